#include "Foundation/Switches.h"

#include "Foundation/ApplicationIdentity.h"
#include "Foundation/Number.h"
#include "Foundation/PreferenceFolder.h"
#include "Foundation/UntypedPref.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <thread>

using namespace Foundation;
using Support::EnvVar;

namespace {

constexpr const char* kName = "OVTestSwitch";
constexpr const char* kApplication = "com.example.Switches";

/// What the switch is set to in the environment, null for unset, and how it reads.
struct EnvironmentCase {
    const char* name;
    std::string value;
    bool result;
};
/// A value in the application's preferences and how it reads.
struct PreferenceCase {
    const char* name;
    const char* xml;
    bool result;
};

class GetBoolPrefTest : public testing::Test {
 protected:
    GetBoolPrefTest() {
        ApplicationIdentity::_forget();
        ApplicationIdentity::setIdentifier(kApplication);
    }
    ~GetBoolPrefTest() override { ApplicationIdentity::_forget(); }

    void hold(const std::string& value) {
        folder.replace(kApplication, PreferenceFolder::xml("<key>OVTestSwitch</key>" + value));
    }

    PreferenceFolder folder;
};
class GetBoolPrefInEnvironment : public GetBoolPrefTest,
                                 public testing::WithParamInterface<EnvironmentCase> {};
class GetBoolPrefInPreferences : public GetBoolPrefTest,
                                 public testing::WithParamInterface<PreferenceCase> {};

}  // namespace

TEST_P(GetBoolPrefInEnvironment, IsOnUnlessItIsNoOrZero) {
    const EnvVar variable(kName, GetParam().value.c_str());
    EXPECT_EQ(GetBoolPref(kName, false), GetParam().result);
    EXPECT_EQ(GetBoolPref(kName, true), GetParam().result);
}

INSTANTIATE_TEST_SUITE_P(
    Values, GetBoolPrefInEnvironment,
    testing::Values(EnvironmentCase{"no", "NO", false}, EnvironmentCase{"zero", "0", false},
                    EnvironmentCase{"lowerCaseNo", "no", true}, EnvironmentCase{"empty", "", true},
                    EnvironmentCase{"manyZeros", "00", true}, EnvironmentCase{"one", "1", true},
                    EnvironmentCase{"none", "NONE", true},
                    EnvironmentCase{"long", std::string(200, 'x'), true}),
    [](const auto& test) { return test.param.name; });

TEST_P(GetBoolPrefInPreferences, ReadsAsATruthValueOrIsOnUnlessItIsNoOrZero) {
    hold(GetParam().xml);
    EXPECT_EQ(GetBoolPref(kName, false), GetParam().result);
    EXPECT_EQ(GetBoolPref(kName, true), GetParam().result);
}

INSTANTIATE_TEST_SUITE_P(
    Values, GetBoolPrefInPreferences,
    testing::Values(PreferenceCase{"yes", "<true/>", true}, PreferenceCase{"no", "<false/>", false},
                    PreferenceCase{"one", "<integer>1</integer>", true},
                    PreferenceCase{"zero", "<integer>0</integer>", false},
                    PreferenceCase{"textTrue", "<string>true</string>", true},
                    PreferenceCase{"textFalse", "<string>false</string>", false},
                    PreferenceCase{"textNo", "<string>NO</string>", false},
                    PreferenceCase{"textZero", "<string>0</string>", false},
                    PreferenceCase{"textOther", "<string>maybe</string>", true},
                    PreferenceCase{"emptyText", "<string></string>", true},
                    PreferenceCase{"dictionary", "<dict/>", true}),
    [](const auto& test) { return test.param.name; });

TEST_F(GetBoolPrefTest, IsTheDefaultWhereNeitherIsSet) {
    EXPECT_TRUE(GetBoolPref(kName, true));
    EXPECT_FALSE(GetBoolPref(kName, false));
}

TEST_F(GetBoolPrefTest, TheEnvironmentComesFirst) {
    hold("<true/>");
    const EnvVar variable(kName, "NO");
    EXPECT_FALSE(GetBoolPref(kName, true));
}

TEST_F(GetBoolPrefTest, ADamagedFileSetsNothingAndIsLeftToTheOneWhoReadsAllOfIt) {
    Support::LogCapture log;
    folder.replace(kApplication, "damage");
    EXPECT_TRUE(GetBoolPref(kName, true));
    EXPECT_FALSE(GetBoolPref(kName, false));
    EXPECT_TRUE(log.lines().empty());
    EXPECT_EQ(folder.contentOf(kApplication), "damage");
}

TEST_F(GetBoolPrefTest, SeesAnAssignmentAtOnce) {
    EXPECT_FALSE(GetBoolPref(kName, false));
    Prefs prefs(kApplication);
    UntypedPref(prefs, kName) = true;
    EXPECT_TRUE(GetBoolPref(kName, false));
    UntypedPref(prefs, kName) = nullptr;
    EXPECT_FALSE(GetBoolPref(kName, false));
}

TEST_F(GetBoolPrefTest, SeesAnAssignmentThatWasMadeBeforeItsFirstUse) {
    Prefs prefs(kApplication);
    UntypedPref(prefs, kName) = true;
    EXPECT_TRUE(GetBoolPref(kName, false));
}

TEST_F(GetBoolPrefTest, SeesOtherProcessesChangesOnceTheApplicationSynchronizes) {
    Prefs prefs(kApplication);
    EXPECT_FALSE(GetBoolPref(kName, false));
    hold("<true/>");
    EXPECT_FALSE(GetBoolPref(kName, false));
    prefs.synchronize();
    EXPECT_TRUE(GetBoolPref(kName, false));
}

TEST_F(GetBoolPrefTest, LogsNothingAndNeedsNoPoolOnAnyThread) {
    Support::LogCapture log;
    Support::LoggingOn on({&gLogPrefs});
    hold("<true/>");
    bool result = false;
    std::thread([&] { result = GetBoolPref(kName, false); }).join();
    EXPECT_TRUE(result);
    EXPECT_TRUE(log.lines().empty());
}
