#include <Engine/Base/value.h>

#include <Engine/Base/detail/immortal.h>
#include <Engine/Base/detail/number_text.h>
#include <Engine/Base/detail/truncate.h>
#include <Engine/Base/detail/unreachable.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>

#include <boost/variant/apply_visitor.hpp>
#include <boost/variant/get.hpp>
#include <boost/variant/static_visitor.hpp>

#include <array>
#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <initializer_list>
#include <iterator>
#include <ostream>
#include <string_view>
#include <utility>

namespace tarn::engine {

namespace {

// This assertion message always ends in line 161, wherever the check moves, because crash reports
// are grouped by the whole message.
constexpr int kResourceTypeLine = 161;

constexpr FloatMat4 FloatMat4Identity{{1, 0, 0, 0,  //
                                       0, 1, 0, 0,  //
                                       0, 0, 1, 0,  //
                                       0, 0, 0, 1}};

// Names indexed by enumerator.
constexpr std::array<std::string_view, 14> kTypeNames{
    "float", "vec2",  "vec3",  "vec4", "mat4",   "boolean", "int",
    "image", "video", "sound", "path", "string", "model",   "unstructured"};
static_assert(kTypeNames.size() == std::size_t(Type::Unstructured) + 1);

// A set of types as bits. Undefined enumerators are in no set.
constexpr unsigned setOf(std::initializer_list<Type> types) {
    unsigned bits = 0;
    for (Type const type : types) bits |= 1u << unsigned(type);
    return bits;
}
constexpr unsigned kAllTypes = (1u << kTypeNames.size()) - 1;
constexpr unsigned kResourceTypes = setOf({Type::Image, Type::Video, Type::Sound, Type::Model});
constexpr unsigned kCopiedTypes = kAllTypes & ~setOf({Type::Path, Type::Model, Type::Unstructured});

bool contains(unsigned types, Type type) {
    return std::size_t(type) < kTypeNames.size() && (types >> unsigned(type) & 1u) != 0;
}

bool hasElements(std::shared_ptr<Path const> const& path) {
    return path && !path->elements.empty();
}

// The number that the whole string represents; otherwise 1, and 0 for an empty string.
double numberFromString(std::shared_ptr<std::string const> const& text) {
    if (!text) return 0.0;
    int const errorBefore = errno;
    char* parsedTo = nullptr;
    double const number = std::strtod(text->c_str(), &parsedTo);
    errno = errorBefore;
    // For the empty string this is 0: all of nothing was parsed.
    return parsedTo == text->c_str() + text->size() ? number : 1.0;
}

struct AsInteger : boost::static_visitor<long long> {
    long long operator()(long long i) const { return i; }
    long long operator()(double d) const { return detail::truncate<long long>(d); }
    long long operator()(FloatVec2 const& v) const { return detail::truncate<long long>(v.x); }
    long long operator()(FloatVec3 const& v) const { return detail::truncate<long long>(v.x); }
    long long operator()(FloatVec4 const& v) const { return detail::truncate<long long>(v.x); }
    long long operator()(std::shared_ptr<FloatMat4 const> const&) const { return 0; }
    long long operator()(bool b) const { return b ? 1 : 0; }
    template <Type resource>
    long long operator()(Value::ResourceID<resource> resourceId) const {
        return resourceId.id != 0 ? 1 : 0;
    }
    long long operator()(std::shared_ptr<Path const> const& p) const {
        return hasElements(p) ? 1 : 0;
    }
    long long operator()(std::shared_ptr<Unstructured const> const& u) const {
        return u ? u->asInteger() : 0;
    }
    long long operator()(std::shared_ptr<std::string const> const& s) const {
        return detail::truncate<long long>(numberFromString(s));
    }
    template <class T>
    long long operator()(T const&) const = delete;
};

struct AsDouble : boost::static_visitor<double> {
    double operator()(long long i) const { return static_cast<double>(i); }
    double operator()(double d) const { return d; }
    double operator()(FloatVec2 const& v) const { return v.x; }
    double operator()(FloatVec3 const& v) const { return v.x; }
    double operator()(FloatVec4 const& v) const { return v.x; }
    double operator()(std::shared_ptr<FloatMat4 const> const&) const { return 0.0; }
    double operator()(bool b) const { return b ? 1.0 : 0.0; }
    template <Type resource>
    double operator()(Value::ResourceID<resource> resourceId) const {
        return resourceId.id != 0 ? 1.0 : 0.0;
    }
    double operator()(std::shared_ptr<Path const> const& p) const {
        return hasElements(p) ? 1.0 : 0.0;
    }
    double operator()(std::shared_ptr<Unstructured const> const& u) const {
        return u ? u->asFloat() : 0.0;
    }
    double operator()(std::shared_ptr<std::string const> const& s) const {
        return numberFromString(s);
    }
    template <class T>
    double operator()(T const&) const = delete;
};

struct IsTrue : boost::static_visitor<bool> {
    bool operator()(long long i) const { return i != 0; }
    bool operator()(double d) const { return d != 0.0; }  // A NaN is true.
    bool operator()(FloatVec2 const& v) const { return v.x != 0.0 || v.y != 0.0; }
    bool operator()(FloatVec3 const& v) const { return v.x != 0.0 || v.y != 0.0 || v.z != 0.0; }
    bool operator()(FloatVec4 const& v) const {
        return v.x != 0.0 || v.y != 0.0 || v.z != 0.0 || v.w != 0.0;
    }
    bool operator()(std::shared_ptr<FloatMat4 const> const&) const { return false; }
    bool operator()(bool b) const { return b; }
    template <Type resource>
    bool operator()(Value::ResourceID<resource> resourceId) const {
        return resourceId.id != 0;
    }
    bool operator()(std::shared_ptr<Path const> const& p) const { return hasElements(p); }
    bool operator()(std::shared_ptr<Unstructured const> const& u) const { return u && u->asBool(); }
    bool operator()(std::shared_ptr<std::string const> const& s) const { return s && !s->empty(); }
    template <class T>
    bool operator()(T const&) const = delete;
};

struct AsId : boost::static_visitor<unsigned long long> {
    unsigned long long operator()(long long) const { return 0; }
    unsigned long long operator()(double) const { return 0; }
    unsigned long long operator()(FloatVec2 const&) const { return 0; }
    unsigned long long operator()(FloatVec3 const&) const { return 0; }
    unsigned long long operator()(FloatVec4 const&) const { return 0; }
    unsigned long long operator()(std::shared_ptr<FloatMat4 const> const&) const { return 0; }
    unsigned long long operator()(bool) const { return 0; }
    template <Type resource>
    unsigned long long operator()(Value::ResourceID<resource> resourceId) const {
        return resourceId.id;
    }
    unsigned long long operator()(std::shared_ptr<Path const> const&) const { return 0; }
    unsigned long long operator()(std::shared_ptr<Unstructured const> const& u) const {
        return u ? u->asId() : 0;
    }
    unsigned long long operator()(std::shared_ptr<std::string const> const&) const { return 0; }
    template <class T>
    unsigned long long operator()(T const&) const = delete;
};

FloatVec2 spread(double d, FloatVec2) { return {d, d}; }
FloatVec3 spread(double d, FloatVec3) { return {d, d, d}; }
FloatVec4 spread(double d, FloatVec4) { return {d, d, d, d}; }

FloatVec2 resize(FloatVec4 const& v, FloatVec2) { return {v.x, v.y}; }
FloatVec3 resize(FloatVec4 const& v, FloatVec3) { return {v.x, v.y, v.z}; }
FloatVec4 resize(FloatVec4 const& v, FloatVec4) { return v; }

template <class Vector>
struct AsVector : boost::static_visitor<Vector> {
    Vector operator()(long long i) const { return spread(static_cast<double>(i), Vector()); }
    Vector operator()(double d) const { return spread(d, Vector()); }
    Vector operator()(FloatVec2 const& v) const { return resize({v.x, v.y, 0, 0}, Vector()); }
    Vector operator()(FloatVec3 const& v) const { return resize({v.x, v.y, v.z, 0}, Vector()); }
    Vector operator()(FloatVec4 const& v) const { return resize(v, Vector()); }
    Vector operator()(std::shared_ptr<FloatMat4 const> const&) const { return {}; }
    Vector operator()(bool b) const { return spread(b ? 1.0 : 0.0, Vector()); }
    template <Type resource>
    Vector operator()(Value::ResourceID<resource>) const {
        return {};
    }
    Vector operator()(std::shared_ptr<Path const> const&) const { return {}; }
    Vector operator()(std::shared_ptr<Unstructured const> const& u) const {
        return u ? u->operator Vector() : Vector();
    }
    Vector operator()(std::shared_ptr<std::string const> const&) const { return {}; }
    template <class T>
    Vector operator()(T const&) const = delete;
};

struct AsUnstructured : boost::static_visitor<Unstructured> {
    Unstructured operator()(long long i) const { return i; }
    Unstructured operator()(double d) const { return d; }
    Unstructured operator()(FloatVec2 const& v) const {
        return Unstructured::Map{{"X", v.x}, {"Y", v.y}};
    }
    Unstructured operator()(FloatVec3 const& v) const {
        return Unstructured::Map{{"X", v.x}, {"Y", v.y}, {"Z", v.z}};
    }
    Unstructured operator()(FloatVec4 const& v) const {
        return Unstructured::Map{{"X", v.x}, {"Y", v.y}, {"Z", v.z}, {"W", v.w}};
    }
    Unstructured operator()(std::shared_ptr<FloatMat4 const> const&) const { return {}; }
    Unstructured operator()(bool b) const { return b ? 1LL : 0LL; }
    template <Type resource>
    Unstructured operator()(Value::ResourceID<resource>) const {
        return {};
    }
    Unstructured operator()(std::shared_ptr<Path const> const&) const { return {}; }
    Unstructured operator()(std::shared_ptr<Unstructured const> const& u) const {
        return u ? *u : Unstructured();
    }
    Unstructured operator()(std::shared_ptr<std::string const> const& s) const {
        return s ? *s : std::string();
    }
    template <class T>
    Unstructured operator()(T const&) const = delete;
};

struct AppendText : boost::static_visitor<void> {
    explicit AppendText(std::string& appendedTo) : text(appendedTo) {}

