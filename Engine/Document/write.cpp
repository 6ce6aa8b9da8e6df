#include <Engine/Document/document.h>

#include <Engine/Base/detail/shortest_number.h>
#include <Engine/Base/detail/utf8.h>
#include <Engine/Base/path.h>
#include <Engine/Document/detail/identifiers.h>
#include <Engine/Document/detail/kinds.h>
#include <Engine/Document/detail/texts.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <string_view>
#include <type_traits>

namespace tarn::engine {

namespace {

constexpr std::string_view kHexDigits = "0123456789abcdef";
// Deeper records are not indented further, so that the string grows linearly.
constexpr std::size_t kWidestIndent = 40;

// Appends JSON to a string.
class JsonWriter {
public:
    std::string text;

    void number(double value) {
        if (!std::isfinite(value)) return string(detail::nonFiniteText(value));
        std::size_t const begin = text.size();
        detail::appendShortest(text, value);
        std::string_view const written = std::string_view(text).substr(begin);
        if (written.find_first_of(".e") == std::string_view::npos) text += ".0";
    }

    template <class Integer>
    void digits(Integer value) {
        char buffer[24];
        char* const end = std::to_chars(buffer, std::end(buffer), value).ptr;
        text.append(buffer, end);
    }

    // Written as a string where a JSON reader with doubles would lose digits.
    template <class Integer>
    void integer(Integer value) {
        bool const isSmall = fits(value);
        if (!isSmall) text += '"';
        digits(value);
        if (!isSmall) text += '"';
    }

    static bool fits(unsigned long long value) {
        return value <= static_cast<unsigned long long>(detail::kLargestNumber);
    }
    static bool fits(long long value) {
        return value <= detail::kLargestNumber && value >= -detail::kLargestNumber;
    }

    void string(std::string_view bytes) {
        text += '"';
        std::size_t plain = 0;  // The number of bytes that need no escape.
        auto const isPlain = [&](std::size_t i) {
            auto const byte = static_cast<unsigned char>(bytes[i]);
            return byte >= 0x20 && byte < 0x7f && byte != '"' && byte != '\\';
        };
        for (;;) {
            while (plain < bytes.size() && isPlain(plain)) ++plain;
            text.append(bytes.substr(0, plain));
            bytes.remove_prefix(plain);
            plain = 0;
            if (bytes.empty()) break;
            std::size_t const length = detail::utf8Length(bytes);
            if (length > 1) {
                plain = length;
                continue;
            }
            escape(bytes[0], length == 1);
            bytes.remove_prefix(1);
        }
        text += '"';
    }

private:
    void escape(char c, bool isCharacter) {
        auto const byte = static_cast<unsigned char>(c);
        if (!isCharacter || c == detail::kByteEscape) {
            text += "\\u001a";
        } else if (c == '"' || c == '\\') {
            (text += '\\') += c;
            return;
        } else if (c == '\n') {
            text += "\\n";
            return;
        } else if (c == '\t') {
            text += "\\t";
            return;
        } else {
            text += "\\u00";
        }
        text += kHexDigits[byte >> 4u];
        text += kHexDigits[byte & 15u];
    }
};

// Writes a tree of any depth without recursion.
class DataWriter {
public:
    explicit DataWriter(JsonWriter& target) : json(target) {}

    void write(Unstructured const& data) {
        begin(data);
        while (!open.empty()) step();
    }

    void write(Unstructured::Map const& map) {
        json.text += '{';
        open.push_back({&map, map.begin(), nullptr, 0});
        while (!open.empty()) step();
    }

private:
    struct Level {
        Unstructured::Map const* map;
        Unstructured::Map::const_iterator nextEntry;
        Unstructured::Array const* array;
        std::size_t nextElement;
    };

    void step() {
        Level& level = open.back();
        if (level.map != nullptr) {
            if (level.nextEntry == level.map->end()) return end('}');
            if (level.nextEntry != level.map->begin()) json.text += ',';
            auto const& [key, element] = *level.nextEntry++;
            // Keys that begin with "$" are escaped by another "$".
            json.string(!key.empty() && key[0] == '$' ? "$" + key : key);
            json.text += ':';
            begin(element);
        } else {
            if (level.nextElement == level.array->size()) return end(']');
            if (level.nextElement > 0) json.text += ',';
            begin((*level.array)[level.nextElement++]);
        }
    }

    void end(char bracket) {
        json.text += bracket;
        open.pop_back();
    }

