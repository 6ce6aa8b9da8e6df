#include <Engine/Document/detail/node_graph.h>

#include <Engine/Document/detail/kinds.h>
#include <Engine/Document/detail/lists.h>
#include <Engine/Document/detail/texts.h>

#include <algorithm>
#include <cctype>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <utility>

namespace tarn::engine::detail {

namespace {

constexpr std::size_t kMostPatches = 1000000;
// The approximate limit for all copies of shared definitions: a small document must not exhaust
// memory.
constexpr std::size_t kMostCopiedBytes = std::size_t(256) << 20;
constexpr std::size_t kMostNotes = 100;
// The pseudo nodes that stand for a definition's own inputs and outputs in its links.
constexpr long long kInputNode = -10;
constexpr long long kOutputNode = -20;

std::string lowerCase(std::string text) {
    for (char& c : text) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return text;
}

// "math/Add" is our "add"; kinds that we do not have are unknown.
unsigned long long kindOf(std::string const& nodeType) {
    std::string const name = lowerCase(nodeType.substr(nodeType.find_last_of('/') + 1));
    if (name == "const") return *stringToKind("constant");
    for (unsigned long long kind = kUnknownKind + 1; !kindToString(kind).empty(); ++kind) {
        if (lowerCase(kindToString(kind)) == name) return kind;
    }
    return kUnknownKind;
}

// Editors have different type names. Unknown ones become unstructured data.
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

// Converts a setting to the type of a port; a string converts as a string value, so "5" becomes 5
// for a number.
Value asDefault(Unstructured const& setting, Type type) {
    if (std::string const* const text = setting.ifString()) return Value(*text).asType(type);
    return Value(setting).asType(type);
}

std::string shown(NodeName const& name) {
    return name.text ? "\"" + printable(*name.text) + "\"" : std::to_string(name.number);
}

// The approximate size of the data in memory.
std::size_t bytesOf(Unstructured const& data) {
    constexpr std::size_t kEntry = 64;  // Of a map, without the key.
    std::size_t bytes = 0;
    std::vector<Unstructured const*> pending{&data};
    while (!pending.empty()) {
        Unstructured const& next = *pending.back();
        pending.pop_back();
        bytes += sizeof(Unstructured);
        if (std::string const* const text = next.ifString())
            bytes += sizeof(std::string) + text->size();
        if (Unstructured::Array const* const array = next.ifArray()) {
            for (Unstructured const& element : *array) pending.push_back(&element);
        }
        if (Unstructured::Map const* const members = next.ifMap()) {
            for (auto const& [key, element] : *members) {
                bytes += kEntry + key.size();
                pending.push_back(&element);
            }
        }
    }
    return bytes;
}

std::size_t bytesOf(std::map<std::string, Unstructured> const& attributes) {
    std::size_t bytes = 0;
    for (auto const& [key, element] : attributes) bytes += key.size() + bytesOf(element);
    return bytes;
}

template <class Ports>
std::size_t bytesOfPorts(Ports const& ports) {
    std::size_t bytes = 0;
    for (Port const& port : ports) {
        bytes += sizeof port + port.name.size() + bytesOf(port.attributes);
    }
    return bytes;
}

// The size of each definition, with the definitions inside it.
class Sizes {
public:
    Sizes(std::deque<Definition> const& all,
          std::unordered_map<std::string, std::size_t> const& byId)
        : definitions(all), positions(byId), sizes(all.size()) {}

    struct Size {
        std::size_t patches = 0;
        std::size_t copiedBytes = 0;
        std::size_t depth = 1;
    };

    // False where a definition contains itself.
    bool compute(DocumentError& error) {
        enum class State : unsigned char { New, Open, Done };
        std::vector<State> states(definitions.size(), State::New);
        for (std::size_t start = 0; start < definitions.size(); ++start) {
            std::vector<Visit> open;
            if (states[start] == State::New) open.push_back(visit(start));
            while (!open.empty()) {
                Visit& last = open.back();
                states[last.definition] = State::Open;
                if (last.next == last.uses.size()) {
                    sizes[last.definition] = sizeOf(definitions[last.definition]);
                    states[last.definition] = State::Done;
                    open.pop_back();
                    continue;
                }
                Use const use = last.uses[last.next++];
                if (states[use.definition] == State::Open) {
                    describeCircle(open, use, error);
                    return false;
                }
                if (states[use.definition] == State::New) open.push_back(visit(use.definition));
            }
        }
        return true;
    }

