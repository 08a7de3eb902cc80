#include <Orvane/OVFeed.h>

#include "Bridges/BridgeTest.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationNames.h"

#include <stdexcept>

using namespace Foundation;
using namespace Orvane;

namespace {

namespace Names = Foundation::NotificationNames;

constexpr const char* kRDF =
    "<rdf:RDF xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#' "
    "xmlns='http://purl.org/rss/1.0/' xmlns:x='urn:x'>"
    "<channel><title>T</title><link>http://e.org/</link><x:a/><items/></channel>"
    "<item><title>I</title></item></rdf:RDF>";
constexpr const char* kAtom =
    "<feed xmlns='http://www.w3.org/2005/Atom' xmlns:x='urn:x'><title>T</title>"
    "<id>urn:f</id><link rel='self' href='/f'/><x:a/>"
    "<entry><id>urn:1</id><title>One</title></entry></feed>";

class OVFeedTest : public BridgeTest {
 protected:
    static std::shared_ptr<OVFeed> parsed(const char* document) {
        return OVFeed::create(document, kAddress);
    }
    static Strings namesOf(const std::vector<OVXMLElement>& elements) {
        Strings names;
        for (const OVXMLElement& element : elements) {
            names.push_back(element.name());
        }
        return names;
    }
    static void agentDies() {
        NotificationCenter::getLocal()->post(Names::kAgentDied, nullptr, nullptr);
    }

    FakeFeeders feeders;
};

}  // namespace

TEST_F(OVFeedTest, IsInMemoryAtFirst) {
    const std::shared_ptr<OVFeed> feed = OVFeed::create(kAddress);
    ASSERT_TRUE(feed);
    EXPECT_EQ(feed->URL(), kAddress);
    EXPECT_FALSE(feed->client());
    EXPECT_FALSE(feed->settings());
    EXPECT_EQ(feed->unreadCount(), 0);
    EXPECT_FALSE(feed->isRefreshing());
    EXPECT_FALSE(feed->nextRefreshDate());
    EXPECT_EQ(feed->description(), "OVFeed[<http://example.org/feed> 0/0]");
    EXPECT_TRUE(agent->calls.empty());
    EXPECT_EQ(count("Feeds"), 0);
}

TEST_F(OVFeedTest, IsNotMadeOfWhatIsNoURL) {
    EXPECT_NE(exceptionOf([] { OVFeed::create(""); }), "none");
    EXPECT_NE(exceptionOf([] { OVFeed::create("no url"); }), "none");
    EXPECT_FALSE(OVFeed::create("gopher://example.org"));
}

TEST_F(OVFeedTest, IsReadFromADocument) {
    const std::shared_ptr<OVFeed> feed = parsed(kAtom);
    ASSERT_TRUE(feed);
    EXPECT_EQ(feed->title(), "T");
    EXPECT_EQ(feed->feedFormat(), 2);
    const OVEntry::List entries = feed->entries();
    ASSERT_EQ(entries.size(), 1u);
    EXPECT_EQ(entries[0]->title(), "One");
    EXPECT_FALSE(entries[0]->isPersistent());
    EXPECT_EQ(entries[0]->feed(), feed);
    EXPECT_FALSE(parsed("no feed"));
    EXPECT_EQ(count("Feeds"), 0);
}

TEST_F(OVFeedTest, IsRefreshedInThisProcessWhileItIsInMemory) {
    PublicRecorder recorder;
    const std::shared_ptr<OVFeed> feed = OVFeed::create(kAddress);
    std::optional<OVError> error;
    EXPECT_TRUE(feed->refresh(&error));
    EXPECT_FALSE(error);
    EXPECT_EQ(feeders.feeder->calls, "refresh(0,1) ");
    EXPECT_TRUE(agent->calls.empty());
    EXPECT_TRUE(feed->isRefreshing());
    feeders.feeder->mRefreshStarted.invoke(feeders.feeder);
    EXPECT_EQ(recorder.names, Strings{"OVFeedRefreshing"});
    feeders.feeder->mRefreshFinished.invoke(feeders.feeder);
    EXPECT_FALSE(feed->isRefreshing());
    EXPECT_EQ(recorder.names.size(), 2u);
}

TEST_F(OVFeedTest, OutlivesItsRefresh) {
    std::weak_ptr<OVFeed> feed;
    {
        const std::shared_ptr<OVFeed> made = OVFeed::create(kAddress);
        EXPECT_TRUE(made->refresh());
        feed = made;
    }
    EXPECT_FALSE(feed.expired());
    feeders.feeder->mRefreshFinished.invoke(feeders.feeder);
    EXPECT_TRUE(feed.expired());
}

