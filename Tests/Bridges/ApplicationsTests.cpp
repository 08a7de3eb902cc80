// Applications as processes of their own, and the agent.

#include "Bridges/ApplicationsTest.h"

#include <sqlite3.h>

#include <set>
#include <string>
#include <vector>

namespace {

/// Several applications and an agent.
class Applications : public ApplicationsTest {
 protected:
    /// What the file has of an entry's state.
    std::string inFile(const std::string& title) const {
        sqlite3* file = nullptr;
        std::string state = "none";
        EXPECT_EQ(sqlite3_open_v2(database().c_str(), &file, SQLITE_OPEN_READONLY, nullptr), 0);
        const std::string query =
            "select read || flagged from Entries where title = '" + title + "'";
        const auto take = [](void* into, int, char** values, char**) {
            *static_cast<std::string*>(into) = values[0];
            return 0;
        };
        EXPECT_EQ(sqlite3_exec(file, query.c_str(), take, &state, nullptr), SQLITE_OK);
        sqlite3_close(file);
        return state;
    }
};

}  // namespace

TEST_F(Applications, OneSubscribesHearsMarksAndReadsBack) {
    // There is no database, and no agent.
    EXPECT_EQ(agent(), 0);
    const auto reader = subscriber("Reader");
    EXPECT_GT(agent(), 0);
    EXPECT_EQ(reader->ask("feeds"), "feed");
    EXPECT_EQ(reader->ask("title feed"), "none");
    EXPECT_EQ(reader->ask("count feed"), "0");

    EXPECT_EQ(reader->ask("refresh feed"), "started");
    EXPECT_TRUE(reader->hears("begin feed"));
    EXPECT_TRUE(brings(*reader, {"One", "Two"}));
    EXPECT_TRUE(reader->hears("count feed 2"));
    EXPECT_TRUE(reader->hears("end feed"));
    EXPECT_EQ(reader->ask("refreshing feed"), "no");
    EXPECT_EQ(reader->ask("title feed"), "The feed");
    EXPECT_EQ(reader->ask("list feed"), "One: Two:");

    EXPECT_EQ(reader->ask("read One"), "One:r");
    EXPECT_TRUE(reader->hears("flags feed One"));
    EXPECT_TRUE(reader->hears("count feed 1"));
    EXPECT_EQ(reader->ask("flag Two"), "Two:f");
    EXPECT_TRUE(reader->hears("flags feed Two"));
    EXPECT_EQ(reader->ask("query"), "One:r Two:f");
    EXPECT_EQ(inFile("One"), "10");
    EXPECT_EQ(inFile("Two"), "01");
    EXPECT_EQ(reader->ask("batch"), "One:r Two:rf");
    EXPECT_TRUE(reader->hears("count feed 0"));
    EXPECT_EQ(reader->ask("unflag Two"), "Two:r");
    EXPECT_EQ(reader->ask("all"), "One:rf Two:rf");
    EXPECT_EQ(inFile("One"), "11");

    serve({"Three", "One", "Two"});
    EXPECT_EQ(reader->ask("refresh feed"), "started");
    EXPECT_TRUE(brings(*reader, {"Three"}));
    EXPECT_TRUE(reader->hears("count feed 1"));
    EXPECT_EQ(reader->ask("interval feed"), "3600");
    EXPECT_EQ(reader->ask("remove feed"), "removed");
    EXPECT_EQ(reader->ask("feeds"), "");
    EXPECT_EQ(reader->ask("query"), "");
}

TEST_F(Applications, TwoHearOfEachOther) {
    subscribeTwo();
    EXPECT_TRUE(second->hears("begin feed"));
    EXPECT_TRUE(second->hears("end feed"));
    EXPECT_EQ(second->ask("state One"), "One:");

    EXPECT_EQ(first->ask("read One"), "One:r");
    EXPECT_TRUE(second->hears("flags feed One"));
    EXPECT_TRUE(second->hears("count feed 1"));
    EXPECT_EQ(second->ask("state One"), "One:r");
    EXPECT_EQ(second->ask("flag One"), "One:rf");
    EXPECT_TRUE(first->hearsOfAll({"flags feed"}, {"One"}));
    EXPECT_EQ(first->ask("state One"), "One:rf");

    // What one gives up the other one keeps.
    EXPECT_EQ(first->ask("remove feed"), "removed");
    EXPECT_EQ(first->ask("query"), "");
    EXPECT_EQ(second->ask("query"), "One:rf Two:");
    EXPECT_EQ(second->ask("read Two"), "Two:r");
    EXPECT_TRUE(second->hears("count feed 0"));
}