    // For the whole document, whose own nodes are not copies.
    Size sizeOf(NodeGraph const& graph) const { return sizeOf(graph, false); }

private:
    struct Use {
        std::size_t definition;
        NodeGraph const* graph;
        std::size_t node;
    };
    struct Visit {
        std::size_t definition;
        std::vector<Use> uses;
        std::size_t next;
    };

    Size sizeOf(Definition const& definition) const {
        Size size = sizeOf(definition.graph, true);
        size.patches += 2;  // The input and output patches.
        size.copiedBytes += 2 * sizeof(Patch) + definition.id.size() + definition.title.size() +
                            bytesOfPorts(definition.inputs) + bytesOfPorts(definition.outputs) +
                            bytesOf(definition.graph.attributes);
        return size;
    }

    // Sums cannot overflow.
    Size sizeOf(NodeGraph const& graph, bool isCopied) const {
        Size size;
        if (isCopied) size.copiedBytes = graph.links.size() * sizeof(Connection);
        for (std::size_t i = 0; i < graph.nodes.size(); ++i) {
            GraphNode const& node = graph.nodes[i];
            Size inner{0, 0, 0};
            auto const use = positions.find(node.type);
            if (node.inside) {
                inner = sizeOf(*node.inside, isCopied);
            } else if (use != positions.end()) {
                inner = sizes[use->second];
            }
            size.patches = std::min(size.patches + inner.patches + 1, kMostPatches + 1);
            size.depth = std::max(size.depth, inner.depth + 1);
            size.copiedBytes += inner.copiedBytes + (isCopied ? bytesOfNode(node) : 0);
            size.copiedBytes = std::min(size.copiedBytes, kMostCopiedBytes + 1);
        }
        return size;
    }

    static std::size_t bytesOfNode(GraphNode const& node) {
        std::size_t bytes = sizeof(Patch) + node.type.size() + bytesOf(node.attributes);
        if (node.ports)
            bytes += bytesOfPorts(node.ports->inputs) + bytesOfPorts(node.ports->outputs);
        return bytes;
    }

    Visit visit(std::size_t definition) const {
        Visit result{definition, {}, 0};
        findUses(definitions[definition].graph, result.uses);
        return result;
    }

    void findUses(NodeGraph const& graph, std::vector<Use>& uses) const {
        for (std::size_t i = 0; i < graph.nodes.size(); ++i) {
            GraphNode const& node = graph.nodes[i];
            auto const use = positions.find(node.type);
            if (node.inside) {
                findUses(*node.inside, uses);
            } else if (use != positions.end()) {
                uses.push_back({use->second, &graph, i});
            }
        }
    }

    void describeCircle(std::vector<Visit> const& open, Use const& use,
                        DocumentError& error) const {
        std::string path;
        bool isInside = false;
        for (Visit const& outer : open) {
            isInside = isInside || outer.definition == use.definition;
            if (isInside) path += nameOf(outer.definition) + " > ";
        }
        error.pointer = pointerTo(*use.graph) + "/nodes/" + std::to_string(use.node);
        error.message = "the shared definition " + nameOf(use.definition) +
                        " contains itself: " + path + nameOf(use.definition);
    }

    std::string nameOf(std::size_t position) const {
        Definition const& definition = definitions[position];
        return "\"" + printable(definition.title.empty() ? definition.id : definition.title) + "\"";
    }

    std::deque<Definition> const& definitions;
    std::unordered_map<std::string, std::size_t> const& positions;
    std::vector<Size> sizes;
};

class Maker {
public:
    Maker(std::deque<Definition>& all, std::unordered_map<std::string, std::size_t> const& byId,
          DocumentInfo& made)
        : definitions(all), positions(byId), uses(all.size(), 0), info(made) {}

