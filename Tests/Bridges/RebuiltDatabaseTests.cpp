// The agent makes the database anew while applications live on.

#include "Bridges/ApplicationsTest.h"

#include <csignal>
#include <filesystem>
#include <string>

namespace {

class RebuiltDatabase : public ApplicationsTest {
 protected:
    /// Two applications and one that turns no loop, who have looked at what there is; then there is
    /// no agent.
    RebuiltDatabase() {
        subscribeTwo();
        unturned = subscriber("Unturned", false);
        EXPECT_TRUE(hasSavedSubscriptions()) << log();
        for (TestApplication* each : {first.get(), second.get(), unturned.get()}) {
            EXPECT_EQ(each->ask("list feed"), "One: Two:");
            EXPECT_EQ(each->ask("state One"), "One:");
            EXPECT_EQ(each->ask("title feed"), "The feed");
        }
        endAgent(SIGTERM);
    }
    ~RebuiltDatabase() noexcept override { unturned = nullptr; }

    /// Waits until they know of the new database.
    void expectAllToldOf() {
        for (const auto* each : {&first, &second}) {
            EXPECT_TRUE((*each)->hasLogged("***** Database was replaced by agent ..."));
        }
    }
    /// It sees the new database, in which all counts as read, by the objects that it had.
    static void expectAllFound(TestApplication& application) {
        EXPECT_EQ(application.ask("feeds"), "feed");
        EXPECT_EQ(application.ask("list feed"), "One:r Two:r");
        EXPECT_EQ(application.ask("state One"), "One:r");
        EXPECT_EQ(application.ask("title feed"), "The feed");
        EXPECT_EQ(application.ask("count feed"), "0");
    }
    /// All do, and hear what becomes of it.
    void expectAllGoOn() {
        expectAllToldOf();
        for (TestApplication* each : {first.get(), second.get(), unturned.get()}) {
            expectAllFound(*each);
        }
        EXPECT_EQ(first->ask("flag One"), "One:rf");
        // Who is told of the first change is told of all that has come into being since the last.
        EXPECT_TRUE(first->hears("added feed One Two"));
        EXPECT_TRUE(second->hears("added feed One Two"));
        EXPECT_EQ(unturned->ask("state One"), "One:rf");
        EXPECT_EQ(unturned->ask("flag Two"), "Two:rf");
        EXPECT_TRUE(first->hears("flags feed Two"));
        EXPECT_TRUE(second->hears("flags feed Two"));
        EXPECT_EQ(second->ask("query"), "One:rf Two:rf");
        serve({"Three", "One", "Two"});
        EXPECT_EQ(first->ask("refresh feed"), "started");
        EXPECT_TRUE(brings(*second, {"Three"}));
        EXPECT_TRUE(second->hears("count feed 1"));
        EXPECT_EQ(second->ask("remove feed"), "removed");
        EXPECT_EQ(second->ask("feeds"), "");
    }

    std::unique_ptr<TestApplication> unturned;
};

}  // namespace

TEST_F(RebuiltDatabase, OnesThatDidNotLookFindAllAgain) {
    overwriteDatabase();
    // Whoever comes meets the damage and has it mended.
    const auto third = application("Third");
    EXPECT_EQ(third->ask("feeds"), "");
    EXPECT_NE(log().find("*** DATABASE IS BROKEN/STUCK: Moving aside and rebuilding ***"),
              std::string::npos);
    expectAllGoOn();
}

TEST_F(RebuiltDatabase, OneThatMeetsTheDamageHasItMended) {
    breakDatabase();
    EXPECT_TRUE(first->ask("query").starts_with("failed"));
    expectAllGoOn();
}

TEST_F(RebuiltDatabase, OneThatTurnsNoLoopHasItMendedAsWell) {
    breakDatabase();
    EXPECT_TRUE(unturned->ask("query").starts_with("failed"));
    EXPECT_EQ(unturned->ask("query"), "One:r Two:r");
    expectAllGoOn();
}

TEST_F(RebuiltDatabase, OneThatTurnsNoLoopFollowsTheFile) {
    const std::filesystem::path folder = database().parent_path();
    std::filesystem::rename(folder, folder.string() + "-aside");
    // It reads on in what it has.
    EXPECT_EQ(unturned->ask("query"), "One: Two:");
    EXPECT_EQ(agent(), 0);
    // Whoever comes has a new one made.
    EXPECT_EQ(application("Third")->ask("feeds"), "");
    expectAllFound(*unturned);
    EXPECT_EQ(unturned->ask("flag One"), "One:rf");
    EXPECT_EQ(subscriber("Fourth")->ask("query"), "One:rf Two:r");
}
