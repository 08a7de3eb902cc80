#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVFormat.h>

#include <span>
#include <string_view>

/// The library's log for applications. Lines go where the library's own lines go. Formats are
/// those of `OVFormat.h`. Only `_OVAssertFailed` throws, and only if it is told to. Main thread.

/// What the functions below are made of, for formats that are known only at run time. A null format
/// is none: the first two write nothing for it.
OV_EXPORT void _OVLogV(const char* format, std::span<const OVFormatArgument> arguments);
OV_EXPORT void AlwaysWarnV(const char* format, std::span<const OVFormatArgument> arguments);
OV_EXPORT void _OVAssertFailedV(const char* function, bool shouldRaise, OVFormatArgument self,
                                const char* format, std::span<const OVFormatArgument> arguments);

/// Whether the log is on: the preference or environment variable "OVLog" and, for a name, also
/// "OVLog" with the name appended. Null and the empty name ask for the log as a whole.
OV_EXPORT bool WillLog(const char* name);

/// Writes a line if the log is on. A format that begins with a name in brackets, such as
/// "[Feed] got %d entries", is written if that facility is on; the brackets stay in the line.
template <class... Args>
void _OVLog(OVFormatString<Args...> format, const Args&... arguments) {
    OVWithFormatArguments(
        [&](std::span<const OVFormatArgument> list) { _OVLogV(format.text(), list); },
        arguments...);
}

/// Writes a line that begins with "WARNING: ", whether or not the log is on.
template <class... Args>
void AlwaysWarn(OVFormatString<Args...> format, const Args&... arguments) {
    OVWithFormatArguments(
        [&](std::span<const OVFormatArgument> list) { AlwaysWarnV(format.text(), list); },
        arguments...);
}

/// Reports that something did not hold in `function`, and throws `OVException` with the reported
/// text if `shouldRaise`. `self` is the object that it did not hold for: a pointer that `%@` takes,
/// or null. An empty format stands for the function's name.
template <class Self, class... Args>
void _OVAssertFailed(const char* function, bool shouldRaise, const Self& self,
                     OVFormatString<Args...> format, const Args&... arguments) {
    static_assert(OVFormatTraits<Self>::kind == OVFormatKind::Object, "%@ must take self");
    const OVFormatArgument object = OVFormatTraits<Self>::make(self);
    OVWithFormatArguments(
        [&](std::span<const OVFormatArgument> list) {
            _OVAssertFailedV(function, shouldRaise, object, format.text(), list);
        },
        arguments...);
}
