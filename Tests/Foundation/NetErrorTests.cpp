#include "Foundation/NetError.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/HTTPException.h"
#include "Foundation/NetException.h"
#include "Foundation/String.h"
#include "Support/LogCapture.h"

#include <gio/gio.h>
#include <gtest/gtest.h>
#include <netdb.h>

#include <cerrno>
#include <climits>
#include <cstring>
#include <set>

using namespace Foundation;

namespace {

constexpr std::int64_t kDomains[] = {
    NetError::kPOSIX, NetError::kOSStatus,      NetError::kMach,   NetError::kNetDB,
    NetError::kPFURL, NetError::kPFMessagePort, NetError::kOrvane, NetError::kCustom,
    NetError::kFTP,   NetError::kNetServices,   NetError::kSSL,    NetError::kSOCKS,
    NetError::kHTTP,  NetError::kSystemConfig,
};

NetError roundTrip(const NetError& error) {
    return NetError::unwrapMachError(error.wrapAsMachError());
}

/// Whether both fields are the same, which `==` does not ask for code 0.
bool isSame(const NetError& a, const NetError& b) {
    return a.domain == b.domain && a.code == b.code;
}

NetError fromGError(GQuark domain, int code) {
    GError* error = g_error_new_literal(domain, code, "text");
    const NetError result(error);
    g_error_free(error);
    return result;
}

}  // namespace

TEST(NetError, IsNoErrorFromTheStart) {
    EXPECT_TRUE(isSame(NetError(), NetError(0, 0)));
    EXPECT_TRUE(isSame(NetError::None, NetError(0, 0)));
}

TEST(NetError, IsEqualByCodeAndUnlessItIsZeroByDomain) {
    EXPECT_EQ(NetError(5, 0), NetError::None);
    EXPECT_EQ(NetError(1, 2), NetError(1, 2));
    EXPECT_NE(NetError(1, 2), NetError(1, 3));
    EXPECT_NE(NetError(1, 2), NetError(2, 2));
    EXPECT_NE(NetError(1, 2), NetError(1, 0));
}

TEST(NetError, KeepsTheNumbersOfItsDomains) {
    EXPECT_EQ(NetError::kPOSIX, 1);
    EXPECT_EQ(NetError::kOSStatus, 2);
    EXPECT_EQ(NetError::kMach, 11);
    EXPECT_EQ(NetError::kNetDB, 12);
    EXPECT_EQ(NetError::kPFURL, 15);
    EXPECT_EQ(NetError::kPFMessagePort, 1001);
    EXPECT_EQ(NetError::kOrvane, 1002);
    EXPECT_EQ(NetError::kCustom, -1);
    EXPECT_EQ(NetError::kFTP, 1201);
    EXPECT_EQ(NetError::kNetServices, 1202);
    EXPECT_EQ(NetError::kSSL, 1203);
    EXPECT_EQ(NetError::kSOCKS, 1204);
    EXPECT_EQ(NetError::kSystemConfig, 1205);
    EXPECT_EQ(NetError::kHTTP, 4);
    EXPECT_EQ(std::set<std::int64_t>(std::begin(kDomains), std::end(kDomains)).size(),
              std::size(kDomains));
}

TEST(NetError, KeepsTheNumbersOfTheLibrarysOwnCodes) {
    EXPECT_EQ(OVInternalError, 1);
    EXPECT_EQ(OVNotAFeedError, 2);
    EXPECT_EQ(OVFeedIDMismatchError, 3);
    EXPECT_EQ(OVInvalidRowIDError, 200);
    EXPECT_EQ(OVReadOnlyError, 201);
    EXPECT_EQ(OVAgentLaunchError, 202);
    EXPECT_EQ(OVIPCError, 203);
    EXPECT_STREQ(OVErrorDomain, "Orvane");
}