    void operator()(long long i) const {
        std::uint64_t const bits = static_cast<std::uint64_t>(i);
        integer(i < 0 ? 0 - bits : bits, i < 0);
    }
    void operator()(double d) const { detail::appendNumber(text, d); }
    void operator()(FloatVec2 const& v) const { list({v.x, v.y}); }
    void operator()(FloatVec3 const& v) const { list({v.x, v.y, v.z}); }
    void operator()(FloatVec4 const& v) const { list({v.x, v.y, v.z, v.w}); }
    void operator()(std::shared_ptr<FloatMat4 const> const& m) const {
        for (std::size_t i = 0; m && i < std::size(m->elements); ++i) {
            detail::appendNumber(text, m->elements[i]);
            text += i % 4 == 3 ? " \n" : " ";
        }
    }
    void operator()(bool b) const { text += b ? '1' : '0'; }
    template <Type resource>
    void operator()(Value::ResourceID<resource> resourceId) const {
        integer(resourceId.id, false);
    }
    void operator()(std::shared_ptr<Path const> const& p) const {
        text += hasElements(p) ? "Path" : "Empty Path";
    }
    void operator()(std::shared_ptr<Unstructured const> const& u) const {
        std::string const* const held = u ? u->ifString() : nullptr;
        text += held ? std::string_view(*held) : "unstructured";
    }
    void operator()(std::shared_ptr<std::string const> const& s) const {
        if (s) text += *s;
    }
    template <class T>
    void operator()(T const&) const = delete;

private:
    void integer(std::uint64_t magnitude, bool isNegative) const {
        detail::appendInteger(text, magnitude, isNegative);
    }
    void list(std::initializer_list<double> numbers) const {
        char const* separator = "";
        for (double const number : numbers) {
            text += separator;
            detail::appendNumber(text, number);
            separator = ", ";
        }
    }

