#include <Engine/Base/patch_edit.h>

#include <Engine/Base/detail/patch_tables.h>

#include <algorithm>
#include <cmath>
#include <deque>
#include <iterator>
#include <list>
#include <map>
#include <string>
#include <unordered_map>
#include <unordered_set>
#include <utility>
#include <vector>

namespace tarn::engine {

namespace {

using detail::kNone;

enum class Side : unsigned char { Input, Output };

// A port in a changed list: either the existing one or the edit's own copy.
struct PortEntry {
    unsigned long long id = 0;
    Port const* base = nullptr;
    std::unique_ptr<Port> own = nullptr;

    Port const& port() const { return own ? *own : *base; }
};

struct PortEdits {
    bool isOpen = false;
    std::vector<PortEntry> entries;
};

// A patch that is changed, or has a changed patch inside it.
struct Node {
    // The patch before the edit, without the edit's lists, and after it.
    Patch const* base = nullptr;
    Patch fields = {};
    bool isHandedOut = false;  // Otherwise the fields are unchanged.
    PortEdits inputs = {};
    PortEdits outputs = {};
    // The numbers of its children, once their order has changed.
    bool hasOrder = false;
    std::vector<std::uint32_t> order = {};
    std::unordered_set<Connection, detail::SeededHash> disconnected = {};
    // Values are consecutive numbers, in the order in which connections were added.
    std::unordered_map<Connection, std::size_t, detail::SeededHash> connected = {};
};

using Numbers = std::unordered_map<unsigned long long, std::uint32_t, detail::SeededHash>;

// Moves all `elements` into a container that uses the same seed and has enough room, so that
// nothing can fail.
template <class Container>
void absorb(Container& container, Container&& elements) noexcept {
    container.merge(elements);
}

std::vector<Port> const& portsOf(Patch const& patch, Side side) {
    return side == Side::Input ? *patch.inputs : *patch.outputs;
}

template <class T>
void insertAt(std::vector<T>& list, std::size_t position, T element) noexcept {
    std::size_t const place = std::min(position, list.size());
    list.insert(list.begin() + static_cast<std::ptrdiff_t>(place), std::move(element));
}

// Whether they are identical, signed zeros included. Unstructured data and paths must be the same
// object.
bool isSame(Value const& a, Value const& b) {
    if (a.type() != b.type() || a != b) return false;
    switch (a.type()) {
        case Type::Float:
        case Type::Vec2:
        case Type::Vec3:
        case Type::Vec4: {
            FloatVec4 const x = a;
            FloatVec4 const y = b;
            return std::signbit(x.x) == std::signbit(y.x) &&
                   std::signbit(x.y) == std::signbit(y.y) &&
                   std::signbit(x.z) == std::signbit(y.z) && std::signbit(x.w) == std::signbit(y.w);
        }
        case Type::Path: return a.ifPath() == b.ifPath();
        case Type::Unstructured: return a.ifUnstructured() == b.ifUnstructured();
        case Type::Mat4:  // Compared by bytes.
        case Type::Int:
        case Type::Boolean:
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::String:
        case Type::Model: break;
    }
    return true;
}

bool isSame(Optional<Value> const& a, Optional<Value> const& b) {
    return a.hasValue() == b.hasValue() && (!a || isSame(*a, *b));
}

using Attributes = std::map<std::string, Unstructured>;

// The string shows the sign of a zero.
bool isSame(Unstructured const& a, Unstructured const& b) {
    constexpr std::size_t kAll = std::numeric_limits<std::size_t>::max();
    return a == b && a.toText(kAll, kAll) == b.toText(kAll, kAll);
}

bool isSame(Attributes const& a, Attributes const& b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](auto const& x, auto const& y) {
        return x.first == y.first && isSame(x.second, y.second);
    });
}

