#include "support/allocations.h"

#include <atomic>
#include <cstdlib>
#include <limits>
#include <new>

namespace {

constexpr std::size_t kNever = std::numeric_limits<std::size_t>::max();

std::atomic<std::size_t> allocationCount{0};
std::atomic<std::size_t> failingAllocation{kNever};

void* allocate(std::size_t size) {
    std::size_t const number = allocationCount.fetch_add(1);
    if (number == failingAllocation.load()) throw std::bad_alloc();
    void* const memory = std::malloc(size == 0 ? 1 : size);
    if (memory == nullptr) throw std::bad_alloc();
    return memory;
}

}  // namespace

void* operator new(std::size_t size) { return allocate(size); }
void* operator new[](std::size_t size) { return allocate(size); }
void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete[](void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
void operator delete[](void* memory, std::size_t) noexcept { std::free(memory); }

namespace tests {

AllocationCounter::AllocationCounter() : start(allocationCount.load()) {}
std::size_t AllocationCounter::count() const { return allocationCount.load() - start; }

FailingAllocation::FailingAllocation(std::size_t succeeding) {
    failingAllocation.store(allocationCount.load() + succeeding);
}
FailingAllocation::~FailingAllocation() { failingAllocation.store(kNever); }

}  // namespace tests
