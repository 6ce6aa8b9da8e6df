#include <Engine/Base/patch_index.h>

#include "support/allocations.h"
#include "support/death.h"
#include "support/edits.h"
#include "support/graph_model.h"
#include "support/graphs.h"
#include "support/print.h"
#include "support/random.h"
#include "support/stack.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cstdint>
#include <ctime>
#include <functional>
#include <iterator>
#include <unordered_map>

using namespace tarn::engine;
using namespace tests;

namespace {

using Set = std::unordered_set<Connection>;

// Expects the view to contain exactly these connections, each once, in the order of the list, as
// references into it.
void expectView(ConnectionView const& view, Patch const* holder, Set expected) {
    std::vector<Connection const*> wanted;
    if (holder != nullptr) {
        for (Connection const& connection : *holder->connections) {
            if (expected.erase(connection) != 0) wanted.push_back(&connection);
        }
    }
    ASSERT_TRUE(expected.empty());
    ASSERT_EQ(view.size(), wanted.size());
    ASSERT_EQ(view.empty(), wanted.empty());
    ASSERT_EQ(std::distance(view.begin(), view.end()), static_cast<std::ptrdiff_t>(view.size()));
    std::size_t i = 0;
    for (Connection const& connection : view) {
        ASSERT_EQ(&connection, wanted[i]);
        ASSERT_EQ(&view[i], wanted[i]);
        ++i;
    }
}

Patch smallGraph() {
    return withPorts(patch(1,
                           {withPorts(patch(2, {withPorts(patch(4), {port(41)}, {port(42)})}),
                                      {port(21)}, {port(22)}),
                            withPorts(patch(3), {port(31)}, {port(32)})},
                           {{2, 22, 3, 31}, {3, 32, 2, 21}, {2, 22, 3, 31}, {2, 22, 2, 21}}),
                     {port(11)}, {port(12)});
}

// The number of results of a query.
std::size_t countOf(void const* found) { return found == nullptr ? 0 : 1; }
std::size_t countOf(ConnectionView const& found) { return found.size(); }
template <auto query>
std::size_t ask(PatchIndex const& index, unsigned long long id) {
    return countOf((index.*query)(id));
}

}  // namespace

TEST(PatchIndexDeathTest, NamesANullList) {
    struct Row {
        char const* condition;
        void (*damage)(Patch&);
    };
    for (Row const& row : {Row{"inputs != nullptr", [](Patch& p) { p.inputs = nullptr; }},
                           Row{"outputs != nullptr", [](Patch& p) { p.outputs = nullptr; }},
                           Row{"connections != nullptr", [](Patch& p) { p.connections = nullptr; }},
                           Row{"children != nullptr", [](Patch& p) { p.children = nullptr; }}}) {
        SCOPED_TRACE(row.condition);
        Patch child;
        child.id = 2;
        row.damage(child);
        Patch root{1};
        root.children = arrayOf({child});
        EXPECT_ENDS(PatchIndex{root},
                    tests::failedAssertion(row.condition, "elementsOf", "Engine/Base/patch"));
        EXPECT_ENDS(PatchIndex{child},
                    tests::failedAssertion(row.condition, "elementsOf", "Engine/Base/patch"));
    }
}

