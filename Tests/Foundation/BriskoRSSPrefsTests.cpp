#include "Foundation/BriskoRSSPrefs.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Number.h"
#include "Foundation/PreferenceFolder.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;

namespace {

constexpr const char* kDomain = "com.tarnwick.Brisko.RSS";

/// The domain's folder is that of the first use, so all the suite has one.
class BriskoRSSPrefsTest : public testing::Test {
 protected:
    static void SetUpTestSuite() { folder = new PreferenceFolder; }
    static void TearDownTestSuite() { delete folder; }

    /// What the domain holds from now on.
    void hold(const std::string& entries) {
        folder->replace(kDomain, PreferenceFolder::xml(entries));
        BriskoRSSPrefs_Synchronize();
    }
    static Ref<String> text(const char* utf8) { return String::string(utf8); }

    static PreferenceFolder* folder;
};

PreferenceFolder* BriskoRSSPrefsTest::folder = nullptr;

}  // namespace

TEST_F(BriskoRSSPrefsTest, HasTheKeysOfTheEnumeration) {
    const char* const kNames[] = {"RefreshInterval",
                                  "MaxDaysToKeep",
                                  "IntervalLastUpdated",
                                  "ArticlesPerPage",
                                  "Theme.TimeChanged",
                                  "Theme.ClickArticles",
                                  "Theme.ShowArticleIcons",
                                  "Theme.HighlightUnreadArticleHeaders",
                                  "Theme.OpenArticlesInWindows",
                                  "Theme.ShowFOAF",
                                  "Theme.UserParam.",
                                  "Theme.UserParam.Styles",
                                  "Theme.UserParam.BriskoPrefStyles",
                                  "FixedSubscriptionAutodownloadSettings",
                                  "FixedRefreshesInBackgroundSettings",
                                  "com.tarnwick.PreferenceSync.ExcludeSyncKeys"};
    for (unsigned i = 0; i < 16; ++i) {
        EXPECT_STREQ(BriskoRSSPrefs::getKeyName(static_cast<BriskoRSSPref>(i)), kNames[i]);
    }
    EXPECT_EQ(static_cast<unsigned>(BriskoRSSPref::ArticlesPerPage), 3u);
    EXPECT_EQ(static_cast<unsigned>(BriskoRSSPref::ThemeHighlightUnreadArticleHeaders), 7u);
    EXPECT_EQ(static_cast<unsigned>(BriskoRSSPref::ThemeUserParam), 10u);
}

TEST_F(BriskoRSSPrefsTest, AValueOfSixteenOrMoreIsNoKey) {
    Support::LogCapture log;
    EXPECT_THROW(BriskoRSSPrefs::getKeyName(static_cast<BriskoRSSPref>(16)), AssertionFailure);
    EXPECT_THROW(BriskoRSSPrefs_GetInt(static_cast<BriskoRSSPref>(-1), 0), AssertionFailure);
}

TEST_F(BriskoRSSPrefsTest, GivesTheDefaultForAKeyWithoutAValue) {
    hold("");
    EXPECT_EQ(BriskoRSSPrefs_GetInt(BriskoRSSPref::ArticlesPerPage, 200), 200);
    EXPECT_TRUE(BriskoRSSPrefs_GetBool(BriskoRSSPref::ThemeShowFOAF, true));
    EXPECT_FALSE(BriskoRSSPrefs_GetBool(BriskoRSSPref::ThemeShowFOAF, false));
    const Ref<String> fallback = text("default");
    EXPECT_EQ(Ref<String>(BriskoRSSPrefs_GetStringByName(text("Theme.X").get(), fallback)).get(),
              fallback.get());
    const Ref<MutableDictionary> empty = MutableDictionary::dictionary();
    EXPECT_EQ(
        Ref<Dictionary>(BriskoRSSPrefs_GetDictionaryByName(text("multi:a").get(), empty)).get(),
        empty.get());
    EXPECT_EQ(
        Ref<Dictionary>(BriskoRSSPrefs_GetDictionaryByName(text("multi:a").get(), nullptr)).get(),
        nullptr);
}

TEST_F(BriskoRSSPrefsTest, GivesTheValueOfAKey) {
    hold("<key>ArticlesPerPage</key><integer>20</integer><key>Theme.ShowFOAF</key><false/>" +
         PreferenceFolder::entry("Theme.X", "blue"));
    EXPECT_EQ(BriskoRSSPrefs_GetInt(BriskoRSSPref::ArticlesPerPage, 200), 20);
    EXPECT_FALSE(BriskoRSSPrefs_GetBool(BriskoRSSPref::ThemeShowFOAF, true));
    const Ref<String> blue = BriskoRSSPrefs_GetStringByName(text("Theme.X").get(), nullptr);
    EXPECT_EQ(blue->utf8(), "blue");
}

TEST_F(BriskoRSSPrefsTest, KeepsADictionaryByName) {
    hold("");
    const Ref<Number> slider = Number::number(0.5);
    const Ref<MutableDictionary> settings = MutableDictionary::dictionary();
    settings->set("sliderValue", slider.get());
    BriskoRSSPrefs_SetDictionaryByName(text("multi:a,b").get(), settings);
    EXPECT_TRUE(IsEqual(
        Ref<Dictionary>(BriskoRSSPrefs_GetDictionaryByName(text("multi:a,b").get(), nullptr)).get(),
        settings.get()));
    BriskoRSSPrefs_Synchronize();
    EXPECT_NE(folder->contentOf(kDomain).find("<key>multi:a,b</key>"), std::string::npos);
    BriskoRSSPrefs_SetDictionaryByName(text("multi:a,b").get(), nullptr);
    BriskoRSSPrefs_Synchronize();
    EXPECT_EQ(folder->contentOf(kDomain).find("multi"), std::string::npos);
}

TEST_F(BriskoRSSPrefsTest, SynchronizeShowsWhatAnotherProcessChanged) {
    hold(PreferenceFolder::entry("Theme.X", "blue"));
    folder->replace(kDomain, PreferenceFolder::xml(PreferenceFolder::entry("Theme.X", "red")));
    BriskoRSSPrefs::Synchronize();
    const Ref<String> red = BriskoRSSPrefs::GetStringByName(text("Theme.X").get(), nullptr);
    EXPECT_EQ(red->utf8(), "red");
}
