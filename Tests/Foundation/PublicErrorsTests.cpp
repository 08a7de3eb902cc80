#include "Foundation/PublicErrors.h"

#include "Foundation/Bundle.h"
#include "Foundation/ErrorTexts.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <set>

using namespace Foundation;

namespace {

const char* const kURL = "http://example.org/feed";

bool hasNoUserInfo(const OVError& error) {
    return error == OVError(error.domain(), error.code());
}

/// What `raise` throws, after it has been reported.
template <class Function>
std::string raisedBy(Function&& raise) {
    try {
        raise();
    } catch (const OVException& e) {
        return e.what();
    }
    return "nothing was raised";
}

}  // namespace

TEST(PublicErrors, ExplainAnInternalErrorAndWhatIsNoFeed) {
    for (const int code : {OVInternalError, OVNotAFeedError}) {
        const OVError error = errorWithNetError({NetError::kOrvane, code}, kURL);
        const std::string key = code == OVInternalError ? "OVInternalError" : "OVNotAFeedError";
        EXPECT_EQ(error.domain(), OVErrorDomain);
        EXPECT_EQ(error.code(), code);
        EXPECT_EQ(error.description(), localizedText(key + "Description"));
        EXPECT_EQ(error.failureReason(), localizedText(key + "FailureReason"));
        EXPECT_EQ(error.recoverySuggestion(), localizedText(key + "RecoverySuggestion"));
        EXPECT_EQ(error.URL(), kURL);
    }
}

TEST(PublicErrors, HaveATextForEachOfTheirKeys) {
    std::set<std::string> texts;
    for (const std::string name : {"OVInternalError", "OVNotAFeedError"}) {
        for (const char* part : {"Description", "FailureReason", "RecoverySuggestion"}) {
            EXPECT_NE(localizedText(name + part), name + part);
            texts.insert(localizedText(name + part));
        }
    }
    EXPECT_EQ(texts.size(), 6u);
    EXPECT_EQ(localizedText("no such key"), "no such key");
}

TEST(PublicErrors, DoNotExplainOtherCodesOfTheLibrary) {
    for (const int code : {0, 3, 99, 200, 201, 202, 203}) {
        EXPECT_TRUE(hasNoUserInfo(errorWithCode(code, ""))) << code;
        EXPECT_EQ(errorWithCode(code, "").code(), code);
        EXPECT_EQ(errorWithCode(code, kURL).URL(), kURL);
    }
}

TEST(PublicErrors, AreInternalErrorsWhereNoRowMatches) {
    const OVError error = errorWithNetError({5, 7}, kURL);
    EXPECT_EQ(error, errorWithCode(OVInternalError, kURL));
    EXPECT_NE(error.description(), "");
}

TEST(PublicErrors, HaveNoUserInfoInOtherDomains) {
    const OVError error = errorWithNetError({NetError::kPOSIX, 2}, kURL);
    EXPECT_EQ(error.domain(), "POSIX");
    EXPECT_EQ(error.code(), 2);
    EXPECT_TRUE(hasNoUserInfo(error));
    EXPECT_TRUE(hasNoUserInfo(errorWithNetError({NetError::kPFURL, -999}, kURL)));
}

TEST(PublicErrors, DescribeTroubleWithAURL) {
    const OVError error = errorWithNetError({NetError::kHTTP, 404}, kURL);
    EXPECT_EQ(error.domain(), OVURLErrorDomain);
    EXPECT_EQ(error.code(), OVURLErrorFileDoesNotExist);
    EXPECT_EQ(error.description(), describeURLError(OVURLErrorFileDoesNotExist));
    EXPECT_NE(error.description(), "");
    EXPECT_EQ(error.URL(), kURL);
    EXPECT_EQ(errorWithNetError({NetError::kHTTP, 404}, "").URL(), "");
}

TEST(PublicErrors, DescribeEveryURLCodeThatErrorsBecome) {
    for (const int code : {-1, -1000, -1001, -1002, -1003, -1004, -1005, -1006, -1007, -1008, -1009,
                           -1011, -1012, -1013, -1100, -1102, -3003}) {
        EXPECT_NE(errorWithNetError({NetError::kPFURL, code}, kURL).description(), "") << code;
    }
}

TEST(PublicErrors, SpeakOfAPasswordWhereTheServerWantsOne) {
    const std::string text = localizedText("PNURLErrorUserAuthenticationRequired Description");
    EXPECT_EQ(errorWithNetError({NetError::kHTTP, 401}, kURL).description(), text);
    EXPECT_EQ(errorWithNetError({NetError::kPFURL, -1013}, kURL).description(), text);
    EXPECT_EQ(errorWithNetError({NetError::kPFURL, -1012}, kURL).description(), text);
    EXPECT_EQ(errorWithNetError({NetError::kPFURL, -4711}, kURL).description(), "");
}

TEST(PublicErrors, ReportAndRaiseAnException) {
    const Support::LogCapture log;
    const NetException e(NetError::kOrvane, OVIPCError);
    EXPECT_EQ(raisedBy([&] { doWarnAndRaise(&e, "title()"); }),
              "Orvane Foundation::NetException: OVIPCError (1002,203) during title()");
    EXPECT_TRUE(log.contains(
        "[WARNING] Foundation::NetException \"OVIPCError (1002,203)\" caught in title()"));
}

TEST(PublicErrors, ReportAndRaiseWhatIsNoException) {
    const Support::LogCapture log;
    EXPECT_EQ(raisedBy([] { doWarnAndRaise(nullptr, "title()"); }),
              "Orvane: An unknown native exception was thrown during title()");
    EXPECT_TRUE(log.contains("[WARNING] Unknown exception caught in title()"));
}

TEST(PublicErrors, RaiseForTheExceptionInFlight) {
    const Support::LogCapture log;
    const auto rethrow = [](auto thrown) {
        return raisedBy([&] {
            try {
                throw thrown;
            } catch (...) {
                warnAndRaiseCurrentException("f()");
            }
        });
    };
    EXPECT_EQ(rethrow(std::runtime_error("text")), "Orvane std::runtime_error: text during f()");
    EXPECT_EQ(rethrow(42), "Orvane: An unknown native exception was thrown during f()");
}
