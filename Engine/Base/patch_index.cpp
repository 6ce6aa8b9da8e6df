#include <Engine/Base/patch_index.h>

#include <limits>
#include <unordered_map>
#include <utility>
#include <vector>

namespace tarn::engine {

namespace {

constexpr std::uint32_t kNone = std::numeric_limits<std::uint32_t>::max();

// Spreads identifiers that were counted up over all bits.
std::uint64_t mixed(std::uint64_t key) {
    key ^= key >> 32;
    key *= 0xd6e8feb86659fd93;
    key ^= key >> 32;
    key *= 0xd6e8feb86659fd93;
    return key;
}

// A hash table with room for a known number of keys, in one block, probed in a line. A `Slot` has
// a `key` and says itself whether it is free. The first value that comes for a key stays.
template <class Slot>
class Table {
public:
    // A quarter more slots than keys keeps the probes short, and one is always free.
    explicit Table(std::size_t keys) : slots(keys + keys / 4 + 1) {}

    // The slot of the key, or the free one where it would be.
    Slot const& at(std::uint64_t key) const { return slots[positionOf(key)]; }
    Slot& at(std::uint64_t key) { return slots[positionOf(key)]; }

    typename std::vector<Slot>::iterator begin() { return slots.begin(); }
    typename std::vector<Slot>::iterator end() { return slots.end(); }

private:
    std::size_t positionOf(std::uint64_t key) const {
        // The upper half of the hash, scaled to the number of slots.
        std::size_t i = static_cast<std::size_t>((mixed(key) >> 32) * slots.size() >> 32);
        while (!slots[i].isFree() && slots[i].key != key) i = i + 1 == slots.size() ? 0 : i + 1;
        return i;
    }

    std::vector<Slot> slots;
};

struct PatchSlot {
    std::uint64_t key = 0;
    std::uint32_t record = kNone;
    bool isFree() const { return record == kNone; }
};

template <class AnyPort>
struct PortSlot {
    std::uint64_t key = 0;
    AnyPort const* port = nullptr;
    std::uint32_t owner = kNone;
    // For an input the position of its incoming connection, for an output its group of outgoing
    // ones; `kNone` where there is none.
    std::uint32_t link = kNone;
    bool isFree() const { return port == nullptr; }
};

template <class AnyPatch>
struct Record {
    AnyPatch const* patch;
    std::uint32_t parent;
    // Groups of connections to and from the patch; `kNone` where there are none.
    std::uint32_t incoming = kNone;
    std::uint32_t outgoing = kNone;
};

// Every patch in the order in which a search looks at it, and where to find it and its ports.
template <class AnyPatch, class AnyPort>
struct Graph {
    explicit Graph(AnyPatch const& root)
        : records(inSearchOrder(root)),
          patches(records.size()),
          inputs(count(&AnyPatch::inputs)),
          outputs(count(&AnyPatch::outputs)) {
        for (std::uint32_t i = 0; i < records.size(); ++i) {
            AnyPatch const& patch = *records[i].patch;
            PatchSlot& slot = patches.at(patch.id);
            if (slot.isFree() && patch.id != 0) slot = {patch.id, i};
            insert(inputs, *patch.inputs, i);
            insert(outputs, *patch.outputs, i);
        }
    }

    static std::vector<Record<AnyPatch>> inSearchOrder(AnyPatch const& root) {
        std::vector<Record<AnyPatch>> found{{&root, kNone}};
        std::vector<std::uint32_t> toEnter{0};
        while (!toEnter.empty()) {
            std::uint32_t const parent = toEnter.back();
            toEnter.pop_back();
            auto const first = static_cast<std::uint32_t>(found.size());
            for (AnyPatch const& child : *found[parent].patch->children) {
                found.push_back({&child, parent});
            }
            for (auto i = static_cast<std::uint32_t>(found.size()); i > first; --i) {
                if (!found[i - 1].patch->children->empty()) toEnter.push_back(i - 1);
            }
        }
        found.shrink_to_fit();
        return found;
    }

    template <class List>
    std::size_t count(List AnyPatch::*ports) const {
        std::size_t sum = 0;
        for (Record<AnyPatch> const& record : records) sum += (record.patch->*ports)->size();
        return sum;
    }

    static void insert(Table<PortSlot<AnyPort>>& table, std::vector<AnyPort> const& ports,
                       std::uint32_t owner) {
        for (AnyPort const& port : ports) {
            PortSlot<AnyPort>& slot = table.at(port.id);
            if (slot.isFree()) slot = {port.id, &port, owner};
        }
    }

    std::uint32_t recordOf(unsigned long long id) const { return patches.at(id).record; }

    AnyPatch const* findPatch(unsigned long long id) const {
        std::uint32_t const record = recordOf(id);
        return id == 0 || record == kNone ? nullptr : records[record].patch;
    }

