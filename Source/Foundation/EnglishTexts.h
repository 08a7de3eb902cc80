#pragma once

#include <string_view>
#include <vector>

namespace Foundation {

/// The English text of a key of the table "Localizable"; null if the key has none. English is what
/// is shown where there is no translation, so the library carries it itself.
const char* findEnglishText(std::string_view key) noexcept;
/// All keys.
std::vector<std::string_view> englishKeys();

}  // namespace Foundation
