#include "Foundation/PublicErrorMap.h"

#include <climits>

namespace Foundation {

namespace {

/// As a source code it matches all codes; as a target the code stays.
constexpr int kAny = INT_MIN;

struct Row {
    int sourceDomain;
    int sourceCode;
    const char* domain;
    int code;
};

// The first row that matches decides, so a domain's "any" stands behind its other rows.
constexpr Row kRows[] = {
    {NetError::kPOSIX, kAny, OVPOSIXErrorDomain, kAny},
    {NetError::kMach, kAny, OVMachErrorDomain, kAny},
    {NetError::kNetServices, kAny, OVNetServicesErrorDomain, kAny},
    {NetError::kSOCKS, kAny, OVSOCKSErrorDomain, kAny},
    {NetError::kSSL, kAny, OVSSLErrorDomain, kAny},
    {NetError::kOrvane, kAny, OVErrorDomain, kAny},
    {NetError::kSystemConfig, kAny, OVSystemConfigErrorDomain, kAny},
    {NetError::kFTP, 425, OVURLErrorDomain, OVURLErrorCannotConnectToHost},
    {NetError::kFTP, 426, OVURLErrorDomain, OVURLErrorNetworkConnectionLost},
    {NetError::kFTP, 450, OVURLErrorDomain, OVURLErrorResourceUnavailable},
    {NetError::kFTP, 553, OVURLErrorDomain, OVURLErrorResourceUnavailable},
    {NetError::kFTP, 451, OVURLErrorDomain, OVURLErrorBadServerResponse},
    {NetError::kFTP, 500, OVURLErrorDomain, OVURLErrorBadServerResponse},
    {NetError::kFTP, 501, OVURLErrorDomain, OVURLErrorBadServerResponse},
    {NetError::kFTP, 502, OVURLErrorDomain, OVURLErrorBadServerResponse},
    {NetError::kFTP, 503, OVURLErrorDomain, OVURLErrorBadServerResponse},
    {NetError::kFTP, 504, OVURLErrorDomain, OVURLErrorBadServerResponse},
    {NetError::kFTP, 452, OVURLErrorDomain, OVURLErrorCannotWriteFile},
    {NetError::kFTP, 550, OVURLErrorDomain, OVURLErrorCannotWriteFile},
    {NetError::kFTP, 552, OVURLErrorDomain, OVURLErrorCannotWriteFile},
    {NetError::kFTP, 530, OVURLErrorDomain, OVURLErrorUserAuthenticationRequired},
    {NetError::kFTP, 532, OVURLErrorDomain, OVURLErrorUserAuthenticationRequired},
    {NetError::kFTP, kAny, OVURLErrorDomain, OVURLErrorUnknown},
    {NetError::kHTTP, -1, OVURLErrorDomain, OVURLErrorBadServerResponse},
    {NetError::kHTTP, -2, OVURLErrorDomain, OVURLErrorTooManyRedirects},
    {NetError::kHTTP, -3, OVURLErrorDomain, OVURLErrorBadURL},
    {NetError::kHTTP, 413, OVURLErrorDomain, OVURLErrorBadURL},
    {NetError::kHTTP, 401, OVURLErrorDomain, OVURLErrorUserAuthenticationRequired},
    {NetError::kHTTP, 407, OVURLErrorDomain, OVURLErrorUserAuthenticationRequired},
    {NetError::kHTTP, 402, OVURLErrorDomain, OVURLErrorNoPermission},
    {NetError::kHTTP, 404, OVURLErrorDomain, OVURLErrorFileDoesNotExist},
    {NetError::kHTTP, 410, OVURLErrorDomain, OVURLErrorFileDoesNotExist},
    {NetError::kHTTP, 408, OVURLErrorDomain, OVURLErrorTimedOut},
    {NetError::kHTTP, 504, OVURLErrorDomain, OVURLErrorTimedOut},
    {NetError::kHTTP, kAny, OVURLErrorDomain, OVURLErrorResourceUnavailable},
    {NetError::kNetDB, kAny, OVURLErrorDomain, OVURLErrorCannotFindHost},
    {NetError::kPFMessagePort, kAny, OVErrorDomain, OVInternalError},
    {NetError::kPFURL, -10, OVURLErrorDomain, OVURLErrorUnknown},
    {NetError::kPFURL, -999, OVApplicationErrorDomain, OVUserCancelledError},
    {NetError::kPFURL, -11, OVURLErrorDomain, OVURLErrorUnsupportedURL},
    {NetError::kPFURL, -12, OVURLErrorDomain, OVURLErrorResourceUnavailable},
    {NetError::kPFURL, -13, OVURLErrorDomain, OVURLErrorNoPermission},
    {NetError::kPFURL, -14, OVURLErrorDomain, OVURLErrorCannotConnectToHost},
    {NetError::kPFURL, -15, OVErrorDomain, OVInternalError},
    {NetError::kPFURL, -16, OVErrorDomain, OVInternalError},
    {NetError::kPFURL, -17, OVErrorDomain, OVInternalError},
    {NetError::kPFURL, -18, OVURLErrorDomain, OVURLErrorTimedOut},
    {NetError::kPFURL, kAny, OVURLErrorDomain, kAny},
    {NetError::kOSStatus, -128, OVApplicationErrorDomain, OVUserCancelledError},
};

}  // namespace

PublicError mapToPublicError(const NetError& error) {
    for (const Row& row : kRows) {
        if (row.sourceDomain != error.domain) continue;
        if (row.sourceCode != kAny && row.sourceCode != error.code) continue;
        return {row.domain, row.code == kAny ? error.code : row.code};
    }
    return {OVErrorDomain, OVInternalError};
}

}  // namespace Foundation
