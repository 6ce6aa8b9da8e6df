#include "support/allocations.h"

#include <atomic>
#include <cstdlib>
#include <limits>
#include <new>

#include <malloc.h>

namespace {

constexpr std::size_t kNever = std::numeric_limits<std::size_t>::max();

std::atomic<std::size_t> allocationCount{0};
std::atomic<std::size_t> releaseCount{0};
std::atomic<std::size_t> failingAllocation{kNever};
std::atomic<std::size_t> bytes{0};
std::atomic<std::size_t> mostBytes{0};

std::size_t sizeOf(void* memory) {
#if defined(_WIN32)
    return _msize(memory);
#else
    return malloc_usable_size(memory);
#endif
}

void countBytes(std::size_t size) {
    std::size_t const now = bytes.fetch_add(size) + size;
    std::size_t most = mostBytes.load();
    while (now > most && !mostBytes.compare_exchange_weak(most, now)) {
    }
}

void* allocate(std::size_t size) {
    std::size_t const number = allocationCount.fetch_add(1);
    void* const memory =
        number == failingAllocation.load() ? nullptr : std::malloc(size == 0 ? 1 : size);
    if (memory != nullptr) {
        countBytes(sizeOf(memory));
        return memory;
    }
    releaseCount.fetch_add(1);  // Not counted as held.
    throw std::bad_alloc();
}

void release(void* memory) {
    if (memory != nullptr) {
        releaseCount.fetch_add(1);
        bytes.fetch_sub(sizeOf(memory));
    }
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
    : start(allocationCount.load()), startReleased(releaseCount.load()), startBytes(bytes.load()) {
    mostBytes.store(startBytes);
}
std::size_t AllocationCounter::count() const { return allocationCount.load() - start; }
std::size_t AllocationCounter::held() const {
    return allocationCount.load() - start - (releaseCount.load() - startReleased);
}

std::size_t AllocationCounter::heldBytes() const { return bytes.load() - startBytes; }
std::size_t AllocationCounter::peakBytes() const { return mostBytes.load() - startBytes; }

FailingAllocation::FailingAllocation(std::size_t succeeding) {
    failingAllocation.store(allocationCount.load() + succeeding);
}
FailingAllocation::~FailingAllocation() { failingAllocation.store(kNever); }

}  // namespace tests
