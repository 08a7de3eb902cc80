#include "Foundation/ByteSize.h"

#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Support/EnvVar.h"
#include "Support/Language.h"

#include <gtest/gtest.h>

#include <climits>

using namespace Foundation;
using Support::EnvVar;
using Support::Language;

namespace {

std::string size(long long bytes) {
    return Ref<String>(String::representationForBytes(bytes))->utf8();
}

constexpr long long kKB = 1024;
constexpr long long kMB = 1024 * kKB;
constexpr long long kGB = 1024 * kMB;

struct Sized {
    long long bytes;
    const char* text;
};
class ByteSizeText : public testing::TestWithParam<Sized> {};

struct Keyed {
    long long bytes;
    const char* key;
    double number;
};
class ByteSizeKey : public testing::TestWithParam<Keyed> {};

}  // namespace

TEST_P(ByteSizeKey, IsChosenByTheNumber) {
    const ByteSize size = ByteSize::of(GetParam().bytes);
    EXPECT_STREQ(size.key, GetParam().key) << GetParam().bytes;
    EXPECT_EQ(size.number, GetParam().number) << GetParam().bytes;
}

// On both sides of each limit. Of most keys the texts are the same, so these would not tell.
INSTANTIATE_TEST_SUITE_P(
    All, ByteSizeKey,
    testing::Values(
        Keyed{0, "0 bytes", 0}, Keyed{1, "1 byte", 1}, Keyed{-1, "1 byte", 1},
        Keyed{2, "%.0f bytes", 2}, Keyed{99, "%.0f bytes", 99},
        Keyed{100, "%.1f KB (0.1)", 100 / 1024.0}, Keyed{999, "%.1f KB (0.1)", 999 / 1024.0},
        Keyed{1000, "%.1f KB (1.0)", 1000 / 1024.0}, Keyed{10188, "%.1f KB (1.0)", 10188 / 1024.0},
        Keyed{10189, "%.1f KB (10.0)", 10189 / 1024.0},
        Keyed{102348, "%.1f KB (10.0)", 102348 / 1024.0}, Keyed{102349, "%.0f KB", 102349 / 1024.0},
        Keyed{1023487, "%.0f KB", 1023487 / 1024.0},
        Keyed{1023488, "%.1f MB (1.0)", 1023488.0 / kMB},
        Keyed{10433331, "%.1f MB (1.0)", 10433331.0 / kMB},
        Keyed{10433332, "%.1f MB (10.0)", 10433332.0 / kMB},
        Keyed{104805171, "%.1f MB (10.0)", 104805171.0 / kMB},
        Keyed{104805172, "%.0f MB", 104805172.0 / kMB},
        Keyed{1048051711, "%.0f MB", 1048051711.0 / kMB},
        Keyed{1048051712, "%.1f GB (1.0)", 1048051712.0 / kGB},
        Keyed{10683731148, "%.1f GB (1.0)", 10683731148.0 / kGB},
        Keyed{10683731149, "%.1f GB (10.0)", 10683731149.0 / kGB},
        Keyed{107320495308, "%.1f GB (10.0)", 107320495308.0 / kGB},
        Keyed{107320495309, "%.0f GB", 107320495309.0 / kGB}, Keyed{1023 * kGB, "%.0f GB", 1023},
        Keyed{5000 * kGB, "%.0f GB", 5000}, Keyed{-5000 * kGB, "%.0f GB", 5000}));

TEST_P(ByteSizeText, IsShown) {
    EXPECT_EQ(size(GetParam().bytes), GetParam().text) << GetParam().bytes;
    if (GetParam().bytes != LLONG_MIN) {
        EXPECT_EQ(size(-GetParam().bytes), GetParam().text) << GetParam().bytes;
    }
}

// On both sides of each limit.
INSTANTIATE_TEST_SUITE_P(
    All, ByteSizeText,
    testing::Values(
        Sized{0, "0 bytes"}, Sized{1, "1 byte"}, Sized{2, "2 bytes"}, Sized{99, "99 bytes"},
        Sized{100, "0.1 KB"}, Sized{999, "1.0 KB"}, Sized{1000, "1.0 KB"}, Sized{10188, "9.9 KB"},
        Sized{10189, "10.0 KB"}, Sized{102348, "99.9 KB"}, Sized{102349, "100 KB"},
        Sized{1023487, "999 KB"}, Sized{1023488, "1.0 MB"}, Sized{kMB, "1.0 MB"},
        Sized{10433331, "9.9 MB"}, Sized{10433332, "10.0 MB"}, Sized{104805171, "99.9 MB"},
        Sized{104805172, "100 MB"}, Sized{1048051711, "999 MB"}, Sized{1048051712, "1.0 GB"},
        Sized{10 * kGB, "10.0 GB"}, Sized{10683731148, "9.9 GB"}, Sized{10683731149, "10.0 GB"},
        Sized{107320495308, "99.9 GB"}, Sized{107320495309, "100 GB"}, Sized{5000 * kGB, "5000 GB"},
        Sized{LLONG_MAX, "8589934592 GB"}, Sized{LLONG_MIN, "8589934592 GB"}));

TEST(ByteSize, HasTheDecimalSignOfTheLocale) {
    const EnvVar locale("LC_ALL", "de_DE.UTF-8");
    EXPECT_EQ(size(1500), "1,5 KB");
    EXPECT_EQ(size(99), "99 bytes");
}

TEST(ByteSize, HasTheTextOfTheLanguage) {
    const EnvVar locale("LC_ALL", "de_DE.UTF-8");
    const Language german("de");
    EXPECT_EQ(size(99), "99 Byte");
    EXPECT_EQ(size(1500), "1,5 KB");
}
