// An easing curve as a path.
//
//     std::cout << svgPathData(curve(EasingFunction::CubicOut, 100.0));

#ifndef EXAMPLES_CURVE_H
#define EXAMPLES_CURVE_H

#include <Engine/Base/easing.h>
#include <Engine/Base/path.h>

#include <cmath>
#include <utility>

// The range of progress that is shown: from 0 to 1, and a quarter before and after.
constexpr double kCurveStart = -0.25;
constexpr double kCurveEnd = 1.25;

// Line segments, `size` wide and high from progress 0 to 1, upwards from the origin, with
// coordinates rounded to hundredths.
inline tarn::engine::Path curve(tarn::engine::EasingFunction function, double size) {
    constexpr int kSteps = 90;
    auto const shown = [](double coordinate) { return std::round(coordinate * 100.0) / 100.0; };
    tarn::engine::PathBuilder builder;
    for (int i = 0; i <= kSteps; ++i) {
        double const t = kCurveStart + (kCurveEnd - kCurveStart) * i / kSteps;
        tarn::engine::FloatVec2 const p{shown(t * size),
                                        shown(-tarn::engine::ease(function, 0.0, size, t))};
        if (i == 0)
            builder.moveTo(p);
        else
            builder.lineTo(p);
    }
    return std::move(builder).build();
}

#endif
