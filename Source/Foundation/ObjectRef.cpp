#include "Foundation/ObjectRef.h"

#include "Foundation/FormatObjects.h"

namespace Foundation {

bool ObjectRef::isEqual(const ObjectRef& other) const {
    return IsEqual(getValue(), other.getValue()) && IsEqual(getObject(), other.getObject());
}

std::size_t ObjectRef::getHash() const {
    if (const PFRefCounted* value = getValue()) return value->getHash();
    if (const RefCounted* object = getObject()) return object->getPFHashCode();
    return 0;
}

std::string ObjectRef::description() const {
    return isObject() ? describeForFormat(getObject()) : describeForFormat(getValue());
}

}  // namespace Foundation
