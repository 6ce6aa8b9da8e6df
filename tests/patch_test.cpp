#include <Engine/Base/patch.h>

#include <Engine/Base/path.h>

#include "support/allocations.h"
#include "support/death.h"
#include "support/graph_model.h"
#include "support/graphs.h"
#include "support/print.h"
#include "support/random.h"
#include "support/stack.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <functional>
#include <sstream>
#include <unordered_set>
#include <vector>

using namespace tarn::engine;
using namespace tests;

namespace {

using Set = std::unordered_set<Connection>;

std::map<std::string, Unstructured> const kOtherKeys{{"A", 1}, {"b", "two"}};

}  // namespace

TEST(Records, HaveEmptyListsInitially) {
    Patch const fresh;
    for (std::size_t size : {fresh.inputs->size(), fresh.outputs->size(), fresh.connections->size(),
                             fresh.children->size()}) {
        EXPECT_EQ(size, 0u);
    }
    EXPECT_EQ(fresh, Patch());
    EvalPatch const evaluated;
    EXPECT_TRUE(evaluated.inputs->empty() && evaluated.outputs->empty());
    EXPECT_TRUE(evaluated.children->empty());
    EXPECT_NE(evaluated.inputs, EvalPatch().inputs);
    EXPECT_EQ(evaluated, EvalPatch());
    EXPECT_EQ(EvalPort(), EvalPort());
    EXPECT_EQ(Port(), Port());
    EXPECT_EQ(Connection(), (Connection{0, 0, 0, 0}));
}

TEST(Port, ComparesAllFields) {
    auto const base = [] {
        Port p = port(1, 2);
        p.typeInfo.min = Value(0.0);
        p.defaultValue = 1.5;
        p.attributes = {{"a", 1}, {"b", "two"}};
        return p;
    };
    struct Row {
        char const* what;
        void (*change)(Port&);
        bool equal;
    };
    for (Row const& row : {
             Row{"nothing", [](Port&) {}, true},
             Row{"id", [](Port& p) { p.id = 9; }, false},
             Row{"tag", [](Port& p) { p.tag = 9; }, false},
             Row{"name", [](Port& p) { p.name = "other"; }, false},
             Row{"type", [](Port& p) { p.typeInfo.type = Type::Int; }, false},
             Row{"subtype", [](Port& p) { p.typeInfo.subtype = 1; }, false},
             Row{"lower bound", [](Port& p) { p.typeInfo.min = Value(0.5); }, false},
             Row{"no lower bound", [](Port& p) { p.typeInfo.min = {}; }, false},
             Row{"upper bound", [](Port& p) { p.typeInfo.max = Value(1.0); }, false},
             Row{"extra", [](Port& p) { p.typeInfo.extra = Value("mm"); }, false},
             Row{"default value", [](Port& p) { p.defaultValue = 2; }, false},
             Row{"attribute's value", [](Port& p) { p.attributes["a"] = 2; }, false},
             Row{"attribute's key", [](Port& p) { p.attributes = kOtherKeys; }, false},
             Row{"another attribute", [](Port& p) { p.attributes["c"] = 3; }, false},
             Row{"order of insertion",
                 [](Port& p) {
                     p.attributes.clear();
                     p.attributes["b"] = "two";
                     p.attributes["a"] = 1;
                 },
                 true},
             Row{"NaN", [](Port& p) { p.defaultValue = double(NAN); }, false},
         }) {
        SCOPED_TRACE(row.what);
        Port other = base();
        row.change(other);
        EXPECT_EQ(base() == other, row.equal);
        EXPECT_EQ(other == base(), row.equal);
        EXPECT_EQ(base() != other, !row.equal);
    }
}

