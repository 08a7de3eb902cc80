#include "Bridges/BridgeTest.h"

using namespace Foundation;
using namespace Orvane;

namespace {

/// The agent makes a new database, in which rows have other IDs.
class ReplacedDatabaseTest : public BridgeTest {
 protected:
    ReplacedDatabaseTest() {
        addEntry(addFeed(kAddress), "e1");
        announce();
        client = me();
        feed = feedOf();
        entry = feed->entries().at(0);
    }

    /// Moves all rows to other IDs while nobody reads, so that the old ones are of other things.
    void replace(const std::string& also = {}) {
        db().close(true);
        write(
            "update Clients set rowID=rowID+100; update Subscriptions set client=client+100;"
            "update Feeds set rowID=rowID+50; update Subscriptions set feed=feed+50 where feed!=0;"
            "update Subscriptions set rowID=rowID+30;"
            "update Entries set rowID=rowID+10,feed=feed+50;" +
            also);
        write(
            "insert into Clients (rowID,signature) values (1,'org.example.Else');"
            "insert into Feeds (rowID,url,title) values (1,'http://e.org/else','Else');"
            "insert into Entries (rowID,identifier,title) values (1,'else','Else')");
        db().open(path.c_str(), false);
    }

    std::shared_ptr<OVClient> client;
    std::shared_ptr<OVFeed> feed;
    std::shared_ptr<OVEntry> entry;
};

}  // namespace

TEST_F(ReplacedDatabaseTest, ObjectsFindThemselvesAgain) {
    replace();
    EXPECT_EQ(client->signature(), kMe);
    EXPECT_EQ(client->_internal().peek()->getRowID(), 101);
    EXPECT_EQ(feed->title(), "A feed");
    EXPECT_EQ(feed->_internal()._feedCore()->getRowID(), 51);
    EXPECT_EQ(entry->title(), "Title");
    EXPECT_EQ(entry->_internal().peek()->getRowID(), 11);
    EXPECT_EQ(entry->feed(), feed);
    EXPECT_EQ(feed->client(), client);
}

TEST_F(ReplacedDatabaseTest, NoSecondObjectIsMade) {
    replace();
    EXPECT_EQ(OVClient::clientForBundleIdentifier(kMe), client);
    EXPECT_EQ(OVClient::applicationClient(), client);
    EXPECT_EQ(client->feedWithURL(kAddress), feed);
    EXPECT_EQ(feed->entries(), OVEntry::List{entry});
    EXPECT_EQ(client->entryWithIdentifier("e1"), entry);
}

TEST_F(ReplacedDatabaseTest, EntriesThatWereLetGoOfAreFoundAsWell) {
    entry->_internal().peek()->unload();
    replace();
    EXPECT_EQ(entry->title(), "Title");
    EXPECT_EQ(entry->_internal().peek()->getRowID(), 11);
}

TEST_F(ReplacedDatabaseTest, NewRowsAreHeardOf) {
    replace();
    RecordingDelegate delegate;
    client->setDelegate(&delegate);
    clock.advanceBy(1);
    addEntry(51, "e2", 1);
    announce();
    EXPECT_EQ(delegate.told, (Strings{"begin", "added e2", "end"}));
    client->setDelegate(nullptr);
}

TEST_F(ReplacedDatabaseTest, AFeedThatIsNotThereIsOneInMemory) {
    replace("delete from Feeds; delete from Subscriptions where feed!=0; delete from Entries;");
    EXPECT_FALSE(feed->client());
    EXPECT_EQ(feed->URL(), kAddress);
    EXPECT_FALSE(feed->title());
    EXPECT_TRUE(client->feeds().empty());
    EXPECT_EQ(exceptionOf([&] { static_cast<void>(entry->title()); }).find("Orvane "), 0u);
    EXPECT_NE(exceptionOf([&] { entry->setRead(true); }), "none");
    EXPECT_EQ(agent->calls, Strings());
}

TEST_F(ReplacedDatabaseTest, AClientThatIsNotThereIsMadeAnew) {
    replace("delete from Clients; delete from Subscriptions;");
    EXPECT_NE(exceptionOf([&] { static_cast<void>(client->signature()); }), "none");
    EXPECT_TRUE(client->feeds().empty());
    const std::shared_ptr<OVClient> made = OVClient::applicationClient();
    ASSERT_TRUE(made);
    EXPECT_EQ(agent->calls, Strings{"createClient(org.example.Me)"});
    EXPECT_EQ(made->signature(), kMe);
    EXPECT_TRUE(made->addFeedWithURL(kAddress));
}

TEST_F(ReplacedDatabaseTest, PartsAreLost) {
    write("insert into Contents (rowID,data,mimeType) values (1,cast('x' as blob),'text/plain')");
    write("update Entries set content=1");
    announce();
    const std::shared_ptr<OVContent> content = entry->content();
    EXPECT_EQ(content->data(), "x");
    replace();
    EXPECT_NE(exceptionOf([&] { static_cast<void>(content->data()); }), "none");
    EXPECT_EQ(entry->content()->data(), "x");
}

TEST_F(ReplacedDatabaseTest, NothingIsLostWhileItIsClosed) {
    feed->_internal()._feedCore()->unload();
    db().close(true);
    EXPECT_NE(exceptionOf([&] { static_cast<void>(feed->subtitle()); }), "none");
    db().open(path.c_str(), false);
    EXPECT_EQ(feed->title(), "A feed");
    EXPECT_EQ(entry->title(), "Title");
}
