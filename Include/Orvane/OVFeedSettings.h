#pragma once

#include <optional>
#include <string>
#include <utility>
#include <vector>

/// How a feed is looked after. A plain value, which is copied.
///
/// A 0 for an interval or a size stands for what the client's own settings say.
class OVFeedSettings {
 public:
    using Types = std::optional<std::vector<std::string>>;  ///< media types; none for no choice

    static constexpr double kDefaultRefreshInterval = 1800.0;        ///< seconds
    static constexpr double kDefaultExpirationInterval = 1209600.0;  ///< seconds: 14 days
    static constexpr double kDefaultMaxEnclosureSize = 8388608.0;    ///< bytes

    /// What a feed has that nobody has set anything for.
    static OVFeedSettings defaultFeedSettings() { return {}; }
    /// What a client has that nobody has set anything for.
    static OVFeedSettings defaultClientSettings() {
        OVFeedSettings settings;
        settings.setRefreshInterval(kDefaultRefreshInterval);
        settings.setExpirationInterval(kDefaultExpirationInterval);
        return settings;
    }

    // Setters keep what they get.

    /// Seconds between two refreshes; below 0 for never.
    double refreshInterval() const { return mRefreshInterval; }
    void setRefreshInterval(double seconds) { mRefreshInterval = seconds; }
    /// Seconds for which entries are kept; below 0 for good.
    double expirationInterval() const { return mExpirationInterval; }
    void setExpirationInterval(double seconds) { mExpirationInterval = seconds; }
    /// Whether the feed is refreshed while the application does not run.
    bool refreshesInBackground() const { return mRefreshesInBackground; }
    void setRefreshesInBackground(bool refreshes) { mRefreshesInBackground = refreshes; }
    /// Whether enclosures are downloaded without being asked for.
    bool downloadsEnclosures() const { return mDownloadsEnclosures; }
    void setDownloadsEnclosures(bool downloads) { mDownloadsEnclosures = downloads; }
    /// Bytes; larger enclosures are not downloaded without being asked for.
    double maxEnclosureSize() const { return mMaxEnclosureSize; }
    void setMaxEnclosureSize(double bytes) { mMaxEnclosureSize = bytes; }
    /// The media types that are downloaded without being asked for; none for all.
    const Types& enclosureTypes() const { return mEnclosureTypes; }
    void setEnclosureTypes(Types types) { mEnclosureTypes = std::move(types); }

    /// Equal settings of their own.
    OVFeedSettings copy() const { return *this; }
    /// Whether all of them are equal.
    bool isEqual(const OVFeedSettings& other) const { return *this == other; }
    bool operator==(const OVFeedSettings&) const = default;

 private:
    double mRefreshInterval = 0;
    double mExpirationInterval = 0;
    bool mRefreshesInBackground = true;
    bool mDownloadsEnclosures = false;
    double mMaxEnclosureSize = kDefaultMaxEnclosureSize;
    Types mEnclosureTypes;
};
