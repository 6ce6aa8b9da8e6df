// Points of curves, computed without the library.

#ifndef TESTS_SUPPORT_CURVES_H
#define TESTS_SUPPORT_CURVES_H

#include <Engine/Base/points.h>

namespace tests {

// The point at `t` of the cubic curve from `from` with the points of a `curveTo`.
inline tarn::engine::FloatVec2 pointOfCurve(tarn::engine::FloatVec2 from,
                                            tarn::engine::Points const& p, double t) {
    double const s = 1 - t;
    auto const at = [&](double a, double b, double c, double d) {
        return s * s * s * a + 3 * s * s * t * b + 3 * s * t * t * c + t * t * t * d;
    };
    return {at(from.x, p[0].x, p[1].x, p[2].x), at(from.y, p[0].y, p[1].y, p[2].y)};
}

}  // namespace tests

#endif