    void begin(Unstructured const& data) {
        switch (data.type()) {
            case Unstructured::Type::Null: json.text += "null"; return;
            case Unstructured::Type::Map:
                json.text += '{';
                open.push_back({data.ifMap(), data.ifMap()->begin(), nullptr, 0});
                return;
            case Unstructured::Type::Array:
                json.text += '[';
                open.push_back({nullptr, {}, data.ifArray(), 0});
                return;
            case Unstructured::Type::Float:
                if (std::isfinite(data.asFloat())) return json.number(data.asFloat());
                json.text += "{\"$float\":";
                json.number(data.asFloat());
                break;
            case Unstructured::Type::Integer:
                if (JsonWriter::fits(data.asInteger())) return json.digits(data.asInteger());
                json.text += "{\"$integer\":";
                json.integer(data.asInteger());
                break;
            case Unstructured::Type::UnsignedInteger:
                json.text += "{\"$unsigned\":";
                json.integer(data.asId());
                break;
            case Unstructured::Type::String: return json.string(*data.ifString());
        }
        json.text += '}';
    }

    JsonWriter& json;
    std::vector<Level> open;
};

// Writes a value in the format of its own type.
class ValueWriter {
public:
    explicit ValueWriter(JsonWriter& target) : json(target) {}

    void operator()(double number) const { json.number(number); }
    void operator()(long long integer) const { json.integer(integer); }
    void operator()(bool truth) const { json.text += truth ? "true" : "false"; }
    void operator()(FloatVec2 v) const { numbers({v.x, v.y}); }
    void operator()(FloatVec3 v) const { numbers({v.x, v.y, v.z}); }
    void operator()(FloatVec4 v) const { numbers({v.x, v.y, v.z, v.w}); }
    void operator()(FloatMat4 const& m) const { numbers(m.elements); }
    template <Type resource>
    void operator()(Value::ResourceID<resource> resourceId) const {
        json.integer(resourceId.id);
    }
    void operator()(std::string const& string) const { json.string(string); }
    void operator()(Unstructured const& data) const { DataWriter(json).write(data); }
    void operator()(Path const& path) const {
        json.text += '[';
        char const* separator = "";
        for (PathElement const& element : path.elements) {
            json.text += separator;
            separator = ",";
            if (isUsual(element)) {
                json.text += '[';
                json.string(pathInstructionToString(element.instruction));
                for (FloatVec2 const p : element.points) {
                    json.text += ',';
                    json.number(p.x);
                    json.text += ',';
                    json.number(p.y);
                }
                json.text += ']';
                continue;
            }
            json.text += "{\"instruction\":";
            if (element.instruction <= PathInstruction::close) {
                json.string(pathInstructionToString(element.instruction));
            } else {
                json.digits(static_cast<unsigned>(element.instruction));
            }
            json.text += ",\"points\":[";
            char const* between = "";
            for (FloatVec2 const p : element.points) {
                json.text += between;
                between = ",";
                (*this)(p);
            }
            json.text += "]}";
        }
        json.text += ']';
    }

private:
    static bool isUsual(PathElement const& element) {
        switch (element.instruction) {
            case PathInstruction::moveTo:
            case PathInstruction::lineTo: return element.points.size() == 1;
            case PathInstruction::quadCurveTo: return element.points.size() == 2;
            case PathInstruction::curveTo: return element.points.size() == 3;
            case PathInstruction::close: return element.points.empty();
        }
        return false;
    }

    template <std::size_t count>
    void numbers(double const (&list)[count]) const {
        char separator = '[';
        for (double const number : list) {
            json.text += separator;
            json.number(number);
            separator = ',';
        }
        json.text += ']';
    }

    JsonWriter& json;
};

bool hasNullPayload(Value const& value) {
    switch (value.type()) {
        case Type::Mat4: return value.asFloatMat4() == nullptr;
        case Type::Path: return value.ifPath() == nullptr;
        case Type::String: return value.ifString() == nullptr;
        case Type::Unstructured: return value.ifUnstructured() == nullptr;
        default: return false;
    }
}

// Whether a missing field is read as this value.
bool isDefault(Value const& value, Type type) {
    if (hasNullPayload(value)) return false;
    Value const usual = type <= Type::Unstructured ? Value::defaultValue(type) : Value();
    if (value.type() != usual.type()) return false;
    switch (value.type()) {
        case Type::Float:
        case Type::Vec2:
        case Type::Vec3:
        case Type::Vec4: {  // Signs of zeros matter; here all are positive.
            FloatVec4 const v = value;
            return value == usual && !std::signbit(v.x) && !std::signbit(v.y) &&
                   !std::signbit(v.z) && !std::signbit(v.w);
        }
        default: return value == usual;
    }
}

class DocumentWriter {
public:
    std::string write(Patch const& root, double framesPerSecond) {
        json.text += "{\"version\":1,";
        if (framesPerSecond > 0.0 && std::isfinite(framesPerSecond) && framesPerSecond != 60.0) {
            json.text += "\"framesPerSecond\":";
            json.number(framesPerSecond);
            json.text += ',';
        }
        if (detail::findWrongIdentifier(root)) json.text += R"("identifiers":"any",)";
        json.text += "\"root\":";
        patch(root);
        json.text += "}\n";
        return std::move(json.text);
    }

private:
    void line() {
        json.text += '\n';
        json.text.append(std::min(level, kWidestIndent), ' ');
    }

