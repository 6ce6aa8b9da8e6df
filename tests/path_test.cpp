#include <Engine/Base/path.h>

#include "support/allocations.h"
#include "support/curves.h"
#include "support/death.h"
#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <sstream>

using namespace tarn::engine;

namespace {

constexpr double K = 0.552284749;

void expectElements(std::vector<PathElement> const& actual,
                    std::vector<PathElement> const& expected) {
    ASSERT_EQ(actual.size(), expected.size());
    for (std::size_t i = 0; i < actual.size(); ++i) {
        SCOPED_TRACE(i);
        EXPECT_EQ(actual[i].instruction, expected[i].instruction);
        ASSERT_EQ(actual[i].points.size(), expected[i].points.size());
        for (std::size_t j = 0; j < actual[i].points.size(); ++j) {
            SCOPED_TRACE(j);
            EXPECT_EQ(tests::bits(actual[i].points[j].x), tests::bits(expected[i].points[j].x));
            EXPECT_EQ(tests::bits(actual[i].points[j].y), tests::bits(expected[i].points[j].y));
        }
    }
}

PathElement move(FloatVec2 p) { return {PathInstruction::moveTo, {p}}; }
PathElement line(FloatVec2 p) { return {PathInstruction::lineTo, {p}}; }
PathElement curve(FloatVec2 a, FloatVec2 b, FloatVec2 p) {
    return {PathInstruction::curveTo, {a, b, p}};
}
PathElement closed() { return {PathInstruction::close, {}}; }

// Arguments of shapes where the values do not matter.
constexpr FloatVec2 kOrigin{0, 0};
constexpr FloatVec2 kAside{1, 2};
constexpr FloatVec2 kRadii{2, 1};
constexpr FloatVec2 kSize{30, 40};

}  // namespace

TEST(PathInstruction, HasItsNumberAndName) {
    struct Row {
        int number;
        PathInstruction instruction;
        char const* name;
    };
    for (Row const& row : {
             Row{0, PathInstruction::moveTo, "moveTo"},
             Row{1, PathInstruction::lineTo, "lineTo"},
             Row{2, PathInstruction::curveTo, "curveTo"},
             Row{3, PathInstruction::quadCurveTo, "quadCurveTo"},
             Row{4, PathInstruction::close, "close"},
         }) {
        SCOPED_TRACE(row.name);
        EXPECT_EQ(static_cast<int>(row.instruction), row.number);
        EXPECT_EQ(pathInstructionToString(row.instruction), row.name);
        EXPECT_EQ(stringToPathInstruction(row.name), row.instruction);
    }
    static_assert(std::is_same_v<std::underlying_type_t<PathInstruction>, unsigned char>);
}

TEST(PathInstruction, IsPrintedByName) {
    std::ostringstream stream;
    for (unsigned char i = 0; i < 6; ++i) stream << PathInstruction(i) << " ";
    stream << PathInstruction(255);
    EXPECT_EQ(stream.str(),
              "moveTo lineTo curveTo quadCurveTo close PathInstruction(5) PathInstruction(255)");
}

TEST(PathInstruction, IsParsedFromAnyString) {
    for (unsigned char i = 0; i < 5; ++i) {
        EXPECT_EQ(parsePathInstruction(pathInstructionToString(PathInstruction(i))),
                  PathInstruction(i));
    }
    for (char const* name : {"Close", "close ", " close", "", "moveto", "curve"}) {
        EXPECT_FALSE(parsePathInstruction(name).hasValue()) << name;
    }
}

TEST(PathInstructionDeathTest, RejectsOtherNames) {
    for (char const* name : {"Close", "close ", " close", "", "moveto", "curve"}) {
        SCOPED_TRACE(name);
        EXPECT_ENDS(stringToPathInstruction(name),
                    tests::failedAssertion("0", "stringToPathInstruction", "Engine/Base/path"));
    }
    EXPECT_ENDS(pathInstructionToString(PathInstruction(5)),
                tests::failedAssertion("0", "pathInstructionToString", "Engine/Base/path"));
}