TEST(PatchIndex, FindsEverythingInASmallGraph) {
    PatchIndex const index(smallGraph());
    Patch const& root = index.root();
    EXPECT_EQ(root, smallGraph());
    EXPECT_EQ(index.findPatch(1), &root);
    EXPECT_EQ(index.findPatch(4), &root.children->at(0).children->at(0));
    EXPECT_EQ(index.findPatch(9), nullptr);
    EXPECT_EQ(index.findPatch(0), nullptr);
    EXPECT_EQ(index.parentOf(1), nullptr);
    EXPECT_EQ(index.parentOf(2), &root);
    EXPECT_EQ(index.parentOf(4), &root.children->at(0));
    EXPECT_EQ(index.parentOf(9), nullptr);
    EXPECT_EQ(index.parentOf(0), nullptr);
    EXPECT_EQ(index.findInputPort(41), &root.children->at(0).children->at(0).inputs->at(0));
    EXPECT_EQ(index.findInputPort(42), nullptr);
    EXPECT_EQ(index.findOutputPort(42), &root.children->at(0).children->at(0).outputs->at(0));
    EXPECT_EQ(index.ownerOfPort(11), &root);
    EXPECT_EQ(index.ownerOfPort(32), &root.children->at(1));
    EXPECT_EQ(index.ownerOfPort(99), nullptr);
    Connection const* const connections = root.connections->data();
    expectView(index.outgoingConnections(22), &root, {{2, 22, 3, 31}, {2, 22, 2, 21}});
    EXPECT_EQ(index.outgoingConnections(22).begin()->toPortId, 31u);
    EXPECT_EQ((*index.outgoingConnections(22).begin()++).toPortId, 31u);
    auto place = index.outgoingConnections(22).begin();
    EXPECT_EQ((place++)->toPortId, 31u);
    EXPECT_EQ(place->toPortId, 21u);
    EXPECT_TRUE(++place == index.outgoingConnections(22).end());
    EXPECT_TRUE(index.outgoingConnections(12).empty());
    EXPECT_TRUE(index.outgoingConnections(99).empty());
    EXPECT_EQ(index.incomingConnection(31), connections);
    EXPECT_EQ(index.incomingConnection(21), connections + 1);
    EXPECT_EQ(index.incomingConnection(41), nullptr);
    EXPECT_EQ(index.incomingConnection(11), nullptr);
    EXPECT_EQ(index.incomingConnection(99), nullptr);
    EXPECT_EQ(index.incomingConnectionsToPatch(2).size(), 2u);
    EXPECT_EQ(index.outgoingConnectionsFromPatch(2).size(), 2u);
    EXPECT_TRUE(index.incomingConnectionsToPatch(1).empty());
    EXPECT_TRUE(index.outgoingConnectionsFromPatch(9).empty());
    EXPECT_TRUE(index.incomingConnectionsToPatch(0).empty());
    EXPECT_TRUE(ConnectionView().empty());
    EXPECT_TRUE(ConnectionView().begin() == ConnectionView().end());
}

// A connection with these first fields, and a target port that gives it the hash `hash`.
Connection withHash(unsigned long long fromPatchId, unsigned long long fromPortId,
                    unsigned long long toPatchId, std::uint64_t hash) {
    std::uint64_t seed = 0;
    for (std::uint64_t const field : {fromPatchId, fromPortId, toPatchId}) {
        seed ^= field + 0x9e3779b9 + (seed << 6) + (seed >> 2);
    }
    return {fromPatchId, fromPortId, toPatchId,
            (hash ^ seed) - 0x9e3779b9 - (seed << 6) - (seed >> 2)};
}

TEST(PatchIndex, DistinguishesConnectionsWithEqualHashes) {
    std::vector<Connection> connections;
    for (unsigned long long i = 0; i < 40; ++i) {
        connections.push_back(withHash(2, 22, i % 15, i < 30 ? 77 : 78));
        ASSERT_EQ(std::hash<Connection>()(connections.back()), i < 30 ? 77u : 78u);
    }
    Patch child = withPorts(patch(2), {}, {port(22)});
    PatchIndex const index(patch(1, {child}, connections));
    Set const expected = findOutgoingConnectionsFromPort(index.root(), 22);
    ASSERT_EQ(expected.size(), 25u);
    expectView(index.outgoingConnections(22), &index.root(), expected);
    expectView(index.outgoingConnectionsFromPatch(2), &index.root(), expected);
}

namespace {

// The identifier whose hash without a seed is `hash`.
unsigned long long unmixed(std::uint64_t hash) {
    constexpr std::uint64_t kFactor = 0xd6e8feb86659fd93;
    std::uint64_t inverse = kFactor;
    for (int i = 0; i < 6; ++i) inverse *= 2 - kFactor * inverse;
    for (int i = 0; i < 2; ++i) {
        hash *= inverse;
        hash ^= hash >> 32;
    }
    return hash;
}

// CPU seconds of the fastest of five runs.
template <class Operation>
double secondsFor(Operation operation) {
    double fastest = 1e9;
    for (int i = 0; i < 5; ++i) {
        std::clock_t const start = std::clock();
        operation();
        fastest = std::min(fastest, static_cast<double>(std::clock() - start) / CLOCKS_PER_SEC);
    }
    return fastest;
}
double secondsToIndex(Patch const& root) {
    return secondsFor([&] { PatchIndex const index(root); });
}

}  // namespace

