// tests/support/random.h: the same random inputs in every run.

#ifndef TARN_TESTS_SUPPORT_RANDOM_H
#define TARN_TESTS_SUPPORT_RANDOM_H

#include <cmath>
#include <cstdint>
#include <cstring>
#include <random>
#include <string>

namespace tests {

inline std::uint64_t bits(double d) {
    std::uint64_t result;
    std::memcpy(&result, &d, sizeof result);
    return result;
}

inline double fromBits(std::uint64_t b) {
    double result;
    std::memcpy(&result, &b, sizeof result);
    return result;
}

class Random {
public:
    explicit Random(std::uint64_t seed) : engine(seed) {}

    std::uint64_t word() { return engine(); }

    /// From 0 to `end` - 1.
    std::size_t below(std::size_t end) { return static_cast<std::size_t>(engine() % end); }

    bool chance() { return below(2) == 0; }

    /// Any magnitude, sign and kind: ties in formatting, round numbers, random bits.
    double anyDouble() {
        switch (below(6)) {
            case 0: return fromBits(word());
            case 1:
                return static_cast<double>(static_cast<std::int64_t>(below(4000000)) - 2000000) /
                       8.0;
            case 2:
                return static_cast<double>(static_cast<std::int64_t>(below(400000)) - 200000) /
                       100.0;
            case 3:
                return std::ldexp(static_cast<double>(word() >> 11), -static_cast<int>(below(80)));
            case 4: return std::pow(10.0, static_cast<double>(below(309)));
            default: {
                double const special[] = {0.0,    -0.0,     1000.0,    -1000.0, 999.995, 0.005,
                                          -0.005, INFINITY, -INFINITY, NAN,     5e-324,  1e-310};
                return special[below(std::size(special))];
            }
        }
    }

    /// A number of moderate size, never a NaN.
    double number() {
        return static_cast<double>(static_cast<std::int64_t>(below(20001)) - 10000) / 16.0;
    }

    std::string text(std::size_t longest) {
        std::string result;
        for (std::size_t n = below(longest + 1); n > 0; --n) {
            result += static_cast<char>(word() & 0xff);
        }
        return result;
    }

private:
    std::mt19937_64 engine;
};

}  // namespace tests

#endif