    // The root gets its identifier last, so that nodes keep theirs.
    void make(NodeGraph& graph, Patch& root) {
        claim(graph);
        fill(root, graph, nullptr, true);
        root.id = freeIdentifier();
        for (std::size_t count : uses) info.unusedDefinitions += count == 0 ? 1 : 0;
    }

private:
    // Existing identifiers are assigned before new ones, outer nodes before inner ones.
    void claim(NodeGraph& graph) {
        for (std::size_t i = 0; i < graph.nodes.size(); ++i) {
            graph.nodes[i].id = claimed(graph.nodes[i].name);
        }
        for (std::size_t i = 0; i < graph.nodes.size(); ++i) {
            if (graph.nodes[i].inside) claim(*graph.nodes[i].inside);
        }
    }

    // The identifier with that number if it is still free, else 0.
    unsigned long long claimed(NodeName const& name) {
        if (name.text || name.number <= 0) return 0;
        auto const id = static_cast<unsigned long long>(name.number);
        return patchIds.insert(id).second ? id : 0;
    }

    // The positions of the nodes of a name in the list of patches.
    using Places = std::vector<std::pair<NodeName, std::size_t>>;

    // Fills `patch` with the patches and connections of `graph`, whose content is moved for
    // `isLastUse`: so for the document and its inline subgraphs. Definitions are copied at every
    // use.
    void fill(Patch& patch, NodeGraph& graph, Definition const* definition, bool isLastUse) {
        Places places;
        std::size_t const count = graph.nodes.size();
        places.reserve(count + 2);
        std::vector<unsigned long long> ids;
        ids.reserve(count);
        for (std::size_t i = 0; i < count; ++i) {
            GraphNode const& node = graph.nodes[i];
            places.emplace_back(node.name, i);
            // Copies get their identifiers here.
            ids.push_back(isLastUse ? node.id : claimed(node.name));
        }
        for (unsigned long long& id : ids) {
            if (id == 0) id = freeIdentifier();
        }
        std::vector<Patch> children;
        children.reserve(count + 2);
        GroupTags const tags = tagsOf(patch);
        for (std::size_t i = 0; i < count; ++i) {
            children.push_back(isLastUse ? child(graph.nodes.takeFirst(), ids[i], tags)
                                         : child(graph.nodes[i], ids[i], tags));
        }
        if (definition != nullptr) {
            addEnd(children, places, definition->inputNode, kGroupInputKind, definition->inputs);
            addEnd(children, places, definition->outputNode, kGroupOutputKind, definition->outputs);
        }
        // Nodes of the same name stay in order.
        std::sort(places.begin(), places.end());
        std::vector<Connection> connections;
        connections.reserve(graph.links.size());
        for (std::size_t i = 0; i < graph.links.size(); ++i) {
            GraphLink const& link = graph.links[i];
            Connection connection;
            std::string const missing = connect(link, places, children, connection);
            if (missing.empty()) {
                connections.push_back(connection);
                continue;
            }
            ++info.omittedLinks;
            if (info.notes.size() < kMostNotes) {
                info.notes.push_back(pointerTo(graph) + "/links/" + std::to_string(link.position) +
                                     ": link " + std::to_string(link.id) +
                                     " left out: there is no " + missing);
            }
        }
        if (!children.empty()) patch.children = arrayOf(std::move(children));
        if (!connections.empty()) patch.connections = arrayOf(std::move(connections));
        if (!graph.linkMembers.empty()) {
            addAttribute(patch, "linkMembers", Unstructured(graph.linkMembers));
        }
    }

    // Uses that key, or the first free variant of it.
    static void addAttribute(Patch& patch, std::string key, Unstructured value) {
        while (patch.attributes.count(key) != 0) key += "_";
        patch.attributes.emplace(std::move(key), std::move(value));
    }

