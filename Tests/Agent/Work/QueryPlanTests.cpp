// How sqlite3 means to answer what the agent asks of the database again and again.
//
// The queries are not written down here: the agent runs, and what it has asked is read from the
// log. Each is then shown to the planner. Its plan must be the same whatever statistics the file
// has: none, or some of a day when the tables were nothing like they are now.

#include "Agent/AgentTest.h"
#include "Bridges/EntryQueryStatement.h"
#include "FeedParser/DifferenceEngine.h"
#include "FeedParser/Documents.h"
#include "Foundation/ClockTrust.h"
#include "Model/AuthorCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/UpdatedEntryIterator.h"
#include "SQLite/TableOf.h"
#include "SQLite/Transaction.h"

#include <Orvane/OVEntryQuery.h>
#include <gmock/gmock.h>

#include <filesystem>
#include <functional>
#include <map>
#include <regex>
#include <set>

using namespace Foundation;
using namespace Orvane;
using testing::HasSubstr;
using Strings = std::vector<std::string>;

namespace {

using Plans = std::map<std::string, std::string>;  // by query

struct Past {
    const char* name;
    std::function<void()> fill;  ///< the tables as they were when they were analysed
};

void PrintTo(const Past& past, std::ostream* out) {
    *out << past.name;
}

void addFeeds(int feeds, int clients, int entriesOfEach) {
    SQLite::Database& db = *SQLite::gDatabase;
    const SQLite::Transaction transaction(true);
    for (int c = 1; c <= clients; ++c) {
        db.execute("insert into Clients (signature, dateUsed) values ('c%d', 788918000)", c);
        db.execute(
            "insert into Subscriptions (client, feed, refreshInterval, expirationInterval, "
            "refreshesInBackground) values (%d, 0, 1800, 1209600, 1)",
            c);
    }
    for (int f = 1; f <= feeds; ++f) {
        db.execute(
            "insert into Feeds (identifier, url, refreshLocalDate) values ('f%d', "
            "'http://e.org/%d', 788918000)",
            f, f);
        db.execute(
            "insert into Subscriptions (client, feed, refreshInterval, expirationInterval, "
            "expirationDate, refreshesInBackground) select rowID, %d, 0, 0, 1, 1 from "
            "Clients",
            f);
        db.execute(
            "with n(i) as (select 1 union all select i+1 from n where i<%d) insert into "
            "Entries (identifier, feed, read, current, flagged, localDateCreated, content) "
            "select 'e%d.'||i, %d, 1, 0, 0, i, i from n",
            entriesOfEach, f, f);
    }
    db.execute(
        "insert into Enclosures (entry, url, downloadState, downloadAuditStatus) select "
        "rowID, 'http://e.org', 0, 2 from Entries");
}

void empty() {}
void oneOfEach() {
    addFeeds(1, 1, 1);
}
void oneGreatFeed() {
    addFeeds(1, 1, 2000);
}
void manyClients() {
    addFeeds(2, 200, 1);
}
void manyFeeds() {
    addFeeds(200, 1, 3);
}

class QueryPlanTest : public AgentTest, public testing::WithParamInterface<Past> {
 protected:
    QueryPlanTest() { ClockTrust::setBuildDate(0); }
    ~QueryPlanTest() noexcept override {
        task.reset();
        ClockTrust::setBuildDate(mBuildDate);
    }

