#include <Engine/Base/patch_index.h>

#include <Engine/Base/detail/prefetch.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <set>
#include <stdexcept>
#include <tuple>
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

// Different in every table, by where it is in memory: a document cannot choose its identifiers so
// that all of them come to the same slot.
struct SeededHash {
    std::uint64_t seed = mixed(reinterpret_cast<std::uintptr_t>(this));
    std::uint64_t operator()(std::uint64_t key) const { return mixed(key ^ seed); }
};

// Positions take 32 bits here, of which one pattern stands for none.
void requireCountable(std::size_t count) {
    if (count >= kNone) throw std::length_error("PatchIndex");
}

// Tables and documents are larger than caches: what is needed a few steps on is asked for early.
constexpr std::size_t kAhead = 8;

// A hash table in one block, made from all its slots at once and probed in a line. A `Slot` has a
// `key` and says itself whether it is free. The first slot that comes for a key stays.
template <class Slot>
class Table {
public:
    // A quarter more slots than keys keeps the probes short, and one is always free.
    explicit Table(std::vector<Slot> const& filled) : slots(filled.size() + filled.size() / 4 + 1) {
        requireCountable(slots.size());
        for (std::size_t i = 0; i < filled.size(); ++i) {
            if (i + kAhead < filled.size()) prefetch(filled[i + kAhead].key);
            Slot& slot = at(filled[i].key);
            if (slot.isFree()) slot = filled[i];
        }
    }

    // The slot of the key, or the free one where it would be.
    Slot const& at(std::uint64_t key) const { return slots[positionOf(key)]; }
    Slot& at(std::uint64_t key) { return slots[positionOf(key)]; }

    void prefetch(std::uint64_t key) const { detail::prefetch(&slots[startOf(key)]); }

    typename std::vector<Slot>::iterator begin() { return slots.begin(); }
    typename std::vector<Slot>::iterator end() { return slots.end(); }

private:
    // The upper half of the hash, scaled to the number of slots.
    std::size_t startOf(std::uint64_t key) const {
        return static_cast<std::size_t>((hash(key) >> 32) * slots.size() >> 32);
    }
    std::size_t positionOf(std::uint64_t key) const {
        std::size_t i = startOf(key);
        while (!slots[i].isFree() && slots[i].key != key) i = i + 1 == slots.size() ? 0 : i + 1;
        return i;
    }

    std::vector<Slot> slots;
    SeededHash hash;
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

// An assertion failure for a record with a null list.
void requireLists(EvalPatch const& patch) {
    static_cast<void>(detail::elementsOf(patch.inputs, "inputs != nullptr"));
    static_cast<void>(detail::elementsOf(patch.outputs, "outputs != nullptr"));
    static_cast<void>(detail::elementsOf(patch.children, "children != nullptr"));
}
void requireLists(Patch const& patch) {
    static_cast<void>(detail::elementsOf(patch.inputs, "inputs != nullptr"));
    static_cast<void>(detail::elementsOf(patch.outputs, "outputs != nullptr"));
    static_cast<void>(detail::elementsOf(patch.connections, "connections != nullptr"));
    static_cast<void>(detail::elementsOf(patch.children, "children != nullptr"));
}

// Every patch in the order in which a search looks at it, and where to find it and its ports.
template <class AnyPatch, class AnyPort>
struct Graph {
    explicit Graph(AnyPatch const& root)
        : records(inSearchOrder(root)),
          patches(patchSlots()),
          inputs(portSlots(&AnyPatch::inputs)),
          outputs(portSlots(&AnyPatch::outputs)) {}

    static std::vector<Record<AnyPatch>> inSearchOrder(AnyPatch const& root) {
        requireLists(root);
        std::vector<Record<AnyPatch>> found{{&root, kNone}};
        std::vector<std::uint32_t> toEnter{0};
        while (!toEnter.empty()) {
            std::uint32_t const parent = toEnter.back();
            toEnter.pop_back();
            auto const first = static_cast<std::uint32_t>(found.size());
            for (AnyPatch const& child : *found[parent].patch->children) {
                requireLists(child);
                found.push_back({&child, parent});
            }
            requireCountable(found.size());
            for (auto i = static_cast<std::uint32_t>(found.size()); i > first; --i) {
                if (!found[i - 1].patch->children->empty()) toEnter.push_back(i - 1);
            }
        }
        found.shrink_to_fit();
        return found;
    }

    std::vector<PatchSlot> patchSlots() const {
        std::vector<PatchSlot> slots;
        slots.reserve(records.size());
        for (std::uint32_t i = 0; i < records.size(); ++i) {
            if (records[i].patch->id != 0) slots.push_back({records[i].patch->id, i});
        }
        return slots;
    }