TEST(Connection, ComparesAndHashesAllFields) {
    Connection const base{1, 2, 3, 4};
    EXPECT_EQ(base, (Connection{1, 2, 3, 4}));
    for (Connection const& other : {Connection{9, 2, 3, 4}, Connection{1, 9, 3, 4},
                                    Connection{1, 2, 9, 4}, Connection{1, 2, 3, 9}}) {
        EXPECT_FALSE(base == other);
        EXPECT_TRUE(base != other);
        EXPECT_NE(std::hash<Connection>()(base), std::hash<Connection>()(other));
    }
    struct Row {
        Connection connection;
        std::uint64_t hash;  // A 32-bit `std::size_t` holds the lower half.
    };
    for (Row const& row : {
             Row{{1, 2, 3, 4}, 0x28253c81ad382},
             Row{{3, 4, 1, 2}, 0x28253c81259e0},
             Row{{0, 0, 0, 0}, 0x28253c84d221a},
         }) {
        EXPECT_EQ(std::hash<Connection>()(row.connection), static_cast<std::size_t>(row.hash));
    }
    EXPECT_EQ(Set().max_load_factor(), 1.0f);

    tests::Random random(31);
    for (int i = 0; i < 10000; ++i) {
        unsigned long long const fields[] = {random.word(), random.word() >> random.below(64),
                                             random.word(), ULLONG_MAX - random.below(2)};
        std::uint64_t seed = 0;
        for (unsigned long long v : fields) {
            seed = seed ^ (v + 2654435769ULL + seed * 64 + seed / 4);
        }
        ASSERT_EQ(std::hash<Connection>()({fields[0], fields[1], fields[2], fields[3]}),
                  static_cast<std::size_t>(seed));
    }
}

TEST(Patch, SharesItsEmptyListsAndAllocatesNothing) {
    Patch const first;  // Initialises statics.
    tests::AllocationCounter counter;
    {
        Patch const patch;
        Patch const copy = patch;
        Port const port;
        EXPECT_EQ(patch.inputs, first.inputs);
        EXPECT_EQ(copy.outputs, first.inputs);
        EXPECT_EQ(patch.children, first.children);
        EXPECT_EQ(patch.connections, first.connections);
        EXPECT_TRUE(patch.inputs != nullptr && patch.inputs->empty());
        EXPECT_TRUE(patch.children != nullptr && patch.children->empty());
        EXPECT_TRUE(patch.connections != nullptr && patch.connections->empty());
        // Without a reference count that threads would contend for.
        EXPECT_EQ(patch.inputs.use_count(), 0);
    }
    EXPECT_EQ(counter.count(), 0u);
}

TEST(Array, IsConstructedFromAVectorOrBraces) {
    Array<Port> const ofVector = arrayOf(std::vector<Port>{Port{1}, Port{2}});
    EXPECT_EQ(ofVector->size(), 2u);
    EXPECT_EQ((*ofVector)[1].id, 2u);
    EXPECT_EQ(*arrayOf<Port>({Port{1}, Port{2}}), *ofVector);
    EXPECT_EQ(arrayOf<Port>({})->size(), 0u);
    std::vector<Port> ports{Port{1}};
    Port const* const before = ports.data();
    EXPECT_EQ(arrayOf(std::move(ports))->data(), before);
}

TEST(Map, AcceptsAnyCallable) {
    Array<Port> const list = arrayOf<Port>({Port{7}, Port{8, 0, "second"}});
    EXPECT_EQ(*map(&Port::id, list), (std::vector<unsigned long long>{7, 8}));
    EXPECT_EQ(*map(&Port::name, list), (std::vector<std::string>{"", "second"}));
    auto const twice = [](Port const& port) { return 2 * port.id; };
    EXPECT_EQ(*map(twice, list), (std::vector<unsigned long long>{14, 16}));
}

