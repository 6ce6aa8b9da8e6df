#include <Engine/Base/patch_edit.h>

#include "support/allocations.h"
#include "support/edits.h"
#include "support/print.h"
#include "support/random.h"
#include "support/stack.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <ctime>
#include <functional>
#include <new>
#include <utility>

using namespace tarn::engine;
using namespace tests;

namespace {

// 1 { 2 { 4 }, 3 }
Patch smallGraph() {
    return withPorts(patch(1,
                           {withPorts(patch(2, {withPorts(patch(4), {port(41)}, {port(42)})}),
                                      {port(21)}, {port(22), port(23)}),
                            withPorts(patch(3), {port(31), port(33)}, {port(32)})},
                           {{2, 22, 3, 31}, {3, 32, 2, 21}, {2, 23, 3, 31}}),
                     {port(11)}, {port(12)});
}

Patch const& child(Patch const& patch, std::size_t position) {
    return patch.children->at(position);
}

// Expects every unchanged list to be the same object.
void expectShared(Model const& model, Patch const& before, Patch const& after) {
    EXPECT_TRUE(before.inputs == after.inputs || model.hasOtherInputs) << after.id;
    EXPECT_TRUE(before.outputs == after.outputs || model.hasOtherOutputs) << after.id;
    EXPECT_TRUE(before.connections == after.connections || model.hasOtherConnections) << after.id;
}

std::function<bool(Model const&, Patch const&)> const isUntouched = [](Model const& model,
                                                                       Patch const& before) {
    bool same = !model.hasOtherInputs && !model.hasOtherOutputs && !model.hasOtherConnections &&
                !model.hasOtherChildren && model.fields == before;
    auto now = model.children.begin();
    for (Patch const& inner : *before.children) {
        same = same && now != model.children.end() && isUntouched(*now++, inner);
    }
    return same;
};

// A connection of the small graph.
constexpr Connection kBack{3, 32, 2, 21};
constexpr Connection kFurther{2, 22, 3, 33};

}  // namespace

TEST(PatchEdit, ChangesFieldsAndPorts) {
    Patch const before = smallGraph();
    PatchIndex const index(before);
    PatchEdit edit(index);
    ASSERT_NE(edit.patch(4), nullptr);
    edit.patch(4)->name = "renamed";
    edit.patch(4)->id = 99;
    ASSERT_NE(edit.inputPort(41), nullptr);
    edit.inputPort(41)->defaultValue = 5.0;
    edit.inputPort(41)->id = 98;
    EXPECT_EQ(edit.inputPort(41)->defaultValue, Value(5.0));
    EXPECT_EQ(edit.patch(4)->name, "renamed");
    EXPECT_EQ(edit.patch(9), nullptr);
    EXPECT_EQ(edit.patch(0), nullptr);
    EXPECT_EQ(edit.inputPort(42), nullptr);
    EXPECT_EQ(edit.outputPort(41), nullptr);
    Patch const after = edit.commit();

    EXPECT_EQ(index.root(), smallGraph());
    Patch expected = withPorts(patch(4), {port(41)}, {port(42)});
    expected.name = "renamed";
    Port changed = port(41);
    changed.defaultValue = 5.0;
    expected.inputs = arrayOf<Port>({changed});
    EXPECT_EQ(child(child(after, 0), 0), expected);
    // The lists on the path to the change are new, all others are the same objects.
    EXPECT_NE(after.children, before.children);
    EXPECT_NE(child(after, 0).children, child(before, 0).children);
    EXPECT_EQ(after.connections, before.connections);
    EXPECT_EQ(after.inputs, before.inputs);
    EXPECT_EQ(child(after, 0).outputs, child(before, 0).outputs);
    EXPECT_EQ(child(after, 1).children, child(before, 1).children);
    EXPECT_EQ(child(child(after, 0), 0).outputs, child(child(before, 0), 0).outputs);
}

