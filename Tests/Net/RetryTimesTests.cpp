#include "Net/RetryTimes.h"

#include "NetTest.h"
#include "Support/TempDir.h"

using namespace Orvane;
using Foundation::NetError;

namespace {

using Notes = std::vector<std::string>;

class RetryTimesTest : public NetTest {
 protected:
    std::string path() const { return mDirectory / "RetryTimes"; }
    void note(RetryTimes& times, const char* address, int status, const char* retryAfter,
              std::vector<HTTPHeader> more = {}) {
        more.push_back({"Retry-After", retryAfter});
        const Ref<HTTPMessage> message = HTTPMessage::response(status, more);
        times.note(*url(address), *message);
    }
    /// Seconds that the host is not asked for; 0 if it may be.
    double wait(RetryTimes& times, const char* address) {
        const auto refusal = times.find(*url(address));
        return refusal ? refusal->until - mClock.now() : 0;
    }

    Support::TempDir mDirectory;
};

TEST_F(RetryTimesTest, KeepsAHostFromBeingAskedForAsLongAsItSays) {
    RetryTimes times(path());
    note(times, "http://a/feed", 429, "120");
    EXPECT_EQ(wait(times, "http://a/other"), 120);
    EXPECT_EQ(wait(times, "http://b/"), 0);
    mClock.advanceBy(119);
    EXPECT_EQ(wait(times, "https://a/"), 1);
    mClock.advanceBy(1);
    EXPECT_EQ(wait(times, "http://a/feed"), 0);
}

TEST_F(RetryTimesTest, KnowsHostsByTheirPort) {
    RetryTimes times(path());
    note(times, "http://A:8080/", 503, "10");
    EXPECT_EQ(wait(times, "http://a:8080/x"), 10);
    EXPECT_EQ(wait(times, "http://a/"), 0);
}

TEST_F(RetryTimesTest, ReadsDates) {
    RetryTimes times(path());
    note(times, "http://a/", 503, "Thu, 01 Jan 2026 00:05:00 GMT");
    EXPECT_EQ(wait(times, "http://a/"), 300);
}

TEST_F(RetryTimesTest, CountsDatesFromTheServersOwn) {
    RetryTimes times(path());
    note(times, "http://a/", 503, "Sun, 06 Nov 1994 08:50:37 GMT",
         {{"Date", "Sun, 06 Nov 1994 08:49:37 GMT"}});
    EXPECT_EQ(wait(times, "http://a/"), 60);
}

TEST_F(RetryTimesTest, MindsNothingElse) {
    RetryTimes times(path());
    note(times, "http://a/", 200, "60");
    note(times, "http://a/", 500, "60");
    note(times, "http://a/", 301, "60");
    note(times, "http://a/", 503, "soon");
    note(times, "http://a/", 503, "-5");
    note(times, "http://a/", 503, "0");
    note(times, "http://a/", 503, "Wed, 31 Dec 2025 00:00:00 GMT");
    EXPECT_EQ(wait(times, "http://a/"), 0);
    EXPECT_FALSE(std::filesystem::exists(path()));
}

TEST_F(RetryTimesTest, SurvivesARestart) {
    {
        RetryTimes times(path());
        note(times, "http://a/", 429, "3600");
        note(times, "http://b/", 503, "10");
    }
    mClock.advanceBy(60);
    RetryTimes times(path());
    EXPECT_EQ(wait(times, "http://a/"), 3540);
    EXPECT_EQ(times.find(*url("http://a/"))->status, 429);
    EXPECT_EQ(wait(times, "http://b/"), 0);
}

TEST_F(RetryTimesTest, KeepsWhatAnotherProcessWrote) {
    RetryTimes one(path());
    RetryTimes other(path());
    EXPECT_EQ(wait(one, "http://a/"), 0);
    EXPECT_EQ(wait(other, "http://a/"), 0);
    note(one, "http://a/", 429, "100");
    note(other, "http://b/", 429, "100");
    RetryTimes third(path());
    EXPECT_EQ(wait(third, "http://a/"), 100);
    EXPECT_EQ(wait(third, "http://b/"), 100);
}

TEST_F(RetryTimesTest, ReadsNothingIntoABrokenFile) {
    mDirectory.writeFile("RetryTimes", "a\n\nb x y\nc 429\nd 503 788918500\n\xff\xff 1 2 3\n");
    RetryTimes times(path());
    EXPECT_EQ(wait(times, "http://a/"), 0);
    EXPECT_EQ(wait(times, "http://c/"), 0);
    EXPECT_EQ(wait(times, "http://d/"), 100);
}

TEST_F(RetryTimesTest, BoundsTheTime) {
    const Support::LogCapture log;
    RetryTimes times(path());
    note(times, "http://a/", 429, "99999999999999");
    EXPECT_EQ(wait(times, "http://a/"), 31 * 86400);
    EXPECT_EQ(log.count("<a>: wants to be left alone for 2147483648 seconds"), 1);
    // A time that cannot have been meant, as a clock that was wrong leaves behind.
    mClock.jumpTo(mClock.now() - 86400);
    EXPECT_EQ(wait(times, "http://a/"), 0);
}

TEST_F(RetryTimesTest, BoundsTheNumberOfHosts) {
    RetryTimes times("");
    for (std::size_t i = 0; i < RetryTimes::kMaxHosts + 10; ++i) {
        note(times, ("http://h" + std::to_string(i) + "/").c_str(), 429,
             std::to_string(1000 + i).c_str());
    }
    EXPECT_EQ(wait(times, "http://h9/"), 0);
    EXPECT_EQ(wait(times, "http://h10/"), 1010);
}

TEST_F(RetryTimesTest, WarnsWhenItCannotBeWritten) {
    const Support::LogCapture log;
    RetryTimes times(mDirectory / "missing/RetryTimes");
    note(times, "http://a/", 429, "100");
    EXPECT_EQ(wait(times, "http://a/"), 100);
    EXPECT_EQ(log.count("Can't write \""), 1);
}

class PolitenessTest : public NetTest {
 protected:
    Notes fetch(const char* address) {
        mRequest = get(address);
        const RequestRecorder recorder(*mRequest);
        mRequest->start(true);
        turn();
        const Notes notes = recorder.notes;
        mRequest->stop();
        return notes;
    }

    Ref<HTTPRequest> mRequest;
};

TEST_F(PolitenessTest, AnswersForAHostThatWantsToBeLeftAlone) {
    network().answer("http://a/1", {.status = 429, .headers = {{"Retry-After", "90"}}});
    EXPECT_EQ(fetch("http://a/1"), (Notes{"opened", "response 429", "finished"}));
    EXPECT_EQ(fetch("http://a/2"), (Notes{"opened", "response 429", "finished"}));
    EXPECT_EQ(mRequest->getHTTPResponse()->getHeader("Retry-After"), "90");
    EXPECT_EQ(network().asked(), Notes{"GET http://a/1"});
    mClock.advanceBy(90);
    network().answer("http://a/2", {});
    EXPECT_EQ(fetch("http://a/2"), (Notes{"opened", "response 200", "finished"}));
}

TEST_F(PolitenessTest, AsksNoHostAgainByWayOfARedirect) {
    network().answer("http://a/", {.status = 503, .headers = {{"Retry-After", "90"}}});
    fetch("http://a/");
    network().answer("http://b/", {.status = 302, .headers = {{"Location", "http://a/x"}}});
    EXPECT_EQ(fetch("http://b/"), (Notes{"opened", "response 503", "finished"}));
    EXPECT_EQ(network().asked(), (Notes{"GET http://a/", "GET http://b/"}));
}

}  // namespace
