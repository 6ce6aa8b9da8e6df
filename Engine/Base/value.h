// Engine/Base/value.h: the values on connections, and the types of ports.
//
//     Value radius = 2.5;
//     double r = radius;                          // 2.5
//     Value text = radius.asType(Type::String);   // "2.5"
//     std::cout << text;

#ifndef TARN_ENGINE_BASE_VALUE_H
#define TARN_ENGINE_BASE_VALUE_H

#include <Engine/Base/comparison.h>
#include <Engine/Base/conversion_traits.h>
#include <Engine/Base/export.h>
#include <Engine/Base/optional.h>

#if defined(BOOST_VARIANT_MINIMIZE_SIZE)
#error                                                                                             \
    "Tarn Engine Base has Boost's usual variant in its binary interface: undefine BOOST_VARIANT_MINIMIZE_SIZE"
#endif
#include <boost/variant/get.hpp>
#include <boost/variant/variant.hpp>

#include <cstddef>
#include <functional>
#include <iosfwd>
#include <memory>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

/// The data types that evaluator, renderer and editor share.
namespace tarn::engine {

struct Path;
class Unstructured;

/// The value types. Documents store the numbers, and tables are indexed by them; the alternatives
/// inside a `Value` have another order. `TypeInfo::subtype` marks a `Boolean` port as a pulse and
/// an `Unstructured` port as a layer.
enum class Type : unsigned char {
    Float = 0,
    Vec2 = 1,
    Vec3 = 2,
    Vec4 = 3,
    Mat4 = 4,
    Boolean = 5,
    Int = 6,
    Image = 7,
    Video = 8,
    Sound = 9,
    Path = 10,
    String = 11,
    Model = 12,
    Unstructured = 13,
};

/// Two doubles, compared as floating-point numbers: a NaN is unequal to itself, and 0.0 equals
/// -0.0.
struct FloatVec2 {
    /// The components.
    double x = 0.0;
    double y = 0.0;

    /// Component by component.
    friend constexpr bool operator==(FloatVec2 const& a, FloatVec2 const& b) {
        return detail::equalNumbers(a.x, b.x) && detail::equalNumbers(a.y, b.y);
    }
    friend constexpr bool operator!=(FloatVec2 const& a, FloatVec2 const& b) { return !(a == b); }
};

/// Three doubles, compared likewise.
struct FloatVec3 {
    /// The components.
    double x = 0.0;
    double y = 0.0;
    double z = 0.0;

    /// Component by component.
    friend constexpr bool operator==(FloatVec3 const& a, FloatVec3 const& b) {
        return detail::equalNumbers(a.x, b.x) && detail::equalNumbers(a.y, b.y) &&
               detail::equalNumbers(a.z, b.z);
    }
    friend constexpr bool operator!=(FloatVec3 const& a, FloatVec3 const& b) { return !(a == b); }
};

/// Four doubles, compared likewise.
struct FloatVec4 {
    /// The components. For a colour: red, green, blue and opacity, from 0 to 1.
    double x = 0.0;
    double y = 0.0;
    double z = 0.0;
    double w = 0.0;

    /// Component by component.
    friend constexpr bool operator==(FloatVec4 const& a, FloatVec4 const& b) {
        return detail::equalNumbers(a.x, b.x) && detail::equalNumbers(a.y, b.y) &&
               detail::equalNumbers(a.z, b.z) && detail::equalNumbers(a.w, b.w);
    }
    friend constexpr bool operator!=(FloatVec4 const& a, FloatVec4 const& b) { return !(a == b); }
};

/// A 4x4 matrix, all zero by default; the identity has 1.0 at the indices 0, 5, 10 and 15. Whether
/// rows or columns come first is the user's convention. It has no `==`: a `Value` compares matrices
/// by their bytes, and a second meaning would confuse.
struct FloatMat4 {
    /// Row by row or column by column, by the user's convention.
    double elements[16] = {};
};
static_assert(sizeof(FloatMat4) == 128, "sixteen doubles and nothing else");

/// The name in documents, "float" to "unstructured". An undefined enumerator is an assertion
/// failure.
TARN_API std::string typeToString(Type type);

/// The inverse of `typeToString`, compared byte by byte; empty for any other string.
TARN_API Optional<Type> stringToType(std::string const& name);

/// True for images, videos, sounds and models; false for undefined enumerators.
TARN_API bool typeIsResource(Type type);

/// Whether the input keeps the value of a connection that is deleted: true except for paths, models
/// and unstructured data; false for undefined enumerators.
TARN_API bool typeShouldCopyAcrossDeletedConnections(Type type);

/// A value of one of the fourteen types. Numbers, vectors, booleans and identifiers are stored
/// inline. A matrix, a path, a tree or a string is allocated once, never changed afterwards, and
/// shared by every copy. A copy costs at most one reference count and never fails.
///
/// Conversions never fail: those without a sensible result return zero, false, the identity matrix
/// or the empty path. A value that was moved from, or made from a null pointer, may hold a null
/// payload. It converts like the identity matrix, an empty path, null data or an empty string, and
/// equals only another null of its type.
///
/// Thread-safe as the types of the standard library are: copies that share a payload may be used in
/// different threads.
class Value {
public:
    /// The identifier of a resource; 0 is no resource. A type for each kind, so that an image is
    /// never a video.
    template <Type resource>
    struct ResourceID {
        /// The identifier; 0 is none.
        unsigned long long id = 0;

