#include "CommandLine/NameMatch.h"

#include "CommandLine/Failure.h"

#include <gmock/gmock.h>

using Commands::ExitStatus;
using Commands::Failure;
using Commands::NameMatch::find;
using Commands::NameMatch::Named;
using testing::HasSubstr;

namespace {

const std::vector<Named> kThings = {
    {"abcdef0123456789", "http://e.org/a", "Planet News"},
    {"abcdef0999999999", "http://e.org/b/", "News"},
    {"1234567890abcdef", "http://e.org/c", "\u00C4pfel und News"},
};

/// Why a name is refused.
std::string refusal(const std::string& name) {
    try {
        find(name, kThings, "feed");
        return "none";
    } catch (const Failure& failure) {
        EXPECT_EQ(failure.getStatus(), ExitStatus::UnknownName);
        return failure.what();
    }
}

}  // namespace

TEST(NameMatch, KnowsIdentifiersAndTheirBeginnings) {
    EXPECT_EQ(find("abcdef0123456789", kThings, "feed"), 0U);
    EXPECT_EQ(find("1234567", kThings, "feed"), 2U);
    EXPECT_EQ(find("abcdef01", kThings, "feed"), 0U);
    EXPECT_THAT(refusal("abcdef0"), HasSubstr("may be 2 feeds"));
    EXPECT_THAT(refusal("abcdef0"), HasSubstr("abcdef012345  Planet News"));
    // Six characters are too few.
    EXPECT_THAT(refusal("123456"), HasSubstr("there is no feed"));
}

TEST(NameMatch, KnowsURLs) {
    EXPECT_EQ(find("http://e.org/a", kThings, "feed"), 0U);
    EXPECT_EQ(find("http://e.org/b", kThings, "feed"), 1U);
    EXPECT_THAT(refusal("http://e.org/"), HasSubstr("there is no feed"));
}

TEST(NameMatch, KnowsPartsOfTitlesWithoutRegardToCase) {
    EXPECT_EQ(find("planet", kThings, "feed"), 0U);
    EXPECT_EQ(find("\u00E4PFEL", kThings, "feed"), 2U);
    // The whole title comes before a part of one.
    EXPECT_EQ(find("news", kThings, "feed"), 1U);
    EXPECT_THAT(refusal("ews"), HasSubstr("may be 3 feeds"));
}

TEST(NameMatch, SaysWhatWasProbablyMeant) {
    EXPECT_THAT(refusal("Planet Nwes"), HasSubstr("did you mean \"Planet News\"?"));
    EXPECT_THAT(refusal("zzz"), HasSubstr("\"orvane feeds\" lists what there is"));
}