    /// A new database, analysed when it was as in that past, and opened by an agent again.
    void startWith(const std::function<void()>& past) {
        startAgent();
        past();
        db().execute("analyze");
        task.reset();
        startAgent();
        EnclosureCore::_forgetAutoDownloads();
        clearTables();
        addFeeds(2, 2, 3);
    }
    /// Merges two documents, of which the second has a changed entry and a new one. None falls out:
    /// a feed without an archive leaves no directory to be deleted behind the test's back.
    static void merge(FeedCore* feed) {
        const std::string address = feed->mURL.getValue()->text();
        const auto mergeDocument = [&](const std::vector<Post>& posts) {
            FeedCore* parsed = makeDocument(address.c_str(), posts);
            EXPECT_TRUE(DifferenceEngine(Ref<FeedCore>(feed), false).updateFrom(parsed));
        };
        mergeDocument({{.guid = "a", .length = 5}, {.guid = "b"}, {.guid = "c"}});
        mergeDocument({{.guid = "a", .title = "New", .length = 6},
                       {.guid = "b"},
                       {.guid = "c"},
                       {.guid = "d"}});
    }
    /// What is asked for one feed or entry by others.
    static void askAbout(ClientCore& client, FeedCore& feed) {
        const Ref<EntryCore> entry = feed.getEntries(nullptr).getRow();
        String* const identifier = entry->getIdentifier();
        Ref<SubscriptionCore> subscription;
        EXPECT_EQ(Ref<EntryCore>(client.getEntryWithIdentifier(identifier, subscription)).get(),
                  entry.get());
        EXPECT_EQ(Ref<EntryCore>(EntryCore::getEntryWithIdentifier(identifier)).get(), entry.get());
        for (const Ref<SubscriptionCore>& found :
             {Ref<SubscriptionCore>(client.getSubscription(&feed)),
              Ref<SubscriptionCore>(client.getSubscription(feed.mURL.getValue())),
              Ref<SubscriptionCore>(
                  client.getSubscriptionWithFeedIdentifier(feed.getIdentifier()))}) {
            EXPECT_EQ(found.get(), subscription.get());
        }
        EXPECT_EQ(Ref<FeedCore>(FeedCore::existingFeedWithURL(feed.mURL.getValue())).get(), &feed);
        EXPECT_GT(subscription->getEntryCount(true), 0);
        client.refreshNonBackgroundSubscriptions();
        const Ref<Date> past = Date::date(0);
        for (const bool usesXML : {false, true}) {
            client.mUsesXML = usesXML;
            const UpdatedEntryIterator updated(&client, past);
        }
        EXPECT_TRUE(EnclosureCore::getEnclosures(&client, nullptr).hasRow());
        const Ref<AuthorCore> author = Returner<AuthorCore>::adopted(new AuthorCore);
        author->mName.setValue(client.mSignature.getValue());
        EXPECT_EQ(Ref<AuthorCore>(author->findInDatabase()).get(), nullptr);
        EXPECT_EQ(Ref<AuthorCore>(author->addToDatabase()).get(), author.get());
        EXPECT_NE(Ref<AuthorCore>(author->findInDatabase()).get(), nullptr);
    }
    /// What applications ask for lists of entries.
    static void list(const ClientCore& client) {
        OVEntryQuery queries[4];
        queries[1].read = false;
        queries[1].hasEnclosures = true;
        queries[2].order = OVEntryQuery::Order::ByTitle;
        queries[2].author = "x";
        queries[3].order = OVEntryQuery::Order::ByFeed;
        queries[3].words = {"x"};
        for (const OVEntryQuery& query : queries) {
            const EntryQueryStatement statement(client, query);
            statement.walk([](EntryCore*) {});
            statement.count();
        }
    }
    /// All that is asked in the life of a feed.
    static void liveThrough() {
        FeedCore* const feed = subscribe("http://e.org/merged");
        const Ref<String> signature = String::string("org.example.Reader");
        const Ref<ClientCore> client = ClientCore::existingClientWithSignature(signature);
        merge(feed);
        askAbout(*client, *feed);
        list(*client);
        const Ref<EntryCore> entry = feed->getEntries(nullptr).getRow();
        entry->setRead(true);
        entry->deleteRow();
        const Ref<SubscriptionCore> subscription = client->getSubscription(feed);
        subscription->deleteRow();
    }
    /// What is asked while the agent schedules, looks after the database, counts and merges.
    std::set<std::string> askedQueries() {
        const Support::LoggingOn on{{&SQLite::gLogSQL}};
        clock.advanceBy(AgentTask::kHoldOffSeconds);
        task->scheduleNextRefresh();
        // Rows in memory are read by nothing.
        for (const char* table : {"Clients", "Feeds", "Subscriptions"})
            db().getRegisteredTable(table)->uncacheRows();
        task->scheduleNextRefresh();
        task->hygieneTasks();
        SQLite::TableOf<FeedCore>::instance()->rowWithID(1)->updateUnreadCounts();
        liveThrough();
        std::set<std::string> queries;
        for (const std::string& line : log.lines()) {
            const std::string query = queryIn(line);
            if (!query.empty()) queries.insert(query);
        }
        return queries;
    }
    static std::string planOf(const std::string& query) {
        std::string plan;
        for (const std::string& step : rows(("explain query plan " + query).c_str())) {
            // The last column is what there is to read.
            plan += step.substr(step.rfind('|') + 1) + "\n";
        }
        return plan;
    }
    /// The plans of all that reads or changes rows.
    Plans plans() {
        const std::set<std::string> queries = askedQueries();
        db().execute(
            "create temporary table ExpiredEntries "
            "(entry, content, summary, xmlRepresentation, identifier, feed)");
        Plans result;
        for (const std::string& query : queries) {
            const bool makesTable = query.starts_with("create temporary table");
            result[withoutTimes(query)] =
                planOf(makesTable ? query.substr(query.find(" as ") + 4) : query);
        }
        return result;
    }

 private:
    static void clearTables() {
        for (const char* table : {"Clients", "Subscriptions", "Feeds", "Entries", "Enclosures"}) {
            db().getRegisteredTable(table)->uncacheRows();
            db().execute("delete from %s", table);
        }
    }
    /// The query as it is on every day.
    static std::string withoutTimes(const std::string& query) {
        return std::regex_replace(query, std::regex("[0-9]{9,}"), "NOW");
    }
    /// The SQL in a line of the log of statements that are run; empty if it is none of rows.
    static std::string queryIn(const std::string& line) {
        std::string text;
        for (const char* start : {"[SQL] Exec ( ", "[SQL] Exec "}) {
            if (text.empty() && line.starts_with(start))
                text = line.substr(std::string(start).size(),
                                   line.rfind("  -->") - std::string(start).size());
        }
        if (line.starts_with("[SQL] Cursor ")) {
            const std::size_t first = line.find('"') + 1;
            text = line.substr(first, line.rfind("\" ...") - first);
        }
        for (const char* verb : {"select ", "SELECT ", "delete ", "DELETE ", "update ", "UPDATE ",
                                 "create temporary table"}) {
            if (text.starts_with(verb)) return text;
        }
        return {};
    }

