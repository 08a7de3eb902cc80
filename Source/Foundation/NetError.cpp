#include "Foundation/NetError.h"

#include "Foundation/NetException.h"
#include "Foundation/String.h"

#include <netdb.h>

#include <cstring>

namespace Foundation {

namespace {

struct Name {
    std::int64_t number;
    const char* text;
};

constexpr Name kDomainNames[] = {
    {NetError::kPOSIX, "POSIX"},
    {NetError::kOSStatus, "OSStatus"},
    {NetError::kMach, "Mach"},
    {NetError::kNetDB, "NetDB"},
    {NetError::kPFURL, "PFURL"},
    {NetError::kPFMessagePort, "PFMessagePort"},
    {NetError::kOrvane, "Orvane"},
    {NetError::kCustom, "Custom"},
    {NetError::kFTP, "FTP"},
    {NetError::kNetServices, "NetServices"},
    {NetError::kSSL, "SSL"},
    {NetError::kSOCKS, "SOCKS"},
    {NetError::kSystemConfig, "SystemConfig"},
    {NetError::kHTTP, "HTTP"},
};

constexpr Name kOrvaneErrorNames[] = {
    {OVInternalError, "OVInternalError"},
    {OVNotAFeedError, "OVNotAFeedError"},
    {OVFeedIDMismatchError, "OVFeedIDMismatchError"},
    {OVInvalidRowIDError, "OVInvalidRowIDError"},
    {OVReadOnlyError, "OVReadOnlyError"},
    {OVAgentLaunchError, "OVAgentLaunchError"},
    {OVIPCError, "OVIPCError"},
};

// There is no system call to ask for these: the transport is the system's own.
constexpr Name kMachErrorTexts[] = {
    {MachError::kInvalidDestination, "invalid destination"},
    {MachError::kSendTimedOut, "send timed out"},
    {MachError::kReceiveTimedOut, "receive timed out"},
    {MachError::kBadReply, "bad reply"},
    {MachError::kUnknownRoutine, "unknown routine"},
    {MachError::kBadArguments, "bad arguments"},
    {MachError::kServerDied, "server died"},
    {MachError::kUnknownService, "unknown service"},
};

template <std::size_t N>
const char* find(const Name (&names)[N], std::int64_t number) {
    for (const Name& name : names) {
        if (name.number == number) return name.text;
    }
    return nullptr;
}

// The packed form of an error: the code's low bits, above them the domain's, on a base that keeps
// packed errors apart from the statuses that the transport itself gives.
constexpr int kCodeBits = 14;
constexpr std::uint32_t kCodeMask = 0x3fff;
constexpr std::uint32_t kCodeSign = 0x2000;
constexpr std::uint32_t kDomainMask = 0x3ffc000;
constexpr std::uint32_t kDomainLimit = 0xfff;
constexpr std::uint32_t kPOSIXBits = 0xC000;
constexpr std::int32_t kPackedBase = -0x8000000;
constexpr std::int32_t kPackedSize = 0x4000000;

}  // namespace

const char* NetError::getDomainName() const {
    return find(kDomainNames, domain);
}

const char* NetError::getErrorName() const {
    if (code == 0) return nullptr;
    switch (domain) {
        case kPOSIX:
            return std::strerror(code);
        case kMach:
            return find(kMachErrorTexts, code);
        case kNetDB:
            return gai_strerror(code);
        case kOrvane:
            return find(kOrvaneErrorNames, code);
        default:
            return nullptr;
    }
}

std::string NetError::description() const {
    if (code == 0) return "OK";
    if (const char* name = getErrorName()) return OVFormat("%s (%i,%li)", name, domain, code);
    if (const char* name = getDomainName()) return OVFormat("%s error %li", name, code);
    return OVFormat("NetError(%i,%li)", domain, code);
}

StringReturner NetError::toString() const {
    return String::string(description());
}

const char* NetError::toCString() const {
    const String* text = toString();
    return text->utf8().c_str();
}

void NetError::throwException() const {
    if (code != 0) throw NetException(*this);
}

// All of the packing is done on unsigned numbers, whose overflow is defined, and the result is the
// 32-bit word read as a signed one.
std::int32_t NetError::wrapAsMachError() const {
    if (code == 0) return 0;
    const auto bits = static_cast<std::uint32_t>(code);
    if (domain == kMach) return code;
    if (domain == kPOSIX) return static_cast<std::int32_t>(bits | kPOSIXBits);
    const auto domainBits = static_cast<std::uint32_t>(static_cast<std::uint64_t>(domain))
                            << kCodeBits;
    return static_cast<std::int32_t>((bits & kCodeMask) + (domainBits & kDomainMask)) + kPackedBase;
}

NetError NetError::unwrapMachError(std::int32_t status) {
    if (status == 0) return None;
    const auto bits = static_cast<std::uint32_t>(status);
    if ((bits & ~kCodeMask) == kPOSIXBits) {
        return {kPOSIX, static_cast<std::int32_t>(bits & kCodeMask)};
    }
    if (status >= kPackedBase && status < kPackedBase + kPackedSize) {
        // Flipping the sign bit and taking it off again extends it.
        const auto low = static_cast<std::int32_t>((bits & kCodeMask) ^ kCodeSign);
        return {static_cast<std::int64_t>((bits >> kCodeBits) & kDomainLimit),
                low - static_cast<std::int32_t>(kCodeSign)};
    }
    return {kMach, status};
}

}  // namespace Foundation