        /// The same identifier. (Different kinds do not compare.)
        friend constexpr bool operator==(ResourceID a, ResourceID b) { return a.id == b.id; }
        friend constexpr bool operator!=(ResourceID a, ResourceID b) { return a.id != b.id; }
    };
    /// The four kinds of resources.
    using ImageID = ResourceID<Type::Image>;
    using VideoID = ResourceID<Type::Video>;
    using SoundID = ResourceID<Type::Sound>;
    using ModelID = ResourceID<Type::Model>;

    /// The double 0.0.
    TARN_API_INLINE Value() noexcept : storage(0.0) {}
    TARN_API_INLINE Value(double number) noexcept : storage(number) {}
    TARN_API_INLINE Value(long long integer) noexcept : storage(integer) {}
    /// Every other signed integer type; `char` does not compile.
    template <class Integer, std::enable_if_t<detail::isSignedInteger<Integer>, int> = 0>
    Value(Integer integer) noexcept : Value(static_cast<long long>(integer)) {}
    TARN_API_INLINE Value(bool truth) noexcept : storage(truth) {}
    TARN_API_INLINE Value(FloatVec2 vector) noexcept : storage(vector) {}
    TARN_API_INLINE Value(FloatVec3 vector) noexcept : storage(vector) {}
    TARN_API_INLINE Value(FloatVec4 vector) noexcept : storage(vector) {}
    TARN_API Value(FloatMat4 const& matrix);
    /// The bytes up to the terminating zero; a null pointer is the empty string.
    TARN_API Value(char const* text);
    TARN_API Value(std::string text);
    TARN_API Value(Path path);
    /// Shares the path without copying it.
    TARN_API Value(std::shared_ptr<Path const> path) noexcept;
    TARN_API Value(Unstructured tree);
    /// Shares the tree without copying it. An aliasing pointer makes an element of a large document
    /// a value and keeps the whole document alive: `std::shared_ptr<Unstructured const>(document,
    /// &element)`.
    TARN_API Value(std::shared_ptr<Unstructured const> tree) noexcept;
    /// The resource `id`. A `type` that is not a resource is an assertion failure.
    TARN_API Value(unsigned long long id, Type type);

    /// Deleted: an unsigned integer needs a `Type`, and the others would convert to `bool`.
    template <class Source, std::enable_if_t<detail::isNoValueSource<Source>, int> = 0>
    Value(Source) = delete;
    Value(std::nullptr_t) = delete;

    /// Shares or moves the payload of `other`. Neither allocates.
    Value(Value const& other) noexcept = default;
    Value(Value&& other) noexcept = default;
    Value& operator=(Value const& other) noexcept = default;
    Value& operator=(Value&& other) noexcept = default;
    ~Value() = default;

    /// Same as the constructor with that type.
    TARN_API static Value Image(unsigned long long id);
    TARN_API static Value Video(unsigned long long id);
    TARN_API static Value Sound(unsigned long long id);
    TARN_API static Value Model(unsigned long long id);

    /// The value of a new port of `type`: zero, false, the identity matrix, identifier 0, an empty
    /// path or string, null data. With `qualifier` 4 a `Vec4` is (0, 0, 0, 1), opaque black; other
    /// types ignore it. An undefined enumerator is an assertion failure.
    TARN_API static Value defaultValue(Type type);
    TARN_API static Value defaultValue(Type type, unsigned char qualifier);

