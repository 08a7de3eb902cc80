#pragma once

#include "FeedParser/RollingDocument.h"
#include "Foundation/Clock.h"
#include "Model/FeedCore.h"
#include "Model/StorageTest.h"
#include "Support/EnvVar.h"
#include "Support/ScriptedServer.h"

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <random>
#include <set>
#include <string>

/// What is in the files after an agent was killed at any moment while it refreshed 50 feeds: the
/// test kills one again and again. In every round all feeds are due, and the server has another
/// document for them.
class RefreshKillTest : public StorageTest {
 protected:
    using Names = std::set<std::string>;

    static constexpr int kFeeds = 50;

    RefreshKillTest() {
        std::printf("seed %u\n", seed);
        random.seed(seed);
        ministry().openDatabase();
        db().execute("insert into Clients (rowID, signature) values (1, 'reader')");
        db().execute("insert into Subscriptions (client, feed, refreshInterval) values (1, 0, 60)");
        for (int i = 1; i <= kFeeds; ++i)
            addFeed("/feed/" + std::to_string(i));
        db().close(true);
    }

    /// The document of that number, as it comes from the network.
    static std::string documentOf(int number) {
        std::string xml =
            "<rss version=\"2.0\"><channel><title>" + std::to_string(number) + "</title>";
        for (const Post& post : RollingDocument::posts(number)) {
            xml += "<item><title>" + post.title + "</title><guid>" + post.guid +
                   "</guid><description>" + post.text + "</description></item>";
        }
        return xml + "</channel></rss>";
    }
    void addFeed(const std::string& path) {
        const Foundation::AutoreleasePool inner;
        const long long feed = makeStoredFeed(server.url(path).c_str())->getRowID();
        db().execute(
            "insert into Subscriptions (client, feed, refreshInterval, "
            "expirationInterval, expirationDate, refreshesInBackground, unreadCount) "
            "values (1, %lld, 60, -1, 0, 1, 0)",
            feed);
        server.answerBy(path,
                        [this](const Support::ServerRequest& request) { return answer(request); });
    }
    /// In the server's thread.
    Support::ServerAnswer answer(const Support::ServerRequest& request) const {
        const int number = round;
        const std::string tag = "\"" + std::to_string(number) + "\"";
        if (request.header("if-none-match") == tag) return Support::ServerAnswer(304);
        return Support::ServerAnswer().header("ETag", tag).body(documentOf(number));
    }
    int between(int least, int most) {
        return std::uniform_int_distribution<int>(least, most)(random);
    }

    /// Makes all feeds due. The test's own clock stands still, the agent's does not.
    void beginRound() {
        ++round;
        acknowledged.clear();
        // It was not the documents that brought the last ones down.
        std::filesystem::remove(storage() / "Feeds/.parsing");
        const double now = static_cast<double>(std::time(nullptr)) - Foundation::kUnixEpochOffset;
        ministry().openDatabase();
        db().execute("update Clients set dateUsed=%.0f", now);
        db().execute("update Feeds set refreshLocalDate=0");
        db().close(true);
    }
    /// A moment in which other things happen.
    void letSomeTimePass() {
        const auto end =
            std::chrono::steady_clock::now() + std::chrono::microseconds(between(0, 20000));
        while (std::chrono::steady_clock::now() < end) {
        }
    }
    static int kills() { return std::getenv("ORVANE_SLOW_TESTS") ? 200 : 20; }

    void checkFiles() {
        const Foundation::AutoreleasePool inner;
        ministry().openDatabase();
        db().integrityCheck();
        EXPECT_EQ(count("Feeds"), kFeeds);
        EXPECT_EQ(count("Contents where rowID not in (select content from Entries) and rowID not "
                        "in (select xmlRepresentation from Entries)"),
                  0);
        for (int feed = 1; feed <= kFeeds; ++feed)
            checkFeed(feed);
        db().close(true);
    }
    void checkFeed(int feed) {
        const std::string url = server.url("/feed/" + std::to_string(feed));
        SCOPED_TRACE(url);
        const std::string id = std::to_string(feed);
        const int before = numbers[feed];
        const int number =
            db().execScalar("select ifnull(title, 0) from Feeds where rowID=%d", feed);
        if (acknowledged.contains(url)) {
            EXPECT_EQ(number, round);
        } else {
            // It may have been saved and not been acknowledged any more.
            EXPECT_TRUE(number == before || number == round) << number << " behind " << before;
        }
        numbers[feed] = number;
        checkEntries(feed, number);
        EXPECT_EQ(db().execScalar("select unreadCount from Subscriptions where feed=%d", feed),
                  count(("Entries where feed=" + id).c_str()));
    }
    void checkEntries(int feed, int number) {
        const std::string id = std::to_string(feed);
        Names current, all;
        for (const std::string& row :
             rows(("select current||id||' '||title, id from Entries where feed=" + id).c_str())) {
            const std::string text = row.substr(1, row.find('|') - 1);
            if (row[0] == '1') current.insert(text);
            all.insert(row.substr(row.find('|') + 1));
        }
        EXPECT_EQ(current, namesOf(number));
        // Nothing that was once there is lost, and what has left the document has its file.
        for (const std::string& guid : known[feed])
            EXPECT_TRUE(all.contains(guid)) << guid;
        known[feed] = all;
        checkSavedEntries(id);
    }
    static Names namesOf(int number) {
        Names names;
        if (number == 0) return names;
        for (const Post& post : RollingDocument::posts(number))
            names.insert(post.guid + " " + post.title);
        return names;
    }
    void checkSavedEntries(const std::string& feed) const {
        for (const std::string& row : rows(("select f.identifier||'/'||e.identifier from Feeds f, "
                                            "Entries e where e.feed=f.rowID and e.current=0 and "
                                            "f.rowID=" +
                                            feed)
                                               .c_str())) {
            std::ifstream file(storage() / "Feeds" / (row + ".xml"));
            const std::string content{std::istreambuf_iterator<char>(file), {}};
            EXPECT_TRUE(content.starts_with("<item>") && content.ends_with("</item>")) << row;
        }
    }

    const unsigned seed = std::getenv("ORVANE_TEST_SEED")
                              ? static_cast<unsigned>(std::atoi(std::getenv("ORVANE_TEST_SEED")))
                              : std::random_device()();
    std::mt19937 random;
    const Support::EnvVar noSystemBus{"DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent/bus"};
    std::atomic<int> round = 0;
    std::map<int, int> numbers;  ///< of the documents that the feeds have
    std::map<int, Names> known;  ///< the entries that each feed has had
    Names acknowledged;          ///< addresses of feeds, in this round
    Support::ScriptedServer server;
};
