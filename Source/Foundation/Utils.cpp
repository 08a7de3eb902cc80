#include "Foundation/Utils.h"

#include "Foundation/Logger.h"
#include "Foundation/Switches.h"

#include <cxxabi.h>
#include <execinfo.h>

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

namespace Compatibility {

namespace {

/// One frame as the stack service words it, "object(mangled+offset) [address]", made readable.
std::string demangledFrame(const char* frame) {
    const char* open = std::strchr(frame, '(');
    const char* plus = open ? std::strchr(open, '+') : nullptr;
    if (!plus) return frame;
    const std::string mangled(open + 1, plus);
    // The demangler takes the name of a C function for that of a type: "f" would become "float".
    if (!mangled.starts_with("_Z")) return frame;
    int status = 0;
    const std::unique_ptr<char, void (*)(void*)> name(
        abi::__cxa_demangle(mangled.c_str(), nullptr, nullptr, &status), std::free);
    if (status != 0) return frame;
    return std::string(frame, open + 1) + name.get() + plus;
}

}  // namespace

bool Utils::copyenv(char* buffer, std::size_t size, const char* name) {
    const char* value = std::getenv(name);
    if (!value) return false;
    std::snprintf(buffer, size, "%s", value);
    return true;
}

int Utils::str2int(const char* text, bool hex) {
    const long number = text ? std::strtol(text, nullptr, hex ? 16 : 10) : 0;
    return static_cast<int>(std::clamp<long>(number, INT_MIN, INT_MAX));
}

std::int64_t Utils::str2longlong(const char* text) {
    return text ? std::strtoll(text, nullptr, 10) : 0;
}

void Utils::printStack(int skip, int count) {
    if (!Foundation::GetBoolPref("OVPrintStack", false)) return;
    constexpr int kSlack = 4;  // frames of the stack service itself, which a sanitizer wraps
    std::vector<void*> addresses(static_cast<std::size_t>(kSlack + skip + 1 + count + 1));
    const int found = backtrace(addresses.data(), static_cast<int>(addresses.size()));
    addresses.resize(static_cast<std::size_t>(found));
    const auto caller = std::find(addresses.begin(), addresses.end(), __builtin_return_address(0));
    const int first = static_cast<int>(caller - addresses.begin()) + skip;
    for (void*& address : addresses) {
        // The call itself: behind one that does not return, the next function may begin.
        address = static_cast<char*>(address) - 1;
    }
    const std::unique_ptr<char*, void (*)(void*)> frames(backtrace_symbols(addresses.data(), found),
                                                         std::free);
    if (!frames || found == 0) {
        Foundation::gWarn.log("The call stack can't be read");
        return;
    }
    for (int i = first; i < std::min(found, first + count); ++i) {
        std::fprintf(stderr, "\t%s\n", demangledFrame(frames.get()[i]).c_str());
    }
    if (found > first + count) std::fputs("\t...more...\n", stderr);
}

}  // namespace Compatibility
