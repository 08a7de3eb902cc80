#include "Foundation/Translations.h"

#include "Foundation/EnglishTexts.h"
#include "Foundation/ErrorTexts.h"
#include "Support/Language.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <string>
#include <vector>

using namespace Foundation;
using Support::Language;

namespace {

Translations sample() {
    return {"sample", SAMPLE_LOCALES};
}

/// The message ids of the library's translations into a language.
std::vector<std::string> translatedKeys(const std::string& language) {
    std::ifstream file(TRANSLATIONS "/" + language + ".po");
    std::vector<std::string> keys;
    for (std::string line; std::getline(file, line);) {
        if (line.starts_with("msgid \"") && line != "msgid \"\"") {
            keys.push_back(line.substr(7, line.size() - 8));
        }
    }
    return keys;
}

}  // namespace

TEST(Translations, FindAKeyInItsTable) {
    const Translations texts = sample();
    const Language german("de");
    EXPECT_EQ(texts.find("key", "Localizable", "none"), "ohne Tabelle");
    EXPECT_EQ(texts.find("key", "Other", "none"), "in der Tabelle");
    EXPECT_EQ(texts.find("key", "No such table", "none"), "none");
    EXPECT_EQ(texts.find("no such key", "Localizable", "none"), "none");
}

TEST(Translations, AreInUTF8) {
    const Translations texts = sample();
    const Language german("de");
    EXPECT_EQ(texts.find("greetings", "Localizable", ""),
              "Gr\xc3\xbc\xc3\x9f"
              "e");
}

TEST(Translations, HaveNoTextForTheEmptyKey) {
    const Translations texts = sample();
    const Language german("de");
    EXPECT_EQ(texts.find("", "Localizable", "none"), "none");
}

TEST(Translations, ChooseThePluralForm) {
    const Translations texts = sample();
    const Language german("de");
    EXPECT_EQ(texts.findPlural("%u feed", "%u feeds", 1, "none"), "%u Feed");
    EXPECT_EQ(texts.findPlural("%u feed", "%u feeds", 0, "none"), "%u Feeds (Mehrzahl)");
    EXPECT_EQ(texts.findPlural("%u feed", "%u feeds", 2, "none"), "%u Feeds (Mehrzahl)");
    EXPECT_EQ(texts.findPlural("%u cat", "%u cats", 2, "none"), "none");
}

TEST(Translations, AreNotUsedInTheCLocale) {
    const Translations texts = sample();
    const Support::EnvVar language("LANGUAGE", "de");
    EXPECT_EQ(texts.find("key", "Localizable", "none"), "none");
}

TEST(Translations, OfALanguageThatThereIsNotAreNone) {
    const Translations texts = sample();
    const Language french("fr");
    EXPECT_EQ(texts.find("key", "Localizable", "none"), "none");
}

TEST(Translations, IntoGermanAreOfKeysThatThereAre) {
    const std::vector<std::string> keys = translatedKeys("de");
    EXPECT_GT(keys.size(), 40u);
    for (const std::string& key : keys) {
        // A key of several words that ends in a full stop is the English text itself.
        EXPECT_TRUE(findEnglishText(key) || key.ends_with('.')) << key;
    }
}

TEST(Translations, IntoGermanAreComplete) {
    const std::vector<std::string> keys = translatedKeys("de");
    int errors = 0;
    for (const std::string_view key : englishKeys()) {
        EXPECT_EQ(std::count(keys.begin(), keys.end(), key), 1) << key;
    }
    for (int code = -4000; code <= 0; ++code) {
        const std::string text = describeURLError(code);
        if (text.empty()) continue;
        EXPECT_EQ(std::count(keys.begin(), keys.end(), text), 1) << text;
        ++errors;
    }
    EXPECT_GT(errors, 15);
}
