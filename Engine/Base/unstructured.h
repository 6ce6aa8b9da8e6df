// Engine/Base/unstructured.h: free-form data, a tree of maps, arrays, numbers and strings.
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

/// A value in the manner of JSON, with two kinds of integers and no boolean of its own (truth
/// is the integer 1 or 0). It owns its subtree: a copy is deep, a move takes constant time, cannot
/// fail and leaves null behind. No conversion fails: what has no meaning is zero, false or empty.
/// A tree may be of any depth: nothing here uses more stack for a deep one. Copies and comparisons
/// of trees of more than 256 levels allocate a list of what is still to do; destruction never does.
/// For that a tree counts its levels when it takes a map or an array over: from then on no element
/// may be changed through a reference from before.
///
/// An `Array` in braces is an element: `Array{array}` has one, `Array(array)` is the copy.
class Unstructured {
public:
    /// An object, ordered by the bytes of its keys, and a list.
    using Map = std::map<std::string, Unstructured>;
    using Array = std::vector<Unstructured>;

    /// The kinds, numbered as the alternatives of the union.
    enum class Type : unsigned char {
        Null = 0,
        Map = 1,
        Array = 2,
        Float = 3,
        Integer = 4,
        UnsignedInteger = 5,
        String = 6,
    };

    /// One step from data to a part of it: the key of a map, or the position in an array. Made
    /// implicitly, to be written in the braces of a path: `{"render", "size", 0}`.
    class Step {
    public:
        /// To the element of a map with this key; a null pointer is the empty one.
        Step(char const* mapKey) : key(mapKey == nullptr ? "" : mapKey), isKey(true) {}
        Step(std::string mapKey) : key(std::move(mapKey)), isKey(true) {}
        /// To the element of an array at this position. A negative one is that of no element.
        template <class Integer, std::enable_if_t<detail::isInteger<Integer>, int> = 0>
        Step(Integer arrayPosition) : position(positionOf(arrayPosition)) {}

    private:
        friend class Unstructured;
        // That of no element where it is negative, or more than can be addressed.
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
    /// A path of such steps, from the outside to the inside.
    using Steps = std::initializer_list<Step>;

    /// What a lookup along a path found.
    enum class Lookup : unsigned char {
        /// Something of the kind that was asked for.
        Found = 0,
        /// Nothing.
        Missing = 1,
        /// Something of another kind, null included.
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
    /// Every other integer type, by its sign; a boolean or a character is neither.
    template <class Integer, std::enable_if_t<detail::isOtherInteger<Integer>, int> = 0>
    Unstructured(Integer integer)
        : Unstructured(static_cast<std::conditional_t<std::is_signed_v<Integer>, long long,
                                                      unsigned long long>>(integer)) {}
    /// As `value.asUnstructured()`.
    TARN_API Unstructured(Value const& value);

    template <class Source, std::enable_if_t<detail::isNoDataSource<Source>, int> = 0>
    Unstructured(Source) = delete;
    Unstructured(std::nullptr_t) = delete;

    /// The whole tree, copied; or taken over in constant time, null being left behind.
    TARN_API_INLINE Unstructured(Unstructured const& other)
        : storage(other.ownsContent() ? other.copiedContent() : other.storage) {}
    TARN_API_INLINE Unstructured(Unstructured&& other) noexcept
        : storage(std::move(other.storage)) {
        other.forget();
    }
    /// A failing allocation leaves this as it was. What is assigned may be a part of this; a whole
    /// may be copied, but not moved, into a part of itself.
    TARN_API Unstructured& operator=(Unstructured const& other);
    TARN_API Unstructured& operator=(Unstructured&& other) noexcept;
    TARN_API_INLINE ~Unstructured() {
        if (ownsContent()) destroyContent();
    }

    /// Null, by name.
    TARN_API_INLINE static Unstructured Undefined() { return Unstructured(); }

    /// The kind of this value. Constant time.
    TARN_API_INLINE Type type() const noexcept { return Type(storage.which()); }

    /// Copies of the content, empty for every other kind. `ifMap`, `ifArray` and `ifString` copy
    /// nothing.
    TARN_API Map asMap() const;
    TARN_API Array asArray() const;
    TARN_API std::string asString() const;

    /// The signed number, or the floating-point one (towards zero and kept in range, NaN as 0, for
    /// an integer). Deliberate: an unsigned number is an identifier and reads as 0 in both.
    TARN_API long long asInteger() const;
    TARN_API_INLINE double asFloat() const {
        if (double const* number = boost::get<double>(&storage)) return *number;
        if (long long const* integer = boost::get<long long>(&storage)) {
            return static_cast<double>(*integer);
        }
        return 0.0;
    }
    /// Deliberate: every map and every array is true, empty ones included; a string when it is not
    /// empty, a number when it is not zero.
    TARN_API bool asBool() const;
    /// The unsigned number, the signed one's bits, or the floating-point one towards zero and
    /// kept in range; else 0.
    TARN_API unsigned long long asId() const;

