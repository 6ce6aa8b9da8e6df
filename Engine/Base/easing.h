// Engine/Base/easing.h: easing curves between two numbers, vectors or values.
//
//     double y = ease(EasingFunction::CubicOut, 0.0, 100.0, 0.5);  // 87.5

#ifndef TARN_ENGINE_BASE_EASING_H
#define TARN_ENGINE_BASE_EASING_H

#include <Engine/Base/export.h>
#include <Engine/Base/optional.h>
#include <Engine/Base/value.h>

#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <string>
#include <type_traits>
#include <vector>

namespace tarn::engine {

/// The curves. Documents store the numbers.
enum class EasingFunction : std::int32_t {
    Linear = 0,
    QuadraticIn = 1,
    QuadraticOut = 2,
    QuadraticInOut = 3,
    CubicIn = 4,
    CubicOut = 5,
    CubicInOut = 6,
    ExponentialIn = 7,
    ExponentialOut = 8,
    ExponentialInOut = 9,
    SinusoidalIn = 10,
    SinusoidalOut = 11,
    SinusoidalInOut = 12,
};

/// The names that an editor shows, "Linear" to "Sinusoidal In-Out", indexed by enumerator. Returns
/// a new list at every call.
TARN_API std::vector<std::string> easingFunctionNames();

/// The inverse: the curve with this name, compared byte by byte. Empty for any other string.
TARN_API Optional<EasingFunction> stringToEasingFunction(std::string const& name);

/// Writes the name that an editor shows, or "EasingFunction(77)" for an undefined enumerator.
TARN_API std::ostream& operator<<(std::ostream& stream, EasingFunction function);

/// The point of the curve from `from` to `to` at `t`. `T` is `double`, `long long`, `FloatVec2`,
/// `FloatVec3` or `FloatVec4`; other types do not compile.
///
/// `t` is the progress: 0 at `from`, 1 at `to`. It is not clamped, so 1.5 overshoots. The
/// exponential curves are rescaled to pass through both ends. Their flat ends are exact: the in
/// curve at 0, the out curve at 1, the in-out curve at both. A NaN gives a NaN. An undefined
/// enumerator gives `from`.
///
/// Vectors are eased component by component. Integers are eased in double precision, truncated
/// towards zero and clamped to the range of `long long` (a NaN is 0); their difference wraps around
/// modulo 2^64.
template <class T>
T ease(EasingFunction function, T from, T to, double t) = delete;
template <>
TARN_API double ease<double>(EasingFunction, double, double, double);
template <>
TARN_API long long ease<long long>(EasingFunction, long long, long long, double);
template <>
TARN_API FloatVec2 ease<FloatVec2>(EasingFunction, FloatVec2, FloatVec2, double);
template <>
TARN_API FloatVec3 ease<FloatVec3>(EasingFunction, FloatVec3, FloatVec3, double);
template <>
TARN_API FloatVec4 ease<FloatVec4>(EasingFunction, FloatVec4, FloatVec4, double);

/// Evaluates one curve at many points: for each `i` below `count`, `results[i]` becomes
/// `ease(function, from, to, progress[i])`, bit for bit. `results` may be `progress`; otherwise the
/// two must not overlap. Allocates nothing. For numbers, the linear and the quadratic curves take a
/// fraction of the time of single calls; all other curves save the call itself.
template <class T>
void easeEach(EasingFunction function, T from, T to, double const* progress, std::size_t count,
              T* results) = delete;
template <>
TARN_API void easeEach<double>(EasingFunction, double, double, double const*, std::size_t, double*);
template <>
TARN_API void easeEach<long long>(EasingFunction, long long, long long, double const*, std::size_t,
                                  long long*);
template <>
TARN_API void easeEach<FloatVec2>(EasingFunction, FloatVec2, FloatVec2, double const*, std::size_t,
                                  FloatVec2*);
template <>
TARN_API void easeEach<FloatVec3>(EasingFunction, FloatVec3, FloatVec3, double const*, std::size_t,
                                  FloatVec3*);
template <>
TARN_API void easeEach<FloatVec4>(EasingFunction, FloatVec4, FloatVec4, double const*, std::size_t,
                                  FloatVec4*);

/// Deleted: the two ends have different types. Convert one of them, or pass `Value`s.
template <detail::AllDeduced = detail::AllDeduced::Yes, class From, class To,
          std::enable_if_t<!std::is_same_v<From, To> && !detail::isOneOf<Value, From, To>, int> = 0>
void ease(EasingFunction function, From from, To to, double t) = delete;

/// `EasingFunction::ExponentialInOut` as a function, for the same types: the in curve up to the
/// midpoint (truncated towards zero for integers) and the out curve from there.
template <class T>
T easeExponentialInOut(T from, T to, double t) = delete;
template <>
TARN_API double easeExponentialInOut<double>(double, double, double);
template <>
TARN_API long long easeExponentialInOut<long long>(long long, long long, double);
template <>
TARN_API FloatVec2 easeExponentialInOut<FloatVec2>(FloatVec2, FloatVec2, double);
template <>
TARN_API FloatVec3 easeExponentialInOut<FloatVec3>(FloatVec3, FloatVec3, double);
template <>
TARN_API FloatVec4 easeExponentialInOut<FloatVec4>(FloatVec4, FloatVec4, double);

/// The same for values. The type of `to` decides: both ends are converted to it, and the result has
/// it. Only numbers and vectors are eased; every other type gives 0.0.
TARN_API Value ease(EasingFunction function, Value from, Value to, double t);

}  // namespace tarn::engine

#endif
