#include <Engine/Base/svg_path.h>

#include "support/curves.h"
#include "support/locales.h"
#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cfenv>
#include <cmath>
#include <cstring>
#include <string>

using namespace tarn::engine;

namespace {

PathElement element(PathInstruction instruction, Points points) {
    return {instruction, std::move(points)};
}

TEST(SvgPathData, HasOneCommandPerElement) {
    struct Row {
        char const* what;
        Path path;
        char const* data;
    };
    for (Row const& row : {
             Row{"nothing", Path(), ""},
             Row{"lines", PathBuilder().moveTo({0, 0}).lineTo({1.5, -2}).close().build(),
                 "M0 0L1.5 -2Z"},
             Row{"curves",
                 PathBuilder()
                     .moveTo({1, 2})
                     .curveTo({3, 4}, {5, 6}, {7, 8})
                     .quadCurveTo({9, 10}, {11, 12})
                     .build(),
                 "M1 2C3 4 5 6 7 8Q9 10 11 12"},
             Row{"no start", PathBuilder().lineTo({1, 2}).build(), "M0 0L1 2"},
             Row{"a close alone", PathBuilder().close().build(), "M0 0Z"},
             Row{"too few points",
                 Path({element(PathInstruction::moveTo, {{1, 2}}),
                       element(PathInstruction::curveTo, {{3, 4}}),
                       element(PathInstruction::lineTo, {})}),
                 "M1 2"},
             Row{"too many points", Path({element(PathInstruction::moveTo, {{1, 2}, {3, 4}})}),
                 "M1 2"},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(svgPathData(row.path), row.data);
    }
}

TEST(SvgPathData, WritesTheShortestExactNumbers) {
    struct Row {
        double number;
        char const* text;
    };
    for (Row const& row : {
             Row{0.0, "0"},
             Row{-0.0, "-0"},
             Row{5, "5"},
             Row{-17.25, "-17.25"},
             Row{0.1, "0.1"},
             Row{1.0 / 3.0, "0.3333333333333333"},
             Row{0.1 + 0.2, "0.30000000000000004"},
             Row{123456789, "123456789"},
             Row{1e20, "100000000000000000000"},
             Row{1e21, "1e21"},
             Row{1.5e300, "1.5e300"},
             Row{0.000001, "0.000001"},
             Row{0.0000001, "1e-7"},
             Row{-2.5e-9, "-2.5e-9"},
             Row{5e-324, "5e-324"},
             Row{1.7976931348623157e308, "1.7976931348623157e308"},
             Row{double(INFINITY), "1.7976931348623157e308"},
             Row{-double(INFINITY), "-1.7976931348623157e308"},
             Row{double(NAN), "0"},
             Row{-double(NAN), "0"},
             Row{9007199254740993.0, "9007199254740992"},
         }) {
        EXPECT_EQ(svgPathData(PathBuilder().moveTo({row.number, 1}).build()),
                  "M" + std::string(row.text) + " 1");
    }
}

TEST(SvgPathData, IgnoresTheRoundingMode) {
#if defined(FE_UPWARD)
    for (int mode : {FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        std::fesetround(mode);
        Path const path = PathBuilder().moveTo({0.3, 0.1}).build();
        std::string const data = svgPathData(path);
        Optional<Path> const back = pathFromSvgPathData(data);
        bool const refused = !pathFromSvgPathData("M1e999 0") && !pathFromSvgPathData("M-1e999 0");
        int const after = std::fegetround();
        std::fesetround(FE_TONEAREST);
        EXPECT_EQ(data, "M0.3 0.1");
        EXPECT_EQ(back, path);
        EXPECT_TRUE(refused);
        EXPECT_TRUE(after == mode || after == FE_TONEAREST);
    }
#endif
    EXPECT_EQ(svgPathData(Path({element(PathInstruction(77), {{1, 2}})})), "");
}

TEST(SvgPathData, RoundTripsToTheSameDoubles) {
    tests::Random random(17);
    for (int i = 0; i < 3000; ++i) {
        auto const number = [&] {
            double const d = random.anyDouble();
            return std::isfinite(d) ? d : 1.0;
        };
        auto const point = [&] { return FloatVec2{number(), number()}; };
        PathBuilder builder;
        builder.moveTo(point());
        for (std::size_t n = random.below(6); n > 0; --n) {
            switch (random.below(4)) {
                case 0: builder.lineTo(point()); break;
                case 1: builder.curveTo(point(), point(), point()); break;
                case 2: builder.quadCurveTo(point(), point()); break;
                default: builder.close().moveTo(point()); break;
            }
        }
        Path const path = builder.build();
        Optional<Path> const back = pathFromSvgPathData(svgPathData(path));
        ASSERT_TRUE(back.hasValue()) << svgPathData(path);
        ASSERT_EQ(back->elements.size(), path.elements.size());
        for (std::size_t e = 0; e < path.elements.size(); ++e) {
            Points const& before = path.elements[e].points;
            Points const& after = back->elements[e].points;
            ASSERT_EQ(back->elements[e].instruction, path.elements[e].instruction);
            ASSERT_EQ(before.size(), after.size());
            ASSERT_TRUE(before.empty() || std::memcmp(before.data(), after.data(),
                                                      before.size() * sizeof(FloatVec2)) == 0)
                << svgPathData(path);
        }
    }
}

TEST(SvgPathData, IgnoresTheDecimalPointOfTheCLibrary) {
    tests::CLocaleWithComma comma;
    ASSERT_TRUE(comma.isSet());
    EXPECT_EQ(svgPathData(PathBuilder().moveTo({1.5, 2.25}).build()), "M1.5 2.25");
    EXPECT_EQ(*pathFromSvgPathData("M1.5,2.25"), PathBuilder().moveTo({1.5, 2.25}).build());
    EXPECT_EQ(*pathFromSvgPathData("M1,2"), PathBuilder().moveTo({1, 2}).build());
}

TEST(PathFromSvgPathData, ParsesEveryCommand) {
    auto const from = [](double x, double y) { return PathBuilder().moveTo({x, y}); };
    struct Row {
        char const* data;
        Path path;
    };
    for (Row const& row : {
             Row{"", Path()},
             Row{" \t\n\f\r", Path()},
             Row{"M1 2", from(1, 2).build()},
             Row{"m1 2", from(1, 2).build()},
             Row{"M1 2 3 4 5 6", from(1, 2).lineTo({3, 4}).lineTo({5, 6}).build()},
             Row{"m1 2 3 4 5 6", from(1, 2).lineTo({4, 6}).lineTo({9, 12}).build()},
             Row{"M1,2L3,4", from(1, 2).lineTo({3, 4}).build()},
             Row{"M 1 , 2 l 3 -4", from(1, 2).lineTo({4, -2}).build()},
             Row{"M1-2.5.5.5", from(1, -2.5).lineTo({.5, .5}).build()},
             Row{"M1 2H5h-2", from(1, 2).lineTo({5, 2}).lineTo({3, 2}).build()},
             Row{"M1 2V5v-2", from(1, 2).lineTo({1, 5}).lineTo({1, 3}).build()},
             Row{"M0 0C1 2 3 4 5 6", from(0, 0).curveTo({1, 2}, {3, 4}, {5, 6}).build()},
             Row{"M1 1c1 2 3 4 5 6", from(1, 1).curveTo({2, 3}, {4, 5}, {6, 7}).build()},
             Row{"M0 0C1 2 3 4 5 6S7 8 9 10", from(0, 0)
                                                  .curveTo({1, 2}, {3, 4}, {5, 6})
                                                  .curveTo({7, 8}, {7, 8}, {9, 10})
                                                  .build()},
             Row{"M1 1S2 3 4 5", from(1, 1).curveTo({1, 1}, {2, 3}, {4, 5}).build()},
             Row{"M0 0C1 2 3 4 5 6s1 1 2 2", from(0, 0)
                                                 .curveTo({1, 2}, {3, 4}, {5, 6})
                                                 .curveTo({7, 8}, {6, 7}, {7, 8})
                                                 .build()},
             Row{"M0 0Q1 2 3 4T5 6T7 8", from(0, 0)
                                             .quadCurveTo({1, 2}, {3, 4})
                                             .quadCurveTo({5, 6}, {5, 6})
                                             .quadCurveTo({5, 6}, {7, 8})
                                             .build()},
             Row{"M1 1T2 3", from(1, 1).quadCurveTo({1, 1}, {2, 3}).build()},
             Row{"M1 1q1 1 2 0t2 0",
                 from(1, 1).quadCurveTo({2, 2}, {3, 1}).quadCurveTo({4, 0}, {5, 1}).build()},
             Row{"M1 1Q2 2 3 3S4 4 5 5",
                 from(1, 1).quadCurveTo({2, 2}, {3, 3}).curveTo({3, 3}, {4, 4}, {5, 5}).build()},
             Row{"M1 1L2 2Z", from(1, 1).lineTo({2, 2}).close().build()},
             Row{"M1 1L2 2zL3 3",
                 from(1, 1).lineTo({2, 2}).close().moveTo({1, 1}).lineTo({3, 3}).build()},
             Row{"M1 1l2 2zl3 3",
                 from(1, 1).lineTo({3, 3}).close().moveTo({1, 1}).lineTo({4, 4}).build()},
             Row{"M1 1l2 2zm3 3", from(1, 1).lineTo({3, 3}).close().moveTo({4, 4}).build()},
             Row{"M1 1zz", from(1, 1).close().close().build()},
             Row{"M1e2-1E-2", from(100, -0.01).build()},
             Row{"M+1+.5", from(1, 0.5).build()},
             Row{"M1 1A0 5 0 0 1 3 3", from(1, 1).lineTo({3, 3}).build()},
             Row{"M1 1A5 0 0 0 1 3 3", from(1, 1).lineTo({3, 3}).build()},
             Row{"M1 1A5 5 0 0 1 1 1", from(1, 1).build()},
         }) {
        SCOPED_TRACE(row.data);
        std::size_t fault = 77;
        Optional<Path> const path = pathFromSvgPathData(row.data, &fault);
        ASSERT_TRUE(path.hasValue()) << "at " << fault;
        EXPECT_EQ(*path, row.path) << svgPathData(*path);
        EXPECT_EQ(fault, 77u);
    }
}

TEST(PathFromSvgPathData, ReportsTheFirstInvalidByte) {
    struct Row {
        std::string data;
        std::size_t fault;
    };
    for (Row const& row : {
             Row{"L1 2", 0},
             Row{"1 2", 0},
             Row{"x", 0},
             Row{",M1 2", 0},
             Row{"M", 1},
             Row{"M1", 2},
             Row{"M1 ", 3},
             Row{"M1,", 2},
             Row{"M1 2,", 4},
             Row{"M1 2,L3 4", 4},
             Row{"M1,,2", 2},
             Row{"M1 2 3", 6},
             Row{"M1-2.5.5.5-3", 12},
             Row{"M1 2X", 4},
             Row{"M1 2Z3 4", 5},
             Row{"M1 .", 3},
             Row{"M1. 2", 2},
             Row{"M1 2Z,3 4", 5},
             Row{"M1 -", 3},
             Row{"M1 e5", 3},
             Row{"M1 1e999", 3},
             Row{"M1 nan", 3},
             Row{"M1 inf", 3},
             Row{"M0x10 1", 2},
             Row{"M1 1A5 5 0 2 1 3 3", 11},
             Row{"M1 1A5 5 0 0 1 3", 16},
             Row{std::string("M1 2\0L3 4", 9), 4},
             Row{"M1 2\xc3\xa9", 4},
         }) {
        SCOPED_TRACE(row.data);
        std::size_t fault = 77;
        EXPECT_FALSE(pathFromSvgPathData(row.data, &fault).hasValue());
        EXPECT_EQ(fault, row.fault);
        EXPECT_FALSE(pathFromSvgPathData(row.data).hasValue());
    }
}

// Each piece of an arc is a cubic curve close to the circle; together they cover the angle.
TEST(PathFromSvgPathData, ConvertsArcsToCurves) {
    struct Row {
        char const* what;
        char const* data;
        std::size_t curves;
        FloatVec2 centre;
        double radius;
        FloatVec2 middle;
    };
    double const half = std::sqrt(0.5);
    for (Row const& row : {
             Row{"a quarter", "M1 0A1 1 0 0 1 0 1", 1, {0, 0}, 1, {half, half}},
             Row{"the other three quarters", "M1 0A1 1 0 1 0 0 1", 3, {0, 0}, 1, {-half, -half}},
             Row{"a quarter about the other centre",
                 "M1 0A1 1 0 0 0 0 1",
                 1,
                 {1, 1},
                 1,
                 {1 - half, 1 - half}},
             Row{"a half", "M1 0A1 1 0 0 1 -1 0", 2, {0, 0}, 1, {0, 1}},
             Row{"the other half", "M1 0A1 1 0 0 0 -1 0", 2, {0, 0}, 1, {0, -1}},
             Row{"a tiny radius", "M2 0A1e-155 1e-155 0 0 1 -2 0", 2, {0, 0}, 2, {0, 2}},
             Row{"nearly the whole circle", "M0 1A1 1 0 1 0 1e-17 1", 4, {0, 2}, 1, {0, 3}},
             Row{"nearly nothing", "M0 1A1 1 0 0 1 1e-17 1", 1, {0, 2}, 1, {0, 1}},
             Row{"a radius that does not reach", "M2 0A1 1 0 0 1 -2 0", 2, {0, 0}, 2, {0, 2}},
             Row{"a negative radius", "M1 0A-1 -1 0 0 1 -1 0", 2, {0, 0}, 1, {0, 1}},
             Row{"flags without anything between", "M1 0a1 1 0 01-2 0", 2, {0, 0}, 1, {0, 1}},
             Row{"turned", "M1 0A1 1 30 0 1 -1 0", 2, {0, 0}, 1, {0, 1}},
         }) {
        SCOPED_TRACE(row.what);
        Optional<Path> const path = pathFromSvgPathData(row.data);
        ASSERT_TRUE(path.hasValue());
        ASSERT_EQ(path->elements.size(), row.curves + 1);
        FloatVec2 from = path->elements[0].points[0];
        double nearestToMiddle = 9;
        for (std::size_t i = 1; i <= row.curves; ++i) {
            ASSERT_EQ(path->elements[i].instruction, PathInstruction::curveTo);
            Points const& p = path->elements[i].points;
            for (int step = 0; step <= 100; ++step) {
                auto const [x, y] = tests::pointOfCurve(from, p, step / 100.0);
                EXPECT_LE(std::abs(std::hypot(x - row.centre.x, y - row.centre.y) - row.radius),
                          2.726e-4 * row.radius);
                nearestToMiddle =
                    std::min(nearestToMiddle, std::hypot(x - row.middle.x, y - row.middle.y));
            }
            from = p[2];
        }
        EXPECT_LE(nearestToMiddle, 0.02 * row.radius);
    }
    Path const ellipse = *pathFromSvgPathData("M0 2A1 2 0 0 1 1 0");
    EXPECT_EQ(ellipse.elements.back().points[2], (FloatVec2{1, 0}));
    Path const turned = *pathFromSvgPathData("M2 0A1 2 90 0 0 0 1");
    EXPECT_EQ(turned.elements.size(), 2u);
    // With a large radius the arc is nearly straight.
    for (char const* data :
         {"M0 0A1e9 1e9 0 0 1 1 0", "M0 0A1e17 1e17 0 0 1 1 0", "M0 0A1e160 1e160 0 0 1 1 0",
          "M0 0A1e300 1e300 0 0 1 1 0", "M0 0A1e307 1e307 30 0 0 1 0"}) {
        SCOPED_TRACE(data);
        Points const points = pathFromSvgPathData(data)->elements.back().points;
        for (FloatVec2 const& p : points) {
            EXPECT_TRUE(p.x >= 0 && p.x <= 1 && std::abs(p.y) < 1e-9) << p.x << ", " << p.y;
        }
    }
    Path const far = *pathFromSvgPathData("M1e308 0A1e308 1e308 0 0 1 1.1e308 0");
    for (FloatVec2 const& p : far.elements.back().points) {
        EXPECT_TRUE(std::isfinite(p.x) && std::isfinite(p.y));
    }
}

TEST(PathFromSvgPathData, SurvivesAnyBytes) {
    tests::Random random(5);
    std::string const letters = "MmLlHhVvCcSsQqTtAaZz0123456789.,-+eE \n";
    std::size_t read = 0;
    for (int i = 0; i < 50000; ++i) {
        std::string data = "M1 2";
        for (std::size_t n = random.below(30); n > 0; --n) {
            data += random.below(40) == 0 ? static_cast<char>(random.word() & 0xff)
                                          : letters[random.below(letters.size())];
        }
        std::size_t fault = 0;
        Optional<Path> const path = pathFromSvgPathData(data, &fault);
        if (path) {
            ++read;
            Optional<Path> const again = pathFromSvgPathData(svgPathData(*path));
            ASSERT_TRUE(again.hasValue()) << data;
        } else {
            ASSERT_LE(fault, data.size());
        }
    }
    EXPECT_GT(read, 1000u);
}

}  // namespace
