#include <Engine/Document/detail/node_graph.h>

#include <Engine/Document/detail/kinds.h>
#include <Engine/Document/detail/lists.h>
#include <Engine/Document/detail/texts.h>

#include <algorithm>
#include <cctype>
#include <unordered_map>
#include <unordered_set>
#include <utility>

namespace tarn::engine::detail {

namespace {

constexpr std::size_t kMostPatches = 1000000;
constexpr std::size_t kMostNotes = 100;
// How links of a definition name its own inputs and outputs.
constexpr long long kInputNode = -10;
constexpr long long kOutputNode = -20;

std::string lowerCase(std::string text) {
    for (char& c : text) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return text;
}

// "math/Add" is our "add"; what we do not implement is of no kind.
unsigned long long kindOf(std::string const& nodeType) {
    std::string const name = lowerCase(nodeType.substr(nodeType.find_last_of('/') + 1));
    if (name == "const") return *stringToKind("constant");
    for (unsigned long long kind = kUnknownKind + 1; !kindToString(kind).empty(); ++kind) {
        if (lowerCase(kindToString(kind)) == name) return kind;
    }
    return kUnknownKind;
}

// Their type names differ from editor to editor: what we do not know is free-form data.
TypeInfo typeInfoOf(Unstructured const& type) {
    TypeInfo info;
    info.type = Type::Unstructured;
    if (type == -1 || type == "event" || type == "action") {
        info.type = Type::Boolean;
        info.subtype = 1;
    } else if (std::string const* const text = type.ifString()) {
        std::string const name = lowerCase(*text);
        info.type = name == "number" ? Type::Float : stringToType(name).value_or(info.type);
    }
    return info;
}

// A setting as a port's value: converted where that keeps it, so that "5" is 5 for a number.
Value asDefault(Unstructured const& setting, Type type) {
    if (std::string const* const text = setting.ifString()) return Value(*text).asType(type);
    return Value(setting).asType(type);
}

std::string shown(NodeName const& name) {
    return name.text ? "\"" + printable(*name.text) + "\"" : std::to_string(name.number);
}

// How many patches each definition becomes, with those inside it, and how deep they are.
class Sizes {
public:
    Sizes(std::deque<NodeGraph> const& all,
          std::unordered_map<std::string, std::size_t> const& byId)
        : definitions(all), positions(byId), sizes(all.size()) {}

    struct Size {
        std::size_t patches = 0;
        std::size_t depth = 0;
    };

    // False where a definition contains itself.
    bool compute(DocumentError& error) {
        enum class State : unsigned char { New, Open, Done };
        std::vector<State> states(definitions.size(), State::New);
        for (std::size_t start = 0; start < definitions.size(); ++start) {
            std::vector<Visit> open;
            if (states[start] == State::New) open.push_back({start, usesIn(definitions[start]), 0});
            while (!open.empty()) {
                Visit& visit = open.back();
                states[visit.definition] = State::Open;
                if (visit.next == visit.uses.size()) {
                    sizes[visit.definition] = sizeOf(definitions[visit.definition]);
                    states[visit.definition] = State::Done;
                    open.pop_back();
                    continue;
                }
                Use const use = visit.uses[visit.next++];
                if (states[use.definition] == State::Open) {
                    describeCircle(open, use, error);
                    return false;
                }
                if (states[use.definition] == State::New) {
                    open.push_back({use.definition, usesIn(definitions[use.definition]), 0});
                }
            }
        }
        return true;
    }

    Size sizeOf(NodeGraph const& graph) const {
        Size size{2, 1};  // Of a definition, the ends.
        for (GraphNode const& node : graph.nodes) {
            Size inner;
            auto const use = positions.find(node.type);
            if (node.inside) {
                inner = sizeOf(*node.inside);
            } else if (use != positions.end()) {
                inner = sizes[use->second];
            }
            // No sum of these overflows.
            size.patches = std::min(size.patches + inner.patches + 1, kMostPatches + 1);
            size.depth = std::max(size.depth, inner.depth + 1);
        }
        return size;
    }

private:
    struct Use {
        std::size_t definition;
        std::string pointer;
    };
    struct Visit {
        std::size_t definition;
        std::vector<Use> uses;
        std::size_t next;
    };

    std::vector<Use> usesIn(NodeGraph const& graph) const {
        std::vector<Use> uses;
        for (std::size_t i = 0; i < graph.nodes.size(); ++i) {
            GraphNode const& node = graph.nodes[i];
            auto const use = positions.find(node.type);
            if (node.inside) {
                std::vector<Use> const inner = usesIn(*node.inside);
                uses.insert(uses.end(), inner.begin(), inner.end());
            } else if (use != positions.end()) {
                uses.push_back({use->second, graph.pointer + "/nodes/" + std::to_string(i)});
            }
        }
        return uses;
    }

