#include "Foundation/PublicErrorMap.h"

#include <gtest/gtest.h>

#include <climits>

using namespace Foundation;

namespace {

struct Case {
    NetError source;
    const char* domain;
    int code;
};

void PrintTo(const Case& c, std::ostream* out) {
    *out << c.source.description();
}

class PublicErrorMapTest : public testing::TestWithParam<Case> {};

}  // namespace

TEST_P(PublicErrorMapTest, GivesThePublicDomainAndCode) {
    const PublicError result = mapToPublicError(GetParam().source);
    EXPECT_STREQ(result.domain, GetParam().domain);
    EXPECT_EQ(result.code, GetParam().code);
}

INSTANTIATE_TEST_SUITE_P(KeptCodes, PublicErrorMapTest,
                         testing::Values(Case{{NetError::kPOSIX, 2}, "POSIX", 2},
                                         Case{{NetError::kMach, -308}, "Mach", -308},
                                         Case{{NetError::kNetServices, 7}, "NetServices", 7},
                                         Case{{NetError::kSOCKS, 8}, "SOCKS", 8},
                                         Case{{NetError::kSSL, 9}, "SSL", 9},
                                         Case{{NetError::kOrvane, 203}, "Orvane", 203},
                                         Case{{NetError::kOrvane, 1}, "Orvane", 1},
                                         Case{{NetError::kSystemConfig, 10}, "SystemConfig", 10},
                                         Case{{NetError::kPFURL, -1003}, "URL", -1003},
                                         Case{{NetError::kPFURL, 302}, "URL", 302},
                                         Case{{NetError::kPFURL, INT32_MIN}, "URL", INT32_MIN}));

INSTANTIATE_TEST_SUITE_P(
    FTP, PublicErrorMapTest,
    testing::Values(
        Case{{NetError::kFTP, 425}, "URL", -1004}, Case{{NetError::kFTP, 426}, "URL", -1005},
        Case{{NetError::kFTP, 450}, "URL", -1008}, Case{{NetError::kFTP, 553}, "URL", -1008},
        Case{{NetError::kFTP, 451}, "URL", -1011}, Case{{NetError::kFTP, 500}, "URL", -1011},
        Case{{NetError::kFTP, 501}, "URL", -1011}, Case{{NetError::kFTP, 502}, "URL", -1011},
        Case{{NetError::kFTP, 503}, "URL", -1011}, Case{{NetError::kFTP, 504}, "URL", -1011},
        Case{{NetError::kFTP, 452}, "URL", -3003}, Case{{NetError::kFTP, 550}, "URL", -3003},
        Case{{NetError::kFTP, 552}, "URL", -3003}, Case{{NetError::kFTP, 530}, "URL", -1013},
        Case{{NetError::kFTP, 532}, "URL", -1013}, Case{{NetError::kFTP, 421}, "URL", -1},
        Case{{NetError::kFTP, -1}, "URL", -1}));

INSTANTIATE_TEST_SUITE_P(
    HTTP, PublicErrorMapTest,
    testing::Values(
        Case{{NetError::kHTTP, -1}, "URL", -1011}, Case{{NetError::kHTTP, -2}, "URL", -1007},
        Case{{NetError::kHTTP, -3}, "URL", -1000}, Case{{NetError::kHTTP, 413}, "URL", -1000},
        Case{{NetError::kHTTP, 401}, "URL", -1013}, Case{{NetError::kHTTP, 407}, "URL", -1013},
        Case{{NetError::kHTTP, 402}, "URL", -1102}, Case{{NetError::kHTTP, 404}, "URL", -1100},
        Case{{NetError::kHTTP, 410}, "URL", -1100}, Case{{NetError::kHTTP, 408}, "URL", -1001},
        Case{{NetError::kHTTP, 504}, "URL", -1001}, Case{{NetError::kHTTP, 500}, "URL", -1008},
        Case{{NetError::kHTTP, 403}, "URL", -1008}));

INSTANTIATE_TEST_SUITE_P(
    Others, PublicErrorMapTest,
    testing::Values(
        Case{{NetError::kNetDB, -2}, "URL", -1003},
        Case{{NetError::kPFMessagePort, -3}, "Orvane", 1}, Case{{NetError::kPFURL, -10}, "URL", -1},
        Case{{NetError::kPFURL, -999}, "Application", 3072},
        Case{{NetError::kPFURL, -11}, "URL", -1002}, Case{{NetError::kPFURL, -12}, "URL", -1008},
        Case{{NetError::kPFURL, -13}, "URL", -1102}, Case{{NetError::kPFURL, -14}, "URL", -1004},
        Case{{NetError::kPFURL, -15}, "Orvane", 1}, Case{{NetError::kPFURL, -16}, "Orvane", 1},
        Case{{NetError::kPFURL, -17}, "Orvane", 1}, Case{{NetError::kPFURL, -18}, "URL", -1001},
        Case{{NetError::kOSStatus, -128}, "Application", 3072},
        Case{{NetError::kOSStatus, -43}, "Orvane", 1}, Case{{NetError::kCustom, -1}, "Orvane", 1},
        Case{{5, 7}, "Orvane", 1}));
