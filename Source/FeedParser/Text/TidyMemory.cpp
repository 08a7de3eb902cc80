#include "FeedParser/Text/TidyMemory.h"

#include <tidy/tidy.h>

#include <cstdlib>

namespace Orvane::FeedParser {

namespace {

[[noreturn]] void panic(TidyAllocator*, ctmbstr) {
    // Tidy would go on with a broken tree, and it looks at no allocation that fails: as with its
    // own allocator, that is the end of the process.
    std::abort();
}

}  // namespace

/// What Tidy knows of this.
struct TidyMemory::Allocator {
    TidyAllocator base;  ///< first: Tidy hands back a pointer to it
    TidyMemory* memory;
};

/// In front of each piece of memory that Tidy has.
struct alignas(std::max_align_t) TidyMemory::Block {
    Block* next;
    Block* previous;

    void* content() { return this + 1; }
    static Block* of(void* content) { return static_cast<Block*>(content) - 1; }
};

TidyMemory::TidyMemory() {
    static constexpr TidyAllocatorVtbl kFunctions = {allocate, reallocate, free, panic};
    mAllocator = new Allocator{{&kFunctions}, this};
}

TidyMemory::~TidyMemory() {
    Block* block = mBlocks;
    while (block) {
        Block* const next = block->next;
        std::free(block);
        block = next;
    }
    delete mAllocator;
}

TidyAllocator* TidyMemory::getAllocator() {
    return &mAllocator->base;
}

void* TidyMemory::allocate(TidyAllocator* self, std::size_t size) {
    auto* block = static_cast<Block*>(std::malloc(sizeof(Block) + size));
    if (!block) panic(self, "out of memory");
    return reinterpret_cast<Allocator*>(self)->memory->add(block);
}

void* TidyMemory::reallocate(TidyAllocator* self, void* memory, std::size_t size) {
    if (!memory) return allocate(self, size);
    TidyMemory& all = *reinterpret_cast<Allocator*>(self)->memory;
    Block* block = Block::of(memory);
    all.remove(block);
    block = static_cast<Block*>(std::realloc(block, sizeof(Block) + size));
    if (!block) panic(self, "out of memory");
    return all.add(block);
}

void TidyMemory::free(TidyAllocator* self, void* memory) {
    if (!memory) return;
    Block* block = Block::of(memory);
    reinterpret_cast<Allocator*>(self)->memory->remove(block);
    std::free(block);
}

void* TidyMemory::add(Block* block) {
    block->next = mBlocks;
    block->previous = nullptr;
    if (mBlocks) mBlocks->previous = block;
    mBlocks = block;
    ++mCount;
    return block->content();
}

void TidyMemory::remove(Block* block) {
    (block->previous ? block->previous->next : mBlocks) = block->next;
    if (block->next) block->next->previous = block->previous;
    --mCount;
}

}  // namespace Orvane::FeedParser