    void describeCircle(std::vector<Visit> const& open, Use const& use,
                        DocumentError& error) const {
        std::string path;
        bool isInside = false;
        for (Visit const& visit : open) {
            isInside = isInside || visit.definition == use.definition;
            if (isInside) path += nameOf(visit.definition) + " > ";
        }
        error.pointer = use.pointer;
        error.message = "the shared definition " + nameOf(use.definition) +
                        " contains itself: " + path + nameOf(use.definition);
    }

    std::string nameOf(std::size_t definition) const {
        NodeGraph const& graph = definitions[definition];
        return "\"" + printable(graph.title.empty() ? graph.id : graph.title) + "\"";
    }

    std::deque<NodeGraph> const& definitions;
    std::unordered_map<std::string, std::size_t> const& positions;
    std::vector<Size> sizes;
};

class Maker {
public:
    Maker(std::deque<NodeGraph>& all, std::unordered_map<std::string, std::size_t> const& byId,
          DocumentInfo& made)
        : definitions(all), positions(byId), uses(all.size(), 0), info(made) {}

    // The root's own identifier comes last, so that nodes keep theirs.
    void make(NodeGraph& graph, Patch& root) {
        claim(graph);
        fill(root, graph, true);
        root.id = freeIdentifier(1);
        for (std::size_t count : uses) info.unusedDefinitions += count == 0 ? 1 : 0;
    }

private:
    // Nodes keep their identifiers before any other gets a free one, and the outer ones before the
    // inner ones.
    void claim(NodeGraph& graph) {
        for (GraphNode& node : graph.nodes) node.id = claimed(node.name);
        for (GraphNode const& node : graph.nodes) {
            if (node.inside) claim(*node.inside);
        }
    }

    // The identifier of that number where it is still free, else 0.
    unsigned long long claimed(NodeName const& name) {
        if (name.text || name.number <= 0) return 0;
        auto const id = static_cast<unsigned long long>(name.number);
        return patchIds.insert(id).second ? id : 0;
    }

    // Where the nodes of a name are among the patches of a level.
    using Places = std::vector<std::pair<NodeName, std::size_t>>;

    // The patches and connections of `graph` become those of `patch`. What is used for the last
    // time is moved and not copied.
    void fill(Patch& patch, NodeGraph& graph, bool isLastUse) {
        Places places;
        places.reserve(graph.nodes.size() + 2);
        std::vector<unsigned long long> ids;
        ids.reserve(graph.nodes.size());
        for (GraphNode const& node : graph.nodes) {
            places.emplace_back(node.name, places.size());
            // Those of a copy have not been claimed before.
            ids.push_back(isLastUse ? node.id : claimed(node.name));
        }
        for (unsigned long long& id : ids) {
            if (id == 0) id = freeIdentifier(0);
        }
        std::vector<Patch> children;
        children.reserve(graph.nodes.size() + 2);
        for (std::size_t i = 0; i < ids.size(); ++i) {
            if (isLastUse) {
                children.push_back(child(std::move(graph.nodes.front()), ids[i], patch));
                graph.nodes.pop_front();
            } else {
                children.push_back(child(graph.nodes[i], ids[i], patch));
            }
        }
        if (!graph.inputs.empty()) {
            places.emplace_back(NodeName{kInputNode}, children.size());
            children.push_back(end(graph.inputNode, kGroupInputKind, graph.inputs));
        }
        if (!graph.outputs.empty()) {
            places.emplace_back(NodeName{kOutputNode}, children.size());
            children.push_back(end(graph.outputNode, kGroupOutputKind, graph.outputs));
        }
        // Of nodes of one name the first comes first.
        std::sort(places.begin(), places.end());
        std::vector<Connection> connections;
        connections.reserve(graph.links.size());
        for (GraphLink const& link : graph.links) {
            Connection connection;
            std::string const missing = connect(link, places, children, connection);
            if (missing.empty()) {
                connections.push_back(connection);
                continue;
            }
            ++info.omittedLinks;
            if (info.notes.size() < kMostNotes) {
                info.notes.push_back(graph.pointer + "/links/" + std::to_string(link.position) +
                                     ": link " + std::to_string(link.id) +
                                     " left out: there is no " + missing);
            }
        }
        if (!children.empty()) patch.children = arrayOf(std::move(children));
        if (!connections.empty()) patch.connections = arrayOf(std::move(connections));
    }

    Patch child(GraphNode&& node, unsigned long long id, Patch const& parent) {
        GraphNode::Ports ports;
        if (node.ports) ports = std::move(*node.ports);
        Patch patch = started(node.name, std::move(node.type), std::move(node.attributes), id);
        finish(patch, ports, parent, node.inside != nullptr);
        if (node.inside) {
            patch.attributes.merge(node.inside->attributes);
            fill(patch, *node.inside, true);
        }
        return patch;
    }

