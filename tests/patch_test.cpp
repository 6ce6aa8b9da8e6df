#include <Engine/Base/patch.h>

#include <Engine/Base/path.h>

#include "support/allocations.h"
#include "support/death.h"
#include "support/graph_model.h"
#include "support/graphs.h"
#include "support/random.h"
#include "support/stack.h"
#include "support/streams.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <fstream>
#include <iomanip>
#include <iterator>
#include <sstream>

using namespace tarn::engine;
using namespace tests;

namespace {

using Set = std::unordered_set<Connection>;

// Three levels, with everything that the debug text shows.
Patch document() {
    Port number = port(11, 1);
    number.name = "";
    number.defaultValue = 2.5;
    Port text = port(12, 2);
    text.typeInfo.type = Type::String;
    text.defaultValue = "a text";
    Port color = port(13);
    color.typeInfo.type = Type::Vec4;
    color.defaultValue = FloatVec4{1, 0.5, 0, 1};
    Port shape = port(21, 7);
    shape.typeInfo.type = Type::Path;
    shape.defaultValue = Path();
    Patch const leaf = withPorts(patch(4), {number}, {});
    Patch const bare = patch(5);
    Patch const middle =
        withPorts(patch(2, {leaf, bare}, {{4, 11, 5, 99}}), {text, color}, {shape});
    Patch root = patch(1, {middle, patch(3)}, {{2, 21, 3, 31}, {2, 21, 2, 12}});
    root.builtin = 77;
    root.descriptor = "not printed";
    return root;
}

template <class T>
std::string written(T const& what) {
    std::ostringstream stream;
    stream << what;
    return stream.str();
}

}  // namespace

