#include "Net/ConnectionLimits.h"
#include "Net/ServerTest.h"
#include "Support/ScriptedServer.h"

using namespace Foundation;
using namespace Orvane;
using Support::ScriptedServer;
using Support::ServerAnswer;
using Support::ServerRequest;
using Support::turnUntil;

namespace {

constexpr const char* kTimedOut = "15 -1001";
constexpr const char* kLost = "15 -1005";
constexpr const char* kTooManyRedirects = "15 -1007";
constexpr const char* kBadResponse = "15 -1011";

class BadServerTest : public ServerTest {
 protected:
    FeedCore& feedOf(const std::string& place) { return *storedFeed(server.url(place).c_str()); }
    std::string refreshPath(const std::string& place) { return refresh(feedOf(place)); }
    static ServerAnswer document(const std::string& body) {
        return ServerAnswer().header("Content-Type", "text/xml").body(body);
    }

    ScriptedServer server;
};

/// Documents in which nothing repeats, as far as a compressor can see.
std::string noise(std::size_t length) {
    std::string text(length, ' ');
    unsigned state = 12345;
    for (char& c : text) {
        state = state * 1103515245U + 12345U;
        c = static_cast<char>('a' + (state >> 16) % 26);
    }
    return text;
}

}  // namespace

TEST_F(BadServerTest, GetsADocumentFromOneThatIsGood) {
    server.answer("/feed", document(rss("A")).header("ETag", "\"1\""));
    FeedCore& feed = feedOf("/feed");
    EXPECT_EQ(refresh(feed), "changed");
    EXPECT_EQ(text(feed.mTitle), "A");
    EXPECT_EQ(text(feed.mRefreshETag), "\"1\"");
    EXPECT_EQ(refresh(feed), "same");
    EXPECT_EQ(server.getRequests().back().header("if-none-match"), "\"1\"");
    EXPECT_EQ(server.getRequests().back().header("user-agent").find("Tarnwick-Orvane/"), 0U);
    EXPECT_EQ(server.getConnectionCount(), 1);
}

TEST_F(BadServerTest, GivesUpAfterFiveMinutesOnOneThatSendsAByteNowAndThen) {
    ServerAnswer answer;
    for (int i = 0; i < 100; ++i) {
        answer.wait("tick").body("x");
    }
    server.answer("/slow", answer);
    FeedCore& feed = feedOf("/slow");
    const double start = clock.now();
    begin(feed);
    ASSERT_TRUE(turnUntil([&] { return server.getWaitingCount("tick") == 1; }));
    while (feederOf(feed)->isRefreshing() && clock.now() < start + 400) {
        const std::uint64_t sent = server.getSentBytes();
        server.letThrough("tick");
        ASSERT_TRUE(turnUntil([&] { return server.getSentBytes() > sent; }));
        clock.advanceBy(5);
    }
    EXPECT_EQ(resultOf(feed), kTimedOut);
    EXPECT_GE(clock.now(), start + ConnectionLimits::kMaxDocumentSeconds);
    EXPECT_LE(clock.now(), start + ConnectionLimits::kMaxDocumentSeconds + 10);
}

TEST_F(BadServerTest, GivesUpAfterTwoMinutesOnOneThatSaysNothing) {
    server.answer("/dumb", ServerAnswer().holdHead("never"));
    FeedCore& feed = feedOf("/dumb");
    const double start = clock.now();
    begin(feed);
    ASSERT_TRUE(turnUntil([&] { return server.getWaitingCount("never") == 1; }));
    while (feederOf(feed)->isRefreshing() && clock.now() < start + 400) {
        clock.advanceBy(5);
    }
    EXPECT_EQ(resultOf(feed), kTimedOut);
    EXPECT_GE(clock.now(), start + 120);
    EXPECT_LE(clock.now(), start + 130);
    ASSERT_TRUE(turnUntil([&] { return server.getOpenConnectionCount() == 0; }));
}