    void key(char const* name) {
        json.text += ",\"";
        json.text += name;
        json.text += "\":";
    }

    void patch(Patch const& written) {
        line();
        json.text += "{\"id\":";
        json.integer(written.id);
        if (written.builtin != detail::kGroupKind) {
            key("kind");
            std::string const name = kindToString(written.builtin);
            if (name.empty()) {
                json.integer(written.builtin);
            } else {
                json.string(name);
            }
        }
        stringField("name", written.name);
        stringField("descriptor", written.descriptor);
        if (written.modelLayer != ModelLayer()) {
            key("modelLayer");
            layer(written.modelLayer);
        }
        attributes(written.attributes);
        ports("inputs", detail::elementsOf(written.inputs, "inputs != nullptr"));
        ports("outputs", detail::elementsOf(written.outputs, "outputs != nullptr"));
        list("children", detail::elementsOf(written.children, "children != nullptr"),
             [this](Patch const& child) { patch(child); });
        list("connections", detail::elementsOf(written.connections, "connections != nullptr"),
             [this](Connection const& c) {
                 line();
                 json.text += "{\"from\":[";
                 end(c.fromPatchId, c.fromPortId);
                 json.text += ",\"to\":[";
                 end(c.toPatchId, c.toPortId);
                 json.text += '}';
             });
        json.text += '}';
    }

    void end(unsigned long long patchId, unsigned long long portId) {
        json.integer(patchId);
        json.text += ',';
        json.integer(portId);
        json.text += ']';
    }

    template <class T, class Write>
    void list(char const* name, std::vector<T> const& elements, Write write) {
        if (elements.empty()) return;
        key(name);
        json.text += '[';
        ++level;
        char const* separator = "";
        for (T const& element : elements) {
            json.text += separator;
            separator = ",";
            write(element);
        }
        --level;
        json.text += ']';
    }

    void stringField(char const* name, std::string const& value) {
        if (value.empty()) return;
        key(name);
        json.string(value);
    }

    void attributes(std::map<std::string, Unstructured> const& written) {
        if (written.empty()) return;
        key("attributes");
        DataWriter(json).write(written);
    }

    void layer(ModelLayer const& written) {
        json.text += "{\"id\":";
        json.integer(written.id);
        layers("children", written.children);
        layers("additionalLayers", written.additionalLayers);
        json.text += '}';
    }

    void layers(char const* name, std::vector<ModelLayer> const& written) {
        if (written.empty()) return;
        key(name);
        char separator = '[';
        for (ModelLayer const& element : written) {
            json.text += separator;
            separator = ',';
            layer(element);
        }
        json.text += ']';
    }

    void ports(char const* name, std::vector<Port> const& written) {
        unsigned long long position = 0;
        list(name, written, [&](Port const& element) { port(element, ++position); });
    }

    void port(Port const& written, unsigned long long usualTag) {
        line();
        json.text += "{\"id\":";
        json.integer(written.id);
        if (written.tag != usualTag) {
            key("tag");
            json.integer(written.tag);
        }
        stringField("name", written.name);
        TypeInfo const& info = written.typeInfo;
        key("type");
        bool const isKnown = info.type <= Type::Unstructured;
        bool const isPulse = info.type == Type::Boolean && info.subtype == 1;
        bool const isLayer = info.type == Type::Unstructured && info.subtype == 1;
        if (isPulse || isLayer) {
            json.string(isPulse ? "pulse" : "layer");
        } else if (isKnown) {
            json.string(typeToString(info.type));
        } else {
            json.digits(static_cast<unsigned>(info.type));
        }
        if (info.subtype != 0 && !isPulse && !isLayer) {
            key("subtype");
            json.digits(static_cast<unsigned>(info.subtype));
        }
        if (!isDefault(written.defaultValue, info.type)) {
            value("default", "defaultType", written.defaultValue, info.type);
        }
        if (info.min) value("min", "minType", *info.min, info.type);
        if (info.max) value("max", "maxType", *info.max, info.type);
        if (info.extra) value("extra", "extraType", *info.extra, Type::Unstructured);
        attributes(written.attributes);
        json.text += '}';
    }

    void value(char const* name, char const* typeName, Value const& written, Type usualType) {
        bool const isNull = hasNullPayload(written);
        if (!isNull) {
            key(name);
            written.visit(ValueWriter(json));
        }
        // Without a type, null is read as a missing field: null payloads and null data need theirs.
        Unstructured const* const data = written.ifUnstructured();
        bool const isNullData = data != nullptr && data->isNull();
        if (isNull || isNullData || written.type() != usualType) {
            key(typeName);
            json.string((isNull ? "null " : "") + typeToString(written.type()));
        }
    }

    JsonWriter json;
    std::size_t level = 0;
};

}  // namespace

std::string writeDocument(Patch const& root, double framesPerSecond) {
    return DocumentWriter().write(root, framesPerSecond);
}

}  // namespace tarn::engine