    /// The type of the value. Constant time, a few instructions.
    TARN_API_INLINE Type type() const noexcept { return kTypes[unsigned(storage.which())]; }

    /// Conversions to scalars; none allocates. A vector converts to its x, and to true when a
    /// component is not zero. An identifier is 1, or 0 for identifier 0. A path is whether it has
    /// elements. A matrix is zero. Unstructured data converts as by `asFloat` and `asInteger`, and
    /// to `bool` as by `asBool`. A string is the number that `strtod` parses from all of it, else
    /// 1, and 0 when it is empty; it is true when it is not empty. A double becomes an integer by
    /// truncation towards zero, clamped to the range, and 0 for a NaN.
    TARN_API operator long long() const noexcept;
    TARN_API_INLINE TARN_FLATTEN operator double() const noexcept {
        if (TARN_LIKELY(storage.which() == kFloat)) {
            return *boost::get<double>(&storage);
        }
        return readDouble();
    }
    TARN_API operator bool() const noexcept;
    /// The identifier of a resource, or of unstructured data (`Unstructured::asId`); else 0.
    TARN_API operator unsigned long long() const noexcept;
    /// Same as `long long` or `unsigned long long`, for the other 64-bit types (`std::int64_t`).
    template <class Integer, std::enable_if_t<detail::isWideInteger<Integer>, int> = 0>
    operator Integer() const noexcept {
        using Reading =
            std::conditional_t<std::is_signed_v<Integer>, long long, unsigned long long>;
        return static_cast<Integer>(operator Reading());
    }
    /// Deleted: `int(value)` would be a promoted `bool`. Convert to `long long` and narrow that.
    template <class Narrow, std::enable_if_t<detail::isNarrowNumber<Narrow>, int> = 0>
    operator Narrow() const = delete;

    /// Deleted: `value[pointer]` would be an element of an array.
    template <class T>
    void operator[](T const*) const = delete;

    /// Conversions to vectors, written `FloatVec2 v = value` or `FloatVec2(value)`; braces would
    /// set only the first component. None allocates. A number or boolean fills every component; a
    /// shorter vector is padded with zeros and a longer one truncated; unstructured data converts
    /// as described in `Unstructured`; everything else is zero.
    TARN_API operator FloatVec2() const noexcept;
    TARN_API operator FloatVec3() const noexcept;
    TARN_API operator FloatVec4() const noexcept;
    /// The matrix; the identity for every other type.
    TARN_API operator FloatMat4() const noexcept;
    /// A copy of the path, or the empty path for every other type. Linear; `ifPath` does not copy.
    /// Callers include path.h, as callers of `asUnstructured` include unstructured.h.
    TARN_API operator Path() const;
    /// Same as `to_string`, but "??" for unstructured data that is not a string. `s = value` does
    /// not compile, since a string can also be assigned a character; write `s =
    /// std::string(value)`.
    TARN_API operator std::string() const;
    /// The value as unstructured data: numbers, strings and trees unchanged, a boolean as the
    /// integer 1 or 0, a vector as a map with "X", "Y", "Z", "W"; everything else is null.
    TARN_API Unstructured asUnstructured() const;

    /// A pointer to the payload, or null where the value has another type or a null payload. Valid
    /// until the value is assigned to or destroyed. Copies nothing.
    TARN_API FloatMat4 const* asFloatMat4() const noexcept;
    TARN_API Path const* ifPath() const noexcept;
    TARN_API std::string const* ifString() const noexcept;
    TARN_API Unstructured const* ifUnstructured() const noexcept;

    /// The shared payload: the pointer that every copy of the value holds, or null as above. Costs
    /// one reference count, and keeps the payload alive.
    TARN_API std::shared_ptr<FloatMat4 const> sharedFloatMat4() const noexcept;
    TARN_API std::shared_ptr<Path const> sharedPath() const noexcept;
    TARN_API std::shared_ptr<std::string const> sharedString() const noexcept;
    TARN_API std::shared_ptr<Unstructured const> sharedUnstructured() const noexcept;

