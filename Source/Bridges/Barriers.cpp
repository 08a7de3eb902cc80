#include "Bridges/Barriers.h"

#include "Foundation/NetException.h"

#include <Orvane/OVLog.h>

namespace Orvane {

OVError currentError() {
    try {
        throw;
    } catch (const OVException& exception) {
        if (exception.error()) return *exception.error();
    } catch (const Foundation::NetException& exception) {
        return Foundation::errorWithNetError(exception.getError(), {});
    } catch (...) {
        // Nothing is known of it.
    }
    return Foundation::errorWithCode(OVInternalError, {});
}

void requireParameter(bool condition, const char* function, const char* text) {
    if (condition) return;
    try {
        _OVAssertFailed(function, true, nullptr, "%s", text);
    } catch (const OVException& exception) {
        throw ParameterException(exception.what());
    }
}

}  // namespace Orvane