TEST(Records, HoldEmptyListsUntilGivenOthers) {
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

TEST(Port, EqualsFieldByField) {
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
             Row{"attribute's key",
                 [](Port& p) {
                     p.attributes = {{"A", 1}, {"b", "two"}};
                 },
                 false},
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

TEST(Connection, EqualsAndHashesByAllFields) {
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
        std::uint64_t hash;  // Of which a `std::size_t` of 32 bits holds the lower half.
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
    Patch const first;  // What is made at first use.
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
        // Without a count that threads would fight over.
        EXPECT_EQ(patch.inputs.use_count(), 0);
    }
    EXPECT_EQ(counter.count(), 0u);
}

TEST(Array, IsMadeOfAVectorOrInBraces) {
    Array<Port> const ofVector = arrayOf(std::vector<Port>{Port{1}, Port{2}});
    EXPECT_EQ(ofVector->size(), 2u);
    EXPECT_EQ((*ofVector)[1].id, 2u);
    EXPECT_EQ(*arrayOf<Port>({Port{1}, Port{2}}), *ofVector);
    EXPECT_EQ(arrayOf<Port>({})->size(), 0u);
    std::vector<Port> ports{Port{1}};
    Port const* const before = ports.data();
    EXPECT_EQ(arrayOf(std::move(ports))->data(), before);
}

TEST(Map, TakesWhateverCanBeInvoked) {
    Array<Port> const list = arrayOf<Port>({Port{7}, Port{8, 0, "second"}});
    EXPECT_EQ(*map(&Port::id, list), (std::vector<unsigned long long>{7, 8}));
    EXPECT_EQ(*map(&Port::name, list), (std::vector<std::string>{"", "second"}));
    auto const twice = [](Port const& port) { return 2 * port.id; };
    EXPECT_EQ(*map(twice, list), (std::vector<unsigned long long>{14, 16}));
}

TEST(PatchDeathTest, ANullListIsNamed) {
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

TEST(Patch, EqualsFieldByField) {
    auto const withAttributes = [] {
        Patch p = document();
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

TEST(Patch, TakesSharedListsForEqualAndNothingElse) {
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
        // Children that are not shared are looked at, and share their own lists.
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
    Patch const original = document();
    Patch const copy = original;
    EXPECT_EQ(copy.inputs, original.inputs);
    EXPECT_EQ(copy.children, original.children);
    EXPECT_EQ(copy.connections, original.connections);
}

TEST(Records, AreZeroAndEmptyAtFirst) {
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

TEST(EvalPort, IsEmptyAtFirst) {
    EvalPort const port;
    EXPECT_EQ(port.id, 0u);
    EXPECT_EQ(port.tag, 0u);
    EXPECT_EQ(port.evaluatorState, 0u);
    EXPECT_FALSE(port.evaluatorFlag);
    EXPECT_EQ(port.typeInfo, TypeInfo());
    EXPECT_TRUE(port.values.empty());
    EXPECT_EQ(port.name, "");
}

TEST(EvalPort, TakesOverAPort) {
    Port source = port(5, 6);
    source.typeInfo = {Type::Int, 1, Value(0), {}, Value("e")};
    source.defaultValue = 7;
    source.attributes["dropped"] = 1;
    for (EvalPort const& evaluated : {EvalPort(source), toEvalPort(source)}) {
        EXPECT_EQ(evaluated.id, 5u);
        EXPECT_EQ(evaluated.tag, 6u);
        EXPECT_EQ(evaluated.evaluatorState, 0u);
        EXPECT_FALSE(evaluated.evaluatorFlag);
        EXPECT_EQ(evaluated.typeInfo, source.typeInfo);
        EXPECT_EQ(evaluated.values, Loop{7});
        EXPECT_EQ(evaluated.values.capacity(), 1u);
        EXPECT_EQ(evaluated.name, "p5");
    }
}

TEST(EvalPort, EqualsFieldByField) {
    struct Row {
        char const* what;
        void (*change)(EvalPort&);
    };
    EvalPort const base(port(1));
    EXPECT_EQ(base, EvalPort(port(1)));
    for (Row const& row : {
             Row{"id", [](EvalPort& p) { p.id = 9; }},
             Row{"tag", [](EvalPort& p) { p.tag = 9; }},
             Row{"state", [](EvalPort& p) { p.evaluatorState = 9; }},
             Row{"flag", [](EvalPort& p) { p.evaluatorFlag = true; }},
             Row{"type info", [](EvalPort& p) { p.typeInfo.type = Type::Int; }},
             Row{"values", [](EvalPort& p) { p.values.push_back(1); }},
             Row{"name", [](EvalPort& p) { p.name = "other"; }},
         }) {
        SCOPED_TRACE(row.what);
        EvalPort other = base;
        row.change(other);
        EXPECT_FALSE(base == other);
        EXPECT_TRUE(base != other);
    }
}

TEST(EvalPatch, TakesOverAPatchAndItsSubtree) {
    Patch source = document();
    source.modelLayer = {3, {{4, {}, {}}}, {{5, {}, {}}}};
    Patch child = source.children->at(1);
    child.modelLayer = {6, {{7, {}, {}}}, {{8, {}, {}}}};
    source.children = arrayOf<Patch>({source.children->at(0), child});
    for (EvalPatch const& evaluated : {EvalPatch(source), toEvalPatch(source)}) {
        EXPECT_EQ(evaluated.id, 1u);
        EXPECT_EQ(evaluated.builtin, 77u);
        EXPECT_EQ(evaluated.name, "n1");
        EXPECT_EQ(evaluated.modelLayer, source.modelLayer);
        EXPECT_TRUE(evaluated.inputs->empty());
        ASSERT_EQ(evaluated.children->size(), 2u);
        EvalPatch const& middle = evaluated.children->at(0);
        EXPECT_EQ(middle.id, 2u);
        ASSERT_EQ(middle.inputs->size(), 2u);
        EXPECT_EQ(middle.inputs->at(0), EvalPort(source.children->at(0).inputs->at(0)));
        EXPECT_EQ(middle.inputs->at(1).id, 13u);
        EXPECT_EQ(middle.outputs->at(0).id, 21u);
        ASSERT_EQ(middle.children->size(), 2u);
        EXPECT_EQ(middle.children->at(0).inputs->at(0).values, Loop{2.5});
        ASSERT_NE(middle.children->at(1).children, nullptr);
        EXPECT_TRUE(middle.children->at(1).children->empty());
        EXPECT_EQ(evaluated.children->at(1).id, 3u);
        EXPECT_EQ(evaluated.children->at(1).modelLayer, child.modelLayer);
    }
}

TEST(EvalPatch, RecordsWhetherPortsAreCounted) {
    struct Row {
        char const* what;
        std::map<std::string, Unstructured> attributes;
        bool in, out;
    };
    for (Row const& row : {
             Row{"none", {}, false, false},
             Row{"inputs", {{"inputCount", 3}}, true, false},
             Row{"outputs", {{"outputCount", 3}}, false, true},
             Row{"of null", {{"inputCount", {}}, {"outputCount", {}}}, true, true},
             Row{"another case", {{"InputCount", 3}, {"outputcount", 3}}, false, false},
         }) {
        SCOPED_TRACE(row.what);
        Patch source;
        source.attributes = row.attributes;
        EXPECT_EQ(EvalPatch(source).hasInputCount, row.in);
        EXPECT_EQ(EvalPatch(source).hasOutputCount, row.out);
        EvalPatch const parent(patch(1, {source}));
        EXPECT_EQ(parent.children->at(0).hasInputCount, row.in);
        EXPECT_EQ(parent.children->at(0).hasOutputCount, row.out);
        EXPECT_FALSE(parent.hasInputCount || parent.hasOutputCount);
    }
}

TEST(EvalPatch, SharesListsWithCopiesAndNotWithOtherConversions) {
    Patch const source = document();
    EvalPatch const first(source);
    EvalPatch const second(source);
    EvalPatch const copy = first;
    EXPECT_EQ(first, second);
    EXPECT_NE(first.inputs, second.inputs);
    EXPECT_NE(first.outputs, second.outputs);
    EXPECT_NE(first.children, second.children);
    EXPECT_EQ(copy.inputs, first.inputs);
    EXPECT_EQ(copy.outputs, first.outputs);
    EXPECT_EQ(copy.children, first.children);
    copy.children->at(0).inputs->at(0).values[0] = 9.0;
    EXPECT_EQ(first.children->at(0).inputs->at(0).values, Loop{9.0});
    EXPECT_NE(first, second);
}

TEST(EvalPatch, TakesSharedListsForEqualAndNothingElse) {
    Port nan = port(1);
    nan.defaultValue = double(NAN);
    for (Patch const& source : {withPorts(patch(1), {nan}, {}), withPorts(patch(1), {}, {nan}),
                                patch(1, {withPorts(patch(2), {nan}, {})})}) {
        EvalPatch const evaluated(source);
        EXPECT_TRUE(evaluated == EvalPatch(evaluated));
        EXPECT_FALSE(evaluated == EvalPatch(source));
    }
}

TEST(EvalPatch, EqualsFieldByField) {
    struct Row {
        char const* what;
        void (*change)(EvalPatch&);
    };
    for (Row const& row : {
             Row{"id", [](EvalPatch& p) { p.id = 9; }},
             Row{"builtin", [](EvalPatch& p) { p.builtin = 9; }},
             Row{"name", [](EvalPatch& p) { p.name = "other"; }},
             Row{"inputs", [](EvalPatch& p) { p.inputs->emplace_back(); }},
             Row{"outputs", [](EvalPatch& p) { p.outputs->emplace_back(); }},
             Row{"children", [](EvalPatch& p) { p.children->at(0).id = 9; }},
             Row{"model layer", [](EvalPatch& p) { p.modelLayer.id = 9; }},
             Row{"input count", [](EvalPatch& p) { p.hasInputCount = true; }},
             Row{"output count", [](EvalPatch& p) { p.hasOutputCount = true; }},
         }) {
        SCOPED_TRACE(row.what);
        EvalPatch const base(document());
        EvalPatch other(document());
        EXPECT_TRUE(base == other);
        row.change(other);
        EXPECT_FALSE(base == other);
        EXPECT_TRUE(base != other);
    }
}

TEST(Map, AppliesAFunctionInOrderWithOneAllocationForTheList) {
    Array<Port> const ports = arrayOf<Port>({port(1), port(2), port(3)});
    MutableArray<unsigned long long> const ids =
        map([](Port const& p) { return p.id * 10; }, ports);
    EXPECT_EQ(*ids, (std::vector<unsigned long long>{10, 20, 30}));
    tests::AllocationCounter counter;
    EXPECT_EQ(map([](Port const& p) { return p.id; }, ports)->size(), 3u);
    EXPECT_EQ(counter.count(), 2u);  // The elements, and the list with its count.
    MutableArray<EvalPort> const none = map(toEvalPort, arrayOf<Port>({}));
    ASSERT_NE(none, nullptr);
    EXPECT_TRUE(none->empty());
}

TEST(FindPatchRecursive, LooksAtALevelBeforeItEntersIt) {
    Patch deep = patch(7);
    deep.name = "deep";
    Patch shallow = patch(7);
    shallow.name = "shallow";
    Patch const root = patch(1, {patch(2, {deep, patch(8)}), patch(3, {patch(9)}), shallow});
    EvalPatch const evaluated(root);
    EXPECT_EQ(findPatchRecursive(root, 1), &root);
    EXPECT_EQ(findPatchRecursive(evaluated, 1), &evaluated);
    EXPECT_EQ(findPatchRecursive(root, 7)->name, "shallow");
    EXPECT_EQ(findPatchRecursive(evaluated, 7)->name, "shallow");
    EXPECT_EQ(findPatchRecursive(root, 9), &root.children->at(1).children->at(0));
    EXPECT_EQ(findPatchRecursive(root, 8), &root.children->at(0).children->at(1));
    EXPECT_EQ(findPatchRecursive(root, 99), nullptr);
    EXPECT_EQ(findPatchRecursive(evaluated, 99), nullptr);
}

TEST(FindPatchRecursive, FindsNothingForZero) {
    Patch const root = patch(0, {patch(0)});
    EXPECT_EQ(findPatchRecursive(root, 0), nullptr);
    EXPECT_EQ(findPatchRecursive(EvalPatch(root), 0), nullptr);
}

TEST(FindPort, SearchesThePatchAndItsChildren) {
    Patch const grandchild = withPorts(patch(4), {port(41)}, {port(42)});
    Patch const root = withPorts(
        patch(1, {withPorts(patch(2, {grandchild}), {port(21), port(90)}, {port(22), port(91)}),
                  withPorts(patch(3), {port(31), port(21)}, {port(32), port(22)})}),
        {port(11), port(90)}, {port(12), port(91)});
    EvalPatch const evaluated(root);
    EXPECT_EQ(findInputPort(evaluated, 11), &evaluated.inputs->at(0));
    EXPECT_EQ(findOutputPort(evaluated, 12), &evaluated.outputs->at(0));
    EXPECT_EQ(findInputPort(evaluated, 90), &evaluated.inputs->at(1));
    EXPECT_EQ(findOutputPort(evaluated, 91), &evaluated.outputs->at(1));
    EXPECT_EQ(findInputPort(evaluated, 21), &evaluated.children->at(0).inputs->at(0));
    EXPECT_EQ(findOutputPort(evaluated, 22), &evaluated.children->at(0).outputs->at(0));
    EXPECT_EQ(findInputPort(evaluated, 31), &evaluated.children->at(1).inputs->at(0));
    EXPECT_EQ(findOutputPort(evaluated, 32), &evaluated.children->at(1).outputs->at(0));
    EXPECT_EQ(findInputPort(evaluated, 41), nullptr);
    EXPECT_EQ(findOutputPort(evaluated, 42), nullptr);
    EXPECT_EQ(findInputPort(evaluated, 12), nullptr);
    EXPECT_EQ(findOutputPort(evaluated, 11), nullptr);
}

TEST(FindConnections, SearchThePatchsOwn) {
    Connection const a{1, 10, 2, 20};
    Connection const b{3, 30, 2, 20};
    Connection const c{1, 10, 4, 40};
    Connection const inner{1, 10, 2, 50};
    Patch const root = patch(9, {patch(1, {}, {inner}), patch(2)}, {a, b, c, a});
    EXPECT_EQ(findIncomingConnectionToPort(root, 20).value(), a);
    EXPECT_EQ(findIncomingConnectionToPort(root, 40).value(), c);
    EXPECT_FALSE(findIncomingConnectionToPort(root, 10).hasValue());
    EXPECT_FALSE(findIncomingConnectionToPort(root, 50).hasValue());
    EXPECT_EQ(findIncomingConnectionsToPatch(root, 2), (Set{a, b}));
    EXPECT_EQ(findIncomingConnectionsToPatch(root, 4), (Set{c}));
    EXPECT_EQ(findIncomingConnectionsToPatch(root, 1), Set());
    EXPECT_EQ(findOutgoingConnectionsFromPatch(root, 1), (Set{a, c}));
    EXPECT_EQ(findOutgoingConnectionsFromPatch(root, 3), (Set{b}));
    EXPECT_EQ(findOutgoingConnectionsFromPatch(root, 2), Set());
}

TEST(FindOutgoingConnectionsFromPort, EndsAtTheParentOfThePortsPatch) {
    Connection const wrongPatch{77, 10, 3, 30};  // Matched by the port alone.
    Connection const twice{2, 10, 4, 40};
    Patch const deeper =
        patch(6, {withPorts(patch(7), {}, {port(10), port(60)})}, {{7, 10, 8, 80}, {7, 60, 8, 81}});
    Patch const root = withPorts(patch(1, {deeper, withPorts(patch(2), {}, {port(10), port(11)})},
                                       {wrongPatch, twice, twice, {2, 12, 3, 30}}),
                                 {}, {port(5)});
    struct Row {
        char const* what;
        unsigned long long portId;
        bool engaged;
        Set expected;
    };
    for (Row const& row : {
             Row{"child's port, although a deeper patch has it too", 10, true, {wrongPatch, twice}},
             Row{"child's port without connections", 11, true, {}},
             Row{"deeper port", 60, true, {{7, 60, 8, 81}}},
             Row{"the root's own port", 5, false, {}},
             Row{"no port", 12, false, {}},
         }) {
        SCOPED_TRACE(row.what);
        auto const worker = _findOutgoingConnectionsFromPort(root, row.portId);
        EXPECT_EQ(worker.hasValue(), row.engaged);
        if (worker) {
            EXPECT_EQ(*worker, row.expected);
        }
        EXPECT_EQ(findOutgoingConnectionsFromPort(root, row.portId), row.expected);
    }
    EXPECT_FALSE(_findOutgoingConnectionsFromPort(patch(1), 1).hasValue());
}

TEST(PortForTag, IsTheFirstOfThePatchsOwn) {
    Patch const root =
        withPorts(patch(1, {withPorts(patch(2), {port(21, 5)}, {port(22, 6)})}),
                  {port(11, 1), port(12, 2), port(13, 1)}, {port(14, 1), port(15, 3), port(16, 3)});
    EvalPatch const evaluated(root);
    EXPECT_EQ(inPortForTag(root, 1), &root.inputs->at(0));
    EXPECT_EQ(inPortForTag(root, 2), &root.inputs->at(1));
    EXPECT_EQ(inPortForTag(root, 3), nullptr);
    EXPECT_EQ(inPortForTag(root, 5), nullptr);
    EXPECT_EQ(outPortForTag(root, 1), &root.outputs->at(0));
    EXPECT_EQ(outPortForTag(root, 3), &root.outputs->at(1));
    EXPECT_EQ(outPortForTag(root, 6), nullptr);
    EXPECT_EQ(inPortForTag(evaluated, 1), &evaluated.inputs->at(0));
    EXPECT_EQ(inPortForTag(evaluated, 3), nullptr);
    EXPECT_EQ(outPortForTag(evaluated, 3), &evaluated.outputs->at(1));
    EXPECT_EQ(outPortForTag(evaluated, 2), nullptr);
    EXPECT_EQ(inPortForTag(evaluated, 5), nullptr);
    EXPECT_EQ(outPortForTag(evaluated, 6), nullptr);
}

TEST(GraphText, OfPortsAndConnections) {
    Port p = port(12, 34);
    p.typeInfo.type = Type::Vec2;
    p.defaultValue = FloatVec2{1, 2.5};
    EXPECT_EQ(written(p), "[p12:12 tag: 34 typeInfo: [type: vec2] defaultValue: 1, 2.5]");
    p.name = "";
    EXPECT_EQ(written(p), "[:12 tag: 34 typeInfo: [type: vec2] defaultValue: 1, 2.5]");
    EXPECT_EQ(written(Connection{1, 2, 3, 4}), "[connection:2->4]");
    std::ostringstream hex;
    hex << std::hex << Connection{1, 255, 3, 16} << p;
    EXPECT_EQ(hex.str(),
              "[connection:ff->10][:c tag: 22 typeInfo: [type: vec2] defaultValue: 1, 2.5]");
}

TEST(GraphText, OfPatches) {
    std::string const in = "[p11:11 tag: 0 typeInfo: [type: float] defaultValue: 0]";
    std::string const out = "[p12:12 tag: 0 typeInfo: [type: float] defaultValue: 0]";
    struct Row {
        char const* what;
        Patch patch;
        std::string text;
    };
    for (Row const& row : {
             Row{"nothing", patch(1), "[patch:1 name: n1 builtin: 0]"},
             Row{"one input", withPorts(patch(1), {port(11)}, {}),
                 "[patch:1 name: n1 builtin: 0  " + in + "\n"},
             Row{"one output", withPorts(patch(1), {}, {port(12)}),
                 "[patch:1 name: n1 builtin: 0  " + out + "\n"},
             Row{"both", withPorts(patch(1), {port(11)}, {port(12)}),
                 "[patch:1 name: n1 builtin: 0  " + in + "\n  " + out + "\n"},
             Row{"one child", patch(1, {patch(2)}),
                 "[patch:1 name: n1 builtin: 0][patch:2 name: n2 builtin: 0]\n"},
             Row{"child with a port", patch(1, {withPorts(patch(2), {port(11)}, {})}),
                 "[patch:1 name: n1 builtin: 0][patch:2 name: n2 builtin: 0  " + in + "\n\n"},
             Row{"connections after children",
                 patch(1, {patch(2, {}, {{0, 3, 0, 4}})}, {{0, 1, 0, 2}}),
                 "[patch:1 name: n1 builtin: 0][patch:2 name: n2 builtin: 0][connection:3->4]\n"
                 "\n[connection:1->2]\n"},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(written(row.patch), row.text);
    }
}

TEST(GraphText, FollowsTheStreamsFlagsAndItsNewline) {
    Patch source = withPorts(patch(255), {port(16)}, {});
    source.builtin = 17;
    std::ostringstream stream;
    stream.imbue(tests::barForNewline());
    stream << std::hex << source;
    EXPECT_EQ(stream.str(), "[patch:ff name: n255 builtin: 11  [p16:10 tag: 0 typeInfo: [type: "
                            "float] defaultValue: 0]|");
}

TEST(Queries, GiveWhatLivesAsLongAsTheLists) {
    Array<Patch> children;
    Patch const* child = nullptr;
    {
        Patch const root = patch(1, {patch(2)});
        children = root.children;
        child = findPatchRecursive(root, 2);
    }
    EXPECT_EQ(child, children->data());
    EXPECT_EQ(child->name, "n2");
}

TEST(GraphText, OfADocumentIsItsGoldenText) {
    std::ifstream file(TARN_TESTS_GOLDEN_DIR "/document.txt", std::ios::binary);
    ASSERT_TRUE(file);
    std::string const golden((std::istreambuf_iterator<char>(file)), {});
    EXPECT_EQ(written(document()), golden);
}

TEST(GraphText, FlushesEveryLine) {
    tests::FlushCounter buffer;
    std::ostream stream(&buffer);
    EXPECT_EQ(&(stream << document()), &stream);
    std::string const text = buffer.str();
    EXPECT_EQ(buffer.flushes, std::count(text.begin(), text.end(), '\n'));
    EXPECT_EQ(&(stream << port(1)), &stream);
    EXPECT_EQ(&(stream << Connection()), &stream);
}

TEST(Queries, AgreeWithAModelOnRandomTrees) {
    tests::Random random(33);
    for (int i = 0; i < 2000; ++i) {
        Patch const root = randomPatch(random, 4);
        EvalPatch const evaluated(root);
        for (unsigned long long id = 0; id < 13; ++id) {
            ASSERT_EQ(findPatchRecursive(root, id), modelFind(root, id)) << id;
            ASSERT_EQ(findPatchRecursive(evaluated, id), modelFind(evaluated, id)) << id;
            Optional<Set> const expected = modelOutgoing(root, id);
            Optional<Set> const actual = _findOutgoingConnectionsFromPort(root, id);
            ASSERT_EQ(actual.hasValue(), expected.hasValue()) << id;
            ASSERT_EQ(findOutgoingConnectionsFromPort(root, id), expected ? *expected : Set());
        }
    }
}

TEST(EvalPatch, AgreesWithItsPatchOnRandomTrees) {
    tests::Random random(32);
    for (int i = 0; i < 500; ++i) {
        Patch const root = randomPatch(random, 4);
        EvalPatch const evaluated(root);
        std::vector<Patch const*> const patches = searchOrder(root);
        std::vector<EvalPatch const*> const copies = searchOrder(evaluated);
        ASSERT_EQ(patches.size(), copies.size());
        for (std::size_t n = 0; n < patches.size(); ++n) {
            ASSERT_EQ(copies[n]->id, patches[n]->id);
            ASSERT_EQ(copies[n]->inputs->size(), patches[n]->inputs->size());
            ASSERT_EQ(copies[n]->outputs->size(), patches[n]->outputs->size());
        }
        ASSERT_EQ(evaluated, EvalPatch(Patch(root)));
    }
}

TEST(Patch, SurvivesFailingAllocations) {
    Patch const source = document();
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
                                        [&] { EXPECT_EQ(source, document()); }),
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
