#pragma once

#include <Orvane/OVFormat.h>

#include <span>
#include <stdexcept>

/// Throws `Foundation::AssertionFailure` unless `condition` holds. Never ends the process.
#define OV_ASSERT(condition) OV_ASSERT_AS(condition, #condition)
/// The same, with the condition's text as the system states it.
#define OV_ASSERT_AS(condition, text)   \
    ((condition) ? static_cast<void>(0) \
                 : ::Foundation::AssertionFailure::failed(__PRETTY_FUNCTION__, text))
/// The same with a message: a format and its arguments.
#define OV_ASSERT_MESSAGE(condition, ...) OV_ASSERT_MESSAGE_AS(condition, #condition, __VA_ARGS__)
#define OV_ASSERT_MESSAGE_AS(condition, text, ...) \
    ((condition) ? static_cast<void>(0)            \
                 : ::Foundation::AssertionFailure::failed(__PRETTY_FUNCTION__, text, __VA_ARGS__))

namespace Foundation {

/// A condition of the code's own did not hold. Unwinds to the run-loop callback that led here.
/// `what()` is the message, or the condition where there is no message.
class AssertionFailure : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;

    // Each of these is one frame of the stack, always: the stack is printed from their caller on.

    /// Logs the failure, with the call stack where the log is on, and throws. `function` is the
    /// caller's full signature, `condition` the text of what did not hold.
    [[noreturn, gnu::noinline]] static void failed(const char* function, const char* condition);
    /// The same with a message; an empty one stands for the condition.
    template <class... Args>
    [[noreturn, gnu::noinline]] static void failed(const char* function, const char* condition,
                                                   OVFormatString<Args...> format,
                                                   const Args&... arguments) {
        if constexpr (sizeof...(Args) == 0) {
            failedV(function, condition, format.text(), {});
        } else {
            const OVFormatArgument list[] = {OVFormatTraits<Args>::make(arguments)...};
            failedV(function, condition, format.text(), list);
        }
    }

 private:
    [[noreturn, gnu::noinline]] static void failedV(const char* function, const char* condition,
                                                    const char* format,
                                                    std::span<const OVFormatArgument> arguments);
};

}  // namespace Foundation
