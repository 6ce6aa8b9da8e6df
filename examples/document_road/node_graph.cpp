#include "document.h"
#include "kinds.h"

#include <algorithm>
#include <cctype>
#include <map>
#include <set>

using namespace tarn::engine;

namespace {

std::string lowerCase(std::string text) {
    for (char& c : text) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return text;
}

// "math/Add" is our "add"; what we do not implement is of no kind.
Kind const* kindOf(std::string const& nodeType) {
    std::string const name = lowerCase(nodeType.substr(nodeType.find_last_of('/') + 1));
    if (name == "const") return kindByName("constant");
    for (Kind const& kind : kinds()) {
        if (lowerCase(kind.name) == name && kind.number != kUnknownKind) return &kind;
    }
    return kindByNumber(kUnknownKind);
}

// Their type names differ from editor to editor: what we do not know is free-form data.
TypeInfo typeInfoOf(Json const& type) {
    TypeInfo info;
    info.type = Type::Unstructured;
    if (type == -1 || type == "event" || type == "action") {
        info.type = Type::Boolean;
        info.subtype = 1;
    } else if (type.is_string()) {
        std::string const name = lowerCase(type.get<std::string>());
        info.type = name == "number"     ? Type::Float
                    : stringToType(name) ? *stringToType(name)
                                         : info.type;
    }
    return info;
}

// A setting as a port's value: converted where that keeps it, so that "5" is 5 for a number.
Value asDefault(Json const& setting, Type type) {
    Value const data = fromJson(setting);
    if (setting.is_string()) return Value(setting.get<std::string>()).asType(type);
    return data.asType(type);
}

// Every member but `known` ones.
std::map<std::string, Unstructured> otherKeys(Json const& object,
                                              std::set<std::string> const& known) {
    std::map<std::string, Unstructured> result = toAttributes(object);
    for (std::string const& key : known) result.erase(key);
    return result;
}

class Reader {
public:
    explicit Reader(Document& target) : document(target) {}

    // The root's own identifier comes last, so that nodes keep theirs.
    void read(Field const& graph) {
        fill(document.root, graph);
        document.root.id = freeIdentifier(1);
    }

private:
    struct Link {
        long long id, fromNode, fromSlot, toNode, toSlot;
    };

    // The patches and connections of `graph` become those of `patch`; its other keys attributes.
    void fill(Patch& patch, Field const& graph) {
        auto other = otherKeys(graph.object(), {"nodes", "links"});
        patch.attributes.insert(other.begin(), other.end());

        std::map<long long, std::size_t> positions;
        Field const nodes = graph.at("nodes");
        for (std::size_t i = 0; i < nodes.array().size(); ++i) {
            Field const node = nodes.element(i);
            Field const id = node.at("id");
            if (id.integer() == 0) id.refuse("the identifier 0 stands for nothing");
            if (!positions.emplace(id.integer(), i).second) {
                id.refuse("the node identifier " + std::to_string(id.integer()) + " is used twice");
            }
        }
        // All of this level's nodes keep their identifiers before any inner one takes a free one.
        std::vector<unsigned long long> ids;
        for (std::size_t i = 0; i < nodes.array().size(); ++i) {
            long long const id = nodes.element(i).at("id").integer();
            ids.push_back(freeIdentifier(id > 0 ? static_cast<unsigned long long>(id) : 1));
        }
        std::vector<Patch> children;
        for (std::size_t i = 0; i < ids.size(); ++i) {
            children.push_back(node(nodes.element(i), ids[i], patch));
        }

        std::vector<Connection> connections;
        graph.forEach("links", [&](Field const& field) {
            if (field.raw().is_null()) return;
            Link const link = readLink(field);
            Connection connection;
            std::string const missing = connect(link, positions, children, connection);
            if (missing.empty()) {
                connections.push_back(connection);
            } else {
                document.skipped.push_back(field.pointer() + ": link " + std::to_string(link.id) +
                                           " left out: there is no " + missing);
            }
        });
        patch.children = arrayOf(std::move(children));
        patch.connections = arrayOf(std::move(connections));
    }

    Patch node(Field const& field, unsigned long long id, Patch const& parent) {
        Patch patch;
        patch.id = id;
        patch.descriptor = field.at("type").text();
        patch.name = field.has("title") ? field.at("title").text() : patch.descriptor;
        patch.builtin = kindOf(patch.descriptor)->number;
        patch.attributes =
            otherKeys(field.object(), {"id", "type", "title", "inputs", "outputs", "subgraph"});
        long long const ownId = field.at("id").integer();
        if (ownId < 0 || static_cast<unsigned long long>(ownId) != id)
            patch.attributes["id"] = ownId;
        if (field.has("order")) field.at("order").integer();
        Json properties = Json::object();
        if (field.has("properties")) properties = field.at("properties").object();
        patch.inputs = ports(field, "inputs", properties);
        patch.outputs = ports(field, "outputs", properties);
        if (patch.builtin == kindByName("time")->number) retagTime(patch.outputs);
        if (patch.builtin == kGroupInputKind) retag(patch.outputs, *parent.inputs, properties);
        if (patch.builtin == kGroupOutputKind) retag(patch.inputs, *parent.outputs, properties);
        if (field.has("subgraph")) {
            patch.builtin = kGroupKind;
            fill(patch, field.at("subgraph"));
        }
        return patch;
    }