TEST(NetError, NamesItsDomain) {
    EXPECT_STREQ(NetError(1, 1).getDomainName(), "POSIX");
    EXPECT_STREQ(NetError(2, 1).getDomainName(), "OSStatus");
    EXPECT_STREQ(NetError(11, 1).getDomainName(), "Mach");
    EXPECT_STREQ(NetError(12, 1).getDomainName(), "NetDB");
    EXPECT_STREQ(NetError(15, 1).getDomainName(), "PFURL");
    EXPECT_STREQ(NetError(1001, 1).getDomainName(), "PFMessagePort");
    EXPECT_STREQ(NetError(1002, 1).getDomainName(), "Orvane");
    EXPECT_STREQ(NetError(-1, 1).getDomainName(), "Custom");
    EXPECT_STREQ(NetError(NetError::kFTP, 1).getDomainName(), "FTP");
    EXPECT_STREQ(NetError(NetError::kNetServices, 1).getDomainName(), "NetServices");
    EXPECT_STREQ(NetError(NetError::kSSL, 1).getDomainName(), "SSL");
    EXPECT_STREQ(NetError(NetError::kSOCKS, 1).getDomainName(), "SOCKS");
    EXPECT_STREQ(NetError(NetError::kSystemConfig, 1).getDomainName(), "SystemConfig");
    EXPECT_STREQ(NetError(NetError::kHTTP, 1).getDomainName(), "HTTP");
    EXPECT_EQ(NetError(5, 1).getDomainName(), nullptr);
    EXPECT_EQ(NetError(0x100000001, 1).getDomainName(), nullptr);
}

TEST(NetError, NamesItsCode) {
    EXPECT_STREQ(NetError(1, ENOENT).getErrorName(), std::strerror(ENOENT));
    EXPECT_STREQ(NetError(11, 0x10000003).getErrorName(), "invalid destination");
    EXPECT_STREQ(NetError(11, 1102).getErrorName(), "unknown service");
    EXPECT_STREQ(NetError(11, -303).getErrorName(), "unknown routine");
    EXPECT_EQ(NetError(11, 77).getErrorName(), nullptr);
    EXPECT_STREQ(NetError(12, EAI_NONAME).getErrorName(), gai_strerror(EAI_NONAME));
    EXPECT_STREQ(NetError(1002, 1).getErrorName(), "OVInternalError");
    EXPECT_STREQ(NetError(1002, 2).getErrorName(), "OVNotAFeedError");
    EXPECT_STREQ(NetError(1002, 3).getErrorName(), "OVFeedIDMismatchError");
    EXPECT_STREQ(NetError(1002, 200).getErrorName(), "OVInvalidRowIDError");
    EXPECT_STREQ(NetError(1002, 201).getErrorName(), "OVReadOnlyError");
    EXPECT_STREQ(NetError(1002, 202).getErrorName(), "OVAgentLaunchError");
    EXPECT_STREQ(NetError(1002, 203).getErrorName(), "OVIPCError");
    EXPECT_EQ(NetError(1002, 4).getErrorName(), nullptr);
    EXPECT_EQ(NetError(15, -1003).getErrorName(), nullptr);
}

TEST(NetError, HasNoNameForCodeZero) {
    for (const std::int64_t domain : kDomains) {
        EXPECT_EQ(NetError(domain, 0).getErrorName(), nullptr) << domain;
    }
}

TEST(NetError, DescribesItselfAsWellAsItCan) {
    const AutoreleasePool pool;
    EXPECT_STREQ(NetError(1002, 0).toCString(), "OK");
    EXPECT_STREQ(NetError(1002, 201).toCString(), "OVReadOnlyError (1002,201)");
    EXPECT_STREQ(NetError(1, ENOENT).toCString(), "No such file or directory (1,2)");
    EXPECT_STREQ(NetError(NetError::kHTTP, 404).toCString(), "HTTP error 404");
    EXPECT_STREQ(NetError(15, -1003).toCString(), "PFURL error -1003");
    EXPECT_STREQ(NetError(1002, 4).toCString(), "Orvane error 4");
    EXPECT_STREQ(NetError(5, -7).toCString(), "NetError(5,-7)");
    const Ref<String> text = NetError(1002, 201).toString();
    EXPECT_EQ(text->utf8(), "OVReadOnlyError (1002,201)");
    EXPECT_EQ(OVFormat("<%@>", NetError(5, -7)), "<NetError(5,-7)>");
}

