#include <Engine/Base/patch_index.h>

#include <Engine/Base/detail/patch_tables.h>

#include <algorithm>
#include <set>
#include <tuple>
#include <utility>

namespace tarn::engine {

namespace detail {

void appendOnce(std::vector<Connection> const& list, std::uint32_t parent,
                std::vector<ConnectionPlace>& places) {
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
    HashTable<Slot> const firstOfHash(slots);
    auto const before = [](Connection const& a, Connection const& b) {
        return std::tie(a.fromPatchId, a.fromPortId, a.toPatchId, a.toPortId) <
               std::tie(b.fromPatchId, b.fromPortId, b.toPatchId, b.toPortId);
    };
    std::set<Connection, decltype(before)> others(before);
    for (std::uint32_t i = 0; i < list.size(); ++i) {
        bool isFirst = true;
        if (slots.empty()) {
            // Mostly the first identifier already differs, without a function call.
            for (std::uint32_t j = 0; j < i && isFirst; ++j) {
                isFirst = list[j].toPortId != list[i].toPortId || list[j] != list[i];
            }
        } else if (std::uint32_t const first = firstOfHash.slotFor(slots[i].key).position;
                   first != i) {
            isFirst = list[first] != list[i] && others.insert(list[i]).second;
        }
        if (isFirst) places.emplace_back(list[i], parent, i);
    }
}

PatchTables::PatchTables(Patch patch) : root(std::move(patch)), graph(root) {
    lookAtIds();
    groupConnections();
}

void PatchTables::lookAtIds() {
    std::size_t const size = graph.records.size();
    std::size_t const withoutRoot = size - (root.id == 0 ? 1 : 0);
    hasUniqueIds = graph.patches.size() == withoutRoot &&
                   graph.inputs.size() + graph.outputs.size() == graph.portCount;
    for (PatchSlot const& slot : graph.patches) {
        largestPatchId = std::max<unsigned long long>(largestPatchId, slot.key);
    }
    for (auto const& slot : graph.outputs) {
        largestPortId = std::max<unsigned long long>(largestPortId, slot.key);
    }
    // Both tables have the same seed and nearly the same order, so the lookups go through memory in
    // order.
    for (auto const& slot : graph.inputs) {
        if (slot.isFree()) continue;
        largestPortId = std::max<unsigned long long>(largestPortId, slot.key);
        hasUniqueIds = hasUniqueIds && graph.outputs.slotFor(slot.key).isFree();
    }
}

void PatchTables::groupConnections() {
    std::vector<Member> members;
    findMembers(placesOfConnections(), members);
    std::size_t end = 0;
    for (auto& record : graph.records) {
        ConnectionGroups::layOut(record.incoming, end);
        ConnectionGroups::layOut(record.outgoing, end);
    }
    for (auto& slot : graph.outputs) ConnectionGroups::layOut(slot.outgoing, end);
    requireCountable(end);
    groups.fill(members, end);
}

std::vector<ConnectionPlace> PatchTables::placesOfConnections() const {
    auto const listOf = [&](std::size_t i) { return graph.records[i].patch->connections.get(); };
    std::size_t const size = graph.records.size();
    std::vector<ConnectionPlace> places;
    places.reserve(size);
    for (std::uint32_t parent = 0; parent < size; ++parent) {
        if (parent + 2 * kAhead < size) detail::prefetch(listOf(parent + 2 * kAhead));
        if (parent + kAhead < size) detail::prefetch(listOf(parent + kAhead)->data());
        if (!listOf(parent)->empty()) appendOnce(*listOf(parent), parent, places);
    }
    return places;
}

void PatchTables::findMembers(std::vector<ConnectionPlace> const& places,
                              std::vector<Member>& members) {
    members.reserve(3 * places.size());
    for (std::size_t i = 0; i < places.size(); ++i) {
        if (i + 2 * kAhead < places.size()) {
            Connection const& next = *places[i + 2 * kAhead].connection;
            graph.patches.prefetch(next.toPatchId);
            graph.outputs.prefetch(next.fromPortId);
            graph.inputs.prefetch(next.toPortId);
        }
        addMembers(places[i], members);
    }
}

void PatchTables::addMembers(ConnectionPlace const& place, std::vector<Member>& members) {
    Connection const& connection = *place.connection;
    auto const isChild = [&](std::uint32_t record) {
        return record != kNone && graph.records[record].parent == place.parent;
    };
    auto const add = [&](ConnectionGroup& group) {
        group.grow();
        members.emplace_back(group, place.position);
    };

    std::uint32_t const from = graph.recordOf(connection.fromPatchId);
    if (isChild(from)) add(graph.records[from].outgoing);
    std::uint32_t const to = graph.recordOf(connection.toPatchId);
    if (isChild(to)) add(graph.records[to].incoming);

    auto& output = graph.outputs.slotFor(connection.fromPortId);
    if (isChild(innerOwner(output))) add(output.outgoing);

    auto& input = graph.inputs.slotFor(connection.toPortId);
    bool const isInput = hasUniqueIds && !input.isFree();
    std::uint32_t const owner = isInput ? input.owner : graph.ownerOfPort(connection.toPortId);
    if (!isChild(owner)) return;
    if (owner == input.owner) {
        if (input.incoming == kNone) input.incoming = place.position;
    } else {
        incomingToOutputs.emplace(connection.toPortId, place.position);
    }
}

// A search for outgoing connections ignores the root's own outputs. Where such an identifier also
// occurs further inside, that patch counts.
std::uint32_t PatchTables::innerOwner(OutputSlot<Port> const& output) {
    if (output.owner != 0) return output.owner;
    if (hasUniqueIds) return kNone;
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

}  // namespace detail

PatchIndex::PatchIndex(Patch root)
    : tables(std::make_shared<detail::PatchTables>(std::move(root))) {}

void PatchIndex::update(Patch root) {
    bool const isShared = tables.use_count() != 1;
    // Synchronises with the copies that have released the tables: what they did with them happened
    // before.
    static_cast<void>(std::shared_ptr<detail::PatchTables>(tables));
    if (isShared || !tables->update(root)) *this = PatchIndex(std::move(root));
}

Patch const& PatchIndex::root() const { return tables->root; }

Patch const* PatchIndex::findPatch(unsigned long long id) const {
    return tables->graph.findPatch(id);
}

Patch const* PatchIndex::parentOf(unsigned long long id) const {
    return tables->graph.parentOf(id);
}

Port const* PatchIndex::findInputPort(unsigned long long portId) const {
    return tables->graph.inputs.slotFor(portId).port;
}

Port const* PatchIndex::findOutputPort(unsigned long long portId) const {
    return tables->graph.outputs.slotFor(portId).port;
}

Patch const* PatchIndex::ownerOfPort(unsigned long long portId) const {
    std::uint32_t const owner = tables->graph.ownerOfPort(portId);
    return owner == detail::kNone ? nullptr : tables->graph.records[owner].patch;
}

ConnectionView PatchIndex::outgoingConnections(unsigned long long portId) const {
    auto const& output = tables->graph.outputs.slotFor(portId);
    if (!output.outgoing.exists()) return {};
    std::uint32_t const owner = output.owner != 0 ? output.owner : tables->innerOwners.at(portId);
    return tables->view(tables->graph.records[owner].parent, output.outgoing);
}

Connection const* PatchIndex::incomingConnection(unsigned long long portId) const {
    auto const& graph = tables->graph;
    std::uint32_t const owner = graph.ownerOfPort(portId);
    if (owner == detail::kNone || graph.records[owner].parent == detail::kNone) return nullptr;
    auto const& input = graph.inputs.slotFor(portId);
    std::uint32_t position = input.incoming;
    if (owner != input.owner) {
        auto const known = tables->incomingToOutputs.find(portId);
        position = known == tables->incomingToOutputs.end() ? detail::kNone : known->second;
    }
    Patch const& parent = *graph.records[graph.records[owner].parent].patch;
    return position == detail::kNone ? nullptr : &(*parent.connections)[position];
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

struct EvalPatchIndex::Tables : detail::Graph<EvalPatch, EvalPort> {
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
    return tables->inputs.slotFor(portId).port;
}

EvalPort const* EvalPatchIndex::findOutputPort(unsigned long long portId) const {
    return tables->outputs.slotFor(portId).port;
}

EvalPatch const* EvalPatchIndex::ownerOfPort(unsigned long long portId) const {
    std::uint32_t const owner = tables->ownerOfPort(portId);
    return owner == detail::kNone ? nullptr : tables->records[owner].patch;
}

}  // namespace tarn::engine
