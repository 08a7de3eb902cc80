#pragma once

#include "Foundation/Returner.h"

#include <Orvane/OVErrorCode.h>
#include <Orvane/OVFormat.h>

#include <cstdint>
#include <string>

typedef struct _GError GError;

namespace Foundation {

/// The outcome of work that can fail: a domain, which tells the source of the error, and a code of
/// that domain. Code 0 is success, whatever the domain.
struct NetError {
    // The domains. The database keeps an error as these numbers, and replies of the agent pack
    // them, so none may ever change or come to mean something else.
    static constexpr std::int64_t kPOSIX = 1;     ///< an `errno`
    static constexpr std::int64_t kOSStatus = 2;  ///< -128 is a user's cancel
    static constexpr std::int64_t kHTTP = 4;      ///< an HTTP status, or below 0 a failed exchange
    static constexpr std::int64_t kMach = 11;     ///< a status of the message transport
    static constexpr std::int64_t kNetDB = 12;    ///< an `EAI_` code of the resolver
    static constexpr std::int64_t kPFURL = 15;    ///< a code of URL loading, or of a file URL
    static constexpr std::int64_t kPFMessagePort = 1001;
    static constexpr std::int64_t kOrvane = 1002;  ///< an `OVErrorCode`
    static constexpr std::int64_t kFTP = 1201;     ///< an FTP reply code
    static constexpr std::int64_t kNetServices = 1202;
    static constexpr std::int64_t kSSL = 1203;
    static constexpr std::int64_t kSOCKS = 1204;
    static constexpr std::int64_t kSystemConfig = 1205;
    static constexpr std::int64_t kCustom = -1;  ///< none of these; code -1 is an unknown error

    std::int64_t domain = 0;
    std::int32_t code = 0;

    /// No error: domain and code are 0.
    static const NetError None;

    constexpr NetError() = default;
    constexpr NetError(std::int64_t errorDomain, std::int32_t errorCode)
        : domain(errorDomain), code(errorCode) {}
    /// From GLib's error object, which stays the caller's; null gives `None`.
    ///
    /// Codes of `G_FILE_ERROR` and `G_IO_ERROR` that stand for an `errno` become that, in domain
    /// `kPOSIX`; a name that does not resolve becomes code -1003 of `kPFURL`, and one that cannot
    /// be asked for now -1006. All else is `kCustom` with its code. No error object becomes a
    /// success: a code of 0 that has no other meaning turns into -1.
    explicit NetError(const GError* error);

    /// Equal codes and, unless they are 0, equal domains.
    constexpr bool operator==(const NetError& other) const {
        return code == other.code && (code == 0 || domain == other.domain);
    }

    /// The domain's name for logs; null if it is none of the above.
    const char* getDomainName() const;
    /// The code's name or a text for it; null for code 0 and where there is none. The text may
    /// change at the next call.
    const char* getErrorName() const;

    /// A text for logs, such as "OVReadOnlyError (1002,201)", "HTTP error 404" or "OK".
    StringReturner toString() const;
    /// The same; lives until the current pool drains.
    const char* toCString() const;
    std::string description() const;

    /// Throws `NetException`; does nothing for code 0.
    void throwException() const;

    /// Packs the error into the status of an agent's reply. `unwrapMachError` gives back: every
    /// error of domain `kPOSIX` with a code from 1 to 0x3fff; every one of the other domains from
    /// 0 to 4095 but `kMach` with a code from -8192 to 8191; and of `kMach` every code that is
    /// not in the range of the packed ones. Other errors are cut.
    std::int32_t wrapAsMachError() const;
    static NetError unwrapMachError(std::int32_t status);
};

inline constexpr NetError NetError::None{};

/// Codes of the domain `kMach`: what the transport of calls to the agent reports. Programs of other
/// versions read them too, so the numbers stay.
namespace MachError {
inline constexpr std::int32_t kInvalidDestination = 0x10000003;
inline constexpr std::int32_t kSendTimedOut = 0x10000004;
inline constexpr std::int32_t kReceiveTimedOut = 0x10004003;
inline constexpr std::int32_t kBadReply = -301;
inline constexpr std::int32_t kUnknownRoutine = -303;
inline constexpr std::int32_t kBadArguments = -304;
inline constexpr std::int32_t kServerDied = -308;
inline constexpr std::int32_t kUnknownService = 1102;
}  // namespace MachError

}  // namespace Foundation

/// Errors are arguments of `%@`.
template <>
struct OVFormatTraits<Foundation::NetError> {
    static constexpr OVFormatKind kind = OVFormatKind::Object;
    static OVFormatArgument make(const Foundation::NetError& error) {
        return {&error, [](const void* object) {
                    return static_cast<const Foundation::NetError*>(object)->description();
                }};
    }
};
