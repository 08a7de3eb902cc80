#pragma once

#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"
#include "Foundation/Translations.h"

#include <string>
#include <string_view>

namespace Foundation {

/// A directory of resources, with the localised texts that belong to them.
class Bundle : public PFRefCounted {
 public:
    /// The library's own: `$ORVANE_RESOURCES` or else where the library is installed. Its texts
    /// are the domain "orvane", and English where there is no translation.
    static Bundle* frameworkBundle();
    /// The version of the library: "1.0.2".
    static StringReturner frameworkVersion();
    /// A bundle of somebody else's. Its translations are those of `textDomain` in the directory
    /// "locale" beside its own.
    static Returner<Bundle> bundle(const std::string& directory, const std::string& textDomain);

    /// The directory.
    URLReturner getBundleURL() const;
    /// The resource `name`.`type` of a subdirectory; `type` and `directory` may be null. Throws
    /// `AssertionFailure` if there is none.
    URLReturner getResourceURL(const String* name, const String* type,
                               const String* directory) const;
    /// The same, but null if there is none. What leads out of the bundle is none.
    URLReturner getOptResourceURL(const String* name, const String* type,
                                  const String* directory) const;
    /// The content of a resource. Throws `AssertionFailure` if there is none, and for a string if
    /// it is not UTF-8.
    StringReturner loadResourceString(const String* name, const String* type) const;
    /// As for strings, but null if it is there and cannot be read.
    DataReturner loadResourceData(const String* name, const String* type) const;

    /// The text of a key in the language of the process; the key itself if it has none. A null
    /// table is "Localizable". Null for null.
    StringReturner getLocalizedString(const String* key, const String* table) const;
    std::string getLocalizedText(std::string_view key,
                                 std::string_view table = kLocalizableTable) const;
    /// The same for a text that depends on a number, in the table "Localizable".
    std::string getLocalizedPlural(std::string_view key, std::string_view pluralKey,
                                   unsigned long count) const;

 private:
    enum class Texts { Translated, TranslatedOrEnglish };

    Bundle(std::string directory, const std::string& textDomain, Texts texts);

    std::string find(std::string_view key, std::string_view table,
                     std::string_view undefined) const;

    std::string mDirectory;
    Translations mTranslations;
    Texts mTexts;
};

/// The text of a key of the framework bundle's table "Localizable".
std::string localizedText(std::string_view key);

}  // namespace Foundation