    std::string& text;
};

// Deliberate: 0.0 and -0.0 differ, and a NaN equals itself.
bool payloadsEqual(FloatMat4 const& a, FloatMat4 const& b) {
    // NOLINTNEXTLINE(bugprone-suspicious-memory-comparison,cert-exp42-c,cert-flp37-c)
    return std::memcmp(&a, &b, sizeof(FloatMat4)) == 0;
}
template <class T>
bool payloadsEqual(T const& a, T const& b) {
    return a == b;
}

template <class T>
bool payloadsEqual(std::shared_ptr<T const> const& left, std::shared_ptr<T const> const& right) {
    T const* const a = left.get();
    T const* const b = right.get();
    return a == b || (a != nullptr && b != nullptr && payloadsEqual(*a, *b));
}

std::uint64_t combine(std::uint64_t seed, std::uint64_t word) {
    seed ^= word + 0x9e3779b97f4a7c15 + (seed << 6) + (seed >> 2);
    return seed;
}

// Equal for equal numbers, so for both zeros.
std::uint64_t wordOf(double d) {
    std::uint64_t word = 0;
    if (d != 0.0) std::memcpy(&word, &d, sizeof word);
    return word;
}

struct HashOf : boost::static_visitor<std::uint64_t> {
    std::uint64_t operator()(long long i) const { return static_cast<std::uint64_t>(i); }
    std::uint64_t operator()(double d) const { return wordOf(d); }
    std::uint64_t operator()(FloatVec2 const& v) const { return combine(wordOf(v.x), wordOf(v.y)); }
    std::uint64_t operator()(FloatVec3 const& v) const {
        return combine((*this)(FloatVec2{v.x, v.y}), wordOf(v.z));
    }
    std::uint64_t operator()(FloatVec4 const& v) const {
        return combine((*this)(FloatVec3{v.x, v.y, v.z}), wordOf(v.w));
    }
    std::uint64_t operator()(std::shared_ptr<FloatMat4 const> const& m) const {
        std::uint64_t hash = 0;
        for (std::size_t i = 0; m && i < std::size(m->elements); ++i) {
            std::uint64_t word = 0;
            std::memcpy(&word, &m->elements[i], sizeof word);
            hash = combine(hash, word);
        }
        return hash;
    }
    std::uint64_t operator()(bool b) const { return b ? 1 : 0; }
    template <Type resource>
    std::uint64_t operator()(Value::ResourceID<resource> resourceId) const {
        return resourceId.id;
    }
    std::uint64_t operator()(std::shared_ptr<Path const> const& p) const {
        std::uint64_t hash = 0;
        if (!p) return hash;
        for (PathElement const& element : p->elements) {
            hash = combine(hash, std::uint64_t(element.instruction));
            for (FloatVec2 const& point : element.points) hash = combine(hash, (*this)(point));
        }
        return hash;
    }
    std::uint64_t operator()(std::shared_ptr<Unstructured const> const& u) const {
        if (!u) return 0;
        std::uint64_t hash = ofElement(*u);
        if (Unstructured::Map const* map = u->ifMap()) {
            for (auto const& entry : *map) {
                hash = combine(combine(hash, ofText(entry.first)), ofElement(entry.second));
            }
        }
        if (Unstructured::Array const* array = u->ifArray()) {
            for (Unstructured const& element : *array) hash = combine(hash, ofElement(element));
        }
        return hash;
    }
    std::uint64_t operator()(std::shared_ptr<std::string const> const& s) const {
        return s ? ofText(*s) : 0;
    }
    template <class T>
    std::uint64_t operator()(T const&) const = delete;

private:
    static std::uint64_t ofText(std::string const& text) { return std::hash<std::string>()(text); }

