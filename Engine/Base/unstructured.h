// Engine/Base/unstructured.h: free-form data, a tree of maps, lists, numbers and texts.
//
//     Unstructured::Map point;
//     point["X"] = 1.5;
//     Unstructured data = std::move(point);
//     FloatVec2 v = data;  // (1.5, 0)

#ifndef TARN_ENGINE_BASE_UNSTRUCTURED_H
#define TARN_ENGINE_BASE_UNSTRUCTURED_H

#include <Engine/Base/export.h>
#include <Engine/Base/value.h>

#include <boost/variant/variant.hpp>

#include <cstddef>
#include <map>
#include <memory>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace tarn::engine {

namespace detail {

template <class T>
using EnableIfDataSource = std::enable_if_t<
    !isOneOf<T, Unstructured, Value> && std::is_convertible_v<T const&, Unstructured>, int>;

}  // namespace detail

/// A value in the manner of JSON, with two kinds of integers and no truth value of its own (truth
/// is the integer 1 or 0). It owns its subtree: a copy is deep, a move takes constant time, cannot
/// fail and leaves null behind. No reading fails: what has no answer is zero, false or empty.
/// An `Array` in braces is an element: `Array{array}` has one, `Array(array)` is the copy.
class Unstructured {
public:
    using Map = std::map<std::string, Unstructured>;
    using Array = std::vector<Unstructured>;

    enum class Type : unsigned char {
        Null = 0,
        Map = 1,
        Array = 2,
        Float = 3,
        Integer = 4,
        UnsignedInteger = 5,
        String = 6,
    };

    /// Null.
    TARN_ENGINE_BASE_EXPORT Unstructured();
    TARN_ENGINE_BASE_EXPORT Unstructured(Map const& map);
    TARN_ENGINE_BASE_EXPORT Unstructured(Map&& map);
    TARN_ENGINE_BASE_EXPORT Unstructured(Array const& array);
    TARN_ENGINE_BASE_EXPORT Unstructured(Array&& array);
    TARN_ENGINE_BASE_EXPORT Unstructured(std::string const& text);
    TARN_ENGINE_BASE_EXPORT Unstructured(std::string&& text);
    /// The bytes up to the terminating zero; a null pointer is the empty string.
    TARN_ENGINE_BASE_EXPORT Unstructured(char const* text);
    TARN_ENGINE_BASE_EXPORT Unstructured(long long const& integer);
    TARN_ENGINE_BASE_EXPORT Unstructured(double const& number);
    TARN_ENGINE_BASE_EXPORT Unstructured(unsigned long long const& integer);
    /// Every other integer type, by its sign; a truth value or a character is neither.
    template <class Integer, std::enable_if_t<(detail::isSignedInteger<Integer> ||
                                               detail::isUnsignedInteger<Integer>)&&!detail::
                                                  isOneOf<Integer, long long, unsigned long long>,
                                              int> = 0>
    Unstructured(Integer integer)
        : Unstructured(static_cast<std::conditional_t<std::is_signed_v<Integer>, long long,
                                                      unsigned long long>>(integer)) {}
    /// As `value.asUnstructured()`.
    TARN_ENGINE_BASE_EXPORT Unstructured(Value const& value);

    template <
        class Source,
        std::enable_if_t<std::is_same_v<Source, bool> || detail::isCharacter<Source>, int> = 0>
    Unstructured(Source) = delete;
    Unstructured(std::nullptr_t) = delete;

    TARN_ENGINE_BASE_EXPORT Unstructured(Unstructured const& other);
    TARN_ENGINE_BASE_EXPORT Unstructured(Unstructured&& other) noexcept;
    /// A failing allocation leaves this as it was; either side may be part of the other.
    TARN_ENGINE_BASE_EXPORT Unstructured& operator=(Unstructured const& other);
    TARN_ENGINE_BASE_EXPORT Unstructured& operator=(Unstructured&& other) noexcept;
    TARN_ENGINE_BASE_EXPORT ~Unstructured();

