// Engine/Base/unstructured.h: JSON-like data: a tree of maps, arrays, numbers and strings.
//
//     Unstructured::Map point;
//     point["X"] = 1.5;
//     Unstructured data = std::move(point);
//     FloatVec2 v = data;  // (1.5, 0)

#ifndef TARN_ENGINE_BASE_UNSTRUCTURED_H
#define TARN_ENGINE_BASE_UNSTRUCTURED_H

#include <Engine/Base/export.h>
#include <Engine/Base/value.h>

#include <boost/variant/get.hpp>
#include <boost/variant/variant.hpp>

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <iosfwd>
#include <map>
#include <new>
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

/// A JSON-like value, with two kinds of integers and without booleans (they are the integers 1 and
/// 0). It owns its subtree: a copy is deep; a move takes constant time, never throws and leaves
/// null. Conversions never fail: those without a sensible result return zero, false or an empty
/// value. A tree may be of any depth: nothing here uses more stack for a deep one. Copies and
/// comparisons of trees of more than 256 levels allocate a work list; destruction never allocates.
/// To know which algorithm is needed, an `Unstructured` caches its depth when it is constructed
/// from a map or an array: from then on, no element may be changed through an older reference.
///
/// In braces, an `Array` is an element: `Array{array}` has one element, `Array(array)` is a copy.
class Unstructured {
public:
    /// A JSON object, ordered by the bytes of its keys, and a JSON array.
    using Map = std::map<std::string, Unstructured>;
    using Array = std::vector<Unstructured>;

    /// The kinds, numbered like the alternatives of the variant.
    enum class Type : unsigned char {
        Null = 0,
        Map = 1,
        Array = 2,
        Float = 3,
        Integer = 4,
        UnsignedInteger = 5,
        String = 6,
    };

    /// One step of a lookup: the key in a map or the position in an array. Converts implicitly, so
    /// that a path is written in braces: `{"render", "size", 0}`.
    class Step {
    public:
        /// The element of a map with this key; a null pointer is the empty key.
        Step(char const* mapKey) : key(mapKey == nullptr ? "" : mapKey), isKey(true) {}
        Step(std::string mapKey) : key(std::move(mapKey)), isKey(true) {}
        /// The element of an array at this position. A negative position never exists.
        template <class Integer, std::enable_if_t<detail::isInteger<Integer>, int> = 0>
        Step(Integer arrayPosition) : position(positionOf(arrayPosition)) {}

    private:
        friend class Unstructured;
        // A position that never exists where it is negative, or larger than `std::size_t`.
        template <class Integer>
        static std::size_t positionOf(Integer arrayPosition) {
            auto const result = static_cast<std::size_t>(arrayPosition);
            bool const fits =
                !(arrayPosition < Integer()) && static_cast<Integer>(result) == arrayPosition;
            return fits ? result : static_cast<std::size_t>(-1);
        }
        std::string key;
        std::size_t position = 0;
        bool isKey = false;
    };
    /// A path of steps, from the outside to the inside.
    using Steps = std::initializer_list<Step>;

    /// The result of a lookup.
    enum class Lookup : unsigned char {
        /// A value of the requested kind.
        Found = 0,
        /// No value.
        Missing = 1,
        /// A value of another kind, null included.
        WrongKind = 2,
    };

    /// Null.
    TARN_API_INLINE Unstructured() : storage(nullptr) {}
    TARN_API Unstructured(Map const& map);
    TARN_API Unstructured(Map&& map);
    TARN_API Unstructured(Array const& array);
    TARN_API Unstructured(Array&& array);
    TARN_API Unstructured(std::string const& text);
    TARN_API Unstructured(std::string&& text);
    /// The bytes up to the terminating zero; a null pointer is the empty string.
    TARN_API Unstructured(char const* text);
    TARN_API_INLINE Unstructured(long long const& integer) : storage(integer) {}
    TARN_API_INLINE Unstructured(double const& number) : storage(number) {}
    TARN_API_INLINE Unstructured(unsigned long long const& integer) : storage(integer) {}
    /// Every other integer type, according to its sign; booleans and characters do not compile.
    template <class Integer, std::enable_if_t<detail::isOtherInteger<Integer>, int> = 0>
    Unstructured(Integer integer)
        : Unstructured(static_cast<std::conditional_t<std::is_signed_v<Integer>, long long,
                                                      unsigned long long>>(integer)) {}
    /// Same as `value.asUnstructured()`.
    TARN_API Unstructured(Value const& value);

