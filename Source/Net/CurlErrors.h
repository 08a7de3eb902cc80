#pragma once

#include "Net/ConnectionError.h"

#include <string>

namespace Orvane {

/// The error that a result of libcurl (a `CURLcode`) stands for.
///
/// | results | error |
/// |---|---|
/// | no such host, or proxy | -1003 |
/// | cannot connect | -1004; -1009 where the system says that there is no network at all |
/// | the connection broke, or ended before the body did | -1005 |
/// | a time-out | -1001 |
/// | the URL, or its scheme | -1000, -1002 |
/// | TLS: no handshake, no certificate that can be trusted | -1200 |
/// | too many redirects, which are not libcurl's to count | -1007 |
/// | an answer that is no HTTP, or not as it says it is | -1011 |
/// | out of memory | `ENOMEM` of domain 1 |
/// | all else | -1 |
///
/// `osError` is the `errno` of the last failed connection attempt, or 0.
Foundation::Returner<ConnectionError> connectionErrorOf(int result, long osError, std::string text);

}  // namespace Orvane
