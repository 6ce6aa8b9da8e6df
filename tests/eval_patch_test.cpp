#include <Engine/Base/patch.h>

#include <Engine/Base/path.h>

#include "support/graph_model.h"
#include "support/graphs.h"
#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

using namespace tarn::engine;
using namespace tests;

TEST(EvalPort, IsInitiallyEmpty) {
    EvalPort const port;
    EXPECT_EQ(port.id, 0u);
    EXPECT_EQ(port.tag, 0u);
    EXPECT_EQ(port.evaluatorState, 0u);
    EXPECT_FALSE(port.evaluatorFlag);
    EXPECT_EQ(port.typeInfo, TypeInfo());
    EXPECT_TRUE(port.values.empty());
    EXPECT_EQ(port.name, "");
}

TEST(EvalPort, ConvertsAPort) {
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

TEST(EvalPort, ComparesAllFields) {
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

TEST(EvalPatch, ConvertsAPatchAndItsSubtree) {
    Patch source = sampleDocument();
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

TEST(EvalPatch, RecordsWhetherPortCountsAreSet) {
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
    Patch const source = sampleDocument();
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

TEST(EvalPatch, TreatsOnlySharedListsAsEqual) {
    Port nan = port(1);
    nan.defaultValue = double(NAN);
    for (Patch const& source : {withPorts(patch(1), {nan}, {}), withPorts(patch(1), {}, {nan}),
                                patch(1, {withPorts(patch(2), {nan}, {})})}) {
        EvalPatch const evaluated(source);
        EXPECT_TRUE(evaluated == EvalPatch(evaluated));
        EXPECT_FALSE(evaluated == EvalPatch(source));
    }
}

TEST(EvalPatch, ComparesAllFields) {
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
        EvalPatch const base(sampleDocument());
        EvalPatch other(sampleDocument());
        EXPECT_TRUE(base == other);
        row.change(other);
        EXPECT_FALSE(base == other);
        EXPECT_TRUE(base != other);
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