TEST(PathElement, ComparesInstructionAndPoints) {
    struct Row {
        char const* what;
        PathElement a;
        PathElement b;
        bool equal;
    };
    for (Row const& row : {
             Row{"closes", closed(), closed(), true},
             Row{"moves", move({1, 2}), move({1, 2}), true},
             Row{"move and line", move({1, 2}), line({1, 2}), false},
             Row{"other x", move({1, 2}), move({3, 2}), false},
             Row{"other y", move({1, 2}), move({1, 3}), false},
             Row{"one point and two",
                 {PathInstruction::lineTo, {{1, 2}}},
                 {PathInstruction::lineTo, {{1, 2}, {1, 2}}},
                 false},
             Row{"zeros", move({0.0, -0.0}), move({-0.0, 0.0}), true},
             Row{"NaN x", move({NAN, 0}), move({NAN, 0}), false},
             Row{"NaN y", move({0, NAN}), move({0, NAN}), false},
             Row{"curves", curve({1, 2}, {3, 4}, {5, 6}), curve({1, 2}, {3, 4}, {5, 6}), true},
             Row{"other control", curve({1, 2}, {3, 4}, {5, 6}), curve({1, 2}, {3, 9}, {5, 6}),
                 false},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.a == row.b, row.equal);
        EXPECT_EQ(row.a != row.b, !row.equal);
        EXPECT_EQ((Path{{row.a}} == Path{{row.b}}), row.equal);
        EXPECT_EQ((Path{{row.a}} != Path{{row.b}}), !row.equal);
    }
}

TEST(Path, ComparesElementsInOrder) {
    Path const one{{move({1, 2})}};
    Path const two{{move({1, 2}), closed()}};
    EXPECT_EQ(Path(), Path());
    EXPECT_NE(one, two);
    EXPECT_NE(one, Path());
    EXPECT_EQ(two, Path(two));
    Path const nan{{move({NAN, 0})}};
    EXPECT_FALSE(nan == nan);
    EXPECT_TRUE(nan != nan);
}

TEST(Path, CopiesDeeplyAndMoves) {
    Path path{{move({1, 2}), closed()}};
    Path copy = path;
    copy.elements[0].points[0].x = 9;
    EXPECT_EQ(path.elements[0].points[0].x, 1);
    copy = path;
    EXPECT_EQ(copy, path);
    PathElement const* const elements = path.elements.data();
    Path moved = std::move(path);
    EXPECT_EQ(moved.elements.data(), elements);
    Path assigned;
    assigned = std::move(moved);
    EXPECT_EQ(assigned.elements.data(), elements);
    static_assert(std::is_nothrow_move_constructible_v<Path>);
}

TEST(EmptyPath, IsTheSameObjectEveryTime) {
    EXPECT_TRUE(Path::EmptyPath()->elements.empty());
    EXPECT_EQ(Path::EmptyPath().get(), Path::EmptyPath().get());
    EXPECT_EQ(Value(Path::EmptyPath()).ifPath(), Path::EmptyPath().get());
}

TEST(PathBuilder, StartsEmptyAtTheOrigin) {
    PathBuilder const builder;
    EXPECT_EQ(builder.build(), Path());
    EXPECT_EQ(builder.build(), *Path::EmptyPath());
    EXPECT_EQ(builder.currentPoint, (FloatVec2{0, 0}));
}

