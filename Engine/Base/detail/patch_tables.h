// Engine/Base/detail/patch_tables.h: the lookup tables behind the indexes of graphs.

#ifndef TARN_ENGINE_BASE_DETAIL_PATCH_TABLES_H
#define TARN_ENGINE_BASE_DETAIL_PATCH_TABLES_H

#include <Engine/Base/detail/connection_groups.h>
#include <Engine/Base/detail/hash_table.h>
#include <Engine/Base/patch.h>
#include <Engine/Base/patch_index.h>

#include <cstddef>
#include <cstdint>
#include <unordered_map>
#include <vector>

namespace tarn::engine::detail {

// The records below are constructed in their lists with `emplace_back`: of a temporary, `push_back`
// would load several fields at once right after they were stored one by one, which stalls.

struct PatchSlot {
    PatchSlot() = default;
    PatchSlot(std::uint64_t id, std::uint32_t number) : key(id), record(number) {}

    std::uint64_t key = 0;
    std::uint32_t record = kNone;
    bool isFree() const { return record == kNone; }
};

template <class AnyPort>
struct InputSlot {
    InputSlot() = default;
    InputSlot(AnyPort const& input, std::uint32_t record)
        : key(input.id), port(&input), owner(record) {}

    std::uint64_t key = 0;
    AnyPort const* port = nullptr;
    std::uint32_t owner = kNone;
    /// The position of the connection that leads to it, or `kNone`.
    std::uint32_t incoming = kNone;
    bool isFree() const { return port == nullptr; }
};

template <class AnyPort>
struct OutputSlot {
    OutputSlot() = default;
    OutputSlot(AnyPort const& output, std::uint32_t record)
        : key(output.id), port(&output), owner(record) {}

    std::uint64_t key = 0;
    AnyPort const* port = nullptr;
    std::uint32_t owner = kNone;
    ConnectionGroup outgoing = {};
    bool isFree() const { return port == nullptr; }
};

template <class AnyPatch>
struct PatchRecord {
    PatchRecord() = default;
    PatchRecord(AnyPatch const& recorded, std::uint32_t parentRecord)
        : patch(&recorded), parent(parentRecord) {}

    /// Null for a free record.
    AnyPatch const* patch = nullptr;
    std::uint32_t parent = kNone;
    ConnectionGroup incoming = {};
    ConnectionGroup outgoing = {};
    /// What the last updates noted about it.
    std::uint32_t mark = 0;
};

/// An assertion failure for a record with a null list.
inline void requireLists(EvalPatch const& patch) {
    static_cast<void>(elementsOf(patch.inputs, "inputs != nullptr"));
    static_cast<void>(elementsOf(patch.outputs, "outputs != nullptr"));
    static_cast<void>(elementsOf(patch.children, "children != nullptr"));
}
inline void requireLists(Patch const& patch) {
    static_cast<void>(elementsOf(patch.inputs, "inputs != nullptr"));
    static_cast<void>(elementsOf(patch.outputs, "outputs != nullptr"));
    static_cast<void>(elementsOf(patch.connections, "connections != nullptr"));
    static_cast<void>(elementsOf(patch.children, "children != nullptr"));
}

/// A record for every patch, and tables that find it and its ports. The first record is that of the
/// root. In a newly built table the records are in search order, so that siblings are neighbours.
template <class AnyPatch, class AnyPort>
struct Graph {
    explicit Graph(AnyPatch const& root)
        : records(inSearchOrder(root)),
          patches(patchSlots()),
          inputs(portSlots<InputSlot<AnyPort>>(&AnyPatch::inputs)),
          outputs(portSlots<OutputSlot<AnyPort>>(&AnyPatch::outputs), inputs.hashFunction()) {}

