#include "document.h"
#include "kinds.h"

#include <Engine/Base/path.h>

#include <map>
#include <set>

using namespace tarn::engine;

namespace {

FloatMat4 matrix(Field const& field) {
    std::vector<double> const numbers = field.numbers(16);
    FloatMat4 result;
    std::copy(numbers.begin(), numbers.end(), result.elements);
    return result;
}

// [["moveTo", 1, 2], ["lineTo", 3, 4], ["close"]]
Path path(Field const& field) {
    std::map<std::string, std::pair<PathInstruction, std::size_t>> const instructions{
        {"moveTo", {PathInstruction::moveTo, 1}},
        {"lineTo", {PathInstruction::lineTo, 1}},
        {"curveTo", {PathInstruction::curveTo, 3}},
        {"quadCurveTo", {PathInstruction::quadCurveTo, 2}},
        {"close", {PathInstruction::close, 0}},
    };
    Path result;
    for (std::size_t i = 0; i < field.array().size(); ++i) {
        Field const element = field.element(i);
        if (element.array().empty()) element.refuse("a path element begins with its name");
        Field const name = element.element(0);
        auto const known = instructions.find(name.text());
        if (known == instructions.end()) {
            name.refuse("unknown path instruction \"" + printable(name.text()) + "\"");
        }
        auto const [instruction, count] = known->second;
        if (element.array().size() != 1 + 2 * count) {
            element.refuse(name.text() + " takes " + std::to_string(2 * count) + " coordinates");
        }
        PathElement made{instruction, {}};
        for (std::size_t p = 0; p < count; ++p) {
            made.points.push_back(
                {element.element(1 + 2 * p).number(), element.element(2 + 2 * p).number()});
        }
        result.elements.push_back(std::move(made));
    }
    return result;
}

Value value(Field const& field, Type type) {
    switch (type) {
        case Type::Float: return field.number();
        case Type::Vec2: {
            auto const n = field.numbers(2);
            return FloatVec2{n[0], n[1]};
        }
        case Type::Vec3: {
            auto const n = field.numbers(3);
            return FloatVec3{n[0], n[1], n[2]};
        }
        case Type::Vec4: {
            auto const n = field.numbers(4);
            return FloatVec4{n[0], n[1], n[2], n[3]};
        }
        case Type::Mat4: return matrix(field);
        case Type::Boolean: return field.truth();
        case Type::Int: return field.integer();
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::Model: return Value(field.identifier(), type);
        case Type::Path: return path(field);
        case Type::String: return field.text();
        case Type::Unstructured: return fromJson(field.raw());
    }
    field.refuse("this type has no values");
}

TypeInfo typeInfo(Field const& port) {
    TypeInfo info;
    Field const name = port.at("type");
    std::string const text = name.text();
    if (text == "pulse" || text == "layer") {
        info.type = text == "pulse" ? Type::Boolean : Type::Unstructured;
        info.subtype = 1;
    } else {
        Optional<Type> const type = stringToType(text);
        if (!type) name.refuse("unknown value type \"" + printable(text) + "\"");
        info.type = *type;
    }
    if (port.has("min")) info.min = value(port.at("min"), info.type);
    if (port.has("max")) info.max = value(port.at("max"), info.type);
    if (port.has("extra")) info.extra = Value(fromJson(port.at("extra").raw()));
    return info;
}

std::map<std::string, Unstructured> attributes(Field const& owner) {
    if (!owner.has("attributes")) return {};
    return toAttributes(owner.at("attributes").object());
}

ModelLayer modelLayer(Field const& field) {
    field.onlyKeys({"id", "children", "additionalLayers"});
    ModelLayer layer;
    layer.id = field.at("id").identifier();
    field.forEach("children",
                  [&](Field const& child) { layer.children.push_back(modelLayer(child)); });
    field.forEach("additionalLayers",
                  [&](Field const& other) { layer.additionalLayers.push_back(modelLayer(other)); });
    return layer;
}

// Reads patches, and sees to it that every identifier stands for one thing.
class Reader {
public:
    Patch patch(Field const& field) {
        field.onlyKeys({"id", "kind", "name", "descriptor", "modelLayer", "inputs", "outputs",
                        "attributes", "children", "connections"});
        Patch result;
        result.id = newIdentifier(field, patchIds, "patch");
        result.builtin = kind(field);
        result.name = field.has("name") ? field.at("name").text() : "";
        result.descriptor = field.has("descriptor") ? field.at("descriptor").text() : "";
        if (field.has("modelLayer")) result.modelLayer = modelLayer(field.at("modelLayer"));
        result.attributes = attributes(field);
        result.inputs = ports(field, "inputs");
        result.outputs = ports(field, "outputs");
        std::vector<Patch> children;
        field.forEach("children", [&](Field const& child) { children.push_back(patch(child)); });
        result.children = arrayOf(std::move(children));
        result.connections = connections(field, *result.children);
        return result;
    }

private:
    static unsigned long long newIdentifier(Field const& owner, std::set<unsigned long long>& used,
                                            char const* what) {
        Field const field = owner.at("id");
        unsigned long long const id = field.identifier();
        if (!used.insert(id).second) {
            field.refuse("the " + std::string(what) + " identifier " + std::to_string(id) +
                         " is used twice");
        }
        return id;
    }

