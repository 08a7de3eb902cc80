#pragma once

#include "Foundation/Uncopyable.h"

#include <cstddef>

struct _TidyAllocator;

namespace Orvane::FeedParser {

/// The memory of one document of Tidy's. It frees what Tidy forgets to: Tidy loses the attributes
/// of some broken elements, some hundred bytes each time. Any one thread.
class TidyMemory : Foundation::Uncopyable {
 public:
    TidyMemory();
    /// Frees all that is left.
    ~TidyMemory();

    /// For `tidyCreateWithAllocator`.
    _TidyAllocator* getAllocator();
    /// How many blocks there are.
    std::size_t count() const { return mCount; }

 private:
    struct Allocator;
    struct Block;

    static void* allocate(_TidyAllocator* self, std::size_t size);
    static void* reallocate(_TidyAllocator* self, void* memory, std::size_t size);
    static void free(_TidyAllocator* self, void* memory);

    void* add(Block* block);
    void remove(Block* block);

    Allocator* mAllocator;
    Block* mBlocks = nullptr;
    std::size_t mCount = 0;
};

}  // namespace Orvane::FeedParser
