#include "Foundation/AssertionFailure.h"

#include "Foundation/Logger.h"
#include "Foundation/Utils.h"

#include <string>

namespace Foundation {

void AssertionFailure::failed(const char* function, const char* condition) {
    failedV(function, condition, "", {});
}

void AssertionFailure::failedV(const char* function, const char* condition, const char* format,
                               std::span<const OVFormatArgument> arguments) {
    const std::string text = *format ? OVFormatV(format, arguments) : condition;
    {
        const InsideLogCall inside;
        gWarn.log("ASSERTION FAILED: in %s: %s", function, text);
        // Behind the two frames of this class comes the function in which the condition failed.
        if (gWarn.willLog() && gLog.willLog()) Compatibility::Utils::printStack(2, 10);
    }
    throw AssertionFailure(text);
}

}  // namespace Foundation
