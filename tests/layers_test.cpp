#include <Engine/Base/layers.h>

#include "support/stack.h"
#include "support/streams.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <iomanip>
#include <limits>
#include <sstream>

using namespace tarn::engine;
using tests::written;

namespace {

RenderLayerHierarchy hierarchy(unsigned long long id,
                               std::vector<RenderLayerHierarchy> leading = {},
                               std::vector<RenderLayerHierarchy> children = {}) {
    return {{0, id}, std::move(leading), std::move(children)};
}

}  // namespace

TEST(ModelLayer, ComparesDeeplyAndInOrder) {
    ModelLayer const base{1, {{2, {}, {}}, {3, {}, {}}}, {{4, {}, {}}, {6, {}, {}}}};
    struct Row {
        char const* what;
        void (*change)(ModelLayer&);
        bool equal;
    };
    for (Row const& row : {
             Row{"nothing", [](ModelLayer&) {}, true},
             Row{"id", [](ModelLayer& layer) { layer.id = 9; }, false},
             Row{"order of children",
                 [](ModelLayer& layer) { std::swap(layer.children[0], layer.children[1]); }, false},
             Row{"fewer children", [](ModelLayer& layer) { layer.children.pop_back(); }, false},
             Row{"grandchild", [](ModelLayer& layer) { layer.children[0].children.resize(1); },
                 false},
             Row{"additional layer", [](ModelLayer& layer) { layer.additionalLayers[0].id = 5; },
                 false},
             Row{"order of additional layers",
                 [](ModelLayer& layer) {
                     std::swap(layer.additionalLayers[0], layer.additionalLayers[1]);
                 },
                 false},
             Row{"fewer additional layers",
                 [](ModelLayer& layer) { layer.additionalLayers.pop_back(); }, false},
             Row{"additional layer's child",
                 [](ModelLayer& layer) {
                     layer.additionalLayers[1].children.push_back({5, {}, {}});
                 },
                 false},
         }) {
        SCOPED_TRACE(row.what);
        ModelLayer other = base;
        row.change(other);
        EXPECT_EQ(base == other, row.equal);
        EXPECT_EQ(other == base, row.equal);
        EXPECT_EQ(base != other, !row.equal);
    }
    EXPECT_EQ(base, (ModelLayer{1, {{2, {}, {}}, {3, {}, {}}}, {{4, {}, {}}, {6, {}, {}}}}));
}

TEST(ModelLayer, CopiesAreIndependent) {
    ModelLayer const original{1, {{2, {{3, {}, {}}}, {}}}, {{4, {}, {}}}};
    ModelLayer copy = original;
    copy.children[0].children[0].id = 9;
    copy.additionalLayers[0].children.push_back({5, {}, {}});
    EXPECT_EQ(original, (ModelLayer{1, {{2, {{3, {}, {}}}, {}}}, {{4, {}, {}}}}));
    EXPECT_EQ(copy, (ModelLayer{1, {{2, {{9, {}, {}}}, {}}}, {{4, {{5, {}, {}}}, {}}}}));
}

TEST(ModelLayer, PrintsItsTreeWithoutAdditionalLayers) {
    EXPECT_EQ(written(ModelLayer{7, {}, {}}), "7\n");
    ModelLayer const tree{1, {{2, {{3, {}, {}}}, {{8, {}, {}}}}, {4, {}, {}}}, {{9, {}, {}}}};
    EXPECT_EQ(written(tree), "1\n-2\n--3\n-4\n");
}

TEST(RenderLayer, PrintsOnlyItsId) {
    EXPECT_EQ(written(RenderLayer{3, 12}), "12");
    EXPECT_EQ(RenderLayer(), (RenderLayer{0, 0}));
    EXPECT_NE((RenderLayer{0, 1}), (RenderLayer{0, 2}));
    EXPECT_NE((RenderLayer{1, 1}), (RenderLayer{2, 1}));
}

