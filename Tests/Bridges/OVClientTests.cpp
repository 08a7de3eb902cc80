#include <Orvane/OVClient.h>

#include "Bridges/BridgeTest.h"

using namespace Foundation;
using namespace Orvane;

namespace {

class OVClientTest : public BridgeTest {};

}  // namespace

TEST_F(OVClientTest, IsMadeOnceForEachApplication) {
    const std::shared_ptr<OVClient> client = OVClient::applicationClient();
    ASSERT_TRUE(client);
    EXPECT_EQ(agent->calls, Strings{"createClient(org.example.Me)"});
    EXPECT_EQ(client->signature(), kMe);
    EXPECT_FALSE(client->isPrivate());
    EXPECT_EQ(OVClient::applicationClient(), client);
    EXPECT_EQ(OVClient::clientForBundleIdentifier(kMe), client);
    EXPECT_EQ(agent->calls.size(), 1u);
    EXPECT_EQ(count("Clients"), 1);
}

TEST_F(OVClientTest, IsNullWithTheReasonIfTheAgentCannotMakeIt) {
    agent->fails = true;
    std::optional<OVError> error;
    EXPECT_FALSE(OVClient::applicationClient(&error));
    ASSERT_TRUE(error);
    EXPECT_EQ(error->domain(), OVErrorDomain);
    EXPECT_EQ(error->code(), OVAgentLaunchError);
    EXPECT_TRUE(log.contains("+[OVClient clientForBundleIdentifier:]"));
    agent->fails = false;
    EXPECT_TRUE(OVClient::applicationClient(&error));
    EXPECT_FALSE(error);
}

TEST_F(OVClientTest, WantsAnIdentifier) {
    EXPECT_NE(exceptionOf([] { OVClient::clientForBundleIdentifier(""); }), "none");
}

TEST_F(OVClientTest, TakesTheApplicationsIdentifierBeforeItsFirstUseAlone) {
    ApplicationIdentity::_forget();
    OVClient::setApplicationIdentifier("org.example.Named");
    EXPECT_EQ(OVClient::applicationClient()->signature(), "org.example.Named");
    EXPECT_NE(exceptionOf([] { OVClient::setApplicationIdentifier("org.example.Else"); }), "none");
}

TEST_F(OVClientTest, IsNullIfTheApplicationHasNoIdentifier) {
    ApplicationIdentity::_forget();
    ApplicationIdentity::setIdentifier(ApplicationIdentity::kUnknown);
    std::optional<OVError> error;
    EXPECT_FALSE(OVClient::applicationClient(&error));
    EXPECT_FALSE(error);
    EXPECT_TRUE(agent->calls.empty());
    EXPECT_TRUE(
        log.contains("Call to [[PNBundle mainBundle] bundleIdentifier] resulted in nil.  Returning "
                     "nil for applicationClient."));
}

TEST_F(OVClientTest, LogsWhichRowItIs) {
    const Support::LoggingOn logging({&gLog, &gLogAPIVerbose});
    const std::shared_ptr<OVClient> client = OVClient::applicationClient();
    EXPECT_TRUE(
        log.contains(OVFormat("+clientForBundleIdentifier = %@", client->_internal().peek())));
    EXPECT_TRUE(log.contains("INIT OVClient[org.example.Me]"));
}

TEST_F(OVClientTest, OfAnotherApplicationIsNotGivenIfItIsPrivate) {
    EXPECT_TRUE(OVClient::clientForBundleIdentifier("org.example.Open"));
    EXPECT_TRUE(OVClient::clientForBundleIdentifier("org.example.Closed"));
    write("update Clients set private=1 where signature='org.example.Closed'");
    announce();
    me()->setPrivate(true);
    std::optional<OVError> error;
    EXPECT_FALSE(OVClient::clientForBundleIdentifier("org.example.Closed", &error));
    EXPECT_FALSE(error);
    EXPECT_TRUE(log.contains("Attempt to access private OVClient 'org.example.Closed'"));
    EXPECT_TRUE(OVClient::clientForBundleIdentifier("org.example.Open"));
    EXPECT_TRUE(OVClient::clientForBundleIdentifier(kMe));
    EXPECT_EQ(OVClient::allClientBundleIdentifiers(), (Strings{"org.example.Open", kMe}));
}

TEST_F(OVClientTest, IsMadePrivateByTheAgent) {
    const std::shared_ptr<OVClient> client = me();
    client->setPrivate(true);
    EXPECT_EQ(agent->calls, Strings{"setPrivate(1)"});
    EXPECT_TRUE(client->isPrivate());
    agent->fails = true;
    EXPECT_EQ(exceptionOf([&] { client->setPrivate(false); }), "Orvane: -setPrivate failed");
}

