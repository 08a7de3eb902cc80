#include "CommandLine/RowFormat.h"

#include "CommandLine/Failure.h"

#include <gtest/gtest.h>

using Commands::Failure;
using Commands::Listing;
using Commands::RowFormat::expand;

namespace {

const Listing kListing{"things",
                       {{"id"}, {"title"}},
                       {{{std::string("1"), std::string("One\n{id}")}}, {{std::string("2"), {}}}}};

}  // namespace

TEST(RowFormat, PutsValuesInTheirPlaces) {
    EXPECT_EQ(expand("{id}: {title}", kListing), "1: One {id}\n2: \n");
    EXPECT_EQ(expand("{{{id}}\\t\\n\\\\", kListing), "{1}\t\n\\\n{2}\t\n\\\n");
    EXPECT_EQ(expand("", kListing), "\n\n");
}

TEST(RowFormat, RefusesKeysThatThereAreNot) {
    EXPECT_THROW(expand("{titel}", kListing), Failure);
    EXPECT_THROW(expand("{title", kListing), Failure);
}
