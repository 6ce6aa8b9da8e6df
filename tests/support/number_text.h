// tests/support/number_text.h: the text of a number, worked out in decimal digits by hand.
//
//     modelNumberText(2.5, '.', '.');  // "2.5"

#ifndef TARN_TESTS_SUPPORT_NUMBER_TEXT_H
#define TARN_TESTS_SUPPORT_NUMBER_TEXT_H

#include <cfenv>
#include <string>

namespace tests {

/// `formatted` is the decimal point that the number is written with, `trimmed` the one that
/// trailing zeros are looked for behind. Rounds as `roundingMode` says, to the nearest
/// with ties to even.
std::string modelNumberText(double number, char formatted, char trimmed,
                            int roundingMode = FE_TONEAREST);

}  // namespace tests

#endif
