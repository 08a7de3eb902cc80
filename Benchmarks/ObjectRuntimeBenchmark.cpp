// What do counting and pools cost, next to std::shared_ptr?

#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"
#include "Support/AllocationCounter.h"

#include <memory>

using namespace Foundation;
using Benchmarks::compare;
using Benchmarks::keep;
using Benchmarks::report;

namespace {

constexpr int kCount = 200'000;
constexpr int kEntries = 256;

struct Object : RefCounted {
    int value = 0;
};

struct Plain {
    int value = 0;
};

double copiesOfAReference() {
    const Ref<Object> ref(new Object);
    const auto shared = std::make_shared<Plain>();
    const auto c = compare(
        [&] {
            for (int i = 0; i < kCount; ++i) {
                const Ref<Object> copy = ref;  // NOLINT: the copy is what is measured
                keep(copy);
            }
        },
        [&] {
            for (int i = 0; i < kCount; ++i) {
                const std::shared_ptr<Plain> copy = shared;  // NOLINT
                keep(copy);
            }
        });
    report("copy and drop a reference", c, kCount, "std::shared_ptr");
    return c.ratio();
}

void makingAnObject() {
    const auto c = compare(
        [] {
            for (int i = 0; i < kCount; ++i) {
                const Ref<Object> object(new Object);
                keep(object);
            }
        },
        [] {
            for (int i = 0; i < kCount; ++i) {
                const auto object = std::make_shared<Plain>();
                keep(object);
            }
        });
    report("make and drop an object", c, kCount, "std::make_shared");
}

void fillingAPool() {
    const auto c = compare(
        [] {
            for (int i = 0; i < kCount / kEntries; ++i) {
                AutoreleasePool pool;
                for (int j = 0; j < kEntries; ++j) {
                    keep(*(new Object)->autorelease());
                }
            }
        },
        [] {
            for (int i = 0; i < kCount / kEntries; ++i) {
                std::vector<std::shared_ptr<Plain>> holder;
                for (int j = 0; j < kEntries; ++j) {
                    holder.push_back(std::make_shared<Plain>());
                }
            }
        });
    report("hand 256 objects to a pool, each", c, kCount, "vector of std::shared_ptr");
}

/// How many times a pool of 256 entries asks for memory.
std::size_t allocationsOfAPool() {
    const Ref<Object> object(new Object);
    std::vector<Ref<Object>> objects;
    for (int i = 0; i < kEntries; ++i) {
        objects.emplace_back(new Object);
    }
    const std::size_t before = Support::allocations();
    {
        AutoreleasePool pool;
        for (const Ref<Object>& entry : objects) {
            entry->retain();
            entry->autorelease();
        }
    }
    return Support::allocations() - before;
}

}  // namespace

int main() {
    makingAnObject();
    fillingAPool();
    std::printf("allocations of a pool with %d entries: %zu\n", kEntries, allocationsOfAPool());
    std::printf("object_runtime %.2f\n", copiesOfAReference());
}
