#include <Engine/Base/comparison.h>

#if defined(__FINITE_MATH_ONLY__) && __FINITE_MATH_ONLY__
#error "The library itself is not to be compiled with -ffast-math or -ffinite-math-only"
#endif

namespace tarn::engine::detail {

bool equalNumbersInLibrary(double a, double b) noexcept { return a == b; }
bool lessNumberInLibrary(double a, double b) noexcept { return a < b; }

}  // namespace tarn::engine::detail
