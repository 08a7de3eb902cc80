#include <Orvane/OVObject.h>

#include "Foundation/TypeName.h"

#include <Orvane/OVFormat.h>

#include <functional>

OVObject::OVObject() = default;
OVObject::~OVObject() = default;

bool OVObject::isEqual(const OVObject* other) const {
    return this == other;
}

std::size_t OVObject::hash() const {
    return std::hash<const void*>()(this);
}

std::string OVObject::description() const {
    return OVFormat("%s[%p]", Foundation::getTypeName(typeid(*this)),
                    static_cast<const void*>(this));
}

std::string describeForFormat(const OVObject* object) {
    return object->description();
}
