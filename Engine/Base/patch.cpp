#include <Engine/Base/patch.h>

#include <Engine/Base/assertion.h>
#include <Engine/Base/detail/immortal.h>
#include <Engine/Base/detail/prefetch.h>

#include <cstdint>
#include <ostream>

namespace tarn::engine {

namespace {

using detail::elementsOf;

constexpr char kInputs[] = "inputs != nullptr";
constexpr char kOutputs[] = "outputs != nullptr";
constexpr char kConnections[] = "connections != nullptr";
constexpr char kChildren[] = "children != nullptr";

template <class List>
bool listsEqual(List const& a, List const& b, char const* condition) {
    return a == b || elementsOf(a, condition) == elementsOf(b, condition);
}

// The list, checked for null. (The check is a function of its own, to keep the stack frames of
// recursive conversions small.)
template <class T>
Array<T> const& requireList(Array<T> const& list, char const* condition) {
    static_cast<void>(elementsOf(list, condition));
    return list;
}

// One for each type of element, without a reference count.
template <class T>
Array<T> emptyList() noexcept {
    static detail::Immortal<std::vector<T>> const list;
    return Array<T>(std::shared_ptr<void>(), &list.value);
}

// Searches are limited by memory latency, so the list of a later child is prefetched.
constexpr std::size_t kAhead = 6;

// Searches below the patch, not the patch itself.
template <class AnyPatch>
AnyPatch const* findBelow(AnyPatch const& root, unsigned long long id) {
    auto const& children = elementsOf(root.children, kChildren);
    for (AnyPatch const& child : children) {
        if (child.id == id) return &child;
    }
    for (std::size_t i = 0; i < children.size(); ++i) {
        if (i + kAhead < children.size()) detail::prefetch(children[i + kAhead].children.get());
        if (elementsOf(children[i].children, kChildren).empty()) continue;
        if (AnyPatch const* found = findBelow(children[i], id)) return found;
    }
    return nullptr;
}

template <class AnyPatch>
AnyPatch const* findPatch(AnyPatch const& root, unsigned long long id) {
    if (id == 0) return nullptr;
    return root.id == id ? &root : findBelow(root, id);
}

// The first element of the list whose `field` equals `wanted`.
template <class Element>
Element const* findByField(std::vector<Element> const& list, unsigned long long Element::*field,
                           unsigned long long wanted) {
    for (Element const& element : list) {
        if (element.*field == wanted) return &element;
    }
    return nullptr;
}

// Finds the port in the list `ports` of the patch, then of its children.
EvalPort const* findPort(EvalPatch const& patch, MutableArray<EvalPort> EvalPatch::*ports,
                         char const* condition, unsigned long long portId) {
    auto const among = [&](EvalPatch const& owner) {
        return findByField(elementsOf(owner.*ports, condition), &EvalPort::id, portId);
    };
    if (EvalPort const* port = among(patch)) return port;
    for (EvalPatch const& child : elementsOf(patch.children, kChildren)) {
        if (EvalPort const* port = among(child)) return port;
    }
    return nullptr;
}

std::unordered_set<Connection> connectionsByField(Patch const& patch,
                                                  unsigned long long Connection::*field,
                                                  unsigned long long wanted) {
    std::unordered_set<Connection> found;
    for (Connection const& connection : elementsOf(patch.connections, kConnections)) {
        if (connection.*field == wanted) found.insert(connection);
    }
    return found;
}

// The first patch of the subtree, depth first, with a child that has the port as an output.
Patch const* parentOfOutput(Patch const& root, unsigned long long portId) {
    std::vector<Patch> const& children = elementsOf(root.children, kChildren);
    for (std::size_t i = 0; i < children.size(); ++i) {
        if (i + kAhead < children.size()) detail::prefetch(children[i + kAhead].outputs.get());
        if (findByField(elementsOf(children[i].outputs, kOutputs), &Port::id, portId) != nullptr)
            return &root;
    }
    for (std::size_t i = 0; i < children.size(); ++i) {
        if (i + kAhead < children.size()) detail::prefetch(children[i + kAhead].children.get());
        if (elementsOf(children[i].children, kChildren).empty()) continue;
        if (Patch const* parent = parentOfOutput(children[i], portId)) return parent;
    }
    return nullptr;
}

}  // namespace

namespace detail {

Array<Port> emptyPorts() noexcept { return emptyList<Port>(); }
Array<Connection> emptyConnections() noexcept { return emptyList<Connection>(); }
Array<Patch> emptyPatches() noexcept { return emptyList<Patch>(); }

void listIsNull(char const* condition) noexcept {
    assertionFailed(condition, "elementsOf", "Engine/Base/patch", __LINE__);
}

}  // namespace detail

bool Port::operator==(Port const& other) const {
    return id == other.id && tag == other.tag && name == other.name && typeInfo == other.typeInfo &&
           defaultValue == other.defaultValue && attributes == other.attributes;
}
bool Port::operator!=(Port const& other) const { return !(*this == other); }

bool Connection::operator==(Connection const& other) const {
    return fromPatchId == other.fromPatchId && fromPortId == other.fromPortId &&
           toPatchId == other.toPatchId && toPortId == other.toPortId;
}
bool Connection::operator!=(Connection const& other) const { return !(*this == other); }

bool Patch::operator==(Patch const& other) const {
    return id == other.id && descriptor == other.descriptor && builtin == other.builtin &&
           name == other.name && listsEqual(inputs, other.inputs, kInputs) &&
           listsEqual(outputs, other.outputs, kOutputs) &&
           listsEqual(children, other.children, kChildren) && modelLayer == other.modelLayer &&
           listsEqual(connections, other.connections, kConnections) &&
           attributes == other.attributes;
}
bool Patch::operator!=(Patch const& other) const { return !(*this == other); }

EvalPort::EvalPort() = default;
EvalPort::EvalPort(Port const& port)
    : id(port.id),
      tag(port.tag),
      typeInfo(port.typeInfo),
      values(1, port.defaultValue),
      name(port.name) {}

bool EvalPort::operator==(EvalPort const& other) const {
    return id == other.id && tag == other.tag && evaluatorState == other.evaluatorState &&
           evaluatorFlag == other.evaluatorFlag && typeInfo == other.typeInfo &&
           values == other.values && name == other.name;
}
bool EvalPort::operator!=(EvalPort const& other) const { return !(*this == other); }

EvalPatch::EvalPatch() = default;
EvalPatch::EvalPatch(Patch const& patch)
    : id(patch.id),
      builtin(patch.builtin),
      inputs(map(toEvalPort, requireList(patch.inputs, kInputs))),
      outputs(map(toEvalPort, requireList(patch.outputs, kOutputs))),
      name(patch.name),
      children(map(toEvalPatch, requireList(patch.children, kChildren))),
      modelLayer(patch.modelLayer),
      hasInputCount(patch.attributes.count("inputCount") != 0),
      hasOutputCount(patch.attributes.count("outputCount") != 0) {}

bool EvalPatch::operator==(EvalPatch const& other) const {
    return id == other.id && builtin == other.builtin && name == other.name &&
           hasInputCount == other.hasInputCount && hasOutputCount == other.hasOutputCount &&
           listsEqual(inputs, other.inputs, kInputs) &&
           listsEqual(outputs, other.outputs, kOutputs) &&
           listsEqual(children, other.children, kChildren) && modelLayer == other.modelLayer;
}
bool EvalPatch::operator!=(EvalPatch const& other) const { return !(*this == other); }

EvalPort toEvalPort(Port const& port) { return EvalPort(port); }
EvalPatch toEvalPatch(Patch const& patch) { return EvalPatch(patch); }

Patch const* findPatchRecursive(Patch const& root, unsigned long long id) {
    return findPatch(root, id);
}
EvalPatch const* findPatchRecursive(EvalPatch const& root, unsigned long long id) {
    return findPatch(root, id);
}

EvalPort const* findInputPort(EvalPatch const& patch, unsigned long long portId) {
    return findPort(patch, &EvalPatch::inputs, kInputs, portId);
}
EvalPort const* findOutputPort(EvalPatch const& patch, unsigned long long portId) {
    return findPort(patch, &EvalPatch::outputs, kOutputs, portId);
}

Optional<Connection> findIncomingConnectionToPort(Patch const& patch, unsigned long long portId) {
    Connection const* const found =
        findByField(elementsOf(patch.connections, kConnections), &Connection::toPortId, portId);
    if (found == nullptr) return std::nullopt;
    return *found;
}

std::unordered_set<Connection> findIncomingConnectionsToPatch(Patch const& patch,
                                                              unsigned long long patchId) {
    return connectionsByField(patch, &Connection::toPatchId, patchId);
}
std::unordered_set<Connection> findOutgoingConnectionsFromPatch(Patch const& patch,
                                                                unsigned long long patchId) {
    return connectionsByField(patch, &Connection::fromPatchId, patchId);
}

Optional<std::unordered_set<Connection>>
_findOutgoingConnectionsFromPort(Patch const& root, unsigned long long portId) {
    Patch const* const parent = parentOfOutput(root, portId);
    if (parent == nullptr) return std::nullopt;
    return connectionsByField(*parent, &Connection::fromPortId, portId);
}

std::unordered_set<Connection> findOutgoingConnectionsFromPort(Patch const& root,
                                                               unsigned long long portId) {
    auto found = _findOutgoingConnectionsFromPort(root, portId);
    return found ? *std::move(found) : std::unordered_set<Connection>();
}

Port const* inPortForTag(Patch const& patch, unsigned long long tag) {
    return findByField(elementsOf(patch.inputs, kInputs), &Port::tag, tag);
}
EvalPort const* inPortForTag(EvalPatch const& patch, unsigned long long tag) {
    return findByField(elementsOf(patch.inputs, kInputs), &EvalPort::tag, tag);
}
Port const* outPortForTag(Patch const& patch, unsigned long long tag) {
    return findByField(elementsOf(patch.outputs, kOutputs), &Port::tag, tag);
}
EvalPort const* outPortForTag(EvalPatch const& patch, unsigned long long tag) {
    return findByField(elementsOf(patch.outputs, kOutputs), &EvalPort::tag, tag);
}

std::ostream& operator<<(std::ostream& stream, Port const& port) {
    return stream << "[" << port.name << ":" << port.id << " tag: " << port.tag
                  << " typeInfo: " << port.typeInfo << " defaultValue: " << port.defaultValue
                  << "]";
}

std::ostream& operator<<(std::ostream& stream, Connection const& connection) {
    return stream << "[connection:" << connection.fromPortId << "->" << connection.toPortId << "]";
}

std::ostream& operator<<(std::ostream& stream, Patch const& patch) {
    stream << "[patch:" << patch.id << " name: " << patch.name << " builtin: " << patch.builtin;
    if (elementsOf(patch.inputs, kInputs).empty() && elementsOf(patch.outputs, kOutputs).empty())
        stream << "]";
    for (Port const& port : elementsOf(patch.inputs, kInputs)) stream << "  " << port << std::endl;
    for (Port const& port : elementsOf(patch.outputs, kOutputs))
        stream << "  " << port << std::endl;
    for (Patch const& child : elementsOf(patch.children, kChildren)) stream << child << std::endl;
    for (Connection const& connection : elementsOf(patch.connections, kConnections))
        stream << connection << std::endl;
    return stream;
}

}  // namespace tarn::engine

std::size_t std::hash<tarn::engine::Connection>::operator()(
    tarn::engine::Connection const& connection) const noexcept {
    std::uint64_t seed = 0;
    for (std::uint64_t const field : {connection.fromPatchId, connection.fromPortId,
                                      connection.toPatchId, connection.toPortId}) {
        seed ^= field + 0x9e3779b9 + (seed << 6) + (seed >> 2);
    }
    return static_cast<std::size_t>(seed);
}