TEST(PatchDeathTest, NamesANullList) {
    auto const said = [](char const* condition) {
        return tests::failedAssertion(condition, "elementsOf", "Engine/Base/patch");
    };
    Patch const noInputs{1, 2, "", {}, "", {}};
    Patch noOutputs;
    noOutputs.outputs = nullptr;
    Patch noConnections;
    noConnections.connections = nullptr;
    Patch noChildren;
    noChildren.children = nullptr;
    std::ostringstream stream;
    EXPECT_ENDS(inPortForTag(noInputs, 1), said("inputs != nullptr"));
    EXPECT_ENDS(outPortForTag(noOutputs, 1), said("outputs != nullptr"));
    EXPECT_ENDS(findPatchRecursive(noChildren, 7), said("children != nullptr"));
    EXPECT_ENDS(findIncomingConnectionToPort(noConnections, 7), said("connections != nullptr"));
    EXPECT_ENDS(findOutgoingConnectionsFromPatch(noConnections, 7), said("connections != nullptr"));
    EXPECT_ENDS(findOutgoingConnectionsFromPort(noChildren, 7), said("children != nullptr"));
    EXPECT_ENDS(static_cast<void>(noInputs == Patch{1, 2}), said("inputs != nullptr"));
    EXPECT_ENDS(static_cast<void>(Patch() == noChildren), said("children != nullptr"));
    EXPECT_ENDS(stream << noInputs, said("inputs != nullptr"));
    Patch noOutputsButInputs{1, 2, "", {}, "", arrayOf({Port{1}}), {}};
    EXPECT_ENDS(stream << noOutputsButInputs, said("outputs != nullptr"));
    EXPECT_ENDS(stream << noConnections, said("connections != nullptr"));
    EXPECT_ENDS(EvalPatch{noOutputs}, said("outputs != nullptr"));
    EXPECT_ENDS(EvalPatch{noChildren}, said("children != nullptr"));
    EXPECT_ENDS(map(toEvalPort, Array<Port>()), said("list != nullptr"));
    EvalPatch noEvalChildren;
    noEvalChildren.children = nullptr;
    EXPECT_ENDS(findInputPort(noEvalChildren, 1), said("children != nullptr"));
}

TEST(Patch, ComparesAllFields) {
    auto const withAttributes = [] {
        Patch p = sampleDocument();
        p.attributes = {{"a", 1}, {"b", "two"}};
        return p;
    };
    struct Row {
        char const* what;
        void (*change)(Patch&);
        bool equal;
    };
    for (Row const& row : {
             Row{"nothing", [](Patch&) {}, true},
             Row{"id", [](Patch& p) { p.id = 9; }, false},
             Row{"builtin", [](Patch& p) { p.builtin = 9; }, false},
             Row{"descriptor", [](Patch& p) { p.descriptor = "other"; }, false},
             Row{"name", [](Patch& p) { p.name = "other"; }, false},
             Row{"model layer", [](Patch& p) { p.modelLayer.id = 9; }, false},
             Row{"inputs", [](Patch& p) { p.inputs = arrayOf<Port>({port(9)}); }, false},
             Row{"outputs", [](Patch& p) { p.outputs = arrayOf<Port>({port(9)}); }, false},
             Row{"connections", [](Patch& p) { p.connections = arrayOf<Connection>({}); }, false},
             Row{"order of connections",
                 [](Patch& p) {
                     p.connections = arrayOf<Connection>({{2, 21, 2, 12}, {2, 21, 3, 31}});
                 },
                 false},
             Row{"other end of a connection",
                 [](Patch& p) {
                     p.connections = arrayOf<Connection>({{2, 21, 3, 31}, {2, 21, 9, 12}});
                 },
                 false},
             Row{"other start of a connection",
                 [](Patch& p) {
                     p.connections = arrayOf<Connection>({{9, 21, 3, 31}, {2, 21, 2, 12}});
                 },
                 false},
             Row{"other ports of a connection",
                 [](Patch& p) {
                     p.connections = arrayOf<Connection>({{2, 21, 3, 32}, {2, 22, 2, 12}});
                 },
                 false},
             Row{"another attribute", [](Patch& p) { p.attributes["c"] = 1; }, false},
             Row{"attribute's value", [](Patch& p) { p.attributes["a"] = 2; }, false},
             Row{"attribute's key",
                 [](Patch& p) {
                     p.attributes = {{"A", 1}, {"b", "two"}};
                 },
                 false},
             Row{"fewer children", [](Patch& p) { p.children = arrayOf<Patch>({}); }, false},
             Row{"grandchild's port",
                 [](Patch& p) {
                     Patch middle = p.children->at(0);
                     Patch leaf = middle.children->at(0);
                     Port changed = leaf.inputs->at(0);
                     changed.attributes["x"] = 0;
                     leaf.inputs = arrayOf<Port>({changed});
                     middle.children = arrayOf<Patch>({leaf, middle.children->at(1)});
                     p.children = arrayOf<Patch>({middle, p.children->at(1)});
                 },
                 false},
             Row{"grandchild's inputs in another order",
                 [](Patch& p) {
                     Patch middle = p.children->at(0);
                     middle.inputs = arrayOf<Port>({middle.inputs->at(1), middle.inputs->at(0)});
                     p.children = arrayOf<Patch>({middle, p.children->at(1)});
                 },
                 false},
             Row{"order of children",
                 [](Patch& p) {
                     p.children = arrayOf<Patch>({p.children->at(1), p.children->at(0)});
                 },
                 false},
         }) {
        SCOPED_TRACE(row.what);
        Patch const base = withAttributes();
        Patch other = withAttributes();
        row.change(other);
        EXPECT_EQ(base == other, row.equal);
        EXPECT_EQ(other == base, row.equal);
        EXPECT_EQ(base != other, !row.equal);
    }
}

