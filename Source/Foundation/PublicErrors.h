#pragma once

#include "Foundation/NetError.h"

#include <Orvane/OVError.h>
#include <Orvane/OVException.h>

#include <exception>
#include <string_view>

/// From the system's own errors to those that applications see.

namespace Foundation {

/// The public form of an error. `url` is the text of the URL that the work was about, or empty.
/// Errors of URL loading get a description and the URL, those of `OVErrorDomain` what
/// `errorWithCode` gives; others have neither. What has no public form becomes `OVInternalError`.
OVError errorWithNetError(const NetError& error, std::string_view url);
/// The error of `OVErrorDomain` with this code and the URL; `OVInternalError` and `OVNotAFeedError`
/// get their three texts.
OVError errorWithCode(int code, std::string_view url);

/// Reports an exception that reached the public interface in `where`, and throws `OVException`
/// with its class and text, and its error if it is a `NetException`. `e` is null for an exception
/// that is no `std::exception`.
[[noreturn]] void doWarnAndRaise(const std::exception* e, const char* where);
/// The same for the exception in flight. REQUIRES: called from a catch handler.
[[noreturn]] void warnAndRaiseCurrentException(const char* where);

}  // namespace Foundation
