// Checks that curves are finite, exact at their ends where the formulas are, and equal for scalars,
// vectors and values.

#include "fuzz.h"

#include <Engine/Base/easing.h>

using namespace fuzz;
using namespace tarn::engine;

namespace {

constexpr int kCurves = 13;

bool isPolynomial(EasingFunction function) {
    return static_cast<int>(function) <= static_cast<int>(EasingFunction::CubicInOut);
}

bool meetsItsEndExactly(EasingFunction function) {
    return isPolynomial(function) || function == EasingFunction::ExponentialOut ||
           function == EasingFunction::ExponentialInOut;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input input(data, size);
    auto const function = static_cast<EasingFunction>(input.below(kCurves));
    double const from[] = {input.anyDouble(), input.anyDouble(), input.anyDouble(),
                           input.anyDouble()};
    double const to[] = {input.anyDouble(), input.anyDouble(), input.anyDouble(),
                         input.anyDouble()};
    double const t = input.chance() ? input.anyDouble() : static_cast<double>(input.below(65)) / 64;

    double expected[4];
    for (int i = 0; i < 4; ++i) {
        expected[i] = ease(function, from[i], to[i], t);
        bool const moderate =
            std::fabs(from[i]) < 1e150 && std::fabs(to[i]) < 1e150 && t >= -8.0 && t <= 8.0;
        if (moderate) check(std::isfinite(expected[i]), "finite for finite input");
        if (std::isfinite(from[i]) && std::isfinite(to[i]) && std::isfinite(to[i] - from[i])) {
            check(ease(function, from[i], to[i], 0.0) == from[i], "exact at the start");
        }
    }
    double const a = input.number();
    double const b = input.number();
    if (meetsItsEndExactly(function)) check(ease(function, a, b, 1.0) == b, "exact at the end");

    auto const v2 = ease(function, FloatVec2{from[0], from[1]}, FloatVec2{to[0], to[1]}, t);
    check(same(v2.x, expected[0]) && same(v2.y, expected[1]), "two components");
    auto const v3 =
        ease(function, FloatVec3{from[0], from[1], from[2]}, FloatVec3{to[0], to[1], to[2]}, t);
    check(same(v3.x, expected[0]) && same(v3.y, expected[1]) && same(v3.z, expected[2]),
          "three components");
    auto const v4 = ease(function, FloatVec4{from[0], from[1], from[2], from[3]},
                         FloatVec4{to[0], to[1], to[2], to[3]}, t);
    check(same(v4.x, expected[0]) && same(v4.y, expected[1]) && same(v4.z, expected[2]) &&
              same(v4.w, expected[3]),
          "four components");
    if (function == EasingFunction::ExponentialInOut) {
        check(same(easeExponentialInOut(from[0], to[0], t), expected[0]), "by its own name");
    }

    Value const eased = ease(function, Value(from[0]), Value(to[0]), t);
    check(eased.type() == Type::Float && same(double(eased), expected[0]), "values of doubles");
    auto const i = static_cast<long long>(input.word());
    auto const j = static_cast<long long>(input.word());
    Value const whole = ease(function, Value(i), Value(j), t);
    check(whole.type() == Type::Int && static_cast<long long>(whole) == ease(function, i, j, t),
          "values of integers");
    return 0;
}
