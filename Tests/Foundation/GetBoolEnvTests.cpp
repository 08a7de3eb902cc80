#include "Foundation/Switches.h"
#include "Support/EnvVar.h"

#include <gtest/gtest.h>

using Foundation::GetBoolEnv;
using Support::EnvVar;

namespace {

const char* const kName = "OVTestSwitch";

struct Case {
    const char* value;
    bool result;
};

void PrintTo(const Case& c, std::ostream* out) {
    *out << '"' << (c.value ? c.value : "(unset)") << '"';
}

class GetBoolEnvTest : public testing::TestWithParam<Case> {};

}  // namespace

TEST_P(GetBoolEnvTest, LooksAtTheFirstTwoCharacters) {
    const EnvVar variable(kName, GetParam().value);
    EXPECT_EQ(GetBoolEnv(kName), GetParam().result);
}

INSTANTIATE_TEST_SUITE_P(Values, GetBoolEnvTest,
                         testing::Values(Case{nullptr, false}, Case{"no", false}, Case{"No", false},
                                         Case{"nO", false}, Case{"NO", false}, Case{"none", false},
                                         Case{"North", false}, Case{"0", false}, Case{"0x1", false},
                                         Case{"01", false}, Case{"", true}, Case{"n", true},
                                         Case{"N", true}, Case{"NaN", true}, Case{"1", true},
                                         Case{"yes", true}, Case{" 0", true}, Case{"off", true},
                                         Case{"false", true}));
