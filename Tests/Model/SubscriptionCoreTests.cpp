#include "Model/SubscriptionCore.h"

#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationRecorder.h"
#include "Model/ClientTest.h"
#include "Support/AssertionOf.h"
#include "Support/DefaultZone.h"

#include <algorithm>

using namespace Foundation;
using namespace Orvane;
using Support::assertionOf;
using Support::LoggingOn;
using Objects = std::vector<void*>;

namespace {

/// What subscriptions announce, while this lives.
class Announced : public NotificationRecorder {
 public:
    explicit Announced(const NotificationName& name) {
        NotificationCenter::getLocal()->addObserver(*this, name, nullptr);
    }
    ~Announced() { NotificationCenter::getLocal()->removeObserver(*this); }
};

class SubscriptionCoreTest : public ClientTest {
 protected:
    ArrayOf<String>* types(std::initializer_list<const char*> names) {
        MutableArrayOf<String>* list = MutableArrayOf<String>::array();
        for (const char* name : names) {
            list->add(string(name));
        }
        return list;
    }
    bool isPlistSaved() {
        clock.advanceBy(MinistryOfTruth::kSaveDelaySeconds);
        const std::string file = directory / "Orvane/Clients.plist";
        return std::filesystem::remove(file);
    }
    const Ref<ClientCore> client = newClient();
    const Ref<SubscriptionCore> settings = client->getDefaultSubscription();
    const Ref<FeedCore> feed = storedFeed();
    const Ref<SubscriptionCore> mine = newSubscription(client, feed);
};

}  // namespace

TEST_F(SubscriptionCoreTest, IsTheSettingsOnlyWithoutAFeed) {
    EXPECT_TRUE(settings->isClientSettings());
    EXPECT_FALSE(mine->isClientSettings());
    auto* free = row<SubscriptionCore>();
    EXPECT_TRUE(free->isClientSettings());
    free->setFeed(freeFeed("http://example.org/new"));
    EXPECT_FALSE(free->isClientSettings());
}

TEST_F(SubscriptionCoreTest, LeavesItsOwnersNewRowsWhenItIsSavedByItself) {
    auto* made = row<SubscriptionCore>();
    made->setClient(client);
    made->setFeed(feed);
    EXPECT_EQ(client->mSubscriptions.getNewRows().size(), 1u);
    EXPECT_EQ(feed->mSubscriptions.getNewRows().size(), 1u);
    made->saveChanges();
    EXPECT_TRUE(client->mSubscriptions.getNewRows().empty());
    EXPECT_TRUE(feed->mSubscriptions.getNewRows().empty());
}

TEST_F(SubscriptionCoreTest, MayLeaveWhatAloneKeepsIt) {
    const Ref<FeedCore> other = freeFeed("http://example.org/other");
    const Ref<ClientCore> another = row<ClientCore>();
    SubscriptionCore* made = nullptr;
    {
        const AutoreleasePool inner;
        made = row<SubscriptionCore>();
        made->setFeed(feed);
    }
    made->setFeed(other);
    EXPECT_TRUE(feed->mSubscriptions.getNewRows().empty());
    EXPECT_EQ(made->getRefCount(), 1u);
    EXPECT_EQ(other->mSubscriptions.getNewRows().size(), 1u);
    made->setClient(client);
    made->setFeed(nullptr);
    EXPECT_EQ(made->getRefCount(), 1u);
    made->setClient(another);
    EXPECT_TRUE(client->mSubscriptions.getNewRows().empty());
    EXPECT_EQ(another->mSubscriptions.getNewRows().size(), 1u);
}

// Intervals.

TEST_F(SubscriptionCoreTest, TakesARefreshIntervalOf0ForTheConstantInTheSettingsAlone) {
    settings->setRefreshInterval(60);
    EXPECT_EQ(settings->mRefreshInterval, 60);
    settings->setRefreshInterval(0);
    EXPECT_EQ(settings->mRefreshInterval, 1800);
    mine->setRefreshInterval(60);
    mine->setRefreshInterval(0);
    EXPECT_EQ(mine->mRefreshInterval, 0);
}

