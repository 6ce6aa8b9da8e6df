// tests/support/locales.h: sets other decimal points, and restores the usual one.

#ifndef TARN_TESTS_SUPPORT_LOCALES_H
#define TARN_TESTS_SUPPORT_LOCALES_H

#include <clocale>
#include <iostream>
#include <locale>
#include <string>

namespace tests {

/// While it lives, `std::cout`'s locale has this decimal point.
class CoutDecimalPoint {
public:
    explicit CoutDecimalPoint(char point)
        : previous(std::cout.imbue(std::locale(std::cout.getloc(), new Punctuation(point)))) {}
    ~CoutDecimalPoint() { std::cout.imbue(previous); }
    CoutDecimalPoint(CoutDecimalPoint const&) = delete;
    CoutDecimalPoint& operator=(CoutDecimalPoint const&) = delete;

private:
    struct Punctuation : std::numpunct<char> {
        explicit Punctuation(char decimalPoint) : point(decimalPoint) {}
        char do_decimal_point() const override { return point; }
        char point;
    };
    std::locale previous;
};

/// While it lives, the C library writes and reads numbers with a decimal comma.
class CLocaleWithComma {
public:
    CLocaleWithComma() {
        for (char const* name : {"de_DE.UTF-8", "German_Germany.1252"}) {
            set = set || std::setlocale(LC_NUMERIC, name) != nullptr;
        }
    }
    ~CLocaleWithComma() { std::setlocale(LC_NUMERIC, "C"); }
    CLocaleWithComma(CLocaleWithComma const&) = delete;
    CLocaleWithComma& operator=(CLocaleWithComma const&) = delete;

    /// The build of the tests generates the locale where the system has none.
    bool isSet() const { return set; }

private:
    bool set = false;
};

}  // namespace tests

#endif
