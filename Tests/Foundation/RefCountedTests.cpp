#include "Foundation/RefCounted.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/Tracked.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Support::LogCapture;

namespace {

std::string whatOf(const std::function<void()>& body) {
    try {
        body();
    } catch (const AssertionFailure& e) {
        return e.what();
    }
    return "(nothing was thrown)";
}

}  // namespace

TEST(RefCounted, IsNewWithACountOf0) {
    Deaths deaths;
    const Ref<TrackedObject> object(new TrackedObject("a", &deaths));
    EXPECT_EQ(object->getRefCount(), 1u);
    EXPECT_FALSE(object->isPooled());
}

TEST(RefCounted, EndsWithTheLastReference) {
    Deaths deaths;
    { const Ref<TrackedObject> object(new TrackedObject("a", &deaths)); }
    EXPECT_EQ(deaths, Deaths({"a"}));
}

TEST(RefCounted, ANewObjectGoesIntoThePoolWithoutACount) {
    Deaths deaths;
    {
        AutoreleasePool pool;
        auto* object = new TrackedObject("a", &deaths);
        EXPECT_EQ(object->autorelease(), object);
        EXPECT_EQ(object->getRefCount(), 0u);
        EXPECT_TRUE(object->isPooled());
        EXPECT_TRUE(deaths.empty());
    }
    EXPECT_EQ(deaths, Deaths({"a"}));
}

TEST(RefCounted, ReleasedToZeroWhilePooledItStaysUntilTheDrain) {
    Deaths deaths;
    {
        AutoreleasePool pool;
        auto* object = new TrackedObject("a", &deaths);
        object->autorelease();
        { const Ref<TrackedObject> ref(object); }
        EXPECT_TRUE(deaths.empty());
    }
    EXPECT_EQ(deaths, Deaths({"a"}));
}

TEST(RefCounted, OutlivesThePoolIfItIsOwnedAtTheDrain) {
    Deaths deaths;
    Ref<TrackedObject> ref;
    {
        AutoreleasePool pool;
        auto* object = new TrackedObject("a", &deaths);
        object->autorelease();
        ref = object;
    }
    EXPECT_TRUE(deaths.empty());
    EXPECT_FALSE(ref->isPooled());
    { const Ref<TrackedObject> last = std::move(ref); }
    EXPECT_EQ(deaths, Deaths({"a"}));
}

TEST(RefCounted, ASecondAutoreleaseOnlyLowersTheCount) {
    Deaths deaths;
    {
        AutoreleasePool pool;
        auto* object = new TrackedObject("a", &deaths);
        object->retain();
        object->retain();
        object->autorelease();
        EXPECT_EQ(object->getRefCount(), 1u);
        object->autorelease();
        EXPECT_EQ(object->getRefCount(), 0u);
        EXPECT_TRUE(object->isPooled());
    }
    EXPECT_EQ(deaths, Deaths({"a"}));
}

TEST(RefCounted, AdoptedMakesANewObjectOwnedAndLeavesOthersAlone) {
    Deaths deaths;
    auto* object = new TrackedObject("a", &deaths);
    EXPECT_EQ(object->adopted(), object);
    EXPECT_EQ(object->getRefCount(), 1u);
    object->adopted();
    EXPECT_EQ(object->getRefCount(), 1u);
    {
        AutoreleasePool pool;
        object->autorelease();
        object->adopted();
        EXPECT_EQ(object->getRefCount(), 0u);
    }
    EXPECT_EQ(deaths, Deaths({"a"}));
    EXPECT_EQ(adopted<TrackedObject>(nullptr), nullptr);
}

TEST(RefCounted, ReleasingWhatNobodyOwnsIsAnAssertion) {
    LogCapture log;
    Deaths deaths;
    AutoreleasePool pool;
    auto* object = new TrackedObject("a", &deaths);
    EXPECT_EQ(whatOf([&] { object->release(); }),
              OVFormat("over-released object %p (refcount=0, pooled=0)", object));
    EXPECT_TRUE(
        log.contains("ASSERTION FAILED: in void Foundation::RefCounted::_badRelease() "
                     "const: over-released object"));
    object->autorelease();
    EXPECT_EQ(whatOf([&] { object->release(); }),
              OVFormat("over-released object %p (refcount=0, pooled=1)", object));
    EXPECT_EQ(whatOf([&] { object->autorelease(); }),
              OVFormat("over-released object %p (refcount=0, pooled=1)", object));
}

TEST(RefCounted, WarnsWhenItEndsWithReferencesLeft) {
    LogCapture log;
    Deaths deaths;
    {
        TrackedObject object("a", &deaths);
        object.retain();
        object.retain();
    }
    EXPECT_TRUE(log.contains("[WARNING] Destructing RefCounted 0x"));
    EXPECT_TRUE(log.contains(" that still has 2 references!"));
}

TEST(RefCounted, EndsInSilenceWhenAPoolDrainsIt) {
    LogCapture log;
    Deaths deaths;
    {
        AutoreleasePool pool;
        (new TrackedObject("a", &deaths))->autorelease();
    }
    EXPECT_TRUE(log.lines().empty());
}

TEST(RefCounted, IsStillMarkedAsPooledWhenAPoolEndsIt) {
    struct Marked : RefCounted {
        explicit Marked(bool* atItsEnd) : wasPooled(atItsEnd) {}
        ~Marked() override { *wasPooled = isPooled(); }
        bool* wasPooled;
    };
    bool wasPooled = false;
    {
        AutoreleasePool pool;
        (new Marked(&wasPooled))->autorelease();
    }
    EXPECT_TRUE(wasPooled);
}

TEST(RefCounted, DescribesItselfByClassAddressCountAndPool) {
    Deaths deaths;
    AutoreleasePool pool;
    Ref<TrackedObject> object(new TrackedObject("a", &deaths));
    EXPECT_EQ(object->toString()->utf8(), OVFormat("TrackedObject[%p +1]", object));
    object->retain();
    object->autorelease();
    EXPECT_EQ(object->toString()->utf8(), OVFormat("TrackedObject[%p +1p]", object));
}

TEST(RefCounted, IsEqualToItselfAlone) {
    Deaths deaths;
    const Ref<TrackedObject> a(new TrackedObject("a", &deaths));
    const Ref<TrackedObject> b(new TrackedObject("a", &deaths));
    const RefCounted* null = nullptr;
    EXPECT_TRUE(IsEqual(a.get(), a.get()));
    EXPECT_FALSE(IsEqual(a.get(), b.get()));
    EXPECT_FALSE(IsEqual(a.get(), null));
    EXPECT_FALSE(IsEqual(null, b.get()));
    EXPECT_TRUE(IsEqual(null, null));
    EXPECT_EQ(a->getPFHashCode(), reinterpret_cast<std::size_t>(a.get()));
}

TEST(RefCounted, NullIsRetainedAndReleasedWithoutHarm) {
    RefCounted* object = nullptr;
    PFRefCounted* value = nullptr;
    EXPECT_EQ(retain(object), nullptr);
    EXPECT_EQ(retain(value), nullptr);
    release(object);
    release(value);
    EXPECT_EQ(autorelease(object), nullptr);
    EXPECT_EQ(autorelease(value), nullptr);
}
