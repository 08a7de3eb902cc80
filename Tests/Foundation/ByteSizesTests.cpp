#include "Foundation/AutoreleasePool.h"
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
class ByteSize : public testing::TestWithParam<Sized> {};

}  // namespace

TEST_P(ByteSize, IsShown) {
    EXPECT_EQ(size(GetParam().bytes), GetParam().text) << GetParam().bytes;
    if (GetParam().bytes != LLONG_MIN) {
        EXPECT_EQ(size(-GetParam().bytes), GetParam().text) << GetParam().bytes;
    }
}

// On both sides of each limit.
INSTANTIATE_TEST_SUITE_P(
    All, ByteSize,
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

TEST(ByteSizes, HaveTheDecimalSignOfTheLocale) {
    const EnvVar locale("LC_ALL", "de_DE.UTF-8");
    EXPECT_EQ(size(1500), "1,5 KB");
    EXPECT_EQ(size(99), "99 bytes");
}

TEST(ByteSizes, HaveTheTextOfTheLanguage) {
    const EnvVar locale("LC_ALL", "de_DE.UTF-8");
    const Language german("de");
    EXPECT_EQ(size(99), "99 Byte");
    EXPECT_EQ(size(1500), "1,5 KB");
}
