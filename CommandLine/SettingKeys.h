#pragma once

#include "Value.h"

#include <Orvane/OVFeedSettings.h>

#include <string>
#include <vector>

namespace Commands::SettingKeys {

/// What "never" stands for where entries are to be kept for good: a hundred years. Of a feed whose
/// interval is below 0, which would be good for that as well, the library tells no changes.
inline constexpr double kForGood = 36500.0 * 24 * 3600;

/// Where a value comes from.
enum class Origin { Feed, Client, BuiltIn };

/// A setting as it is shown.
struct Setting {
    std::string key;
    std::string value;
    Origin origin;
};

/// The names of all settings.
const std::vector<std::string>& names();

/// Sets one. `text` is what the user wrote; "default" gives it back to where it comes from if
/// nothing is set. Throws `Failure` with `ExitStatus::Usage` for a key or a text that is none.
void set(OVFeedSettings& settings, const std::string& key, const std::string& text);

/// What goes for a feed, and by whom. `client` has the settings of its client.
std::vector<Setting> ofFeed(const OVFeedSettings& feed, const OVFeedSettings& client);
/// The same of a client.
std::vector<Setting> ofClient(const OVFeedSettings& client);

const char* nameOf(Origin origin);

/// How many bytes a text such as "8MB", "500 kB" or "1000000" stands for. Throws as above.
double parseSize(const std::string& text);

}  // namespace Commands::SettingKeys
