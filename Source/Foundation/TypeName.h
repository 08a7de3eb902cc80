#pragma once

#include <typeinfo>

namespace Foundation {

/// The demangled name of a class. The text stands in one static buffer, cut at 255 bytes: use or
/// copy it before the next call. Main thread.
const char* getTypeName(const std::type_info& type);

/// Whether a pointer cannot be that of an object: below 65535, above the top 65535 of the address
/// space, or not a multiple of 4. Says nothing about the memory behind other pointers.
bool isBadPointer(const void* pointer);

}  // namespace Foundation
