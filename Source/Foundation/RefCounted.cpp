#include "Foundation/RefCounted.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Foundation/String.h"
#include "Foundation/TypeName.h"

namespace Foundation {

std::size_t RefCounted::getPFHashCode() const {
    return reinterpret_cast<std::size_t>(this);
}

bool RefCounted::isEqual(const RefCounted* other) const {
    return this == other;
}

StringReturner RefCounted::toString() const {
    return String::stringWithFormat("%s[%p +%i%s]", getTypeName(typeid(*this)), this, mRefCount,
                                    mPooled ? "p" : "");
}

RefCounted::~RefCounted() {
    if (mRefCount != 0) {
        gWarn.log("Destructing RefCounted %p that still has %u references!", this, mRefCount);
    }
}

void RefCounted::release() const {
    if (mRefCount == 0) _badRelease();
    if (--mRefCount == 0 && !mPooled) delete this;
}

const RefCounted* RefCounted::autorelease() const {
    if (mRefCount > 0) {
        --mRefCount;
        if (mPooled) return this;
    } else if (mPooled) {
        _badRelease();
    }
    mPooled = AutoreleasePool::add(this);
    return this;
}

const RefCounted* RefCounted::adopted() const {
    if (mRefCount == 0 && !mPooled) mRefCount = 1;
    return this;
}

void RefCounted::_evaporate() const {
    if (mRefCount == 0) {
        delete this;
    } else {
        mPooled = false;
    }
}

void RefCounted::_badRelease() const {
    AssertionFailure::failed("void Foundation::RefCounted::_badRelease() const", "false",
                             "over-released object %p (refcount=%i, pooled=%i)", this, mRefCount,
                             mPooled);
}

bool IsEqual(const RefCounted* a, const RefCounted* b) {
    if (a == b) return true;
    return a && b && a->isEqual(b);
}

}  // namespace Foundation
