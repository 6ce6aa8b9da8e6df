// Engine/Base/detail/number_text.h: numbers as people read them, at the end of a string.
//
//     appendNumber(text, 2.50);  // "2.5"

#ifndef TARN_ENGINE_BASE_DETAIL_NUMBER_TEXT_H
#define TARN_ENGINE_BASE_DETAIL_NUMBER_TEXT_H

#include <cstdint>
#include <string>

namespace tarn::engine::detail {

/// As the C library formats it with "%.1f" from 1000.0 on and with "%.2f" below, without the zeros
/// that end it. What is no finite number is "nan" or "inf" behind its sign, on every platform.
void appendNumber(std::string& text, double number);

/// All its digits, behind a sign where it is negative.
void appendInteger(std::string& text, std::uint64_t magnitude, bool isNegative);

}  // namespace tarn::engine::detail

#endif