TEST(PatchEdit, IsFinishedAfterCommit) {
    PatchIndex const index(smallGraph());
    PatchEdit edit(index);
    ASSERT_TRUE(edit.removePatch(4));
    Patch const root = edit.commit();
    EXPECT_EQ(edit.commit().children, root.children);
    EXPECT_EQ(edit.patch(2), nullptr);
    EXPECT_EQ(edit.inputPort(21), nullptr);
    EXPECT_EQ(edit.outputPort(22), nullptr);
    EXPECT_FALSE(edit.addInputPort(2, port(90)));
    EXPECT_FALSE(edit.addOutputPort(2, port(90)));
    EXPECT_FALSE(edit.removeInputPort(21));
    EXPECT_FALSE(edit.removeOutputPort(22));
    EXPECT_FALSE(edit.addPatch(1, patch(90)));
    EXPECT_FALSE(edit.removePatch(2));
    EXPECT_FALSE(edit.movePatch(3, 2));
    EXPECT_FALSE(edit.connect({2, 22, 3, 33}));
    EXPECT_FALSE(edit.disconnect({2, 22, 3, 31}));
    EXPECT_EQ(edit.freshPatchId(), 0u);
    EXPECT_EQ(edit.freshPortId(), 0u);
    PatchEdit moved(std::move(edit));
    EXPECT_EQ(moved.commit(), root);
}

TEST(PatchEdit, WithoutChangesKeepsTheLists) {
    Patch const before = smallGraph();
    PatchIndex const index(before);
    PatchEdit edit(index);
    edit.patch(4)->name = edit.patch(4)->name + "x";
    edit.patch(4)->name.pop_back();
    edit.inputPort(41)->id = 7;
    edit.inputPort(41)->id = 41;
    EXPECT_TRUE(edit.movePatch(3, 1, 0));
    EXPECT_TRUE(edit.movePatch(3, 1));
    EXPECT_TRUE(edit.disconnect({2, 22, 3, 31}));
    EXPECT_TRUE(edit.connect({2, 22, 3, 31}));
    EXPECT_TRUE(edit.addPatch(3, patch(90)));
    EXPECT_TRUE(edit.removePatch(90));
    EXPECT_TRUE(edit.addInputPort(3, port(91)));
    EXPECT_TRUE(edit.removeInputPort(91));
    Patch const after = edit.commit();
    EXPECT_EQ(after, before);
    EXPECT_EQ(after.children, before.children);
    EXPECT_EQ(after.connections, before.connections);
    EXPECT_EQ(after.inputs, before.inputs);
    EXPECT_EQ(after.outputs, before.outputs);
}