TEST_F(SubscriptionCoreTest, AnnouncesARefreshIntervalThatChanges) {
    const Announced announced(SubscriptionCore::kRefreshScheduleChangedNotification);
    mine->setRefreshInterval(0);
    settings->setRefreshInterval(0);
    settings->setRefreshInterval(1800);
    EXPECT_TRUE(announced.notes.empty());
    mine->setRefreshInterval(60);
    settings->setRefreshInterval(60);
    EXPECT_EQ(announced.objects, (Objects{mine.get(), settings.get()}));
    EXPECT_EQ(announced.notes[0], "Orvane::SubscriptionCore::RefreshScheduleChanged");
}

TEST_F(SubscriptionCoreTest, TakesASizeOf0ForTheConstantInTheSettingsAlone) {
    settings->setMaxEnclosureSize(5);
    settings->setMaxEnclosureSize(0);
    EXPECT_EQ(settings->mMaxEnclosureSize, 8388608);
    mine->setMaxEnclosureSize(5);
    EXPECT_EQ(mine->mMaxEnclosureSize, 5);
    mine->setMaxEnclosureSize(0);
    EXPECT_EQ(mine->mMaxEnclosureSize, 0);
}

TEST_F(SubscriptionCoreTest, TakesAnExpirationIntervalOf0ForTheConstantInTheSettingsAlone) {
    settings->setExpirationInterval(60);
    settings->setExpirationInterval(0);
    EXPECT_EQ(settings->mExpirationInterval, 1209600);
    mine->setExpirationInterval(60);
    mine->setExpirationInterval(0);
    EXPECT_EQ(mine->mExpirationInterval, 0);
}

TEST_F(SubscriptionCoreTest, CountsAnewWhatAShorterExpirationIntervalLeaves) {
    newEntry(feed, "old", clock.now() - 3 * kDay);
    newEntry(feed, "new", clock.now());
    mine->updateUnreadCount();
    EXPECT_EQ(mine->mUnreadCount, 2);
    mine->setExpirationInterval(kDay);
    EXPECT_EQ(time(mine->mExpirationDate), clock.now() - kDay);
    EXPECT_EQ(mine->mUnreadCount, 1);
    mine->setExpirationInterval(7 * kDay);
    EXPECT_EQ(time(mine->mExpirationDate), clock.now() - kDay);
}

TEST_F(SubscriptionCoreTest, ThatGoesByTheSettingsFollowsTheirExpirationInterval) {
    const Ref<SubscriptionCore> own = newSubscription(client, storedFeed("http://example.org/2"));
    own->setExpirationInterval(30 * kDay);
    const Ref<SubscriptionCore> theirs = newSubscription(newClient("other"), feed);
    newEntry(feed, "old", clock.now() - 3 * kDay);
    mine->updateUnreadCount();
    settings->setExpirationInterval(kDay);
    EXPECT_EQ(time(settings->mExpirationDate), clock.now() - kDay);
    EXPECT_EQ(time(mine->mExpirationDate), clock.now() - kDay);
    EXPECT_EQ(mine->mUnreadCount, 0);
    EXPECT_EQ(time(own->mExpirationDate), clock.now() - 14 * kDay);
    EXPECT_EQ(time(theirs->mExpirationDate), clock.now() - 14 * kDay);
}

TEST_F(SubscriptionCoreTest, IsRefreshedByItsIntervalOrTheSettingsOrTheConstant) {
    EXPECT_EQ(mine->getCurrentRefreshInterval(), 1800);
    settings->mRefreshInterval.setValue(900);
    EXPECT_EQ(mine->getCurrentRefreshInterval(), 900);
    settings->mRefreshInterval.setValue(0);
    EXPECT_EQ(mine->getCurrentRefreshInterval(), 1800);
    settings->mRefreshInterval.setValue(-1);
    EXPECT_EQ(mine->getCurrentRefreshInterval(), FeedCore::kRefreshNever);
    mine->mRefreshInterval.setValue(60);
    EXPECT_EQ(mine->getCurrentRefreshInterval(), 60);
}