bool haveSameFields(Patch const& a, Patch const& b) {
    return a.builtin == b.builtin && a.descriptor == b.descriptor && a.name == b.name &&
           a.modelLayer == b.modelLayer && isSame(a.attributes, b.attributes);
}

}  // namespace

// Every patch has a number: that of its record in the index, or a later number for patches that the
// edit adds.
class PatchEdit::State {
public:
    explicit State(std::shared_ptr<detail::PatchTables> shared)
        : tables(std::move(shared)),
          largestPatchId(tables->largestPatchId),
          largestPortId(tables->largestPortId) {}

    bool isDone() const { return tables == nullptr; }

    Patch* patch(unsigned long long id) {
        std::uint32_t const number = find(id);
        if (number == kNone) return nullptr;
        Node& node = touch(number);
        node.isHandedOut = true;
        return &node.fields;
    }

    Port* port(unsigned long long portId, Side side) {
        PortPlace const place = findPort(portId, side);
        if (place.owner == kNone) return nullptr;
        PortEntry& entry = openPorts(touch(place.owner), side).entries[place.position];
        if (!entry.own) entry.own = std::make_unique<Port>(*entry.base);
        return entry.own.get();
    }

    bool addPort(unsigned long long patchId, Port& port, Side side, std::size_t position) {
        std::uint32_t const owner = find(patchId);
        if (owner == kNone || port.id == 0 || isPortTaken(port.id)) return false;
        PortEdits& ports = openPorts(touch(owner), side);
        detail::reserveFor(ports.entries, 1);
        auto& known = side == Side::Input ? addedInputs : addedOutputs;
        PortEntry entry{port.id, nullptr, nullptr};
        entry.own = std::make_unique<Port>(std::move(port));
        known[entry.id] = owner;
        largestPortId = std::max(largestPortId, entry.id);
        insertAt(ports.entries, position, std::move(entry));
        return true;
    }

    bool removePort(unsigned long long portId, Side side) {
        PortPlace const place = findPort(portId, side);
        if (place.owner == kNone) return false;
        PortEdits& ports = openPorts(touch(place.owner), side);
        detail::reserveFor(removedPorts, 1);
        std::uint32_t const parent = parentOf(place.owner);
        if (parent != kNone) {
            unsigned long long const owner = patchOf(place.owner).id;
            disconnectAll(parent, place.owner, [&](Connection const& c) {
                return side == Side::Input ? c.toPatchId == owner && c.toPortId == portId
                                           : c.fromPatchId == owner && c.fromPortId == portId;
            });
        }
        auto const entry = ports.entries.begin() + static_cast<std::ptrdiff_t>(place.position);
        removedPorts.push_back(std::move(entry->own));
        ports.entries.erase(entry);
        return true;
    }

    bool addPatch(unsigned long long parentId, Patch& patch, std::size_t position) {
        std::uint32_t const parent = find(parentId);
        if (parent == kNone) return false;
        Node& node = touch(parent);
        openOrder(node, parent);
        detail::reserveFor(node.order, 1);
        std::size_t const before = added.size();
        try {
            return addTree(parent, patch, node, position);
        } catch (...) {
            added.resize(before);
            throw;
        }
    }

    bool removePatch(unsigned long long id) {
        std::uint32_t const number = find(id);
        std::uint32_t const parent = number == kNone ? kNone : parentOf(number);
        if (parent == kNone) return false;
        Node& node = touch(parent);
        openOrder(node, parent);
        std::unordered_set<std::uint32_t> one{number};
        detail::reserveSlots(removed, 1);
        disconnectAll(parent, number, [id](Connection const& c) {
            return c.fromPatchId == id || c.toPatchId == id;
        });
        absorb(removed, std::move(one));
        takeOut(node, number);
        return true;
    }

