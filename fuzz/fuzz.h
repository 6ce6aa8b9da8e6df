// fuzz/fuzz.h: shared by the fuzz targets: typed inputs from bytes, and a check that aborts.

#ifndef TARN_FUZZ_FUZZ_H
#define TARN_FUZZ_FUZZ_H

#include "support/random.h"

#include <fuzzer/FuzzedDataProvider.h>

#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>

namespace fuzz {

/// Aborts where `holds` is false, which the fuzzer reports.
inline void check(bool holds, char const* what) {
    if (holds) return;
    std::fprintf(stderr, "does not hold: %s\n", what);
    std::abort();
}

/// Equal to the last bit; all NaNs count as equal.
inline bool same(double a, double b) {
    return tests::bits(a) == tests::bits(b) || (std::isnan(a) && std::isnan(b));
}

/// The input as numbers of any kind, small choices and strings. Past its end everything is zero.
class Input {
public:
    Input(std::uint8_t const* data, std::size_t size) : provider(data, size) {}

    bool ended() { return provider.remaining_bytes() == 0; }
    std::size_t below(std::size_t end) {
        return provider.ConsumeIntegralInRange<std::size_t>(0, end - 1);
    }
    bool chance() { return provider.ConsumeBool(); }
    std::uint64_t word() { return provider.ConsumeIntegral<std::uint64_t>(); }
    std::string text(std::size_t longest) { return provider.ConsumeRandomLengthString(longest); }
    std::string rest() { return provider.ConsumeRemainingBytesAsString(); }

    /// Any double at all, or one of those that occur in documents.
    double anyDouble() {
        switch (below(4)) {
            case 0: return tests::fromBits(provider.ConsumeIntegral<std::uint64_t>());
            case 1: return provider.ConsumeIntegral<std::int8_t>();
            case 2: return provider.ConsumeIntegral<std::int32_t>() / 200.0;
            default: {
                double const special[] = {0.0,  -0.0,   1000.0, 999.995, 0.005,     INFINITY,
                                          -1e9, 5e-324, NAN,    1e300,   -INFINITY, 9.3e18};
                return special[below(std::size(special))];
            }
        }
    }
    /// Finite, with an absolute value of at most a million and few binary digits.
    double number() { return provider.ConsumeIntegralInRange<int>(-1000000, 1000000) / 16.0; }

private:
    FuzzedDataProvider provider;
};

}  // namespace fuzz

#endif
