#include "Net/ServerTest.h"
#include "Support/ScriptedServer.h"

using namespace Foundation;
using namespace Orvane;
using Support::ScriptedServer;
using Support::ServerAnswer;

namespace {

class RetryAfterTest : public ServerTest, public testing::WithParamInterface<int> {};

}  // namespace

TEST_P(RetryAfterTest, IsHeardBySecondsAndByDate) {
    const int status = GetParam();
    const std::string result = "4 " + std::to_string(status);
    // The clock of the test begins at the midnight before; the date is tried 20 minutes later.
    for (const char* when : {"600", "Thu, 01 Jan 2026 00:30:00 GMT"}) {
        ScriptedServer asked;
        asked.answer("/feed", ServerAnswer(status).header("Retry-After", when));
        asked.answer("/other", ServerAnswer().body(rss("A")));
        FeedCore& feed = *storedFeed(asked.url("/feed").c_str());
        FeedCore& other = *storedFeed(asked.url("/other").c_str());
        EXPECT_EQ(refresh(feed), result);
        EXPECT_EQ(refresh(other), result);
        EXPECT_EQ(asked.getRequestCount(), 1);
        EXPECT_EQ(other.mRefreshLocalDate.getValue()->getAbsoluteTime(), clock.now());
        clock.advanceBy(599);
        EXPECT_EQ(refresh(other), result);
        clock.advanceBy(601);
        EXPECT_EQ(refresh(other), "changed");
        EXPECT_EQ(asked.getRequestCount(), 2);
    }
}

INSTANTIATE_TEST_SUITE_P(Statuses, RetryAfterTest, testing::Values(429, 503));
