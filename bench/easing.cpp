#include "bench.h"

#include <Engine/Base/easing.h>

#include <QEasingCurve>

#include <array>
#include <cmath>
#include <variant>
#include <vector>

using namespace tarn::engine;

namespace {

using EF = EasingFunction;

constexpr int kSteps = 1000;
constexpr std::array<EF, 13> kAll{EF::Linear,           EF::QuadraticIn,   EF::QuadraticOut,
                                  EF::QuadraticInOut,   EF::CubicIn,       EF::CubicOut,
                                  EF::CubicInOut,       EF::ExponentialIn, EF::ExponentialOut,
                                  EF::ExponentialInOut, EF::SinusoidalIn,  EF::SinusoidalOut,
                                  EF::SinusoidalInOut};
constexpr std::array<EF, 4> kPolynomials{EF::Linear, EF::QuadraticIn, EF::QuadraticOut,
                                         EF::QuadraticInOut};
constexpr std::array<EF, 3> kCubics{EF::CubicIn, EF::CubicOut, EF::CubicInOut};

// The formulas inlined into the caller's code: the fastest possible.
inline double inlined(EF f, double a, double b, double t) {
    double const d = b - a;
    double const u = 2 * t;
    double const v = u - 1;
    auto const in = [](double x) {
        return (std::exp2((x - 1) * 10) - 0.0009765625) / 0.9990234375;
    };
    auto const out = [](double x) { return 1 - std::exp2(x * -10); };
    switch (f) {
        case EF::Linear: return a + d * t;
        case EF::QuadraticIn: return a + d * t * t;
        case EF::QuadraticOut: return a - (t - 2) * (d * t);
        case EF::QuadraticInOut:
            return u < 1 ? a + u * u * (d * 0.5) : a + ((v - 2) * v - 1) * (d * -0.5);
        case EF::CubicIn: return a + std::pow(t, 3.0) * d;
        case EF::CubicOut: return a + (std::pow(t - 1, 3.0) + 1) * d;
        case EF::CubicInOut:
            return u < 1 ? a + std::pow(u, 3.0) * (d * 0.5)
                         : a + (std::pow(u - 2, 3.0) + 2) * (d * 0.5);
        case EF::ExponentialIn: return t == 0 ? a : a + in(t)*d;
        case EF::ExponentialOut: return t == 1 ? b : a + out(t) * d * 1.0009775171065494;
        case EF::ExponentialInOut: {
            if (t == 0 || t == 1) return t == 0 ? a : b;
            double const m = d * 0.5 + a;
            return u < 1 ? a + in(u) * (m - a) : out(v) * (b - m) * 1.0009775171065494 + m;
        }
        case EF::SinusoidalIn: return a + (d - std::cos(t * 1.5707963267948966) * d);
        case EF::SinusoidalOut: return a + std::sin(t * 1.5707963267948966) * d;
        case EF::SinusoidalInOut: return a + (std::cos(t * 3.141592653589793) - 1) * (d * -0.5);
    }
    return a;
}

inline FloatVec4 inlined(EF f, FloatVec4 a, FloatVec4 b, double t) {
    // Computes the factor once, from the curve from 0 to 1.
    double const x = inlined(f, 0.0, 1.0, t);
    return {a.x + x * (b.x - a.x), a.y + x * (b.y - a.y), a.z + x * (b.z - a.z),
            a.w + x * (b.w - a.w)};
}

std::vector<double> const& progress() {
    static std::vector<double> const list = [] {
        std::vector<double> made;
        for (int i = 0; i <= kSteps; ++i) made.push_back(static_cast<double>(i) / kSteps);
        return made;
    }();
    return list;
}

template <class Curves, class Ease>
bench::Implementation over(Curves const& curves, Ease ease) {
    return bench::on(progress, [&curves, ease](std::vector<double> const& list) {
        double sum = 0.0;
        for (EF const f : curves) {
            for (double const t : list) sum += ease(f, t);
        }
        return sum;
    });
}

// Evaluates the curves at many points, in one call for each curve or point by point.
template <class T, class Curves>
void inOneCall(std::string const& name, Curves const& curves, T a, T b, double atMost) {
    auto const oneByOne = [&curves, a, b](std::vector<double> const& list) {
        std::vector<T> results(list.size());
        for (EF const f : curves) {
            for (std::size_t i = 0; i < list.size(); ++i) results[i] = ease(f, a, b, list[i]);
            benchmark::DoNotOptimize(results.data());
        }
        return results;
    };
    auto const atOnce = [&curves, a, b](std::vector<double> const& list) {
        std::vector<T> results(list.size());
        for (EF const f : curves) {
            easeEach(f, a, b, list.data(), list.size(), results.data());
            benchmark::DoNotOptimize(results.data());
        }
        return results;
    };
    bench::agreement(
        [=] { bench::agree(oneByOne(progress()) == atOnce(progress()), "easing in one call"); });
    bench::operation(name)
        .ours(bench::on(progress, atOnce))
        .peer("one by one", bench::on(progress, oneByOne))
        .atMost(atMost);
}

using Small = std::variant<long long, double, FloatVec2, FloatVec3, FloatVec4, bool>;

Small dispatched(EF f, Small const& from, Small const& to, double t) {
    switch (to.index()) {
        case 1: return inlined(f, std::get<double>(from), std::get<double>(to), t);
        case 4: return inlined(f, std::get<FloatVec4>(from), std::get<FloatVec4>(to), t);
        default: return 0.0;
    }
}

}  // namespace

