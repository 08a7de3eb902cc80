// What changes something: by the agent, which the program finds on the bus.

#include "CommandLine/CommandLineTest.h"

namespace {

using Support::ServerAnswer;
using testing::HasSubstr;

constexpr const char* kPage =
    "<html><head><link rel='alternate' type='application/rss+xml' title='First' href='/feed'>"
    "<link rel='alternate' type='application/rss+xml' title='Second' href='/other'></head></html>";

class ChangingVerbs : public CommandLineTest {
 protected:
    std::size_t feedCount() {
        return JSON::parse(runOrvane({"feeds", "--json"}).out)["feeds"].size();
    }
};

}  // namespace

TEST_F(ChangingVerbs, AddSubscribesAndFetches) {
    const JSON added = json({"add", server.url("/feed")});
    ASSERT_EQ(added["feeds"].size(), 1U);
    EXPECT_EQ(added["feeds"][0]["title"], "The feed");
    EXPECT_EQ(added["feeds"][0]["entries"], 2);
    EXPECT_THAT(run({"add", server.url("/feed")}).err,
                HasSubstr("Already subscribed to The feed."));
    EXPECT_EQ(json({"add", "feed:" + server.url("/other")})["feeds"][0]["title"], "Another feed");
    EXPECT_EQ(feedCount(), 2U);
}

TEST_F(ChangingVerbs, AddFindsTheFeedsOfAPage) {
    server.answer("/page", ServerAnswer().header("Content-Type", "text/html").body(kPage));
    const std::string page = server.url("/page");
    const Support::ChildResult several = run({"add", page}, 3);
    EXPECT_THAT(several.err, HasSubstr(server.url("/feed")));
    EXPECT_THAT(several.err, HasSubstr("--all"));
    EXPECT_EQ(feedCount(), 0U);
    EXPECT_EQ(json({"add", "--first", page})["feeds"][0]["url"], server.url("/feed"));
    EXPECT_EQ(json({"add", "--all", page})["feeds"].size(), 1U);
    EXPECT_EQ(feedCount(), 2U);
}

TEST_F(ChangingVerbs, AddTellsWhatIsNoFeed) {
    server.answer("/page", ServerAnswer().body("<html><body>Nothing here</body></html>"));
    server.answer("/closed", ServerAnswer(401).header("WWW-Authenticate", "Basic realm=\"x\""));
    EXPECT_THAT(run({"add", server.url("/page")}, 5).err, HasSubstr("There is no feed at "));
    EXPECT_THAT(run({"add", server.url("/gone")}, 5).err, HasSubstr("orvane add --force"));
    EXPECT_THAT(run({"add", server.url("/closed")}, 6).err, HasSubstr("orvane set FEED login"));
    const Support::ChildResult partly = run({"add", server.url("/feed"), server.url("/gone")}, 4);
    EXPECT_THAT(partly.out, HasSubstr("The feed"));
    EXPECT_EQ(feedCount(), 1U);
    run({"add", "--force", "--no-fetch", server.url("/gone")});
    EXPECT_EQ(feedCount(), 2U);
}

TEST_F(ChangingVerbs, RmUnsubscribesUnlessItIsADryRun) {
    add("/feed");
    add("/other");
    EXPECT_THAT(run({"rm", "--dry-run", "the feed"}).out, HasSubstr("The feed"));
    EXPECT_EQ(feedCount(), 2U);
    // One wrong name, and nothing is done.
    run({"rm", "the feed", "no such thing"}, 3);
    EXPECT_EQ(feedCount(), 2U);
    const JSON removed = json({"rm", "the feed"});
    EXPECT_EQ(removed["feeds"][0]["url"], server.url("/feed"));
    EXPECT_EQ(removed["feeds"][0]["entries"], 2);
    EXPECT_EQ(feedCount(), 1U);
    EXPECT_EQ(ids().size(), 1U);
}