    /// The content in place, or null for every other kind. Lives until this is assigned to,
    /// moved from or destroyed.
    TARN_API_INLINE Map const* ifMap() const { return content<Map>(); }
    TARN_API_INLINE Array const* ifArray() const { return content<Array>(); }
    TARN_API_INLINE std::string const* ifString() const {
        std::string* const* text = boost::get<std::string*>(&storage);
        return text == nullptr ? nullptr : *text;
    }

    /// Whether this is of that kind. A number is a floating-point or a signed one: what `asFloat`
    /// reads, and not an identifier (an unsigned integer). Constant time.
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

    /// The element of a map with this key, the element of an array at this position, or what a path
    /// of both leads to; null where there is none, and for data of another kind. An empty path
    /// leads to this itself. Lives as the content in place does. Copies nothing.
    TARN_API Unstructured const* find(std::string const& key) const noexcept;
    TARN_API Unstructured const* find(std::size_t position) const noexcept;
    TARN_API Unstructured const* find(Steps path) const noexcept;

    /// What is at the end of the path, or `otherwise` where it leads nowhere or to data of another
    /// kind; `lookup`, where it is given, says which. A number is as in `isNumber`; an integer is a
    /// signed one, or a floating-point number without a fraction that fits; a truth is the integer
    /// 1 or 0.
    TARN_API double numberAt(Steps path, double otherwise, Lookup* lookup = nullptr) const noexcept;
    TARN_API long long integerAt(Steps path, long long otherwise,
                                 Lookup* lookup = nullptr) const noexcept;
    TARN_API bool boolAt(Steps path, bool otherwise, Lookup* lookup = nullptr) const noexcept;
    TARN_API std::string stringAt(Steps path, std::string otherwise,
                                  Lookup* lookup = nullptr) const;

    /// A string for people, on one line, in the manner of JSON: `{"id": 7u, "size": [80.0, 50.5]}`.
    /// Kinds can be told apart: a floating-point number has a point, an exponent or is "nan" or
    /// "inf", an unsigned one ends in "u", null is "null". Strings are in quotes, in UTF-8: control
    /// characters and bytes that are none stand as "\\n", "\\t", "\\r" or "\\x1f".
    ///
    /// `maxDepth` levels of maps and arrays are shown; a deeper one is "{...}" or "[...]", unless
    /// it is empty. The string has at most `maxBytes` bytes: what would be longer ends in "..."
    /// there. The cost follows the string, not the tree; nothing recurses.
    TARN_API std::string toText(std::size_t maxBytes = 4096, std::size_t maxDepth = 16) const;

    /// A map is read by its keys "X", "Y", "Z" and "W", an array by position; each element
    /// counts as its `asFloat()`, and what is missing as 0. A floating-point or signed number
    /// fills every component. Everything else is zero. Nothing is allocated.
    TARN_API operator FloatVec2() const;
    TARN_API operator FloatVec3() const;
    TARN_API operator FloatVec4() const;

    /// The same kind with equal content, deeply: 1, 1u and 1.0 are three different things.
    TARN_API bool operator==(Unstructured const& other) const;
    TARN_API bool operator!=(Unstructured const& other) const;
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
    TARN_API static Map removeEmptyValues(Map const& map);

private:
    // A map or array with the number of levels from it downwards. Content never changes once it
    // is here, so neither does the number; with it, deep trees are known before they are entered.
    template <class T>
    struct Node {
        T content;
        std::uint32_t height;
    };

    // Maps, arrays and strings are on the heap and owned: that keeps the union at two words, which
    // arrays of numbers pay for each element, and moving it a plain copy.
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
    static bool equalDeep(Unstructured const& a, Unstructured const& b);
    Unstructured* lastElement() const;
    void dropLastElement();
    void emptyDeep() noexcept;
    // Afterwards this is null. Whoever calls it has taken the content over.
    void forget() noexcept { ::new (static_cast<void*>(&storage)) Storage(nullptr); }
    TARN_API Storage copiedContent() const;
    TARN_API void destroyContent() noexcept;

    Storage storage;
};

/// The name of a kind, for people: "null", "map", "array", "float", "integer", "unsigned integer"
/// or "string"; "Unstructured::Type(77)" for what is no enumerator.
TARN_API std::string to_string(Unstructured::Type kind);

/// Writes that name.
TARN_API std::ostream& operator<<(std::ostream& stream, Unstructured::Type kind);

}  // namespace tarn::engine

#endif