TEST(PatchIndex, IsNotSlowedByAdversarialIdentifiers) {
    constexpr unsigned long long kCount = 30000;
    struct Row {
        char const* label;
        std::function<unsigned long long(unsigned long long)> idOf;
        std::function<Connection(unsigned long long)> connectionOf;
    };
    auto const counted = [](unsigned long long i) { return i + 10; };
    auto const plain = [](unsigned long long i) { return Connection{2, i, 3, i}; };
    Row const rows[] = {
        {"ports that come to one slot", [](unsigned long long i) { return unmixed(i + 1); }, plain},
        {"connections of one hash", counted,
         [](unsigned long long i) { return withHash(2, i, 3, 77); }},
    };
    auto const graph = [](auto const& idOf, auto const& connectionOf) {
        std::vector<Port> ports;
        std::vector<Connection> connections;
        for (unsigned long long i = 0; i < kCount; ++i) {
            ports.push_back(port(idOf(i)));
            connections.push_back(connectionOf(i));
        }
        return patch(1, {withPorts(patch(2), {}, ports), patch(3)}, connections);
    };
    double const usual = secondsToIndex(graph(counted, plain));
    double const map = secondsFor([&] {
        std::unordered_map<unsigned long long, std::size_t> positions;
        for (unsigned long long i = 0; i < kCount; ++i) positions.emplace(counted(i), i);
        ASSERT_EQ(positions.size(), kCount);
    });
    EXPECT_LT(usual, 20 * map + 0.01);
    for (Row const& row : rows) {
        SCOPED_TRACE(row.label);
        Patch const chosen = graph(row.idOf, row.connectionOf);
        EXPECT_LT(secondsToIndex(chosen), 40 * usual + 0.01);
        PatchIndex const index(chosen);
        EXPECT_EQ(index.outgoingConnectionsFromPatch(2).size(), kCount);
        for (unsigned long long i = 0; i < kCount; i += 100) {
            ASSERT_EQ(index.findOutputPort(row.idOf(i)),
                      &chosen.children->at(0).outputs->at(static_cast<std::size_t>(i)));
        }
    }
}

namespace {

// Compares all results for this identifier with the queries of patch.h.
void expectAnswers(PatchIndex const& index, unsigned long long id) {
    Patch const& root = index.root();
    Patch const* const found = findPatchRecursive(root, id);
    ASSERT_EQ(index.findPatch(id), found);
    Patch const* const parent = found == nullptr ? nullptr : modelParent(root, found);
    ASSERT_EQ(index.parentOf(id), parent);
    expectView(index.incomingConnectionsToPatch(id), parent,
               parent ? findIncomingConnectionsToPatch(*parent, id) : Set());
    expectView(index.outgoingConnectionsFromPatch(id), parent,
               parent ? findOutgoingConnectionsFromPatch(*parent, id) : Set());

    ASSERT_EQ(index.findInputPort(id), modelPort(root, &Patch::inputs, id).port);
    ASSERT_EQ(index.findOutputPort(id), modelPort(root, &Patch::outputs, id).port);
    Patch const* const owner = modelOwner(root, id);
    ASSERT_EQ(index.ownerOfPort(id), owner);

    Patch const* const ownersParent = owner ? modelParent(root, owner) : nullptr;
    auto const incoming =
        ownersParent ? findIncomingConnectionToPort(*ownersParent, id) : Optional<Connection>();
    Connection const* const indexed = index.incomingConnection(id);
    ASSERT_EQ(indexed != nullptr, incoming.hasValue());
    if (incoming) {
        ASSERT_EQ(*indexed, *incoming);
        ASSERT_EQ(indexed, &*std::find(ownersParent->connections->begin(),
                                       ownersParent->connections->end(), *incoming));
    }

    Set const outgoing = findOutgoingConnectionsFromPort(root, id);
    ConnectionView const view = index.outgoingConnections(id);
    ASSERT_EQ(Set(view.begin(), view.end()), outgoing);
    ASSERT_EQ(view.size(), outgoing.size());
    for (std::size_t n = 1; n < view.size(); ++n) ASSERT_LT(&view[n - 1], &view[n]);
}

}  // namespace