    template <class Source, std::enable_if_t<detail::isNoDataSource<Source>, int> = 0>
    Unstructured(Source) = delete;
    Unstructured(std::nullptr_t) = delete;

    /// Copies the whole tree; or moves it in constant time and leaves null.
    TARN_API_INLINE Unstructured(Unstructured const& other)
        : storage(other.ownsContent() ? other.copiedContent() : other.storage) {}
    TARN_API_INLINE Unstructured(Unstructured&& other) noexcept
        : storage(std::move(other.storage)) {
        other.forget();
    }
    /// A failing allocation leaves this unchanged. A part of this may be assigned to it. The whole
    /// may be copied, but not moved, into a part of itself.
    TARN_API Unstructured& operator=(Unstructured const& other);
    TARN_API Unstructured& operator=(Unstructured&& other) noexcept;
    TARN_API_INLINE ~Unstructured() {
        if (ownsContent()) destroyContent();
    }

    /// The same as null.
    TARN_API_INLINE static Unstructured Undefined() { return Unstructured(); }

    /// The kind of value. Constant time.
    TARN_API_INLINE Type type() const noexcept { return Type(storage.which()); }

    /// A copy of the content; empty for every other kind. `ifMap`, `ifArray` and `ifString` do not
    /// copy.
    TARN_API Map asMap() const;
    TARN_API Array asArray() const;
    TARN_API std::string asString() const;

    /// The signed integer or the double, else 0. `asInteger` truncates a double towards zero and
    /// clamps it; a NaN is 0. Deliberate: an unsigned integer is an identifier and converts to 0 in
    /// both.
    TARN_API long long asInteger() const;
    TARN_API_INLINE double asFloat() const {
        if (double const* number = boost::get<double>(&storage)) return *number;
        if (long long const* integer = boost::get<long long>(&storage)) {
            return static_cast<double>(*integer);
        }
        return 0.0;
    }
    /// Maps and arrays are true, deliberately also empty ones; a string is true when it is not
    /// empty, a number when it is not zero.
    TARN_API bool asBool() const;
    /// The unsigned integer, the signed integer's bits, or the double truncated towards zero and
    /// clamped; else 0.
    TARN_API unsigned long long asId() const;

    /// A pointer to the content, or null for every other kind. Valid until this is assigned to,
    /// moved from or destroyed.
    TARN_API_INLINE Map const* ifMap() const { return content<Map>(); }
    TARN_API_INLINE Array const* ifArray() const { return content<Array>(); }
    TARN_API_INLINE std::string const* ifString() const {
        std::string* const* text = boost::get<std::string*>(&storage);
        return text == nullptr ? nullptr : *text;
    }

    /// Whether this is of that kind. A number is a double or a signed integer, as `asFloat`
    /// converts it; an unsigned integer is an identifier. Constant time.
    bool isNull() const noexcept { return type() == Type::Null; }
    bool isMap() const noexcept { return type() == Type::Map; }
    bool isArray() const noexcept { return type() == Type::Array; }
    bool isNumber() const noexcept { return type() == Type::Float || type() == Type::Integer; }
    bool isIdentifier() const noexcept { return type() == Type::UnsignedInteger; }
    bool isString() const noexcept { return type() == Type::String; }

    /// The number of elements of a map or an array, and whether it is 0; every other kind has none.
    /// Constant time.
    TARN_API std::size_t size() const noexcept;
    bool empty() const noexcept { return size() == 0; }

    /// The element of a map with this key, the element of an array at this position, or the value
    /// at the end of a path of both. Null where it does not exist, and in values of another kind.
    /// An empty path leads to this value itself. Lifetime as for `ifMap`. Copies nothing.
    TARN_API Unstructured const* find(std::string const& key) const noexcept;
    TARN_API Unstructured const* find(std::size_t position) const noexcept;
    TARN_API Unstructured const* find(Steps path) const noexcept;

    /// The value at the end of the path, or `otherwise` where it does not exist or has another
    /// kind; `lookup`, where given, tells which. A number is as in `isNumber`. An integer is a
    /// signed integer, or a double without a fraction that fits. A boolean is the integer 1 or 0.
    TARN_API double numberAt(Steps path, double otherwise, Lookup* lookup = nullptr) const noexcept;
    TARN_API long long integerAt(Steps path, long long otherwise,
                                 Lookup* lookup = nullptr) const noexcept;
    TARN_API bool boolAt(Steps path, bool otherwise, Lookup* lookup = nullptr) const noexcept;
    TARN_API std::string stringAt(Steps path, std::string otherwise,
                                  Lookup* lookup = nullptr) const;

