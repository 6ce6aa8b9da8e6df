#include <Engine/Base/patch.h>

#include <Engine/Base/path.h>

#include "support/graph_model.h"
#include "support/graphs.h"
#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <unordered_set>

using namespace tarn::engine;
using namespace tests;

namespace {

using Set = std::unordered_set<Connection>;

}  // namespace

TEST(FindPatchRecursive, SearchesALevelBeforeDescending) {
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

TEST(FindConnections, SearchesTheConnectionsOfThePatch) {
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

TEST(FindOutgoingConnectionsFromPort, StopsAtTheParentOfThePortsPatch) {
    Connection const wrongPatch{77, 10, 3, 30};  // Only the port matches.
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

TEST(PortForTag, IsTheFirstPortOfThePatch) {
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

TEST(Queries, ReturnPointersIntoTheLists) {
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