    // Without the elements of a map or an array: data may be of any depth.
    static std::uint64_t ofElement(Unstructured const& element) {
        std::uint64_t content = element.asId();
        if (auto const* map = element.ifMap()) content = map->size();
        if (auto const* array = element.ifArray()) content = array->size();
        if (auto const* text = element.ifString()) content = ofText(*text);
        if (element.type() == Unstructured::Type::Float) content = wordOf(element.asFloat());
        return combine(std::uint64_t(element.type()), content);
    }
};

// A pointer to the payload, plain or shared; null where the value has another type.
template <class T>
T const* inside(std::shared_ptr<T const> const* held) {
    return held != nullptr ? held->get() : nullptr;
}
template <class T>
std::shared_ptr<T const> shared(std::shared_ptr<T const> const* held) {
    return held != nullptr ? *held : nullptr;
}

}  // namespace

std::string typeToString(Type type) {
    if (std::size_t(type) >= kTypeNames.size()) {
        TARN_ENGINE_BASE_UNREACHABLE("Engine/Base/value");
    }
    return std::string(kTypeNames[std::size_t(type)]);
}

Optional<Type> stringToType(std::string const& name) {
    for (std::size_t i = 0; i < kTypeNames.size(); ++i) {
        if (kTypeNames[i] == name) return Type(i);
    }
    return std::nullopt;
}

bool typeIsResource(Type type) { return contains(kResourceTypes, type); }

bool typeShouldCopyAcrossDeletedConnections(Type type) { return contains(kCopiedTypes, type); }

Value::Value(FloatMat4 const& matrix) : storage(std::make_shared<FloatMat4 const>(matrix)) {}
Value::Value(char const* text)
    : storage(std::make_shared<std::string const>(text == nullptr ? "" : text)) {}
Value::Value(std::string text) : storage(std::make_shared<std::string const>(std::move(text))) {}
Value::Value(Path path) : storage(std::make_shared<Path const>(std::move(path))) {}
Value::Value(std::shared_ptr<Path const> path) noexcept : storage(std::move(path)) {}
Value::Value(Unstructured tree) : storage(std::make_shared<Unstructured const>(std::move(tree))) {}
Value::Value(std::shared_ptr<Unstructured const> tree) noexcept : storage(std::move(tree)) {}

Value::Value(unsigned long long id, Type type) {
    switch (type) {
        case Type::Image: storage = ImageID{id}; return;
        case Type::Video: storage = VideoID{id}; return;
        case Type::Sound: storage = SoundID{id}; return;
        case Type::Model: storage = ModelID{id}; return;
        case Type::Float:
        case Type::Vec2:
        case Type::Vec3:
        case Type::Vec4:
        case Type::Mat4:
        case Type::Boolean:
        case Type::Int:
        case Type::Path:
        case Type::String:
        case Type::Unstructured: break;
    }
    TARN_ENGINE_BASE_UNREACHABLE_AT("Engine/Base/value", kResourceTypeLine);
}

Value Value::Image(unsigned long long id) { return Value(id, Type::Image); }
Value Value::Video(unsigned long long id) { return Value(id, Type::Video); }
Value Value::Sound(unsigned long long id) { return Value(id, Type::Sound); }
Value Value::Model(unsigned long long id) { return Value(id, Type::Model); }

Value Value::defaultValue(Type type) { return defaultValue(type, 0); }

Value Value::defaultValue(Type type, unsigned char qualifier) {
    switch (type) {
        case Type::Float: return 0.0;
        case Type::Vec2: return FloatVec2();
        case Type::Vec3: return FloatVec3();
        case Type::Vec4: return FloatVec4{0.0, 0.0, 0.0, qualifier == 4 ? 1.0 : 0.0};
        case Type::Mat4: return FloatMat4Identity;
        case Type::Boolean: return false;
        case Type::Int: return 0LL;
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::Model: return Value(0, type);
        case Type::Path: return Path();
        case Type::String: return std::string();
        case Type::Unstructured: return Unstructured::Undefined();
    }
    TARN_ENGINE_BASE_UNREACHABLE("Engine/Base/value");
}

Value::operator long long() const noexcept { return boost::apply_visitor(AsInteger(), storage); }
double Value::readDouble() const noexcept { return boost::apply_visitor(AsDouble(), storage); }
Value::operator bool() const noexcept { return boost::apply_visitor(IsTrue(), storage); }
Value::operator unsigned long long() const noexcept {
    return boost::apply_visitor(AsId(), storage);
}
Value::operator FloatVec2() const noexcept {
    return boost::apply_visitor(AsVector<FloatVec2>(), storage);
}
Value::operator FloatVec3() const noexcept {
    return boost::apply_visitor(AsVector<FloatVec3>(), storage);
}
Value::operator FloatVec4() const noexcept {
    return boost::apply_visitor(AsVector<FloatVec4>(), storage);
}

Value::operator FloatMat4() const noexcept {
    FloatMat4 const* const matrix = asFloatMat4();
    return matrix ? *matrix : FloatMat4Identity;
}

Value::operator Path() const {
    Path const* const path = ifPath();
    return path ? *path : Path();
}

Value::operator std::string() const {
    if (Unstructured const* tree = ifUnstructured()) {
        return tree->ifString() ? *tree->ifString() : "??";
    }
    return type() == Type::Unstructured ? "??" : to_string(*this);
}

Unstructured Value::asUnstructured() const {
    return boost::apply_visitor(AsUnstructured(), storage);
}

FloatMat4 const* Value::asFloatMat4() const noexcept {
    return inside(boost::get<std::shared_ptr<FloatMat4 const>>(&storage));
}
Path const* Value::ifPath() const noexcept {
    return inside(boost::get<std::shared_ptr<Path const>>(&storage));
}
std::string const* Value::ifString() const noexcept {
    return inside(boost::get<std::shared_ptr<std::string const>>(&storage));
}
Unstructured const* Value::ifUnstructured() const noexcept {
    return inside(boost::get<std::shared_ptr<Unstructured const>>(&storage));
}

std::shared_ptr<FloatMat4 const> Value::sharedFloatMat4() const noexcept {
    return shared(boost::get<std::shared_ptr<FloatMat4 const>>(&storage));
}
std::shared_ptr<Path const> Value::sharedPath() const noexcept {
    return shared(boost::get<std::shared_ptr<Path const>>(&storage));
}
std::shared_ptr<std::string const> Value::sharedString() const noexcept {
    return shared(boost::get<std::shared_ptr<std::string const>>(&storage));
}
std::shared_ptr<Unstructured const> Value::sharedUnstructured() const noexcept {
    return shared(boost::get<std::shared_ptr<Unstructured const>>(&storage));
}

Value Value::asType(Type type) const {
    switch (type) {
        case Type::Float: return operator double();
        case Type::Vec2: return operator FloatVec2();
        case Type::Vec3: return operator FloatVec3();
        case Type::Vec4: return operator FloatVec4();
        case Type::Mat4: return operator FloatMat4();
        case Type::Boolean: return operator bool();
        case Type::Int: return operator long long();
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::Model: return Value(operator unsigned long long(), type);
        case Type::Path: return operator Path();
        case Type::String: return operator std::string();
        case Type::Unstructured: return Value(Unstructured(*this));
    }
    TARN_ENGINE_BASE_UNREACHABLE("Engine/Base/value");
}

TARN_FLATTEN bool Value::contentEquals(Value const& other) const {
    int const alternative = storage.which();
    if (other.storage.which() != alternative) return false;
    auto const same = [&](auto const* left) {
        return payloadsEqual(*left, *boost::get<std::decay_t<decltype(*left)>>(&other.storage));
    };
    switch (kTypes[alternative]) {
        case Type::Int: return same(boost::get<long long>(&storage));
        case Type::Float: return same(boost::get<double>(&storage));
        case Type::Vec2: return same(boost::get<FloatVec2>(&storage));
        case Type::Vec3: return same(boost::get<FloatVec3>(&storage));
        case Type::Vec4: return same(boost::get<FloatVec4>(&storage));
        case Type::Mat4: return same(boost::get<std::shared_ptr<FloatMat4 const>>(&storage));
        case Type::Boolean: return same(boost::get<bool>(&storage));
        case Type::Image: return same(boost::get<ImageID>(&storage));
        case Type::Video: return same(boost::get<VideoID>(&storage));
        case Type::Sound: return same(boost::get<SoundID>(&storage));
        case Type::Model: return same(boost::get<ModelID>(&storage));
        case Type::Path: return same(boost::get<std::shared_ptr<Path const>>(&storage));
        case Type::Unstructured:
            return same(boost::get<std::shared_ptr<Unstructured const>>(&storage));
        case Type::String: break;
    }
    return same(boost::get<std::shared_ptr<std::string const>>(&storage));
}

void appendText(std::string& text, Value const& value) {
    boost::apply_visitor(AppendText(text), value.storage);
}

std::string to_string(Value const& value) {
    std::string text;
    appendText(text, value);
    return text;
}

FloatMat4 const& detail::neutralMatrix() noexcept { return FloatMat4Identity; }
Path const& detail::neutralPath() noexcept {
    static Immortal<Path> const path;
    return path.value;
}
Unstructured const& detail::neutralData() noexcept {
    static Immortal<Unstructured> const null;
    return null.value;
}
std::string const& detail::neutralString() noexcept {
    static Immortal<std::string> const text;
    return text.value;
}

std::ostream& operator<<(std::ostream& stream, Value const& value) {
    return stream << to_string(value);
}

std::ostream& operator<<(std::ostream& stream, Type type) {
    if (std::size_t(type) >= kTypeNames.size()) return stream << "Type(" << int(type) << ")";
    return stream << kTypeNames[std::size_t(type)];
}

}  // namespace tarn::engine

std::size_t
std::hash<tarn::engine::Value>::operator()(tarn::engine::Value const& value) const noexcept {
    using namespace tarn::engine;
    std::uint64_t const all = combine(std::uint64_t(value.storage.which()),
                                      boost::apply_visitor(HashOf(), value.storage));
    // The lower half of a double is often zero, and `std::size_t` may have only 32 bits.
    return static_cast<std::size_t>(all ^ all >> 32);
}
