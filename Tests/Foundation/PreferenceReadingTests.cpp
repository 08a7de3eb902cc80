#include "Foundation/PreferenceReading.h"

#include "Foundation/Data.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Number.h"

#include <gtest/gtest.h>

#include <climits>

using namespace Foundation;

namespace {

/// How one value reads as each type.
struct Case {
    const char* name;
    std::function<Ref<PFRefCounted>()> make;
    std::optional<bool> asBool;
    int asInt;
    double asDouble;
    std::optional<std::string> asString;  ///< nothing for null
};

void PrintTo(const Case& c, std::ostream* out) {
    *out << c.name;
}

auto text(const char* utf8) {
    return [=] { return Ref<PFRefCounted>(String::string(utf8)); };
}
template <class T>
auto number(T value) {
    return [=] { return Ref<PFRefCounted>(Number::number(value)); };
}
Ref<PFRefCounted> nothing() {
    return {};
}
Ref<PFRefCounted> dictionary() {
    return MutableDictionary::dictionary();
}
Ref<PFRefCounted> data() {
    return Data::data("1", 1);
}

class PreferenceReadingTest : public testing::TestWithParam<Case> {
 protected:
    Ref<PFRefCounted> value = GetParam().make();
};

const Case kCases[] = {
    {"absent", nothing, std::nullopt, 0, 0.0, ""},
    {"true", number(true), true, 1, 1.0, "1"},
    {"false", number(false), false, 0, 0.0, "0"},
    {"integer", number(42), true, 42, 42.0, "42"},
    {"zero", number(0), false, 0, 0.0, "0"},
    {"real", number(-2.75), true, -2, -2.75, "-2.75"},
    {"large", number(5000000000LL), true, INT_MAX, 5e9, "5000000000"},
    {"low", number(-5000000000LL), true, INT_MIN, -5e9, "-5000000000"},
    {"textTrue", text("True"), true, 0, 0.0, "True"},
    {"textYes", text("YES"), true, 0, 0.0, "YES"},
    {"textOne", text("1"), true, 1, 1.0, "1"},
    {"textFalse", text("false"), false, 0, 0.0, "false"},
    {"textNo", text("No"), false, 0, 0.0, "No"},
    {"textZero", text("0"), false, 0, 0.0, "0"},
    {"textNumber", text(" +12.5 s"), std::nullopt, 12, 12.5, " +12.5 s"},
    {"textNegative", text("-3"), std::nullopt, -3, -3.0, "-3"},
    {"textExponent", text("1e3"), std::nullopt, 1, 1000.0, "1e3"},
    {"textHuge", text("1e999"), std::nullopt, 1, 0.0, "1e999"},
    {"textManyDigits", text("99999999999999999999"), std::nullopt, INT_MAX, 1e20,
     "99999999999999999999"},
    {"textHexadecimal", text("0x10"), std::nullopt, 0, 0.0, "0x10"},
    {"textInfinity", text("inf"), std::nullopt, 0, 0.0, "inf"},
    {"textNotANumber", text("nan"), std::nullopt, 0, 0.0, "nan"},
    {"textTwoSigns", text("+-5"), std::nullopt, 0, 0.0, "+-5"},
    {"textOther", text("maybe"), std::nullopt, 0, 0.0, "maybe"},
    {"textEmpty", text(""), std::nullopt, 0, 0.0, ""},
    {"dictionary", dictionary, std::nullopt, 0, 0.0, std::nullopt},
    {"data", data, std::nullopt, 0, 0.0, std::nullopt},
};

}  // namespace

TEST_P(PreferenceReadingTest, ReadsAsEachType) {
    EXPECT_EQ(PreferenceReading::asBool(value), GetParam().asBool);
    EXPECT_EQ(PreferenceReading::asInt(value), GetParam().asInt);
    EXPECT_EQ(PreferenceReading::asDouble(value), GetParam().asDouble);
    const Ref<String> string = PreferenceReading::asString(value);
    EXPECT_EQ(string ? std::optional(string->utf8()) : std::nullopt, GetParam().asString);
}

TEST_P(PreferenceReadingTest, IsASwitchThatIsOnUnlessItReadsAsFalse) {
    if (!value) return;
    EXPECT_EQ(PreferenceReading::asSwitch(value), GetParam().asBool.value_or(true));
}

INSTANTIATE_TEST_SUITE_P(Values, PreferenceReadingTest, testing::ValuesIn(kCases),
                         [](const auto& test) { return test.param.name; });
