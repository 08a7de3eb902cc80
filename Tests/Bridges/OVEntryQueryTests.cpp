#include <Orvane/OVEntryQuery.h>

#include "Bridges/BridgeTest.h"
#include "Bridges/EntryQueryStatement.h"

using namespace Foundation;
using namespace Orvane;

namespace {

class OVEntryQueryTest : public BridgeTest {
 protected:
    OVEntryQueryTest() {
        one = addFeed("http://e.org/1", "Beta");
        two = addFeed("http://e.org/2", "alpha");
        addEntry(one, "a", -400, "First post");
        addEntry(one, "b", -300, "second POST");
        addEntry(two, "c", -200, "third");
        addEntry(two, "d", -100, "fourth 100%");
    }

    /// The identifiers of what a query finds, in its order; and the count, if that is another.
    std::string find(const OVEntryQuery& query) {
        std::string found;
        const OVEntry::List entries = me()->entries(query);
        for (const std::shared_ptr<OVEntry>& each : entries) {
            found += *each->identifier();
        }
        const std::size_t number = me()->entryCount(query);
        if (number != entries.size()) found += " of " + std::to_string(number);
        return found;
    }
    static OVEntryQuery by(const std::function<void(OVEntryQuery&)>& choose) {
        OVEntryQuery query;
        choose(query);
        return query;
    }
    void set(const char* identifier, const std::string& values) {
        write(OVFormat("update Entries set %s where identifier='%s'", values, identifier));
    }
    /// The plan of the statement that answers a query, a line for each step.
    std::string planOf(const OVEntryQuery& query) {
        const EntryQueryStatement statement(me()->_internal().core(), query);
        std::string plan;
        const std::string sql = "explain query plan " + statement.entriesSQL();
        for (SQLite::Cursor cursor(&db(), "%s", sql); cursor.hasRow(); cursor.nextRow()) {
            plan += std::string(cursor.textColumn(3)) + "\n";
        }
        return plan;
    }

    long long one = 0;
    long long two = 0;
};

}  // namespace

TEST_F(OVEntryQueryTest, FindsTheNewestFirst) {
    EXPECT_EQ(find({}), "dcba");
    EXPECT_EQ(find(by([](auto& q) { q.ascending = true; })), "abcd");
}

TEST_F(OVEntryQueryTest, FindsAPartAndCountsAll) {
    EXPECT_EQ(find(by([](auto& q) { q.limit = 2; })), "dc of 4");
    EXPECT_EQ(find(by([](auto& q) {
                  q.limit = 2;
                  q.offset = 3;
              })),
              "a of 4");
    EXPECT_EQ(find(by([](auto& q) { q.offset = 1; })), "cba of 4");
    EXPECT_EQ(find(by([](auto& q) { q.offset = 9; })), " of 4");
}

TEST_F(OVEntryQueryTest, ChoosesFeeds) {
    const std::shared_ptr<OVFeed> feed = feedOf("http://e.org/1");
    EXPECT_EQ(find(by([&](auto& q) { q.feeds = {feed}; })), "ba");
    EXPECT_EQ(find(by([&](auto& q) { q.feeds = {feed, feedOf("http://e.org/2")}; })), "dcba");
    me()->removeFeed(feed);
    EXPECT_EQ(find(by([&](auto& q) { q.feeds = {feed}; })), "");
}

TEST_F(OVEntryQueryTest, FindsNothingOfOtherClients) {
    const std::shared_ptr<OVClient> other =
        OVClient::clientForBundleIdentifier("org.example.Other");
    EXPECT_EQ(other->entryCount({}), 0u);
    agent->addSubscription(other->_internal().core().getRowID(), one);
    EXPECT_EQ(other->entryCount({}), 2u);
    EXPECT_EQ(other->entries({}).at(0)->feed()->client(), other);
    EXPECT_EQ(find(by([&](auto& q) { q.feeds = {other->feedWithURL("http://e.org/1")}; })), "");
}