TEST_F(SubscriptionCoreTest, IsNotRefreshedInTheForegroundAloneWhileItsClientDoesNotRun) {
    mine->mRefreshesInBackground.setValue(false);
    EXPECT_EQ(mine->getCurrentRefreshInterval(), FeedCore::kRefreshNever);
    session.run("org.example.reader");
    EXPECT_EQ(mine->getCurrentRefreshInterval(), 1800);
    client->mDateUsed.setValue(date(clock.now() - 15 * kDay));
    EXPECT_EQ(mine->getCurrentRefreshInterval(), FeedCore::kRefreshNever);
}

TEST_F(SubscriptionCoreTest, IsNotRefreshedInMemory) {
    auto* free = row<SubscriptionCore>();
    free->mRefreshInterval.setValue(60);
    EXPECT_EQ(free->getCurrentRefreshInterval(), FeedCore::kRefreshNever);
}

TEST_F(SubscriptionCoreTest, OfANegativeIntervalIsNeverRefreshed) {
    newSubscription(client, storedFeed("http://example.org/2"))->mRefreshInterval.setValue(300);
    const Ref<ClientCore> other = newClient("other");
    newSubscription(other, FeedCore::getRow(2))->mRefreshInterval.setValue(300);
    db().saveRows();
    EXPECT_EQ(SubscriptionCore::getSubscribedFeeds()->count(), 2u);
    mine->setRefreshInterval(-1);
    db().saveRows();
    const Ref<ArrayOf<FeedCore>> feeds = SubscriptionCore::getSubscribedFeeds();
    ASSERT_EQ(feeds->count(), 1u);
    EXPECT_EQ(feeds->at(0), FeedCore::getRow(2));
    EXPECT_EQ(mine->getCurrentRefreshInterval(), FeedCore::kRefreshNever);
}

// Settings.

TEST_F(SubscriptionCoreTest, SavesThePlistForNewDefaults) {
    isPlistSaved();
    mine->setDefaultSettings();
    EXPECT_TRUE(isPlistSaved());
    settings->setDefaultSettings();
    EXPECT_TRUE(isPlistSaved());
    EXPECT_FALSE(isPlistSaved());
    mine->ipcDidChangeColumn(SubscriptionCore::ColumnID::MaxEnclosureSize);
    EXPECT_TRUE(isPlistSaved());
}

TEST_F(SubscriptionCoreTest, CountsAndExpiresFromTheStart) {
    newEntry(feed, "old", clock.now() - 15 * kDay);
    newEntry(feed, "new", clock.now());
    const Ref<SubscriptionCore> made = newSubscription(newClient("other"), feed);
    EXPECT_EQ(time(made->mExpirationDate), clock.now() - 14 * kDay);
    EXPECT_EQ(made->mUnreadCount, 1);
}

TEST_F(SubscriptionCoreTest, SetsAllSettingsAtOnce) {
    const Announced announced(SubscriptionCore::kRefreshScheduleChangedNotification);
    isPlistSaved();
    mine->setSettings(300, 7 * kDay, false, true, 1000, types({"audio/*", "video/mp4"}));
    EXPECT_EQ(mine->mRefreshInterval, 300);
    EXPECT_EQ(mine->mExpirationInterval, 7 * kDay);
    EXPECT_EQ(time(mine->mExpirationDate), clock.kStart - 7 * kDay);
    EXPECT_FALSE(mine->mRefreshesInBackground);
    EXPECT_TRUE(mine->mDownloadsEnclosures);
    EXPECT_EQ(mine->mMaxEnclosureSize, 1000);
    EXPECT_EQ(text(mine->mEnclosureTypesString.getValue()), "audio/*\tvideo/mp4");
    EXPECT_EQ(announced.notes.size(), 1u);
    EXPECT_TRUE(isPlistSaved());
    mine->setSettings(300, 7 * kDay, false, true, 1000, types({"audio/*", "video/mp4"}));
    EXPECT_FALSE(isPlistSaved());
    mine->setSettings(300, 7 * kDay, false, true, 1000, nullptr);
    EXPECT_EQ(mine->mEnclosureTypesString.getValue(), nullptr);
    EXPECT_TRUE(isPlistSaved());
}

