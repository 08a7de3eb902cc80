#include "SettingKeys.h"

#include "DateText.h"
#include "Failure.h"
#include "ListingText.h"
#include "Suggestion.h"

#include <cmath>
#include <cstdlib>
#include <sstream>

namespace Commands {

namespace {

using SettingKeys::Origin;
using SettingKeys::Setting;

constexpr double kNever = -1;

[[noreturn]] void complain(const std::string& text) {
    throw Failure(ExitStatus::Usage, text);
}

double interval(const std::string& text, double never) {
    if (text == "default") return 0;
    return text == "never" ? never : DateText::parseDuration(text);
}

std::string shownInterval(double seconds) {
    return seconds >= SettingKeys::kForGood ? "never" : DateText::duration(seconds);
}

bool flag(const std::string& key, const std::string& text, bool byDefault) {
    if (text == "default") return byDefault;
    if (text == "yes" || text == "on" || text == "true") return true;
    if (text == "no" || text == "off" || text == "false") return false;
    complain(key + " is yes or no, not \"" + text + '"');
}

OVFeedSettings::Types types(const std::string& text) {
    if (text == "default" || text == "all") return std::nullopt;
    std::vector<std::string> list;
    std::istringstream words(text);
    for (std::string word; std::getline(words, word, ',');) {
        if (!word.empty()) list.push_back(word);
    }
    return list;
}

std::string shown(const OVFeedSettings::Types& types) {
    if (!types) return "all";
    std::string text;
    for (const std::string& type : *types) {
        text += (text.empty() ? "" : ",") + type;
    }
    return text;
}

std::string shown(bool flag) {
    return flag ? "yes" : "no";
}

std::string sizeOf(double bytes) {
    return ListingText::shown(static_cast<long long>(bytes), Listing::Column::Kind::Bytes,
                              OVDate(0));
}

/// A number of a feed, or else of the client, or else the built-in one.
struct Found {
    double value;
    Origin origin;
};

Found find(double feed, double client, double builtIn) {
    if (feed != 0) return {feed, Origin::Feed};
    if (client != 0) return {client, Origin::Client};
    return {builtIn, Origin::BuiltIn};
}

std::vector<Setting> all(const OVFeedSettings& own, const OVFeedSettings& client, Origin origin) {
    const Found refresh = find(own.refreshInterval(), client.refreshInterval(),
                               OVFeedSettings::kDefaultRefreshInterval);
    const Found expire = find(own.expirationInterval(), client.expirationInterval(),
                              OVFeedSettings::kDefaultExpirationInterval);
    const Found size = find(own.maxEnclosureSize(), client.maxEnclosureSize(),
                            OVFeedSettings::kDefaultMaxEnclosureSize);
    return {
        {"refresh", DateText::duration(refresh.value), refresh.origin},
        {"expire", shownInterval(expire.value), expire.origin},
        {"background", shown(own.refreshesInBackground()), origin},
        {"enclosures", shown(own.downloadsEnclosures()), origin},
        {"max-enclosure", sizeOf(size.value), size.origin},
        {"types", shown(own.enclosureTypes()), origin},
    };
}

}  // namespace

const std::vector<std::string>& SettingKeys::names() {
    static const std::vector<std::string> sNames{"refresh",    "expire",        "background",
                                                 "enclosures", "max-enclosure", "types"};
    return sNames;
}

void SettingKeys::set(OVFeedSettings& settings, const std::string& key, const std::string& text) {
    if (key == "refresh") {
        settings.setRefreshInterval(interval(text, kNever));
    } else if (key == "expire") {
        settings.setExpirationInterval(interval(text, kForGood));
    } else if (key == "background") {
        settings.setRefreshesInBackground(flag(key, text, true));
    } else if (key == "enclosures") {
        settings.setDownloadsEnclosures(flag(key, text, false));
    } else if (key == "max-enclosure") {
        settings.setMaxEnclosureSize(text == "default" ? 0 : parseSize(text));
    } else if (key == "types") {
        settings.setEnclosureTypes(types(text));
    } else {
        const std::string close = Suggestion::closest(key, names());
        complain("there is no setting \"" + key + '"' +
                 (close.empty() ? "; see orvane set --help" : "; did you mean " + close + '?'));
    }
}

std::vector<Setting> SettingKeys::ofFeed(const OVFeedSettings& feed, const OVFeedSettings& client) {
    return all(feed, client, Origin::Feed);
}

std::vector<Setting> SettingKeys::ofClient(const OVFeedSettings& client) {
    std::vector<Setting> settings = all({}, client, Origin::Client);
    const std::vector<Setting> own = all(client, client, Origin::Client);
    for (std::size_t i = 0; i < settings.size(); ++i) {
        settings[i].value = own[i].value;
        if (settings[i].origin == Origin::Feed) settings[i].origin = Origin::Client;
    }
    return settings;
}

const char* SettingKeys::nameOf(Origin origin) {
    switch (origin) {
        case Origin::Feed:
            return "the feed";
        case Origin::Client:
            return "the client";
        case Origin::BuiltIn:
            break;
    }
    return "built in";
}

double SettingKeys::parseSize(const std::string& text) {
    char* end = nullptr;
    const double number = std::strtod(text.c_str(), &end);
    while (*end == ' ') {
        ++end;
    }
    const std::string unit = end;
    constexpr std::pair<const char*, double> kUnits[] = {{"", 1},     {"B", 1},    {"kB", 1e3},
                                                         {"KB", 1e3}, {"MB", 1e6}, {"GB", 1e9}};
    for (const auto& [name, bytes] : kUnits) {
        const bool isSize = end != text.c_str() && number > 0 && std::isfinite(number);
        if (isSize && unit == name) return number * bytes;
    }
    complain("\"" + text + "\" is no size: write bytes, or 500kB, 8MB, 1GB");
}

}  // namespace Commands