TEST(NetError, ThrowsItselfUnlessItIsNone) {
    EXPECT_NO_THROW(NetError(15, 0).throwException());
    try {
        NetError(1002, 200).throwException();
        FAIL();
    } catch (const NetException& e) {
        EXPECT_EQ(e.getDomain(), 1002);
        EXPECT_EQ(e.getCode(), 200);
        EXPECT_EQ(e.getError(), NetError(1002, 200));
        EXPECT_STREQ(e.what(), "OVInvalidRowIDError (1002,200)");
    }
}

TEST(NetError, PacksIntoAStatus) {
    EXPECT_EQ(NetError(1002, 0).wrapAsMachError(), 0);
    EXPECT_EQ(NetError(11, 0x10000003).wrapAsMachError(), 0x10000003);
    EXPECT_EQ(NetError(11, -308).wrapAsMachError(), -308);
    EXPECT_EQ(NetError(1, 2).wrapAsMachError(), 0xC002);
    EXPECT_EQ(NetError(1002, 201).wrapAsMachError(), -0x8000000 + (1002 << 14) + 201);
    EXPECT_EQ(NetError(15, -1).wrapAsMachError(), -0x8000000 + (15 << 14) + 0x3fff);
}

TEST(NetError, UnpacksAtTheEdgesOfItsRanges) {
    EXPECT_TRUE(isSame(NetError::unwrapMachError(0), NetError(0, 0)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(0xBFFF), NetError(11, 0xBFFF)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(0xC000), NetError(1, 0)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(0xFFFF), NetError(1, 0x3fff)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(0x10000), NetError(11, 0x10000)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(0x1C001), NetError(11, 0x1C001)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(-0x8000001), NetError(11, -0x8000001)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(-0x8000000), NetError(0, 0)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(-0x8000000 + 0x1fff), NetError(0, 0x1fff)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(-0x8000000 + 0x2000), NetError(0, -0x2000)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(-0x4000001), NetError(4095, -1)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(-0x4000000), NetError(11, -0x4000000)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(INT32_MAX), NetError(11, INT32_MAX)));
    EXPECT_TRUE(isSame(NetError::unwrapMachError(INT32_MIN), NetError(11, INT32_MIN)));
}

TEST(NetError, GivesBackEveryDomainAndCodeThatFitsItsPackedForm) {
    for (std::int32_t code = 1; code <= 0x3fff; ++code) {
        ASSERT_TRUE(isSame(roundTrip({1, code}), {1, code})) << code;
    }
    for (std::int64_t domain = 0; domain <= 4095; ++domain) {
        if (domain == NetError::kPOSIX || domain == NetError::kMach) continue;
        for (const std::int32_t code : {-8192, -1009, -1, 1, 2, 203, 404, 8191}) {
            ASSERT_TRUE(isSame(roundTrip({domain, code}), {domain, code})) << domain << ' ' << code;
        }
    }
    for (const std::int64_t domain : {NetError::kPFURL, NetError::kOrvane, NetError::kHTTP}) {
        for (std::int32_t code = -8192; code <= 8191; ++code) {
            if (code == 0) continue;
            ASSERT_TRUE(isSame(roundTrip({domain, code}), {domain, code})) << domain << ' ' << code;
        }
    }
    for (const std::int32_t code : {0x10000003, 1102, -308, 1, -1, INT32_MAX, INT32_MIN}) {
        EXPECT_TRUE(isSame(roundTrip({11, code}), {11, code})) << code;
    }
}

