#include "CommandLine/Suggestion.h"

#include <gtest/gtest.h>

using Commands::Suggestion::closest;
using Commands::Suggestion::distance;

TEST(Suggestion, CountsLettersThatDiffer) {
    EXPECT_EQ(distance("feeds", "feeds"), 0U);
    EXPECT_EQ(distance("feeds", "fedes"), 1U);
    EXPECT_EQ(distance("feeds", "feed"), 1U);
    EXPECT_EQ(distance("", "abc"), 3U);
    EXPECT_EQ(distance("abc", "xyz"), 3U);
}

TEST(Suggestion, IsTheNearestThatIsNearEnough) {
    const std::vector<std::string> verbs{"feeds", "entries", "mark", "rm", "refresh"};
    EXPECT_EQ(closest("feds", verbs), "feeds");
    EXPECT_EQ(closest("entires", verbs), "entries");
    EXPECT_EQ(closest("ref", verbs), "refresh");
    EXPECT_EQ(closest("mr", verbs), "rm");
    EXPECT_EQ(closest("xylophone", verbs), "");
    EXPECT_EQ(closest("x", {}), "");
}