TEST(RenderLayerHierarchy, PrintsLeadingLayersMarkedAndChildrenDeeper) {
    struct Row {
        char const* what;
        RenderLayerHierarchy tree;
        char const* text;
    };
    for (Row const& row : {
             Row{"alone", hierarchy(1), "-1\n"},
             Row{"one of each", hierarchy(1, {hierarchy(2)}, {hierarchy(3)}), "-v2\n-1\n--3\n"},
             Row{"leading with a child", hierarchy(1, {hierarchy(2, {}, {hierarchy(3)})}),
                 "-v2\n--v3\n-1\n"},
             Row{"child with a leading",
                 hierarchy(1, {}, {hierarchy(2, {hierarchy(3, {}, {hierarchy(4)})})}),
                 "-1\n--v3\n---v4\n--2\n"},
             Row{"leading of a leading", hierarchy(1, {hierarchy(2, {hierarchy(3)})}),
                 "-v3\n-v2\n-1\n"},
             Row{"several, deep",
                 hierarchy(1, {hierarchy(2), hierarchy(3)},
                           {hierarchy(4, {}, {hierarchy(5)}), hierarchy(6)}),
                 "-v2\n-v3\n-1\n--4\n---5\n--6\n"},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(written(row.tree), row.text);
    }
}

TEST(RenderLayerHierarchy, HelperTakesAPrefixAndAMark) {
    std::ostringstream stream;
    _helper(stream, hierarchy(1, {hierarchy(2)}, {hierarchy(3)}), "--", true);
    EXPECT_EQ(stream.str(), "---v2\n---v1\n----v3\n");
}

TEST(RenderLayerHierarchy, ComparesDeeplyAndInOrder) {
    auto const base = [] { return hierarchy(1, {hierarchy(2)}, {hierarchy(3)}); };
    EXPECT_EQ(base(), base());
    EXPECT_NE(base(), hierarchy(9, {hierarchy(2)}, {hierarchy(3)}));
    EXPECT_NE(base(), hierarchy(1, {hierarchy(9)}, {hierarchy(3)}));
    EXPECT_NE(base(), hierarchy(1, {hierarchy(2)}, {hierarchy(9)}));
    EXPECT_NE(base(), hierarchy(1, {hierarchy(2)}));
}

TEST(LayerOutput, FollowsStreamFlagsAndFlushesEachLine) {
    tests::FlushCounter buffer;
    std::ostream stream(&buffer);
    stream << std::hex << ModelLayer{255, {{16, {}, {}}}, {}};
    EXPECT_EQ(buffer.str(), "ff\n-10\n");
    EXPECT_EQ(buffer.flushes, 2);
    stream << hierarchy(255, {hierarchy(1)}, {hierarchy(2)});
    EXPECT_EQ(buffer.str(), "ff\n-10\n-v1\n-ff\n--2\n");
    EXPECT_EQ(buffer.flushes, 5);
    EXPECT_EQ(&(stream << RenderLayer{0, 1}), &stream);
}

TEST(LayerOutput, UsesTheStreamsNewline) {
    std::ostringstream stream;
    stream.imbue(tests::barForNewline());
    EXPECT_EQ(&(stream << ModelLayer{1, {{2, {}, {}}}, {}}), &stream);
    EXPECT_EQ(&(stream << hierarchy(3)), &stream);
    EXPECT_EQ(stream.str(), "1|-2|-3|");
}

TEST(StrokeSettings, IsVisibleAboveItsThresholds) {
    double const epsilon = std::numeric_limits<double>::epsilon();
    struct Row {
        char const* what;
        double width, opacity, start, end;
        bool forced, visible;
    };
    for (Row const& row : {
             Row{"whole", 1, 1, 0, 1, false, true},
             Row{"no length", 1, 1, 0, 0, false, false},
             Row{"no length, forced", 1, 1, 0, 0, true, true},
             Row{"no length, further on", 1, 1, 0.5, 0.5, false, false},
             Row{"around the start", 1, 1, -0.5, 0.5, false, true},
             Row{"opacity at the threshold", 1, 0.0001, 0, 1, true, false},
             Row{"opacity above it", 1, std::nextafter(0.0001, 1.0), 0, 1, false, true},
             Row{"no opacity", 1, 0, 0, 1, true, false},
             Row{"negative opacity", 1, -1, 0, 1, true, false},
             Row{"width at the threshold", 0.01, 1, 0, 1, true, false},
             Row{"width above it", std::nextafter(0.01, 1.0), 1, 0, 1, false, true},
             Row{"negative width", -5, 1, 0, 1, true, false},
             Row{"NaN opacity", 1, NAN, 0, 1, false, true},
             Row{"NaN width", NAN, 1, 0, 1, false, true},
             Row{"NaN start", 1, 1, NAN, 1, false, true},
             Row{"NaN end", 1, 1, 0, NAN, false, true},
             Row{"both infinite", 1, 1, INFINITY, INFINITY, false, true},
             Row{"length epsilon", 1, 1, 0, epsilon, false, true},
             Row{"length below epsilon", 1, 1, 0, std::nextafter(epsilon, 0.0), false, false},
             Row{"reversed", 1, 1, 1, 0, false, true},
             Row{"reversed below epsilon", 1, 1, epsilon / 2, 0, false, false},
         }) {
        SCOPED_TRACE(row.what);
        StrokeSettings const settings{3,           4,         5,       row.width,
                                      row.opacity, row.start, row.end, row.forced};
        EXPECT_EQ(settings.isVisible(), row.visible);
    }
    EXPECT_FALSE(StrokeSettings().isVisible());
}

TEST(Layers, AreInitiallyZeroAndEmpty) {
    StrokeSettings const stroke;
    EXPECT_EQ(stroke.cap, 0);
    EXPECT_EQ(stroke.join, 0);
    EXPECT_EQ(stroke.miterLimit, 0.0);
    EXPECT_EQ(stroke.width, 0.0);
    EXPECT_EQ(stroke.opacity, 0.0);
    EXPECT_EQ(stroke.start, 0.0);
    EXPECT_EQ(stroke.end, 0.0);
    EXPECT_FALSE(stroke.forceVisible);
    EXPECT_EQ(RenderLayer().rendererState, 0u);
    EXPECT_EQ(RenderLayer().id, 0u);
    EXPECT_EQ(ModelLayer().id, 0u);
}

TEST(StrokeSettings, ComparesAllFields) {
    StrokeSettings const base{1, 2, 3, 4, 5, 6, 7, true};
    EXPECT_EQ(base, (StrokeSettings{1, 2, 3, 4, 5, 6, 7, true}));
    for (StrokeSettings const& other :
         {StrokeSettings{9, 2, 3, 4, 5, 6, 7, true}, StrokeSettings{1, 9, 3, 4, 5, 6, 7, true},
          StrokeSettings{1, 2, 9, 4, 5, 6, 7, true}, StrokeSettings{1, 2, 3, 9, 5, 6, 7, true},
          StrokeSettings{1, 2, 3, 4, 9, 6, 7, true}, StrokeSettings{1, 2, 3, 4, 5, 9, 7, true},
          StrokeSettings{1, 2, 3, 4, 5, 6, 9, true}, StrokeSettings{1, 2, 3, 4, 5, 6, 7, false}}) {
        EXPECT_NE(base, other);
        EXPECT_FALSE(base == other);
    }
}

// The innermost layer of `kDeepest` nested ones; each is the only element of the outer one's
// `list`.
template <class Layer>
Layer nested(std::vector<Layer> Layer::*list, Layer innermost) {
    for (std::size_t i = 1; i < tests::kDeepest; ++i) {
        Layer outer;
        (outer.*list).push_back(std::move(innermost));
        innermost = std::move(outer);
    }
    return innermost;
}

TEST(ModelLayer, NestsTenThousandLevelsDeep) {
    struct Row {
        char const* list;
        std::vector<ModelLayer> ModelLayer::*layers;
        std::size_t lines;
    };
    for (Row const& row : {Row{"children", &ModelLayer::children, tests::kDeepest},
                           Row{"additional layers", &ModelLayer::additionalLayers, 1}}) {
        SCOPED_TRACE(row.list);
        tests::onStackOf(tests::kStack, [&row] {
            ModelLayer const layer = nested(row.layers, ModelLayer{7, {}, {}});
            ModelLayer copy = layer;
            EXPECT_TRUE(copy == layer);
            EXPECT_TRUE(layer != nested(row.layers, ModelLayer{8, {}, {}}));
            std::string const text = written(layer);
            EXPECT_EQ(std::count(text.begin(), text.end(), '\n'),
                      static_cast<std::ptrdiff_t>(row.lines));
            copy = ModelLayer();
        });
    }
}

TEST(RenderLayerHierarchy, NestsTenThousandLevelsDeep) {
    for (auto const list :
         {&RenderLayerHierarchy::children, &RenderLayerHierarchy::leadingLayers}) {
        tests::onStackOf(tests::kStack, [list] {
            RenderLayerHierarchy const layers = nested(list, hierarchy(7));
            RenderLayerHierarchy copy = layers;
            EXPECT_TRUE(copy == layers);
            EXPECT_TRUE(layers != nested(list, hierarchy(8)));
            std::string const text = written(layers);
            EXPECT_EQ(std::count(text.begin(), text.end(), '\n'),
                      static_cast<std::ptrdiff_t>(tests::kDeepest));
            copy = RenderLayerHierarchy();
        });
    }
}
