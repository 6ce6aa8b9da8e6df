// Engine/Base/conversion_traits.h: which types `Value` and `Unstructured` convert from and to.
//
//     static_assert(detail::isSignedInteger<short>);

#ifndef TARN_ENGINE_BASE_CONVERSION_TRAITS_H
#define TARN_ENGINE_BASE_CONVERSION_TRAITS_H

#include <type_traits>
#include <utility>

namespace tarn::engine::detail {

template <class T, class... Candidates>
constexpr bool isOneOf = (std::is_same_v<T, Candidates> || ...);

template <class T>
constexpr bool isSignedInteger = isOneOf<T, signed char, short, int, long, long long>;

template <class T>
constexpr bool isUnsignedInteger =
    isOneOf<T, unsigned char, unsigned short, unsigned int, unsigned long, unsigned long long>;

template <class T>
constexpr bool isInteger = isSignedInteger<T> || isUnsignedInteger<T>;

// Every integer type except the two that an `Unstructured` stores.
template <class T>
constexpr bool isOtherInteger = isInteger<T> && !isOneOf<T, long long, unsigned long long>;

template <class T>
constexpr bool isCharacter = std::is_integral_v<T> && !isSignedInteger<T> &&
                             !isUnsignedInteger<T> && !std::is_same_v<T, bool>;

// The other type of a 64-bit integer: `long` where it has 64 bits, as `std::int64_t` on Linux.
template <class T>
constexpr bool isWideInteger = isOneOf<T, long, unsigned long> && sizeof(long) == sizeof(long long);

// Types that a `Value` must not convert to: the result would be a promoted `bool`.
template <class T>
constexpr bool isNarrowNumber = std::is_arithmetic_v<T> && !isWideInteger<T> &&
                                !isOneOf<T, bool, double, long long, unsigned long long>;

// Class types with a conversion to a pointer, such as a lambda without captures.
template <class T, class = void>
constexpr bool becomesPointer = false;
template <class T>
constexpr bool
    becomesPointer<T, std::enable_if_t<std::is_class_v<T> &&
                                       std::is_pointer_v<decltype(+std::declval<T const&>())>>> =
        true;

// Types that a `Value` must not be constructed from: they would be stored as a `bool`.
template <class T>
constexpr bool isNoValueSource =
    isUnsignedInteger<T> || isCharacter<T> || std::is_same_v<T, long double> ||
    std::is_member_pointer_v<T> ||
    (std::is_pointer_v<T> && !isOneOf<T, char*, char const*>) || becomesPointer<T>;

// Types that an `Unstructured` must not be constructed from: they would be stored as a number.
template <class T>
constexpr bool isNoDataSource = std::is_same_v<T, bool> || isCharacter<T>;

// As the type of the first template parameter, this rejects explicit arguments:
// `ease<double>(...)`.
enum class AllDeduced { Yes };

}  // namespace tarn::engine::detail

#endif
