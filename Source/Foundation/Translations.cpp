#include "Foundation/Translations.h"

#include <libintl.h>

namespace Foundation {

namespace {

/// Stands between a context and its message id in the files of translations.
constexpr char kContextMark = '\004';

}  // namespace

Translations::Translations(std::string domain, const std::string& localeDirectory)
    : mDomain(std::move(domain)) {
    bindtextdomain(mDomain.c_str(), localeDirectory.c_str());
    bind_textdomain_codeset(mDomain.c_str(), "UTF-8");
}

std::string Translations::find(std::string_view key, std::string_view table,
                               std::string_view fallback) const {
    // The empty id is that of a file's own header.
    if (key.empty()) return std::string(fallback);
    std::string id(key);
    if (table != kLocalizableTable) id = std::string(table) + kContextMark + id;
    const char* text = dgettext(mDomain.c_str(), id.c_str());
    // What has no translation comes back as it was given.
    return text != id.c_str() ? text : std::string(fallback);
}

std::string Translations::findPlural(std::string_view key, std::string_view pluralKey,
                                     unsigned long count, std::string_view fallback) const {
    const std::string one(key);
    const std::string many(pluralKey);
    const char* text = dngettext(mDomain.c_str(), one.c_str(), many.c_str(), count);
    return text != one.c_str() && text != many.c_str() ? text : std::string(fallback);
}

}  // namespace Foundation
