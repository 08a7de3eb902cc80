#include "Bridges/BridgeTest.h"
#include "Foundation/NotificationNames.h"

#include <Orvane/OVClient.h>

#include <stdexcept>

using namespace Foundation;
using namespace Orvane;

// What a client hears of, and what it tells.

namespace {

namespace Names = Foundation::NotificationNames;

class OVClientChangesTest : public BridgeTest {
 protected:
    OVClientChangesTest() {
        feedID = addFeed(kAddress);
        announce();
        client = me();
        client->setDelegate(&delegate);
        told.clear();
    }
    ~OVClientChangesTest() noexcept override { client->setDelegate(nullptr); }

    /// A second later, so that what is written next is later than what has been told.
    void later(double seconds = 1) { clock.advanceBy(seconds); }
    /// Changes an entry's content, and says so, now.
    void update(long long entry) {
        write(
            OVFormat("update Entries set title='New',localDateUpdated=%f,localDateXmlChanged=%f "
                     "where rowID=%lli",
                     clock.now(), clock.now(), entry));
    }
    void flag(long long entry) {
        write(OVFormat("update Entries set flagged=1,localDateFlagsUpdated=%f where rowID=%lli",
                       clock.now(), entry));
    }
    long long addEntryNow(const std::string& identifier) {
        return addEntry(feedID, identifier, clock.now() - kNow);
    }
    /// What the delegate was told since the last call.
    Strings take() { return std::exchange(delegate.told, {}); }

    RecordingDelegate delegate;
    std::shared_ptr<OVClient> client;
    long long feedID = 0;
    Strings told;
};

}  // namespace

TEST_F(OVClientChangesTest, TellsOfANewEntryInsideARefresh) {
    PublicRecorder recorder;
    later();
    addEntryNow("e1");
    announce();
    EXPECT_EQ(take(), (Strings{"begin", "added e1", "end"}));
    EXPECT_EQ(delegate.lastFeed, client->feedWithURL(kAddress));
    EXPECT_EQ(recorder.names,
              (Strings{"OVFeedRefreshing", "OVFeedEntriesChanged", "OVFeedRefreshing"}));
}

TEST_F(OVClientChangesTest, PostsTheListsUnderTheirKeys) {
    later();
    const long long old = addEntryNow("old");
    const long long seen = addEntryNow("seen");
    announce();
    later();
    OVNotification last;
    const auto observation = OVNotificationCenter::defaultCenter().addObserver(
        OVFeedEntriesChangedNotification, nullptr,
        [&](const OVNotification& notification) { last = notification; });
    addEntryNow("new");
    update(old);
    flag(seen);
    announce();
    EXPECT_EQ(last.object, client->feedWithURL(kAddress));
    ASSERT_EQ(last.info.size(), 3u);
    const auto first = [&](const char* key) {
        return std::get<OVEntry::List>(last.info.at(key)).at(0)->identifier();
    };
    EXPECT_EQ(first("AddedEntries"), "new");
    EXPECT_EQ(first("UpdatedEntries"), "old");
    EXPECT_EQ(first("OVFeedDidChangeEntryFlagsKey"), "seen");
}

TEST_F(OVClientChangesTest, TellsInOneOrderWhatHappened) {
    later();
    const long long one = addEntryNow("one");
    const long long two = addEntryNow("two");
    addEntry(feedID, "expired", -1209600 + 3);
    announce();
    take();
    later();
    update(one);
    flag(two);
    addEntryNow("three");
    announce();
    EXPECT_EQ(take(), (Strings{"begin", "added three", "updated one", "flags two", "end"}));
}

TEST_F(OVClientChangesTest, TellsOfBothContentAndFlagsOfOneEntry) {
    later();
    const long long entry = addEntryNow("e1");
    announce();
    take();
    later();
    update(entry);
    flag(entry);
    announce();
    EXPECT_EQ(take(), (Strings{"begin", "updated e1", "flags e1", "end"}));
}

