#pragma once

#include <optional>
#include <string_view>

namespace Orvane {

class HTTPMessage;

/// What the headers of a response say about keeping it, RFC 9111.
struct CacheDirectives {
    bool mayBeStored = true;         ///< no "no-store", and no "Vary: *"
    std::optional<double> lifetime;  ///< seconds that it is fresh for, where that is said

    /// `now` is in seconds since 2001.
    static CacheDirectives of(const HTTPMessage& response, double now);

    /// Seconds since 2001 of a date of HTTP (RFC 9110, 5.6.7, and what else servers write); none
    /// for what is no date.
    static std::optional<double> readDate(std::string_view text);
    /// A number of seconds: digits only. Numbers beyond 2^31, which RFC 9111 lets count as that,
    /// become that.
    static std::optional<double> readSeconds(std::string_view text);
};

}  // namespace Orvane