    Patch child(GraphNode const& node, unsigned long long id, Patch const& parent) {
        GraphNode::Ports ports;
        if (node.ports) ports = *node.ports;
        Patch patch = started(node.name, node.type, node.attributes, id);
        finish(patch, ports, parent, node.inside != nullptr);
        if (node.inside) {
            patch.attributes.insert(node.inside->attributes.begin(), node.inside->attributes.end());
            fill(patch, *node.inside, false);
        }
        return patch;
    }

    Patch started(NodeName const& name, std::string type,
                  std::map<std::string, Unstructured> attributes, unsigned long long id) {
        Patch patch;
        patch.id = id;
        patch.builtin = kindOf(type);
        patch.descriptor = std::move(type);
        patch.attributes = std::move(attributes);
        auto const title = patch.attributes.find("title");
        if (title != patch.attributes.end()) {
            patch.name = title->second.asString();
            patch.attributes.erase(title);
        }
        if (name.text || name.number < 0 || static_cast<unsigned long long>(name.number) != id) {
            ++info.renumberedNodes;
            patch.attributes["id"] =
                name.text ? Unstructured(*name.text) : Unstructured(name.number);
        }
        return patch;
    }

    void finish(Patch& patch, GraphNode::Ports& ports, Patch const& parent, bool hasInside) {
        auto const found = patch.attributes.find("properties");
        bool const hasProperties = found != patch.attributes.end();
        finishPorts(ports.inputs, hasProperties ? &found->second : nullptr);
        finishPorts(ports.outputs, hasProperties ? &found->second : nullptr);
        auto const definition = positions.find(patch.descriptor);
        bool const isUse = !hasInside && definition != positions.end();
        if (isUse) {
            joinByName(ports.inputs, definitions[definition->second].inputs);
            joinByName(ports.outputs, definitions[definition->second].outputs);
        } else if (patch.builtin == kTimeKind) {
            retagTime(ports.outputs);
        } else if (hasProperties) {
            std::string const name = found->second.stringAt({"name"}, "");
            if (patch.builtin == kGroupInputKind) retagEnd(ports.outputs, *parent.inputs, name);
            if (patch.builtin == kGroupOutputKind) retagEnd(ports.inputs, *parent.outputs, name);
        }
        takeInto(patch.inputs, ports.inputs);
        takeInto(patch.outputs, ports.outputs);
        if (hasInside) patch.builtin = kGroupKind;
        if (isUse) use(definition->second, patch);
        if (patch.name.empty()) patch.name = patch.descriptor;
    }

    // The inside of the definition becomes that of the patch.
    void use(std::size_t position, Patch& patch) {
        NodeGraph& graph = definitions[position];
        ++uses[position];
        patch.builtin = kGroupKind;
        if (patch.name.empty()) patch.name = graph.title;
        Unstructured::Map about = graph.attributes;
        about["id"] = graph.id;
        about["name"] = graph.title;
        patch.attributes.emplace("definition", std::move(about));
        fill(patch, graph, false);
    }

    // Of a definition: the patch inside it that stands for its inputs or its outputs.
    Patch end(Unstructured const& node, unsigned long long kind, std::deque<Port> const& ofGroup) {
        Patch patch;
        patch.id = freeIdentifier(0);
        patch.builtin = kind;
        patch.name = kindToString(kind);
        if (Unstructured::Map const* const members = node.ifMap()) {
            patch.attributes = *members;
            patch.attributes.erase("id");
        }
        std::deque<Port> ports = ofGroup;
        finishPorts(ports, nullptr);
        takeInto(kind == kGroupInputKind ? patch.outputs : patch.inputs, ports);
        return patch;
    }

    // Identifiers, tags, types and defaults. A property of a port's name is its default.
    void finishPorts(std::deque<Port>& ports, Unstructured const* properties) {
        for (std::size_t i = 0; i < ports.size(); ++i) {
            Port& port = ports[i];
            port.id = ++lastPortId;
            port.tag = i + 1;
            auto const type = port.attributes.find("type");
            port.typeInfo =
                typeInfoOf(type == port.attributes.end() ? Unstructured() : type->second);
            Unstructured const* setting =
                properties == nullptr ? nullptr : properties->find(port.name);
            if (setting == nullptr && i == 0 && properties != nullptr) {
                setting = properties->find("value");
            }
            port.defaultValue = setting == nullptr ? Value::defaultValue(port.typeInfo.type)
                                                   : asDefault(*setting, port.typeInfo.type);
        }
    }