TEST_F(OVFeedTest, SaysWhyARefreshDidNotStart) {
    feeders.feeder->starts = false;
    const std::shared_ptr<OVFeed> feed = OVFeed::create(kAddress);
    std::optional<OVError> error;
    EXPECT_FALSE(feed->refresh(&error));
    ASSERT_TRUE(error);
    EXPECT_EQ(error->code(), OVInternalError);
    EXPECT_EQ(error->URL(), kAddress);
    feed->_internal()._feedCore()->setLastError({NetError::kHTTP, 404});
    EXPECT_FALSE(feed->refresh(&error));
    EXPECT_EQ(error->domain(), OVURLErrorDomain);
    EXPECT_EQ(error->code(), OVURLErrorFileDoesNotExist);
    EXPECT_EQ(feed->lastError(), error);
    EXPECT_FALSE(feed->refresh());
    EXPECT_FALSE(feed->isRefreshing());
}

TEST_F(OVFeedTest, IsRefreshedByTheAgentOnceItIsSubscribed) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    PublicRecorder recorder;
    EXPECT_TRUE(feed->refresh());
    EXPECT_EQ(agent->calls, Strings{"refresh(1)"});
    EXPECT_TRUE(feed->isRefreshing());
    EXPECT_EQ(agent->listened, 1);
    EXPECT_EQ(recorder.names, Strings{"OVFeedRefreshing"});
    EXPECT_EQ(recorder.last.object, feed);
}

TEST_F(OVFeedTest, IsNotRefreshedAnyMoreIfTheAgentDies) {
    addFeed(kAddress);
    RecordingDelegate delegate;
    const std::shared_ptr<OVClient> client = me();
    client->setDelegate(&delegate);
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_TRUE(feed->refresh());
    agentDies();
    EXPECT_FALSE(feed->isRefreshing());
    EXPECT_EQ(delegate.told, (Strings{"begin", "end"}));
    agentDies();
    EXPECT_EQ(delegate.told.size(), 2u);
    EXPECT_TRUE(feed->refresh());
    agentDies();
    EXPECT_EQ(delegate.told.size(), 4u);
    client->setDelegate(nullptr);
}

TEST_F(OVFeedTest, DiesWithTheAgentIfNobodyElseHoldsIt) {
    addFeed(kAddress);
    std::weak_ptr<OVFeed> feed;
    {
        const std::shared_ptr<OVFeed> held = feedOf();
        EXPECT_TRUE(held->refresh());
        feed = held;
    }
    EXPECT_FALSE(feed.expired());
    agentDies();
    EXPECT_TRUE(feed.expired());
}

TEST_F(OVFeedTest, IsAddedToAClientWithItsSettings) {
    const std::shared_ptr<OVClient> client = me();
    const std::shared_ptr<OVFeed> feed = OVFeed::create(kAddress);
    OVFeedSettings settings;
    settings.setRefreshInterval(60);
    settings.setEnclosureTypes(Strings{"audio/mpeg"});
    feed->setSettings(settings);
    EXPECT_EQ(feed->settings(), settings);
    EXPECT_TRUE(client->addFeed(feed));
    ASSERT_EQ(agent->calls.size(), 1u);
    EXPECT_EQ(agent->calls[0],
              "createSubscription(http://example.org/feed,{refreshInterval = 60, "
              "expirationInterval = 0, refreshesInBackground = 1, downloadsEnclosures = 0, "
              "maxEnclosureSize = 8388608, enclosureTypes = (audio/mpeg)})");
    EXPECT_EQ(feed->client(), client);
    EXPECT_EQ(feed->title(), "made");
    EXPECT_EQ(client->feeds(), std::vector<std::shared_ptr<OVFeed>>{feed});
    EXPECT_FALSE(feed->settings()->enclosureTypes());
}

TEST_F(OVFeedTest, IsNotAddedTwice) {
    const std::shared_ptr<OVClient> client = me();
    const std::shared_ptr<OVFeed> first = OVFeed::create(kAddress);
    const std::shared_ptr<OVFeed> second = OVFeed::create(kAddress);
    EXPECT_TRUE(client->addFeed(first));
    const Support::LoggingOn logging({&gLog});
    EXPECT_FALSE(client->addFeed(second));
    EXPECT_TRUE(log.contains("already has a feed with that URL"));
    EXPECT_FALSE(second->client());
    EXPECT_NE(
        exceptionOf([&] { client->addFeed(first); }).find("OVFeed already added to a OVClient"),
        std::string::npos);
    EXPECT_NE(exceptionOf([&] { client->addFeed(nullptr); }), "none");
}

