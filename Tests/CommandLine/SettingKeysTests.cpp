#include "CommandLine/SettingKeys.h"

#include "CommandLine/Failure.h"

#include <gmock/gmock.h>

using Commands::Failure;
using testing::ElementsAre;
namespace Keys = Commands::SettingKeys;

namespace {

std::vector<std::string> lines(const std::vector<Keys::Setting>& settings) {
    std::vector<std::string> all;
    for (const Keys::Setting& each : settings) {
        all.push_back(each.key + '=' + each.value + " by " + Keys::nameOf(each.origin));
    }
    return all;
}

}  // namespace

TEST(SettingKeys, SetsEachSetting) {
    OVFeedSettings settings;
    Keys::set(settings, "refresh", "2h");
    EXPECT_EQ(settings.refreshInterval(), 7200);
    Keys::set(settings, "expire", "never");
    Keys::set(settings, "background", "no");
    Keys::set(settings, "enclosures", "yes");
    Keys::set(settings, "max-enclosure", "50MB");
    Keys::set(settings, "types", "audio/mpeg,video/mp4");
    EXPECT_EQ(settings.expirationInterval(), Keys::kForGood);
    Keys::set(settings, "refresh", "never");
    EXPECT_LT(settings.refreshInterval(), 0);
    EXPECT_FALSE(settings.refreshesInBackground());
    EXPECT_TRUE(settings.downloadsEnclosures());
    EXPECT_EQ(settings.maxEnclosureSize(), 50e6);
    EXPECT_THAT(*settings.enclosureTypes(), ElementsAre("audio/mpeg", "video/mp4"));
    for (const std::string& key : Keys::names()) {
        Keys::set(settings, key, "default");
    }
    OVFeedSettings expected;
    expected.setMaxEnclosureSize(0);
    EXPECT_EQ(settings, expected);
}

TEST(SettingKeys, RefusesWhatIsNone) {
    OVFeedSettings settings;
    for (const auto& [key, text] :
         std::vector<std::pair<std::string, std::string>>{{"refresh", "soon"},
                                                          {"background", "perhaps"},
                                                          {"max-enclosure", "big"},
                                                          {"max-enclosure", "-1"},
                                                          {"nothing", "1"}}) {
        EXPECT_THROW(Keys::set(settings, key, text), Failure) << key;
    }
    EXPECT_EQ(settings, OVFeedSettings());
}

TEST(SettingKeys, TellWhereValuesComeFrom) {
    OVFeedSettings feed;
    feed.setRefreshInterval(3600);
    feed.setMaxEnclosureSize(0);
    OVFeedSettings client;
    client.setExpirationInterval(-1);
    client.setMaxEnclosureSize(500e6);
    EXPECT_THAT(lines(Keys::ofFeed({}, client)).at(1), "expire=never by the client");
    client.setExpirationInterval(Keys::kForGood);
    EXPECT_THAT(lines(Keys::ofFeed(feed, client)),
                ElementsAre("refresh=1 hour by the feed", "expire=never by the client",
                            "background=yes by the feed", "enclosures=no by the feed",
                            "max-enclosure=500.0 MB by the client", "types=all by the feed"));
    EXPECT_THAT(lines(Keys::ofFeed({}, {})).at(0), "refresh=30 minutes by built in");
    EXPECT_THAT(lines(Keys::ofClient(client)),
                ElementsAre("refresh=30 minutes by built in", "expire=never by the client",
                            "background=yes by the client", "enclosures=no by the client",
                            "max-enclosure=500.0 MB by the client", "types=all by the client"));
}
