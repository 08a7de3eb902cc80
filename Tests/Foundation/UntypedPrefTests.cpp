#include "Foundation/UntypedPref.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Foundation/PreferenceFolder.h"
#include "Foundation/PreferenceKeys.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

/// One key, "Key", of a domain.
class UntypedPrefTest : public testing::Test {
 protected:
    using Lines = std::vector<std::string>;

    std::string asText() {
        const Ref<String> text = StringReturner(pref);
        return text ? text->utf8() : "(null)";
    }
    Lines logged() {
        Lines lines = log.lines();
        log.clear();
        return lines;
    }

    Support::ManualClock clock;
    PreferenceFolder folder;
    Prefs prefs{"com.example.Test"};
    UntypedPref pref{prefs, "Key"};
    LogCapture log;
    LoggingOn on{{&gLogPrefs}};
};

}  // namespace

TEST_F(UntypedPrefTest, WithoutAValueReadsAsNothing) {
    EXPECT_FALSE(pref.exists());
    EXPECT_FALSE(static_cast<bool>(pref));
    EXPECT_EQ(static_cast<int>(pref), 0);
    EXPECT_EQ(static_cast<double>(pref), 0.0);
    EXPECT_EQ(asText(), "");
    EXPECT_EQ(Ref<Dictionary>(Returner<Dictionary>(pref)).get(), nullptr);
}

TEST_F(UntypedPrefTest, LogsWhatIsRead) {
    static_cast<void>(static_cast<bool>(pref));
    static_cast<void>(static_cast<int>(pref));
    static_cast<void>(static_cast<double>(pref));
    asText();
    EXPECT_EQ(logged(), Lines({"[Prefs] Get Key => false", "[Prefs] Get Key => 0",
                               "[Prefs] Key => (null)", "[Prefs] Key => (null)"}));
    pref = Ref<Number>(Number::number(2.5)).get();
    EXPECT_EQ(logged(), Lines({"[Prefs] Set Key = 2.5"}));
    EXPECT_TRUE(static_cast<bool>(pref));
    EXPECT_EQ(static_cast<int>(pref), 2);
    EXPECT_EQ(static_cast<double>(pref), 2.5);
    EXPECT_EQ(asText(), "2.5");
    EXPECT_EQ(logged(), Lines({"[Prefs] Get Key => true", "[Prefs] Get Key => 2",
                               "[Prefs] Key => 2.5", "[Prefs] Key => 2.5"}));
}

TEST_F(UntypedPrefTest, IsSilentAboutWhatIsMerelyLookedAt) {
    pref.exists();
    static_cast<void>(Ref<Dictionary>(Returner<Dictionary>(pref)));
    EXPECT_EQ(logged(), Lines());
}

TEST_F(UntypedPrefTest, TakesATruthValue) {
    pref = true;
    EXPECT_TRUE(pref.exists());
    EXPECT_TRUE(static_cast<bool>(pref));
    pref = false;
    EXPECT_TRUE(pref.exists());
    EXPECT_FALSE(static_cast<bool>(pref));
    EXPECT_EQ(log.count("Set Key = 1"), 1);
    EXPECT_EQ(log.count("Set Key = 0"), 1);
}

TEST_F(UntypedPrefTest, NullRemovesItsValue) {
    pref = true;
    pref = nullptr;
    EXPECT_FALSE(pref.exists());
    EXPECT_EQ(log.count("Set Key = (null)"), 1);
}

TEST_F(UntypedPrefTest, AValueOfTheWrongTypeReadsAsNone) {
    const Ref<MutableDictionary> dictionary = MutableDictionary::dictionary();
    pref = dictionary;
    EXPECT_TRUE(pref.exists());
    EXPECT_FALSE(static_cast<bool>(pref));
    EXPECT_EQ(static_cast<int>(pref), 0);
    EXPECT_EQ(static_cast<double>(pref), 0.0);
    EXPECT_EQ(asText(), "(null)");
    pref = true;
    EXPECT_EQ(Ref<Dictionary>(Returner<Dictionary>(pref)).get(), nullptr);
}

