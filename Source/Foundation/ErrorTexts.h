#pragma once

#include <string>
#include <string_view>

namespace Foundation {

/// The text of a key of the table "Localizable" that explains an error; the key itself if there
/// is none.
std::string localizedErrorText(std::string_view key);

/// The text for a code of `OVURLErrorDomain`; empty if there is none. The two codes of
/// authentication have none: their text is that of a key which translators know.
std::string describeURLError(int code);

}  // namespace Foundation
