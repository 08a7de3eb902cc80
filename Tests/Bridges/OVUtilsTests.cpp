#include <Orvane/OVUtils.h>

#include "Foundation/Bundle.h"
#include "Foundation/NetError.h"

#include <gtest/gtest.h>

using Foundation::NetError;

namespace {

const std::string kURL = "http://example.org/feed";

}  // namespace

TEST(OVUtils, MapsTheNumbersOfTheServiceToPublicErrors) {
    const OVError gone = OVUtils::errorWithNetError(NetError::kHTTP, 410, kURL);
    EXPECT_EQ(gone.domain(), OVURLErrorDomain);
    EXPECT_EQ(gone.code(), OVURLErrorFileDoesNotExist);
    EXPECT_NE(gone.description(), "");
    EXPECT_EQ(gone.URL(), kURL);
    EXPECT_EQ(OVUtils::errorWithNetError(NetError::kHTTP, 500).code(),
              OVURLErrorResourceUnavailable);
    EXPECT_EQ(OVUtils::errorWithNetError(NetError::kHTTP, 500).URL(), "");
    EXPECT_EQ(OVUtils::errorWithNetError(1, 2, kURL), OVError(OVPOSIXErrorDomain, 2));
}

TEST(OVUtils, KnowsTheNumbersThatDatabasesKeep) {
    EXPECT_EQ(OVUtils::errorWithNetError(1002, 201).code(), OVReadOnlyError);
    EXPECT_EQ(OVUtils::errorWithNetError(1002, 201).domain(), OVErrorDomain);
    EXPECT_EQ(OVUtils::errorWithNetError(15, -11).code(), OVURLErrorUnsupportedURL);
    EXPECT_EQ(OVUtils::errorWithNetError(2, -128),
              OVError(OVApplicationErrorDomain, OVUserCancelledError));
}

TEST(OVUtils, CallsAnInternalErrorWhatHasNoPublicForm) {
    EXPECT_EQ(OVUtils::errorWithNetError(5, 7, kURL),
              OVUtils::orvaneErrorWithCode(OVInternalError, kURL));
}

TEST(OVUtils, ExplainsTheErrorsOfTheLibraryThatUsersSee) {
    for (const int code : {OVInternalError, OVNotAFeedError}) {
        const std::string key = code == OVInternalError ? "OVInternalError" : "OVNotAFeedError";
        const OVError error = OVUtils::orvaneErrorWithCode(code, kURL);
        EXPECT_EQ(error.domain(), OVErrorDomain);
        EXPECT_EQ(error.code(), code);
        EXPECT_EQ(error.description(), Foundation::localizedText(key + "Description"));
        EXPECT_EQ(error.failureReason(), Foundation::localizedText(key + "FailureReason"));
        EXPECT_EQ(error.recoverySuggestion(),
                  Foundation::localizedText(key + "RecoverySuggestion"));
        EXPECT_EQ(error.URL(), kURL);
    }
    EXPECT_EQ(OVUtils::orvaneErrorWithCode(OVIPCError), OVError(OVErrorDomain, OVIPCError));
}
