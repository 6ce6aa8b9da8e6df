// Engine/Base/detail/truncate.h: converts doubles to integers without undefined behaviour.
//
//     long long i = truncate<long long>(-2.9);  // -2

#ifndef TARN_ENGINE_BASE_DETAIL_TRUNCATE_H
#define TARN_ENGINE_BASE_DETAIL_TRUNCATE_H

#include <cmath>
#include <limits>

namespace tarn::engine::detail {

/// Truncates `d` towards zero and clamps it to the range of the type; a NaN is 0.
template <class Integer>
Integer truncate(double d) {
    using Limits = std::numeric_limits<Integer>;
    if (std::isnan(d)) return 0;
    // Converted to a double, the maximum is rounded up to the power of two just out of range.
    if (d >= static_cast<double>(Limits::max())) return Limits::max();
    if (d <= static_cast<double>(Limits::min())) return Limits::min();
    return static_cast<Integer>(d);
}

}  // namespace tarn::engine::detail

#endif
