#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVError.h>

#include <cstdint>
#include <string>

/// Errors as the library makes them, for applications that read the service's own numbers, or that
/// report in its words. The thread of the library's objects, see `OVObject`.
class OVUtils {
 public:
    OVUtils() = delete;

    /// The error for a number of the service: `domain` and `code` as they stand in the columns
    /// "lastErrorDomain" and "lastError" of the database. Errors of URL loading have a description
    /// and `url`, which may be empty; those of `OVErrorDomain` are as below; others have neither.
    /// What has no form for applications is `OVInternalError`.
    OV_EXPORT static OVError errorWithNetError(std::int64_t domain, std::int32_t code,
                                               const std::string& url = {});
    /// The error of `OVErrorDomain` with this code, and with `url`, which may be empty.
    /// `OVInternalError` and `OVNotAFeedError` explain themselves in the user's language.
    OV_EXPORT static OVError orvaneErrorWithCode(int code, const std::string& url = {});
};
