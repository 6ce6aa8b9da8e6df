#include <Engine/Base/detail/patch_tables.h>

#include <algorithm>
#include <unordered_set>
#include <utility>

namespace tarn::engine::detail {

namespace {

using Ids = std::unordered_set<unsigned long long, SeededHash>;

// The changes to the inputs or to the outputs.
struct PortPlan {
    Ids erased;
    struct Insertion {
        Port const* port;
        std::uint32_t owner;
    };
    std::vector<Insertion> inserted;
    // Ports of a new list that has the same identifiers in the same order.
    std::vector<Port const*> refreshed;
};

}  // namespace

// Everything that can fail comes first: comparing and allocating. Then the tables are changed.
class PatchUpdate {
public:
    PatchUpdate(PatchTables& updated, Patch& newRoot)
        : tables(updated), graph(updated.graph), next(newRoot) {}

    bool run() {
        bool const isWasteful = tables.groups.isWasteful() ||
                                tables.freeRecords.size() > graph.records.size() / 2 + 1000;
        if (!tables.hasUniqueIds || !tables.incomingToOutputs.empty() || isWasteful) return false;
        if (next.id != tables.root.id || !startMarks()) return false;
        if (!compareAll() || !checkMoves() || !checkIds()) return false;
        reserve();
        apply();
        return true;
    }

private:
    struct Refresh {
        std::uint32_t record;
        std::uint32_t parent;
        Patch const* patch;
    };
    struct Level {
        std::uint32_t record;
        Patch const* patch;
    };

    // Starts a new range of marks, by which this update notes what it has seen of a record.
    bool startMarks() {
        constexpr std::uint32_t kMarks = 3;
        if (tables.lastMark > kNone - 2 * kMarks) return false;
        tables.lastMark += kMarks;
        unchanged = tables.lastMark;
        otherChildren = unchanged + 1;
        removed = unchanged + 2;
        return true;
    }
    std::uint32_t& markOf(std::uint32_t record) { return graph.records[record].mark; }

    // Compares from the root down, except lists that are the same object. False where a patch is
    // found in two places.
    bool compareAll() {
        if (!visit({0, kNone, &next}, nullptr)) return false;
        while (!toEnter.empty()) {
            Level const level = toEnter.back();
            toEnter.pop_back();
            if (!compareChildren(level)) return false;
        }
        for (std::uint32_t const record : left) removeChildren(record);
        return true;
    }

    // A patch that existed before.
    bool visit(Refresh const& now, Patch const* parent) {
        PatchRecord<Patch>& record = graph.records[now.record];
        if (record.mark >= unchanged) return false;
        record.mark = unchanged;
        Patch const& before = *record.patch;
        Patch const& after = *now.patch;
        if (record.parent != now.parent) moved.push_back(now.record);
        refreshed.push_back(now);
        if (before.inputs != after.inputs) {
            comparePorts(elementsOf(before.inputs, "inputs != nullptr"),
                         elementsOf(after.inputs, "inputs != nullptr"), inputs, now, parent);
        }
        if (before.outputs != after.outputs) {
            comparePorts(elementsOf(before.outputs, "outputs != nullptr"),
                         elementsOf(after.outputs, "outputs != nullptr"), outputs, now, parent);
        }
        if (before.connections != after.connections &&
            *before.connections != elementsOf(after.connections, "connections != nullptr")) {
            regroup(now.record, after);
        }
        if (before.children != after.children) {
            record.mark = otherChildren;
            static_cast<void>(elementsOf(after.children, "children != nullptr"));
            toEnter.push_back({now.record, now.patch});
        }
        return true;
    }

    void comparePorts(std::vector<Port> const& before, std::vector<Port> const& after,
                      PortPlan& plan, Refresh const& owner, Patch const* parent) {
        bool const areSame = std::equal(before.begin(), before.end(), after.begin(), after.end(),
                                        [](Port const& a, Port const& b) { return a.id == b.id; });
        if (areSame) {
            for (Port const& port : after) plan.refreshed.push_back(&port);
            return;
        }
        for (Port const& port : before) plan.erased.insert(port.id);
        for (Port const& port : after) plan.inserted.push_back({&port, owner.record});
        if (parent != nullptr) regroup(owner.parent, *parent);
    }

