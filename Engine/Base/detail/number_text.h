// Engine/Base/detail/number_text.h: appends numbers to a string in the form that people read.
//
//     appendNumber(text, 2.50);  // "2.5"

#ifndef TARN_ENGINE_BASE_DETAIL_NUMBER_TEXT_H
#define TARN_ENGINE_BASE_DETAIL_NUMBER_TEXT_H

#include <cstdint>
#include <string>

namespace tarn::engine::detail {

/// Formats like the C library's "%.1f" from 1000.0 on and "%.2f" below, without trailing zeros.
/// Non-finite numbers are "nan" or "inf" with their sign, on every platform.
void appendNumber(std::string& text, double number);

/// Appends all digits, after a "-" where negative.
void appendInteger(std::string& text, std::uint64_t magnitude, bool isNegative);

}  // namespace tarn::engine::detail

#endif