    bool movePatch(unsigned long long id, unsigned long long parentId, std::size_t position) {
        std::uint32_t const number = find(id);
        std::uint32_t const target = find(parentId);
        std::uint32_t const source = number == kNone ? kNone : parentOf(number);
        if (source == kNone || target == kNone || isInside(target, number)) return false;
        Node& from = touch(source);
        Node& to = touch(target);
        openOrder(from, source);
        openOrder(to, target);
        detail::reserveFor(to.order, 1);
        if (source != target) {
            std::unordered_map<std::uint32_t, std::uint32_t> one;
            if (parents.count(number) == 0) one.emplace(number, target);
            detail::reserveSlots(parents, 1);
            disconnectAll(source, number, [id](Connection const& c) {
                return c.fromPatchId == id || c.toPatchId == id;
            });
            absorb(parents, std::move(one));
            parents.find(number)->second = target;
        }
        takeOut(from, number);
        insertAt(to.order, position, number);
        return true;
    }

    bool connect(Connection const& connection) {
        std::uint32_t const from = find(connection.fromPatchId);
        std::uint32_t const to = find(connection.toPatchId);
        if (from == kNone || to == kNone) return false;
        std::uint32_t const parent = parentOf(from);
        if (parent == kNone || parentOf(to) != parent ||
            positionOf(from, Side::Output, connection.fromPortId) == kEnd ||
            positionOf(to, Side::Input, connection.toPortId) == kEnd ||
            isConnected(parent, connection)) {
            return false;
        }
        Node& node = touch(parent);
        // A removed connection that is added again takes its former place.
        if (node.disconnected.erase(connection) == 0) {
            node.connected.emplace(connection, ++lastConnection);
        }
        return true;
    }

    bool disconnect(Connection const& connection) {
        for (unsigned long long const end : {connection.fromPatchId, connection.toPatchId}) {
            std::uint32_t const child = find(end);
            std::uint32_t const parent = child == kNone ? kNone : parentOf(child);
            if (parent == kNone || !isConnected(parent, connection)) continue;
            Node& node = touch(parent);
            if (node.connected.erase(connection) == 0) node.disconnected.insert(connection);
            return true;
        }
        return false;
    }

    unsigned long long freshPatchId() {
        return fresh(largestPatchId, lastPatchGap, givenPatches, [this](unsigned long long id) {
            return tables->graph.recordOf(id) != kNone || addedPatches.count(id) != 0 ||
                   givenPatches.count(id) != 0;
        });
    }

    unsigned long long freshPortId() {
        return fresh(largestPortId, lastPortGap, givenPorts, [this](unsigned long long id) {
            return tables->graph.ownerOfPort(id) != kNone || addedInputs.count(id) != 0 ||
                   addedOutputs.count(id) != 0 || givenPorts.count(id) != 0;
        });
    }

    Patch commit() {
        if (isDone()) return result;
        Patch root = Commit(*this).run();
        Patch answer = root;
        result = std::move(root);
        nodes.clear();
        removedPorts.clear();
        added.clear();
        trees.clear();
        tables = nullptr;
        return answer;
    }

private:
    struct PortPlace {
        std::uint32_t owner = kNone;
        std::size_t position = 0;
    };
    struct Added {
        Patch const* patch;
        std::uint32_t parent;
        std::uint32_t firstChild;
    };

    std::uint32_t recordCount() const {
        return static_cast<std::uint32_t>(tables->graph.records.size());
    }
    bool isAdded(std::uint32_t number) const { return number >= recordCount(); }

    // The patch before the edit, or as it was added.
    Patch const& patchOf(std::uint32_t number) const {
        return isAdded(number) ? *added[number - recordCount()].patch
                               : *tables->graph.records[number].patch;
    }

    std::uint32_t parentOf(std::uint32_t number) const {
        auto const moved = parents.find(number);
        if (moved != parents.end()) return moved->second;
        return isAdded(number) ? added[number - recordCount()].parent
                               : tables->graph.records[number].parent;
    }

    bool isInside(std::uint32_t number, std::uint32_t outer) const {
        while (number != kNone && number != outer) number = parentOf(number);
        return number == outer;
    }

