// Days of life: a web whose feeds grow and change, an agent that comes and goes, and clients, by a
// clock that all of them share. What is in the store is compared with a model of it every day.

#include "EndToEnd/Life.h"

TEST_F(LifeTest, ADayOrTwoWithTwentyFeeds) {
    ASSERT_NO_FATAL_FAILURE(begin(20));
    ASSERT_NO_FATAL_FAILURE(liveADay());
    ASSERT_NO_FATAL_FAILURE(liveADay());
    EXPECT_GT(keeper.getStarts(), 2);
    EXPECT_GT(model.getDailyRuns(), 1);
}