TEST_F(Applications, ManyHearOfEachOther) {
    const std::vector<std::string> titles = {"A", "B", "C", "D", "E", "F", "G", "H"};
    const std::set<std::string> all(titles.begin(), titles.end());
    serve(titles);
    std::vector<std::unique_ptr<TestApplication>> applications;
    for (const std::string& title : titles) {
        applications.push_back(subscriber("Reader" + title));
        EXPECT_EQ(applications.back()->ask("count feed"), "0");
    }
    EXPECT_EQ(applications[0]->ask("refresh feed"), "started");
    for (const auto& each : applications) {
        EXPECT_TRUE(brings(*each, all));
        EXPECT_TRUE(each->hears("count feed 8"));
    }
    // All at once, each its own.
    for (std::size_t i = 0; i < titles.size(); ++i) {
        applications[i]->send("flag " + titles[i]);
    }
    for (std::size_t i = 0; i < titles.size(); ++i) {
        EXPECT_EQ(applications[i]->answer(), titles[i] + ":f");
    }
    for (const auto& each : applications) {
        EXPECT_TRUE(each->hearsOfAll({"flags feed"}, all));
        EXPECT_EQ(each->ask("list feed"), "A:f B:f C:f D:f E:f F:f G:f H:f");
    }
    EXPECT_EQ(applications[3]->ask("all"), "A:rf B:rf C:rf D:rf E:rf F:rf G:rf H:rf");
    for (const auto& each : applications) {
        EXPECT_TRUE(each->hears("count feed 0"));
        EXPECT_EQ(each->ask("query"), "A:rf B:rf C:rf D:rf E:rf F:rf G:rf H:rf");
    }
}

TEST_F(Applications, OneThatTurnsNoLoopGetsRightAnswers) {
    const auto reader = subscriber("Reader", false);
    first = subscriber("First");
    EXPECT_EQ(reader->ask("refresh feed"), "started");
    EXPECT_TRUE(brings(*first, {"One", "Two"}));
    EXPECT_EQ(reader->ask("title feed"), "The feed");
    EXPECT_EQ(reader->ask("count feed"), "2");
    EXPECT_EQ(reader->ask("list feed"), "One: Two:");
    EXPECT_EQ(reader->ask("state One"), "One:");

    EXPECT_EQ(first->ask("read One"), "One:r");
    EXPECT_EQ(reader->ask("state One"), "One:r");
    EXPECT_EQ(reader->ask("count feed"), "1");
    EXPECT_EQ(reader->ask("flag One"), "One:rf");
    EXPECT_EQ(first->ask("state One"), "One:rf");
    serve({"Three", "One"});
    EXPECT_EQ(first->ask("refresh feed"), "started");
    EXPECT_TRUE(brings(*first, {"Three"}));
    EXPECT_EQ(reader->ask("query"), "One:rf Three: Two:");
    EXPECT_EQ(first->ask("add " + server.url("/other")), "added");
    EXPECT_EQ(reader->ask("add " + server.url("/other")), "added");
    EXPECT_EQ(reader->ask("feeds"), "feed other");
    EXPECT_EQ(reader->ask("remove other"), "removed");
    EXPECT_EQ(reader->ask("feeds"), "feed");
}

TEST_F(Applications, OneThatLooksOnlyLaterIsToldOfWhatIsNew) {
    subscribeTwo();
    EXPECT_EQ(first->ask("read One"), "One:r");
    second = nullptr;
    EXPECT_EQ(first->ask("flag Two"), "Two:f");
    // It begins with what there is, of which it is not told.
    second = application("Second");
    EXPECT_EQ(second->ask("query"), "One:r Two:f");
    EXPECT_EQ(first->ask("unflag Two"), "Two:");
    EXPECT_TRUE(second->hears("flags feed Two"));
}