TEST_F(OVEntryQueryTest, LeavesOutWhatHasExpired) {
    write(OVFormat("update Subscriptions set expirationDate=%f where feed=%lli", kNow - 350, one));
    EXPECT_EQ(find({}), "dcb");
    write(OVFormat("update Subscriptions set expirationDate=null where feed=%lli", one));
    EXPECT_EQ(find({}), "dcba");
}

TEST_F(OVEntryQueryTest, ChoosesByTheBeginningOfIdentifiers) {
    set("a", "identifier='ab1'");
    set("b", "identifier='ab2'");
    set("c", "identifier='ac'");
    const auto begins = [](const char* text) {
        return by([&](auto& q) { q.identifierPrefix = text; });
    };
    EXPECT_EQ(find(begins("ab")), "ab2ab1");
    EXPECT_EQ(find(begins("ab1")), "ab1");
    EXPECT_EQ(find(begins("a")), "acab2ab1");
    EXPECT_EQ(find(begins("%")), "");
    EXPECT_EQ(planOf(begins("ab")).find("SCAN e"), std::string::npos);
}

TEST_F(OVEntryQueryTest, ChoosesByTheWebPage) {
    set("b", "alternateUrl='http://e.org/b'");
    EXPECT_EQ(find(by([](auto& q) { q.alternateURL = "http://e.org/b"; })), "b");
    EXPECT_EQ(find(by([](auto& q) { q.alternateURL = "http://e.org/"; })), "");
}

TEST_F(OVEntryQueryTest, ChoosesByState) {
    set("a", "read=1");
    set("b", "flagged=1");
    EXPECT_EQ(find(by([](auto& q) { q.read = true; })), "a");
    EXPECT_EQ(find(by([](auto& q) { q.read = false; })), "dcb");
    EXPECT_EQ(find(by([](auto& q) { q.flagged = true; })), "b");
    EXPECT_EQ(find(by([](auto& q) {
                  q.flagged = false;
                  q.read = false;
              })),
              "dc");
}

TEST_F(OVEntryQueryTest, ChoosesByDate) {
    EXPECT_EQ(find(by([](auto& q) { q.from = OVDate(kNow - 300); })), "dcb");
    EXPECT_EQ(find(by([](auto& q) { q.before = OVDate(kNow - 300); })), "a");
    EXPECT_EQ(find(by([](auto& q) {
                  q.from = OVDate(kNow - 300);
                  q.before = OVDate(kNow - 100);
              })),
              "cb");
}

TEST_F(OVEntryQueryTest, GoesByTheDateThatIsShownOnRequest) {
    set("a", OVFormat("datePublished=%f", kNow - 5));
    set("b", OVFormat("datePublished=0,dateUpdated=%f", kNow - 4));
    set("c", OVFormat("datePublished=null,dateUpdated=0"));
    const auto shown = [](auto& q) { q.date = OVEntryQuery::Date::ForDisplay; };
    EXPECT_EQ(find(by(shown)), "badc");
    EXPECT_EQ(find(by([&](auto& q) {
                  shown(q);
                  q.from = OVDate(kNow - 100);
              })),
              "bad");
    for (const std::shared_ptr<OVEntry>& each : me()->entries(by(shown))) {
        EXPECT_EQ(each->dateForDisplay() >= OVDate(kNow - 100), *each->identifier() != "c");
    }
}

TEST_F(OVEntryQueryTest, ChoosesByWordsInTitlesSummariesAndContents) {
    const auto words = [](std::vector<std::string> all) {
        return by([&](auto& q) { q.words = std::move(all); });
    };
    EXPECT_EQ(find(words({"post"})), "ba");
    EXPECT_EQ(find(words({"post", "first"})), "a");
    write(
        "insert into Contents (rowID,data) values (1,cast('<b>hidden</b> post' as blob)),"
        "(2,cast('short' as blob))");
    set("c", "content=1");
    set("d", "summary=2");
    EXPECT_EQ(find(words({"hidden"})), "c");
    EXPECT_EQ(find(words({"post", "third"})), "c");
    EXPECT_EQ(find(words({"short"})), "d");
    EXPECT_EQ(find(words({"none"})), "");
    EXPECT_EQ(find(words({""})), "dcba");
}

