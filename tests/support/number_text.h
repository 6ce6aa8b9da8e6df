// tests/support/number_text.h: formats numbers with exact decimal arithmetic.
//
//     modelNumberText(2.5, '.', '.');  // "2.5"

#ifndef TARN_TESTS_SUPPORT_NUMBER_TEXT_H
#define TARN_TESTS_SUPPORT_NUMBER_TEXT_H

#include <cfenv>
#include <string>

namespace tests {

/// `formatted` is the decimal point in the formatted number, `trimmed` the one after which trailing
/// zeros are removed. Rounds according to `roundingMode`, by default to the nearest with ties to
/// even.
std::string modelNumberText(double number, char formatted, char trimmed,
                            int roundingMode = FE_TONEAREST);

}  // namespace tests

#endif