TEST(Patch, TreatsOnlySharedListsAsEqual) {
    Port nan = port(1);
    nan.defaultValue = double(NAN);
    for (Array<Port> Patch::*ports : {&Patch::inputs, &Patch::outputs}) {
        Patch a;
        a.*ports = arrayOf<Port>({nan});
        Patch b;
        b.*ports = arrayOf<Port>({nan});
        EXPECT_FALSE(a == b);
        b.*ports = a.*ports;
        EXPECT_TRUE(a == b);
        EXPECT_TRUE(a == Patch(a));
        Patch c = patch(1, {a});
        EXPECT_TRUE(c == Patch(c));
        // Children that are not shared are compared, and share their own lists.
        EXPECT_TRUE(c == patch(1, {a}));
        EXPECT_FALSE(c == patch(1, {[&] {
                                    Patch d;
                                    d.*ports = arrayOf<Port>({nan});
                                    return d;
                                }()}));
    }
    Patch attributes;
    attributes.attributes["a"] = double(NAN);
    EXPECT_FALSE(attributes == attributes);
    Patch const parent = patch(1, {attributes});
    EXPECT_TRUE(parent == Patch(parent));
    EXPECT_FALSE(parent == patch(1, {attributes}));
}

TEST(Patch, CopiesShareTheirLists) {
    Patch const original = sampleDocument();
    Patch const copy = original;
    EXPECT_EQ(copy.inputs, original.inputs);
    EXPECT_EQ(copy.children, original.children);
    EXPECT_EQ(copy.connections, original.connections);
}

TEST(Records, AreInitiallyZeroAndEmpty) {
    Port const port;
    EXPECT_EQ(port.id, 0u);
    EXPECT_EQ(port.tag, 0u);
    EXPECT_EQ(port.name, "");
    EXPECT_EQ(port.typeInfo, TypeInfo());
    EXPECT_EQ(port.defaultValue, Value());
    EXPECT_TRUE(port.attributes.empty());
    Patch const patch;
    EXPECT_EQ(patch.id, 0u);
    EXPECT_EQ(patch.builtin, 0u);
    EXPECT_EQ(patch.descriptor, "");
    EXPECT_EQ(patch.modelLayer, ModelLayer());
    EXPECT_EQ(patch.name, "");
    EXPECT_TRUE(patch.attributes.empty());
    EvalPatch const evaluated;
    EXPECT_EQ(evaluated.id, 0u);
    EXPECT_EQ(evaluated.builtin, 0u);
    EXPECT_EQ(evaluated.name, "");
    EXPECT_EQ(evaluated.modelLayer, ModelLayer());
    EXPECT_FALSE(evaluated.hasInputCount);
    EXPECT_FALSE(evaluated.hasOutputCount);
}

