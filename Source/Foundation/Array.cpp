#include "Foundation/Array.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/String.h"

#include <algorithm>

namespace Foundation {

const ObjectRef& Array::item(std::size_t index) const {
    OV_ASSERT_MESSAGE(index < count(), "index %zu is out of an array of %zu", index, count());
    return mItems[index];
}

std::size_t Array::getHash() const {
    std::size_t hash = count();
    for (const ObjectRef& item : mItems) {
        hash = hash * 31 + item.getHash();
    }
    return hash;
}

bool Array::isEqual(const PFRefCounted* other) const {
    if (this == other) return true;
    const auto* array = dynamic_cast<const Array*>(other);
    return array &&
           std::equal(mItems.begin(), mItems.end(), array->mItems.begin(), array->mItems.end(),
                      [](const ObjectRef& a, const ObjectRef& b) { return a.isEqual(b); });
}

StringReturner Array::toString() const {
    std::string text = "(";
    for (const ObjectRef& item : mItems) {
        if (text.size() > 1) text += ", ";
        text += item.description();
    }
    return String::string(text + ")");
}

}  // namespace Foundation