void bench::easing() {
    agreement([] {
        for (EF const f : kAll) {
            for (double const t : progress()) {
                agree(ease(f, 3.0, 7.0, t) == inlined(f, 3.0, 7.0, t), "easing");
            }
        }
    });
    static QEasingCurve const curves[] = {
        QEasingCurve::Linear,     QEasingCurve::InQuad,  QEasingCurve::OutQuad,
        QEasingCurve::InOutQuad,  QEasingCurve::InCubic, QEasingCurve::OutCubic,
        QEasingCurve::InOutCubic, QEasingCurve::InExpo,  QEasingCurve::OutExpo,
        QEasingCurve::InOutExpo,  QEasingCurve::InSine,  QEasingCurve::OutSine,
        QEasingCurve::InOutSine};
    auto const ours = [](EF f, double t) { return ease(f, 3.0, 7.0, t); };
    auto const limit = [](EF f, double t) { return inlined(f, 3.0, 7.0, t); };
    auto const qt = [](EF f, double t) {
        return 3.0 + 4.0 * curves[static_cast<int>(f)].valueForProgress(t);
    };
    std::string const formulas = "inlined formulas";
    operation("ease 13,000 doubles, all curves")
        .ours(over(kAll, ours))
        .peer(formulas, over(kAll, limit))
        .peer("QEasingCurve", over(kAll, qt))
        .atMost(1.3, formulas)
        .quick();
    operation("ease 3,000 doubles, cubics")
        .ours(over(kCubics, ours))
        .peer(formulas, over(kCubics, limit))
        .peer("QEasingCurve", over(kCubics, qt))
        .atMost(1.2, formulas);
    FloatVec4 const a{1, 2, 3, 4};
    FloatVec4 const b{5, 7, 9, 11};
    operation("ease 13,000 FloatVec4")
        .ours(over(kAll, [=](EF f, double t) { return ease(f, a, b, t).w; }))
        .peer(formulas, over(kAll, [=](EF f, double t) { return inlined(f, a, b, t).w; }))
        .atMost(1.5)
        .quick();
    inOneCall("easeEach of 4,000 doubles, linear and quadratic", kPolynomials, 3.0, 7.0, 0.35);
    inOneCall("easeEach of 13,000 doubles, all curves", kAll, 3.0, 7.0, 1.0);
    inOneCall("easeEach of 4,000 FloatVec4, linear and quadratic", kPolynomials, a, b, 1.0);
    operation("easeEach of 4,000 doubles, linear and quadratic").quick();
    static Value const from = 3.0;
    static Value const to = 7.0;
    static Small const smallFrom = 3.0;
    static Small const smallTo = 7.0;
    operation("ease 13,000 values of doubles")
        .ours(over(kAll, [](EF f, double t) { return double(ease(f, from, to, t)); }))
        .peer("std::variant and a switch",
              over(kAll,
                   [](EF f, double t) {
                       return std::get<double>(dispatched(f, smallFrom, smallTo, t));
                   }))
        .atMost(2.0);
}