TEST_F(OVClientChangesTest, TellsOnceOfAnEntryThatWasAddedAndChanged) {
    later();
    const long long entry = addEntryNow("e1");
    update(entry);
    flag(entry);
    announce();
    EXPECT_EQ(take(), (Strings{"begin", "added e1", "end"}));
}

TEST_F(OVClientChangesTest, TellsOfAnExpiredEntryAsOneThatIsGone) {
    const double interval = SubscriptionCore::kDefaultExpirationInterval;
    addEntry(feedID, "old", -interval + 10);
    announce();
    take();
    later(11);
    addEntryNow("new");
    announce();
    EXPECT_EQ(take(), (Strings{"begin", "added new", "removed old", "end"}));
}

TEST_F(OVClientChangesTest, TellsAllSinceADateOnRequest) {
    addEntry(feedID, "e1", -50);
    addEntry(feedID, "e2", -150);
    announce();
    EXPECT_EQ(take(), Strings());
    client->sendChangesSinceDate(OVDate(kNow - 100));
    EXPECT_EQ(take(), (Strings{"begin", "added e1", "end"}));
    EXPECT_EQ(client->dateLastUpdated(), OVDate(kNow - 50));
    client->sendChangesSinceDate(std::nullopt);
    EXPECT_EQ(take(), (Strings{"begin", "added e1 e2", "end"}));
}

TEST_F(OVClientChangesTest, BeginsWithNow) {
    EXPECT_EQ(client->dateLastUpdated(), OVDate(kNow));
    EXPECT_TRUE(client->tracksEntryChanges());
}

TEST_F(OVClientChangesTest, TellsNothingWhileItDoesNotTrackAndAllAfterwards) {
    client->setTracksEntryChanges(false);
    later();
    addEntryNow("e1");
    announce();
    EXPECT_EQ(take(), Strings());
    EXPECT_EQ(client->dateLastUpdated(), OVDate(kNow));
    client->setTracksEntryChanges(true);
    EXPECT_EQ(take(), Strings());
    later();
    addEntryNow("e2");
    announce();
    EXPECT_EQ(take(), (Strings{"begin", "added e1 e2", "end"}));
}

TEST_F(OVClientChangesTest, StaysInsideARefreshThatRuns) {
    deliver("com.tarnwick.orvane.FeedBeganUpdate", std::to_string(feedID));
    later();
    addEntryNow("e1");
    announce();
    deliver("com.tarnwick.orvane.FeedEndedUpdate", std::to_string(feedID));
    EXPECT_EQ(take(), (Strings{"begin", "added e1", "end"}));
}

TEST_F(OVClientChangesTest, ReadsAFeedAnewThatTheAgentHasRefreshed) {
    const std::shared_ptr<OVFeed> feed = client->feedWithURL(kAddress);
    deliver("com.tarnwick.orvane.FeedBeganUpdate", std::to_string(feedID));
    EXPECT_TRUE(feed->isRefreshing());
    EXPECT_EQ(feed->title(), "A feed");
    write("update Feeds set title='Another'");
    deliver("com.tarnwick.orvane.FeedEndedUpdate", std::to_string(feedID));
    EXPECT_FALSE(feed->isRefreshing());
    EXPECT_FALSE(feed->_internal()._feedCore()->mTitle.isLoaded());
    EXPECT_EQ(feed->title(), "Another");
}

TEST_F(OVClientChangesTest, IgnoresWhatIsSaidOfFeedsThatItHasNot) {
    for (const char* sender : {"999", "", "x", "0", "-1", "999,1,5", "0,1,5"}) {
        deliver("com.tarnwick.orvane.FeedBeganUpdate", sender);
        deliver("com.tarnwick.orvane.EnclosureDownloadProgress", sender);
    }
    deliver("com.tarnwick.orvane.EnclosureDownloadStarted", OVFormat("%lli,77,5", feedID));
    EXPECT_EQ(take(), Strings());
    EXPECT_FALSE(log.contains("WARNING"));
    EXPECT_FALSE(log.contains("Exception"));
}