TEST_F(BadServerTest, TakesNothingFromConnectionsThatBreak) {
    const std::string body = rss("A", "One", noise(100'000));
    for (int tenth = 0; tenth < 10; ++tenth) {
        const std::string place = "/reset" + std::to_string(tenth);
        const std::size_t length = body.size() * static_cast<std::size_t>(tenth) / 10;
        server.answer(place,
                      ServerAnswer().claimLength(body.size()).body(body.substr(0, length)).reset());
        FeedCore& feed = feedOf(place);
        EXPECT_EQ(refresh(feed), kLost) << tenth;
        EXPECT_EQ(text(feed.mTitle), "null");
        EXPECT_NE(feed.mRefreshLocalDate.getValue(), nullptr);
    }
    EXPECT_EQ(count("Entries"), 0);
}

TEST_F(BadServerTest, TakesNothingOfBodiesThatAreShorterThanTheySay) {
    const std::string body = rss("A");
    server.answer("/short", ServerAnswer().claimLength(body.size() + 1).body(body).close());
    EXPECT_EQ(refreshPath("/short"), kLost);
    EXPECT_EQ(count("Entries"), 0);
}

TEST_F(BadServerTest, ReadsNoMoreThanABodySaysItHas) {
    server.answer("/long", ServerAnswer().claimLength(rss("A").size()).body(rss("A") + "more"));
    FeedCore& feed = feedOf("/long");
    EXPECT_EQ(refresh(feed), "changed");
    EXPECT_EQ(text(feed.getXMLData()), rss("A"));
}

TEST_F(BadServerTest, FollowsNoCircleOfRedirects) {
    server.answer("/a", ServerAnswer::redirect(301, "/b"));
    server.answer("/b", ServerAnswer::redirect(302, "/a"));
    FeedCore& feed = feedOf("/a");
    EXPECT_EQ(refresh(feed), kTooManyRedirects);
    EXPECT_EQ(server.getRequestCount(), ConnectionLimits::kMaxRedirects + 1);
    EXPECT_EQ(text(feed.mRedirectedURL), "null");
}

TEST_F(BadServerTest, FollowsRedirectsToWebServersAlone) {
    server.answer("/file", ServerAnswer::redirect(302, "file:///etc/passwd"));
    server.answer("/ftp", ServerAnswer::redirect(302, "ftp://127.0.0.1/feed"));
    for (const char* place : {"/file", "/ftp"}) {
        FeedCore& feed = feedOf(place);
        const std::string result = refresh(feed);
        EXPECT_EQ(result.find("15 -10"), 0U) << result;
        EXPECT_EQ(text(feed.getXMLData()), "null");
    }
}

TEST_F(BadServerTest, ReadsNoBodyOfWhatHasNotChanged) {
    server.answer("/feed", ServerAnswer(304).body(rss("A")));
    EXPECT_EQ(refreshPath("/feed"), "same");
    EXPECT_EQ(count("Entries"), 0);
    // The connection may be of no use any more, but the server is.
    server.answer("/feed", document(rss("A")));
    EXPECT_EQ(refreshPath("/feed?2"), "changed");
}

TEST_F(BadServerTest, OffersALoginOnceToOneThatIsNeverContent) {
    server.answerBy("/login", [](const ServerRequest&) {
        return ServerAnswer(401).header("WWW-Authenticate", "Basic realm=\"R\"").body("No.");
    });
    FeedCore& feed = feedOf("/login");
    feed.mLogin.setValue(string("ann"));
    feed.setPassword(string("secret"), false);
    EXPECT_EQ(refresh(feed), "4 401");
    ASSERT_EQ(server.getRequestCount(), 2);
    EXPECT_EQ(server.getRequests()[0].header("authorization"), "");
    EXPECT_EQ(server.getRequests()[1].header("authorization"), "Basic YW5uOnNlY3JldA==");
}

TEST_F(BadServerTest, TakesWhatIsNoHTTPForAnError) {
    server.answer("/words", ServerAnswer::raw("Hello.\r\n\r\n").close());
    server.answer("/nothing", ServerAnswer::raw("").close());
    EXPECT_EQ(refreshPath("/words").find("15 -10"), 0U);
    EXPECT_EQ(refreshPath("/nothing"), kLost);
}

TEST_F(BadServerTest, StopsReadingHeadsThatAreTooLong) {
    ServerAnswer answer = document(rss("A"));
    for (int i = 0; i < 60; ++i) {
        answer.header("X-" + std::to_string(i), std::string(5000, 'x'));
    }
    server.answer("/heads", answer);
    EXPECT_EQ(refreshPath("/heads"), kBadResponse);
}

TEST_F(BadServerTest, IsRefusedWhereNobodyListens) {
    std::string address;
    {
        const ScriptedServer gone;
        address = gone.url("/feed");
    }
    EXPECT_EQ(refresh(address), "15 -1004");
}

TEST_F(BadServerTest, IsAskedOverFewConnections) {
    std::vector<FeedCore*> feeds;
    for (int i = 0; i < 20; ++i) {
        const std::string place = "/feed" + std::to_string(i);
        server.answer(place, document(rss(place)).holdHead("all"));
        feeds.push_back(&feedOf(place));
        begin(*feeds.back());
    }
    ASSERT_TRUE(turnUntil([&] { return server.getWaitingCount("all") > 0; }));
    server.letThrough("all", 20);
    for (FeedCore* feed : feeds) {
        ASSERT_TRUE(waitForEnd(*feed));
        EXPECT_EQ(resultOf(*feed), "changed");
    }
    EXPECT_LE(server.getMostConnections(), 6);
}

TEST_F(BadServerTest, IsAskedWithConditionsFromTheSecondRoundOnOverFourConnections) {
    constexpr int kFeeds = 200;
    std::vector<FeedCore*> feeds;
    for (int i = 0; i < kFeeds; ++i) {
        const std::string place = "/feed" + std::to_string(i);
        server.answerBy(place, [place](const ServerRequest& request) {
            const bool isKnown = request.header("if-none-match") == "\"" + place + "\"";
            if (isKnown) return ServerAnswer(304);
            return document(rss(place)).header("ETag", "\"" + place + "\"");
        });
        feeds.push_back(&feedOf(place));
    }
    for (const char* result : {"changed", "same"}) {
        server.forgetRequests();
        for (FeedCore* feed : feeds) {
            feed->refresh(false, true);
        }
        for (FeedCore* feed : feeds) {
            ASSERT_TRUE(waitForEnd(*feed));
            ASSERT_EQ(resultOf(*feed), result);
        }
        EXPECT_EQ(server.getRequestCount(), kFeeds);
    }
    EXPECT_LE(server.getMostConnections(), 4);
    EXPECT_LE(server.getConnectionCount(), 4);
}