TEST(PatchEdit, RejectsInvalidCalls) {
    struct Row {
        char const* what;
        std::function<bool(PatchEdit&)> change;
    };
    for (Row const& row : {
             Row{"add to no patch", [](auto& e) { return e.addPatch(9, patch(90)); }},
             Row{"add a patch of no identifier", [](auto& e) { return e.addPatch(1, patch(0)); }},
             Row{"add a patch that is there", [](auto& e) { return e.addPatch(1, patch(4)); }},
             Row{"add a root that is there", [](auto& e) { return e.addPatch(2, patch(1)); }},
             Row{"add one inside that is there",
                 [](auto& e) { return e.addPatch(1, patch(90, {patch(4)})); }},
             Row{"add a patch twice",
                 [](auto& e) {
                     return e.addPatch(1, patch(90, {patch(91), patch(91)}));
                 }},
             Row{"add a port inside that is there",
                 [](auto& e) { return e.addPatch(1, withPorts(patch(90), {port(42)}, {})); }},
             Row{"add a port inside twice",
                 [](auto& e) {
                     return e.addPatch(1, withPorts(patch(90), {port(90)}, {port(90)}));
                 }},
             Row{"add a port inside of no identifier",
                 [](auto& e) { return e.addPatch(1, withPorts(patch(90), {}, {port(0)})); }},
             Row{"remove no patch", [](auto& e) { return e.removePatch(9); }},
             Row{"remove the root", [](auto& e) { return e.removePatch(1); }},
             Row{"move no patch", [](auto& e) { return e.movePatch(9, 1); }},
             Row{"move to no patch", [](auto& e) { return e.movePatch(2, 9); }},
             Row{"move the root", [](auto& e) { return e.movePatch(1, 2); }},
             Row{"move into itself", [](auto& e) { return e.movePatch(2, 2); }},
             Row{"move inside itself", [](auto& e) { return e.movePatch(2, 4); }},
             Row{"add a port to no patch", [](auto& e) { return e.addInputPort(9, port(90)); }},
             Row{"add a port of no identifier", [](auto& e) { return e.addInputPort(2, port(0)); }},
             Row{"add a port that is there", [](auto& e) { return e.addInputPort(2, port(32)); }},
             Row{"add an output that is there",
                 [](auto& e) { return e.addOutputPort(2, port(31)); }},
             Row{"remove no port", [](auto& e) { return e.removeInputPort(99); }},
             Row{"remove an output as an input", [](auto& e) { return e.removeInputPort(22); }},
             Row{"remove an input as an output", [](auto& e) { return e.removeOutputPort(21); }},
             Row{"connect from no patch",
                 [](auto& e) {
                     return e.connect({9, 22, 3, 33});
                 }},
             Row{"connect to no patch",
                 [](auto& e) {
                     return e.connect({2, 22, 9, 33});
                 }},
             Row{"connect from no port",
                 [](auto& e) {
                     return e.connect({2, 99, 3, 33});
                 }},
             Row{"connect to no port",
                 [](auto& e) {
                     return e.connect({2, 22, 3, 99});
                 }},
             Row{"connect from an input",
                 [](auto& e) {
                     return e.connect({2, 21, 3, 33});
                 }},
             Row{"connect to an output",
                 [](auto& e) {
                     return e.connect({2, 22, 3, 32});
                 }},
             Row{"connect to another's port",
                 [](auto& e) {
                     return e.connect({2, 22, 3, 21});
                 }},
             Row{"connect into a group",
                 [](auto& e) {
                     return e.connect({2, 22, 4, 41});
                 }},
             Row{"connect the root",
                 [](auto& e) {
                     return e.connect({1, 12, 2, 21});
                 }},
             Row{"connect what is connected",
                 [](auto& e) {
                     return e.connect({2, 22, 3, 31});
                 }},
             Row{"disconnect what is not",
                 [](auto& e) {
                     return e.disconnect({2, 22, 3, 33});
                 }},
             Row{"disconnect nothing",
                 [](auto& e) {
                     return e.disconnect({9, 9, 9, 9});
                 }},
         }) {
        SCOPED_TRACE(row.what);
        PatchIndex const index(smallGraph());
        PatchEdit edit(index);
        EXPECT_FALSE(row.change(edit));
        EXPECT_EQ(edit.commit().children, index.root().children);
    }
}

TEST(PatchEdit, RemovesConnectionsWithTheirEnds) {
    PatchIndex const index(smallGraph());
    struct Row {
        char const* what;
        std::function<bool(PatchEdit&)> change;
        std::vector<Connection> left;
    };
    for (Row const& row : {
             Row{"patch", [](auto& e) { return e.removePatch(3); }, {}},
             Row{"patch that leaves", [](auto& e) { return e.movePatch(3, 2); }, {}},
             Row{"patch that stays",
                 [](auto& e) { return e.movePatch(3, 1, 0); },
                 {{2, 22, 3, 31}, {3, 32, 2, 21}, {2, 23, 3, 31}}},
             Row{"input", [](auto& e) { return e.removeInputPort(31); }, {{3, 32, 2, 21}}},
             Row{"output",
                 [](auto& e) { return e.removeOutputPort(22); },
                 {{3, 32, 2, 21}, {2, 23, 3, 31}}},
             Row{"one",
                 [](auto& e) { return e.disconnect(kBack); },
                 {{2, 22, 3, 31}, {2, 23, 3, 31}}},
             Row{"another input",
                 [](auto& e) { return e.connect(kFurther); },
                 {{2, 22, 3, 31}, {3, 32, 2, 21}, {2, 23, 3, 31}, {2, 22, 3, 33}}},
         }) {
        SCOPED_TRACE(row.what);
        PatchEdit edit(index);
        EXPECT_TRUE(row.change(edit));
        EXPECT_EQ(*edit.commit().connections, row.left);
    }
}