    bool compareChildren(Level const& level) {
        bool const isNew =
            level.record >= graph.records.size() || graph.records[level.record].patch == nullptr;
        std::vector<Patch> const none;
        std::vector<Patch> const& before =
            isNew ? none : *graph.records[level.record].patch->children;
        std::vector<Patch> const& after = *level.patch->children;
        std::size_t kept = 0;
        std::uint32_t record = kNone;
        for (std::size_t i = 0; i < after.size(); ++i) {
            Patch const& child = after[i];
            if (child.id == 0) return false;
            bool const isInPlace = i < before.size() && before[i].id == child.id;
            record = isInPlace ? tables.childRecord(before, i, record) : graph.recordOf(child.id);
            if (record == kNone) {
                if (!add(child, level.record)) return false;
                continue;
            }
            if (graph.records[record].parent == level.record && !isNew) ++kept;
            if (!visit({record, level.record, &child}, level.patch)) return false;
        }
        if (kept != after.size() || kept != before.size()) regroup(level.record, *level.patch);
        if (kept != before.size()) left.push_back(level.record);
        return true;
    }

    // A patch that is new.
    bool add(Patch const& patch, std::uint32_t parent) {
        requireLists(patch);
        if (!addedIds.insert(patch.id).second) return false;
        std::size_t const position = added.size();
        std::size_t const free = tables.freeRecords.size();
        std::size_t const record = position < free ? tables.freeRecords[free - 1 - position]
                                                   : graph.records.size() + (position - free);
        requireCountable(record);
        auto const number = static_cast<std::uint32_t>(record);
        added.push_back({number, parent, &patch});
        for (Port const& port : *patch.inputs) inputs.inserted.push_back({&port, number});
        for (Port const& port : *patch.outputs) outputs.inserted.push_back({&port, number});
        if (!patch.children->empty()) toEnter.push_back({number, &patch});
        return true;
    }

    // Patches that were not visited are not in the new graph.
    void removeChildren(std::uint32_t top) {
        std::vector<std::uint32_t> pending{top};
        while (!pending.empty()) {
            std::vector<Patch> const& children = *graph.records[pending.back()].patch->children;
            pending.pop_back();
            std::uint32_t record = kNone;
            for (std::size_t i = 0; i < children.size(); ++i) {
                record = tables.childRecord(children, i, record);
                if (markOf(record) >= unchanged) continue;
                markOf(record) = removed;
                removals.push_back(record);
                for (Port const& port : *children[i].inputs) inputs.erased.insert(port.id);
                for (Port const& port : *children[i].outputs) outputs.erased.insert(port.id);
                if (!children[i].children->empty()) pending.push_back(record);
            }
        }
    }

    void regroup(std::uint32_t record, Patch const& patch) { regrouped.emplace(record, &patch); }

    // False where a moved patch is still in its former parent.
    bool checkMoves() {
        return std::all_of(moved.begin(), moved.end(), [this](std::uint32_t record) {
            return markOf(graph.records[record].parent) > unchanged;
        });
    }

    // Whether identifiers stay distinct.
    bool checkIds() const {
        Ids seen;
        auto const isFree = [](auto const& table, PortPlan const& plan, unsigned long long id) {
            return table.slotFor(id).isFree() || plan.erased.count(id) != 0;
        };
        for (PortPlan const* const plan : {&inputs, &outputs}) {
            for (PortPlan::Insertion const& insertion : plan->inserted) {
                unsigned long long const id = insertion.port->id;
                if (!seen.insert(id).second || !isFree(graph.inputs, inputs, id) ||
                    !isFree(graph.outputs, outputs, id)) {
                    return false;
                }
            }
        }
        Ids newOutputs;
        for (auto const& insertion : outputs.inserted) newOutputs.insert(insertion.port->id);
        for (auto const& [record, patch] : regrouped) {
            for (Connection const& c : elementsOf(patch->connections, "connections != nullptr")) {
                bool const leadsToOutput = newOutputs.count(c.toPortId) != 0 ||
                                           !isFree(graph.outputs, outputs, c.toPortId);
                if (leadsToOutput) return false;
            }
        }
        return true;
    }

    void reserve() {
        std::size_t const free = std::min(added.size(), tables.freeRecords.size());
        reserveFor(graph.records, added.size() - free);
        reserveFor(tables.freeRecords, removals.size());
        graph.patches.reserveFor(added.size());
        graph.inputs.reserveFor(inputs.inserted.size());
        graph.outputs.reserveFor(outputs.inserted.size());
        for (auto const& [record, patch] : regrouped)
            appendOnce(*patch->connections, record, places);
        members.reserve(3 * places.size());
        // Each connection is in three groups, and each may be a new group.
        tables.groups.reserveFor(6 * places.size());
    }