    static std::vector<PatchRecord<AnyPatch>> inSearchOrder(AnyPatch const& root) {
        requireLists(root);
        std::vector<PatchRecord<AnyPatch>> found{{root, kNone}};
        std::vector<std::uint32_t> toEnter{0};
        while (!toEnter.empty()) {
            std::uint32_t const parent = toEnter.back();
            toEnter.pop_back();
            auto const first = static_cast<std::uint32_t>(found.size());
            for (AnyPatch const& child : *found[parent].patch->children) {
                requireLists(child);
                found.emplace_back(child, parent);
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
            if (records[i].patch->id != 0) slots.emplace_back(records[i].patch->id, i);
        }
        return slots;
    }

    template <class Slot, class List>
    std::vector<Slot> portSlots(List AnyPatch::*ports) {
        auto const listOf = [&](std::size_t i) { return (records[i].patch->*ports).get(); };
        std::vector<Slot> slots;
        slots.reserve(records.size());
        for (std::uint32_t i = 0; i < records.size(); ++i) {
            if (i + 2 * kAhead < records.size()) detail::prefetch(listOf(i + 2 * kAhead));
            if (i + kAhead < records.size()) detail::prefetch(listOf(i + kAhead)->data());
            for (AnyPort const& port : *listOf(i)) slots.emplace_back(port, i);
        }
        portCount += slots.size();
        return slots;
    }

    std::uint32_t recordOf(unsigned long long id) const {
        return id == 0 ? kNone : patches.slotFor(id).record;
    }

    AnyPatch const* findPatch(unsigned long long id) const {
        std::uint32_t const record = recordOf(id);
        return record == kNone ? nullptr : records[record].patch;
    }

    AnyPatch const* parentOf(unsigned long long id) const {
        std::uint32_t const record = recordOf(id);
        std::uint32_t const parent = record == kNone ? kNone : records[record].parent;
        return parent == kNone ? nullptr : records[parent].patch;
    }

    std::uint32_t ownerOfPort(unsigned long long portId) const {
        std::uint32_t const ofInput = inputs.slotFor(portId).owner;
        std::uint32_t const ofOutput = outputs.slotFor(portId).owner;
        return ofInput <= ofOutput ? ofInput : ofOutput;
    }

    std::vector<PatchRecord<AnyPatch>> records;
    HashTable<PatchSlot> patches;
    std::size_t portCount = 0;  // With repeated ones.
    HashTable<InputSlot<AnyPort>> inputs;
    HashTable<OutputSlot<AnyPort>> outputs;
};

/// A connection and its position.
struct ConnectionPlace {
    ConnectionPlace(Connection const& placed, std::uint32_t record, std::uint32_t number)
        : connection(&placed), parent(record), position(number) {}

    Connection const* connection;
    std::uint32_t parent;
    std::uint32_t position;
};

/// Appends the connections of the list, each once.
void appendOnce(std::vector<Connection> const& list, std::uint32_t parent,
                std::vector<ConnectionPlace>& places);

/// The tables of a `PatchIndex`.
struct PatchTables {
    explicit PatchTables(Patch patch);

    /// Updates the tables for the new root, which is moved from. False where they have to be built
    /// again instead; then, and where an allocation fails, nothing is changed.
    bool update(Patch& newRoot);

    /// The record of the child at `position` in `children`. Callers that iterate over the children
    /// pass the record of the previous child as `previous`, or `kNone`.
    std::uint32_t childRecord(std::vector<Patch> const& children, std::size_t position,
                              std::uint32_t previous) const {
        Patch const& child = children[position];
        std::uint32_t const next = previous + 1;
        bool const isNext = next < graph.records.size() && graph.records[next].patch == &child;
        return isNext ? next : graph.recordOf(child.id);
    }

    /// The connections of a group in the connection list of `parent`.
    ConnectionView view(std::uint32_t parent, ConnectionGroup group) const {
        if (!group.exists()) return {};
        return groups.view(*graph.records[parent].patch->connections, group);
    }

    Patch root;
    Graph<Patch, Port> graph;
    ConnectionGroups groups;
    std::vector<std::uint32_t> freeRecords;
    /// Whether no two patches have the same identifier, none but the root has 0, and no two ports
    /// have the same. Then no result depends on the search order.
    bool hasUniqueIds = false;
    /// An upper bound of the patches' identifiers.
    unsigned long long largestPatchId = 0;
    unsigned long long largestPortId = 0;
    /// The mark of the latest update.
    std::uint32_t lastMark = 0;

    /// For graphs with repeated identifiers, or with connections that lead to outputs.
    std::unordered_map<unsigned long long, std::uint32_t, SeededHash> innerOwners;
    std::unordered_map<unsigned long long, std::uint32_t, SeededHash> incomingToOutputs;

private:
    friend class PatchUpdate;

    using Member = ConnectionGroups::Member;

    void lookAtIds();
    void groupConnections();
    std::vector<ConnectionPlace> placesOfConnections() const;
    void findMembers(std::vector<ConnectionPlace> const& places, std::vector<Member>& members);
    void addMembers(ConnectionPlace const& place, std::vector<Member>& members);
    std::uint32_t innerOwner(OutputSlot<Port> const& output);
};

}  // namespace tarn::engine::detail

#endif
