#include "Foundation/PublicErrors.h"

#include "Foundation/Bundle.h"
#include "Foundation/ErrorTexts.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Foundation/PublicErrorMap.h"
#include "Foundation/TypeName.h"

#include <cstring>
#include <string>

namespace Foundation {

namespace {

OVError errorOfURL(int code, std::string_view url) {
    OVError error(OVURLErrorDomain, code);
    std::string description = describeURLError(code);
    if (description.empty() && (code == OVURLErrorUserAuthenticationRequired ||
                                code == OVURLErrorUserCancelledAuthentication)) {
        description = localizedText("PNURLErrorUserAuthenticationRequired Description");
    }
    error.setDescription(std::move(description));
    error.setURL(std::string(url));
    return error;
}

const char* keyOf(int code) {
    switch (code) {
        case OVInternalError:
            return "OVInternalError";
        case OVNotAFeedError:
            return "OVNotAFeedError";
        default:
            return nullptr;
    }
}

}  // namespace

OVError errorWithNetError(const NetError& error, std::string_view url) {
    const PublicError target = mapToPublicError(error);
    if (std::strcmp(target.domain, OVErrorDomain) == 0) return errorWithCode(target.code, url);
    if (std::strcmp(target.domain, OVURLErrorDomain) == 0) return errorOfURL(target.code, url);
    return {target.domain, target.code};
}

OVError errorWithCode(int code, std::string_view url) {
    OVError error(OVErrorDomain, code);
    error.setURL(std::string(url));
    if (const char* name = keyOf(code)) {
        const std::string key = name;
        error.setDescription(localizedText(key + "Description"));
        error.setFailureReason(localizedText(key + "FailureReason"));
        error.setRecoverySuggestion(localizedText(key + "RecoverySuggestion"));
    }
    return error;
}

void doWarnAndRaise(const std::exception* e, const char* where) {
    doWarnAboutException(e, where);
    if (!e) {
        throw OVException(
            OVFormat("Orvane: An unknown native exception was thrown during %s", where));
    }
    const std::string text =
        OVFormat("Orvane %s: %s during %s", getTypeName(typeid(*e)), e->what(), where);
    const auto* failure = dynamic_cast<const NetException*>(e);
    if (!failure) throw OVException(text);
    throw OVException(text, errorWithNetError(failure->getError(), {}));
}

void warnAndRaiseCurrentException(const char* where) {
    try {
        throw;
    } catch (const std::exception& e) {
        doWarnAndRaise(&e, where);
    } catch (...) {
        doWarnAndRaise(nullptr, where);
    }
}

}  // namespace Foundation
