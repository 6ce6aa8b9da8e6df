// tests/support/allocations.h: counts what the program allocates, and makes an allocation fail.
//
//     AllocationCounter counter;
//     double d = value;
//     EXPECT_EQ(counter.count(), 0u);

#ifndef TARN_TESTS_SUPPORT_ALLOCATIONS_H
#define TARN_TESTS_SUPPORT_ALLOCATIONS_H

#include <cstddef>
#include <new>

namespace tests {

/// Every allocation of the program since this was made.
class AllocationCounter {
public:
    AllocationCounter();
    std::size_t count() const;
    /// How many blocks more there are than when this was made: those not given back.
    std::size_t held() const;
    /// How many bytes more there were at some time than when this was made; of the counter that was
    /// made last.
    std::size_t peakBytes() const;
    /// How many bytes more there are than when this was made.
    std::size_t heldBytes() const;

private:
    std::size_t start;
    std::size_t startReleased;
    std::size_t startBytes;
};

/// While it lives, the allocation after `succeeding` further ones throws `std::bad_alloc`; those
/// after it succeed again.
class FailingAllocation {
public:
    explicit FailingAllocation(std::size_t succeeding);
    ~FailingAllocation();
    FailingAllocation(FailingAllocation const&) = delete;
    FailingAllocation& operator=(FailingAllocation const&) = delete;
};

/// Runs `operation` again and again, failing its first, second, ... allocation, until it gets
/// through. After each failure `check` looks at what is left. Returns how often it failed.
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
