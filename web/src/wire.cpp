#include "wire.h"

#include <cstdlib>
#include <cstring>
#include <iterator>
#include <memory>
#include <utility>

using namespace tarn::engine;

namespace web {

namespace {

// A map or an array that is being written, and the position in it.
struct OpenForWriting {
    Unstructured::Map::const_iterator atKey;
    Unstructured::Map::const_iterator lastKey;
    Unstructured::Array::const_iterator at;
    Unstructured::Array::const_iterator last;
};

// A map or an array that is being read.
struct OpenForReading {
    bool isMap;
    std::size_t missing;
    std::string key;
    Unstructured::Map map;
    Unstructured::Array array;

    void add(Unstructured element) {
        --missing;
        if (isMap) {
            map.insert_or_assign(std::move(key), std::move(element));
        } else {
            array.push_back(std::move(element));
        }
    }
    Unstructured take() {
        return isMap ? Unstructured(std::move(map)) : Unstructured(std::move(array));
    }
};

// The minimal size: two identifiers, a type without bounds, a default without a payload, no name
// and no attributes.
constexpr std::size_t kSmallestPort = 8 + 8 + 5 + 1 + 4 + 5;

// Added to the type of a value with a null payload, which differs from its default.
constexpr unsigned char kNullPayload = 0x80;

bool isNullPayload(Value const& value) {
    switch (value.type()) {
        case Type::Mat4: return value.asFloatMat4() == nullptr;
        case Type::Path: return value.ifPath() == nullptr;
        case Type::String: return value.ifString() == nullptr;
        case Type::Unstructured: return value.ifUnstructured() == nullptr;
        default: return false;
    }
}

// A moved-from value.
Value nullPayload(Type type) {
    Value value = Value::defaultValue(type);
    Value const taken = std::move(value);
    return value;  // NOLINT(bugprone-use-after-move,clang-analyzer-cplusplus.Move)
}

OpenForWriting openMap(Unstructured::Map const& map) { return {map.begin(), map.end(), {}, {}}; }

}  // namespace

Writer& Writer::byte(unsigned char b) {
    bytes.push_back(static_cast<char>(b));
    return *this;
}

Writer& Writer::count(std::size_t n) {
    for (int shift = 0; shift < 32; shift += 8) byte(static_cast<unsigned char>(n >> shift));
    return *this;
}

Writer& Writer::number(double d) {
    std::uint64_t bits = 0;
    std::memcpy(&bits, &d, sizeof bits);
    return integer(bits);
}

Writer& Writer::integer(unsigned long long i) {
    for (int shift = 0; shift < 64; shift += 8) byte(static_cast<unsigned char>(i >> shift));
    return *this;
}

Writer& Writer::text(std::string_view s) {
    count(s.size());
    bytes += s;
    return *this;
}

Writer& Writer::data(Unstructured const& tree) {
    std::vector<OpenForWriting> open;
    Unstructured const* next = &tree;
    while (next != nullptr) {
        byte(static_cast<unsigned char>(next->type()));
        switch (next->type()) {
            case Unstructured::Type::Null: break;
            case Unstructured::Type::Map:
                count(next->size());
                open.push_back(openMap(*next->ifMap()));
                break;
            case Unstructured::Type::Array:
                count(next->size());
                open.push_back({{}, {}, next->ifArray()->begin(), next->ifArray()->end()});
                break;
            case Unstructured::Type::Float: number(next->asFloat()); break;
            case Unstructured::Type::Integer:
                integer(static_cast<unsigned long long>(next->asInteger()));
                break;
            case Unstructured::Type::UnsignedInteger: integer(next->asId()); break;
            case Unstructured::Type::String: text(*next->ifString()); break;
        }
        next = nullptr;
        while (!open.empty() && next == nullptr) {
            OpenForWriting& top = open.back();
            if (top.atKey != top.lastKey) {
                text(top.atKey->first);
                next = &top.atKey++->second;
            } else if (top.at != top.last) {
                next = &*top.at++;
            } else {
                open.pop_back();
            }
        }
    }
    return *this;
}

Writer& Writer::data(Unstructured::Map const& map) {
    byte(static_cast<unsigned char>(Unstructured::Type::Map)).count(map.size());
    for (auto const& [key, element] : map) text(key).data(element);
    return *this;
}

Writer& Writer::path(Path const& path) {
    count(path.elements.size());
    for (PathElement const& element : path.elements) {
        byte(static_cast<unsigned char>(element.instruction)).count(element.points.size());
        for (FloatVec2 const& p : element.points) number(p.x).number(p.y);
    }
    return *this;
}

Writer& Writer::value(Value const& value) {
    auto const type = static_cast<unsigned char>(value.type());
    if (isNullPayload(value)) return byte(type | kNullPayload);
    byte(type);
    struct Content {
        Writer& out;
        void operator()(double d) const { out.number(d); }
        void operator()(long long i) const { out.integer(static_cast<unsigned long long>(i)); }
        void operator()(bool b) const { out.byte(b ? 1 : 0); }
        void operator()(FloatVec2 const& v) const { out.number(v.x).number(v.y); }
        void operator()(FloatVec3 const& v) const { out.number(v.x).number(v.y).number(v.z); }
        void operator()(FloatVec4 const& v) const {
            out.number(v.x).number(v.y).number(v.z).number(v.w);
        }
        void operator()(FloatMat4 const& matrix) const {
            double numbers[16];
            std::memcpy(numbers, &matrix, sizeof numbers);
            for (double const d : numbers) out.number(d);
        }
        void operator()(Path const& path) const { out.path(path); }
        void operator()(Unstructured const& tree) const { out.data(tree); }
        void operator()(std::string const& text) const { out.text(text); }
        void operator()(Value::ImageID const& resource) const { out.integer(resource.id); }
        void operator()(Value::VideoID const& resource) const { out.integer(resource.id); }
        void operator()(Value::SoundID const& resource) const { out.integer(resource.id); }
        void operator()(Value::ModelID const& resource) const { out.integer(resource.id); }
    };
    value.visit(Content{*this});
    return *this;
}

Writer& Writer::typeInfo(TypeInfo const& info) {
    byte(static_cast<unsigned char>(info.type)).byte(info.subtype);
    for (Optional<Value> const* bound : {&info.min, &info.max, &info.extra}) {
        byte(bound->hasValue() ? 1 : 0);
        if (*bound) value(**bound);
    }
    return *this;
}

Writer& Writer::port(Port const& port) {
    integer(port.id).integer(port.tag).typeInfo(port.typeInfo).value(port.defaultValue);
    return text(port.name).data(port.attributes);
}

Writer& Writer::ports(std::vector<Port> const& list) {
    count(list.size());
    for (Port const& element : list) port(element);
    return *this;
}

Writer& Writer::connection(Connection const& c) {
    return integer(c.fromPatchId).integer(c.fromPortId).integer(c.toPatchId).integer(c.toPortId);
}

Writer& Writer::modelLayer(ModelLayer const& layer) {
    integer(layer.id);
    for (auto const* list : {&layer.children, &layer.additionalLayers}) {
        count(list->size());
        for (ModelLayer const& element : *list) modelLayer(element);
    }
    return *this;
}

std::string_view Reader::take(std::size_t bytes) {
    if (bytes > rest.size()) std::abort();
    std::string_view const taken = rest.substr(0, bytes);
    rest.remove_prefix(bytes);
    return taken;
}

unsigned char Reader::byte() { return static_cast<unsigned char>(take(1)[0]); }

std::size_t Reader::count() {
    std::size_t n = 0;
    for (int shift = 0; shift < 32; shift += 8) n |= std::size_t(byte()) << shift;
    return n;
}

// Limited by the remaining bytes, so that reserving never wastes memory.
std::size_t Reader::countOf(std::size_t bytesOfEach) {
    std::size_t const n = count();
    if (n > rest.size() / bytesOfEach) std::abort();
    return n;
}

unsigned long long Reader::integer() {
    unsigned long long i = 0;
    for (int shift = 0; shift < 64; shift += 8)
        i |= static_cast<unsigned long long>(byte()) << shift;
    return i;
}

double Reader::number() {
    std::uint64_t const bits = integer();
    double d = 0.0;
    std::memcpy(&d, &bits, sizeof d);
    return d;
}

std::string Reader::text() { return std::string(take(count())); }

Unstructured Reader::data() {
    std::vector<OpenForReading> open;
    for (;;) {
        auto const kind = Unstructured::Type(byte());
        if (kind == Unstructured::Type::Map || kind == Unstructured::Type::Array) {
            bool const isMap = kind == Unstructured::Type::Map;
            open.push_back({isMap, countOf(isMap ? 5 : 1), {}, {}, {}});
        } else {
            Unstructured scalar = scalarData(kind);
            if (open.empty()) return scalar;
            open.back().add(std::move(scalar));
        }
        while (open.back().missing == 0) {
            Unstructured whole = open.back().take();
            open.pop_back();
            if (open.empty()) return whole;
            open.back().add(std::move(whole));
        }
        if (open.back().isMap) open.back().key = text();
    }
}

Unstructured Reader::scalarData(Unstructured::Type kind) {
    switch (kind) {
        case Unstructured::Type::Null: return {};
        case Unstructured::Type::Float: return number();
        case Unstructured::Type::Integer: return static_cast<long long>(integer());
        case Unstructured::Type::UnsignedInteger: return integer();
        case Unstructured::Type::String: return text();
        default: std::abort();
    }
}

Unstructured::Map Reader::map() {
    Unstructured const tree = data();
    if (!tree.isMap()) std::abort();
    return *tree.ifMap();
}

Path Reader::path() {
    std::vector<PathElement> elements(countOf(5));
    for (PathElement& element : elements) {
        element.instruction = PathInstruction(byte());
        std::size_t const points = countOf(16);
        for (std::size_t i = 0; i < points; ++i) {
            double const x = number();
            element.points.push_back({x, number()});
        }
    }
    return Path(std::move(elements));
}

Value Reader::value() {
    unsigned char const marked = byte();
    auto const type = Type(marked & ~kNullPayload);
    if ((marked & kNullPayload) != 0) return nullPayload(type);
    switch (type) {
        case Type::Float: return number();
        case Type::Vec2: {
            double const x = number();
            return FloatVec2{x, number()};
        }
        case Type::Vec3: {
            double const x = number();
            double const y = number();
            return FloatVec3{x, y, number()};
        }
        case Type::Vec4: {
            double const x = number();
            double const y = number();
            double const z = number();
            return FloatVec4{x, y, z, number()};
        }
        case Type::Mat4: {
            double numbers[16];
            for (double& d : numbers) d = number();
            FloatMat4 matrix;
            std::memcpy(&matrix, numbers, sizeof matrix);
            return matrix;
        }
        case Type::Boolean: return byte() != 0;
        case Type::Int: return static_cast<long long>(integer());
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::Model: return Value(integer(), type);
        case Type::Path: return path();
        case Type::String: return text();
        case Type::Unstructured: return Value(data());
        default: std::abort();
    }
}

TypeInfo Reader::typeInfo() {
    TypeInfo info;
    info.type = Type(byte());
    info.subtype = byte();
    for (Optional<Value>* bound : {&info.min, &info.max, &info.extra}) {
        if (byte() != 0) *bound = value();
    }
    return info;
}

Port Reader::port() {
    Port port;
    port.id = integer();
    port.tag = integer();
    port.typeInfo = typeInfo();
    port.defaultValue = value();
    port.name = text();
    port.attributes = map();
    return port;
}

std::vector<Port> Reader::ports() {
    std::vector<Port> list(countOf(kSmallestPort));
    for (Port& element : list) element = port();
    return list;
}

Connection Reader::connection() {
    Connection c;
    for (unsigned long long* id : {&c.fromPatchId, &c.fromPortId, &c.toPatchId, &c.toPortId}) {
        *id = integer();
    }
    return c;
}

std::vector<Connection> Reader::connections() {
    std::vector<Connection> list(countOf(32));
    for (Connection& element : list) element = connection();
    return list;
}

ModelLayer Reader::modelLayer() {
    ModelLayer layer;
    layer.id = integer();
    for (auto* list : {&layer.children, &layer.additionalLayers}) {
        list->resize(countOf(16));
        for (ModelLayer& element : *list) element = modelLayer();
    }
    return layer;
}

// A separate function, so that the recursion needs little stack at each level.
[[gnu::noinline]] void Reader::patchFields(Patch& patch) {
    patch.id = integer();
    patch.builtin = integer();
    patch.name = text();
    patch.descriptor = text();
    patch.attributes = map();
    patch.modelLayer = modelLayer();
    patch.inputs = arrayOf(ports());
    patch.outputs = arrayOf(ports());
    patch.connections = arrayOf(connections());
}

void Reader::patch(Patch& patch) {
    patchFields(patch);
    std::size_t const count = countOf(32);
    if (count == 0) return;
    auto const children = std::make_shared<std::vector<Patch>>(count);
    for (Patch& child : *children) this->patch(child);
    patch.children = children;
}

Patch Reader::patch() {
    Patch patch;
    this->patch(patch);
    return patch;
}

}  // namespace web
