#include <Engine/Base/vector_math.h>

#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <type_traits>

using namespace tarn::engine;
using tests::bits;

namespace {

static_assert(FloatVec2{1, 2} + FloatVec2{3, 5} == FloatVec2{4, 7});
static_assert(FloatVec3{1, 2, 3} - FloatVec3{3, 5, 4} == FloatVec3{-2, -3, -1});
static_assert(-FloatVec4{1, -2, 3, 0} == FloatVec4{-1, 2, -3, 0});
static_assert(FloatVec2{1, 2} * 3 == FloatVec2{3, 6});
static_assert(0.5f * FloatVec3{1, 2, 3} == FloatVec3{0.5, 1, 1.5});
static_assert(FloatVec4{1, 2, 3, 4} / 2LL == FloatVec4{0.5, 1, 1.5, 2});

constexpr FloatVec2 inPlace() {
    FloatVec2 v{1, 2};
    v += FloatVec2{1, 1};
    v *= 4;
    v -= FloatVec2{2, 2};
    v /= 2.0;
    return v;
}
static_assert(inPlace() == FloatVec2{3, 5});

void expectSameBits(FloatVec4 const& actual, double x, double y, double z, double w) {
    EXPECT_EQ(bits(actual.x), bits(x));
    EXPECT_EQ(bits(actual.y), bits(y));
    EXPECT_EQ(bits(actual.z), bits(z));
    EXPECT_EQ(bits(actual.w), bits(w));
}

TEST(VectorMath, MatchesTheComponentsToTheLastBit) {
    tests::Random random(6);
    for (int i = 0; i < 10000; ++i) {
        double const a[] = {random.number(), random.number() / 3, random.number() / 7,
                            random.number()};
        double const b[] = {random.number() / 5, random.number(), random.number() / 9,
                            random.number()};
        double const s = random.number() / 11;
        FloatVec4 const u{a[0], a[1], a[2], a[3]};
        FloatVec4 const v{b[0], b[1], b[2], b[3]};
        expectSameBits(u + v, a[0] + b[0], a[1] + b[1], a[2] + b[2], a[3] + b[3]);
        expectSameBits(u - v, a[0] - b[0], a[1] - b[1], a[2] - b[2], a[3] - b[3]);
        expectSameBits(-u, -a[0], -a[1], -a[2], -a[3]);
        expectSameBits(u * s, a[0] * s, a[1] * s, a[2] * s, a[3] * s);
        expectSameBits(s * u, a[0] * s, a[1] * s, a[2] * s, a[3] * s);
        expectSameBits(u / 3.0, a[0] / 3.0, a[1] / 3.0, a[2] / 3.0, a[3] / 3.0);
        FloatVec2 two = FloatVec2{a[0], a[1]} + FloatVec2{b[0], b[1]};
        EXPECT_EQ(two, (FloatVec2{a[0] + b[0], a[1] + b[1]}));
        FloatVec3 three{a[0], a[1], a[2]};
        three -= FloatVec3{b[0], b[1], b[2]};
        EXPECT_EQ(three, (FloatVec3{a[0] - b[0], a[1] - b[1], a[2] - b[2]}));
    }
}

TEST(VectorMath, KeepsTheSignsOfZeros) {
    expectSameBits(-FloatVec4{0.0, -0.0, 1, 0}, -0.0, 0.0, -1, -0.0);
    expectSameBits(FloatVec4{0.0, 0.0, 0.0, 0.0} * -1.0, -0.0, -0.0, -0.0, -0.0);
}

TEST(VectorMath, AssignsInPlaceAndReturnsAReference) {
    FloatVec2 v{1, 2};
    EXPECT_EQ(&(v += v), &v);
    EXPECT_EQ(v, (FloatVec2{2, 4}));
    EXPECT_EQ(&(v -= FloatVec2{1, 1}), &v);
    EXPECT_EQ(&(v *= 2), &v);
    EXPECT_EQ(&(v /= 4), &v);
    EXPECT_EQ(v, (FloatVec2{0.5, 1.5}));
}

}  // namespace