TEST_F(OVFeedTest, IsNotAddedIfTheAgentRefuses) {
    const std::shared_ptr<OVClient> client = me();
    const std::shared_ptr<OVFeed> feed = OVFeed::create(kAddress);
    agent->refusesFeeds = true;
    EXPECT_FALSE(client->addFeed(feed));
    agent->fails = true;
    EXPECT_FALSE(client->addFeed(feed));
    EXPECT_FALSE(feed->client());
}

TEST_F(OVFeedTest, GoesOnInMemoryWhenItIsRemoved) {
    addFeed(kAddress);
    const std::shared_ptr<OVClient> client = me();
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_EQ(feed->unreadCount(), 0);
    EXPECT_TRUE(client->removeFeed(feed));
    EXPECT_EQ(agent->calls, Strings{"deleteSubscription"});
    EXPECT_FALSE(feed->client());
    EXPECT_EQ(feed->URL(), kAddress);
    EXPECT_FALSE(feed->title());
    EXPECT_TRUE(feed->entries().empty());
    EXPECT_TRUE(client->feeds().empty());
    EXPECT_TRUE(client->addFeed(feed));
    EXPECT_EQ(feed->client(), client);
}

TEST_F(OVFeedTest, StaysIfTheAgentCannotRemoveIt) {
    addFeed(kAddress);
    const std::shared_ptr<OVClient> client = me();
    const std::shared_ptr<OVFeed> feed = feedOf();
    agent->fails = true;
    EXPECT_FALSE(client->removeFeed(feed));
    EXPECT_EQ(feed->client(), client);
    EXPECT_EQ(feed->title(), "A feed");
}

TEST_F(OVFeedTest, HasSettingsThatTheAgentChanges) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_EQ(feed->settings(), OVFeedSettings::defaultFeedSettings());
    OVFeedSettings settings;
    settings.setDownloadsEnclosures(true);
    settings.setEnclosureTypes(Strings{"a/b", "c/d"});
    feed->setSettings(settings);
    EXPECT_EQ(agent->calls, Strings{"updateSubscription(0,0,1,1,8388608,(a/b, c/d))"});
    EXPECT_TRUE(feed->settings()->downloadsEnclosures());
    feed->setSettings(std::nullopt);
    EXPECT_EQ(feed->settings(), OVFeedSettings::defaultFeedSettings());
    agent->fails = true;
    EXPECT_NE(exceptionOf([&] { feed->setSettings(settings); }), "none");
}

TEST_F(OVFeedTest, HasALoginThatTheAgentChanges) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_FALSE(feed->login());
    feed->setLogin("me");
    EXPECT_EQ(agent->calls, Strings{"setLogin(me)"});
    EXPECT_EQ(feed->login(), "me");
    agent->fails = true;
    EXPECT_EQ(exceptionOf([&] { feed->setLogin("you"); }), "Orvane: -setLogin failed");
}

TEST_F(OVFeedTest, StoresItsPassword) {
    FakeCredentials credentials;
    OVFeed::create(kAddress)->setPassword("secret");
    EXPECT_EQ(credentials.saved, "http://example.org/feed (null) secret ");
}

TEST_F(OVFeedTest, HasTheEntriesThatHaveNotExpiredForItsSubscription) {
    const long long id = addFeed(kAddress);
    addEntry(id, "old", -1000);
    addEntry(id, "new", -10);
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_EQ(feed->entries().size(), 2u);
    write(OVFormat("update Subscriptions set expirationDate=%f where feed!=0", kNow - 500));
    announce();
    const OVEntry::List entries = feed->entries();
    ASSERT_EQ(entries.size(), 1u);
    EXPECT_EQ(entries[0]->identifier(), "new");
    EXPECT_EQ(entries[0]->feed(), feed);
}

TEST_F(OVFeedTest, SortsEntriesByDescriptors) {
    const long long id = addFeed(kAddress);
    addEntry(id, "1", -10, "b");
    addEntry(id, "2", -20, "a");
    addEntry(id, "3", -30, "b");
    const auto byTitle = [](const OVEntry& a, const OVEntry& b) {
        return a.title()->compare(*b.title());
    };
    const auto byDate = [](const OVEntry& a, const OVEntry& b) {
        return a.localDateCreated() < b.localDateCreated() ? -1 : 1;
    };
    std::string order;
    for (const auto& entry : feedOf()->entryEnumeratorSortedBy({byTitle, byDate})) {
        order += *entry->identifier();
    }
    EXPECT_EQ(order, "231");
    EXPECT_EQ(feedOf()->entryEnumeratorSortedBy({}).size(), 3u);
}