TEST_F(SubscriptionCoreTest, SendsAllSettingsInOneCallFromAReader) {
    mine->mEnclosureTypesString.setValue(string("audio/*\tvideo/mp4"));
    becomeReader();
    const Ref<SubscriptionCore> read = SubscriptionCore::getRow(2);
    ClientAgent agent;
    read->setSettings(0, 0, true, false, 0, types({"audio/*", "video/mp4"}));
    EXPECT_EQ(agent.calls, "");
    agent.onCall = [&] { writeElsewhere("update Subscriptions set refreshInterval=300"); };
    read->setSettings(300, 0, true, false, 0, types({"audio/*", "video/mp4"}));
    EXPECT_EQ(agent.calls,
              OVFormat("updateSubscription(2,300,0,1,0,0,%@) ", types({"audio/*", "video/mp4"})));
    EXPECT_EQ(read->mRefreshInterval, 300);
}

namespace {

/// Settings that differ from the defaults by one.
struct Settings {
    double refresh = 0, expiration = 0;
    bool background = true, downloads = false;
    double size = 0;
    const char* type = nullptr;
};

class SettingsTest : public SubscriptionCoreTest, public testing::WithParamInterface<Settings> {};

}  // namespace

TEST_P(SettingsTest, AreSentIfAnyOfThemChanges) {
    becomeReader();
    ClientAgent agent;
    const Settings& s = GetParam();
    SubscriptionCore::getRow(2)->setSettings(s.refresh, s.expiration, s.background, s.downloads,
                                             s.size, s.type ? types({s.type}) : nullptr);
    EXPECT_TRUE(agent.calls.starts_with("updateSubscription(2,"));
}

INSTANTIATE_TEST_SUITE_P(Each, SettingsTest,
                         testing::Values(Settings{1}, Settings{0, 1}, Settings{0, 0, false},
                                         Settings{0, 0, true, true}, Settings{0, 0, true, false, 1},
                                         Settings{0, 0, true, false, 0, "audio/mpeg"}));

TEST_F(SubscriptionCoreTest, FailsToChangeSettingsWithoutAnAgentForAReader) {
    becomeReader();
    const Ref<SubscriptionCore> read = SubscriptionCore::getRow(2);
    EXPECT_THROW(read->setSettings(300, 0, true, false, 0, nullptr), NetException);
    EXPECT_EQ(read->mRefreshInterval, 0);
}

// Expiration and counts.

TEST_F(SubscriptionCoreTest, MovesItsExpirationDateOnceADay) {
    const LoggingOn on{{&gLogAgent}};
    mine->mExpirationDate.setValue(nullptr);
    clock.jumpTo(clock.now() + 3600);
    EXPECT_TRUE(mine->bumpExpirationDate(nullptr));
    EXPECT_EQ(time(mine->mExpirationDate), clock.kStart - 14 * kDay);
    EXPECT_EQ(log.count("[Agent] Bumped exp date to 2025-12-18 00:00:00 +0000 for "
                        "Orvane::SubscriptionCore[Subscriptions #2]"),
              1);
    clock.jumpTo(clock.kStart + kDay - 1);
    EXPECT_FALSE(mine->bumpExpirationDate(nullptr));
    clock.jumpTo(clock.kStart + kDay);
    EXPECT_TRUE(mine->bumpExpirationDate(nullptr));
    EXPECT_EQ(time(mine->mExpirationDate), clock.kStart - 13 * kDay);
}

