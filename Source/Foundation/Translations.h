#pragma once

#include <string>
#include <string_view>

namespace Foundation {

/// The table of keys that have no context in the translations.
inline constexpr std::string_view kLocalizableTable = "Localizable";

/// The translations of one text domain (`<domain>.mo`) of gettext, in a directory of locales.
///
/// Keys are the message ids, and a table other than "Localizable" is their context. Texts are in
/// UTF-8, in the language of the process's LC_MESSAGES; the C locale has no translations.
class Translations {
 public:
    /// One domain has one directory in the process: that of the last object made.
    Translations(std::string domain, const std::string& localeDirectory);

    /// The translation of a key; `fallback` if there is none.
    std::string find(std::string_view key, std::string_view table, std::string_view fallback) const;
    /// The translation for a number of things of a key that has plural forms; `fallback` if there
    /// is none.
    std::string findPlural(std::string_view key, std::string_view pluralKey, unsigned long count,
                           std::string_view fallback) const;

 private:
    std::string mDomain;
};

}  // namespace Foundation
