#include "Foundation/Guard.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Tracked.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <stdexcept>

using namespace Foundation;
using Lines = std::vector<std::string>;

TEST(Guard, RunsInAPoolThatEndsWithTheCall) {
    Deaths deaths;
    std::uint32_t level = 0;
    callGuarded("void f()", [&] {
        level = AutoreleasePool::getNestLevel();
        (new TrackedObject("a", &deaths))->autorelease();
    });
    EXPECT_EQ(level, 1u);
    EXPECT_EQ(deaths, Deaths({"a"}));
    EXPECT_EQ(AutoreleasePool::getNestLevel(), 0u);
}

TEST(Guard, ReportsWhatIsThrownAndDrainsItsPoolAfterwards) {
    const Support::LogCapture log;
    Deaths deaths;
    callGuarded("void f()", [&] {
        (new TrackedObject("a", &deaths))->autorelease();
        throw std::runtime_error("text");
    });
    callGuarded("void g()", [] { throw 42; });
    EXPECT_EQ(log.lines(), Lines({"[WARNING] std::runtime_error \"text\" caught in void f()",
                                  "[WARNING] Unknown exception caught in void g()"}));
    EXPECT_EQ(deaths, Deaths({"a"}));
    EXPECT_EQ(AutoreleasePool::getNestLevel(), 0u);
}