TEST_F(OVClientChangesTest, TellsHowADownloadGoes) {
    const long long entry = addEntry(feedID, "e1");
    write(
        OVFormat("insert into Enclosures (entry,url,length,downloadState) values "
                 "(%lli,'http://e.org/file',100,2)",
                 entry));
    PublicRecorder recorder;
    deliver("com.tarnwick.orvane.EnclosureDownloadProgress", OVFormat("%lli,1,40", feedID));
    EXPECT_EQ(recorder.names, Strings{"OVEnclosureDownloadStateDidChange"});
    const auto enclosure = std::dynamic_pointer_cast<OVEnclosure>(recorder.last.object);
    ASSERT_TRUE(enclosure);
    EXPECT_EQ(enclosure->downloadState(), OVEnclosure::Downloading);
    write("update Enclosures set downloadState=3");
    deliver("com.tarnwick.orvane.EnclosureDownloadEnded", OVFormat("%lli,1,100", feedID));
    EXPECT_EQ(enclosure->downloadState(), OVEnclosure::Finished);
    EXPECT_EQ(recorder.names.size(), 2u);
}

TEST_F(OVClientChangesTest, TellsOfAnUnreadCountThatSomebodyHasAskedFor) {
    const std::shared_ptr<OVFeed> feed = client->feedWithURL(kAddress);
    write("update Subscriptions set unreadCount=2 where feed!=0");
    announce();
    EXPECT_EQ(take(), Strings());
    EXPECT_EQ(feed->unreadCount(), 2);
    PublicRecorder recorder;
    write("update Subscriptions set unreadCount=1 where feed!=0");
    announce();
    EXPECT_EQ(take(), Strings{"count"});
    EXPECT_EQ(recorder.names, Strings{"OVFeedUnreadCountChanged"});
    write("update Subscriptions set refreshInterval=99 where feed!=0");
    announce();
    EXPECT_EQ(take(), Strings());
}

TEST_F(OVClientChangesTest, SurvivesADelegateThatThrows) {
    int calls = 0;
    delegate.also = [&] {
        ++calls;
        throw std::runtime_error("mine");
    };
    later();
    addEntryNow("e1");
    announce();
    EXPECT_EQ(calls, 3);
    EXPECT_EQ(log.count("Exception notifying OVClient delegate: mine"), 3);
    EXPECT_FALSE(client->feedWithURL(kAddress)->isRefreshing());
}

TEST_F(OVClientChangesTest, KeepsTheDateIfChangesCannotBeRead) {
    db().close(false);
    client->_internal().sendChangesSinceDate(client->_internal().dateLastUpdated);
    EXPECT_TRUE(log.contains("-[OVClient sendChangesSinceDate:]"));
    EXPECT_EQ(client->dateLastUpdated(), OVDate(kNow));
}

TEST_F(OVClientChangesTest, HearsNothingOnceItIsGone) {
    OVClientInternal::applicationClient() = nullptr;
    std::weak_ptr<OVClient> gone = client;
    client->setDelegate(nullptr);
    client = nullptr;
    EXPECT_TRUE(gone.expired());
    addEntryNow("e1");
    announce();
    deliver("com.tarnwick.orvane.FeedBeganUpdate", std::to_string(feedID));
    EXPECT_EQ(take(), Strings());
    client = me();
}

