// Inline functions of the headers must work with any compiler flags of the caller: this file is
// compiled with -ffast-math and compares the results by bits.

#include <Engine/Base/easing.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include "support/random.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

using namespace tarn::engine;
using tests::bits;
using tests::fromBits;

namespace {

// Hides the value: with these flags the compiler assumes that there are no NaNs.
double hidden(std::uint64_t all) {
    std::uint64_t const volatile kept = all;
    return fromBits(kept);
}
double nan() { return hidden(0x7ff8000000000000); }
double infinity() { return hidden(0x7ff0000000000000); }
double number(double d) { return hidden(bits(d)); }

TypeInfo boundedPort(double min, double max) {
    TypeInfo info;
    info.min = Value(min);
    info.max = Value(max);
    return info;
}

TEST(FastMath, ANaNIsUnequalToItself) {
    EXPECT_FALSE(Value(nan()) == Value(nan()));
    EXPECT_TRUE(Value(nan()) != Value(nan()));
    EXPECT_FALSE((FloatVec2{nan(), number(1)} == FloatVec2{nan(), number(1)}));
    EXPECT_FALSE((FloatVec2{number(1), nan()} == FloatVec2{number(1), nan()}));
    EXPECT_FALSE(
        (FloatVec3{number(1), number(2), nan()} == FloatVec3{number(1), number(2), nan()}));
    EXPECT_FALSE((FloatVec4{number(1), number(2), number(3), nan()} ==
                  FloatVec4{number(1), number(2), number(3), nan()}));
    EXPECT_TRUE((FloatVec2{nan(), nan()} != FloatVec2{nan(), nan()}));
    EXPECT_FALSE(Points({{nan(), 0}}) == Points({{nan(), 0}}));
    EXPECT_FALSE(Optional<Value>(Value(nan())) == Optional<Value>(Value(nan())));
    EXPECT_FALSE(Unstructured(nan()) == Unstructured(nan()));
    Path const path = PathBuilder().moveTo({nan(), 0}).build();
    EXPECT_FALSE(path == path);
}

TEST(FastMath, NumbersAndInfinitiesCompareCorrectly) {
    struct Row {
        char const* what;
        double a, b;
        bool equal;
    };
    for (Row const& row : {Row{"zeros", hidden(0), hidden(0x8000000000000000), true},
                           Row{"infinities", infinity(), infinity(), true},
                           Row{"opposite infinities", infinity(), -infinity(), false},
                           Row{"neighbours", number(1.0), hidden(0x3ff0000000000001), false},
                           Row{"denormals", hidden(1), hidden(2), false},
                           Row{"the same denormal", hidden(3), hidden(3), true},
                           Row{"a NaN and a number", nan(), number(1.0), false}}) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(Value(row.a) == Value(row.b), row.equal);
        EXPECT_EQ((FloatVec2{row.a, 0.0} == FloatVec2{row.b, 0.0}), row.equal);
        EXPECT_EQ((FloatVec4{0.0, 0.0, 0.0, row.a} == FloatVec4{0.0, 0.0, 0.0, row.b}), row.equal);
        EXPECT_EQ(Points({{row.a, 0}}) == Points({{row.b, 0}}), row.equal);
    }
    static_assert(FloatVec2{1.0, 2.0} == FloatVec2{1.0, 2.0}, "still a constant expression");
    static_assert(FloatVec3{1.0, 2.0, 3.0} != FloatVec3{1.0, 2.0, 4.0},
                  "still a constant expression");
}

// Expected results are bits: with these flags the compiler may treat -0.0 as 0.0.
TEST(FastMath, ClampingPassesANaN) {
    struct Row {
        char const* what;
        double in, min, max;
        std::uint64_t out;
    };
    double const minusZero = hidden(0x8000000000000000);
    for (Row const& row : {
             Row{"a NaN", nan(), 0.0, 1.0, 0x7ff8000000000000},
             Row{"below", number(-3), 0.0, 1.0, 0},
             Row{"above", number(7), 0.0, 1.0, bits(1.0)},
             Row{"inside", number(0.5), 0.0, 1.0, bits(0.5)},
             Row{"infinity", infinity(), 0.0, 1.0, bits(1.0)},
             Row{"a NaN as lower bound", number(-3), nan(), 1.0, bits(-3.0)},
             Row{"a NaN as upper bound", number(7), 0.0, nan(), bits(7.0)},
             Row{"minus zero on the bound", minusZero, 0.0, 1.0, 0x8000000000000000},
             Row{"crossed bounds", number(5), 10.0, 1.0, bits(10.0)},
         }) {
        SCOPED_TRACE(row.what);
        TypeInfo const port = boundedPort(row.min, row.max);
        EXPECT_EQ(bits(castValueToType(Value(row.in), port)), row.out);
        EXPECT_EQ(bits(indexLoopCasting(Loop{row.in}, port, 0)), row.out);
    }
}

TEST(FastMath, ConversionsKeepEveryBit) {
    for (std::uint64_t all : {std::uint64_t(0x7ff8000000000000), std::uint64_t(0xfff8000000000001),
                              std::uint64_t(0x7ff0000000000000), std::uint64_t(0x8000000000000000),
                              std::uint64_t(0x3ff0000000000001)}) {
        double const d = hidden(all);
        EXPECT_EQ(bits(Value(d)), all);
        EXPECT_EQ(bits(Unstructured(d).asFloat()), all);
        EXPECT_EQ(bits(FloatVec4(Value(d)).w), all);
        EXPECT_EQ(bits(Value(FloatVec3{d, 0, 0})), all);
    }
    EXPECT_EQ(bits(Unstructured(9007199254740993LL).asFloat()), bits(9007199254740992.0));
    EXPECT_TRUE(bool(Value(nan())));
    EXPECT_EQ((long long)(Value(nan())), 0);
    EXPECT_EQ(std::string(Value(number(-0.001))), "0");
}

TEST(FastMath, CurvesMatchBitForBit) {
    struct Row {
        EasingFunction function;
        std::uint64_t half, third;
    };
    // Eases from 0.1 to 0.7, where every step of a formula rounds, so that a changed order shows.
    for (Row const& row :
         {Row{EasingFunction::Linear, 0x3fd999999999999a, 0x3fd3333333333333},
          Row{EasingFunction::QuadraticOut, 0x3fe1999999999999, 0x3fdbbbbbbbbbbbbc}}) {
        EXPECT_EQ(bits(ease<double>(row.function, 0.1, 0.7, 0.5)), row.half);
        EXPECT_EQ(bits(ease<double>(row.function, 0.1, 0.7, 1.0 / 3.0)), row.third);
    }
    EXPECT_EQ(bits(ease<double>(EasingFunction::Linear, 0.0, 1.0, nan())) & 0x7ff8000000000000,
              0x7ff8000000000000u);
}

}  // namespace