TEST(PatchEdit, AddsAndMovesToPositions) {
    PatchIndex const index(smallGraph());
    PatchEdit edit(index);
    EXPECT_TRUE(edit.addPatch(1, withPorts(patch(90, {patch(91)}), {port(92)}, {}), 1));
    EXPECT_TRUE(edit.movePatch(4, 91));
    EXPECT_TRUE(edit.movePatch(3, 1, 0));
    EXPECT_TRUE(edit.addInputPort(90, port(93), 0));
    EXPECT_TRUE(edit.connect({2, 22, 90, 93}));
    EXPECT_TRUE(edit.addOutputPort(91, port(94)));
    edit.patch(91)->name = "inside";
    Patch inside =
        withPorts(patch(91, {withPorts(patch(4), {port(41)}, {port(42)})}), {}, {port(94)});
    inside.name = "inside";
    Patch const expected =
        withPorts(patch(1,
                        {withPorts(patch(3), {port(31), port(33)}, {port(32)}),
                         withPorts(patch(2), {port(21)}, {port(22), port(23)}),
                         withPorts(patch(90, {inside}), {port(93), port(92)}, {})},
                        {{2, 22, 3, 31}, {3, 32, 2, 21}, {2, 23, 3, 31}, {2, 22, 90, 93}}),
                  {port(11)}, {port(12)});
    EXPECT_EQ(edit.commit(), expected);
}

TEST(PatchEdit, AcceptsAnAssignedList) {
    PatchIndex const index(smallGraph());
    PatchEdit edit(index);
    edit.patch(3)->inputs = arrayOf<Port>({port(77)});
    edit.patch(1)->connections = arrayOf<Connection>({{3, 32, 3, 77}});
    edit.patch(2)->children = arrayOf<Patch>({patch(78)});
    edit.patch(4)->name = "dropped";
    Patch const after = edit.commit();
    EXPECT_EQ(child(after, 1).inputs->at(0), port(77));
    EXPECT_EQ(*after.connections, (std::vector<Connection>{{3, 32, 3, 77}}));
    EXPECT_EQ(child(after, 0).children->at(0), patch(78));
}

TEST(PatchEdit, IgnoresReplacingAnEmptyListByAnEmptyOne) {
    PatchIndex const index(smallGraph());
    PatchEdit edit(index);
    EXPECT_TRUE(edit.addPatch(4, patch(79)));
    EXPECT_TRUE(edit.addPatch(2, patch(80)));
    edit.patch(4)->children = arrayOf<Patch>({});
    edit.patch(2)->children = arrayOf<Patch>({});
    Patch const after = edit.commit();
    EXPECT_TRUE(child(after, 0).children->empty());
    Patch const four = [&] {
        PatchEdit again(index);
        EXPECT_TRUE(again.addPatch(4, patch(79)));
        again.patch(4)->children = arrayOf<Patch>({});
        return child(child(again.commit(), 0), 0);
    }();
    EXPECT_EQ(*four.children, std::vector<Patch>{patch(79)});
}

TEST(PatchEdit, ReturnsUnusedIdentifiers) {
    PatchIndex const index(smallGraph());
    PatchEdit edit(index);
    EXPECT_EQ(edit.freshPatchId(), 5u);
    EXPECT_EQ(edit.freshPatchId(), 6u);
    EXPECT_EQ(edit.freshPortId(), 43u);
    EXPECT_TRUE(edit.addPatch(1, withPorts(patch(90), {port(100)}, {})));
    EXPECT_TRUE(edit.removePatch(90));
    EXPECT_EQ(edit.freshPatchId(), 91u);
    EXPECT_EQ(edit.freshPortId(), 101u);

    PatchIndex const full(
        patch(2, {withPorts(patch(ULLONG_MAX), {port(ULLONG_MAX)}, {port(1)}), patch(1)}));
    PatchEdit other(full);
    EXPECT_EQ(other.freshPatchId(), 3u);
    EXPECT_EQ(other.freshPatchId(), 4u);
    EXPECT_EQ(other.freshPortId(), 2u);
}

TEST(PatchEdit, NeverReturnsAnIdentifierTwice) {
    PatchIndex const index(patch(1, {patch(2)}));
    PatchEdit edit(index);
    EXPECT_EQ(edit.freshPatchId(), 3u);
    EXPECT_EQ(edit.freshPortId(), 1u);
    EXPECT_TRUE(edit.addPatch(1, withPorts(patch(ULLONG_MAX), {port(ULLONG_MAX)}, {})));
    EXPECT_EQ(edit.freshPatchId(), 4u);
    EXPECT_EQ(edit.freshPortId(), 2u);
}