    bool isThere(std::uint32_t number) const {
        if (removed.empty()) return true;
        while (number != kNone && removed.count(number) == 0) number = parentOf(number);
        return number == kNone;
    }

    // The number of the patch in the edited document, or `kNone`.
    std::uint32_t find(unsigned long long id) const {
        std::uint32_t const before = tables->graph.recordOf(id);
        if (before != kNone && isThere(before)) return before;
        auto const known = addedPatches.find(id);
        return known != addedPatches.end() && isThere(known->second) ? known->second : kNone;
    }

    Node const* nodeOf(std::uint32_t number) const {
        auto const node = nodes.find(number);
        return node == nodes.end() ? nullptr : &node->second;
    }

    // The position of the port in its list, or `kEnd`.
    std::size_t positionOf(std::uint32_t owner, Side side, unsigned long long portId) const {
        Node const* const node = nodeOf(owner);
        if (node != nullptr) {
            PortEdits const& ports = side == Side::Input ? node->inputs : node->outputs;
            if (ports.isOpen) {
                auto const found =
                    std::find_if(ports.entries.begin(), ports.entries.end(),
                                 [portId](PortEntry const& e) { return e.id == portId; });
                return found == ports.entries.end()
                           ? kEnd
                           : static_cast<std::size_t>(found - ports.entries.begin());
            }
        }
        std::vector<Port> const& ports = portsOf(patchOf(owner), side);
        auto const found = std::find_if(ports.begin(), ports.end(),
                                        [portId](Port const& p) { return p.id == portId; });
        return found == ports.end() ? kEnd : static_cast<std::size_t>(found - ports.begin());
    }

    PortPlace findPort(unsigned long long portId, Side side) const {
        auto const& graph = tables->graph;
        auto const& known = side == Side::Input ? addedInputs : addedOutputs;
        auto const later = known.find(portId);
        std::uint32_t const owners[] = {side == Side::Input ? graph.inputs.slotFor(portId).owner
                                                            : graph.outputs.slotFor(portId).owner,
                                        later == known.end() ? kNone : later->second};
        for (std::uint32_t const owner : owners) {
            if (owner == kNone || !isThere(owner)) continue;
            std::size_t const position = positionOf(owner, side, portId);
            if (position != kEnd) return {owner, position};
        }
        return {};
    }

    bool isPortTaken(unsigned long long portId) const {
        return findPort(portId, Side::Input).owner != kNone ||
               findPort(portId, Side::Output).owner != kNone;
    }

    // Prepares the patch, and all patches around it, for a change.
    Node& touch(std::uint32_t number) {
        // If a patch has a node, so have the patches around it.
        std::vector<std::uint32_t> missing;
        for (std::uint32_t n = number; n != kNone && nodes.count(n) == 0; n = parentOf(n)) {
            missing.push_back(n);
        }
        for (auto n = missing.rbegin(); n != missing.rend(); ++n) {
            nodes.emplace(*n, Node{&patchOf(*n), patchOf(*n)});
        }
        return nodes.find(number)->second;
    }

    static PortEdits& openPorts(Node& node, Side side) {
        PortEdits& ports = side == Side::Input ? node.inputs : node.outputs;
        if (ports.isOpen) return ports;
        std::vector<Port> const& list = portsOf(*node.base, side);
        std::vector<PortEntry> entries(list.size());
        for (std::size_t i = 0; i < list.size(); ++i) {
            entries[i].id = list[i].id;
            entries[i].base = &list[i];
        }
        ports.entries = std::move(entries);
        ports.isOpen = true;
        return ports;
    }

    // For a patch of a document with repeated identifiers.
    std::uint32_t firstChildOf(std::uint32_t record) const {
        auto const& records = tables->graph.records;
        if (firstChildren.empty()) {
            std::vector<std::uint32_t> first(records.size(), kNone);
            for (std::size_t i = records.size(); i > 1; --i) {
                first[records[i - 1].parent] = static_cast<std::uint32_t>(i - 1);
            }
            firstChildren = std::move(first);
        }
        return firstChildren[record];
    }