    // The tags of a group's ports by name.
    struct GroupTags {
        std::unordered_map<std::string, unsigned long long> inputs;
        std::unordered_map<std::string, unsigned long long> outputs;
    };

    static GroupTags tagsOf(Patch const& group) {
        GroupTags tags;
        for (Port const& port : *group.inputs) tags.inputs[port.name] = port.tag;
        for (Port const& port : *group.outputs) tags.outputs[port.name] = port.tag;
        return tags;
    }

    Patch child(GraphNode&& node, unsigned long long id, GroupTags const& tags) {
        GraphNode::Ports ports;
        if (node.ports) ports = std::move(*node.ports);
        Patch patch = started(node.name, std::move(node.type), std::move(node.attributes), id);
        finish(patch, ports, tags, node.inside != nullptr);
        if (node.inside) {
            addMembers(patch, std::move(node.inside->attributes));
            fill(patch, *node.inside, nullptr, true);
        }
        return patch;
    }

    Patch child(GraphNode const& node, unsigned long long id, GroupTags const& tags) {
        GraphNode::Ports ports;
        if (node.ports) ports = *node.ports;
        Patch patch = started(node.name, node.type, node.attributes, id);
        finish(patch, ports, tags, node.inside != nullptr);
        if (node.inside) {
            addMembers(patch, node.inside->attributes);
            fill(patch, *node.inside, nullptr, false);
        }
        return patch;
    }

    // Members of an inline subgraph become members of its node. Its `id`, and members that the node
    // has too, are stored as one map in the attribute "subgraph".
    static void addMembers(Patch& patch, std::map<std::string, Unstructured> members) {
        auto const id = members.find("id");
        Unstructured::Map apart;
        if (id != members.end()) apart.insert(members.extract(id));
        patch.attributes.merge(members);
        apart.merge(members);
        if (!apart.empty()) addAttribute(patch, "subgraph", Unstructured(std::move(apart)));
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
            if (!name.text) patch.attributes["id"] = name.number;
        }
        return patch;
    }

    void finish(Patch& patch, GraphNode::Ports& ports, GroupTags const& tags, bool hasInside) {
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
            if (patch.builtin == kGroupInputKind) retagEnd(ports.outputs, tags.inputs, name);
            if (patch.builtin == kGroupOutputKind) retagEnd(ports.inputs, tags.outputs, name);
        }
        takeInto(patch.inputs, ports.inputs);
        takeInto(patch.outputs, ports.outputs);
        if (hasInside) patch.builtin = kGroupKind;
        if (isUse) use(definition->second, patch);
        if (patch.name.empty()) patch.name = patch.descriptor;
    }

    // Fills the patch with the content of the definition.
    void use(std::size_t position, Patch& patch) {
        Definition& definition = definitions[position];
        ++uses[position];
        patch.builtin = kGroupKind;
        if (patch.name.empty()) patch.name = definition.title;
        Unstructured::Map about = definition.graph.attributes;
        about["id"] = definition.id;
        about["name"] = definition.title;
        if (!hasEnd(definition.inputNode, definition.inputs)) {
            about["inputNode"] = definition.inputNode;
        }
        if (!hasEnd(definition.outputNode, definition.outputs)) {
            about["outputNode"] = definition.outputNode;
        }
        addAttribute(patch, "definition", Unstructured(std::move(about)));
        fill(patch, definition.graph, &definition, false);
    }

    // Whether nothing of that end would be lost: the document has nothing about it, or a patch made
    // by `addEnd` keeps it.
    static bool hasEnd(Unstructured const& node, std::vector<Port> const& ports) {
        return node.isNull() || (node.isMap() && !ports.empty());
    }

