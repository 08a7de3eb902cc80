#include "Foundation/AssertionFailure.h"

#include "Foundation/Logger.h"
#include "Foundation/Utils.h"

#include <string>

namespace Foundation {

void AssertionFailure::failed(const char* function, const char* condition) {
    failedV(function, condition, nullptr, {});
}

void AssertionFailure::failedV(const char* function, const char* condition, const char* format,
                               std::span<const OVFormatArgument> arguments) {
    const bool hasMessage = format && *format;
    const std::string text = hasMessage ? OVFormatV(format, arguments) : condition;
    {
        const InsideLogCall inside;
        gWarn.log("ASSERTION FAILED: in %s: %s", function, text);
        if (gWarn.willLog()) Compatibility::Utils::printStack(2, 10);
    }
    throw AssertionFailure(text);
}

}  // namespace Foundation