TEST_F(OVClientChangesTest, LogsWhatItHearsAndTells) {
    const Support::LoggingOn logging({&gLog, &gLogAPI});
    const auto says = [&](const std::string& text) {
        return log.contains("OVClient[org.example.Me]" + text);
    };
    later();
    addEntryNow("e1");
    announce();
    EXPECT_TRUE(says(" notified of updated entries!"));
    EXPECT_TRUE(says(" sendChangesSinceDate: "));
    EXPECT_TRUE(log.contains("    found OVEntry["));
    EXPECT_TRUE(log.contains("...end sendChangesSinceDate -- new dateLastUpdated = "));
    write("update Subscriptions set unreadCount=1 where feed!=0");
    announce();
    EXPECT_TRUE(says(" checking subscriptions for changes"));
    client->setTracksEntryChanges(false);
    addEntryNow("e2");
    announce();
    EXPECT_TRUE(says(" ignoring entry updates (tracksEntryChanges is off)"));
    const std::string feed = client->feedWithURL(kAddress)->description();
    deliver("com.tarnwick.orvane.FeedBeganUpdate", std::to_string(feedID));
    EXPECT_TRUE(says(" notified: com.tarnwick.orvane.FeedBeganUpdate"));
    EXPECT_TRUE(says(": " + feed + " began refresh"));
    deliver("com.tarnwick.orvane.FeedEndedUpdate", std::to_string(feedID));
    EXPECT_TRUE(says(": " + feed + " ended refresh"));
    later(4);
    EXPECT_TRUE(says(": refreshNonBackgroundSubscriptions"));
}

TEST_F(OVClientChangesTest, LogsHowADownloadGoes) {
    write(
        OVFormat("insert into Enclosures (entry,url,length,downloadState) values "
                 "(%lli,'http://e.org/file',100,2)",
                 addEntry(feedID, "e1")));
    const Support::LoggingOn logging({&gLog, &gLogAPI});
    deliver("com.tarnwick.orvane.EnclosureDownloadProgress", OVFormat("%lli,1,40", feedID));
    EXPECT_TRUE(
        log.contains("OVEnclosure[<http://e.org/file> 1]: download status changed (state=2, "
                     "bytes=40, progress=0.000)"));
}

TEST_F(OVClientChangesTest, TakesProgressWithoutReading) {
    write(
        OVFormat("insert into Enclosures (entry,url,length,downloadState) values "
                 "(%lli,'http://e.org/file',100,2)",
                 addEntry(feedID, "e1")));
    const std::shared_ptr<OVEnclosure> enclosure = client->enclosures().at(0);
    EXPECT_EQ(enclosure->downloadState(), OVEnclosure::Downloading);
    const Support::LoggingOn logging({&gLog, &gLogDownload, &SQLite::gLogSQL});
    log.clear();
    deliver("com.tarnwick.orvane.EnclosureDownloadProgress", OVFormat("%lli,1,40", feedID));
    EXPECT_TRUE(log.contains("Notified of 40 downloaded bytes"));
    EXPECT_FALSE(log.contains("Enclosures"));
}

TEST_F(OVClientChangesTest, ReportsWhatFailsAsItHears) {
    db().close(false);
    deliver("com.tarnwick.orvane.FeedBeganUpdate", std::to_string(feedID));
    EXPECT_TRUE(log.contains("OVClient: Exception handling feed/encl change: "));
    EXPECT_EQ(take(), Strings());
}

TEST_F(OVClientChangesTest, TellsTwoClientsOfOneEntry) {
    const std::shared_ptr<OVClient> other =
        OVClient::clientForBundleIdentifier("org.example.Other");
    agent->addSubscription(other->_internal().core().getRowID(), feedID);
    announce();
    RecordingDelegate theirs;
    other->setDelegate(&theirs);
    later();
    addEntryNow("e1");
    announce();
    EXPECT_EQ(take(), (Strings{"begin", "added e1", "end"}));
    EXPECT_EQ(theirs.told, (Strings{"begin", "added e1", "end"}));
    EXPECT_EQ(delegate.lastFeed->client(), client);
    EXPECT_EQ(theirs.lastFeed->client(), other);
    other->setDelegate(nullptr);
}