    void apply() noexcept {
        for (std::uint32_t const record : removals) {
            dropGroups(graph.records[record], graph.records[record].patch->outputs);
            graph.patches.erase(graph.records[record].patch->id);
        }
        for (unsigned long long const id : outputs.erased)
            tables.groups.drop(graph.outputs.slotFor(id).outgoing);
        applyErasures(graph.inputs, inputs);
        applyErasures(graph.outputs, outputs);
        for (Refresh const& now : refreshed) {
            graph.records[now.record].patch = now.patch;
            graph.records[now.record].parent = now.parent;
        }
        addRecords();
        applyInsertions(graph.inputs, inputs);
        applyInsertions(graph.outputs, outputs);
        groupConnections();
        tables.root = std::move(next);
        graph.records[0].patch = &tables.root;
    }

    template <class Slot>
    static void applyErasures(HashTable<Slot>& table, PortPlan const& plan) noexcept {
        for (unsigned long long const id : plan.erased) table.erase(id);
    }

    template <class Slot>
    void applyInsertions(HashTable<Slot>& table, PortPlan const& plan) noexcept {
        for (Port const* const port : plan.refreshed) table.slotFor(port->id).port = port;
        for (auto const& [port, owner] : plan.inserted) {
            table.insert({*port, owner});
            tables.largestPortId = std::max(tables.largestPortId, port->id);
        }
    }

    void addRecords() noexcept {
        std::size_t const reused = std::min(added.size(), tables.freeRecords.size());
        tables.freeRecords.resize(tables.freeRecords.size() - reused);
        graph.records.resize(graph.records.size() + added.size() - reused);
        for (Refresh const& now : added) {
            graph.records[now.record] = {*now.patch, now.parent};
            graph.patches.insert({now.patch->id, now.record});
            tables.largestPatchId = std::max(tables.largestPatchId, now.patch->id);
        }
        for (std::uint32_t const record : removals) {
            graph.records[record] = {};
            tables.freeRecords.push_back(record);
        }
    }

    void dropGroups(PatchRecord<Patch>& record, Array<Port> const& ports) noexcept {
        tables.groups.drop(record.incoming);
        tables.groups.drop(record.outgoing);
        for (Port const& port : *ports) {
            tables.groups.drop(graph.outputs.slotFor(port.id).outgoing);
        }
    }

    template <class Function>
    void forEachRegrouped(Function function) {
        for (auto const& entry : regrouped) {
            std::vector<Patch> const& children = *entry.second->children;
            std::uint32_t record = kNone;
            for (std::size_t i = 0; i < children.size(); ++i) {
                record = tables.childRecord(children, i, record);
                function(graph.records[record], children[i]);
            }
        }
    }

    void groupConnections() noexcept {
        forEachRegrouped([this](PatchRecord<Patch>& record, Patch const& child) {
            dropGroups(record, child.outputs);
            for (Port const& port : *child.inputs) {
                graph.inputs.slotFor(port.id).incoming = kNone;
            }
        });
        for (ConnectionPlace const& place : places) tables.addMembers(place, members);
        std::size_t end = tables.groups.end();
        forEachRegrouped([this, &end](PatchRecord<Patch>& record, Patch const& child) {
            ConnectionGroups::layOut(record.incoming, end);
            ConnectionGroups::layOut(record.outgoing, end);
            for (Port const& port : *child.outputs) {
                ConnectionGroups::layOut(graph.outputs.slotFor(port.id).outgoing, end);
            }
        });
        tables.groups.fill(members, end);
    }

    PatchTables& tables;
    Graph<Patch, Port>& graph;
    Patch& next;
    std::uint32_t unchanged = 0;
    std::uint32_t otherChildren = 0;
    std::uint32_t removed = 0;

    std::vector<Level> toEnter;
    std::vector<Refresh> refreshed;
    std::vector<Refresh> added;
    Ids addedIds;
    std::vector<std::uint32_t> moved;
    std::vector<std::uint32_t> left;  // Patches that have lost children.
    std::vector<std::uint32_t> removals;
    PortPlan inputs;
    PortPlan outputs;
    std::unordered_map<std::uint32_t, Patch const*> regrouped;
    std::vector<ConnectionPlace> places;
    std::vector<PatchTables::Member> members;
};

bool PatchTables::update(Patch& newRoot) { return PatchUpdate(*this, newRoot).run(); }

}  // namespace tarn::engine::detail
