#include "Support/AllocationCounter.h"

#include <cstdlib>
#include <new>

namespace {

std::size_t sAllocations = 0;

void* allocate(std::size_t size) noexcept {
    ++sAllocations;
    return std::malloc(size);
}

}  // namespace

namespace Support {

std::size_t allocations() {
    return sAllocations;
}

}  // namespace Support

// The array forms end here too. The program is one thread's while it counts.

void* operator new(std::size_t size) {
    if (void* memory = allocate(size)) return memory;
    throw std::bad_alloc();
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
    return allocate(size);
}
void* operator new[](std::size_t size) {
    return operator new(size);
}
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
    return allocate(size);
}
void operator delete(void* memory) noexcept {
    std::free(memory);
}
void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}
void operator delete(void* memory, const std::nothrow_t&) noexcept {
    std::free(memory);
}
void operator delete[](void* memory) noexcept {
    std::free(memory);
}
void operator delete[](void* memory, std::size_t) noexcept {
    std::free(memory);
}
void operator delete[](void* memory, const std::nothrow_t&) noexcept {
    std::free(memory);
}
