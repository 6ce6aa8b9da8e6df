// Engine/Base/comparison.h: comparisons of doubles that ignore the caller's compiler flags.
//
//     bool equal = detail::equalNumbers(0.0, -0.0);  // True; false for a NaN.

#ifndef TARN_ENGINE_BASE_COMPARISON_H
#define TARN_ENGINE_BASE_COMPARISON_H

#include <Engine/Base/export.h>

namespace tarn::engine::detail {

// `a == b` and `a < b`, compiled into the library, where NaNs always compare correctly.
TARN_API bool equalNumbersInLibrary(double a, double b) noexcept;
TARN_API bool lessNumberInLibrary(double a, double b) noexcept;

#if defined(__FINITE_MATH_ONLY__) && __FINITE_MATH_ONLY__
// With `-ffinite-math-only` the compiler assumes that there are no NaNs, so an inline comparison
// could call a NaN equal or smaller. Constant expressions are not affected.
constexpr bool equalNumbers(double a, double b) noexcept {
    return __builtin_is_constant_evaluated() ? a == b : equalNumbersInLibrary(a, b);
}
constexpr bool lessNumber(double a, double b) noexcept {
    return __builtin_is_constant_evaluated() ? a < b : lessNumberInLibrary(a, b);
}
#else
constexpr bool equalNumbers(double a, double b) noexcept { return a == b; }
constexpr bool lessNumber(double a, double b) noexcept { return a < b; }
#endif

}  // namespace tarn::engine::detail

#endif
