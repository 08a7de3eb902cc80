#include "FeedParser/Text/TidyMemory.h"

#include <gtest/gtest.h>
#include <tidy/tidy.h>

#include <cstring>

namespace {

using Orvane::FeedParser::TidyMemory;

class TidyMemoryTest : public testing::Test {
 protected:
    void* allocate(std::size_t size) { return mTidy->vtbl->alloc(mTidy, size); }
    void* reallocate(void* memory, std::size_t size) {
        return mTidy->vtbl->realloc(mTidy, memory, size);
    }
    void free(void* memory) { mTidy->vtbl->free(mTidy, memory); }

    TidyMemory mMemory;
    TidyAllocator* mTidy = mMemory.getAllocator();
};

TEST_F(TidyMemoryTest, FreesWhatTidyForgets) {
    // The leak sanitizer looks whether that is so.
    for (int i = 0; i < 3; ++i)
        std::memset(allocate(100), 1, 100);
    EXPECT_EQ(mMemory.count(), 3U);
}

TEST_F(TidyMemoryTest, LetsTidyFreeInAnyOrder) {
    void* first = allocate(1);
    void* second = allocate(2);
    void* third = allocate(3);
    free(second);
    EXPECT_EQ(mMemory.count(), 2U);
    free(third);
    free(nullptr);
    free(first);
    EXPECT_EQ(mMemory.count(), 0U);
}

TEST_F(TidyMemoryTest, KeepsTheContentOfMemoryThatGrows) {
    void* other = allocate(1);
    void* memory = reallocate(nullptr, 5);
    std::memcpy(memory, "text", 5);
    memory = reallocate(memory, 100000);
    EXPECT_STREQ(static_cast<const char*>(memory), "text");
    EXPECT_EQ(mMemory.count(), 2U);
    free(other);
    free(memory);
    EXPECT_EQ(mMemory.count(), 0U);
}

TEST_F(TidyMemoryTest, IsAllThatADocumentOfTidyUses) {
    const TidyDoc document = tidyCreateWithAllocator(mTidy);
    EXPECT_GT(mMemory.count(), 0U);
    EXPECT_GE(tidyParseString(document, "<p>x<b>y"), 0);
    tidyRelease(document);
    EXPECT_EQ(mMemory.count(), 0U);
}

}  // namespace
