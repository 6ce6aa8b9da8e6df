#include <Engine/Base/detail/shortest_number.h>

#include <charconv>
#include <cmath>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <iterator>

namespace tarn::engine::detail {

namespace {

// Writes "d.ddde-xx", with any decimal point: the shortest representation of `number`, which is not
// negative, that converts back to it. Returns the end.
char* writeScientific(char (&buffer)[64], double number) {
#if defined(__cpp_lib_to_chars)
    return std::to_chars(buffer, std::end(buffer), number, std::chars_format::scientific).ptr;
#else
    for (int digits = 1;; ++digits) {
        int const length = std::snprintf(buffer, sizeof buffer, "%.*e", digits - 1, number);
        if (digits == 17 || std::strtod(buffer, nullptr) == number) return buffer + length;
    }
#endif
}

}  // namespace

void appendShortest(std::string& text, double number) {
    if (std::signbit(number)) text += '-';
    char scientific[64];
    char* const end = writeScientific(scientific, std::abs(number));
    char digits[32];
    std::size_t count = 0;
    char const* c = scientific;
    for (; *c != 'e'; ++c) {
        if (*c >= '0' && *c <= '9') digits[count++] = *c;
    }
    bool const isBelowOne = *++c == '-';
    int exponent = 0;  // The decimal exponent of the first digit.
    for (++c; c != end; ++c) exponent = exponent * 10 + (*c - '0');
    if (isBelowOne) exponent = -exponent;

    if (exponent < -6 || exponent >= 21) {
        text += digits[0];
        if (count > 1) (text += '.').append(digits + 1, count - 1);
        (text += 'e') += std::to_string(exponent);
    } else if (exponent < 0) {
        text.append("0.")
            .append(static_cast<std::size_t>(-exponent) - 1, '0')
            .append(digits, count);
    } else {
        std::size_t const whole = static_cast<std::size_t>(exponent) + 1;
        if (count <= whole) {
            text.append(digits, count).append(whole - count, '0');
        } else {
            text.append(digits, whole).append(1, '.').append(digits + whole, count - whole);
        }
    }
}

}  // namespace tarn::engine::detail