    // Adds the patch that represents the inputs or outputs inside a definition.
    void addEnd(std::vector<Patch>& children, Places& places, Unstructured const& node,
                unsigned long long kind, std::vector<Port> const& ofGroup) {
        if (ofGroup.empty()) return;
        long long const usual = kind == kGroupInputKind ? kInputNode : kOutputNode;
        places.emplace_back(NodeName{node.integerAt({"id"}, usual)}, children.size());
        Patch patch;
        patch.id = freeIdentifier();
        patch.builtin = kind;
        patch.name = kindToString(kind);
        if (Unstructured::Map const* const members = node.ifMap()) {
            patch.attributes = *members;
            patch.attributes.erase("id");
        }
        std::deque<Port> ports(ofGroup.begin(), ofGroup.end());
        finishPorts(ports, nullptr);
        takeInto(kind == kGroupInputKind ? patch.outputs : patch.inputs, ports);
        children.push_back(std::move(patch));
    }

    // Sets identifiers, tags, types and defaults. A property is the default of the first port with
    // its name.
    void finishPorts(std::deque<Port>& ports, Unstructured const* properties) {
        std::unordered_set<std::string_view> names;
        for (std::size_t i = 0; i < ports.size(); ++i) {
            Port& port = ports[i];
            bool const isFirst = names.insert(port.name).second;
            port.id = ++lastPortId;
            port.tag = i + 1;
            auto const type = port.attributes.find("type");
            port.typeInfo =
                typeInfoOf(type == port.attributes.end() ? Unstructured() : type->second);
            Unstructured const* setting =
                properties == nullptr || !isFirst ? nullptr : properties->find(port.name);
            if (setting == nullptr && i == 0 && properties != nullptr) {
                setting = properties->find("value");
            }
            port.defaultValue = setting == nullptr ? Value::defaultValue(port.typeInfo.type)
                                                   : asDefault(*setting, port.typeInfo.type);
        }
    }

    // Editors give the time in one unit or in two; our kind identifies them by tag.
    static void retagTime(std::deque<Port>& outputs) {
        for (Port& port : outputs) {
            port.tag = lowerCase(port.name).find("ms") != std::string::npos ? 3 : 1;
        }
    }

    // The inner ends of a group match the group's ports by name; this sets their tags.
    static void retagEnd(std::deque<Port>& ends,
                         std::unordered_map<std::string, unsigned long long> const& tags,
                         std::string const& name) {
        auto const tag = tags.find(name);
        if (!ends.empty() && tag != tags.end()) ends[0].tag = tag->second;
    }

    // A use may have only some of its definition's ports, in any order. Each gets the tag of the
    // first unused port with its name; others get new tags.
    static void joinByName(std::deque<Port>& ports, std::vector<Port> const& ofDefinition) {
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

    // Fills `connection` in, or returns what does not exist.
    static std::string connect(GraphLink const& link, Places const& places,
                               std::vector<Patch> const& patches, Connection& connection) {
        if (!link.hasEnds) return "node at one of its ends";
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

    // The first patch with this name.
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

    unsigned long long freeIdentifier() {
        while (!patchIds.insert(nextFree).second) ++nextFree;
        return nextFree;
    }

    std::deque<Definition>& definitions;
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

std::string pointerTo(NodeGraph const& graph) {
    std::vector<NodeGraph const*> path;
    for (NodeGraph const* g = &graph; g != nullptr; g = g->around) path.push_back(g);
    std::string pointer;
    for (auto g = path.rbegin(); g != path.rend(); ++g) {
        std::string const position = std::to_string((*g)->position);
        if ((*g)->around != nullptr) {
            pointer += "/nodes/" + position + "/subgraph";
        } else if ((*g)->isDefinition) {
            pointer += "/definitions/subgraphs/" + position;
        }
    }
    return pointer;
}

bool toPatches(NodeGraph& graph, std::deque<Definition>& definitions, Patch& root,
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
    } else if (size.copiedBytes > kMostCopiedBytes) {
        error.message = "the copies of its shared definitions take more than 256 MiB";
    } else if (size.depth > kDeepestGroups) {
        error.message = "groups nest deeper than " + std::to_string(kDeepestGroups) + " levels";
    }
    if (!error.message.empty()) return false;
    root.name = "graph";
    root.builtin = kGroupKind;
    root.attributes = std::move(graph.attributes);
    Maker(definitions, positions, info).make(graph, root);
    return true;
}

}  // namespace tarn::engine::detail