    std::vector<std::uint32_t> childrenOf(std::uint32_t number) const {
        std::vector<Patch> const& children = *patchOf(number).children;
        std::vector<std::uint32_t> numbers(children.size());
        if (children.empty()) return numbers;
        std::uint32_t previous = kNone;
        bool const areNeighbours = isAdded(number) || !tables->hasUniqueIds;
        if (areNeighbours) {
            previous = (isAdded(number) ? added[number - recordCount()].firstChild
                                        : firstChildOf(number)) -
                       1;
        }
        for (std::size_t i = 0; i < children.size(); ++i) {
            previous = areNeighbours ? previous + 1 : tables->childRecord(children, i, previous);
            numbers[i] = previous;
        }
        return numbers;
    }

    void openOrder(Node& node, std::uint32_t number) const {
        if (node.hasOrder) return;
        node.order = childrenOf(number);
        node.hasOrder = true;
    }

    static void takeOut(Node& node, std::uint32_t number) noexcept {
        node.order.erase(std::find(node.order.begin(), node.order.end(), number));
    }

    // Numbers all patches of the tree and registers their identifiers, which have to be new.
    bool addTree(std::uint32_t parent, Patch& given, Node& node, std::size_t position) {
        std::list<Patch> kept;
        kept.push_back(std::move(given));
        Patch const& tree = kept.back();
        std::size_t const before = added.size();
        auto const first = static_cast<std::uint32_t>(recordCount() + before);
        Numbers ids(0, addedPatches.hash_function());
        Numbers inputIds(0, addedInputs.hash_function());
        Numbers outputIds(0, addedOutputs.hash_function());
        unsigned long long largestId = largestPatchId;
        unsigned long long largestPort = largestPortId;
        added.push_back({&tree, parent, kNone});
        for (std::size_t i = before; i < added.size(); ++i) {
            auto const number = static_cast<std::uint32_t>(recordCount() + i);
            Patch const& inner = *added[i].patch;
            detail::requireLists(inner);
            bool isNew = inner.id != 0 && find(inner.id) == kNone;
            isNew = ids.emplace(inner.id, number).second && isNew;
            largestId = std::max(largestId, inner.id);
            for (Side const side : {Side::Input, Side::Output}) {
                for (Port const& own : portsOf(inner, side)) {
                    auto& known = side == Side::Input ? inputIds : outputIds;
                    auto const& others = side == Side::Input ? outputIds : inputIds;
                    isNew = isNew && own.id != 0 && !isPortTaken(own.id) &&
                            others.count(own.id) == 0 && known.emplace(own.id, number).second;
                    largestPort = std::max(largestPort, own.id);
                }
            }
            if (!isNew) {
                added.resize(before);
                return false;
            }
            added[i].firstChild = static_cast<std::uint32_t>(recordCount() + added.size());
            for (Patch const& child : *inner.children) added.push_back({&child, number, kNone});
            detail::requireCountable(recordCount() + added.size());
        }
        detail::reserveSlots(addedPatches, ids.size());
        detail::reserveSlots(addedInputs, inputIds.size());
        detail::reserveSlots(addedOutputs, outputIds.size());
        replaceWith(addedPatches, std::move(ids));
        replaceWith(addedInputs, std::move(inputIds));
        replaceWith(addedOutputs, std::move(outputIds));
        trees.splice(trees.end(), kept);
        insertAt(node.order, position, first);
        largestPatchId = largestId;
        largestPortId = largestPort;
        return true;
    }

    // Entries that exist under these keys belong to removed patches.
    static void replaceWith(Numbers& known, Numbers&& news) noexcept {
        known.merge(news);
        for (auto const& [id, number] : news) known.find(id)->second = number;
    }

