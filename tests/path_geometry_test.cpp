#include <Engine/Base/path_geometry.h>

#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

using namespace tarn::engine;
using tests::bits;

namespace {

PathElement element(PathInstruction instruction, Points points) {
    return {instruction, std::move(points)};
}

TEST(Bounds, EncloseWhatIsDrawn) {
    struct Row {
        char const* what;
        Path path;
        Bounds box;
    };
    for (Row const& row : {
             Row{"a point", PathBuilder().moveTo({3, 4}).build(), {{3, 4}, {3, 4}}},
             Row{"a line", PathBuilder().moveTo({3, 4}).lineTo({-1, 9}).build(), {{-1, 4}, {3, 9}}},
             Row{"a line without a start", PathBuilder().lineTo({2, 3}).build(), {{0, 0}, {2, 3}}},
             Row{"a circle", PathBuilder().circle({10, 20}, 5).build(), {{5, 15}, {15, 25}}},
             Row{"a rectangle",
                 PathBuilder().roundRect({1, 2}, {10, 4}, 1).build(),
                 {{1, 2}, {11, 6}}},
             // The control points are at 4, the curve reaches 3.
             Row{"a cubic curve",
                 PathBuilder().moveTo({0, 0}).curveTo({0, 4}, {8, 4}, {8, 0}).build(),
                 {{0, 0}, {8, 3}}},
             Row{"one that leaves its ends on both sides",
                 PathBuilder().moveTo({0, 0}).curveTo({12, 0}, {-12, 0}, {0, 0}).build(),
                 {{-12 * std::sqrt(3) / 6, 0}, {12 * std::sqrt(3) / 6, 0}}},
             Row{"a quadratic curve",
                 PathBuilder().moveTo({0, 0}).quadCurveTo({1, 4}, {2, 0}).build(),
                 {{0, 0}, {2, 2}}},
             Row{"a huge curve",
                 PathBuilder().moveTo({0, 0}).curveTo({0, 1e200}, {1, 1e200}, {1, 0}).build(),
                 {{0, 0}, {1, 7.5e199}}},
             Row{"a tiny curve",
                 PathBuilder().moveTo({0, 0}).curveTo({0, 1e-170}, {1, 1e-170}, {1, 0}).build(),
                 {{0, 0}, {1, 7.5e-171}}},
             Row{"a quadratic curve near the largest numbers",
                 PathBuilder().moveTo({0, 0}).quadCurveTo({0.5, 1e308}, {1, 0}).build(),
                 {{0, 0}, {1, 5e307}}},
             Row{"an infinite handle",
                 PathBuilder().moveTo({0, 0}).quadCurveTo({0, INFINITY}, {1, 1}).build(),
                 {{0, 0}, {1, INFINITY}}},
             Row{"a straight curve",
                 PathBuilder().moveTo({0, 0}).curveTo({1, 1}, {2, 2}, {3, 3}).build(),
                 {{0, 0}, {3, 3}}},
             Row{"what follows a close begins at the start",
                 PathBuilder()
                     .moveTo({0, 0})
                     .lineTo({9, 0})
                     .close()
                     .curveTo({0, 4}, {8, 4}, {8, 0})
                     .build(),
                 {{0, 0}, {9, 3}}},
             Row{"elements with too few points are left out",
                 Path({element(PathInstruction::moveTo, {{1, 1}}),
                       element(PathInstruction::lineTo, {}),
                       element(PathInstruction::curveTo, {{50, 50}, {60, 60}})}),
                 {{1, 1}, {1, 1}}},
             Row{"further points are not drawn",
                 Path({element(PathInstruction::moveTo, {{1, 1}, {50, 50}}),
                       element(PathInstruction::close, {{70, 70}})}),
                 {{1, 1}, {1, 1}}},
             Row{"a NaN",
                 PathBuilder().moveTo({1, 1}).lineTo({NAN, 5}).lineTo({3, 2}).build(),
                 {{1, 1}, {3, 5}}},
         }) {
        SCOPED_TRACE(row.what);
        Optional<Bounds> const box = bounds(row.path);
        ASSERT_TRUE(box.hasValue());
        // Within the rounding errors of a sum of a few terms of this size.
        auto const near = [](double a, double b) {
            return a == b ||
                   std::abs(a - b) <=
                       4e-15 * (b > -1 && b < 1 && b != 0 ? std::abs(b) : 1 + std::abs(b));
        };
        EXPECT_TRUE(near(box->min.x, row.box.min.x)) << box->min.x;
        EXPECT_TRUE(near(box->min.y, row.box.min.y)) << box->min.y;
        EXPECT_TRUE(near(box->max.x, row.box.max.x)) << box->max.x;
        EXPECT_TRUE(near(box->max.y, row.box.max.y)) << box->max.y;
    }
    EXPECT_FALSE(bounds(Path()).hasValue());
    EXPECT_FALSE(bounds(PathBuilder().close().build()).hasValue());
    EXPECT_FALSE(bounds(PathBuilder().moveTo({NAN, NAN}).build()).hasValue());
    EXPECT_EQ((Bounds{{1, 2}, {3, 4}}), (Bounds{{1, 2}, {3, 4}}));
    EXPECT_NE((Bounds{{1, 2}, {3, 4}}), (Bounds{{1, 2}, {3, 5}}));
    EXPECT_NE((Bounds{{0, 2}, {3, 4}}), (Bounds{{1, 2}, {3, 4}}));
}

// Every point of a curve is inside, and some are close to each edge.
TEST(Bounds, EncloseRandomCurvesTightly) {
    tests::Random random(21);
    for (int i = 0; i < 3000; ++i) {
        auto const point = [&] { return FloatVec2{random.number(), random.number()}; };
        FloatVec2 const p[] = {point(), point(), point(), point()};
        bool const cubic = random.chance();
        Path const path = cubic ? PathBuilder().moveTo(p[0]).curveTo(p[1], p[2], p[3]).build()
                                : PathBuilder().moveTo(p[0]).quadCurveTo(p[1], p[2]).build();
        Bounds const box = *bounds(path);
        FloatVec2 low = p[0];
        FloatVec2 high = p[0];
        for (int step = 0; step <= 1000; ++step) {
            double const t = step / 1000.0;
            // De Casteljau's algorithm.
            auto const between = [t](double a, double b) { return a + (b - a) * t; };
            auto const at = [&](double a, double b, double c, double d) {
                double const ab = between(a, b);
                double const bc = between(b, c);
                double const abc = between(ab, bc);
                return cubic ? between(abc, between(bc, between(c, d))) : abc;
            };
            FloatVec2 const q{at(p[0].x, p[1].x, p[2].x, p[3].x),
                              at(p[0].y, p[1].y, p[2].y, p[3].y)};
            low = {std::min(low.x, q.x), std::min(low.y, q.y)};
            high = {std::max(high.x, q.x), std::max(high.y, q.y)};
        }
        double const rounding = 1e-9;
        double const step = 0.05;  // The distance that a curve of this size covers around an
                                   // extremum in a thousandth of its length.
        ASSERT_LE(box.min.x, low.x + rounding);
        ASSERT_LE(box.min.y, low.y + rounding);
        ASSERT_GE(box.max.x, high.x - rounding);
        ASSERT_GE(box.max.y, high.y - rounding);
        ASSERT_GE(box.min.x, low.x - step);
        ASSERT_GE(box.min.y, low.y - step);
        ASSERT_LE(box.max.x, high.x + step);
        ASSERT_LE(box.max.y, high.y + step);
    }
}

TEST(PathGeometry, MovesAndScalesEveryPoint) {
    Path const path = PathBuilder().moveTo({1, 2}).curveTo({3, 4}, {5, 6}, {7, 8}).close().build();
    EXPECT_EQ(translated(path, {10, -1}),
              PathBuilder().moveTo({11, 1}).curveTo({13, 3}, {15, 5}, {17, 7}).close().build());
    EXPECT_EQ(scaled(path, {2, -1}),
              PathBuilder().moveTo({2, -2}).curveTo({6, -4}, {10, -6}, {14, -8}).close().build());
    EXPECT_EQ(translated(Path(), {1, 1}), Path());
    EXPECT_EQ(scaled(Path(), {1, 1}), Path());
}

TEST(PathGeometry, InterpolatesPathsOfTheSameInstructions) {
    Path const a = PathBuilder().moveTo({0, 0}).lineTo({0.1, 10}).close().build();
    Path const b = PathBuilder().moveTo({2, 4}).lineTo({0.7, 30}).close().build();
    struct Row {
        char const* what;
        double t;
        FloatVec2 first;
        FloatVec2 second;
    };
    for (Row const& row :
         {Row{"half way", 0.5, {1, 2}, {0.1 + (0.7 - 0.1) * 0.5, 20}},
          Row{"beyond the end", 1.5, {3, 6}, {0.1 + (0.7 - 0.1) * 1.5, 40}},
          Row{"before the start", -1, {-2, -4}, {0.1 + (0.7 - 0.1) * -1.0, -10}}}) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(*interpolate(a, b, row.t),
                  PathBuilder().moveTo(row.first).lineTo(row.second).close().build());
    }
    EXPECT_EQ(*interpolate(a, b, 0.0), a);
    EXPECT_EQ(*interpolate(a, b, 1.0), b);
    EXPECT_EQ(*interpolate(Path(), Path(), 0.5), Path());
    EXPECT_FALSE(interpolate(a, Path(), 0.5).hasValue());
    EXPECT_FALSE(interpolate(a, PathBuilder().moveTo({0, 0}).moveTo({1, 1}).close().build(), 0.5)
                     .hasValue());
    Path fewer = b;
    fewer.elements[1].points.clear();
    EXPECT_FALSE(interpolate(a, fewer, 0.5).hasValue());
    EXPECT_FALSE(interpolate(a, fewer, 0.0).hasValue());
    Path longer = a;
    longer.elements.push_back(longer.elements.back());
    EXPECT_FALSE(interpolate(a, longer, 1.0).hasValue());
}

}  // namespace
