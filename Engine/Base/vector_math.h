// Engine/Base/vector_math.h: arithmetic operators of vectors.
//
//     FloatVec2 middle = (FloatVec2{0, 2} + FloatVec2{4, 4}) / 2.0;  // (2, 3)

#ifndef TARN_ENGINE_BASE_VECTOR_MATH_H
#define TARN_ENGINE_BASE_VECTOR_MATH_H

#include <Engine/Base/value.h>

#include <type_traits>

namespace tarn::engine {

namespace detail {

template <class V>
constexpr bool isVector = isOneOf<V, FloatVec2, FloatVec3, FloatVec4>;

// `V` is deduced, so that operands are never converted to a vector.
template <class V>
using EnableIfVector = std::enable_if_t<isVector<V>, int>;
template <class V, class Number>
using EnableIfScaling =
    std::enable_if_t<isVector<V> && std::is_arithmetic_v<Number> && !std::is_same_v<Number, bool>,
                     int>;

// A vector with the result of `function` for each component of `a` and `b`.
template <class Function>
constexpr FloatVec2 eachOf(FloatVec2 const& a, FloatVec2 const& b, Function function) {
    return {function(a.x, b.x), function(a.y, b.y)};
}
template <class Function>
constexpr FloatVec3 eachOf(FloatVec3 const& a, FloatVec3 const& b, Function function) {
    return {function(a.x, b.x), function(a.y, b.y), function(a.z, b.z)};
}
template <class Function>
constexpr FloatVec4 eachOf(FloatVec4 const& a, FloatVec4 const& b, Function function) {
    return {function(a.x, b.x), function(a.y, b.y), function(a.z, b.z), function(a.w, b.w)};
}

}  // namespace detail

/// Component by component. Both operands have the same size.
template <class V, detail::EnableIfVector<V> = 0>
constexpr V operator+(V const& a, V const& b) {
    return detail::eachOf(a, b, [](double x, double y) { return x + y; });
}
template <class V, detail::EnableIfVector<V> = 0>
constexpr V operator-(V const& a, V const& b) {
    return detail::eachOf(a, b, [](double x, double y) { return x - y; });
}
template <class V, detail::EnableIfVector<V> = 0>
constexpr V operator-(V const& a) {
    return detail::eachOf(a, a, [](double x, double) { return -x; });
}

/// Multiplies or divides every component by the number. A division is not a multiplication by the
/// reciprocal, so the last bit is that of a division. The number may have any arithmetic type
/// except `bool`, and is converted to a double.
template <class V, class Number, detail::EnableIfScaling<V, Number> = 0>
constexpr V operator*(V const& a, Number factor) {
    auto const f = static_cast<double>(factor);
    return detail::eachOf(a, a, [f](double x, double) { return x * f; });
}
template <class V, class Number, detail::EnableIfScaling<V, Number> = 0>
constexpr V operator*(Number factor, V const& a) {
    auto const f = static_cast<double>(factor);
    return detail::eachOf(a, a, [f](double x, double) { return f * x; });
}
template <class V, class Number, detail::EnableIfScaling<V, Number> = 0>
constexpr V operator/(V const& a, Number divisor) {
    auto const d = static_cast<double>(divisor);
    return detail::eachOf(a, a, [d](double x, double) { return x / d; });
}

/// The operators above, in place.
template <class V, detail::EnableIfVector<V> = 0>
constexpr V& operator+=(V& a, V const& b) {
    return a = a + b;
}
template <class V, detail::EnableIfVector<V> = 0>
constexpr V& operator-=(V& a, V const& b) {
    return a = a - b;
}
template <class V, class Number, detail::EnableIfScaling<V, Number> = 0>
constexpr V& operator*=(V& a, Number factor) {
    return a = a * factor;
}
template <class V, class Number, detail::EnableIfScaling<V, Number> = 0>
constexpr V& operator/=(V& a, Number divisor) {
    return a = a / divisor;
}

}  // namespace tarn::engine

#endif
