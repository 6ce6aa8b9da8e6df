// tests/support/allocations.h: counts allocations and makes them fail.
//
//     AllocationCounter counter;
//     double d = value;
//     EXPECT_EQ(counter.count(), 0u);

#ifndef TARN_TESTS_SUPPORT_ALLOCATIONS_H
#define TARN_TESTS_SUPPORT_ALLOCATIONS_H

#include <cstddef>
#include <new>

namespace tests {

/// Counts the allocations of the program since its construction.
class AllocationCounter {
public:
    AllocationCounter();
    std::size_t count() const;
    /// The number of allocated blocks, relative to construction.
    std::size_t held() const;
    /// The largest number of allocated bytes since construction, relative to then; only for the
    /// counter that was constructed last.
    std::size_t peakBytes() const;
    /// The number of allocated bytes, relative to construction.
    std::size_t heldBytes() const;

private:
    std::size_t start;
    std::size_t startReleased;
    std::size_t startBytes;
};

/// While it lives, one allocation throws `std::bad_alloc`, after `succeeding` successful ones; all
/// later ones succeed again.
class FailingAllocation {
public:
    explicit FailingAllocation(std::size_t succeeding);
    ~FailingAllocation();
    FailingAllocation(FailingAllocation const&) = delete;
    FailingAllocation& operator=(FailingAllocation const&) = delete;
};

/// Runs `operation` repeatedly: its first, second, ... allocation fails, until none does. Calls
/// `check` after each failure. Returns the number of failures.
template <class Operation, class Check>
std::size_t failEachAllocation(Operation operation, Check check) {
    for (std::size_t failures = 0;; ++failures) {
        bool thrown = false;
        {
            FailingAllocation failing(failures);
            try {
                operation();
            } catch (std::bad_alloc const&) {
                thrown = true;
            }
        }
        if (!thrown) return failures;
        check();
    }
}

}  // namespace tests

#endif