TEST(PatchIndex, AgreesWithTheQueriesOnRandomTrees) {
    tests::Random random(3);
    for (int i = 0; i < 1500; ++i) {
        PatchIndex const index(randomPatch(random, 4));
        for (unsigned long long id : {0ULL, 1ULL, 2ULL, 3ULL, 4ULL, 5ULL, 6ULL, 7ULL, 8ULL, 9ULL,
                                      10ULL, 11ULL, 12ULL, 1ULL << 32, ULLONG_MAX}) {
            SCOPED_TRACE(testing::Message() << "tree " << i << ", id " << id);
            expectAnswers(index, id);
        }
        if (HasFatalFailure()) return;
    }
}

TEST(PatchIndex, AgreesWithTheQueriesAfterManyUpdates) {
    Random random(5);
    for (int i = 0; i < 60; ++i) {
        AnyDocument any(random);
        PatchIndex index(any.patch(3));
        std::vector<Patch> history{index.root()};
        for (int step = 0; step < 25; ++step) {
            Patch next;
            Patch const former = index.root();
            PatchIndex const copy = random.below(8) == 0 ? index : PatchIndex(Patch());
            switch (random.below(8)) {
                case 0: next = history[random.below(history.size())]; break;
                case 1: next = Model(former).toPatch(); break;  // Shares nothing.
                case 2: next = randomPatch(random, 3); break;   // With repeated identifiers.
                default: {
                    Model model(former);
                    PatchEdit edit(index);
                    for (std::size_t n = random.below(6); n > 0; --n) {
                        static_cast<void>(editOnce(any, edit, model));
                    }
                    next = edit.commit();
                }
            }
            index.update(next);
            history.push_back(next);
            ASSERT_EQ(index.root(), next);
            SCOPED_TRACE(testing::Message() << "chain " << i << ", step " << step);
            for (unsigned long long id = 0; id < 150; ++id) expectAnswers(index, id);
            if (copy.root().id != 0) {
                ASSERT_EQ(copy.root(), former);
                for (unsigned long long id = 0; id < 50; ++id) expectAnswers(copy, id);
            }
            if (HasFatalFailure()) return;
        }
    }
}

TEST(PatchIndex, HandlesUpdatesOfEachKind) {
    auto const base = [] {
        return patch(1,
                     {withPorts(patch(2, {patch(4)}), {port(21)}, {port(22)}),
                      withPorts(patch(3), {port(31)}, {port(32)})},
                     {{2, 22, 3, 31}, {3, 32, 2, 21}});
    };
    struct Row {
        char const* what;
        std::function<void(Model&)> change;
    };
    for (Row const& row : {
             Row{"nothing", [](Model&) {}},
             Row{"identifier of the root", [](Model& m) { m.fields.id = 9; }},
             Row{"identifier 0", [](Model& m) { m.find(3).patch->fields.id = 0; }},
             Row{"a patch twice", [](Model& m) { m.children.push_back(m.children.front()); }},
             Row{"a patch of the root's identifier",
                 [](Model& m) { m.children.emplace_back(patch(1)); }},
             Row{"an added patch twice",
                 [](Model& m) {
                     m.children.emplace_back(patch(7));
                     m.children.emplace_back(patch(7));
                 }},
             Row{"a port twice", [](Model& m) { m.find(4).patch->inputs.push_back(port(21)); }},
             Row{"an added port twice",
                 [](Model& m) {
                     m.find(4).patch->inputs = {port(41)};
                     m.find(4).patch->outputs = {port(41)};
                 }},
             Row{"a port of the other side",
                 [](Model& m) { std::swap(m.find(2).patch->inputs, m.find(2).patch->outputs); }},
             Row{"a connection to an output",
                 [](Model& m) {
                     m.connections.push_back({3, 32, 2, 22});
                 }},
             Row{"a connection to an added output",
                 [](Model& m) {
                     m.connections.push_back({3, 32, 2, 23});
                     m.find(2).patch->outputs.push_back(port(23));
                 }},
             Row{"a connection that repeats",
                 [](Model& m) {
                     m.connections.push_back({2, 22, 3, 31});
                 }},
             Row{"connections in another order",
                 [](Model& m) { std::swap(m.connections[0], m.connections[1]); }},
             Row{"children in another order", [](Model& m) { m.children.reverse(); }},
             Row{"ports of the root",
                 [](Model& m) {
                     m.inputs = {port(11)};
                     m.outputs = {port(12)};
                 }},
             Row{"a child becomes the parent of its parent",
                 [](Model& m) {
                     m.movePatch(4, 1, 0);
                     m.movePatch(2, 4, 0);
                 }},
             Row{"a parent goes, its child stays",
                 [](Model& m) {
                     m.movePatch(4, 3, 0);
                     m.removePatch(2);
                 }},
             Row{"into an added patch",
                 [](Model& m) {
                     m.addPatch(1, patch(7, {patch(8)}), 0);
                     m.movePatch(3, 8, 0);
                 }},
             Row{"all of it", [](Model& m) { m = Model(patch(1)); }},
         }) {
        SCOPED_TRACE(row.what);
        Model model(base());
        row.change(model);
        PatchIndex index(base());
        for (Patch const& next : {model.toPatch(), base(), model.toPatch()}) {
            index.update(next);
            ASSERT_EQ(index.root(), next);
            for (unsigned long long id = 0; id < 50; ++id) expectAnswers(index, id);
        }
    }
}