TEST_F(OVFeedTest, TellsNoUnreadCountBeforeItIsAskedFor) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    write("update Subscriptions set unreadCount=5 where feed!=0");
    PublicRecorder recorder;
    feed->_internal()._checkForUnreadCountChange();
    EXPECT_TRUE(recorder.names.empty());
    EXPECT_EQ(feed->unreadCount(), 5);
    write("update Subscriptions set unreadCount=6 where feed!=0");
    static_cast<void>(feed->title());  // sees that the file has changed
    const Support::LoggingOn logging({&gLog, &gLogAPI});
    feed->_internal()._checkForUnreadCountChange();
    EXPECT_EQ(recorder.names, Strings{"OVFeedUnreadCountChanged"});
    EXPECT_TRUE(log.contains("changed from 5 to 6"));
}

TEST_F(OVFeedTest, PostsAChangeWithoutListsToo) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    PublicRecorder recorder;
    feed->_internal()._sendEntryNotifications();
    EXPECT_EQ(recorder.names,
              (Strings{"OVFeedRefreshing", "OVFeedEntriesChanged", "OVFeedRefreshing"}));
}

TEST_F(OVFeedTest, IsRefreshedWithOthersWhileItIsInMemory) {
    const std::shared_ptr<OVClient> client = me();
    const std::shared_ptr<OVFeed> feed = OVFeed::create(kAddress);
    client->refreshFeeds({nullptr, feed});
    EXPECT_EQ(feeders.feeder->calls, "refresh(0,1) ");
    EXPECT_TRUE(feed->isRefreshing());
    EXPECT_TRUE(agent->calls.empty());
    feeders.feeder->mRefreshFinished.invoke(feeders.feeder);
}

TEST_F(OVFeedTest, LogsThatItKeepsSettingsAndListensForTheAgent) {
    const Support::LoggingOn logging({&gLog, &gLogAPI, &gLogIPC});
    OVFeed::create(kAddress)->setSettings(OVFeedSettings());
    EXPECT_TRUE(
        log.contains("Storing in-memory settings for unsubscribed feed "
                     "OVFeed[<http://example.org/feed> 0/0]"));
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_TRUE(feed->refresh());
    EXPECT_TRUE(feed->refresh());
    EXPECT_EQ(log.count(feed->description() + " listening for agent-died notifications"), 1);
    agentDies();
}

TEST_F(OVFeedTest, EndsItsRefreshIfChangesCannotBeTold) {
    addFeed(kAddress);
    RecordingDelegate delegate;
    const std::shared_ptr<OVClient> client = me();
    client->setDelegate(&delegate);
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_EQ(feed->unreadCount(), 0);
    delegate.also = [&] {
        if (delegate.told.size() > 1) return;
        feed->_internal()._subscriptionCore()->mUnreadCount.unload();
        write("alter table Subscriptions rename to Gone");
    };
    EXPECT_THROW(feed->_internal()._sendEntryNotifications(), std::exception);
    EXPECT_FALSE(feed->isRefreshing());
    EXPECT_EQ(delegate.told, (Strings{"begin", "end"}));
    client->setDelegate(nullptr);
}

TEST_F(OVFeedTest, IsDueAnIntervalAfterItsLastRefresh) {
    const long long id = addFeed(kAddress);
    session.run(kMe);
    write(OVFormat("update Feeds set refreshLocalDate=%f where rowID=%lli", kNow - 100, id));
    announce();
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_EQ(feed->nextRefreshDate(), OVDate(kNow - 100 + 1800));
    EXPECT_EQ(feed->lastRefreshDate(), OVDate(kNow - 100));
    write("update Subscriptions set refreshInterval=-1 where feed!=0");
    EXPECT_FALSE(feed->nextRefreshDate());
}

TEST_F(OVFeedTest, KnowsTheErrorOfItsLastRefresh) {
    const long long id = addFeed(kAddress);
    EXPECT_FALSE(feedOf()->lastError());
    write(OVFormat("update Feeds set lastErrorDomain=%lli,lastErrorCode=401 where rowID=%lli",
                   static_cast<long long>(NetError::kHTTP), id));
    const std::optional<OVError> error = feedOf()->lastError();
    ASSERT_TRUE(error);
    EXPECT_EQ(error->code(), OVURLErrorUserAuthenticationRequired);
    EXPECT_EQ(error->URL(), kAddress);
}

