#include "bench.h"

#include <Engine/Base/value.h>

#include <fmt/format.h>

#include <QString>

#include <charconv>
#include <cstdio>
#include <random>
#include <vector>

using namespace tarn::engine;

void bench::texts() {
    static std::vector<double> const numbers = [] {
        std::mt19937_64 random(14);
        std::vector<double> list;
        for (int i = 0; i < 10000; ++i) {
            list.push_back(std::uniform_real_distribution<double>(-999.0, 999.0)(random));
        }
        return list;
    }();
    auto const withSnprintf = [](double d) {
        char text[128];
        int const length = std::snprintf(text, sizeof text, "%.2f", d);
        return std::string(text, static_cast<std::size_t>(length));
    };
    auto const trimmed = [](std::string text) {
        while (text.back() == '0') text.pop_back();
        if (text.back() == '.') text.pop_back();
        return text == "-0" ? std::string("0") : text;
    };
    auto const withToChars = [](double d) {
        char text[128];
        return std::string(text,
                           std::to_chars(text, text + 128, d, std::chars_format::fixed, 2).ptr);
    };
    auto const withFmt = [](double d) { return fmt::format("{:.2f}", d); };
    for (double d : numbers) {
        agree(to_string(Value(d)) == trimmed(withSnprintf(d)) &&
                  withSnprintf(d) == withToChars(d) && withSnprintf(d) == withFmt(d) &&
                  QString::number(d, 'f', 2).toStdString() == withSnprintf(d),
              "texts of numbers");
    }
    auto const all = [](auto make) {
        return [make](std::vector<double> const& list) {
            std::size_t sum = 0;
            for (double d : list) sum += static_cast<std::size_t>(make(d).size());
            return sum;
        };
    };
    std::string const name = "text of 10,000 numbers";
    measureOn(name, "ours", numbers, all([](double d) { return to_string(Value(d)); }));
    measureOn(name, "std::to_chars", numbers, all(withToChars));
    measureOn(name, "snprintf", numbers, all(withSnprintf));
    measureOn(name, "fmt", numbers, all(withFmt));
    measureOn(name, "QString::number", numbers,
              all([](double d) { return QString::number(d, 'f', 2); }));
    target(name, 0.9);
}