    /// Calls the visitor with the content as a reference to const: a `long long`, a `double`, a
    /// vector, a `FloatMat4`, a `bool`, a `ResourceID`, a `Path`, an `Unstructured` or a
    /// `std::string`. A null payload is the identity matrix, the empty path, null data or the empty
    /// string. The visitor must return the same type for each of them.
    template <class Visitor>
    decltype(auto) visit(Visitor&& visitor) const;

    /// Converts to exactly `type`. The result has its own payload, even when this value already has
    /// that type. An undefined enumerator is an assertion failure.
    TARN_API Value asType(Type type) const;

    /// The same type with equal content: 1 and 1.0 differ. Doubles and vectors compare as
    /// floating-point numbers, matrices by their bytes, and payloads deeply unless they are shared.
    TARN_API_INLINE TARN_FLATTEN bool operator==(Value const& other) const {
        if (storage.which() != other.storage.which()) return false;
        if (storage.which() != kFloat) return contentEquals(other);
        return detail::equalNumbers(*boost::get<double>(&storage),
                                    *boost::get<double>(&other.storage));
    }
    TARN_API_INLINE bool operator!=(Value const& other) const { return !(*this == other); }

private:
    friend std::string to_string(Value const& value);
    friend void appendText(std::string& text, Value const& value);
    friend struct std::hash<Value>;

    using Storage =
        boost::variant<long long, double, FloatVec2, FloatVec3, FloatVec4,
                       std::shared_ptr<FloatMat4 const>, bool, ImageID, VideoID, SoundID, ModelID,
                       std::shared_ptr<Path const>, std::shared_ptr<Unstructured const>,
                       std::shared_ptr<std::string const>>;
    // Indexed by alternative: the only place that relates the two orders.
    static constexpr Type kTypes[] = {Type::Int,          Type::Float, Type::Vec2,    Type::Vec3,
                                      Type::Vec4,         Type::Mat4,  Type::Boolean, Type::Image,
                                      Type::Video,        Type::Sound, Type::Model,   Type::Path,
                                      Type::Unstructured, Type::String};

    // Most values are floats: they are tested first.
    static constexpr int kFloat = 1;
    static_assert(kTypes[kFloat] == Type::Float);

    TARN_API double readDouble() const noexcept;
    // For two values of the same type.
    TARN_API bool contentEquals(Value const& other) const;

    Storage storage;
};

/// The `Type` of a C++ type. Types other than these do not compile.
template <class T>
constexpr Type TarnType() = delete;
template <>
constexpr Type TarnType<double>() {
    return Type::Float;
}
template <>
constexpr Type TarnType<FloatVec2>() {
    return Type::Vec2;
}
template <>
constexpr Type TarnType<FloatVec3>() {
    return Type::Vec3;
}
template <>
constexpr Type TarnType<FloatVec4>() {
    return Type::Vec4;
}
template <>
constexpr Type TarnType<FloatMat4>() {
    return Type::Mat4;
}
template <>
constexpr Type TarnType<bool>() {
    return Type::Boolean;
}
template <>
constexpr Type TarnType<long long>() {
    return Type::Int;
}
template <>  // Deliberate: a bare number is an image's, the first of the resource kinds.
constexpr Type TarnType<unsigned long long>() {
    return Type::Image;
}
template <>
constexpr Type TarnType<Path>() {
    return Type::Path;
}
template <>
constexpr Type TarnType<std::string>() {
    return Type::String;
}
template <>
constexpr Type TarnType<Unstructured>() {
    return Type::Unstructured;
}
static_assert(std::is_nothrow_move_constructible_v<Value>, "loops move when they grow");

}  // namespace tarn::engine

/// Equal values have equal hashes; a NaN has a hash too. Linear in a path or string; of
/// unstructured data only the first level counts. The hash may differ between processes, versions
/// and platforms.
template <>
struct std::hash<tarn::engine::Value> {
    TARN_API std::size_t operator()(tarn::engine::Value const& value) const noexcept;
};