TEST_F(OVEntryQueryTest, TakesNoCharacterOfAWordForAPattern) {
    const auto word = [](const char* text) { return by([&](auto& q) { q.words = {text}; }); };
    EXPECT_EQ(find(word("0%")), "d");
    EXPECT_EQ(find(word("%")), "d");
    EXPECT_EQ(find(word("_")), "");
    EXPECT_EQ(find(word("\\")), "");
    EXPECT_EQ(find(word("'")), "");
    EXPECT_NE(exceptionOf([&] { find(word("\xff")); }), "none");
}

TEST_F(OVEntryQueryTest, ChoosesByAuthor) {
    write("insert into Authors (rowID,name,email) values (1,'Jane Doe','jane@e.org')");
    set("b", "author=1");
    const auto author = [](const char* text) { return by([&](auto& q) { q.author = text; }); };
    EXPECT_EQ(find(author("jane")), "b");
    EXPECT_EQ(find(author("Doe")), "b");
    EXPECT_EQ(find(author("@e.org")), "b");
    EXPECT_EQ(find(author("John")), "");
}

TEST_F(OVEntryQueryTest, ChoosesByEnclosures) {
    write(
        "insert into Enclosures (entry,url) select rowID,'http://e.org/f' from Entries "
        "where identifier in ('a','c')");
    write(
        "insert into Enclosures (entry,url) select rowID,'http://e.org/g' from Entries "
        "where identifier='a'");
    EXPECT_EQ(find(by([](auto& q) { q.hasEnclosures = true; })), "ca");
    EXPECT_EQ(find(by([](auto& q) { q.hasEnclosures = false; })), "db");
}

TEST_F(OVEntryQueryTest, SortsByTitleAndByFeed) {
    EXPECT_EQ(find(by([](auto& q) {
                  q.order = OVEntryQuery::Order::ByTitle;
                  q.ascending = true;
              })),
              "adbc");
    EXPECT_EQ(find(by([](auto& q) {
                  q.order = OVEntryQuery::Order::ByFeed;
                  q.ascending = true;
              })),
              "cdab");
    EXPECT_EQ(find(by([](auto& q) { q.order = OVEntryQuery::Order::ByFeed; })), "badc");
}

TEST_F(OVEntryQueryTest, SortsEqualOnesAsTheyCame) {
    write(OVFormat("update Entries set localDateCreated=%f", kNow));
    EXPECT_EQ(find({}), "dcba");
    EXPECT_EQ(find(by([](auto& q) { q.ascending = true; })), "abcd");
}

TEST_F(OVEntryQueryTest, MakesObjectsOfWhatItFindsAlone) {
    const std::shared_ptr<OVClient> client = me();
    const std::size_t before = SQLite::TableOf<EntryCore>::instance()->getCachedRowCount();
    const OVEntry::List entries = client->entries(by([](auto& q) { q.limit = 1; }));
    EXPECT_EQ(entries.size(), 1u);
    EXPECT_EQ(SQLite::TableOf<EntryCore>::instance()->getCachedRowCount(), before + 1);
    EXPECT_EQ(client->entryCount({}), 4u);
    EXPECT_EQ(SQLite::TableOf<EntryCore>::instance()->getCachedRowCount(), before + 1);
}

