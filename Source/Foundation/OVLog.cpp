#include <Orvane/OVException.h>
#include <Orvane/OVLog.h>

#include "Foundation/Logger.h"
#include "Foundation/Switches.h"

#include <cstdio>
#include <exception>
#include <string>

namespace {

/// The facility that a format names: "Feed" for "[Feed] text"; empty if it names none.
std::string facilityOf(std::string_view format) {
    if (!format.starts_with('[')) return {};
    const std::size_t end = format.find(']');
    return end == std::string_view::npos ? std::string() : std::string(format.substr(1, end - 1));
}

/// The formatted text, or the format as it stands if an object cannot be described.
std::string tryToFormat(const char* format, std::span<const OVFormatArgument> arguments) {
    try {
        return OVFormatV(format, arguments);
    } catch (const std::exception&) {
        return format;
    }
}

std::string assertionMessage(const char* function, const OVFormatArgument& self, const char* format,
                             std::span<const OVFormatArgument> arguments) {
    std::string message =
        format && *format ? tryToFormat(format, arguments) : OVFormat(" %s ...NOT!!", function);
    if (self.pointer()) message += tryToFormat(" (self = %@)", {&self, 1});
    return message;
}

}  // namespace

bool WillLog(const char* name) {
    if (!Foundation::GetBoolPref("OVLog", false)) return false;
    if (!name || !*name) return true;
    return Foundation::GetBoolPref(("OVLog" + std::string(name)).c_str(), false);
}

// Lines are the general log's, which puts no name before the text.

void _OVLogV(const char* format, std::span<const OVFormatArgument> arguments) {
    if (!format) return;
    if (WillLog(facilityOf(format).c_str())) Foundation::gLog.alwaysLogV(format, arguments);
}

void AlwaysWarnV(const char* format, std::span<const OVFormatArgument> arguments) {
    if (!format) return;
    Foundation::gLog.alwaysLogV(("WARNING: " + std::string(format)).c_str(), arguments);
}

void _OVAssertFailedV(const char* function, bool shouldRaise, OVFormatArgument self,
                      const char* format, std::span<const OVFormatArgument> arguments) {
    const std::string text =
        "WARNING: ASSERTION FAILED: " + assertionMessage(function, self, format, arguments);
    const OVFormatArgument line[] = {text};
    Foundation::gLog.alwaysLogV("%s", line);
    if (shouldRaise) throw OVException(text);
    std::fputs("Continuing without raising an exception...\n", stderr);
}
