#include "Support/ScriptedServer.h"

#include "Support/BackgroundProcess.h"
#include "Support/ChildProcess.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

using namespace Support;

namespace {

class ScriptedServerTest : public testing::Test {
 protected:
    /// What curl says of its transfers, with these arguments; `mStatus` is its result.
    std::string curl(const std::vector<std::string>& arguments) {
        std::vector<std::string> command{"/usr/bin/curl", "-s", "-m", "60", "--noproxy", "*"};
        command.insert(command.end(), arguments.begin(), arguments.end());
        ChildResult result = runChild(command);
        mStatus = result.status;
        return result.out;
    }

    ScriptedServer server;
    int mStatus = -1;
};

}  // namespace

TEST_F(ScriptedServerTest, AnswersAsItWasTold) {
    server.answer("/a", ServerAnswer(201).header("X-Word", "yes").body("one ").body("two ", 2));
    EXPECT_EQ(curl({"-i", server.url("/a?x=1")}),
              "HTTP/1.1 201 Scripted\r\nX-Word: yes\r\nContent-Length: 12\r\n\r\none two two ");
    EXPECT_EQ(curl({"-w", "%{http_code}", server.url("/none")}), "404");
    ASSERT_EQ(server.getRequestCount(), 2);
    EXPECT_EQ(server.getRequests("/a").front().target, "/a?x=1");
    EXPECT_EQ(server.getRequests("/a").front().method, "GET");
    EXPECT_EQ(server.getRequests("/a").front().header("accept"), "*/*");
    EXPECT_EQ(server.getRequests("/a").front().header("range"), "");
}

TEST_F(ScriptedServerTest, AnswersOnceBeforeItAnswersAsAlways) {
    server.answer("/a", ServerAnswer().body("always "));
    server.answerOnce("/a", ServerAnswer().body("first "));
    server.answerOnce("/a", ServerAnswer().body("second "));
    EXPECT_EQ(curl({server.url("/a"), server.url("/a"), server.url("/a"), server.url("/a")}),
              "first second always always ");
}

TEST_F(ScriptedServerTest, KeepsConnections) {
    server.answer("/a", ServerAnswer().body("x"));
    server.answer("/c", ServerAnswer().chunked().body("ab").body("c"));
    server.answer("/n", ServerAnswer(304));
    EXPECT_EQ(curl({server.url("/a"), server.url("/c"), server.url("/n"), server.url("/a")}),
              "xabcx");
    EXPECT_EQ(server.getConnectionCount(), 1);
    EXPECT_EQ(server.getMostConnections(), 1);
    EXPECT_EQ(server.getRequests().back().connection, 1);
}

TEST_F(ScriptedServerTest, EndsBodiesWithoutALengthByClosing) {
    server.answer("/a", ServerAnswer().withoutLength().body("abc"));
    EXPECT_EQ(curl({server.url("/a"), server.url("/a")}), "abcabc");
    EXPECT_EQ(server.getConnectionCount(), 2);
}

TEST_F(ScriptedServerTest, LiesAboutLengths) {
    server.answer("/a", ServerAnswer().claimLength(10).body("abc").close());
    EXPECT_EQ(curl({server.url("/a")}), "abc");
    EXPECT_EQ(mStatus, 18);  // of a partial file
}

TEST_F(ScriptedServerTest, BreaksConnections) {
    server.answer("/a", ServerAnswer().body("abc").claimLength(10).reset());
    curl({server.url("/a")});
    EXPECT_EQ(mStatus, 56);  // of a failure in receiving
    server.answer("/b", ServerAnswer::raw(""));
    server.answerOnce("/b", ServerAnswer::raw("nonsense\r\n\r\n").close());
    curl({server.url("/b")});
    EXPECT_EQ(mStatus, 1);  // of what is no HTTP/1
}

TEST_F(ScriptedServerTest, SendsForEver) {
    server.answer("/a", ServerAnswer().body(std::string(1000, 'x'), ServerAnswer::kForEver));
    const std::string command =
        "curl -s --noproxy '*' " + server.url("/a") + " | head -c 3000000 | wc -c";
    EXPECT_EQ(runChild({"/bin/sh", "-c", command}).out, "3000000\n");
    EXPECT_GE(server.getSentBytes(), 3'000'000U);
    ASSERT_TRUE(turnUntil([&] { return server.getOpenConnectionCount() == 0; }));
}

TEST_F(ScriptedServerTest, WaitsAtGatesUntilTheTestOpensThem) {
    const TempDir files;
    server.answer("/a", ServerAnswer().holdHead("head").body("a").wait("body").body("b"));
    {
        const BackgroundProcess curling(
            {"curl", "-s", "-N", "--noproxy", "*", "-o", files / "out", server.url("/a")});
        ASSERT_TRUE(turnUntil([&] { return server.getWaitingCount("head") == 1; }));
        EXPECT_EQ(server.getSentBytes(), 0U);
        server.letThrough("head");
        ASSERT_TRUE(turnUntil([&] { return server.getWaitingCount("body") == 1; }));
        EXPECT_EQ(server.getWaitingCount("head"), 0);
        const std::uint64_t sent = server.getSentBytes();
        server.letThrough("body");
        ASSERT_TRUE(turnUntil([&] { return server.getOpenConnectionCount() == 0; }));
        EXPECT_EQ(server.getSentBytes(), sent + 1);
    }
    EXPECT_EQ(files.readFile("out"), "ab");
}

TEST_F(ScriptedServerTest, ForgetsWhoLeavesAtAGate) {
    server.answer("/a", ServerAnswer().holdHead("head"));
    {
        const BackgroundProcess curling({"curl", "-s", "--noproxy", "*", server.url("/a")});
        ASSERT_TRUE(turnUntil([&] { return server.getWaitingCount("head") == 1; }));
    }
    ASSERT_TRUE(turnUntil([&] { return server.getOpenConnectionCount() == 0; }));
    EXPECT_EQ(server.getWaitingCount("head"), 0);
}
