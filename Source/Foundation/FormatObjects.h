#pragma once

#include "Foundation/Ref.h"

#include <Orvane/OVFormat.h>

#include <string>

/// Makes the system's counted objects arguments of `%@`, and of `%p`.

namespace Foundation {

/// The text of `ToString(object)`, for formats.
std::string describeForFormat(const RefCounted* object);
std::string describeForFormat(const PFRefCounted* object);

}  // namespace Foundation

template <class T>
struct OVFormatTraits<Foundation::Ref<T>> {
    static constexpr OVFormatKind kind = OVFormatKind::Object;
    static OVFormatArgument make(const Foundation::Ref<T>& object) {
        return OVFormatTraits<T*>::make(object.get());
    }
};
