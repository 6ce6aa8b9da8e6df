// Engine/Base/conversion_traits.h: which types values and data are made from and read as.
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

// Every integer type but the two that data has.
template <class T>
constexpr bool isOtherInteger = isInteger<T> && !isOneOf<T, long long, unsigned long long>;

template <class T>
constexpr bool isCharacter = std::is_integral_v<T> && !isSignedInteger<T> &&
                             !isUnsignedInteger<T> && !std::is_same_v<T, bool>;

// The other spelling of a 64-bit integer: `long` where `std::int64_t` is one, for example.
template <class T>
constexpr bool isWideInteger = isOneOf<T, long, unsigned long> && sizeof(long) == sizeof(long long);

// What a `Value` refuses to be read as, since it would convert to `bool` and be promoted.
template <class T>
constexpr bool isNarrowNumber = std::is_arithmetic_v<T> && !isWideInteger<T> &&
                                !isOneOf<T, bool, double, long long, unsigned long long>;

// An object that becomes a pointer, as a lambda without captures becomes one to a function.
template <class T, class = void>
constexpr bool becomesPointer = false;
template <class T>
constexpr bool
    becomesPointer<T, std::enable_if_t<std::is_class_v<T> &&
                                       std::is_pointer_v<decltype(+std::declval<T const&>())>>> =
        true;

// What a `Value` refuses to be made from, since it would convert to `bool` and be stored as that.
template <class T>
constexpr bool isNoValueSource =
    isUnsignedInteger<T> || isCharacter<T> || std::is_same_v<T, long double> ||
    std::is_member_pointer_v<T> ||
    (std::is_pointer_v<T> && !isOneOf<T, char*, char const*>) || becomesPointer<T>;

// What data refuses to be made from, since it would be a number.
template <class T>
constexpr bool isNoDataSource = std::is_same_v<T, bool> || isCharacter<T>;

// The type of a template's first parameter keeps calls such as `ease<double>(...)` out of it.
enum class AllDeduced { Yes };

}  // namespace tarn::engine::detail

#endif
