#include <Engine/Document/detail/graph_reader.h>

#include <Engine/Document/detail/texts.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <utility>

namespace tarn::engine::detail {

namespace {

constexpr char kLinkForm[] = "expected [id, from node, from slot, to node, to slot, type]";

Unstructured emptyContainer(bool isObject) {
    return isObject ? Unstructured(Unstructured::Map()) : Unstructured(Unstructured::Array());
}

// An integer, written with or without a fraction: 3, 3.0.
Optional<long long> integerOf(Unstructured const& data) {
    Unstructured::Lookup lookup = Unstructured::Lookup::Missing;
    long long const number = data.integerAt({}, 0, &lookup);
    if (lookup == Unstructured::Lookup::Found) return number;
    return std::nullopt;
}

}  // namespace

std::string GraphReader::pointer() const {
    std::string result;
    for (Level const& level : levels) {
        switch (level.place) {
            case Place::Nodes:
            case Place::Ports:
            case Place::Links:
            case Place::DefinitionList: result += pointerStep(level.position); break;
            case Place::Graph:
            case Place::Node:
            case Place::Port:
            case Place::Definitions: result += pointerStep(level.key); break;
        }
    }
    return result;
}

bool GraphReader::push(Place place) {
    levels.push_back({});
    levels.back().place = place;
    return true;
}

bool GraphReader::refuseType(char const* wanted, Unstructured const& found,
                             std::string const& step) {
    return refuseAt(pointer() + step,
                    "expected " + std::string(wanted) + ", found " + describe(found));
}

bool GraphReader::onKey(std::string& key) {
    levels.back().key = std::move(key);
    return true;
}

bool GraphReader::openGraph(NodeGraph& opened, bool isDefinition) {
    if (openGraphs.size() == kDeepestGroups) {
        return refuse("groups nest deeper than " + std::to_string(kDeepestGroups) + " levels");
    }
    opened.isDefinition = isDefinition;
    if (isDefinition) {
        opened.position = definitions.size() - 1;
    } else if (!openGraphs.empty()) {
        opened.around = openGraphs.back();
        opened.position = levels[levels.size() - 2].position;
    }
    openGraphs.push_back(&opened);
    push(Place::Graph);
    levels.back().isDefinition = isDefinition;
    return true;
}

bool GraphReader::onOpen(bool isObject) {
    if (levels.empty()) {
        return isObject ? openGraph(graph, false) : refuseType("an object", emptyContainer(false));
    }
    std::string const& key = levels.back().key;
    switch (levels.back().place) {
        case Place::Graph: return openInGraph(isObject);
        case Place::Node: return openInNode(isObject);
        case Place::Links: return capture(isObject);
        case Place::Port:
            if (key == "name") return refuseType("a string", emptyContainer(isObject));
            if (key == "type" && isObject) return refuse("expected a string, a number or a list");
            return capture(isObject);
        case Place::Definitions:
            if (key == "subgraphs" && !isObject) return push(Place::DefinitionList);
            return capture(isObject);
        case Place::Nodes:
            if (!isObject) break;
            openNodes.push_back(&openGraphs.back()->nodes.emplace_back());
            return push(Place::Node);
        case Place::Ports:
            if (!isObject) break;
            if (openPorts != nullptr) {
                openPorts->emplace_back();
            } else {
                openDefinitionPorts->emplace_back();
            }
            return push(Place::Port);
        case Place::DefinitionList:
            if (!isObject) break;
            return openGraph(definitions.emplace_back().graph, true);
    }
    return refuseType("an object", emptyContainer(isObject));
}

bool GraphReader::openInGraph(bool isObject) {
    Level const& level = levels.back();
    std::string const& key = level.key;
    if (key == "nodes" || key == "links") {
        if (isObject) return refuseType("an array", emptyContainer(isObject));
        return push(key == "nodes" ? Place::Nodes : Place::Links);
    }
    if (level.isDefinition && (key == "inputs" || key == "outputs")) {
        if (isObject) return refuseType("an array", emptyContainer(isObject));
        Definition& definition = definitions.back();
        openPorts = nullptr;
        openDefinitionPorts = key == "inputs" ? &definition.inputs : &definition.outputs;
        return push(Place::Ports);
    }
    if (level.isDefinition && key == "name")
        return refuseType("a string", emptyContainer(isObject));
    if (levels.size() == 1 && key == "definitions" && isObject) return push(Place::Definitions);
    return capture(isObject);
}

bool GraphReader::openInNode(bool isObject) {
    std::string const& key = levels.back().key;
    GraphNode& node = *openNodes.back();
    if (key == "inputs" || key == "outputs") {
        if (isObject) return refuseType("an array", emptyContainer(isObject));
        if (!node.ports) node.ports = std::make_unique<GraphNode::Ports>();
        openPorts = key == "inputs" ? &node.ports->inputs : &node.ports->outputs;
        return push(Place::Ports);
    }
    if (key == "subgraph" && isObject) {
        if (!node.inside) node.inside = std::make_unique<NodeGraph>();
        return openGraph(*node.inside, false);
    }
    if (key == "subgraph" || key == "id" || key == "type" || key == "title" ||
        (key == "properties" && !isObject)) {
        Unstructured found = emptyContainer(isObject);
        return setNodeMember(found);
    }
    return capture(isObject);
}

bool GraphReader::onString(std::string& text) {
    Scalar scalar{std::move(text), false, false};
    return set(scalar);
}

bool GraphReader::onScalar(Scalar& scalar) { return set(scalar); }
bool GraphReader::onData(Scalar& captured) { return set(captured); }

// Sets a member of an object or an element of a list.
bool GraphReader::set(Scalar& scalar) {
    Unstructured& data = scalar.data;
    if (levels.empty()) return refuseType("an object", data);
    Level& level = levels.back();
    switch (level.place) {
        case Place::Graph: return setGraphMember(data);
        case Place::Node: return setNodeMember(data);
        case Place::Port: return setPortMember(data);
        case Place::Definitions: otherDefinitions[level.key] = std::move(data); return true;
        case Place::Links:
            if (!data.isNull() && !addLink(data)) return false;
            ++level.position;
            return true;
        case Place::Nodes:
        case Place::Ports:
        case Place::DefinitionList: break;
    }
    return refuseType("an object", data);
}

bool GraphReader::setGraphMember(Unstructured& data) {
    Level const& level = levels.back();
    NodeGraph& opened = *openGraphs.back();
    std::string const& key = level.key;
    if (key == "nodes" || key == "links") return data.isNull() || refuseType("an array", data);
    if (level.isDefinition) {
        Definition& definition = definitions.back();
        if (key == "id") {
            definition.id = data.isString() ? *data.ifString() : data.toText();
            return true;
        }
        if (key == "name") {
            if (!data.isString()) return data.isNull() || refuseType("a string", data);
            definition.title = *data.ifString();
            return true;
        }
        if (key == "inputs" || key == "outputs") {
            return data.isNull() || refuseType("an array", data);
        }
        if (key == "inputNode" || key == "outputNode") {
            (key == "inputNode" ? definition.inputNode : definition.outputNode) = std::move(data);
            return true;
        }
    }
    opened.attributes[key] = std::move(data);
    return true;
}

bool GraphReader::setNodeMember(Unstructured& data) {
    Level& level = levels.back();
    GraphNode& node = *openNodes.back();
    std::string const& key = level.key;
    if (key == "id") {
        level.hasId = true;
        if (!setName(node.name, data, "")) return false;
        // The original identifier is kept as an attribute where it cannot be used: a string or an
        // invalid number.
        if (node.name.text) node.attributes[key] = std::move(data);
        return true;
    }
    if (key == "type") {
        if (!data.isString()) return refuseType("a string", data);
        level.hasType = true;
        node.type = *data.ifString();
        return true;
    }
    if (key == "title") {
        if (!data.isString()) return data.isNull() || refuseType("a string", data);
        node.attributes[key] = std::move(data);
        return true;
    }
    if (key == "inputs" || key == "outputs") return data.isNull() || refuseType("an array", data);
    if (key == "subgraph") return data.isNull() || refuseType("an object", data);
    if (key == "properties" && !data.isMap()) return data.isNull() || refuseType("an object", data);
    node.attributes[key] = std::move(data);
    return true;
}

bool GraphReader::setPortMember(Unstructured& data) {
    Port& port = openPorts != nullptr ? openPorts->back() : openDefinitionPorts->back();
    std::string const& key = levels.back().key;
    if (key == "name") {
        if (!data.isString()) return data.isNull() || refuseType("a string", data);
        port.name = *data.ifString();
        return true;
    }
    // Redundant: the links themselves have this information.
    if (key == "link" || key == "links" || key == "linkIds") return true;
    port.attributes[key] = std::move(data);
    return true;
}

bool GraphReader::setName(NodeName& name, Unstructured const& data, std::string const& step) {
    name = NodeName();
    if (Optional<long long> const number = integerOf(data)) {
        name.number = *number;
        return true;
    }
    if (data.isIdentifier() || data.isNumber()) {
        name.text = std::make_shared<std::string const>(data.toText());
        return true;
    }
    if (!data.isString()) return refuseType("a number or a string", data, step);
    // Editors write the number of a node as a number or a string.
    if (Optional<long long> const number = integerOfText(*data.ifString())) {
        name.number = *number;
    } else {
        name.text = std::make_shared<std::string const>(*data.ifString());
    }
    return true;
}

bool GraphReader::setInteger(long long& number, Unstructured const& data, std::string const& step) {
    Optional<long long> const integer =
        data.isString() ? integerOfText(*data.ifString()) : integerOf(data);
    if (!integer) return refuseType("an integer", data, step);
    number = *integer;
    return true;
}

bool GraphReader::addLink(Unstructured const& data) {
    constexpr std::array<char const*, 5> kKeys{"id", "origin_id", "origin_slot", "target_id",
                                               "target_slot"};
    std::array<Unstructured const*, 5> parts{};
    std::array<std::string, 5> steps;
    for (std::size_t i = 0; i < parts.size(); ++i) {
        parts[i] = data.isMap() ? data.find(kKeys[i]) : data.find(i);
        steps[i] = data.isMap() ? pointerStep(kKeys[i]) : pointerStep(i);
        if (parts[i] != nullptr) continue;
        if (!data.isMap()) return refuse(kLinkForm);
        return refuse("\"" + std::string(kKeys[i]) + "\" is missing");
    }
    GraphLink link;
    link.id = integerOf(*parts[0]).value_or(0);
    link.hasEnds = std::none_of(parts.begin() + 1, parts.end(),
                                [](Unstructured const* part) { return part->isNull(); });
    if (link.hasEnds &&
        (!setName(link.from, *parts[1], steps[1]) ||
         !setInteger(link.fromSlot, *parts[2], steps[2]) ||
         !setName(link.to, *parts[3], steps[3]) || !setInteger(link.toSlot, *parts[4], steps[4]))) {
        return false;
    }
    link.position = levels.back().position;
    openGraphs.back()->links.emplace_back() = std::move(link);
    if (data.isMap()) keepLinkMembers(data);
    return true;
}

// Connections have no attributes: additional members are stored in the patch around them.
void GraphReader::keepLinkMembers(Unstructured const& link) {
    Unstructured::Map members = *link.ifMap();
    for (char const* known : {"origin_id", "origin_slot", "target_id", "target_slot", "type"}) {
        members.erase(known);
    }
    if (members.size() > 1) openGraphs.back()->linkMembers.emplace_back(std::move(members));
}

bool GraphReader::onClose() {
    Level const level = std::move(levels.back());
    levels.pop_back();
    switch (level.place) {
        case Place::Node:
            openNodes.pop_back();
            if (!level.hasId) return refuse("\"id\" is missing");
            if (!level.hasType) return refuse("\"type\" is missing");
            break;
        case Place::Graph:
            openGraphs.pop_back();
            if (levels.empty() && !otherDefinitions.empty()) {
                graph.attributes["definitions"] = std::move(otherDefinitions);
            }
            break;
        case Place::Port:
        case Place::Nodes:
        case Place::Ports:
        case Place::Links:
        case Place::Definitions:
        case Place::DefinitionList: break;
    }
    // Moves to the next element of the list around the record.
    bool const isElement = level.place == Place::Node || level.place == Place::Port ||
                           (level.place == Place::Graph && level.isDefinition);
    if (isElement) ++levels.back().position;
    return true;
}

}  // namespace tarn::engine::detail
