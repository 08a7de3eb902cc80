#include "Net/ConnectionLimits.h"
#include "Net/ServerTest.h"
#include "Support/Coded.h"
#include "Support/ProcessMemory.h"
#include "Support/ScriptedServer.h"

using namespace Foundation;
using namespace Orvane;
using Support::ProcessMemory;
using Support::ScriptedServer;
using Support::ServerAnswer;
using Support::turnUntil;

namespace {

constexpr const char* kBadResponse = "15 -1011";
constexpr std::size_t kMegabyte = std::size_t{1} << 20;

class BadBodyTest : public ServerTest {
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

TEST_F(BadBodyTest, TakesNothingOfCompressedBodiesThatAreCutOffOrBroken) {
    const std::string whole = Support::gzipped(rss("A", "One", noise(50'000)));
    std::string broken = whole;
    broken[broken.size() / 2] = static_cast<char>(broken[broken.size() / 2] ^ 0x55);
    std::string wrongSum = whole;
    wrongSum[wrongSum.size() - 8] = static_cast<char>(wrongSum[wrongSum.size() - 8] ^ 1);
    const std::string bodies[] = {whole.substr(0, whole.size() / 2),
                                  whole.substr(0, whole.size() - 1), broken, wrongSum, "plain"};
    int number = 0;
    for (const std::string& body : bodies) {
        const std::string place = "/gzip" + std::to_string(number++);
        server.answer(place, document(body).header("Content-Encoding", "gzip"));
        FeedCore& feed = feedOf(place);
        EXPECT_EQ(refresh(feed), kBadResponse) << number;
        EXPECT_TRUE(IsEqual(feed.getXMLData(), nullptr));
    }
    EXPECT_EQ(count("Entries"), 0);
    server.answer("/gzip", document(whole).header("Content-Encoding", "gzip"));
    EXPECT_EQ(refreshPath("/gzip"), "changed");
}

TEST_F(BadBodyTest, StopsReadingABodyThatHasNoEnd) {
    server.answer("/endless", ServerAnswer().body(noise(65536), ServerAnswer::kForEver));
    const std::size_t before = ProcessMemory::now();
    ProcessMemory::forgetPeak();
    EXPECT_EQ(refreshPath("/endless"), kBadResponse);
    EXPECT_LT(ProcessMemory::peak(), before + 160 * kMegabyte);
    ASSERT_TRUE(turnUntil([&] { return server.getOpenConnectionCount() == 0; }));
    EXPECT_GE(server.getSentBytes(), ConnectionLimits::kMaxDocumentBytes);
    EXPECT_LT(server.getSentBytes(), 2 * ConnectionLimits::kMaxDocumentBytes);
    EXPECT_TRUE(turnUntil([&] { return ProcessMemory::now() < before + 16 * kMegabyte; }));
}

TEST_F(BadBodyTest, StopsReadingABodyThatIsAThousandTimesWhatIsSent) {
    const std::string bomb = Support::gzipped(std::string(30 * kMegabyte, 'x'));
    ASSERT_LT(bomb.size() * 900, 30 * kMegabyte);
    server.answer("/bomb", document(bomb).header("Content-Encoding", "gzip"));
    const std::size_t before = ProcessMemory::now();
    ProcessMemory::forgetPeak();
    EXPECT_EQ(refreshPath("/bomb"), kBadResponse);
    EXPECT_LT(ProcessMemory::peak(), before + 32 * kMegabyte);
    EXPECT_TRUE(turnUntil([&] { return ProcessMemory::now() < before + 16 * kMegabyte; }));
}

TEST_F(BadBodyTest, TakesTheLargestDocumentWithinItsMemory) {
    std::string body = "<?xml version=\"1.0\"?><rss version=\"2.0\"><channel><title>A</title>";
    for (int i = 0; body.size() < 31 * kMegabyte; ++i) {
        body += "<item><guid isPermaLink=\"false\">" + std::to_string(i) + "</guid><description>" +
                noise(30'000) + "</description></item>";
    }
    body += "</channel></rss>";
    server.answer("/large", document(body).holdHead("gate"));
    FeedCore& feed = feedOf("/large");
    begin(feed);
    // What the server keeps for its answer is not ours.
    ASSERT_TRUE(turnUntil([&] { return server.getWaitingCount("gate") == 1; }));
    const std::size_t before = ProcessMemory::now();
    ProcessMemory::forgetPeak();
    server.letThrough("gate");
    {
        const AutoreleasePool inner;
        ASSERT_TRUE(waitForEnd(feed));
    }
    EXPECT_EQ(resultOf(feed), "changed");
    EXPECT_LT(ProcessMemory::peak(), before + 160 * kMegabyte);
    // What the database in memory keeps is there still.
    EXPECT_TRUE(turnUntil([&] { return ProcessMemory::now() < before + 64 * kMegabyte; }));
}
