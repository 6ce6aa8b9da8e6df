#include "support/number_text.h"

#include "support/random.h"

#include <algorithm>
#include <cstdint>

namespace tests {

namespace {

// mantissa * 2^exponent as decimal digits, for an exponent of 0 or more.
std::string wholeDigits(std::uint64_t mantissa, int exponent) {
    std::string reversed;
    for (; mantissa != 0; mantissa /= 10) reversed += static_cast<char>('0' + mantissa % 10);
    for (; exponent > 0; --exponent) {
        int carry = 0;
        for (char& digit : reversed) {
            int const doubled = 2 * (digit - '0') + carry;
            digit = static_cast<char>('0' + doubled % 10);
            carry = doubled / 10;
        }
        if (carry != 0) reversed += static_cast<char>('0' + carry);
    }
    std::reverse(reversed.begin(), reversed.end());
    return reversed;
}

enum class Rounding { ToNearest, AwayFromZero, TowardsZero };

Rounding roundingOf([[maybe_unused]] bool negative, int mode) {
#if defined(FE_UPWARD)
    if (mode == FE_UPWARD) return negative ? Rounding::TowardsZero : Rounding::AwayFromZero;
#endif
#if defined(FE_DOWNWARD)
    if (mode == FE_DOWNWARD) return negative ? Rounding::AwayFromZero : Rounding::TowardsZero;
#endif
    return mode == FE_TONEAREST ? Rounding::ToNearest : Rounding::TowardsZero;
}

// mantissa * scale / 2^shift, rounded to an integer; to the nearest with ties to even.
std::uint64_t roundedQuotient(std::uint64_t mantissa, std::uint64_t scale, int shift,
                              Rounding rounding) {
    std::uint64_t const product = mantissa * scale;  // Below 2^60.
    if (shift > 62) return rounding == Rounding::AwayFromZero && product != 0 ? 1 : 0;
    std::uint64_t const quotient = product >> shift;
    std::uint64_t const rest = product - (quotient << shift);
    std::uint64_t const half = std::uint64_t(1) << (shift - 1);
    bool const up = rounding == Rounding::ToNearest
                        ? rest > half || (rest == half && quotient % 2 == 1)
                        : rounding == Rounding::AwayFromZero && rest != 0;
    return quotient + (up ? 1 : 0);
}

}  // namespace

std::string modelNumberText(double number, char formatted, char trimmed, int roundingMode) {
    std::uint64_t const all = bits(number);
    bool const negative = (all >> 63) != 0;
    int const biased = static_cast<int>(all >> 52 & 0x7ff);
    std::uint64_t const fraction = all & 0xfffffffffffff;
    std::string text = negative ? "-" : "";
    if (biased == 0x7ff) return text + (fraction != 0 ? "nan" : "inf");

    std::uint64_t const mantissa = biased == 0 ? fraction : fraction | std::uint64_t(1) << 52;
    int const exponent = (biased == 0 ? 1 : biased) - 1075;
    // 1000.0 is 0x408f400000000000; the order of magnitudes is that of their bits.
    std::size_t const decimals = (all << 1 >> 1) >= 0x408f400000000000 ? 1 : 2;

    std::string digits;
    if (exponent >= 0) {
        digits = wholeDigits(mantissa, exponent) + std::string(decimals, '0');
    } else {
        digits = std::to_string(roundedQuotient(mantissa, decimals == 1 ? 10 : 100, -exponent,
                                                roundingOf(negative, roundingMode)));
        if (digits.size() <= decimals) digits.insert(0, decimals + 1 - digits.size(), '0');
    }
    digits.insert(digits.size() - decimals, 1, formatted);
    text = (text + digits).substr(0, 127);

    if (text.find(trimmed) != std::string::npos) {
        while (text.back() == '0') text.pop_back();
        if (text.back() == trimmed) text.pop_back();
    }
    return text == "-0" ? "0" : text;
}

}  // namespace tests