    /// A JSON-like string for people, on one line: `{"id": 7u, "size": [80.0, 50.5]}`. It shows the
    /// kinds: a double has a point, an exponent or is "nan" or "inf", an unsigned integer ends in
    /// "u", null is "null". Strings are quoted UTF-8: control characters and invalid bytes are
    /// written as "\\n", "\\t", "\\r" or "\\x1f".
    ///
    /// `maxDepth` levels of maps and arrays are shown; a deeper one is "{...}" or "[...]", unless
    /// it is empty. The string has at most `maxBytes` bytes: a longer one is cut there and ends in
    /// "...". The cost depends on the string, not on the tree. Not recursive.
    TARN_API std::string toText(std::size_t maxBytes = 4096, std::size_t maxDepth = 16) const;

    /// A map gives its values for the keys "X", "Y", "Z" and "W", an array its first elements; each
    /// element converts as by `asFloat()`, and missing ones are 0. A double or a signed integer
    /// fills every component. Everything else is zero. Allocates nothing.
    TARN_API operator FloatVec2() const;
    TARN_API operator FloatVec3() const;
    TARN_API operator FloatVec4() const;

    /// Equal kinds with equal content, compared deeply: 1, 1u and 1.0 are three different values.
    TARN_API bool operator==(Unstructured const& other) const;
    TARN_API bool operator!=(Unstructured const& other) const;
    /// Also with a type on the left side that converts to `Unstructured`.
    template <class Source, detail::EnableIfDataSource<Source> = 0>
    friend bool operator==(Source const& source, Unstructured const& data) {
        return data.operator==(source);
    }
    template <class Source, detail::EnableIfDataSource<Source> = 0>
    friend bool operator!=(Source const& source, Unstructured const& data) {
        return data.operator!=(source);
    }

    /// A copy of `map` without its empty maps, arrays and strings. Only the top level is filtered.
    /// Null and zero are not empty.
    TARN_API static Map removeEmptyValues(Map const& map);

private:
    // A map or array with its depth. Neither its content nor the depth changes once it is here, so
    // deep trees are recognised without a traversal.
    template <class T>
    struct Node {
        T content;
        std::uint32_t height;
    };

    // Maps, arrays and strings are on the heap: the variant is two words, which is what an array of
    // numbers takes for each element, and moving it is a plain copy.
    using Storage = boost::variant<std::nullptr_t, Node<Map>*, Node<Array>*, double, long long,
                                   unsigned long long, std::string*>;

    bool ownsContent() const {
        constexpr unsigned kOwning =
            1u << unsigned(Type::Map) | 1u << unsigned(Type::Array) | 1u << unsigned(Type::String);
        return (kOwning >> unsigned(storage.which()) & 1u) != 0;
    }
    template <class T>
    Node<T>* node() const {
        Node<T>* const* pointer = boost::get<Node<T>*>(&storage);
        return pointer == nullptr ? nullptr : *pointer;
    }
    template <class T>
    T const* content() const {
        Node<T> const* const found = node<T>();
        return found == nullptr ? nullptr : &found->content;
    }
    std::uint32_t height() const;
    bool isDeep() const;
    Unstructured const* findOfKind(Steps path, bool (*isKind)(Unstructured const&),
                                   Lookup* lookup) const noexcept;
    template <class T>
    static Storage makeStorage(T&& content);
    template <class T>
    static Storage copyStorage(Node<T> const& node);
    static void copyDeep(Unstructured const& from, Unstructured& to);
    inline static bool equalElements(Unstructured const& a, Unstructured const& b);
    inline static bool equalMaps(Map const& a, Map const& b);
    inline static bool equalArrays(Array const& a, Array const& b);
    static bool equalDeep(Unstructured const& a, Unstructured const& b);
    Unstructured* lastElement() const;
    void dropLastElement();
    void emptyDeep() noexcept;
    // Sets this to null without destroying the content, which the caller has taken over.
    void forget() noexcept { ::new (static_cast<void*>(&storage)) Storage(nullptr); }
    TARN_API Storage copiedContent() const;
    TARN_API void destroyContent() noexcept;

    Storage storage;
};

/// The name of a kind, for people: "null", "map", "array", "float", "integer", "unsigned integer"
/// or "string"; "Unstructured::Type(77)" for an undefined enumerator.
TARN_API std::string to_string(Unstructured::Type kind);

/// Writes that name.
TARN_API std::ostream& operator<<(std::ostream& stream, Unstructured::Type kind);

}  // namespace tarn::engine

#endif
