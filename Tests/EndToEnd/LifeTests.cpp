// Days of life: a web whose feeds grow and change, an agent that comes and goes, and clients, by a
// clock that all of them share. What is in the store is compared with a model of it every day.

#include "EndToEnd/Life.h"

#include <cstdlib>

TEST_F(LifeTest, DaysOfManyFeeds) {
    const bool isSlow = std::getenv("ORVANE_SLOW_TESTS") != nullptr;
    ASSERT_NO_FATAL_FAILURE(begin(isSlow ? 200 : 60));
    ASSERT_NO_FATAL_FAILURE(live(isSlow ? 30 : 3));
    EXPECT_GT(keeper.getStarts(), 10);
    EXPECT_GE(model.getDailyRuns(), 3);
    EXPECT_GT(model.getExpunged(), 0);
}