TEST(Map, AppliesAFunctionInOrderWithOneAllocationForTheList) {
    Array<Port> const ports = arrayOf<Port>({port(1), port(2), port(3)});
    MutableArray<unsigned long long> const ids =
        map([](Port const& p) { return p.id * 10; }, ports);
    EXPECT_EQ(*ids, (std::vector<unsigned long long>{10, 20, 30}));
    tests::AllocationCounter counter;
    EXPECT_EQ(map([](Port const& p) { return p.id; }, ports)->size(), 3u);
    EXPECT_EQ(counter.count(), 2u);  // The elements, and the list with its reference count.
    MutableArray<EvalPort> const none = map(toEvalPort, arrayOf<Port>({}));
    ASSERT_NE(none, nullptr);
    EXPECT_TRUE(none->empty());
}

TEST(Patch, SurvivesFailingAllocations) {
    Patch const source = sampleDocument();
    Patch const before = patch(9, {patch(8)});
    Patch target = before;
    EXPECT_GE(tests::failEachAllocation(
                  [&] {
                      Patch copy = source;
                      copy.name.append(100, 'x');
                      copy.attributes["key of some length, so that it allocates"] = "value";
                      target = std::move(copy);
                  },
                  [&] { EXPECT_EQ(target, before); }),
              3u);
    EXPECT_EQ(target.children, source.children);
    EXPECT_GT(tests::failEachAllocation([&] { EvalPatch const evaluated(source); },
                                        [&] { EXPECT_EQ(source, sampleDocument()); }),
              20u);
}

TEST(Patch, NestsTenThousandLevelsDeep) {
    onStackOf(kStack, [] {
        auto const chain = [](unsigned long long leafId) {
            Patch result = withPorts(patch(leafId), {port(1)}, {port(2)});
            for (unsigned long long id = kDeepest - 1; id > 0; --id) {
                result = withPorts(patch(id, {std::move(result)}, {{id + 1, 2, id + 1, 1}}),
                                   {port(10 * kDeepest + id)}, {port(20 * kDeepest + id)});
            }
            return result;
        };
        Patch root = chain(kDeepest);
        EXPECT_TRUE(root == chain(kDeepest));
        EXPECT_TRUE(root != chain(kDeepest + 1));
        Patch const copy = root;
        EXPECT_TRUE(copy == root);
        EXPECT_EQ(findPatchRecursive(root, kDeepest)->outputs->at(0).id, 2u);
        EXPECT_EQ(findPatchRecursive(root, kDeepest + 1), nullptr);
        EXPECT_EQ(findOutgoingConnectionsFromPort(root, 2).size(), 1u);
        EXPECT_TRUE(findOutgoingConnectionsFromPort(root, 3).empty());
        std::ostringstream text;
        text << root;
        EXPECT_NE(text.str().find("[patch:" + std::to_string(kDeepest) + " "), std::string::npos);
        EXPECT_EQ(text.str().find("[patch:" + std::to_string(kDeepest + 1) + " "),
                  std::string::npos);

        EvalPatch evaluated(root);
        EXPECT_TRUE(evaluated == EvalPatch(root));
        EXPECT_TRUE(evaluated != EvalPatch(chain(kDeepest + 1)));
        EXPECT_EQ(findPatchRecursive(evaluated, kDeepest)->outputs->at(0).id, 2u);
        EXPECT_EQ(findPatchRecursive(evaluated, kDeepest + 1), nullptr);
        root = Patch();
        evaluated = EvalPatch();
    });
}
