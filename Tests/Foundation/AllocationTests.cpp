#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"
#include "Foundation/Tracked.h"
#include "Support/AllocationCounter.h"

#include <gtest/gtest.h>

using namespace Foundation;

TEST(Allocation, APoolOf256EntriesNeedsNone) {
    { AutoreleasePool first; }  // the process's first pool makes the lock that all share
    Deaths deaths;
    std::vector<Ref<TrackedObject>> objects;
    for (int i = 0; i < 257; ++i) {
        objects.emplace_back(new TrackedObject("a", &deaths));
    }
    const auto allocationsFor = [&](int entries) {
        const std::size_t before = Support::allocations();
        {
            AutoreleasePool pool;
            for (int i = 0; i < entries; ++i) {
                objects[i]->retain();
                objects[i]->autorelease();
            }
        }
        return Support::allocations() - before;
    };
    EXPECT_EQ(allocationsFor(256), 0u);
    EXPECT_EQ(allocationsFor(257), 1u);
}
