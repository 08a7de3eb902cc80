#include "Foundation/AutoreleasePool.h"
#include "Support/LogCapture.h"

#include <Orvane/OVDate.h>
#include <Orvane/OVException.h>
#include <Orvane/OVFeedSettings.h>
#include <Orvane/OVNotificationCenter.h>

#include <gtest/gtest.h>

#include <stdexcept>

namespace {

using Names = std::vector<std::string>;

}  // namespace

TEST(OVFeedSettings, HasTheDefaultsOfAFeed) {
    const OVFeedSettings settings;
    EXPECT_EQ(settings.refreshInterval(), 0);
    EXPECT_EQ(settings.expirationInterval(), 0);
    EXPECT_TRUE(settings.refreshesInBackground());
    EXPECT_FALSE(settings.downloadsEnclosures());
    EXPECT_EQ(settings.maxEnclosureSize(), 8388608);
    EXPECT_FALSE(settings.enclosureTypes());
    EXPECT_TRUE(settings.isEqual(OVFeedSettings::defaultFeedSettings()));
}

TEST(OVFeedSettings, HasTheDefaultsOfAClient) {
    const OVFeedSettings settings = OVFeedSettings::defaultClientSettings();
    EXPECT_EQ(settings.refreshInterval(), 1800);
    EXPECT_EQ(settings.expirationInterval(), 1209600);
    EXPECT_EQ(settings.maxEnclosureSize(), 8388608);
    EXPECT_FALSE(settings.isEqual(OVFeedSettings()));
}

TEST(OVFeedSettings, AreEqualIfAllOfThemAre) {
    const OVFeedSettings settings;
    const auto differs = [&](auto change) {
        OVFeedSettings other = settings.copy();
        EXPECT_TRUE(other.isEqual(settings));
        change(other);
        EXPECT_FALSE(other.isEqual(settings));
    };
    differs([](OVFeedSettings& s) { s.setRefreshInterval(1); });
    differs([](OVFeedSettings& s) { s.setExpirationInterval(1); });
    differs([](OVFeedSettings& s) { s.setRefreshesInBackground(false); });
    differs([](OVFeedSettings& s) { s.setDownloadsEnclosures(true); });
    differs([](OVFeedSettings& s) { s.setMaxEnclosureSize(1); });
    differs([](OVFeedSettings& s) { s.setEnclosureTypes(Names{"a/b"}); });
}

TEST(OVDate, CountsFrom2001) {
    const OVDate date(10.5);
    EXPECT_EQ(date.absoluteTime(), 10.5);
    EXPECT_EQ(date.timePoint() - OVDate::epoch(), std::chrono::milliseconds(10500));
    EXPECT_EQ(OVDate(date.timePoint()), date);
    EXPECT_LT(OVDate(1), OVDate(2));
    EXPECT_EQ(OVDate(1).addingSeconds(2), OVDate(3));
    EXPECT_EQ(std::chrono::system_clock::to_time_t(OVDate::epoch()), 978307200);
}

TEST(OVNotificationCenter, CallsObserversByNameAndObject) {
    OVNotificationCenter& center = OVNotificationCenter::defaultCenter();
    Names all, named;
    auto any =
        center.addObserver({}, nullptr, [&](const OVNotification& n) { all.push_back(n.name); });
    const auto one =
        center.addObserver("a", nullptr, [&](const OVNotification& n) { named.push_back(n.name); });
    center.post({"a", nullptr, {}});
    center.post({"b", nullptr, {}});
    EXPECT_EQ(all, (Names{"a", "b"}));
    EXPECT_EQ(named, Names{"a"});
    any = nullptr;
    center.post({"a", nullptr, {}});
    EXPECT_EQ(all.size(), 2u);
    EXPECT_EQ(named.size(), 2u);
}

TEST(OVNotificationCenter, ReportsWhatAnObserverThrows) {
    Support::LogCapture log;
    OVNotificationCenter& center = OVNotificationCenter::defaultCenter();
    int calls = 0;
    const auto bad = center.addObserver(
        "a", nullptr, [](const OVNotification&) { throw std::runtime_error("mine"); });
    const auto good = center.addObserver("a", nullptr, [&](const OVNotification&) { ++calls; });
    center.post({"a", nullptr, {}});
    EXPECT_EQ(calls, 1);
    EXPECT_TRUE(log.contains("mine"));
}

TEST(OVNotificationCenter, LetsObserversComeAndGoWhileItPosts) {
    OVNotificationCenter& center = OVNotificationCenter::defaultCenter();
    Names calls;
    OVNotificationCenter::Observation second;
    OVNotificationCenter::Observation third;
    const auto first = center.addObserver("a", nullptr, [&](const OVNotification&) {
        calls.emplace_back("1");
        second = nullptr;
        third = center.addObserver("a", nullptr,
                                   [&](const OVNotification&) { calls.emplace_back("3"); });
    });
    second =
        center.addObserver("a", nullptr, [&](const OVNotification&) { calls.emplace_back("2"); });
    center.post({"a", nullptr, {}});
    EXPECT_EQ(calls, Names{"1"});
}

TEST(OVException, KnowsWhatFailed) {
    EXPECT_EQ(OVException("text").error(), nullptr);
    const OVException exception("text", OVError("domain", 3));
    const OVException copy = exception;
    ASSERT_NE(copy.error(), nullptr);
    EXPECT_EQ(copy.error()->code(), 3);
    EXPECT_STREQ(copy.what(), "text");
}