namespace tarn::engine {

/// The string that an editor shows; not meant to be parsed. Numbers have two decimals, or one from
/// 1000 on, without trailing zeros: 2.5, 1234.6, 3. Non-finite ones are "nan" or "inf", with "-"
/// where the sign is set. The rounding mode of the calling thread applies; numbers are cut after
/// 127 characters. Components of a vector are joined by ", ", and a matrix is four lines of four. A
/// boolean is "1" or "0", an identifier its number, a path "Path" or "Empty Path", unstructured
/// data "unstructured" unless it is a string. The decimal point that is trimmed is that of
/// `std::cout`'s locale at the time of the call; no other thread may change that locale meanwhile.
TARN_API std::string to_string(Value const& value);

/// Appends `to_string(value)` to `text`. For numbers and vectors nothing is allocated where the
/// capacity of `text` suffices. A failing allocation leaves `text` unchanged, or with the first
/// components of a vector or a matrix.
TARN_API void appendText(std::string& text, Value const& value);

namespace detail {

/// Types that convert to or from a `Value`.
template <class T>
constexpr bool isComparedByReading =
    !std::is_convertible_v<T*, Value const*> &&
    (std::is_arithmetic_v<T> || std::is_convertible_v<T const&, std::string> ||
     isOneOf<T, FloatVec2, FloatVec3, FloatVec4, FloatMat4, Path, std::shared_ptr<Path const>,
             Unstructured, std::shared_ptr<Unstructured const>>);

// `V` is deduced, so that only a `Value` matches and nothing that converts to one.
template <class V, class Other>
using EnableIfMixed = std::enable_if_t<std::is_same_v<V, Value> && isComparedByReading<Other>, int>;
template <class V>
using EnableIfValue = std::enable_if_t<std::is_convertible_v<V*, Value const*>, int>;

}  // namespace detail

/// Deleted: compare values with values. Convert one of the two sides explicitly.
template <class V, class Other, detail::EnableIfMixed<V, Other> = 0>
bool operator==(V const&, Other const&) = delete;
template <class V, class Other, detail::EnableIfMixed<V, Other> = 0>
bool operator==(Other const&, V const&) = delete;
template <class V, class Other, detail::EnableIfMixed<V, Other> = 0>
bool operator!=(V const&, Other const&) = delete;
template <class V, class Other, detail::EnableIfMixed<V, Other> = 0>
bool operator!=(Other const&, V const&) = delete;

/// Deleted: with a pointer or a string literal this would be pointer arithmetic. `"x" +
/// std::string(value)` concatenates. (`array[value]` still compiles: it is the element at the
/// value's integer.)
template <class T, class V, detail::EnableIfValue<V> = 0>
void operator+(T const*, V const&) = delete;
template <class T, class V, detail::EnableIfValue<V> = 0>
void operator+(V const&, T const*) = delete;
template <class T, class V, detail::EnableIfValue<V> = 0>
void operator-(T const*, V const&) = delete;
template <class T, class V, detail::EnableIfValue<V> = 0>
void operator-(V const&, T const*) = delete;
template <class T, class V, detail::EnableIfValue<V> = 0>
void operator+=(T*&, V const&) = delete;
template <class T, class V, detail::EnableIfValue<V> = 0>
void operator-=(T*&, V const&) = delete;

/// A list of values; `indexLoopCasting` wraps indices around.
using Loop = std::vector<Value>;

/// What a port carries: the type and the bounds of its values.
struct TypeInfo {
    /// The type of the port's values.
    Type type = Type::Float;
    /// 1 marks a `Boolean` port as a pulse and an `Unstructured` port as a layer.
    unsigned char subtype = 0;
    /// Inclusive bounds of a `Float` port; values of other ports are never clamped. Setting or
    /// copying one allocates. A copy assignment that runs out of memory has assigned the fields
    /// before that one; `info = TypeInfo(other)` assigns all or nothing.
    Optional<Value> min = {};
    Optional<Value> max = {};
    /// Carried, copied and compared; this library does not interpret it.
    Optional<Value> extra = {};

