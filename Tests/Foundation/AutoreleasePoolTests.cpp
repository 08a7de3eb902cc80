#include "Foundation/AutoreleasePool.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Ref.h"
#include "Foundation/Tracked.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <memory>
#include <new>
#include <thread>

using namespace Foundation;
using Support::LogCapture;

TEST(AutoreleasePool, ReleasesAValueOnceForEachEntry) {
    Deaths deaths;
    const Ref<TrackedValue> value = Returner<TrackedValue>(new TrackedValue("a", &deaths));
    {
        AutoreleasePool pool;
        value->retain();
        value->retain();
        EXPECT_EQ(AutoreleasePool::autorelease(value.get()), value.get());
        AutoreleasePool::autorelease(value.get());
        EXPECT_EQ(value->getRetainCount(), 3u);
    }
    EXPECT_EQ(value->getRetainCount(), 1u);
    EXPECT_TRUE(deaths.empty());
}

TEST(AutoreleasePool, TakesNullAsNothing) {
    LogCapture log;
    EXPECT_EQ(AutoreleasePool::autorelease(nullptr), nullptr);
    EXPECT_TRUE(log.lines().empty());
}

TEST(AutoreleasePool, DrainsBothKindsInTheOrderOfInsertionAcrossBuckets) {
    Deaths deaths;
    Deaths expected;
    {
        AutoreleasePool pool;
        for (int i = 0; i < 600; ++i) {
            const std::string name = std::to_string(i);
            expected.push_back(name);
            if (i % 2) {
                (new TrackedObject(name, &deaths))->autorelease();
            } else {
                AutoreleasePool::autorelease(new TrackedValue(name, &deaths));
            }
        }
        EXPECT_TRUE(deaths.empty());
    }
    EXPECT_EQ(deaths, expected);
}

TEST(AutoreleasePool, NestsAndDrainsInnermostFirst) {
    Deaths deaths;
    EXPECT_EQ(AutoreleasePool::getNestLevel(), 0u);
    {
        AutoreleasePool outer;
        (new TrackedObject("outer", &deaths))->autorelease();
        {
            AutoreleasePool inner;
            EXPECT_EQ(AutoreleasePool::getNestLevel(), 2u);
            (new TrackedObject("inner", &deaths))->autorelease();
        }
        (new TrackedObject("outer 2", &deaths))->autorelease();
    }
    EXPECT_EQ(deaths, Deaths({"inner", "outer", "outer 2"}));
    EXPECT_EQ(AutoreleasePool::getNestLevel(), 0u);
}

namespace {

/// Holds pools outside their scopes, which only a test may do.
struct PoolSlot {
    alignas(AutoreleasePool) std::byte space[sizeof(AutoreleasePool)];
    AutoreleasePool* open() { return ::new (static_cast<void*>(space)) AutoreleasePool; }
};

}  // namespace

TEST(AutoreleasePool, PoppedOutOfOrderItIsAnAssertionThatNamesBothPools) {
    LogCapture log;
    PoolSlot slots[2];
    AutoreleasePool* below = slots[0].open();
    AutoreleasePool* top = slots[1].open();
    std::string what;
    try {
        below->~AutoreleasePool();
    } catch (const AssertionFailure& e) {
        what = e.what();
    }
    EXPECT_EQ(what, OVFormat("Non-top AutoreleasePool being popped (this=%p, top=%p)", below, top));
    top->~AutoreleasePool();
    EXPECT_EQ(AutoreleasePool::getNestLevel(), 0u);
}

TEST(AutoreleasePool, NeverThrowsWhileUnwinding) {
    LogCapture log;
    PoolSlot outer;
    PoolSlot inner;
    AutoreleasePool* below = outer.open();
    AutoreleasePool* top = inner.open();
    struct EndsOutOfOrder {
        AutoreleasePool* pool;
        ~EndsOutOfOrder() { pool->~AutoreleasePool(); }
    };
    try {
        [[maybe_unused]] const EndsOutOfOrder guard{below};
        throw std::runtime_error("first");
    } catch (const std::runtime_error& e) {
        EXPECT_STREQ(e.what(), "first");
    }
    EXPECT_TRUE(log.contains("Non-top AutoreleasePool being popped"));
    top->~AutoreleasePool();
    EXPECT_EQ(AutoreleasePool::getNestLevel(), 0u);
}

TEST(AutoreleasePool, WithoutAPoolItWarnsAndMakesNoEntry) {
    LogCapture log;
    Deaths deaths;
    auto* object = new TrackedObject("a", &deaths);
    object->autorelease();
    EXPECT_FALSE(object->isPooled());
    EXPECT_EQ(log.lines().size(), 1u);
    EXPECT_TRUE(log.contains("[WARNING] No pool to handle autorelease of TrackedObject[0x"));
    { const Ref<TrackedObject> cleanUp(object); }
}

TEST(AutoreleasePool, AThreadWithoutOneWarnsAfterTheHolderIsDone) {
    LogCapture log;
    Deaths deaths;
    auto object = std::make_unique<TrackedObject>("a", &deaths);
    std::thread other;
    {
        AutoreleasePool pool;
        other = std::thread([&] { object->autorelease(); });
        // The warning needs a pool of its own, which this one keeps out.
        (new TrackedObject("mine", &deaths))->autorelease();
        EXPECT_FALSE(object->isPooled());
    }
    other.join();
    EXPECT_TRUE(log.contains("No pool to handle autorelease of TrackedObject"));
    EXPECT_FALSE(object->isPooled());
    EXPECT_EQ(deaths, Deaths({"mine"}));
}

TEST(AutoreleasePool, OneThreadAtATimeHasPools) {
    std::vector<int> order;
    std::thread other;
    {
        AutoreleasePool pool;
        other = std::thread([&] {
            AutoreleasePool mine;
            order.push_back(2);
        });
        order.push_back(1);
    }
    other.join();
    EXPECT_EQ(order, std::vector<int>({1, 2}));
}