    /// Null, by name.
    TARN_ENGINE_BASE_EXPORT static Unstructured Undefined();

    TARN_ENGINE_BASE_EXPORT Type type() const;

    /// Copies of the content, empty for every other kind. `ifMap`, `ifArray` and `ifString` copy
    /// nothing.
    TARN_ENGINE_BASE_EXPORT Map asMap() const;
    TARN_ENGINE_BASE_EXPORT Array asArray() const;
    TARN_ENGINE_BASE_EXPORT std::string asString() const;

    /// The signed number, or the floating-point one (towards zero and kept in range, NaN as 0, for
    /// an integer). Deliberate: an unsigned number is an identifier and reads as 0 in both.
    TARN_ENGINE_BASE_EXPORT long long asInteger() const;
    TARN_ENGINE_BASE_EXPORT double asFloat() const;
    /// Deliberate: every map and every array is true, empty ones included; a string when it is not
    /// empty, a number when it is not zero.
    TARN_ENGINE_BASE_EXPORT bool asBool() const;
    /// The unsigned number, the signed one's bits, or the floating-point one towards zero and
    /// kept in range; else 0.
    TARN_ENGINE_BASE_EXPORT unsigned long long asId() const;

    /// The content in place, or null for every other kind. Lives until this is assigned to,
    /// moved from or destroyed.
    TARN_ENGINE_BASE_EXPORT Map const* ifMap() const;
    TARN_ENGINE_BASE_EXPORT Array const* ifArray() const;
    TARN_ENGINE_BASE_EXPORT std::string const* ifString() const;

    /// A map is read by its keys "X", "Y", "Z" and "W", an array by position; each element
    /// counts as its `asFloat()`, and what is missing as 0. A floating-point or signed number
    /// fills every component. Everything else is zero. Nothing is allocated.
    TARN_ENGINE_BASE_EXPORT operator FloatVec2() const;
    TARN_ENGINE_BASE_EXPORT operator FloatVec3() const;
    TARN_ENGINE_BASE_EXPORT operator FloatVec4() const;

    /// The same kind with equal content, deeply: 1, 1u and 1.0 are three different things.
    TARN_ENGINE_BASE_EXPORT bool operator==(Unstructured const& other) const;
    TARN_ENGINE_BASE_EXPORT bool operator!=(Unstructured const& other) const;
    /// With what data is made from on the left side, as it may stand on the right.
    template <class Source, detail::EnableIfDataSource<Source> = 0>
    friend bool operator==(Source const& source, Unstructured const& data) {
        return data.operator==(source);
    }
    template <class Source, detail::EnableIfDataSource<Source> = 0>
    friend bool operator!=(Source const& source, Unstructured const& data) {
        return data.operator!=(source);
    }

    /// A copy of `map` without its empty maps, arrays and strings. One level deep: what is kept is
    /// kept whole. Null and zero are not empty.
    TARN_ENGINE_BASE_EXPORT static Map removeEmptyValues(Map const& map);

private:
    /// One `T` on the heap, copied deeply; it keeps the union at two words, which arrays of
    /// numbers pay for each element. Null only once moved from, which no `Unstructured` shows.
    template <class T>
    class Box {
    public:
        explicit Box(T made) : content(std::make_unique<T>(std::move(made))) {}
        Box(Box const& other) : content(std::make_unique<T>(*other.content)) {}
        Box(Box&& other) noexcept = default;
        Box& operator=(Box const& other) = delete;
        Box& operator=(Box&& other) noexcept = default;
        ~Box() = default;

        T const& operator*() const { return *content; }
        T const* get() const { return content.get(); }

    private:
        std::unique_ptr<T> content;
    };

    using Storage = boost::variant<std::nullptr_t, Box<Map>, Box<Array>, double, long long,
                                   unsigned long long, Box<std::string>>;
    Storage storage;
};

}  // namespace tarn::engine

#endif
