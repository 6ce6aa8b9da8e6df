#include "support/allocations.h"

#include <atomic>
#include <cstdlib>
#include <limits>
#include <new>

namespace {

constexpr std::size_t kNever = std::numeric_limits<std::size_t>::max();

std::atomic<std::size_t> allocationCount{0};
std::atomic<std::size_t> releaseCount{0};
std::atomic<std::size_t> failingAllocation{kNever};

void* allocate(std::size_t size) {
    std::size_t const number = allocationCount.fetch_add(1);
    void* const memory =
        number == failingAllocation.load() ? nullptr : std::malloc(size == 0 ? 1 : size);
    if (memory != nullptr) return memory;
    releaseCount.fetch_add(1);  // It is not held.
    throw std::bad_alloc();
}

void release(void* memory) {
    if (memory != nullptr) releaseCount.fetch_add(1);
    std::free(memory);
}

}  // namespace

void* operator new(std::size_t size) { return allocate(size); }
void* operator new[](std::size_t size) { return allocate(size); }
void operator delete(void* memory) noexcept { release(memory); }
void operator delete[](void* memory) noexcept { release(memory); }
void operator delete(void* memory, std::size_t) noexcept { release(memory); }
void operator delete[](void* memory, std::size_t) noexcept { release(memory); }

namespace tests {

AllocationCounter::AllocationCounter()
    : start(allocationCount.load()), startReleased(releaseCount.load()) {}
std::size_t AllocationCounter::count() const { return allocationCount.load() - start; }
std::size_t AllocationCounter::held() const {
    return allocationCount.load() - start - (releaseCount.load() - startReleased);
}

FailingAllocation::FailingAllocation(std::size_t succeeding) {
    failingAllocation.store(allocationCount.load() + succeeding);
}
FailingAllocation::~FailingAllocation() { failingAllocation.store(kNever); }

}  // namespace tests