    // Whether the edited document has the connection in this patch.
    bool isConnected(std::uint32_t parent, Connection const& connection) const {
        if (Node const* const node = nodeOf(parent)) {
            if (node->connected.count(connection) != 0) return true;
            if (node->disconnected.count(connection) != 0) return false;
        }
        bool isFound = false;
        forEachBefore(parent, find(connection.fromPatchId),
                      [&](Connection const& c) { isFound = isFound || c == connection; });
        return isFound;
    }

    // Calls `function` for the parent's former connections, or only those to and from `child`.
    template <class Function>
    void forEachBefore(std::uint32_t parent, std::uint32_t child, Function function) const {
        constexpr std::size_t kFew = 16;
        std::vector<Connection> const& list = *patchOf(parent).connections;
        bool const isIndexed = list.size() > kFew && tables->hasUniqueIds && !isAdded(parent) &&
                               child != kNone && !isAdded(child) &&
                               tables->graph.records[child].parent == parent;
        if (!isIndexed) {
            for (Connection const& c : list) function(c);
            return;
        }
        auto const& record = tables->graph.records[child];
        for (Connection const& c : tables->view(parent, record.incoming)) function(c);
        for (Connection const& c : tables->view(parent, record.outgoing)) function(c);
    }

    // All connections of the parent to and from the child for which the predicate is true.
    template <class Predicate>
    void disconnectAll(std::uint32_t parent, std::uint32_t child, Predicate isMeant) {
        Node& node = touch(parent);
        std::unordered_set<Connection, detail::SeededHash> gone(0,
                                                                node.disconnected.hash_function());
        forEachBefore(parent, child, [&](Connection const& c) {
            if (isMeant(c)) gone.insert(c);
        });
        detail::reserveSlots(node.disconnected, gone.size());
        absorb(node.disconnected, std::move(gone));
        for (auto c = node.connected.begin(); c != node.connected.end();) {
            c = isMeant(c->first) ? node.connected.erase(c) : std::next(c);
        }
    }

    using Ids = std::unordered_set<unsigned long long, detail::SeededHash>;

    // Counts up from the largest identifier, then searches for a free one below.
    template <class IsTaken>
    static unsigned long long fresh(unsigned long long& largest, unsigned long long& lastGap,
                                    Ids& given, IsTaken isTaken) {
        constexpr unsigned long long kLast = std::numeric_limits<unsigned long long>::max();
        if (largest != kLast) {
            given.insert(largest + 1);
            return ++largest;
        }
        while (lastGap != kLast) {
            if (!isTaken(++lastGap)) return lastGap;
        }
        return 0;
    }

    // Makes the new records of the nodes, innermost first.
    class Commit {
    public:
        explicit Commit(State const& edited) : state(edited) {}

        Patch run() {
            for (auto const& [number, node] : state.nodes) {
                std::uint32_t const parent = state.parentOf(number);
                if (parent != kNone) ++pending[parent];
            }
            std::vector<std::uint32_t> ready;
            for (auto const& entry : state.nodes) {
                if (pending.count(entry.first) == 0) ready.push_back(entry.first);
            }
            while (!ready.empty()) {
                std::uint32_t const number = ready.back();
                ready.pop_back();
                finish(number, state.nodes.at(number));
                std::uint32_t const parent = state.parentOf(number);
                if (parent != kNone && --pending[parent] == 0) ready.push_back(parent);
            }
            auto const root = finished.find(0);
            return root == finished.end() ? state.tables->root : std::move(root->second);
        }

