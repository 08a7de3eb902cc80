#include "Foundation/TypeName.h"

#include <cxxabi.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>

namespace Foundation {

const char* getTypeName(const std::type_info& type) {
    static char sName[255];
    int status = 0;
    char* demangled = abi::__cxa_demangle(type.name(), nullptr, nullptr, &status);
    std::snprintf(sName, sizeof sName, "%s", status == 0 ? demangled : type.name());
    std::free(demangled);
    return sName;
}

bool isBadPointer(const void* pointer) {
    constexpr std::uintptr_t kMargin = 65535;
    const auto address = reinterpret_cast<std::uintptr_t>(pointer);
    return address < kMargin || address > UINTPTR_MAX - kMargin || address % 4 != 0;
}

}  // namespace Foundation