TEST(PathBuilder, AppendsOneElementForEachCall) {
    PathBuilder builder;
    EXPECT_EQ(&builder.moveTo({1, 2}), &builder);
    EXPECT_EQ(builder.currentPoint, (FloatVec2{1, 2}));
    EXPECT_EQ(&builder.lineTo({3, 4}), &builder);
    EXPECT_EQ(builder.currentPoint, (FloatVec2{3, 4}));
    EXPECT_EQ(&builder.curveTo({5, 6}, {7, 8}, {9, 10}), &builder);
    EXPECT_EQ(builder.currentPoint, (FloatVec2{9, 10}));
    EXPECT_EQ(&builder.quadCurveTo({11, 12}, {13, 14}), &builder);
    EXPECT_EQ(builder.currentPoint, (FloatVec2{13, 14}));
    EXPECT_EQ(&builder.close(), &builder);
    EXPECT_EQ(builder.currentPoint, (FloatVec2{13, 14}));
    expectElements(builder.elements, {move({1, 2}),
                                      line({3, 4}),
                                      curve({5, 6}, {7, 8}, {9, 10}),
                                      {PathInstruction::quadCurveTo, {{11, 12}, {13, 14}}},
                                      closed()});
    EXPECT_EQ(&builder.append(Path()), &builder);
    EXPECT_EQ(&builder.arcTo({0, 0}, true), &builder);
    EXPECT_EQ(&builder.ellipse({0, 0}, {1, 1}), &builder);
    EXPECT_EQ(&builder.circle({0, 0}, 1), &builder);
    EXPECT_EQ(&builder.roundRect({0, 0}, {1, 1}, 1), &builder);
    EXPECT_EQ(&builder.hexaRect({0, 0}, {1, 1}, 1), &builder);
}

TEST(PathBuilder, AcceptsAnyCoordinatesInAnyOrder) {
    PathBuilder builder;
    builder.close().lineTo({NAN, INFINITY}).close();
    expectElements(builder.elements, {closed(), line({NAN, INFINITY}), closed()});
}

TEST(PathBuilder, AppendsAPathAndKeepsItsCurrentPoint) {
    Path const other = PathBuilder().moveTo({5, 5}).lineTo({6, 6}).build();
    PathBuilder builder;
    builder.moveTo({1, 2}).append(other);
    EXPECT_EQ(builder.currentPoint, (FloatVec2{1, 2}));
    builder.arcTo({2, 3}, false);
    expectElements(builder.elements, {move({1, 2}), move({5, 5}), line({6, 6}),
                                      curve({K + 1, 2}, {2, 0.447715251 + 2}, {2, 3})});
    EXPECT_EQ(other.elements.size(), 2u);
    // Appends a copy of itself.
    builder.append(builder.build());
    EXPECT_EQ(builder.elements.size(), 8u);
}

TEST(PathBuilder, AppendsInLinearTime) {
    Path const one = PathBuilder().close().build();
    PathBuilder builder;
    tests::AllocationCounter counter;
    for (int i = 0; i < 1000; ++i) builder.append(one);
    // One for each copy of the argument, plus a few for the growing list.
    EXPECT_LT(counter.count(), 1000u + 20u);
}

TEST(PathBuilder, BuildsRepeatedly) {
    PathBuilder builder;
    Path const first = builder.moveTo({1, 2}).build();
    Path const second = builder.lineTo({3, 4}).build();
    EXPECT_EQ(first.elements.size(), 1u);
    EXPECT_EQ(second.elements.size(), 2u);
    EXPECT_EQ(builder.build(), second);
    EXPECT_EQ(first, (Path{{move({1, 2})}}));
    PathBuilder const copy = builder;
    EXPECT_EQ(copy, builder);
    EXPECT_FALSE(copy != builder);
    builder.close();
    EXPECT_NE(copy, builder);
    PathBuilder moved = copy;
    moved.currentPoint = {7, 7};
    EXPECT_NE(copy, moved);
}

TEST(PathBuilder, MovesItsElementsOutOfAnRvalue) {
    PathBuilder builder;
    builder.circle({0, 0}, 1);
    Path const copy = builder.build();
    PathElement const* const elements = builder.elements.data();
    tests::AllocationCounter counter;
    Path const path = std::move(builder).build();
    EXPECT_EQ(counter.count(), 0u);
    EXPECT_EQ(path.elements.data(), elements);
    EXPECT_EQ(path, copy);
}

