#include "Foundation/Bundle.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/EnglishTexts.h"
#include "Foundation/InstalledTree.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <unistd.h>

#include <cstdlib>
#include <filesystem>

namespace Foundation {

namespace {

// No text can be this one, so it tells "no text" from an empty one.
constexpr std::string_view kUndefined = "<<undefined>>";
constexpr const char* kTextDomain = "orvane";

std::string frameworkDirectory() {
    const char* set = std::getenv("ORVANE_RESOURCES");
    if (set && *set == '/') return set;
    return InstalledTree::findDirectory(ORVANE_RESOURCES_FROM_LIBRARY, ORVANE_INSTALLED_RESOURCES);
}

/// Where the translations of a directory of resources are: "share/locale" beside "share/orvane". By
/// the name alone, since the directory may be a link into a tree of sources.
std::string localeDirectory(const std::string& directory) {
    return (std::filesystem::path(directory).parent_path() / "locale").string();
}

std::string withoutFinalSlash(std::string directory) {
    while (directory.size() > 1 && directory.ends_with('/'))
        directory.pop_back();
    return directory;
}

/// Whether a part of a path stays below what it is appended to.
bool leadsDown(std::string_view path) {
    while (!path.empty()) {
        const std::size_t end = path.find('/');
        if (path.substr(0, end) == "..") return false;
        if (end == std::string_view::npos) break;
        path.remove_prefix(end + 1);
    }
    return true;
}

std::string_view view(const String* string) {
    return string ? string->view() : std::string_view();
}

}  // namespace

Bundle::Bundle(std::string directory, const std::string& textDomain, Texts texts)
    : mDirectory(withoutFinalSlash(std::move(directory))),
      mTranslations(textDomain, localeDirectory(mDirectory)),
      mTexts(texts) {}

Bundle* Bundle::frameworkBundle() {
    static const Ref<Bundle> sBundle =
        Returner<Bundle>(new Bundle(frameworkDirectory(), kTextDomain, Texts::TranslatedOrEnglish));
    return sBundle;
}

StringReturner Bundle::frameworkVersion() {
    return String::string(ORVANE_VERSION);
}

Returner<Bundle> Bundle::bundle(const std::string& directory, const std::string& textDomain) {
    return Returner<Bundle>(new Bundle(directory, textDomain, Texts::Translated));
}

URLReturner Bundle::getBundleURL() const {
    return URL::urlWithFileSystemPath(mDirectory.c_str(), true);
}

URLReturner Bundle::getOptResourceURL(const String* name, const String* type,
                                      const String* directory) const {
    std::string path;
    if (directory) path += directory->utf8() + '/';
    path += view(name);
    if (type) path += '.' + type->utf8();
    if (view(name).empty() || !leadsDown(path)) return nullptr;
    path = mDirectory + '/' + path;
    if (access(path.c_str(), F_OK) != 0) return nullptr;
    return URL::urlWithFileSystemPath(path.c_str(), false);
}

URLReturner Bundle::getResourceURL(const String* name, const String* type,
                                   const String* directory) const {
    Ref<URL> url = getOptResourceURL(name, type, directory);
    OV_ASSERT_MESSAGE(url, "No resource %s.%s in %s", view(name), view(type), mDirectory);
    return url;
}

StringReturner Bundle::loadResourceString(const String* name, const String* type) const {
    const Ref<URL> url = getResourceURL(name, type, nullptr);
    return String::stringFromResource(url);
}

DataReturner Bundle::loadResourceData(const String* name, const String* type) const {
    const Ref<URL> url = getResourceURL(name, type, nullptr);
    return Data::dataFromResource(url);
}

StringReturner Bundle::getLocalizedString(const String* key, const String* table) const {
    if (!key) return nullptr;
    return String::string(getLocalizedText(key->view(), table ? table->view() : kLocalizableTable));
}

std::string Bundle::getLocalizedText(std::string_view key, std::string_view table) const {
    std::string text = find(key, table, kUndefined);
    return text != kUndefined ? text : std::string(key);
}

std::string Bundle::find(std::string_view key, std::string_view table,
                         std::string_view undefined) const {
    const bool isEnglish = mTexts == Texts::TranslatedOrEnglish && table == kLocalizableTable;
    const char* english = isEnglish ? findEnglishText(key) : nullptr;
    return mTranslations.find(key, table, english ? std::string_view(english) : undefined);
}

std::string Bundle::getLocalizedPlural(std::string_view key, std::string_view pluralKey,
                                       unsigned long count) const {
    const std::string_view english = count == 1 ? key : pluralKey;
    const char* text = mTexts == Texts::TranslatedOrEnglish ? findEnglishText(english) : nullptr;
    return mTranslations.findPlural(key, pluralKey, count, text ? std::string_view(text) : english);
}

std::string localizedText(std::string_view key) {
    return Bundle::frameworkBundle()->getLocalizedText(key);
}

}  // namespace Foundation