    const double mBuildDate = ClockTrust::getBuildDate();
};

}  // namespace

TEST_F(QueryPlanTest, UsesAnIndexForAllButWalksOfWholeTables) {
    startWith(empty);
    int asked = 0;
    for (const auto& [query, plan] : plans()) {
        SCOPED_TRACE(query + "\n" + plan);
        ++asked;
        // Both are small, or looked at once and whole.
        const bool readsAll =
            query == "SELECT * FROM Subscriptions" || query.find("sqlite_") != std::string::npos;
        EXPECT_EQ(plan.find("AUTOMATIC"), std::string::npos);
        // By their names in the queries.
        for (const char* table :
             {"Authors", "Contents", "Entries", "a", "c", "e", "encl", "entry", "n", "s", "sub"}) {
            EXPECT_EQ(plan.find(OVFormat("SCAN %s\n", table)), std::string::npos);
            EXPECT_EQ(plan.find(OVFormat("SCAN %s USING", table)), std::string::npos);
        }
        EXPECT_TRUE(readsAll || plan.find("SCAN Subscriptions") == std::string::npos);
        EXPECT_TRUE(query.find("downloadAuditStatus=1") != std::string::npos ||
                    plan.find("SCAN Enclosures") == std::string::npos);
    }
    EXPECT_GE(asked, 40);
}

TEST_F(QueryPlanTest, FindsWhatTheAgentAsks) {
    startWith(empty);
    const Plans found = plans();
    const auto planWith = [&](const std::string& text) {
        for (const auto& [query, plan] : found) {
            if (query.find(text) != std::string::npos) return plan;
        }
        return std::string("nobody asked");
    };
    EXPECT_EQ(planWith("select feed from Subscriptions where refreshInterval>=0 and feed>0"),
              "SEARCH Subscriptions USING INDEX Subscriptions_feedandclient (feed>?)\n");
    EXPECT_THAT(planWith("FROM Subscriptions WHERE feed=?"),
                HasSubstr("INDEX Subscriptions_feedandclient (feed=?)"));
    EXPECT_EQ(planWith("from Subscriptions  where feed=? and client=?"),
              "SEARCH Subscriptions USING COVERING INDEX Subscriptions_feedandclient (feed=? AND "
              "client=?)\n");
    EXPECT_EQ(planWith("create temporary table ExpiredEntries"),
              "MATERIALIZE Exps\n"
              "SCAN Feeds USING COVERING INDEX sqlite_autoindex_Feeds_1\n"
              "SEARCH Subscriptions USING INDEX Subscriptions_feedandclient (feed=?)\n"
              "SCAN Exps\n"
              "SEARCH Entries USING INDEX Entries_unreadcount (feed=?)\n");
    EXPECT_THAT(planWith("delete from Entries where rowID in"), HasSubstr("SEARCH Entries"));
    EXPECT_THAT(planWith("delete from Enclosures where entry in"),
                HasSubstr("SEARCH Enclosures USING INDEX Enclosures_entry (entry=?)"));
    EXPECT_THAT(planWith("select downloadedPath"),
                HasSubstr("SEARCH Enclosures USING INDEX Enclosures_entry (entry=?)"));
    EXPECT_THAT(planWith("delete from Contents"), HasSubstr("SEARCH Contents"));
    EXPECT_THAT(planWith("delete from Entries where feed=0"),
                HasSubstr("SEARCH Entries USING INDEX Entries_unreadcount (feed=?)"));
    EXPECT_EQ(planWith("and read=0"),
              "SEARCH Entries USING COVERING INDEX Entries_unreadcount (feed=? AND read=? AND "
              "localDateCreated>?)\n");
}

TEST_P(QueryPlanTest, IsNoneTheWorseForOldStatistics) {
    startWith(empty);
    const Plans best = plans();
    task.reset();
    std::filesystem::remove_all(storage());
    startWith(GetParam().fill);
    Plans now = plans();
    for (const auto& [query, plan] : best) {
        EXPECT_EQ(now[query], plan) << query;
    }
}

INSTANTIATE_TEST_SUITE_P(Pasts, QueryPlanTest,
                         testing::Values(Past{"oneOfEach", oneOfEach},
                                         Past{"oneGreatFeed", oneGreatFeed},
                                         Past{"manyClients", manyClients},
                                         Past{"manyFeeds", manyFeeds}),
                         [](const auto& past) { return std::string(past.param.name); });
