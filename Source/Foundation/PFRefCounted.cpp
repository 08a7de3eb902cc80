#include "Foundation/PFRefCounted.h"

#include "Foundation/String.h"
#include "Foundation/TypeName.h"

namespace Foundation {

PFRefCounted::~PFRefCounted() = default;

std::size_t PFRefCounted::getHash() const {
    return reinterpret_cast<std::size_t>(this);
}

bool PFRefCounted::isEqual(const PFRefCounted* other) const {
    return this == other;
}

StringReturner PFRefCounted::toString() const {
    return String::stringWithFormat("%s[%p]", getTypeName(typeid(*this)), this);
}

bool IsEqual(const PFRefCounted* a, const PFRefCounted* b) {
    if (a == b) return true;
    return a && b && a->isEqual(b);
}

}  // namespace Foundation