TEST_F(SubscriptionCoreTest, ExpiresFromMidnightInTheLocalZone) {
    const Support::DefaultZone zone("America/New_York");
    mine->mExpirationDate.setValue(nullptr);
    // 19:00 on the day before.
    EXPECT_TRUE(mine->bumpExpirationDate(nullptr));
    EXPECT_EQ(time(mine->mExpirationDate), clock.kStart - 19 * 3600 - 14 * kDay);
}

TEST_F(SubscriptionCoreTest, MovesItsExpirationDateForwardOnly) {
    mine->setExpirationInterval(kDay);
    mine->mExpirationDate.setValue(date(1000000));
    EXPECT_FALSE(mine->bumpExpirationDate(date(1000000 + kDay)));
    EXPECT_FALSE(mine->bumpExpirationDate(date(1000000 + kDay - 1)));
    EXPECT_TRUE(mine->bumpExpirationDate(date(1000000 + kDay + 1)));
    EXPECT_EQ(time(mine->mExpirationDate), 1000001);
}

TEST_F(SubscriptionCoreTest, NeverExpiresByANegativeInterval) {
    mine->mExpirationDate.setValue(nullptr);
    mine->mExpirationInterval.setValue(-1);
    EXPECT_FALSE(mine->bumpExpirationDate(nullptr));
    mine->mExpirationInterval.setValue(0);
    settings->mExpirationInterval.setValue(-1);
    EXPECT_FALSE(mine->bumpExpirationDate(nullptr));
    EXPECT_EQ(mine->mExpirationDate.getValue(), nullptr);
    settings->mExpirationInterval.setValue(0);
    EXPECT_FALSE(mine->bumpExpirationDate(nullptr));
    // Back to what stands for no date.
    mine->mExpirationInterval.setValue(clock.kStart);
    mine->mExpirationDate.setValue(date(-1));
    EXPECT_FALSE(mine->bumpExpirationDate(nullptr));
}

TEST_F(SubscriptionCoreTest, TakesItsDefaultsFromAClient) {
    auto* free = row<SubscriptionCore>();
    free->setFeed(freeFeed("http://example.org/new"));
    EXPECT_EQ(assertionOf([&] { free->setDefaultSettings(); }), "client");
}

TEST_F(SubscriptionCoreTest, CountsTheEntriesThatHaveNotExpired) {
    const double expiration = time(mine->mExpirationDate);
    newEntry(feed, "expired", expiration);
    newEntry(feed, "just not", expiration + 1);
    EntryCore* read = newEntry(feed, "read", clock.now());
    read->mRead.setValue(true);
    read->saveChanges();
    newEntry(storedFeed("http://example.org/2"), "another feed's", clock.now());
    const LoggingOn on{{&gLogFeed}};
    EXPECT_EQ(mine->getEntryCount(true), 2);
    EXPECT_EQ(mine->getEntryCount(false), 1);
    EXPECT_EQ(log.count(" computed entry count = 2"), 1);
    EXPECT_EQ(log.count(" computed unread count = 1"), 1);
    mine->mExpirationDate.setValue(nullptr);
    EXPECT_EQ(mine->getEntryCount(true), 3);
}

TEST_F(SubscriptionCoreTest, CountsUnreadEntriesByTheirIndexAlone) {
    reopen(true);
    const LoggingOn on{{&SQLite::gLogSQL}};
    log.clear();
    (void)SubscriptionCore::getRow(2)->getEntryCount(false);
    const auto line = std::find_if(log.lines().begin(), log.lines().end(), [](const auto& text) {
        return text.find("\"select count(*) from Entries") != std::string::npos;
    });
    ASSERT_NE(line, log.lines().end());
    const std::size_t start = line->find("select"), end = line->find("\" -->");
    const SQLite::Cursor plan(&db(), "explain query plan %s", line->substr(start, end - start));
    EXPECT_STREQ(plan.cStringColumn(3),
                 "SEARCH Entries USING COVERING INDEX Entries_unreadcount "
                 "(feed=? AND read=? AND localDateCreated>?)");
}