    template <class List>
    std::vector<PortSlot<AnyPort>> portSlots(List AnyPatch::*ports) const {
        auto const listOf = [&](std::size_t i) { return (records[i].patch->*ports).get(); };
        std::vector<PortSlot<AnyPort>> slots;
        slots.reserve(records.size());
        for (std::uint32_t i = 0; i < records.size(); ++i) {
            if (i + 2 * kAhead < records.size()) detail::prefetch(listOf(i + 2 * kAhead));
            if (i + kAhead < records.size()) detail::prefetch(listOf(i + kAhead)->data());
            for (AnyPort const& port : *listOf(i)) slots.push_back({port.id, &port, i});
        }
        return slots;
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

// A connection, and where it stands.
struct Place {
    Connection const* connection;
    std::uint32_t parent;
    std::uint32_t position;
};

// Appends the connections of the list, each once.
void appendOnce(std::vector<Connection> const& list, std::uint32_t parent,
                std::vector<Place>& places) {
    requireCountable(list.size());
    constexpr std::size_t kFew = 16;
    struct Slot {
        std::uint64_t key = 0;
        std::uint32_t position = kNone;
        bool isFree() const { return position == kNone; }
    };
    std::vector<Slot> slots;
    if (list.size() > kFew) {
        slots.reserve(list.size());
        for (std::uint32_t i = 0; i < list.size(); ++i) {
            slots.push_back({std::hash<Connection>()(list[i]), i});
        }
    }
    Table<Slot> const firstOfHash(slots);
    auto const before = [](Connection const& a, Connection const& b) {
        return std::tie(a.fromPatchId, a.fromPortId, a.toPatchId, a.toPortId) <
               std::tie(b.fromPatchId, b.fromPortId, b.toPatchId, b.toPortId);
    };
    std::set<Connection, decltype(before)> others(before);
    for (std::uint32_t i = 0; i < list.size(); ++i) {
        bool isFirst = true;
        if (slots.empty()) {
            auto const place = list.begin() + static_cast<std::ptrdiff_t>(i);
            isFirst = std::find(list.begin(), place, list[i]) == place;
        } else if (std::uint32_t const first = firstOfHash.at(slots[i].key).position; first != i) {
            isFirst = list[first] != list[i] && others.insert(list[i]).second;
        }
        if (isFirst) places.push_back({&list[i], parent, i});
    }
}

}  // namespace

struct PatchIndex::Tables {
    explicit Tables(Patch patch) : root(std::move(patch)), graph(root) { groupConnections(); }

    // A connection's membership in a group.
    struct Member {
        std::uint32_t* group;
        std::uint32_t position;
    };

    // Groups are laid out behind one another: how many there are, then their positions in the
    // list. Counted first, so that each has its place.
    void groupConnections() {
        std::vector<Member> const members = findMembers();
        for (Member const& member : members) {
            *member.group = *member.group == kNone ? 1 : *member.group + 1;
        }
        std::size_t size = 0;
        auto const place = [&](std::uint32_t& group) {
            if (group == kNone) return;
            std::size_t const start = size;
            size += 1 + group;
            requireCountable(size);
            group = static_cast<std::uint32_t>(start);
        };
        for (auto& record : graph.records) {
            place(record.incoming);
            place(record.outgoing);
        }
        for (auto& slot : graph.outputs) place(slot.link);
        positions.assign(size, 0);
        for (Member const& member : members) {
            std::uint32_t& count = positions[*member.group];
            positions[*member.group + ++count] = member.position;
        }
    }

    std::vector<Place> placesOfConnections() const {
        auto const listOf = [&](std::size_t i) {
            return graph.records[i].patch->connections.get();
        };
        std::size_t const size = graph.records.size();
        std::vector<Place> places;
        places.reserve(size);
        for (std::uint32_t parent = 0; parent < size; ++parent) {
            if (parent + 2 * kAhead < size) detail::prefetch(listOf(parent + 2 * kAhead));
            if (parent + kAhead < size) detail::prefetch(listOf(parent + kAhead)->data());
            if (!listOf(parent)->empty()) appendOnce(*listOf(parent), parent, places);
        }
        return places;
    }

    std::vector<Member> findMembers() {
        std::vector<Place> const places = placesOfConnections();
        std::vector<Member> members;
        members.reserve(3 * places.size());
        for (std::size_t i = 0; i < places.size(); ++i) {
            if (i + kAhead < places.size()) {
                Connection const& next = *places[i + kAhead].connection;
                graph.patches.prefetch(next.toPatchId);
                graph.outputs.prefetch(next.fromPortId);
                graph.outputs.prefetch(next.toPortId);
                graph.inputs.prefetch(next.toPortId);
            }
            addMembers(places[i], members);
        }
        return members;
    }

    void addMembers(Place const& place, std::vector<Member>& members) {
        Connection const& connection = *place.connection;
        auto const isChild = [&](std::uint32_t record) {
            return record != kNone && graph.records[record].parent == place.parent;
        };
        auto const add = [&](std::uint32_t& group) { members.push_back({&group, place.position}); };

        std::uint32_t const from =
            connection.fromPatchId == 0 ? kNone : graph.recordOf(connection.fromPatchId);
        if (isChild(from)) add(graph.records[from].outgoing);
        std::uint32_t const to =
            connection.toPatchId == 0 ? kNone : graph.recordOf(connection.toPatchId);
        if (isChild(to)) add(graph.records[to].incoming);

        auto& output = graph.outputs.at(connection.fromPortId);
        if (isChild(innerOwner(output))) add(output.link);

        std::uint32_t const owner = graph.ownerOfPort(connection.toPortId);
        if (!isChild(owner)) return;
        auto& input = graph.inputs.at(connection.toPortId);
        if (owner == input.owner) {
            if (input.link == kNone) input.link = place.position;
        } else {
            incomingToOutputs.emplace(connection.toPortId, place.position);
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
    std::unordered_map<unsigned long long, std::uint32_t, SeededHash> innerOwners;
    std::unordered_map<unsigned long long, std::uint32_t, SeededHash> incomingToOutputs;
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