TEST(PathShapes, ArcTo) {
    PathBuilder builder;
    builder.arcTo({10, 10}, false);
    EXPECT_EQ(builder.currentPoint, (FloatVec2{10, 10}));
    builder.moveTo({0, 0}).arcTo({10, 10}, true);
    EXPECT_EQ(builder.currentPoint, (FloatVec2{10, 10}));
    expectElements(builder.elements,
                   {curve({5.52284749, 0}, {10, 4.47715251}, {10, 10}), move({0, 0}),
                    curve({0, 5.52284749}, {4.47715251, 10}, {10, 10})});
}

TEST(PathShapes, ArcToUsesTheSumAsComputed) {
    // c + (p - c) differs from p here, in both coordinates; the sum is kept.
    FloatVec2 const c{0.7, 0.7};
    FloatVec2 const p{-1e-17, -1e-17};
    FloatVec2 const d{p.x - c.x, p.y - c.y};
    ASSERT_NE(tests::bits(d.y + c.y), tests::bits(p.y));
    ASSERT_NE(tests::bits(c.x + d.x), tests::bits(p.x));
    PathBuilder builder;
    builder.moveTo(c).arcTo(p, true).moveTo(c).arcTo(p, false);
    expectElements(builder.elements,
                   {move(c), curve({c.x, K * d.y + c.y}, {0.447715251 * d.x + c.x, d.y + c.y}, p),
                    move(c), curve({K * d.x + c.x, c.y}, {c.x + d.x, 0.447715251 * d.y + c.y}, p)});
}

TEST(PathShapes, Circle) {
    PathBuilder builder;
    builder.circle({0, 0}, 1);
    expectElements(builder.elements, {
                                         move({1, 0}),
                                         curve({1, K}, {K, 1}, {0, 1}),
                                         curve({-K, 1}, {-1, K}, {-1, 0}),
                                         curve({-1, -K}, {-K, -1}, {0, -1}),
                                         curve({K, -1}, {1, -K}, {1, 0}),
                                         closed(),
                                     });
    EXPECT_EQ(builder.currentPoint, (FloatVec2{1, 0}));
}

// Compares the figures in docs/paths.md.
TEST(PathShapes, ACircleDeviatesAsDocumented) {
    Path const circle = PathBuilder().circle({0, 0}, 1).build();
    FloatVec2 from = circle.elements.front().points[0];
    double outside = 0.0;
    double inside = 0.0;
    for (std::size_t i = 1; i <= 4; ++i) {
        Points const& p = circle.elements[i].points;
        for (int step = 0; step <= 100000; ++step) {
            FloatVec2 const point = tests::pointOfCurve(from, p, step / 100000.0);
            double const distance = std::hypot(point.x, point.y);
            outside = std::max(outside, distance - 1);
            inside = std::max(inside, 1 - distance);
        }
        from = p[2];
    }
    EXPECT_GT(outside, 2.725e-4);
    EXPECT_LE(outside, 2.726e-4);
    EXPECT_GT(inside, 4e-10);
    EXPECT_LE(inside, 5e-10);
}

TEST(PathShapes, EllipseIsFourArcs) {
    struct Row {
        char const* what;
        FloatVec2 center;
        FloatVec2 radii;
    };
    for (Row const& row : {
             Row{"plain", {3, 4}, {2, 1}},
             Row{"fractions", {0.1, 0.2}, {0.3, 0.7}},
             Row{"negative zeros", {-0.0, -0.0}, {0.0, 0.0}},
             Row{"negative zeros both", {-0.0, -0.0}, {-0.0, -0.0}},
             Row{"negative radii", {1, 1}, {-2, -3}},
             Row{"infinite", {0, 0}, {INFINITY, 1}},
         }) {
        SCOPED_TRACE(row.what);
        double const x = row.center.x;
        double const y = row.center.y;
        double const rx = row.radii.x;
        double const ry = row.radii.y;
        PathBuilder expected;
        expected.moveTo({x + rx, y + 0.0});
        expected.arcTo({0.0 + x, y + ry}, true);
        expected.arcTo({x - rx, y}, false);
        expected.arcTo({x, y - ry}, true);
        expected.arcTo({x + rx, y + 0.0}, false);
        expected.close();
        PathBuilder builder;
        builder.ellipse(row.center, row.radii);
        expectElements(builder.elements, expected.elements);
        EXPECT_EQ(tests::bits(builder.currentPoint.y), tests::bits(y + 0.0));
        PathBuilder circle;
        circle.circle(row.center, rx);
        expectElements(circle.elements, PathBuilder().ellipse(row.center, {rx, rx}).elements);
    }
}

