#include "FeedParser/EncodingAliases.h"

#include <libxml/encoding.h>

namespace Orvane::FeedParser {

namespace {

struct Alias {
    const char* name;
    const char* alias;
};

constexpr Alias kAliases[] = {
    {"macarabic", "mac-arabic"},
    {"macarabic", "mac_arabic"},
    {"maccentraleurope", "maclatin2"},
    {"maccentraleurope", "mac-central-europe"},
    {"maccentraleurope", "mac_central_europe"},
    {"maccroatian", "mac-croatian"},
    {"maccroatian", "mac_croatian"},
    {"maccyrillic", "mac-cyrillic"},
    {"maccyrillic", "mac_cyrillic"},
    {"macgreek", "mac-greek"},
    {"macgreek", "mac_greek"},
    {"machebrew", "mac-hebrew"},
    {"machebrew", "mac_hebrew"},
    {"maciceland", "mac-iceland"},
    {"maciceland", "mac_iceland"},
    {"macromania", "mac-romania"},
    {"macromania", "mac_romania"},
    {"macthai", "mac-thai"},
    {"macthai", "mac_thai"},
    {"macturkish", "mac-turkish"},
    {"macturkish", "mac_turkish"},
    {"macukraine", "mac-ukraine"},
    {"macukraine", "mac_ukraine"},
    {"windows-1250", "windows_1250"},
    {"windows-1251", "windows_1251"},
    {"windows-1252", "windows_1252"},
    {"windows-1253", "windows_1253"},
    {"windows-1254", "windows_1254"},
    {"windows-1255", "windows_1255"},
    {"windows-1256", "windows_1256"},
    {"windows-1257", "windows_1257"},
    {"windows-1258", "windows_1258"},
};

}  // namespace

void registerEncodingAliases() {
    for (const Alias& alias : kAliases) {
        xmlAddEncodingAlias(alias.name, alias.alias);
    }
}

}  // namespace Orvane::FeedParser