TEST_F(UntypedPrefTest, HoldsADictionaryAsItWasWhenItWasAssigned) {
    const Ref<Number> one = Number::number(1);
    const Ref<MutableDictionary> dictionary = MutableDictionary::dictionary();
    dictionary->set("a", one.get());
    pref = dictionary;
    dictionary->set("b", one.get());
    const Ref<Dictionary> held = Returner<Dictionary>(pref);
    ASSERT_TRUE(held);
    EXPECT_EQ(held->count(), 1u);
    EXPECT_TRUE(IsEqual(held->get("a"), one.get()));
}

TEST_F(UntypedPrefTest, ADateIsOfWholeSecondsAsEveryOtherProcessReadsIt) {
    const Ref<Date> date = Date::date(1234.75);
    pref = date.get();
    log.clear();
    asText();
    EXPECT_EQ(logged(), Lines({"[Prefs] Key => 2001-01-01 00:20:34 +0000"}));
    prefs.synchronize();
    const auto content = PreferenceFile(folder.path("com.example.Test")).read();
    EXPECT_EQ(Date::getAbsoluteTime(content.values->getAs<Date>("Key")), 1234.0);
}

TEST_F(UntypedPrefTest, HoldsAnyValueOfAPropertyList) {
    const Ref<Data> data = Data::data("abc", 3);
    const Ref<ArrayOf<PFRefCounted>> array = ArrayOf<PFRefCounted>::array({data.get()});
    pref = array.get();
    prefs.synchronize();
    const auto content = PreferenceFile(folder.path("com.example.Test")).read();
    EXPECT_TRUE(IsEqual(content.values->get("Key"), array.get()));
}

TEST_F(UntypedPrefTest, RefusesWhatNoPropertyListCanHold) {
    class Odd : public PFRefCounted {};
    const Ref<Odd> odd = Returner<Odd>(new Odd);
    EXPECT_THROW(pref = odd.get(), AssertionFailure);
    const Ref<String> unprintable = String::string("\x01");
    EXPECT_THROW(pref = unprintable.get(), AssertionFailure);
    EXPECT_THROW(UntypedPref(prefs, "\x01") = true, AssertionFailure);
    EXPECT_FALSE(pref.exists());
    log.clear();
    pref = true;
    prefs.synchronize();
    EXPECT_EQ(log.count("WARNING"), 0) << "what was refused keeps the rest from being saved";
}

TEST_F(UntypedPrefTest, WithoutAKeyHasNoValueAndTakesNone) {
    UntypedPref none(prefs, static_cast<String*>(nullptr));
    EXPECT_FALSE(none.exists());
    EXPECT_FALSE(static_cast<bool>(none));
    EXPECT_THROW(none = true, AssertionFailure);
}

TEST_F(UntypedPrefTest, IsOneOfManyThatNameAKey) {
    UntypedPref other(prefs, Ref<String>(String::string("Key")).get());
    other = true;
    EXPECT_TRUE(pref.exists());
    const UntypedPref copy(pref);
    EXPECT_TRUE(copy.exists());
}

TEST_F(UntypedPrefTest, KeysOfTheAgentHaveDefaults) {
    const auto& interval = AgentPreferences::kHygieneRunInterval;
    EXPECT_EQ(interval.valueIn(prefs), 86400.0);
    EXPECT_EQ(AgentPreferences::kHygieneBackoffInterval.valueIn(prefs), 240.0);
    EXPECT_EQ(AgentPreferences::kLastHygieneRun.valueIn(prefs), 0.0);
    EXPECT_FALSE(AgentPreferences::kPauseOnLaunch.valueIn(prefs));
    EXPECT_FALSE(AgentPreferences::kElderMigrationCompleted.valueIn(prefs));
    const Ref<Number> hour = Number::number(3600);
    UntypedPref(prefs, interval.name) = hour.get();
    EXPECT_EQ(interval.valueIn(prefs), 3600.0);
    UntypedPref(prefs, "PauseOnLaunch") = true;
    EXPECT_TRUE(AgentPreferences::kPauseOnLaunch.valueIn(prefs));
}