    private:
        void finish(std::uint32_t number, Node const& node) {
            if (state.removed.count(number) != 0) return;
            Patch made = node.fields;
            Patch const& base = *node.base;
            made.id = base.id;
            finishPorts(made.inputs, base.inputs, node.inputs);
            finishPorts(made.outputs, base.outputs, node.outputs);
            if (made.connections == base.connections) finishConnections(made, node);
            if (made.children == base.children) finishChildren(made, number, node);
            bool const isChanged = made.inputs != base.inputs || made.outputs != base.outputs ||
                                   made.connections != base.connections ||
                                   made.children != base.children ||
                                   (node.isHandedOut && !haveSameFields(made, base));
            if (!isChanged) return;
            std::uint32_t const parent = state.parentOf(number);
            finished.emplace(number, std::move(made));
            if (parent != kNone) changedChildren[parent].push_back(number);
        }

        static void finishPorts(Array<Port>& list, Array<Port> const& base,
                                PortEdits const& edits) {
            if (list != base || !edits.isOpen) return;
            bool const isSame =
                std::equal(edits.entries.begin(), edits.entries.end(), base->begin(), base->end(),
                           [](PortEntry const& e, Port const& p) {
                               return e.own == nullptr ? e.base == &p : same(e, p);
                           });
            if (isSame) return;
            std::vector<Port> ports;
            ports.reserve(edits.entries.size());
            for (PortEntry const& entry : edits.entries) {
                ports.push_back(entry.port());
                ports.back().id = entry.id;
            }
            list = arrayOf(std::move(ports));
        }

        static bool same(PortEntry const& entry, Port const& port) {
            Port const& own = *entry.own;
            return entry.base == &port && own.tag == port.tag && own.name == port.name &&
                   own.typeInfo.type == port.typeInfo.type &&
                   own.typeInfo.subtype == port.typeInfo.subtype &&
                   isSame(own.typeInfo.min, port.typeInfo.min) &&
                   isSame(own.typeInfo.max, port.typeInfo.max) &&
                   isSame(own.typeInfo.extra, port.typeInfo.extra) &&
                   isSame(own.defaultValue, port.defaultValue) &&
                   isSame(own.attributes, port.attributes);
        }

        static void finishConnections(Patch& patch, Node const& node) {
            if (node.disconnected.empty() && node.connected.empty()) return;
            std::vector<Connection> list;
            list.reserve(patch.connections->size() + node.connected.size());
            for (Connection const& c : *patch.connections) {
                if (node.disconnected.count(c) == 0) list.push_back(c);
            }
            if (list.size() == patch.connections->size() && node.connected.empty()) return;
            std::vector<std::pair<std::size_t, Connection>> further;
            further.reserve(node.connected.size());
            for (auto const& [connection, number] : node.connected) {
                further.emplace_back(number, connection);
            }
            std::sort(further.begin(), further.end(),
                      [](auto const& a, auto const& b) { return a.first < b.first; });
            for (auto const& entry : further) list.push_back(entry.second);
            patch.connections = arrayOf(std::move(list));
        }

        void finishChildren(Patch& patch, std::uint32_t number, Node const& node) {
            auto const changed = changedChildren.find(number);
            bool const hasChanged = changed != changedChildren.end();
            if (!node.hasOrder && !hasChanged) return;
            std::vector<Patch> const& before = *patch.children;
            std::vector<Patch> children;
            if (!node.hasOrder) {
                std::vector<std::uint32_t>& places = changed->second;
                auto const placeOf = [&](std::uint32_t n) {
                    return static_cast<std::size_t>(&state.patchOf(n) - before.data());
                };
                std::sort(places.begin(), places.end(), [&](std::uint32_t a, std::uint32_t b) {
                    return placeOf(a) < placeOf(b);
                });
                children.reserve(before.size());
                for (std::uint32_t const n : places) {
                    while (children.size() < placeOf(n))
                        children.push_back(before[children.size()]);
                    children.push_back(std::move(finished.at(n)));
                }
                while (children.size() < before.size()) {
                    children.push_back(before[children.size()]);
                }
            } else {
                if (!hasChanged && node.order == state.childrenOf(number)) return;
                children.reserve(node.order.size());
                for (std::uint32_t const n : node.order) {
                    auto const made = hasChanged ? finished.find(n) : finished.end();
                    if (made != finished.end()) {
                        children.push_back(std::move(made->second));
                    } else {
                        children.push_back(state.patchOf(n));
                    }
                }
            }
            patch.children = arrayOf(std::move(children));
        }

