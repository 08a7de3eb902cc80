#include "Foundation/ThreadUtil.h"

#include <gtest/gtest.h>

#include <thread>

using Foundation::ThreadID;
using Foundation::ThreadUtil;

TEST(ThreadUtil, NamesEachThreadThatRunsByANumberThatIsNot0) {
    const ThreadID mine = ThreadUtil::IDCurrent();
    ThreadID others = 0;
    std::thread([&] { others = ThreadUtil::IDCurrent(); }).join();
    EXPECT_NE(mine, 0u);
    EXPECT_NE(others, 0u);
    EXPECT_NE(mine, others);
    EXPECT_EQ(ThreadUtil::IDCurrent(), mine);
}
