#include <Engine/Base/detail/shortest_number.h>

#include <charconv>
#include <cmath>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <string_view>

namespace tarn::engine::detail {

namespace {

// The digits of the shortest decimal number that reads back to `number`, and the power of ten of
// the first of them.
struct Shortest {
    std::string digits;
    int exponent = 0;
};

// From "-d.ddde-xx", with any decimal point.
Shortest taken(std::string_view scientific) {
    Shortest result;
    std::size_t const e = scientific.find('e');
    for (char c : scientific.substr(0, e)) {
        if (c >= '0' && c <= '9') result.digits += c;
    }
    result.exponent =
        static_cast<int>(std::strtol(std::string(scientific.substr(e + 1)).c_str(), nullptr, 10));
    return result;
}

// For a finite number.
Shortest shortest(double number) {
    char buffer[64];
#if defined(__cpp_lib_to_chars)
    auto const end = std::to_chars(buffer, std::end(buffer), number, std::chars_format::scientific);
    return taken({buffer, static_cast<std::size_t>(end.ptr - buffer)});
#else
    for (int digits = 1;; ++digits) {
        std::snprintf(buffer, sizeof buffer, "%.*e", digits - 1, number);
        if (digits == 17 || std::strtod(buffer, nullptr) == number) return taken(buffer);
    }
#endif
}

}  // namespace

void appendShortest(std::string& text, double number) {
    if (std::signbit(number)) text += '-';
    auto [digits, exponent] = shortest(std::abs(number));
    auto const count = static_cast<int>(digits.size());
    if (exponent < -6 || exponent >= 21) {
        if (count > 1) digits.insert(1, ".");
        text += digits + "e" + std::to_string(exponent);
    } else if (exponent < 0) {
        text += "0." + std::string(static_cast<std::size_t>(-exponent) - 1, '0') + digits;
    } else {
        if (count <= exponent)
            digits.append(static_cast<std::size_t>(exponent) + 1 - digits.size(), '0');
        if (count > exponent + 1) digits.insert(static_cast<std::size_t>(exponent) + 1, ".");
        text += digits;
    }
}

}  // namespace tarn::engine::detail