TEST_F(OVEntryQueryTest, ChoosesAmongRowIDsOfAnIndex) {
    const std::string plan = planOf(by([](auto& q) { q.limit = 200; }));
    EXPECT_NE(plan.find("USING COVERING INDEX Entries_unreadcount (feed=?"), std::string::npos)
        << plan;
    EXPECT_EQ(plan.find("SCAN e"), std::string::npos) << plan;
    EXPECT_NE(plan.find("USING INTEGER PRIMARY KEY"), std::string::npos) << plan;
    const std::string unread = planOf(by([](auto& q) { q.read = false; }));
    EXPECT_NE(unread.find("USING COVERING INDEX Entries_unreadcount (feed=? AND read=?"),
              std::string::npos)
        << unread;
}

TEST_F(OVEntryQueryTest, ReadsNoTableFromEndToEndWhateverItAsks) {
    OVEntryQuery all;
    all.feeds = {feedOf("http://e.org/1"), nullptr};
    all.read = false;
    all.flagged = true;
    all.from = OVDate(1);
    all.before = OVDate(2);
    all.words = {"a", "b"};
    all.author = "c";
    all.hasEnclosures = true;
    for (const auto order :
         {OVEntryQuery::Order::ByDate, OVEntryQuery::Order::ByTitle, OVEntryQuery::Order::ByFeed}) {
        for (const auto date : {OVEntryQuery::Date::Received, OVEntryQuery::Date::ForDisplay}) {
            all.order = order;
            all.date = date;
            const std::string plan = planOf(all);
            // The list of feeds is no table.
            EXPECT_EQ(plan.find("SCAN "), plan.find("SCAN json_each")) << plan;
            EXPECT_EQ(plan.find("SCAN ", plan.find("SCAN json_each") + 1), std::string::npos)
                << plan;
            EXPECT_NE(plan.find("Entries_unreadcount (feed=? AND read=?"), std::string::npos)
                << plan;
            EXPECT_NE(plan.find("Enclosures_entry (entry=?)"), std::string::npos) << plan;
        }
    }
}

TEST_F(OVEntryQueryTest, FindsTheNewestOfAHundredThousand) {
    // It would note each as the newest of its feed.
    write("drop trigger Entries_update_feeds_localdatecreatedofnewestentryinfeed_after_insert");
    write(
        OVFormat("with recursive n(i) as (select 1 union all select i+1 from n where i<100000) "
                 "insert into Entries (feed,identifier,read,flagged,localDateCreated) "
                 "select %lli+i%%2,'n'||i,i%%4=0,0,%f+i from n",
                 one, kNow));
    const std::shared_ptr<OVClient> client = me();
    const OVEntryQuery newest = by([](auto& q) { q.limit = 200; });
    const OVEntry::List found = client->entries(newest);
    ASSERT_EQ(found.size(), 200u);
    EXPECT_EQ(found.front()->identifier(), "n100000");
    EXPECT_EQ(found.back()->identifier(), "n99801");
    EXPECT_EQ(SQLite::TableOf<EntryCore>::instance()->getCachedRowCount(), 200u);
    EXPECT_EQ(client->entryCount(newest), 100004u);
    EXPECT_EQ(client->entryCount(by([](auto& q) { q.read = true; })), 25000u);
    const std::string plan = planOf(newest);
    EXPECT_NE(plan.find("USING COVERING INDEX Entries_unreadcount (feed=?"), std::string::npos)
        << plan;
}

TEST_F(OVEntryQueryTest, IsOneStatement) {
    const std::shared_ptr<OVClient> client = me();
    static_cast<void>(client->entryCount({}));
    const Support::LoggingOn logging({&gLog, &SQLite::gLogSQL});
    log.clear();
    EXPECT_EQ(client->entries({}).size(), 4u);
    // Beside the look at whether the file has changed.
    EXPECT_EQ(log.count("Cursor ") - log.count("\"PRAGMA data_version\" ..."), 1);
    log.clear();
    EXPECT_EQ(client->entryCount(by([](auto& q) { q.read = false; })), 4u);
    EXPECT_EQ(log.count("Cursor ") - log.count("\"PRAGMA data_version\" ..."), 1);
}