TEST(PatchIndex, UpdatesSurviveFailingAllocations) {
    Random random(6);
    for (int i = 0; i < 12; ++i) {
        AnyDocument any(random);
        PatchIndex index(any.patch(2));
        Patch const former = index.root();
        Model model(former);
        PatchEdit edit(index);
        for (int n = 0; n < 5; ++n) ASSERT_TRUE(editOnce(any, edit, model));
        Patch const next = edit.commit();
        failEachAllocation([&] { index.update(next); },
                           [&] {
                               EXPECT_EQ(index.root().children, former.children);
                               for (unsigned long long id = 0; id < 40; ++id) {
                                   expectAnswers(index, id);
                               }
                           });
        EXPECT_EQ(index.root(), next);
        for (unsigned long long id = 0; id < 60; ++id) expectAnswers(index, id);
    }
}

// Each update adds a little; occasionally the index is rebuilt.
TEST(PatchIndex, SurvivesManyUpdates) {
    PatchIndex index(patch(1, {withPorts(patch(2), {port(1)}, {port(2)})}));
    for (int i = 0; i < 3000; ++i) {
        PatchEdit edit(index);
        if (i % 500 == 499) {
            unsigned long long const end = edit.freshPatchId();
            for (unsigned long long id = 3; id < end; ++id) edit.removePatch(id);
        } else {
            unsigned long long const id = edit.freshPatchId();
            Port const input = port(edit.freshPortId());
            ASSERT_TRUE(edit.addPatch(1, withPorts(patch(id), {input}, {})));
            ASSERT_TRUE(edit.connect({2, 2, id, input.id}));
        }
        index.update(edit.commit());
        if (i % 100 > 1) continue;
        for (unsigned long long id = 0; id < 600; ++id) expectAnswers(index, id);
    }
}

TEST(PatchIndex, OutlivesTheCallersRecordAndMoves) {
    auto root = std::make_unique<Patch>(smallGraph());
    PatchIndex index(*root);
    root.reset();
    Patch const* const before = index.findPatch(1);
    Port const* const port = index.findInputPort(41);
    PatchIndex moved = std::move(index);
    EXPECT_EQ(moved.findPatch(1), before);
    EXPECT_EQ(&moved.root(), before);
    EXPECT_EQ(moved.findInputPort(41), port);
    EXPECT_EQ(port->id, 41u);
    PatchIndex const copy = moved;
    moved = PatchIndex(Patch());
    EXPECT_EQ(copy.findPatch(1), before);
    EXPECT_EQ(moved.findPatch(1), nullptr);
}

TEST(PatchIndex, QueriesAllocateNothing) {
    PatchIndex const index(smallGraph());
    struct Query {
        char const* name;
        std::size_t found;  // In the small graph, for all identifiers together.
        std::size_t (*ask)(PatchIndex const&, unsigned long long id);
    };
    for (Query const& query : {
             Query{"findPatch", 4, ask<&PatchIndex::findPatch>},
             Query{"parentOf", 3, ask<&PatchIndex::parentOf>},
             Query{"findInputPort", 4, ask<&PatchIndex::findInputPort>},
             Query{"findOutputPort", 4, ask<&PatchIndex::findOutputPort>},
             Query{"ownerOfPort", 8, ask<&PatchIndex::ownerOfPort>},
             Query{"incomingConnection", 2, ask<&PatchIndex::incomingConnection>},
             Query{"outgoingConnections", 3, ask<&PatchIndex::outgoingConnections>},
             Query{"incomingConnectionsToPatch", 3, ask<&PatchIndex::incomingConnectionsToPatch>},
             Query{"outgoingConnectionsFromPatch", 3,
                   ask<&PatchIndex::outgoingConnectionsFromPatch>},
         }) {
        SCOPED_TRACE(query.name);
        std::size_t found = 0;
        tests::AllocationCounter counter;
        for (unsigned long long id = 0; id < 50; ++id) found += query.ask(index, id);
        EXPECT_EQ(counter.count(), 0u);
        EXPECT_EQ(found, query.found);
    }
}