TEST(PathShapes, RoundRect) {
    PathBuilder builder;
    builder.roundRect({0, 0}, {10, 4}, 5);  // The radius is limited to 2.
    double const k = 2 * K;
    double const rest = 2 * 0.447715251;
    expectElements(builder.elements, {
                                         move({2, 0}),
                                         line({8, 0}),
                                         curve({k + 8, 0}, {10, rest}, {10, 2}),
                                         line({10, 2}),
                                         curve({10, k + 2}, {0.447715251 * -2 + 10, 4}, {8, 4}),
                                         line({2, 4}),
                                         curve({K * -2 + 2, 4}, {0, 0.447715251 * -2 + 4}, {0, 2}),
                                         line({0, 2}),
                                         curve({0, K * -2 + 2}, {rest, 0}, {2, 0}),
                                         closed(),
                                     });
    EXPECT_EQ(builder.currentPoint, (FloatVec2{2, 0}));
}

TEST(PathShapes, RoundRectLimitsItsRadiusFromAbove) {
    struct Row {
        char const* what;
        FloatVec2 size;
        double radius;
        double used;
    };
    for (Row const& row : {
             Row{"fits", {10, 4}, 1, 1},
             Row{"half the height", {10, 4}, 2, 2},
             Row{"wide", {10, 4}, 5, 2},
             Row{"tall", {4, 10}, 5, 2},
             Row{"square", {4, 4}, 9, 2},
             Row{"zero", {4, 4}, 0, 0},
             Row{"negative", {4, 4}, -1, -1},
             Row{"NaN", {10, 4}, NAN, 2},
             Row{"infinite", {10, 4}, INFINITY, 2},
             Row{"negative size", {-10, 4}, 1, -5},
             Row{"NaN height takes the width", {4, NAN}, 9, 2},
             Row{"NaN width takes the width", {NAN, 4}, 1, NAN},
         }) {
        SCOPED_TRACE(row.what);
        PathBuilder builder;
        builder.roundRect({0, 0}, row.size, row.radius);
        ASSERT_EQ(builder.elements.size(), 10u);
        if (std::isnan(row.used)) {
            EXPECT_TRUE(std::isnan(builder.elements[0].points[0].x));
        } else {
            EXPECT_EQ(builder.elements[0].points[0], (FloatVec2{row.used, 0}));
        }
    }
}

TEST(PathShapes, GrowTheListGeometrically) {
    struct Row {
        char const* what;
        void (*append)(PathBuilder&);
        std::size_t size;
    };
    for (Row const& row : {
             Row{"ellipse", [](PathBuilder& b) { b.ellipse(kOrigin, kRadii); }, 6},
             Row{"circle", [](PathBuilder& b) { b.circle(kOrigin, 1); }, 6},
             Row{"roundRect", [](PathBuilder& b) { b.roundRect(kOrigin, kSize, 1); }, 10},
             Row{"hexaRect", [](PathBuilder& b) { b.hexaRect(kOrigin, kSize, 1); }, 9},
         }) {
        SCOPED_TRACE(row.what);
        PathBuilder builder;
        row.append(builder);
        EXPECT_EQ(builder.elements.size(), row.size);
        EXPECT_EQ(builder.elements.capacity(), row.size);
        row.append(builder);
        EXPECT_EQ(builder.elements.capacity(), 2 * row.size);
        row.append(builder);
        EXPECT_EQ(builder.elements.capacity(), 4 * row.size);
        row.append(builder);  // Exactly fills the capacity.
        EXPECT_EQ(builder.elements.capacity(), 4 * row.size);
    }
}

