#pragma once

#include "Foundation/NetError.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <string>

namespace Orvane {

/// Why a `Connection` failed, in the words of the library below: the name of a domain, a code of
/// it and a text for logs.
class ConnectionError : public Foundation::PFRefCounted {
 public:
    /// Codes are of `OVURLErrorCode`.
    static constexpr const char* kNetworkDomain = "Network";
    static constexpr const char* kPOSIXDomain = "POSIX";
    static constexpr const char* kResolverDomain = "NetDB";

    static Foundation::Returner<ConnectionError> error(const char* domain, std::int32_t code,
                                                       std::string text);

    Foundation::String* getDomain() const { return mDomain; }
    std::int32_t getCode() const { return mCode; }

    /// The same as a plain error: an `errno` in domain 1 and a code of the resolver in domain 12.
    /// Any other gives a domain and a code of all ones, which say no more than that there was one.
    Foundation::NetError toNetError() const;
    /// The same, but one of the network's own domain is its code in domain 15.
    Foundation::NetError toLoadingError() const;
    /// The text.
    Foundation::StringReturner toString() const override;

 private:
    ConnectionError(const char* domain, std::int32_t code, std::string text)
        : mDomain(Foundation::String::string(domain)), mCode(code), mText(std::move(text)) {}

    Foundation::Ref<Foundation::String> mDomain;
    std::int32_t mCode;
    std::string mText;
};

}  // namespace Orvane
