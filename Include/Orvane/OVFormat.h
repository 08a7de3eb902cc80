#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVFormatArgument.h>
#include <Orvane/OVFormatString.h>

#include <span>
#include <string>
#include <string_view>

/// printf-style formats, checked against their arguments when they are compiled.
///
/// The conversions are those of ISO C's printf without `n`, and `%@`, which takes an object and
/// prints its description. Length modifiers are accepted and ignored: the argument's own type
/// tells its size, so no value is ever cut or misread. Numbers print as in the C locale.
///
/// A function that formats takes `OVFormatString<Args...>` and `const Args&...`. A string literal
/// whose conversions do not fit the arguments does not compile.

/// Formats `format` with `arguments`. For formats that are known only at run time, such as
/// translated ones: a conversion that has no argument or one of another kind prints as it stands
/// in the format, and no argument is ever read as what it is not.
OV_EXPORT std::string OVFormatV(std::string_view format,
                                std::span<const OVFormatArgument> arguments);

/// Calls `function` with the arguments as an array of `OVFormatArgument`, which lives for the call.
template <class Function, class... Args>
decltype(auto) OVWithFormatArguments(Function&& function, const Args&... arguments) {
    if constexpr (sizeof...(Args) == 0) {
        return function(std::span<const OVFormatArgument>());
    } else {
        const OVFormatArgument list[] = {OVFormatTraits<Args>::make(arguments)...};
        return function(std::span<const OVFormatArgument>(list));
    }
}

/// The text that `format` gives with `arguments`.
template <class... Args>
std::string OVFormat(OVFormatString<Args...> format, const Args&... arguments) {
    return OVWithFormatArguments(
        [&](std::span<const OVFormatArgument> list) { return OVFormatV(format.text(), list); },
        arguments...);
}