    AnyPatch const* parentOf(unsigned long long id) const {
        std::uint32_t const record = id == 0 ? kNone : recordOf(id);
        std::uint32_t const parent = record == kNone ? kNone : records[record].parent;
        return parent == kNone ? nullptr : records[parent].patch;
    }

    std::uint32_t ownerOfPort(unsigned long long portId) const {
        std::uint32_t const ofInput = inputs.at(portId).owner;
        std::uint32_t const ofOutput = outputs.at(portId).owner;
        return ofInput <= ofOutput ? ofInput : ofOutput;
    }

    std::vector<Record<AnyPatch>> records;
    Table<PatchSlot> patches;
    Table<PortSlot<AnyPort>> inputs;
    Table<PortSlot<AnyPort>> outputs;
};

// For each connection of a list, whether it is the first of its like.
std::vector<bool> firstOfTheirLike(std::vector<Connection> const& connections) {
    struct Slot {
        std::uint64_t key = 0;
        std::uint32_t position = kNone;
        bool isFree() const { return position == kNone; }
    };
    std::vector<bool> isFirst(connections.size(), true);
    Table<Slot> seen(connections.size());
    std::unordered_map<std::size_t, std::unordered_set<Connection>> collisions;
    for (std::uint32_t i = 0; i < connections.size(); ++i) {
        std::uint64_t const hash = std::hash<Connection>()(connections[i]);
        Slot& slot = seen.at(hash);
        if (slot.isFree()) {
            slot = {hash, i};
        } else if (connections[slot.position] == connections[i]) {
            isFirst[i] = false;
        } else {
            isFirst[i] = collisions[hash].insert(connections[i]).second;
        }
    }
    return isFirst;
}

}  // namespace

struct PatchIndex::Tables {
    explicit Tables(Patch patch) : root(std::move(patch)), graph(root) { groupConnections(); }

    // Groups are laid out behind one another: how many there are, then their positions in the
    // list. Counted first, so that each has its place.
    void groupConnections() {
        forEachConnection(
            [](std::uint32_t& group, std::uint32_t) { group = group == kNone ? 1 : group + 1; });
        std::size_t size = 0;
        auto const place = [&](std::uint32_t& group) {
            if (group == kNone) return;
            std::size_t const start = size;
            size += 1 + group;
            group = static_cast<std::uint32_t>(start);
        };
        for (auto& record : graph.records) {
            place(record.incoming);
            place(record.outgoing);
        }
        for (auto& slot : graph.outputs) place(slot.link);
        positions.assign(size, 0);
        forEachConnection([this](std::uint32_t& group, std::uint32_t i) {
            std::uint32_t& count = positions[group];
            positions[group + ++count] = i;
        });
    }

    // Calls `add(group, position)` for every group that a connection belongs to.
    template <class Add>
    void forEachConnection(Add add) {
        for (std::uint32_t parent = 0; parent < graph.records.size(); ++parent) {
            std::vector<Connection> const& list = *graph.records[parent].patch->connections;
            if (list.empty()) continue;
            std::vector<bool> const isFirst = firstOfTheirLike(list);
            for (std::uint32_t i = 0; i < list.size(); ++i) {
                if (isFirst[i]) addConnection(list[i], parent, i, add);
            }
        }
    }

    template <class Add>
    void addConnection(Connection const& connection, std::uint32_t parent, std::uint32_t i,
                       Add add) {
        auto const isChild = [&](std::uint32_t record) {
            return record != kNone && graph.records[record].parent == parent;
        };
        std::uint32_t const from =
            connection.fromPatchId == 0 ? kNone : graph.recordOf(connection.fromPatchId);
        if (isChild(from)) add(graph.records[from].outgoing, i);
        std::uint32_t const to =
            connection.toPatchId == 0 ? kNone : graph.recordOf(connection.toPatchId);
        if (isChild(to)) add(graph.records[to].incoming, i);

        auto& output = graph.outputs.at(connection.fromPortId);
        if (isChild(innerOwner(output))) add(output.link, i);

        if (!isChild(graph.ownerOfPort(connection.toPortId))) return;
        auto& input = graph.inputs.at(connection.toPortId);
        if (graph.ownerOfPort(connection.toPortId) == input.owner) {
            if (input.link == kNone) input.link = i;
        } else {
            incomingToOutputs.emplace(connection.toPortId, i);
        }
    }

