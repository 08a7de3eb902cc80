#include "FeedParser/Text/CharacterEntities.h"

#include <gtest/gtest.h>
#include <libxml/HTMLparser.h>

#include <algorithm>
#include <cctype>
#include <map>
#include <string>

using Orvane::CharacterEntities;

namespace {

/// The names that libxml2 knows, with their characters.
std::map<std::string, unsigned> listOfLibxml2() {
    std::map<std::string, unsigned> names;
    for (unsigned value = 1; value < 0x10000; ++value) {
        const htmlEntityDesc* entity = htmlEntityValueLookup(value);
        if (entity && entity->value == value) names[entity->name] = value;
    }
    return names;
}

std::string inCase(std::string name, int (*convert)(int)) {
    std::transform(name.begin(), name.end(), name.begin(),
                   [convert](unsigned char c) { return static_cast<char>(convert(c)); });
    return name;
}

}  // namespace

TEST(CharacterEntities, KnowsTheNamesOfHTML4AndApos) {
    const auto names = listOfLibxml2();
    ASSERT_EQ(names.size(), 253u);
    ASSERT_EQ(names.count("apos"), 1u);
    for (const auto& [name, value] : names) {
        if (name == "tau") continue;
        EXPECT_EQ(CharacterEntities::find(name), value) << name;
    }
}

TEST(CharacterEntities, TakesANameOfOneFormInAnyCase) {
    const auto names = listOfLibxml2();
    int count = 0;
    for (const auto& [name, value] : names) {
        const std::string lower = inCase(name, std::tolower);
        const bool isPair = std::count_if(names.begin(), names.end(), [&](const auto& other) {
                                return inCase(other.first, std::tolower) == lower;
                            }) > 1;
        if (isPair) continue;
        EXPECT_EQ(CharacterEntities::find(inCase(name, std::toupper)), value) << name;
        std::string title = lower;
        title[0] = static_cast<char>(std::toupper(title[0]));
        EXPECT_EQ(CharacterEntities::find(title), value) << name;
        ++count;
    }
    EXPECT_EQ(count, 253 - 2 * 64);
}

TEST(CharacterEntities, GivesTheCapitalOfAPairForAllButTheLowerCase) {
    EXPECT_EQ(CharacterEntities::find("eacute"), 0xE9);
    EXPECT_EQ(CharacterEntities::find("Eacute"), 0xC9);
    EXPECT_EQ(CharacterEntities::find("EACUTE"), 0xC9);
    EXPECT_EQ(CharacterEntities::find("eAcute"), 0xC9);
    EXPECT_EQ(CharacterEntities::find("alpha"), 0x3B1);
    EXPECT_EQ(CharacterEntities::find("ALPHA"), 0x391);
    EXPECT_EQ(CharacterEntities::find("yuml"), 0xFF);
    EXPECT_EQ(CharacterEntities::find("YUML"), 0x178);
    EXPECT_EQ(CharacterEntities::find("larr"), 0x2190);
    EXPECT_EQ(CharacterEntities::find("lArr"), 0x21D0);
    EXPECT_EQ(CharacterEntities::find("LARR"), 0x21D0);
    EXPECT_EQ(CharacterEntities::find("thorn"), 0xFE);
    EXPECT_EQ(CharacterEntities::find("Thorn"), 0xDE);
}

TEST(CharacterEntities, HasNoSmallTau) {
    for (const char* name : {"tau", "Tau", "TAU"}) {
        EXPECT_EQ(CharacterEntities::find(name), 0x3A4) << name;
    }
}

TEST(CharacterEntities, KnowsNoOtherNames) {
    for (const char* name : {"", "foo", "am", "ampx", "thetasymb", "&amp", "a mp", "\xC3\xA9"}) {
        EXPECT_EQ(CharacterEntities::find(name), 0) << name;
    }
}