TEST(PathShapes, RoundRectKeepsTheSignOfTheHeightsZero) {
    struct Row {
        char const* what;
        FloatVec2 size;
        double radius;
        double used;
    };
    for (Row const& row : {
             Row{"height and width", {-0.0, 0.0}, 9, -0.0},
             Row{"width and height", {0.0, -0.0}, 9, 0.0},
             Row{"radius and size", {0.0, 0.0}, -0.0, 0.0},
             Row{"size and radius", {-0.0, -0.0}, 0.0, -0.0},
         }) {
        SCOPED_TRACE(row.what);
        PathBuilder builder;
        builder.roundRect({-0.0, 0}, row.size, row.radius);
        EXPECT_EQ(tests::bits(builder.elements[0].points[0].x), tests::bits(row.used));
    }
}

TEST(PathShapes, RoundRectKeepsElementsOfZeroLength) {
    PathBuilder builder;
    builder.roundRect({0, 0}, {4, 4}, 0);
    ASSERT_EQ(builder.elements.size(), 10u);
    for (std::size_t i : {2u, 4u, 6u, 8u}) {
        Points const& points = builder.elements[i].points;
        ASSERT_EQ(points.size(), 3u);
        EXPECT_EQ(points[0], points[2]);
        EXPECT_EQ(points[1], points[2]);
    }
}

TEST(PathShapes, HexaRect) {
    PathBuilder builder;
    builder.hexaRect({0, 0}, {10, 10}, 2);
    expectElements(builder.elements,
                   {move({2, 0}), line({8, 0}), line({10, 2}), line({10, 8}), line({8, 10}),
                    line({2, 10}), line({0, 8}), line({0, 2}), closed()});
    EXPECT_EQ(builder.currentPoint, (FloatVec2{0, 2}));
    PathBuilder crossing;
    crossing.hexaRect({1, 2}, {10, 10}, 6);
    expectElements(crossing.elements,
                   {move({7, 2}), line({5, 2}), line({11, 8}), line({11, 6}), line({5, 12}),
                    line({7, 12}), line({1, 6}), line({1, 8}), closed()});
}

// The shapes computed from their coordinates rather than from the builder's primitives.
TEST(PathShapes, AgreeWithAModelOnRandomSizes) {
    tests::Random random(43);
    auto const quarter = [](FloatVec2 c, FloatVec2 p, bool vertical) {
        double const dx = p.x - c.x;
        double const dy = p.y - c.y;
        return vertical
                   ? curve({c.x, 0.552284749 * dy + c.y}, {0.447715251 * dx + c.x, dy + c.y}, p)
                   : curve({0.552284749 * dx + c.x, c.y}, {c.x + dx, 0.447715251 * dy + c.y}, p);
    };
    for (int i = 0; i < 20000; ++i) {
        double const x = random.number() / 3;
        double const y = random.number() / 7;
        double const w = random.number() / 11;
        double const h = random.number() / 13;
        double const radius = random.number() / 50;
        double const m = h * 0.5 < w * 0.5 ? h * 0.5 : w * 0.5;
        double const r = radius < m ? radius : m;
        double const R = w + x;
        double const B = h + y;
        std::vector<PathElement> const expected{
            move({r + x, y}),
            line({R - r, y}),
            quarter({R - r, y}, {R, r + y}, false),
            line({R, B - r}),
            quarter({R, B - r}, {R - r, B}, true),
            line({r + x, B}),
            quarter({r + x, B}, {x, B - r}, false),
            line({x, r + y}),
            quarter({x, r + y}, {r + x, y}, true),
            closed(),
        };
        PathBuilder builder;
        builder.roundRect({x, y}, {w, h}, radius);
        expectElements(builder.elements, expected);

        std::vector<PathElement> const round{
            move({x + w, y + 0.0}),
            quarter({x + w, y + 0.0}, {0.0 + x, y + h}, true),
            quarter({0.0 + x, y + h}, {x - w, y}, false),
            quarter({x - w, y}, {x, y - h}, true),
            quarter({x, y - h}, {x + w, y + 0.0}, false),
            closed(),
        };
        PathBuilder ellipse;
        ellipse.ellipse({x, y}, {w, h});
        expectElements(ellipse.elements, round);

        std::vector<PathElement> const cut{
            move({x + radius, y}), line({R - radius, y}), line({R, y + radius}),
            line({R, B - radius}), line({R - radius, B}), line({x + radius, B}),
            line({x, B - radius}), line({x, y + radius}), closed(),
        };
        PathBuilder hexagon;
        hexagon.hexaRect({x, y}, {w, h}, radius);
        expectElements(hexagon.elements, cut);
        if (testing::Test::HasFatalFailure() || testing::Test::HasNonfatalFailure()) return;
    }
}

