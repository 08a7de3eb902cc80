#include "Foundation/LongWork.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

using namespace Foundation;

namespace {

class LongWorkTest : public testing::Test {
 protected:
    ~LongWorkTest() noexcept override {}

    AutoreleasePool pool;
    Support::ManualClock clock;
    Support::LogCapture log;
};

}  // namespace

TEST_F(LongWorkTest, WarnsOfWorkOfMoreThan100Milliseconds) {
    {
        const LongWork work("parsing", URL::url(String::string("http://e.org/feed")));
        clock.sleep(0.1015);
    }
    EXPECT_TRUE(
        log.contains("Long work on the run loop: parsing of <http://e.org/feed> took 102 "
                     "ms"))
        << log.lines().size();
}

TEST_F(LongWorkTest, SaysNothingOfShorterWork) {
    {
        const LongWork work("parsing");
        clock.sleep(0.0995);
    }
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(LongWorkTest, NamesNoFeedWhereThereIsNone) {
    {
        const LongWork work("integrity check");
        clock.sleep(3);
    }
    EXPECT_TRUE(log.contains("Long work on the run loop: integrity check took 3000 ms"));
}

TEST_F(LongWorkTest, TakesNothingForLongWhenTheClockIsSetBack) {
    {
        const LongWork work("merging");
        clock.jumpTo(Support::ManualClock::kStart - 3600);
    }
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(LongWorkTest, KeepsTheURLOfAFeedThatGoes) {
    {
        Ref<URL> url{URL::url(String::string("http://e.org/gone"))};
        const LongWork work("merging", url);
        url = nullptr;
        clock.sleep(1);
    }
    EXPECT_TRUE(log.contains("merging of <http://e.org/gone> took 1000 ms"));
}