        State const& state;
        std::unordered_map<std::uint32_t, std::size_t> pending;
        std::unordered_map<std::uint32_t, Patch> finished;
        std::unordered_map<std::uint32_t, std::vector<std::uint32_t>> changedChildren;
    };

    std::shared_ptr<detail::PatchTables> tables;  // Null after `commit`.
    Patch result;
    std::unordered_map<std::uint32_t, Node> nodes;
    std::list<Patch> trees;  // The added patches.
    std::deque<Added> added;
    Numbers addedPatches;
    Numbers addedInputs;
    Numbers addedOutputs;
    std::unordered_map<std::uint32_t, std::uint32_t> parents;  // The new parents of moved patches.
    std::unordered_set<std::uint32_t> removed;
    std::vector<std::unique_ptr<Port>> removedPorts;  // Callers may still have pointers to them.
    mutable std::vector<std::uint32_t> firstChildren;
    std::size_t lastConnection = 0;
    unsigned long long largestPatchId;
    unsigned long long largestPortId;
    // No identifier below is free; used once the largest possible one is taken.
    unsigned long long lastPatchGap = 0;
    unsigned long long lastPortGap = 0;
    Ids givenPatches;
    Ids givenPorts;
};

PatchEdit::PatchEdit(PatchIndex const& index) : state(std::make_unique<State>(index.tables)) {}
PatchEdit::PatchEdit(PatchEdit&& other) noexcept = default;
PatchEdit& PatchEdit::operator=(PatchEdit&& other) noexcept = default;
PatchEdit::~PatchEdit() = default;

Patch* PatchEdit::patch(unsigned long long id) {
    return state->isDone() ? nullptr : state->patch(id);
}
Port* PatchEdit::inputPort(unsigned long long portId) {
    return state->isDone() ? nullptr : state->port(portId, Side::Input);
}
Port* PatchEdit::outputPort(unsigned long long portId) {
    return state->isDone() ? nullptr : state->port(portId, Side::Output);
}

bool PatchEdit::addInputPort(unsigned long long patchId, Port port, std::size_t position) {
    return !state->isDone() && state->addPort(patchId, port, Side::Input, position);
}
bool PatchEdit::addOutputPort(unsigned long long patchId, Port port, std::size_t position) {
    return !state->isDone() && state->addPort(patchId, port, Side::Output, position);
}
bool PatchEdit::removeInputPort(unsigned long long portId) {
    return !state->isDone() && state->removePort(portId, Side::Input);
}
bool PatchEdit::removeOutputPort(unsigned long long portId) {
    return !state->isDone() && state->removePort(portId, Side::Output);
}

bool PatchEdit::addPatch(unsigned long long parentId, Patch patch, std::size_t position) {
    return !state->isDone() && state->addPatch(parentId, patch, position);
}
bool PatchEdit::removePatch(unsigned long long id) {
    return !state->isDone() && state->removePatch(id);
}
bool PatchEdit::movePatch(unsigned long long id, unsigned long long parentId,
                          std::size_t position) {
    return !state->isDone() && state->movePatch(id, parentId, position);
}

bool PatchEdit::connect(Connection connection) {
    return !state->isDone() && state->connect(connection);
}
bool PatchEdit::disconnect(Connection connection) {
    return !state->isDone() && state->disconnect(connection);
}

unsigned long long PatchEdit::freshPatchId() { return state->isDone() ? 0 : state->freshPatchId(); }
unsigned long long PatchEdit::freshPortId() { return state->isDone() ? 0 : state->freshPortId(); }

Patch PatchEdit::commit() { return state->commit(); }

}  // namespace tarn::engine
