#include <Engine/Base/easing.h>

#include <Engine/Base/detail/truncate.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <ostream>
#include <type_traits>

namespace tarn::engine {

namespace {

constexpr std::array<char const*, 13> kNames{
    "Linear",        "Quadratic In",   "Quadratic Out",    "Quadratic In-Out", "Cubic In",
    "Cubic Out",     "Cubic In-Out",   "Exponential In",   "Exponential Out",  "Exponential In-Out",
    "Sinusoidal In", "Sinusoidal Out", "Sinusoidal In-Out"};
static_assert(kNames.size() == std::size_t(EasingFunction::SinusoidalInOut) + 1);

// The unscaled rising half starts at 2^-10, and the falling half ends at 1 - 2^-10; these rescale
// them to 0 and 1.
constexpr double kExponentialOffset = 0.0009765625;       // 2^-10
constexpr double kExponentialRange = 0.9990234375;        // 1 - 2^-10
constexpr double kExponentialScale = 1.0009775171065494;  // 1024 / 1023
constexpr double kExponent = 10.0;
constexpr double kHalfPi = 1.5707963267948966;
constexpr double kPi = 3.141592653589793;

double cube(double x) { return std::pow(x, 3.0); }

// Factors of the exponential curve: of its rising half, and of its falling half, which still has to
// be scaled by `kExponentialScale`.
double exponentialIn(double t) {
    return (std::exp2((t - 1.0) * kExponent) - kExponentialOffset) / kExponentialRange;
}
double exponentialOut(double t) { return 1.0 - std::exp2(t * -kExponent); }

// Factors of the remaining curves: the falling half of the quadratic one, and the sinusoidal ones
// without the sign.
double quadraticFalling(double v) { return (v - 2.0) * v - 1.0; }
double sinusoidalIn(double t) { return std::cos(t * kHalfPi); }
double sinusoidalInOut(double t) { return std::cos(t * kPi) - 1.0; }

// The start plus the factor times the distance.
auto part(double factor) {
    return [=](double a, double delta) { return a + factor * delta; };
}

// b - a, modulo 2^64.
long long difference(long long b, long long a) {
    return static_cast<long long>(static_cast<unsigned long long>(b) -
                                  static_cast<unsigned long long>(a));
}

// Evaluates `formula(a, delta)` for each component, with `a` the start and `delta` the distance to
// the end. What depends on progress alone is computed only once for all components.
template <class Formula>
double eachComponent(double from, double to, Formula const& formula) {
    return formula(from, to - from);
}
template <class Formula>
FloatVec2 eachComponent(FloatVec2 const& from, FloatVec2 const& to, Formula const& formula) {
    return {formula(from.x, to.x - from.x), formula(from.y, to.y - from.y)};
}
template <class Formula>
FloatVec3 eachComponent(FloatVec3 const& from, FloatVec3 const& to, Formula const& formula) {
    return {formula(from.x, to.x - from.x), formula(from.y, to.y - from.y),
            formula(from.z, to.z - from.z)};
}
template <class Formula>
FloatVec4 eachComponent(FloatVec4 const& from, FloatVec4 const& to, Formula const& formula) {
    return {formula(from.x, to.x - from.x), formula(from.y, to.y - from.y),
            formula(from.z, to.z - from.z), formula(from.w, to.w - from.w)};
}
template <class Formula>
long long eachComponent(long long from, long long to, Formula formula) {
    return detail::truncate<long long>(
        formula(static_cast<double>(from), static_cast<double>(difference(to, from))));
}

template <class T>
T exponentialInOut(T const& from, T const& to, double t) {
    T const middle =
        eachComponent(from, to, [](double a, double delta) { return delta * 0.5 + a; });
    double const u = 2.0 * t;
    if (u < 1.0) {
        if (u == 0.0) return from;
        return eachComponent(from, middle, part(exponentialIn(u)));
    }
    double const v = u - 1.0;
    if (v == 1.0) return to;
    double const factor = exponentialOut(v);
    return eachComponent(
        middle, to, [=](double a, double delta) { return factor * delta * kExponentialScale + a; });
}

template <EasingFunction function>
using Curve = std::integral_constant<EasingFunction, function>;

template <class T>
T easeAlong(EasingFunction function, T const& from, T const& to, double t) {
    double const u = 2.0 * t;
    switch (function) {
        case EasingFunction::Linear:
            return eachComponent(from, to, [=](double a, double delta) { return a + delta * t; });
        case EasingFunction::QuadraticIn:
            return eachComponent(from, to,
                                 [=](double a, double delta) { return a + delta * t * t; });
        case EasingFunction::QuadraticOut:
            return eachComponent(
                from, to, [=](double a, double delta) { return a - (t - 2.0) * (delta * t); });
        case EasingFunction::QuadraticInOut: {
            // Computes both halves without a branch, so that the compiler can vectorise.
            double const v = u - 1.0;
            double const rising = u * u;
            double const falling = quadraticFalling(v);
            double const factor = u < 1.0 ? rising : falling;
            double const half = u < 1.0 ? 0.5 : -0.5;
            return eachComponent(
                from, to, [=](double a, double delta) { return a + factor * (delta * half); });
        }
        case EasingFunction::CubicIn: return eachComponent(from, to, part(cube(t)));
        case EasingFunction::CubicOut: return eachComponent(from, to, part(cube(t - 1.0) + 1.0));
        case EasingFunction::CubicInOut: {
            double const factor = u < 1.0 ? cube(u) : cube(u - 2.0) + 2.0;
            return eachComponent(
                from, to, [=](double a, double delta) { return a + factor * (delta * 0.5); });
        }
        case EasingFunction::ExponentialIn: {
            if (t == 0.0) return from;
            return eachComponent(from, to, part(exponentialIn(t)));
        }
        case EasingFunction::ExponentialOut: {
            if (t == 1.0) return to;
            double const factor = exponentialOut(t);
            return eachComponent(from, to, [=](double a, double delta) {
                return a + factor * delta * kExponentialScale;
            });
        }
        case EasingFunction::ExponentialInOut: return exponentialInOut(from, to, t);
        case EasingFunction::SinusoidalIn: {
            double const factor = sinusoidalIn(t);
            return eachComponent(
                from, to, [=](double a, double delta) { return a + (delta - factor * delta); });
        }
        case EasingFunction::SinusoidalOut:
            return eachComponent(from, to, part(std::sin(t * kHalfPi)));
        case EasingFunction::SinusoidalInOut: {
            double const factor = sinusoidalInOut(t);
            return eachComponent(
                from, to, [=](double a, double delta) { return a + factor * (delta * -0.5); });
        }
    }
    return from;  // An undefined enumerator stays at the start.
}

// One curve, selected at compile time.
template <EasingFunction function, class T>
TARN_FLATTEN void easeEachAlong(T const& from, T const& to, double const* progress,
                                std::size_t count, T* results) {
    std::size_t i = 0;
    if constexpr (std::is_same_v<T, double>) {
        // Blocks of a constant size in local memory are vectorised.
        constexpr std::size_t kBlock = 32;
        for (; count - i >= kBlock; i += kBlock) {
            double block[kBlock];
            std::copy(progress + i, progress + i + kBlock, block);
            for (double& t : block) t = easeAlong(function, from, to, t);
            std::copy(block, block + kBlock, results + i);
        }
    }
    for (; i < count; ++i) results[i] = easeAlong(function, from, to, progress[i]);
}

template <class T>
void easeEachAlong(EasingFunction function, T const& from, T const& to, double const* progress,
                   std::size_t count, T* results) {
    using EF = EasingFunction;
    auto const along = [&](auto curve) {
        easeEachAlong<decltype(curve)::value>(from, to, progress, count, results);
    };
    switch (function) {
        case EF::Linear: return along(Curve<EF::Linear>());
        case EF::QuadraticIn: return along(Curve<EF::QuadraticIn>());
        case EF::QuadraticOut: return along(Curve<EF::QuadraticOut>());
        case EF::QuadraticInOut: return along(Curve<EF::QuadraticInOut>());
        case EF::CubicIn: return along(Curve<EF::CubicIn>());
        case EF::CubicOut: return along(Curve<EF::CubicOut>());
        case EF::CubicInOut: return along(Curve<EF::CubicInOut>());
        case EF::ExponentialIn: return along(Curve<EF::ExponentialIn>());
        case EF::ExponentialOut: return along(Curve<EF::ExponentialOut>());
        case EF::ExponentialInOut: return along(Curve<EF::ExponentialInOut>());
        case EF::SinusoidalIn: return along(Curve<EF::SinusoidalIn>());
        case EF::SinusoidalOut: return along(Curve<EF::SinusoidalOut>());
        case EF::SinusoidalInOut: return along(Curve<EF::SinusoidalInOut>());
    }
    std::fill(results, results + count, from);  // An undefined enumerator stays at the start.
}

}  // namespace

std::vector<std::string> easingFunctionNames() {
    return std::vector<std::string>(kNames.begin(), kNames.end());
}

Optional<EasingFunction> stringToEasingFunction(std::string const& name) {
    for (std::size_t i = 0; i < kNames.size(); ++i) {
        if (kNames[i] == name) return EasingFunction(i);
    }
    return std::nullopt;
}

std::ostream& operator<<(std::ostream& stream, EasingFunction function) {
    auto const i = static_cast<std::size_t>(function);
    if (i >= kNames.size()) return stream << "EasingFunction(" << int(function) << ")";
    return stream << kNames[i];
}

template <>
TARN_FLATTEN double ease(EasingFunction function, double from, double to, double t) {
    return easeAlong(function, from, to, t);
}
template <>
TARN_FLATTEN FloatVec2 ease(EasingFunction function, FloatVec2 from, FloatVec2 to, double t) {
    return easeAlong(function, from, to, t);
}
template <>
TARN_FLATTEN FloatVec3 ease(EasingFunction function, FloatVec3 from, FloatVec3 to, double t) {
    return easeAlong(function, from, to, t);
}
template <>
TARN_FLATTEN FloatVec4 ease(EasingFunction function, FloatVec4 from, FloatVec4 to, double t) {
    return easeAlong(function, from, to, t);
}

// The other overloads negate the difference. Here it is computed in the other order, which differs
// where it wraps around.
template <>
TARN_FLATTEN long long ease(EasingFunction function, long long from, long long to, double t) {
    double const a = static_cast<double>(from);
    double const delta = static_cast<double>(difference(to, from));
    double const back = static_cast<double>(difference(from, to));
    double const u = 2.0 * t;
    double const v = u - 1.0;
    if (function == EasingFunction::QuadraticOut) {
        return detail::truncate<long long>((t - 2.0) * (back * t) + a);
    }
    if (function == EasingFunction::QuadraticInOut && !(u < 1.0)) {
        return detail::truncate<long long>(a + quadraticFalling(v) * (back * 0.5));
    }
    if (function == EasingFunction::SinusoidalIn) {
        return detail::truncate<long long>(a + (delta + sinusoidalIn(t) * back));
    }
    if (function == EasingFunction::SinusoidalInOut) {
        return detail::truncate<long long>(a + sinusoidalInOut(t) * (back * 0.5));
    }
    return easeAlong(function, from, to, t);
}

template <>
void easeEach(EasingFunction function, double from, double to, double const* progress,
              std::size_t count, double* results) {
    easeEachAlong(function, from, to, progress, count, results);
}
template <>
void easeEach(EasingFunction function, long long from, long long to, double const* progress,
              std::size_t count, long long* results) {
    for (std::size_t i = 0; i < count; ++i) results[i] = ease(function, from, to, progress[i]);
}
template <>
void easeEach(EasingFunction function, FloatVec2 from, FloatVec2 to, double const* progress,
              std::size_t count, FloatVec2* results) {
    easeEachAlong(function, from, to, progress, count, results);
}
template <>
void easeEach(EasingFunction function, FloatVec3 from, FloatVec3 to, double const* progress,
              std::size_t count, FloatVec3* results) {
    easeEachAlong(function, from, to, progress, count, results);
}
template <>
void easeEach(EasingFunction function, FloatVec4 from, FloatVec4 to, double const* progress,
              std::size_t count, FloatVec4* results) {
    easeEachAlong(function, from, to, progress, count, results);
}

template <>
double easeExponentialInOut(double from, double to, double t) {
    return exponentialInOut(from, to, t);
}
template <>
long long easeExponentialInOut(long long from, long long to, double t) {
    return exponentialInOut(from, to, t);
}
template <>
FloatVec2 easeExponentialInOut(FloatVec2 from, FloatVec2 to, double t) {
    return exponentialInOut(from, to, t);
}
template <>
FloatVec3 easeExponentialInOut(FloatVec3 from, FloatVec3 to, double t) {
    return exponentialInOut(from, to, t);
}
template <>
FloatVec4 easeExponentialInOut(FloatVec4 from, FloatVec4 to, double t) {
    return exponentialInOut(from, to, t);
}

Value ease(EasingFunction function, Value from, Value to, double t) {
    switch (to.type()) {
        case Type::Float: return ease<double>(function, from, to, t);
        case Type::Vec2: return ease<FloatVec2>(function, from, to, t);
        case Type::Vec3: return ease<FloatVec3>(function, from, to, t);
        case Type::Vec4: return ease<FloatVec4>(function, from, to, t);
        case Type::Int: return ease<long long>(function, from, to, t);
        case Type::Mat4:
        case Type::Boolean:
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::Path:
        case Type::String:
        case Type::Model:
        case Type::Unstructured: break;
    }
    return Value();
}

}  // namespace tarn::engine