TEST(PatchEdit, DistinguishesSignedZeros) {
    PatchIndex const index(smallGraph());
    {
        PatchEdit edit(index);
        edit.inputPort(41)->defaultValue = -0.0;
        PatchIndex const changed(edit.commit());
        EXPECT_TRUE(std::signbit(double(changed.findInputPort(41)->defaultValue)));
    }
    PatchEdit edit(index);
    edit.patch(4)->attributes["a"] = 0.0;
    PatchIndex const zero(edit.commit());
    PatchEdit other(zero);
    other.patch(4)->attributes["a"] = -0.0;
    PatchIndex const changed(other.commit());
    EXPECT_TRUE(std::signbit(changed.findPatch(4)->attributes.at("a").asFloat()));
}

TEST(PatchEdit, KeepsReturnedPointersValid) {
    PatchIndex const index(smallGraph());
    PatchEdit edit(index);
    Patch* const patch = edit.patch(4);
    Port* const input = edit.inputPort(21);
    EXPECT_TRUE(edit.removeInputPort(21));
    EXPECT_TRUE(edit.removePatch(2));
    input->tag = 3;
    patch->name = "gone";
    EXPECT_EQ(edit.commit().children->size(), 1u);
}

TEST(PatchEdit, CopiesNoListForUndoneChanges) {
    Patch const before = smallGraph();
    PatchIndex const index(before);
    PatchEdit edit(index);
    EXPECT_TRUE(edit.addPatch(3, patch(90)));
    edit.patch(90)->name = "x";
    EXPECT_TRUE(edit.removePatch(90));
    EXPECT_EQ(edit.commit().children, before.children);
}

// Adding to one list, and editing documents with repeated identifiers, takes time proportional to
// the changes.
TEST(PatchEdit, TakesTimeProportionalToTheChanges) {
    std::vector<Patch> groups;
    for (unsigned long long id = 2; id < 20002; ++id) groups.push_back(patch(id, {patch(1)}));
    PatchIndex const index(patch(1, std::move(groups)));
    std::clock_t const start = std::clock();
    PatchEdit edit(index);
    for (unsigned long long id = 100000; id < 120000; ++id) {
        ASSERT_TRUE(edit.addPatch(id - 99998, patch(id)));
        ASSERT_TRUE(edit.addInputPort(2, port(id)));
    }
    edit.commit();
    // Quadratic algorithms take minutes; sanitizers make this one second.
    EXPECT_LT(static_cast<double>(std::clock() - start) / CLOCKS_PER_SEC, 10.0);
}

TEST(PatchEdit, HandlesRepeatedIdentifiers) {
    Patch const twice = patch(5, {patch(7)});
    PatchIndex const index(patch(5, {patch(6, {twice}), twice, patch(0, {patch(8)})}));
    PatchEdit edit(index);
    edit.patch(7)->name = "first";
    edit.patch(8)->name = "inside of none";
    EXPECT_TRUE(edit.addPatch(6, patch(9), 0));
    Patch const after = edit.commit();
    EXPECT_EQ(child(child(child(after, 0), 1), 0).name, "first");
    EXPECT_EQ(child(child(after, 0), 0).id, 9u);
    EXPECT_EQ(child(child(after, 1), 0), patch(7));
    EXPECT_EQ(child(child(after, 2), 0).name, "inside of none");
}

TEST(PatchEdit, AgreesWithAModelOnRandomEdits) {
    Random random(11);
    for (int i = 0; i < 400; ++i) {
        AnyDocument any(random);
        PatchIndex const index(any.patch(3));
        Patch const before = Model(index.root()).toPatch();
        Model model(index.root());
        model.forEach([](Model& m, Model*) { m.isOriginal = true; });
        PatchEdit edit(index);
        for (std::size_t n = random.below(25); n > 0; --n) {
            ASSERT_TRUE(editOnce(any, edit, model)) << i;
        }
        Patch const after = edit.commit();
        ASSERT_EQ(after, model.toPatch()) << i;
        ASSERT_EQ(index.root(), before);
        PatchIndex const changed(after);
        model.forEach([&](Model& m, Model*) {
            if (!m.isOriginal) return;
            Patch const* const was = index.findPatch(m.fields.id);
            Patch const* const is = changed.findPatch(m.fields.id);
            expectShared(m, *was, *is);
            EXPECT_TRUE(was->children == is->children || !isUntouched(m, *was));
        });
        if (HasFailure()) return;
    }
}

