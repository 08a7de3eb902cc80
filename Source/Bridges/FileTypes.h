#pragma once

#include <string_view>

namespace Orvane {

/// The media type of files whose names end in this, without the "."; null if it is not known.
/// Case does not count.
const char* mimeTypeOfExtension(std::string_view extension);

}  // namespace Orvane