    /// Compares every field.
    TARN_API bool operator==(TypeInfo const& other) const;
    TARN_API bool operator!=(TypeInfo const& other) const;
};

/// The name of a port of this type, such as "Number" or, where `plural`, "Numbers". Only `type` and
/// `subtype` matter. An undefined enumerator is an assertion failure.
TARN_API std::string portNameForTypeInfo(TypeInfo typeInfo, bool plural);

/// `value`, or the bound that it exceeds, where the port is a `Float` port. `min` is tested first,
/// and a NaN passes. Nothing is converted: the value or the bound is returned with its own type.
/// Copies nothing: the result refers to one of the arguments and must not outlive them.
TARN_API_INLINE inline Value const& castValueToType(Value const& value,
                                                    TypeInfo const& typeInfo) noexcept;

/// The same result as a copy.
TARN_API Value castValueToType(Value&& value, TypeInfo const& typeInfo);

/// The element at `index`, wrapped around the loop, cast to the port. An empty loop counts as one
/// element, 0.0. Constant time, copies nothing: the result refers to `loop`, to `typeInfo` or to a
/// value that lives until the program ends.
TARN_API_INLINE inline Value const& indexLoopCasting(Loop const& loop, TypeInfo const& typeInfo,
                                                     unsigned long long index) noexcept;

/// The same for a range of indices: for each `i` below `count`, `results[i]` becomes the address of
/// `indexLoopCasting(loop, typeInfo, first + i)`; the sum wraps around at 2^64. Needs only one
/// division for each pass over the loop.
TARN_API void indexLoopCasting(Loop const& loop, TypeInfo const& typeInfo, unsigned long long first,
                               std::size_t count, Value const** results) noexcept;

/// The empty loop that everyone shares; lives until the program ends.
TARN_API Loop const& nullLoop();

/// Writes `to_string(value)`.
TARN_API std::ostream& operator<<(std::ostream& stream, Value const& value);

/// Writes the name, "float" to "unstructured", or "Type(77)" for an undefined enumerator.
TARN_API std::ostream& operator<<(std::ostream& stream, Type type);

/// Writes only the type: "[type: float]".
TARN_API std::ostream& operator<<(std::ostream& stream, TypeInfo const& typeInfo);

// Implementation

namespace detail {

// `value`, or the bound of the port that it exceeds.
Value const& clamped(Value const& value, TypeInfo const& typeInfo) noexcept;

// The element of an empty loop, cast to the port.
TARN_API Value const& castNullValue(TypeInfo const& typeInfo) noexcept;

// The matrix that a visitor gets for a null payload.
TARN_API FloatMat4 const& neutralMatrix() noexcept;
TARN_API Path const& neutralPath() noexcept;
TARN_API Unstructured const& neutralData() noexcept;
TARN_API std::string const& neutralString() noexcept;

}  // namespace detail

template <class Visitor>
decltype(auto) Value::visit(Visitor&& visitor) const {
    auto const show = [&](auto const& held) -> decltype(auto) {
        return std::forward<Visitor>(visitor)(held);
    };
    switch (type()) {
        case Type::Int: return show(*boost::get<long long>(&storage));
        case Type::Float: return show(*boost::get<double>(&storage));
        case Type::Vec2: return show(*boost::get<FloatVec2>(&storage));
        case Type::Vec3: return show(*boost::get<FloatVec3>(&storage));
        case Type::Vec4: return show(*boost::get<FloatVec4>(&storage));
        case Type::Mat4: return show(asFloatMat4() ? *asFloatMat4() : detail::neutralMatrix());
        case Type::Boolean: return show(*boost::get<bool>(&storage));
        case Type::Image: return show(*boost::get<ImageID>(&storage));
        case Type::Video: return show(*boost::get<VideoID>(&storage));
        case Type::Sound: return show(*boost::get<SoundID>(&storage));
        case Type::Model: return show(*boost::get<ModelID>(&storage));
        case Type::Path: return show(ifPath() ? *ifPath() : detail::neutralPath());
        case Type::Unstructured:
            return show(ifUnstructured() ? *ifUnstructured() : detail::neutralData());
        case Type::String: break;
    }
    return show(ifString() ? *ifString() : detail::neutralString());
}

TARN_FLATTEN inline Value const& detail::clamped(Value const& value,
                                                 TypeInfo const& typeInfo) noexcept {
    double const number = value;
    if (typeInfo.min && detail::lessNumber(number, double(*typeInfo.min))) return *typeInfo.min;
    if (typeInfo.max && detail::lessNumber(double(*typeInfo.max), number)) return *typeInfo.max;
    return value;
}

inline Value const& castValueToType(Value const& value, TypeInfo const& typeInfo) noexcept {
    if (typeInfo.type != Type::Float || (!typeInfo.min && !typeInfo.max)) return value;
    return detail::clamped(value, typeInfo);
}

inline Value const& indexLoopCasting(Loop const& loop, TypeInfo const& typeInfo,
                                     unsigned long long index) noexcept {
    if (loop.empty()) return detail::castNullValue(typeInfo);
    return castValueToType(loop[static_cast<std::size_t>(index % loop.size())], typeInfo);
}

}  // namespace tarn::engine

#endif
