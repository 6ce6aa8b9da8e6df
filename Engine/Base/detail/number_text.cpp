#include <Engine/Base/detail/number_text.h>

#include <Engine/Base/detail/immortal.h>
#include <Engine/Base/detail/radix_point.h>

#include <cfenv>
#include <cmath>
#include <cstddef>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <string_view>
#if !defined(TARN_ENGINE_BASE_CLASSIC_LOCALE)
#include <iostream>
#include <locale>
#endif

namespace tarn::engine::detail {

namespace {

// The result of "%.f" for negative zero.
std::string const& negativeZero() {
    static Immortal<std::string> const text([] {
        char buffer[16];
        std::snprintf(buffer, sizeof buffer, "%.f", -0.0);
        return std::string(buffer);
    }());
    return text.value;
}

// Whether the rounding mode is to nearest: in any other mode the two sums differ. Calling
// `fegetround` instead took a tenth of the time of formatting a number.
bool roundsToNearest() {
    double const volatile tiny = 0x1p-60;
    return 1.0 + tiny == 1.0 - tiny;
}

// From here on doubles have no fraction; below, one decimal still fits into 64 bits.
constexpr double kTwo52 = 4503599627370496.0;

// The magnitude of `d` times `scale` as an integer, rounded like the C library: in the current
// rounding mode, ties to even when it is to nearest. Exact for |d| < 2^52 and a scale of at most
// 100: the mantissa times the scale fits into 64 bits.
std::uint64_t roundedMultiple(double d, std::uint64_t scale) {
    std::uint64_t bits = 0;
    std::memcpy(&bits, &d, sizeof bits);
    int const biased = static_cast<int>(bits >> 52 & 0x7ff);
    std::uint64_t const fraction = bits & 0xfffffffffffff;
    std::uint64_t const mantissa = biased == 0 ? fraction : fraction | std::uint64_t(1) << 52;
    int const shift = 1075 - (biased == 0 ? 1 : biased);  // At least 1, for a number below 2^52.
    std::uint64_t const product = mantissa * scale;       // Below 2^60.
    // From 62 on, `whole` is 0 and the rest is less than one half.
    std::uint64_t const whole = shift < 62 ? product >> shift : 0;
    std::uint64_t const rest = shift < 62 ? product - (whole << shift) : product;
    std::uint64_t const half = std::uint64_t(1) << (shift < 62 ? shift - 1 : 61);
    [[maybe_unused]] bool const negative = bits >> 63 != 0;
    if (rest == 0) return whole;
    std::uint64_t const nearest = whole + (rest > half || (rest == half && whole % 2 != 0) ? 1 : 0);
    if (roundsToNearest()) return nearest;
    switch (std::fegetround()) {
#if defined(FE_UPWARD)
        case FE_UPWARD: return negative ? whole : whole + 1;
#endif
#if defined(FE_DOWNWARD)
        case FE_DOWNWARD: return negative ? whole + 1 : whole;
#endif
#if defined(FE_TOWARDZERO)
        case FE_TOWARDZERO: return whole;
#endif
        default: return nearest;
    }
}

// Writes the digits of a number from the last to the first.
class Digits {
public:
    // The number is `multiple` divided by 10^`decimals`. `trimmed` leaves out trailing zeros, and
    // the point where no decimals remain.
    Digits(std::uint64_t multiple, int decimals, char const* point, bool trimmed, bool negative) {
        bool shown = !trimmed;
        for (; decimals > 0; --decimals, multiple /= 10) {
            shown = shown || multiple % 10 != 0;
            if (shown) *--begin = static_cast<char>('0' + multiple % 10);
        }
        if (shown) {
            std::size_t const length = std::strlen(point);
            begin -= length;
            std::memcpy(begin, point, length);
        }
        do {
            *--begin = static_cast<char>('0' + multiple % 10);
            multiple /= 10;
        } while (multiple != 0);
        if (negative) *--begin = '-';
    }
    // Valid until this is destroyed.
    std::string_view text() const {
        return {begin, static_cast<std::size_t>(std::end(buffer) - begin)};
    }

private:
    char buffer[48] = {};  // A sign, 20 digits, a point of a few bytes, two decimals.
    char* begin = buffer + sizeof buffer;
};

#if defined(TARN_ENGINE_BASE_CLASSIC_LOCALE)
// Configured without locales: nothing of streams or locales is linked.
constexpr char decimalPoint() { return '.'; }
#else
// The decimal point of `std::cout`'s locale. The classic locale, the usual case, takes a short
// path.
char decimalPoint() {
    std::locale const locale = std::cout.getloc();
    if (locale == std::locale::classic()) return '.';
    return std::use_facet<std::numpunct<char>>(locale).decimal_point();
}
#endif

// Removes trailing zeros, and a point that ends the string.
std::string_view trimmed(std::string_view text, char point) {
    if (std::size_t const position = text.find(point); position != std::string_view::npos) {
        while (text.size() > position + 1 && text.back() == '0') text.remove_suffix(1);
        if (text.size() == position + 1) text.remove_suffix(1);
    }
    return text == negativeZero() ? "0" : text;
}

}  // namespace

void appendNumber(std::string& text, double d) {
    char const point = decimalPoint();
    bool const isNegative = std::signbit(d);
    if (std::abs(d) < kTwo52) {
        RadixPoint const radix;
        bool const isUsual = point == '.' && radix.text[0] == '.' && radix.text[1] == '\0';
        int const decimals = std::abs(d) >= 1000.0 ? 1 : 2;
        std::uint64_t const multiple = roundedMultiple(d, decimals == 1 ? 10 : 100);
        bool const hasSign = isNegative && (multiple != 0 || !isUsual);
        Digits const digits(multiple, decimals, radix.text, isUsual, hasSign);
        text += isUsual ? digits.text() : trimmed(digits.text(), point);
    } else if (std::isfinite(d)) {
        char buffer[128];  // Deliberate: longer results are cut to 127 characters.
        std::snprintf(buffer, sizeof buffer, "%.1f", d);
        text += trimmed(buffer, point);
    } else {
        char const* const name = std::isnan(d) ? "-nan" : "-inf";
        text += trimmed(isNegative ? name : name + 1, point);
    }
}

void appendInteger(std::string& text, std::uint64_t magnitude, bool isNegative) {
    text += Digits(magnitude, 0, "", true, isNegative).text();
}

}  // namespace tarn::engine::detail