TEST_F(ChangingVerbs, MarkAndFlagSayHowManyHaveChanged) {
    add("/feed");
    EXPECT_THAT(run({"mark", "read", "one"}).err, HasSubstr("1 entry marked as read."));
    EXPECT_EQ(ids({"--unread"}).size(), 1U);
    EXPECT_EQ(json({"mark", "read", "--all"})["changed"], 1);
    EXPECT_EQ(ids({"--unread"}).size(), 0U);
    EXPECT_THAT(run({"mark", "unread", "--feed", "the feed"}).err,
                HasSubstr("2 entries marked as unread."));
    EXPECT_EQ(json({"flag", "two"})["changed"], 1);
    EXPECT_EQ(json({"entries", "--flagged"})["entries"][0]["title"], "Two");
    run({"mark", "read", "--feed", "the feed", "--flagged"});
    EXPECT_EQ(json({"entries", "--unread"})["entries"][0]["title"], "One");
    EXPECT_EQ(json({"unflag", "--flagged"})["changed"], 1);
    EXPECT_EQ(json({"unflag", "--flagged"}, 1)["changed"], 0);
    EXPECT_THAT(run({"mark", "red", "one"}, 2).err, HasSubstr("\"read\" or \"unread\""));
    EXPECT_THAT(run({"mark", "read"}, 2).err, HasSubstr("--all"));
    run({"mark", "read", "--all", "one"}, 2);
}

TEST_F(ChangingVerbs, SetShowsAndChangesSettings) {
    add("/feed");
    EXPECT_THAT(run({"set", "the feed"}).out, HasSubstr("refresh\t30 minutes\tthe client\n"));
    EXPECT_THAT(run({"set", "the feed", "refresh", "2h", "expire", "90d"}).out,
                HasSubstr("refresh\t2 hours\tthe feed\nexpire\t90 days\tthe feed\n"));
    EXPECT_THAT(run({"set", "the feed", "refresh", "default"}).out,
                HasSubstr("refresh\t30 minutes\tthe client\n"));
    EXPECT_THAT(run({"set", "--default", "refresh", "1h"}).out,
                HasSubstr("refresh\t1 hour\tthe client\n"));
    EXPECT_THAT(run({"set", "the feed"}).out, HasSubstr("refresh\t1 hour\tthe client\n"));
    EXPECT_THAT(run({"set", "the feed", "login", "ann"}).out, HasSubstr("login\tann\tthe feed\n"));
    EXPECT_THAT(run({"set", "the feed", "refersh", "1h"}, 2).err,
                HasSubstr("did you mean refresh?"));
    EXPECT_THAT(run({"set", "the feed", "login", "bob", "expire"}, 2).err,
                HasSubstr("VALUE is missing"));
    EXPECT_THAT(run({"set", "the feed", "login", "bob", "expire", "soon"}, 2).err,
                HasSubstr("14d"));
    EXPECT_THAT(run({"set", "the feed"}).out, HasSubstr("login\tann\tthe feed\n"));
    EXPECT_THAT(run({"set", "the feed", "password", "secret"}, 2).err, HasSubstr("password -"));
}

TEST_F(ChangingVerbs, RefreshTellsWhatIsNewUnchangedAndFailed) {
    add("/feed");
    add("/other");
    server.answer("/feed", ServerAnswer().body(feed("The feed", {"Zero", "One", "Two"})));
    server.answer("/other", ServerAnswer(404));
    const Support::ChildResult result = run({"refresh", "--force", "--json"}, 4);
    EXPECT_THAT(result.err, HasSubstr("1 new entry in 1 feed, 0 unchanged, 1 failed."));
    const JSON feeds = JSON::parse(result.out)["feeds"];
    ASSERT_EQ(feeds.size(), 2U);
    for (const JSON& each : feeds) {
        const bool isGood = each["url"] == server.url("/feed");
        EXPECT_EQ(each["result"], isGood ? "new" : "failed");
        EXPECT_EQ(each["new"], isGood ? 1 : 0);
        EXPECT_EQ(each["detail"].is_null(), isGood);
    }
    EXPECT_THAT(run({"refresh", "the feed"}).err, HasSubstr("1 unchanged"));
    EXPECT_EQ(json({"feeds", "--failing"})["feeds"].size(), 1U);
    EXPECT_EQ(ids().size(), 4U);
}

TEST_F(ChangingVerbs, RefreshNeedNotWait) {
    add("/feed");
    server.answer("/feed", ServerAnswer().holdHead("gate").body("late"));
    EXPECT_EQ(run({"refresh", "--no-wait", "the feed"}).out, "");
    EXPECT_TRUE(Support::turnUntil([&] { return server.getWaitingCount("gate") == 1; }));
    server.letThrough("gate");
}
