#pragma once

#include <string>
#include <string_view>

namespace Support {

// Texts in the content codings of HTTP.
std::string gzipped(std::string_view text);
std::string deflated(std::string_view text);
std::string rawDeflated(std::string_view text);  ///< "deflate" as many servers mean it
std::string brotlied(std::string_view text);
std::string zstandarded(std::string_view text);

}  // namespace Support
