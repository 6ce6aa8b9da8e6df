#include "bench.h"

#include <Engine/Base/value.h>

#include <fmt/format.h>

#include <QString>

#include <charconv>
#include <cmath>
#include <cstdio>
#include <random>
#include <string>
#include <vector>

using namespace tarn::engine;

namespace {

// As in an editor: a third of them above 1000, where numbers have one decimal.
std::vector<double> numbers() {
    std::mt19937_64 random(14);
    std::uniform_real_distribution<double> small(-999.0, 999.0);
    std::uniform_real_distribution<double> large(1000.0, 100000.0);
    std::vector<double> list;
    for (int i = 0; i < 10000; ++i) list.push_back(i % 3 == 0 ? large(random) : small(random));
    return list;
}

int decimalsOf(double d) { return std::abs(d) >= 1000.0 ? 1 : 2; }

std::string withSnprintf(double d) {
    char text[128];
    int const length = std::snprintf(text, sizeof text, "%.*f", decimalsOf(d), d);
    return std::string(text, static_cast<std::size_t>(length));
}

std::string withToChars(double d) {
    char text[128];
    auto const end = std::to_chars(text, text + 128, d, std::chars_format::fixed, decimalsOf(d));
    return std::string(text, end.ptr);
}

std::string withFmt(double d) { return fmt::format("{:.{}f}", d, decimalsOf(d)); }

QString withQt(double d) { return QString::number(d, 'f', decimalsOf(d)); }

std::string trimmed(std::string text) {
    while (text.back() == '0') text.pop_back();
    if (text.back() == '.') text.pop_back();
    return text == "-0" ? std::string("0") : text;
}

template <class Make>
bench::Implementation all(Make make) {
    return bench::on(numbers, [make](std::vector<double> const& list) {
        std::size_t sum = 0;
        for (double const d : list) sum += static_cast<std::size_t>(make(d).size());
        return sum;
    });
}

}  // namespace

void bench::toString() {
    agreement([] {
        for (double const d : numbers()) {
            agree(to_string(Value(d)) == trimmed(withSnprintf(d)) &&
                      withSnprintf(d) == withToChars(d) && withSnprintf(d) == withFmt(d) &&
                      withQt(d).toStdString() == withSnprintf(d),
                  "strings of numbers");
        }
    });
    operation("to_string of 10,000 numbers")
        .ours(all([](double d) { return to_string(Value(d)); }))
        .peer("std::to_chars", all(withToChars))
        .peer("snprintf", all(withSnprintf))
        .peer("fmt", all(withFmt))
        .peer("QString::number", all(withQt))
        .atMost(0.75, "std::to_chars")
        .quick();
    auto const append = [](std::vector<double> const& list) {
        std::string text;
        for (double const d : list) appendText(text, d);
        return text;
    };
    auto const join = [](std::vector<double> const& list) {
        std::string text;
        for (double const d : list) text += to_string(Value(d));
        return text;
    };
    operation("appendText of 10,000 numbers")
        .ours(on(numbers, append))
        .peer("to_string", on(numbers, join))
        .atMost(1.0);
}