TEST(PatchIndex, SurvivesFailingAllocations) {
    Patch const root = smallGraph();
    EXPECT_GT(tests::failEachAllocation([&] { PatchIndex const index(root); },
                                        [&] { EXPECT_EQ(root, smallGraph()); }),
              5u);
    EvalPatch const evaluated(root);
    EvalPatchIndex index(evaluated);
    evaluated.children->at(1).id = 7;
    EXPECT_GT(tests::failEachAllocation([&] { index.rebuild(); },
                                        [&] { EXPECT_EQ(index.findPatch(7), nullptr); }),
              3u);
    EXPECT_EQ(index.findPatch(7), &evaluated.children->at(1));
}

TEST(EvalPatchIndex, AgreesWithTheQueriesOnRandomTrees) {
    tests::Random random(4);
    for (int i = 0; i < 500; ++i) {
        EvalPatchIndex const index(EvalPatch(randomPatch(random, 4)));
        EvalPatch const& root = index.root();
        for (unsigned long long id = 0; id < 14; ++id) {
            EvalPatch const* const found = findPatchRecursive(root, id);
            ASSERT_EQ(index.findPatch(id), found);
            ASSERT_EQ(index.parentOf(id), found ? modelParent(root, found) : nullptr);
            EvalPort const* input = nullptr;
            EvalPort const* output = nullptr;
            EvalPatch const* owner = nullptr;
            for (EvalPatch const* candidate : searchOrder(root)) {
                for (EvalPort const& port : *candidate->inputs) {
                    if (port.id != id) continue;
                    if (owner == nullptr) owner = candidate;
                    if (input == nullptr) input = &port;
                }
                for (EvalPort const& port : *candidate->outputs) {
                    if (port.id != id) continue;
                    if (owner == nullptr) owner = candidate;
                    if (output == nullptr) output = &port;
                }
            }
            ASSERT_EQ(index.findInputPort(id), input);
            ASSERT_EQ(index.findOutputPort(id), output);
            ASSERT_EQ(index.ownerOfPort(id), owner);
        }
    }
}

TEST(EvalPatchIndex, SeesChangesAfterRebuild) {
    EvalPatch const evaluated{smallGraph()};
    EvalPatchIndex index(evaluated);
    EvalPatchIndex const asItWas = index;
    EXPECT_EQ(index.findInputPort(31), &evaluated.children->at(1).inputs->at(0));
    evaluated.children->at(1).inputs->push_back(EvalPort(port(77)));
    EXPECT_EQ(index.findInputPort(77), nullptr);
    index.rebuild();
    EXPECT_EQ(index.findInputPort(77), &evaluated.children->at(1).inputs->at(1));
    EXPECT_EQ(asItWas.findInputPort(77), nullptr);
}

TEST(PatchIndex, NeedsNoDeepStack) {
    onStackOf(kStack, [] {
        Patch root = withPorts(patch(kDeepest), {port(1)}, {port(2)});
        for (unsigned long long id = kDeepest - 1; id > 0; --id) {
            root = patch(id, {std::move(root)}, {{id + 1, 2, id + 1, 1}});
        }
        PatchIndex const index(root);
        EXPECT_EQ(index.findPatch(kDeepest), findPatchRecursive(index.root(), kDeepest));
        EXPECT_EQ(index.parentOf(kDeepest)->id, kDeepest - 1);
        EXPECT_EQ(index.ownerOfPort(2)->id, kDeepest);
        EXPECT_EQ(index.outgoingConnections(2).size(), 1u);
        EXPECT_EQ(index.incomingConnection(1)->toPortId, 1u);
        EvalPatchIndex evaluated{EvalPatch(root)};
        EXPECT_EQ(evaluated.findPatch(kDeepest)->id, kDeepest);
        evaluated.rebuild();
        EXPECT_EQ(evaluated.parentOf(kDeepest)->id, kDeepest - 1);
    });
}