    // Editors give the same time in one unit or two; our kind knows them by tag.
    static void retagTime(std::deque<Port>& outputs) {
        for (Port& port : outputs) {
            port.tag = lowerCase(port.name).find("ms") != std::string::npos ? 3 : 1;
        }
    }

    // The ends of a group find the group's ports by name; here that is turned into tags.
    static void retagEnd(std::deque<Port>& ends, std::vector<Port> const& ofGroup,
                         std::string const& name) {
        if (ends.empty()) return;
        for (Port const& port : ofGroup) {
            if (port.name == name) ends[0].tag = port.tag;
        }
    }

    // A use has some of its definition's ports, in any order: each gets the tag of the first one of
    // its name that is not taken, and those of no such name tags of their own.
    static void joinByName(std::deque<Port>& ports, std::deque<Port> const& ofDefinition) {
        std::unordered_map<std::string, std::vector<std::size_t>> byName;
        for (std::size_t i = ofDefinition.size(); i-- > 0;)
            byName[ofDefinition[i].name].push_back(i);
        unsigned long long further = ofDefinition.size();
        for (Port& port : ports) {
            std::vector<std::size_t>& free = byName[port.name];
            if (free.empty()) {
                port.tag = ++further;
                continue;
            }
            port.tag = free.back() + 1;
            free.pop_back();
        }
    }

    // Fills `connection` in, or names what is not there.
    static std::string connect(GraphLink const& link, Places const& places,
                               std::vector<Patch> const& patches, Connection& connection) {
        Patch const* const from = find(link.from, places, patches);
        if (from == nullptr) return "node " + shown(link.from);
        Patch const* const to = find(link.to, places, patches);
        if (to == nullptr) return "node " + shown(link.to);
        Patch const& source = *from;
        Patch const& target = *to;
        Port const* const output = atSlot(*source.outputs, link.fromSlot);
        if (output == nullptr) return slotName("output", link.fromSlot, link.from);
        Port const* const input = atSlot(*target.inputs, link.toSlot);
        if (input == nullptr) return slotName("input", link.toSlot, link.to);
        connection = {source.id, output->id, target.id, input->id};
        return "";
    }

    // The first of the name.
    static Patch const* find(NodeName const& name, Places const& places,
                             std::vector<Patch> const& patches) {
        auto const place =
            std::lower_bound(places.begin(), places.end(), std::pair(name, std::size_t(0)));
        bool const isThere = place != places.end() && !(name < place->first);
        return isThere ? &patches[place->second] : nullptr;
    }

    static Port const* atSlot(std::vector<Port> const& ports, long long slot) {
        bool const exists = slot >= 0 && slot < static_cast<long long>(ports.size());
        return exists ? &ports[static_cast<std::size_t>(slot)] : nullptr;
    }

    static std::string slotName(char const* side, long long slot, NodeName const& node) {
        return std::string(side) + " " + std::to_string(slot) + " of node " + shown(node);
    }

    // The one that is wanted where it is free; 0 wants none.
    unsigned long long freeIdentifier(unsigned long long wanted) {
        if (wanted != 0 && patchIds.insert(wanted).second) return wanted;
        while (!patchIds.insert(nextFree).second) ++nextFree;
        return nextFree;
    }

    std::deque<NodeGraph>& definitions;
    std::unordered_map<std::string, std::size_t> const& positions;
    std::vector<std::size_t> uses;
    DocumentInfo& info;
    std::unordered_set<unsigned long long> patchIds;
    unsigned long long nextFree = 1;
    unsigned long long lastPortId = 0;
};

}  // namespace

bool NodeName::operator<(NodeName const& other) const {
    if (!text || !other.text) {
        return !text && !other.text ? number < other.number : text == nullptr;
    }
    return *text < *other.text;
}

bool toPatches(NodeGraph& graph, std::deque<NodeGraph>& definitions, Patch& root,
               DocumentInfo& info, DocumentError& error) {
    std::unordered_map<std::string, std::size_t> positions;
    for (std::size_t i = 0; i < definitions.size(); ++i) {
        if (!definitions[i].id.empty()) positions.emplace(definitions[i].id, i);
    }
    Sizes sizes(definitions, positions);
    if (!sizes.compute(error)) return false;
    Sizes::Size const size = sizes.sizeOf(graph);
    if (size.patches > kMostPatches && !definitions.empty()) {
        error.message = "with its shared definitions the graph has more than " +
                        std::to_string(kMostPatches) + " nodes";
        return false;
    }
    if (size.depth > kDeepestGroups) {
        error.message = "groups nest deeper than " + std::to_string(kDeepestGroups) + " levels";
        return false;
    }
    root.name = "graph";
    root.builtin = kGroupKind;
    root.attributes = std::move(graph.attributes);
    Maker(definitions, positions, info).make(graph, root);
    return true;
}

}  // namespace tarn::engine::detail
