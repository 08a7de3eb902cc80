#include "Foundation/CurrentLocale.h"

#include "Support/EnvVar.h"

#include <gtest/gtest.h>

#include <clocale>

using namespace Foundation;
using Support::EnvVar;

TEST(CurrentLocale, OfTheCLocaleIsThatOfTheEnvironment) {
    const EnvVar all("LC_ALL", nullptr);
    const EnvVar time("LC_TIME", "de_AT.UTF-8");
    const EnvVar language("LANG", "fr_FR.UTF-8");
    EXPECT_EQ(currentTimeLocale(), "de_AT");
    EXPECT_EQ(currentNumberLocale(), "fr_FR");
    EXPECT_EQ(currentDecimalSign(), ",");
}

TEST(CurrentLocale, OfTheVariableForAllComesFirst) {
    const EnvVar all("LC_ALL", "ja_JP.UTF-8");
    const EnvVar time("LC_TIME", "de_AT.UTF-8");
    EXPECT_EQ(currentTimeLocale(), "ja_JP");
}

TEST(CurrentLocale, PassesOverEmptyVariables) {
    const EnvVar all("LC_ALL", "");
    const EnvVar time("LC_TIME", "");
    const EnvVar language("LANG", "sv_SE");
    EXPECT_EQ(currentTimeLocale(), "sv_SE");
}

TEST(CurrentLocale, WithoutAnyIsThePlainOne) {
    for (const char* name : {"C", "POSIX", "C.UTF-8"}) {
        const EnvVar all("LC_ALL", name);
        EXPECT_EQ(currentTimeLocale(), "en_US_POSIX");
        EXPECT_EQ(currentDecimalSign(), ".");
    }
    const EnvVar all("LC_ALL", nullptr);
    const EnvVar time("LC_TIME", nullptr);
    const EnvVar language("LANG", nullptr);
    EXPECT_EQ(currentTimeLocale(), "en_US_POSIX");
}