TEST_F(OVClientTest, SaysWhatFailedInASetter) {
    const std::shared_ptr<OVClient> client = me();
    agent->fails = true;
    try {
        client->setPrivate(true);
        FAIL();
    } catch (const OVException& exception) {
        ASSERT_TRUE(exception.error());
        EXPECT_EQ(exception.error()->code(), OVAgentLaunchError);
    }
}

TEST_F(OVClientTest, HasSettingsThatGoForAllFeeds) {
    const std::shared_ptr<OVClient> client = me();
    EXPECT_EQ(client->settings(), OVFeedSettings::defaultClientSettings());
    OVFeedSettings settings = client->settings();
    settings.setRefreshInterval(600);
    client->setSettings(settings);
    EXPECT_EQ(agent->calls, Strings{"updateSubscription(600,1209600,1,0,8388608,(null))"});
    EXPECT_EQ(client->settings().refreshInterval(), 600);
    client->setSettings(std::nullopt);
    EXPECT_EQ(client->settings(), OVFeedSettings::defaultClientSettings());
}

TEST_F(OVClientTest, ThrowsWithoutItsSettingsRow) {
    const std::shared_ptr<OVClient> client = me();
    write("delete from Subscriptions");
    announce();
    EXPECT_NE(exceptionOf([&] {
                  static_cast<void>(client->settings());
              }).find("Missing default subscription for OVClient[org.example.Me]"),
              std::string::npos);
}

TEST_F(OVClientTest, AsksTheAgentToSync) {
    EXPECT_TRUE(OVClient::startSync());
    EXPECT_EQ(agent->calls, Strings{"startSync"});
    agent->answer = false;
    EXPECT_FALSE(OVClient::startSync());
    agent->fails = true;
    EXPECT_FALSE(OVClient::startSync());
}

TEST_F(OVClientTest, ListsItsFeedsWithoutTheSettings) {
    EXPECT_TRUE(me()->feeds().empty());
    addFeed("http://e.org/1", "One");
    addFeed("http://e.org/2", "Two");
    std::set<std::optional<std::string>> titles;
    for (const std::shared_ptr<OVFeed>& feed : me()->feeds()) {
        titles.insert(feed->title());
        EXPECT_EQ(feed->client(), me());
    }
    EXPECT_EQ(titles, (std::set<std::optional<std::string>>{"One", "Two"}));
}

TEST_F(OVClientTest, FindsFeedsByURLAndByIdentifier) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = me()->feedWithURL(kAddress);
    ASSERT_TRUE(feed);
    EXPECT_EQ(me()->feedWithIdentifier("id-http://example.org/feed"), feed);
    EXPECT_FALSE(me()->feedWithURL("http://example.org/other"));
    EXPECT_FALSE(me()->feedWithIdentifier("none"));
    EXPECT_NE(exceptionOf([&] { me()->feedWithURL("not a url"); }), "none");
}

TEST_F(OVClientTest, SubscribesToAURL) {
    const std::shared_ptr<OVFeed> feed = me()->addFeedWithURL(kAddress);
    ASSERT_TRUE(feed);
    EXPECT_EQ(agent->calls, Strings{"createSubscription(http://example.org/feed,(null))"});
    EXPECT_EQ(feed->URL(), kAddress);
    EXPECT_EQ(me()->feeds(), std::vector<std::shared_ptr<OVFeed>>{feed});
    // A second time gives the feed that there is.
    EXPECT_EQ(me()->addFeedWithURL(kAddress), feed);
    EXPECT_TRUE(agent->calls.empty());
}

TEST_F(OVClientTest, SaysWhyItCouldNotSubscribe) {
    const std::shared_ptr<OVClient> client = me();
    std::optional<OVError> error;
    agent->refusesFeeds = true;
    EXPECT_FALSE(client->addFeedWithURL(kAddress, &error));
    EXPECT_FALSE(error);
    agent->fails = true;
    EXPECT_FALSE(client->addFeedWithURL(kAddress, &error));
    ASSERT_TRUE(error);
    EXPECT_EQ(error->code(), OVAgentLaunchError);
}

TEST_F(OVClientTest, RemovesNoFeedOfAnotherClient) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    const std::shared_ptr<OVClient> other =
        OVClient::clientForBundleIdentifier("org.example.Other");
    EXPECT_FALSE(other->removeFeed(feed));
    EXPECT_FALSE(other->removeFeed(nullptr));
    EXPECT_EQ(feed->client(), me());
    EXPECT_TRUE(me()->removeFeed(feed));
    EXPECT_FALSE(feed->client());
    agent->calls.clear();
    EXPECT_TRUE(me()->removeFeed(feed));
    EXPECT_TRUE(agent->calls.empty());
}