    static unsigned long long kind(Field const& patch) {
        if (!patch.has("kind")) return kGroupKind;
        Field const name = patch.at("kind");
        Kind const* const known = kindByName(name.text());
        if (known == nullptr) name.refuse("unknown kind \"" + printable(name.text()) + "\"");
        return known->number;
    }

    Array<Port> ports(Field const& owner, char const* key) {
        std::vector<Port> list;
        owner.forEach(key, [&](Field const& field) {
            field.onlyKeys(
                {"id", "tag", "name", "type", "min", "max", "extra", "default", "attributes"});
            Port port;
            port.id = newIdentifier(field, portIds, "port");
            port.tag = field.has("tag") ? field.at("tag").identifier() : list.size() + 1;
            port.name = field.has("name") ? field.at("name").text() : "";
            port.typeInfo = typeInfo(field);
            port.defaultValue = field.has("default")
                                    ? value(field.at("default"), port.typeInfo.type)
                                    : Value::defaultValue(port.typeInfo.type);
            port.attributes = attributes(field);
            list.push_back(std::move(port));
        });
        return arrayOf(std::move(list));
    }

    // {"from": [patch, port], "to": [patch, port]}, between children of the same patch.
    static Array<Connection> connections(Field const& owner, std::vector<Patch> const& children) {
        std::vector<Connection> list;
        owner.forEach("connections", [&](Field const& field) {
            field.onlyKeys({"from", "to"});
            auto const [fromPatch, fromPort] = end(field, "from", children, &Patch::outputs);
            auto const [toPatch, toPort] = end(field, "to", children, &Patch::inputs);
            list.push_back({fromPatch, fromPort, toPatch, toPort});
        });
        return arrayOf(std::move(list));
    }

    static std::pair<unsigned long long, unsigned long long> end(Field const& connection,
                                                                 char const* key,
                                                                 std::vector<Patch> const& children,
                                                                 Array<Port> Patch::*ports) {
        Field const field = connection.at(key);
        if (field.array().size() != 2) field.refuse("expected [patch, port]");
        unsigned long long const patchId = field.element(0).identifier();
        unsigned long long const portId = field.element(1).identifier();
        for (Patch const& child : children) {
            if (child.id != patchId) continue;
            for (Port const& port : *(child.*ports)) {
                if (port.id == portId) return {patchId, portId};
            }
            field.refuse("patch " + std::to_string(patchId) + " has no " +
                         (ports == &Patch::outputs ? "output" : "input") + " port " +
                         std::to_string(portId));
        }
        field.refuse("there is no patch " + std::to_string(patchId) + " beside the connection");
    }

    std::set<unsigned long long> patchIds;
    std::set<unsigned long long> portIds;
};

}  // namespace

Document readOwnForm(Field const& file) {
    file.onlyKeys({"framesPerSecond", "root"});
    Document document;
    document.form = "a document";
    if (file.has("framesPerSecond")) {
        Field const rate = file.at("framesPerSecond");
        document.framesPerSecond = rate.number();
        if (!(document.framesPerSecond > 0.0)) rate.refuse("expected a number above 0");
    }
    document.root = Reader().patch(file.at("root"));
    return document;
}