    // A search for outgoing connections leaves the root's own outputs out: where such an identifier
    // occurs further down too, that patch counts.
    std::uint32_t innerOwner(PortSlot<Port> const& output) {
        if (output.owner != 0) return output.owner;
        if (innerOwners.empty()) {
            for (Port const& port : *root.outputs) innerOwners.emplace(port.id, kNone);
            for (std::uint32_t i = 1; i < graph.records.size(); ++i) {
                for (Port const& port : *graph.records[i].patch->outputs) {
                    auto const known = innerOwners.find(port.id);
                    if (known != innerOwners.end() && known->second == kNone) known->second = i;
                }
            }
        }
        return innerOwners.at(output.key);
    }

    ConnectionView view(std::uint32_t parent, std::uint32_t group) const {
        if (group == kNone) return {};
        std::vector<Connection> const& list = *graph.records[parent].patch->connections;
        return {list.data(), &positions[group] + 1, positions[group]};
    }

    Patch root;
    Graph<Patch, Port> graph;
    std::vector<std::uint32_t> positions;
    // Both are empty but for graphs that use one identifier for ports of two kinds.
    std::unordered_map<unsigned long long, std::uint32_t> innerOwners;
    std::unordered_map<unsigned long long, std::uint32_t> incomingToOutputs;
};

PatchIndex::PatchIndex(Patch root) : tables(std::make_shared<Tables const>(std::move(root))) {}

Patch const& PatchIndex::root() const { return tables->root; }

Patch const* PatchIndex::findPatch(unsigned long long id) const {
    return tables->graph.findPatch(id);
}

Patch const* PatchIndex::parentOf(unsigned long long id) const {
    return tables->graph.parentOf(id);
}

Port const* PatchIndex::findInputPort(unsigned long long portId) const {
    return tables->graph.inputs.at(portId).port;
}

Port const* PatchIndex::findOutputPort(unsigned long long portId) const {
    return tables->graph.outputs.at(portId).port;
}

Patch const* PatchIndex::ownerOfPort(unsigned long long portId) const {
    std::uint32_t const owner = tables->graph.ownerOfPort(portId);
    return owner == kNone ? nullptr : tables->graph.records[owner].patch;
}

ConnectionView PatchIndex::outgoingConnections(unsigned long long portId) const {
    auto const& output = tables->graph.outputs.at(portId);
    if (output.link == kNone) return {};
    std::uint32_t const owner = output.owner != 0 ? output.owner : tables->innerOwners.at(portId);
    return tables->view(tables->graph.records[owner].parent, output.link);
}

Connection const* PatchIndex::incomingConnection(unsigned long long portId) const {
    auto const& graph = tables->graph;
    std::uint32_t const owner = graph.ownerOfPort(portId);
    if (owner == kNone || graph.records[owner].parent == kNone) return nullptr;
    auto const& input = graph.inputs.at(portId);
    std::uint32_t position = input.link;
    if (owner != input.owner) {
        auto const known = tables->incomingToOutputs.find(portId);
        position = known == tables->incomingToOutputs.end() ? kNone : known->second;
    }
    Patch const& parent = *graph.records[graph.records[owner].parent].patch;
    return position == kNone ? nullptr : &(*parent.connections)[position];
}

ConnectionView PatchIndex::incomingConnectionsToPatch(unsigned long long id) const {
    if (parentOf(id) == nullptr) return {};
    auto const& record = tables->graph.records[tables->graph.recordOf(id)];
    return tables->view(record.parent, record.incoming);
}

ConnectionView PatchIndex::outgoingConnectionsFromPatch(unsigned long long id) const {
    if (parentOf(id) == nullptr) return {};
    auto const& record = tables->graph.records[tables->graph.recordOf(id)];
    return tables->view(record.parent, record.outgoing);
}

struct EvalPatchIndex::Tables : Graph<EvalPatch, EvalPort> {
    using Graph::Graph;
};

EvalPatchIndex::EvalPatchIndex(EvalPatch root)
    : shared(std::make_shared<EvalPatch const>(std::move(root))),
      tables(std::make_shared<Tables const>(*shared)) {}

void EvalPatchIndex::rebuild() { tables = std::make_shared<Tables const>(*shared); }

EvalPatch const& EvalPatchIndex::root() const { return *shared; }

EvalPatch const* EvalPatchIndex::findPatch(unsigned long long id) const {
    return tables->findPatch(id);
}

EvalPatch const* EvalPatchIndex::parentOf(unsigned long long id) const {
    return tables->parentOf(id);
}

EvalPort const* EvalPatchIndex::findInputPort(unsigned long long portId) const {
    return tables->inputs.at(portId).port;
}

EvalPort const* EvalPatchIndex::findOutputPort(unsigned long long portId) const {
    return tables->outputs.at(portId).port;
}

EvalPatch const* EvalPatchIndex::ownerOfPort(unsigned long long portId) const {
    std::uint32_t const owner = tables->ownerOfPort(portId);
    return owner == kNone ? nullptr : tables->records[owner].patch;
}

}  // namespace tarn::engine