TEST_F(OVClientTest, RefreshesFeedsWithoutForce) {
    const long long one = addFeed("http://e.org/1");
    const long long two = addFeed("http://e.org/2");
    me()->refreshFeeds();
    EXPECT_EQ(agent->calls, Strings{OVFormat("refreshMultiple(%lli %lli,0)", one, two)});
    const std::shared_ptr<OVClient> client = me();
    client->refreshFeeds({client->feedWithURL("http://e.org/2")});
    EXPECT_EQ(agent->calls, Strings{OVFormat("refreshMultiple(%lli,0)", two)});
    agent->calls.clear();
    client->refreshFeeds({});
    EXPECT_TRUE(agent->calls.empty());
    agent->fails = true;
    EXPECT_EQ(exceptionOf([&] { client->refreshFeeds(); }), "Orvane: -refreshFeeds failed");
}

TEST_F(OVClientTest, CatchesUpWithFeedsThatAreNotRefreshedInTheBackground) {
    const long long feed = addFeed(kAddress);
    addFeed("http://e.org/2");
    write(OVFormat("update Subscriptions set refreshesInBackground=0 where feed=%lli", feed));
    write(OVFormat("update Feeds set refreshLocalDate=%f", kNow - 4000));
    announce();
    const std::shared_ptr<OVClient> client = me();
    clock.advanceBy(4.9);
    EXPECT_TRUE(agent->calls.empty());
    clock.advanceBy(0.1);
    EXPECT_EQ(agent->calls, Strings{OVFormat("refreshMultiple(%lli,0)", feed)});
}

TEST_F(OVClientTest, FindsAnEntryWithItsFeed) {
    const long long feed = addFeed(kAddress);
    addEntry(feed, "e1");
    const std::shared_ptr<OVEntry> entry = me()->entryWithIdentifier("e1");
    ASSERT_TRUE(entry);
    EXPECT_EQ(entry->identifier(), "e1");
    EXPECT_EQ(entry->feed(), feedOf());
    EXPECT_FALSE(me()->entryWithIdentifier("none"));
}

TEST_F(OVClientTest, LetsEntriesExpire) {
    me()->expireAllEntries();
    EXPECT_EQ(agent->calls, Strings{"expireAll"});
    const std::shared_ptr<OVClient> client = me();
    agent->fails = true;
    EXPECT_EQ(exceptionOf([&] { client->expireAllEntries(); }), "Orvane: -expireAllEntries failed");
}

TEST_F(OVClientTest, ListsEnclosuresAndThoseBeingDownloaded) {
    const long long entry = addEntry(addFeed(kAddress), "e1");
    for (int state = 0; state <= 5; ++state) {
        write(
            OVFormat("insert into Enclosures (entry,url,downloadState) values "
                     "(%lli,'http://e.org/%d',%d)",
                     entry, state, state));
    }
    EXPECT_EQ(me()->enclosures().size(), 6u);
    std::set<int> states;
    for (const std::shared_ptr<OVEnclosure>& each : me()->enclosuresBeingDownloaded()) {
        states.insert(each->downloadState());
        EXPECT_EQ(each->entry()->feed(), feedOf());
    }
    EXPECT_EQ(states, (std::set<int>{1, 2}));
}

TEST_F(OVClientTest, UsesTheXMLOfEntriesUnlessItIsTold) {
    EXPECT_TRUE(me()->_usesExtensionXML());
    me()->_setUsesExtensionXML(false);
    EXPECT_FALSE(me()->_internal().core().mUsesXML);
}

TEST_F(OVClientTest, TurnsTheLogOnAndOff) {
    OVClient::_enableOVLogging(true);
    EXPECT_TRUE(Foundation::gLog.willLog());
    OVClient::_enableOVLogging(false);
    EXPECT_FALSE(Foundation::gLog.willLog());
}

TEST_F(OVClientTest, GivesRightAnswersToWhoTurnsNoLoop) {
    const long long id = addFeed(kAddress);
    addEntry(id, "e1");
    const std::shared_ptr<OVFeed> feed = feedOf();
    const std::shared_ptr<OVEntry> entry = feed->entries().at(0);
    EXPECT_FALSE(entry->isRead());
    EXPECT_EQ(feed->unreadCount(), 0);
    // Nothing of this is announced.
    write("update Entries set read=1");
    write("update Subscriptions set unreadCount=3 where feed!=0");
    write("update Feeds set title='Another'");
    EXPECT_TRUE(entry->isRead());
    EXPECT_EQ(feed->unreadCount(), 3);
    EXPECT_EQ(feed->title(), "Another");
    addEntry(id, "e2");
    EXPECT_EQ(feed->entries().size(), 2u);
}
