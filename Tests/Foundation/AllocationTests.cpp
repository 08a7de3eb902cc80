#include "Foundation/AutoreleasePool.h"
#include "Foundation/DateParser.h"
#include "Foundation/Ref.h"
#include "Foundation/Tracked.h"
#include "Support/AllocationCounter.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

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

TEST(Allocation, ADateIsParsedWithoutAny) {
    const std::string texts[] = {"Sat, 07 Sep 2002 00:00:01 +0100", "2003-12-13T18:30:02Z",
                                 "next week", std::string(32768, ':'), std::string(32768, 'a')};
    for (const std::string& text : texts) {
        GregorianDate date;
        std::uint32_t mask = 0;
        char zoneName[256];
        std::int32_t offset = 0;
        const std::size_t before = Support::allocations();
        parsedatelite(text.c_str(), date, mask, zoneName, sizeof zoneName, offset);
        EXPECT_EQ(Support::allocations() - before, 0u) << text.substr(0, 40);
    }
}