TEST_F(SubscriptionCoreTest, CountsNothingForSettingsOrWhileEntriesWaitToBeSaved) {
    EXPECT_EQ(assertionOf([&] { (void)settings->getEntryCount(true); }),
              "!this->isClientSettings()");
    EXPECT_FALSE(settings->updateUnreadCount());
    EntryCore* entry = newEntry(feed, "a", clock.now());
    entry->mRead.setValue(true);
    EXPECT_EQ(assertionOf([&] { (void)mine->getEntryCount(true); }),
              "getEntryCount called with unsaved entries");
    entry->saveChanges();
    EXPECT_EQ(mine->getEntryCount(true), 1);
}

TEST_F(SubscriptionCoreTest, AnnouncesAnUnreadCountThatChanges) {
    const Announced announced(SubscriptionCore::kUnreadCountChangedNotification);
    const LoggingOn on{{&gLogSub}};
    EXPECT_FALSE(mine->updateUnreadCount());
    newEntry(feed, "a", clock.now());
    EXPECT_TRUE(mine->updateUnreadCount());
    EXPECT_EQ(mine->mUnreadCount, 1);
    EXPECT_EQ(announced.objects, Objects{mine.get()});
    EXPECT_EQ(announced.notes[0], "Orvane::SubscriptionCore::UnreadCountChanged");
    EXPECT_EQ(log.count("[Sub] Unread count of Orvane::SubscriptionCore[Subscriptions #2]"), 1);
    EXPECT_EQ(log.count(" is now 1"), 1);
    EXPECT_FALSE(mine->updateUnreadCount());
    EXPECT_EQ(announced.notes.size(), 1u);
}

// The end.

TEST_F(SubscriptionCoreTest, TakesItsFeedAlongAsTheLastOne) {
    const Ref<SubscriptionCore> theirs = newSubscription(newClient("other"), feed);
    isPlistSaved();
    const LoggingOn on{{}};
    log.clear();
    mine->deleteRow();
    EXPECT_EQ(log.count("Deleting Orvane::SubscriptionCore[Subscriptions #2]"), 1);
    EXPECT_EQ(count("Feeds"), 1);
    EXPECT_EQ(count("Subscriptions where feed=1"), 1);
    EXPECT_TRUE(isPlistSaved());
    theirs->deleteRow();
    EXPECT_EQ(count("Feeds"), 0);
    EXPECT_EQ(count("Subscriptions where feed!=0"), 0);
    EXPECT_TRUE(isPlistSaved());
}

TEST_F(SubscriptionCoreTest, OfNoFeedIsJustDeleted) {
    settings->deleteRow();
    EXPECT_EQ(count("Subscriptions where feed=0"), 0);
    EXPECT_EQ(count("Feeds"), 1);
}

TEST_F(SubscriptionCoreTest, ThatWasNeverSavedIsNotSavedByItsOwners) {
    auto* made = row<SubscriptionCore>();
    made->setClient(client);
    made->setFeed(feed);
    made->deleteRow();
    client->saveChanges();
    feed->saveChanges();
    EXPECT_EQ(count("Subscriptions"), 2);
    EXPECT_EQ(count("Feeds"), 1);
}

TEST_F(SubscriptionCoreTest, IsThereAgainIfItsFeedCannotBeDeleted) {
    db().execute("create trigger Keep before delete on Feeds begin select raise(abort,'no'); end");
    EXPECT_ANY_THROW(mine->deleteRow());
    EXPECT_EQ(count("Subscriptions where feed=1"), 1);
    EXPECT_EQ(count("Feeds"), 1);
}

TEST_F(SubscriptionCoreTest, RefreshesItsFeed) {
    FakeFeeders feeders;
    EXPECT_TRUE(mine->startRefresh());
    EXPECT_EQ(feeders.feeder->calls, "refresh(0,1) ");
    EXPECT_FALSE(settings->startRefresh());
    feed->removeFeeder();
    becomeReader();
    ClientAgent agent;
    EXPECT_TRUE(SubscriptionCore::getRow(2)->startRefresh());
    EXPECT_EQ(agent.calls, "refresh(1,1) ");
}