TEST(PatchEdit, SurvivesFailingAllocations) {
    Patch const start = smallGraph();
    PatchIndex const index(start);
    struct Row {
        char const* what;
        std::function<bool(PatchEdit&)> change;
    };
    for (Row const& row : {
             Row{"patch", [](auto& e) { return e.patch(4) != nullptr; }},
             Row{"port", [](auto& e) { return e.inputPort(41) != nullptr; }},
             Row{"add a port", [](auto& e) { return e.addInputPort(4, port(90), 0); }},
             Row{"remove a port", [](auto& e) { return e.removeInputPort(31); }},
             Row{"add a patch",
                 [](auto& e) {
                     return e.addPatch(3, withPorts(patch(90, {patch(91)}), {port(92)}, {}));
                 }},
             Row{"remove a patch", [](auto& e) { return e.removePatch(2); }},
             Row{"move a patch", [](auto& e) { return e.movePatch(2, 3); }},
             Row{"connect",
                 [](auto& e) {
                     return e.connect({2, 22, 3, 33});
                 }},
             Row{"disconnect",
                 [](auto& e) {
                     return e.disconnect({2, 22, 3, 31});
                 }},
         }) {
        SCOPED_TRACE(row.what);
        Patch expected;
        {
            PatchEdit edit(index);
            ASSERT_TRUE(row.change(edit));
            expected = edit.commit();
        }
        PatchEdit edit(index);
        EXPECT_GT(failEachAllocation([&] { ASSERT_TRUE(row.change(edit)); },
                                     [&] {
                                         PatchEdit const other(index);
                                         EXPECT_EQ(index.root(), start);
                                     }),
                  0u);
        Patch root;
        EXPECT_GT(failEachAllocation([&] { root = edit.commit(); },
                                     [&] { EXPECT_EQ(index.root(), start); }),
                  0u);
        EXPECT_EQ(root, expected);
    }
    // Failed calls have no effect.
    for (std::size_t succeeding = 0; succeeding < 60; ++succeeding) {
        PatchEdit edit(index);
        try {
            FailingAllocation const failing(succeeding);
            edit.addPatch(3, withPorts(patch(90, {patch(91)}), {port(92)}, {}));
            edit.removePatch(2);
            edit.movePatch(4, 3);
            continue;
        } catch (std::bad_alloc const&) {
        }
        Patch const after = edit.commit();
        bool const hasAdded = child(after, after.children->size() - 1).children->size() == 1;
        bool const hasRemoved = after.children->size() == 1;
        EXPECT_EQ(hasAdded, PatchIndex(after).findPatch(91) != nullptr);
        EXPECT_EQ(after.connections->empty(), hasRemoved);
    }
}

TEST(PatchEdit, CopiesAListOnce) {
    std::vector<Patch> children;
    for (unsigned long long id = 2; id < 1002; ++id) {
        children.push_back(withPorts(patch(id), {port(id)}, {}));
    }
    PatchIndex const index(patch(1, std::move(children)));
    auto const blocksFor = [&](unsigned long long count) {
        AllocationCounter counter;
        Patch root;
        {
            PatchEdit edit(index);
            for (unsigned long long id = 2; id < 2 + count; ++id) edit.patch(id)->builtin = 5;
            root = edit.commit();
        }
        return counter.held();
    };
    // One allocation for the list and one for its elements, however many of them are changed.
    EXPECT_EQ(blocksFor(1), blocksFor(500));
    EXPECT_LE(blocksFor(500), 2u);
}

TEST(PatchEdit, NeedsNoDeepStack) {
    onStackOf(kStack, [] {
        Patch root = withPorts(patch(kDeepest), {port(1)}, {port(2)});
        for (unsigned long long id = kDeepest - 1; id > 0; --id) {
            root = patch(id, {std::move(root)});
        }
        PatchIndex const index(root);
        PatchEdit edit(index);
        edit.inputPort(1)->defaultValue = 3.0;
        EXPECT_TRUE(edit.addPatch(kDeepest, root = patch(kDeepest + 1)));
        PatchIndex const changed(edit.commit());
        EXPECT_EQ(changed.findInputPort(1)->defaultValue, Value(3.0));
        EXPECT_EQ(changed.parentOf(kDeepest + 1)->id, kDeepest);
    });
}