TEST(PathBuilder, SurvivesFailingAllocations) {
    Path const other = PathBuilder().circle({0, 0}, 1).hexaRect({0, 0}, {1, 1}, 0.1).build();
    PathBuilder builder;
    builder.moveTo({1, 2}).lineTo({3, 4});
    PathBuilder const before = builder;
    auto const untouched = [&] {
        EXPECT_EQ(builder.elements, before.elements);
        EXPECT_EQ(builder.currentPoint, before.currentPoint);
    };
    EXPECT_EQ(tests::failEachAllocation([&] { builder.append(other); }, untouched), 2u);
    EXPECT_EQ(builder.elements.size(), 2u + 15u);

    struct Row {
        char const* what;
        void (*call)(PathBuilder&);
    };
    for (Row const& row : {
             Row{"moveTo",
                 [](PathBuilder& b) {
                     b.moveTo({9, 9});
                 }},
             Row{"lineTo",
                 [](PathBuilder& b) {
                     b.lineTo({9, 9});
                 }},
             Row{"curveTo",
                 [](PathBuilder& b) {
                     b.curveTo({7, 7}, {8, 8}, {9, 9});
                 }},
             Row{"quadCurveTo",
                 [](PathBuilder& b) {
                     b.quadCurveTo({8, 8}, {9, 9});
                 }},
             Row{"close", [](PathBuilder& b) { b.close(); }},
         }) {
        SCOPED_TRACE(row.what);
        builder = before;
        builder.elements.shrink_to_fit();
        EXPECT_GE(tests::failEachAllocation([&] { row.call(builder); }, untouched), 1u);
        EXPECT_EQ(builder.elements.size(), 3u);
    }
}

TEST(PathBuilder, KeepsWhatAShapeAppendedBeforeAllocationFailed) {
    struct Row {
        char const* what;
        void (*call)(PathBuilder&);
        std::size_t elements;
    };
    for (Row const& row : {
             Row{"arcTo", [](PathBuilder& b) { b.arcTo(kAside, true); }, 1},
             Row{"ellipse", [](PathBuilder& b) { b.ellipse(kAside, kRadii); }, 6},
             Row{"circle", [](PathBuilder& b) { b.circle(kAside, 3); }, 6},
             Row{"roundRect", [](PathBuilder& b) { b.roundRect(kAside, kSize, 3); }, 10},
             Row{"hexaRect", [](PathBuilder& b) { b.hexaRect(kAside, kSize, 3); }, 9},
         }) {
        SCOPED_TRACE(row.what);
        PathBuilder whole;
        row.call(whole);
        PathBuilder builder;
        builder.close();
        std::size_t const failures = tests::failEachAllocation(
            [&] {
                builder = PathBuilder();
                builder.close();
                row.call(builder);
            },
            [&] {
                ASSERT_LT(builder.elements.size(), 1 + row.elements);
                for (std::size_t i = 1; i < builder.elements.size(); ++i) {
                    EXPECT_EQ(builder.elements[i], whole.elements[i - 1]);
                }
            });
        EXPECT_GE(failures, 2u);
        builder.elements.erase(builder.elements.begin());
        EXPECT_EQ(builder.elements, whole.elements);
    }
}