TEST(NetError, CutsWhatDoesNotFitItsPackedForm) {
    EXPECT_TRUE(isSame(roundTrip({-1, -1}), {4095, -1}));
    EXPECT_TRUE(isSame(roundTrip({15, 8192}), {15, -8192}));
    EXPECT_TRUE(isSame(roundTrip({1, -1}), {11, -1}));
    EXPECT_TRUE(isSame(roundTrip({INT64_MIN, INT32_MIN}), {0, 0}));
    EXPECT_TRUE(isSame(roundTrip({INT64_MAX, INT32_MAX}), {4095, -1}));
}

TEST(NetError, IsNoneForANullErrorObject) {
    EXPECT_TRUE(isSame(NetError(static_cast<const GError*>(nullptr)), NetError(0, 0)));
}

TEST(NetError, TakesTheErrnoBehindAFileError) {
    int known = 0;
    for (int number = 1; number < 134; ++number) {
        const int code = g_file_error_from_errno(number);
        if (code == G_FILE_ERROR_FAILED) continue;
        EXPECT_TRUE(isSame(fromGError(G_FILE_ERROR, code), {1, number})) << number;
        ++known;
    }
    EXPECT_EQ(known, 24);
    EXPECT_TRUE(isSame(fromGError(G_FILE_ERROR, G_FILE_ERROR_FAILED), {1, EIO}));
}

TEST(NetError, TakesAnErrnoThatGivesTheSameIOError) {
    int known = 0;
    for (int code = 0; code <= G_IO_ERROR_NO_SUCH_DEVICE; ++code) {
        const NetError error = fromGError(G_IO_ERROR, code);
        if (error.domain != NetError::kPOSIX) continue;
        EXPECT_EQ(g_io_error_from_errno(error.code), code);
        ++known;
    }
    EXPECT_GE(known, 25);
    EXPECT_TRUE(isSame(fromGError(G_IO_ERROR, G_IO_ERROR_NOT_FOUND), {1, ENOENT}));
    EXPECT_TRUE(isSame(fromGError(G_IO_ERROR, G_IO_ERROR_PERMISSION_DENIED), {1, EACCES}));
}

TEST(NetError, TakesTroubleWithAHostNameAsOneOfURLs) {
    EXPECT_TRUE(isSame(fromGError(G_IO_ERROR, G_IO_ERROR_HOST_NOT_FOUND), {15, -1003}));
    EXPECT_TRUE(isSame(fromGError(G_RESOLVER_ERROR, G_RESOLVER_ERROR_NOT_FOUND), {15, -1003}));
    EXPECT_TRUE(
        isSame(fromGError(G_RESOLVER_ERROR, G_RESOLVER_ERROR_TEMPORARY_FAILURE), {15, -1006}));
}

TEST(NetError, TakesOtherErrorObjectsAsCustomAndNeverAsSuccess) {
    EXPECT_TRUE(
        isSame(fromGError(G_IO_ERROR, G_IO_ERROR_NOT_MOUNTED), {-1, G_IO_ERROR_NOT_MOUNTED}));
    EXPECT_TRUE(isSame(fromGError(G_MARKUP_ERROR, 3), {-1, 3}));
    EXPECT_TRUE(isSame(fromGError(G_MARKUP_ERROR, 0), {-1, -1}));
}

TEST(HTTPException, HoldsAStatusOfAtLeast300) {
    EXPECT_EQ(HTTPException(300).getStatus(), 300);
    EXPECT_EQ(HTTPException(404).getStatus(), 404);
    EXPECT_STREQ(HTTPException(404).what(), "HTTP status 404");
    const Support::LogCapture log;
    try {
        const HTTPException ok(299);
        FAIL();
    } catch (const AssertionFailure& e) {
        EXPECT_STREQ(e.what(), "status>=300");
    }
}
