#include "Foundation/EnglishTexts.h"

namespace Foundation {

namespace {

struct Text {
    std::string_view key;
    const char* text;
};

// What a key says in brackets tells translators the range of the number.
constexpr Text kTexts[] = {
    {"0 bytes", "0 bytes"},
    {"1 byte", "1 byte"},
    {"%.0f bytes", "%.0f bytes"},
    {"%.1f KB (0.1)", "%.1f KB"},
    {"%.1f KB (1.0)", "%.1f KB"},
    {"%.1f KB (10.0)", "%.1f KB"},
    {"%.0f KB", "%.0f KB"},
    {"%.1f MB (1.0)", "%.1f MB"},
    {"%.1f MB (10.0)", "%.1f MB"},
    {"%.0f MB", "%.0f MB"},
    {"%.1f GB (1.0)", "%.1f GB"},
    {"%.1f GB (10.0)", "%.1f GB"},
    {"%.0f GB", "%.0f GB"},

    // Patterns of ICU's date formats.
    {"TodayFmt", "'Today', h:mm a"},
    {"YesterdayFmt", "'Yesterday', h:mm a"},
    {"ThisWeekFmt", "EEEE, h:mm a"},
    {"ThisYearFmt", "MMM d, h:mm a"},
    {"PastYearFmt", "MMM d, y, h:mm a"},

    {"OVInternalErrorDescription", "The feed could not be read."},
    {"OVInternalErrorFailureReason", "Something unexpected went wrong inside the feed service."},
    {"OVInternalErrorRecoverySuggestion", "Try again later."},
    {"OVNotAFeedErrorDescription", "This is not a feed."},
    {"OVNotAFeedErrorFailureReason", "What the server sent is neither RSS, RDF nor Atom."},
    {"OVNotAFeedErrorRecoverySuggestion", "Look for a link to a feed on the site's pages."},
    {"PNURLErrorUserAuthenticationRequired Description",
     "The server wants a user name and a password."},
    {"Regular expression syntax error", "Regular expression syntax error"},

    {"kUntitledFileName", "Untitled"},
};

}  // namespace

const char* findEnglishText(std::string_view key) noexcept {
    for (const Text& row : kTexts) {
        if (row.key == key) return row.text;
    }
    return nullptr;
}

std::vector<std::string_view> englishKeys() {
    std::vector<std::string_view> keys;
    for (const Text& row : kTexts)
        keys.push_back(row.key);
    return keys;
}

}  // namespace Foundation