    Array<Port> ports(Field const& node, char const* key, Json const& properties) {
        std::vector<Port> list;
        node.forEach(key, [&](Field const& field) {
            Port port;
            port.id = ++lastPortId;
            port.tag = list.size() + 1;
            port.name = field.has("name") ? field.at("name").text() : "";
            Json const type = field.has("type") ? field.raw().at("type") : Json();
            if (!type.is_null() && !type.is_string() && !type.is_number() && !type.is_array()) {
                field.at("type").refuse("expected a text, a number or a list");
            }
            port.typeInfo = typeInfoOf(type);
            auto setting = properties.find(port.name);
            if (setting == properties.end() && list.empty()) setting = properties.find("value");
            port.defaultValue = setting == properties.end()
                                    ? Value::defaultValue(port.typeInfo.type)
                                    : asDefault(*setting, port.typeInfo.type);
            port.attributes = otherKeys(field.object(), {"name", "link", "links"});
            list.push_back(std::move(port));
        });
        return arrayOf(std::move(list));
    }

    // Editors give the same time in one unit or two; our kind knows them by tag.
    static void retagTime(Array<Port>& outputs) {
        std::vector<Port> changed = *outputs;
        for (Port& port : changed) {
            bool const milliseconds = lowerCase(port.name).find("ms") != std::string::npos;
            port.tag = milliseconds ? 3 : 1;
        }
        outputs = arrayOf(std::move(changed));
    }

    // The ends of a group find the group's ports by name; here that is turned into tags.
    static void retag(Array<Port>& ends, std::vector<Port> const& ofGroup, Json const& properties) {
        std::string const name = properties.value("name", Json("")).is_string()
                                     ? properties.value("name", std::string())
                                     : std::string();
        std::vector<Port> changed = *ends;
        for (Port const& port : ofGroup) {
            if (port.name == name && !changed.empty()) changed[0].tag = port.tag;
        }
        ends = arrayOf(std::move(changed));
    }

    static Link readLink(Field const& field) {
        if (field.raw().is_object()) {
            auto const number = [&](char const* key) { return field.at(key).integer(); };
            return {number("id"), number("origin_id"), number("origin_slot"), number("target_id"),
                    number("target_slot")};
        }
        if (field.array().size() < 5) {
            field.refuse("expected [id, from node, from slot, to node, to slot, type]");
        }
        auto const number = [&](std::size_t i) { return field.element(i).integer(); };
        return {number(0), number(1), number(2), number(3), number(4)};
    }

    // Fills `connection` in, or names what is not there.
    static std::string connect(Link const& link, std::map<long long, std::size_t> const& positions,
                               std::vector<Patch> const& patches, Connection& connection) {
        auto const from = positions.find(link.fromNode);
        if (from == positions.end()) return "node " + std::to_string(link.fromNode);
        auto const to = positions.find(link.toNode);
        if (to == positions.end()) return "node " + std::to_string(link.toNode);
        Patch const& source = patches[from->second];
        Patch const& target = patches[to->second];
        Port const* const output = atSlot(*source.outputs, link.fromSlot);
        if (output == nullptr) return slotName("output", link.fromSlot, link.fromNode);
        Port const* const input = atSlot(*target.inputs, link.toSlot);
        if (input == nullptr) return slotName("input", link.toSlot, link.toNode);
        connection = {source.id, output->id, target.id, input->id};
        return "";
    }

    static Port const* atSlot(std::vector<Port> const& ports, long long slot) {
        bool const exists = slot >= 0 && slot < static_cast<long long>(ports.size());
        return exists ? &ports[static_cast<std::size_t>(slot)] : nullptr;
    }

    static std::string slotName(char const* side, long long slot, long long node) {
        return std::string(side) + " " + std::to_string(slot) + " of node " + std::to_string(node);
    }

    unsigned long long freeIdentifier(unsigned long long wanted) {
        if (patchIds.insert(wanted).second) return wanted;
        while (!patchIds.insert(nextFree).second) ++nextFree;
        return nextFree;
    }

    Document& document;
    std::set<unsigned long long> patchIds;
    unsigned long long nextFree = 1;
    unsigned long long lastPortId = 0;
};

}  // namespace

Document readNodeGraph(Field const& file) {
    Document document;
    document.form = "a node graph";
    document.root.name = "graph";
    document.root.builtin = kGroupKind;
    Reader(document).read(file);
    return document;
}