TEST_F(OVFeedTest, GivesItsDocumentWithoutTheEntries) {
    const std::shared_ptr<OVFeed> atom = parsed(kAtom);
    EXPECT_EQ(atom->XMLData(), kAtom);
    EXPECT_EQ(namesOf(atom->XMLRepresentation()->children()),
              (Strings{"title", "id", "link", "x:a", "entry"}));
    EXPECT_EQ(namesOf(atom->XMLRepresentationWithEntries(true)->children()).size(), 5u);
    EXPECT_EQ(namesOf(atom->XMLRepresentationWithEntries(false)->children()),
              (Strings{"title", "id", "link", "x:a"}));
    const OVXMLElement rdf = *parsed(kRDF)->XMLRepresentationWithEntries(false);
    // The items are not in the namespace of the root.
    EXPECT_EQ(namesOf(rdf.children()), (Strings{"channel", "item"}));
    EXPECT_EQ(namesOf(rdf.children()[0].children()), (Strings{"title", "link", "x:a"}));
}

TEST_F(OVFeedTest, LeavesTheItemsOfPlainRSSWhereTheyAre) {
    const OVXMLElement rss =
        *parsed(
             "<rss version='2.0'><channel><title>T</title><item><title>I</title></item>"
             "</channel></rss>")
             ->XMLRepresentationWithEntries(false);
    EXPECT_EQ(namesOf(rss.children()[0].children()), (Strings{"title", "item"}));
}

TEST_F(OVFeedTest, GivesExtensionsByNamespace) {
    for (const char* document : {kAtom, kRDF}) {
        const std::shared_ptr<OVFeed> feed = parsed(document);
        EXPECT_EQ(namesOf(feed->extensionXMLElementsUsingNamespace(std::nullopt)), Strings{"x:a"});
        EXPECT_EQ(namesOf(feed->extensionXMLElementsUsingNamespace("urn:x")), Strings{"x:a"});
        EXPECT_TRUE(feed->extensionXMLElementsUsingNamespace("urn:y").empty());
    }
}

TEST_F(OVFeedTest, GivesItsLinks) {
    const std::vector<OVLink> links = parsed(kAtom)->links();
    ASSERT_EQ(links.size(), 1u);
    EXPECT_EQ(links[0].linkKind(), OVLink::Kind::Self);
    EXPECT_EQ(links[0].URL(), "http://example.org/f");
}

TEST_F(OVFeedTest, GivesWhatItSaysOfItself) {
    const long long id = addFeed(kAddress, "The title");
    write(
        OVFormat("update Feeds set subtitle='Sub',rights='All',dateUpdated=5,url='%s',"
                 "alternateUrl='http://e.org/page',iconUrl='http://e.org/icon',"
                 "logoUrl='http://e.org/logo',redirectedUrl='http://e.org/to',"
                 "localDateUpdated=6,feedFormat=1,localDateCreatedOfNewestEntry=7 "
                 "where rowID=%lli",
                 kAddress, id));
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_EQ(feed->identifier(), "id-http://example.org/feed");
    EXPECT_EQ(feed->title(), "The title");
    EXPECT_EQ(feed->subtitle(), "Sub");
    EXPECT_EQ(feed->rights(), "All");
    EXPECT_EQ(feed->dateUpdated(), OVDate(5));
    EXPECT_FALSE(feed->timeZoneUpdated());
    EXPECT_EQ(feed->alternateURL(), "http://e.org/page");
    EXPECT_EQ(feed->iconURL(), "http://e.org/icon");
    EXPECT_EQ(feed->logoURL(), "http://e.org/logo");
    EXPECT_EQ(feed->redirectedURL(), "http://e.org/to");
    EXPECT_EQ(feed->localDateUpdated(), OVDate(6));
    EXPECT_EQ(feed->feedFormat(), 1);
    EXPECT_EQ(feed->localDateCreatedOfNewestEntry(), OVDate(7));
}

TEST_F(OVFeedTest, ThrowsFromGettersAndReportsFromListsIfNothingCanBeRead) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    feed->_internal()._feedCore()->unload();
    db().close(false);
    EXPECT_NE(
        exceptionOf([&] { static_cast<void>(feed->subtitle()); }).find("during -[OVFeed subtitle]"),
        std::string::npos);
    EXPECT_TRUE(feed->entries().empty());
    EXPECT_TRUE(log.contains("-[OVFeed entries]"));
}
