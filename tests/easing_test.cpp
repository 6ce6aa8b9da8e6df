#include <Engine/Base/easing.h>

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>

#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <cmath>
#include <cstring>
#include <sstream>
#include <string>
#include <vector>

using namespace tarn::engine;

namespace {

using EF = EasingFunction;

constexpr int kCurves = 13;

constexpr double E0 = 0.0009765625;
constexpr double E1 = 0.9990234375;
constexpr double EC = 1.0009775171065494;

EF outOfRange(int number) { return EF(number); }

// The definitions of the curves: `a` is the start, `D` the difference, `m` the midpoint of the
// in-out exponential curve.
double curve(int f, double a, double b, double t) {
    double const D = b - a;
    double const u = 2 * t;
    double const v = u - 1;
    double const m = D * 0.5 + a;
    switch (f) {
        case 0: return a + D * t;
        case 1: return a + (D * t) * t;
        case 2: return a - (t - 2) * (D * t);
        case 3: return u < 1 ? a + u * u * (D * 0.5) : a + ((v - 2) * v - 1) * (D * (-0.5));
        case 4: return a + std::pow(t, 3.0) * D;
        case 5: return a + (std::pow(t - 1, 3.0) + 1) * D;
        case 6:
            return u < 1 ? a + std::pow(u, 3.0) * (D * 0.5)
                         : a + (std::pow(u - 2, 3.0) + 2) * (D * 0.5);
        case 7: return t == 0 ? a : a + ((std::exp2((t - 1) * 10) - E0) / E1) * D;
        case 8: return t == 1 ? b : a + ((1 - std::exp2(t * (-10))) * D) * EC;
        case 9:
            if (t == 0) return a;
            if (t == 1) return b;
            return u < 1 ? a + ((std::exp2((u - 1) * 10) - E0) / E1) * (m - a)
                         : ((1 - std::exp2(v * (-10))) * (b - m)) * EC + m;
        case 10: return a + (D - std::cos(t * 1.5707963267948966) * D);
        case 11: return a + std::sin(t * 1.5707963267948966) * D;
        case 12: return a + (std::cos(t * 3.141592653589793) - 1) * (D * (-0.5));
        default: return a;
    }
}

long long towardsZero(double d) {
    if (std::isnan(d)) return 0;
    if (d >= 9223372036854775808.0) return LLONG_MAX;
    if (d < -9223372036854775808.0) return LLONG_MIN;
    return static_cast<long long>(d);
}

double wrappedDifference(long long b, long long a) {
    return static_cast<double>(static_cast<long long>(static_cast<unsigned long long>(b) -
                                                      static_cast<unsigned long long>(a)));
}

long long integerCurve(int f, long long from, long long to, double t) {
    double const a = static_cast<double>(from);
    double const D = wrappedDifference(to, from);
    double const N = wrappedDifference(from, to);
    double const u = 2 * t;
    double const v = u - 1;
    long long const m = towardsZero(D * 0.5 + a);
    switch (f) {
        case 0: return towardsZero(a + D * t);
        case 1: return towardsZero(a + (D * t) * t);
        case 2: return towardsZero((t - 2) * (N * t) + a);
        case 3:
            return towardsZero(u < 1 ? a + u * u * (D * 0.5) : a + ((v - 2) * v - 1) * (N * 0.5));
        case 4: return towardsZero(a + std::pow(t, 3.0) * D);
        case 5: return towardsZero(a + (std::pow(t - 1, 3.0) + 1) * D);
        case 6:
            return towardsZero(u < 1 ? a + std::pow(u, 3.0) * (D * 0.5)
                                     : a + (std::pow(u - 2, 3.0) + 2) * (D * 0.5));
        case 7: return t == 0 ? from : towardsZero(a + ((std::exp2((t - 1) * 10) - E0) / E1) * D);
        case 8: return t == 1 ? to : towardsZero(a + ((1 - std::exp2(t * (-10))) * D) * EC);
        case 9:
            if (t == 0) return from;
            if (t == 1) return to;
            return towardsZero(
                u < 1 ? a + ((std::exp2((u - 1) * 10) - E0) / E1) * wrappedDifference(m, from)
                      : ((1 - std::exp2(v * (-10))) * wrappedDifference(to, m)) * EC +
                            static_cast<double>(m));
        case 10: return towardsZero(a + (D + std::cos(t * 1.5707963267948966) * N));
        case 11: return towardsZero(a + std::sin(t * 1.5707963267948966) * D);
        case 12: return towardsZero(a + (std::cos(t * 3.141592653589793) - 1) * (N * 0.5));
        default: return from;
    }
}

// Equal to the last bit; all NaNs count as equal.
void expectSame(double actual, double expected) {
    if (std::isnan(expected)) {
        EXPECT_TRUE(std::isnan(actual));
    } else {
        EXPECT_EQ(tests::bits(actual), tests::bits(expected)) << actual << " for " << expected;
    }
}

double randomProgress(tests::Random& random) {
    switch (random.below(4)) {
        case 0: return static_cast<double>(random.below(17)) / 16;
        case 1: return static_cast<double>(random.below(97)) / 16 - 3;
        case 2: return random.anyDouble();
        default: return std::ldexp(static_cast<double>(random.word() >> 11), -53);
    }
}

}  // namespace

TEST(EasingFunction, HasItsNumberAndName) {
    struct Row {
        int number;
        EF function;
        char const* name;
    };
    std::vector<std::string> const names = easingFunctionNames();
    ASSERT_EQ(names.size(), 13u);
    for (Row const& row : {
             Row{0, EF::Linear, "Linear"},
             Row{1, EF::QuadraticIn, "Quadratic In"},
             Row{2, EF::QuadraticOut, "Quadratic Out"},
             Row{3, EF::QuadraticInOut, "Quadratic In-Out"},
             Row{4, EF::CubicIn, "Cubic In"},
             Row{5, EF::CubicOut, "Cubic Out"},
             Row{6, EF::CubicInOut, "Cubic In-Out"},
             Row{7, EF::ExponentialIn, "Exponential In"},
             Row{8, EF::ExponentialOut, "Exponential Out"},
             Row{9, EF::ExponentialInOut, "Exponential In-Out"},
             Row{10, EF::SinusoidalIn, "Sinusoidal In"},
             Row{11, EF::SinusoidalOut, "Sinusoidal Out"},
             Row{12, EF::SinusoidalInOut, "Sinusoidal In-Out"},
         }) {
        EXPECT_EQ(static_cast<int>(row.function), row.number);
        EXPECT_EQ(names[std::size_t(row.number)], row.name);
    }
    std::vector<std::string> changed = easingFunctionNames();
    changed[0] = "changed";
    EXPECT_EQ(easingFunctionNames()[0], "Linear");
    static_assert(std::is_same_v<std::underlying_type_t<EF>, std::int32_t>);
}

TEST(EasingFunction, IsPrintedByName) {
    std::vector<std::string> const names = easingFunctionNames();
    for (std::size_t i = 0; i < names.size(); ++i) {
        std::ostringstream stream;
        stream << EasingFunction(i);
        EXPECT_EQ(stream.str(), names[i]);
    }
    std::ostringstream others;
    others << EasingFunction(13) << " " << EasingFunction(-1);
    EXPECT_EQ(others.str(), "EasingFunction(13) EasingFunction(-1)");
}

TEST(EasingFunction, IsFoundByName) {
    std::vector<std::string> const names = easingFunctionNames();
    for (std::size_t i = 0; i < names.size(); ++i) {
        EXPECT_EQ(stringToEasingFunction(names[i]), EasingFunction(i)) << names[i];
    }
    for (char const* name :
         {"", "linear", "Linear ", " Linear", "Cubic", "Cubic In-out", "Bounce"}) {
        EXPECT_FALSE(stringToEasingFunction(name).hasValue()) << name;
    }
    EXPECT_FALSE(stringToEasingFunction(std::string("Linear\0", 7)).hasValue());
}

TEST(Ease, MatchesKnownPoints) {
    struct Row {
        EF function;
        double from, to, t, expected;
    };
    for (Row const& row : {
             Row{EF::Linear, 0, 10, 0.25, 2.5},     Row{EF::Linear, 0, 10, 1.5, 15},
             Row{EF::Linear, 0, 10, -1, -10},       Row{EF::QuadraticIn, 0, 8, 0.5, 2},
             Row{EF::QuadraticOut, 0, 8, 0.5, 6},   Row{EF::QuadraticInOut, 0, 8, 0.25, 1},
             Row{EF::QuadraticInOut, 0, 8, 0.5, 4}, Row{EF::QuadraticInOut, 0, 8, 0.75, 7},
             Row{EF::CubicIn, 0, 8, 0.5, 1},        Row{EF::CubicOut, 0, 100, 0.5, 87.5},
             Row{EF::CubicInOut, 0, 32, 0.25, 2},   Row{EF::CubicInOut, 0, 32, 0.75, 30},
             Row{EF::ExponentialIn, 5, 9, 0, 5},    Row{EF::ExponentialIn, 0, 1, 1, 1},
             Row{EF::ExponentialOut, 5, 9, 1, 9},   Row{EF::ExponentialOut, 5, 9, 0, 5},
             Row{EF::ExponentialInOut, 5, 9, 0, 5}, Row{EF::ExponentialInOut, 5, 9, 0.5, 7},
             Row{EF::ExponentialInOut, 5, 9, 1, 9}, Row{EF::SinusoidalIn, 0, 1, 0, 0},
             Row{EF::SinusoidalOut, 0, 1, 1, 1},    Row{EF::SinusoidalInOut, 0, 1, 1, 1},
         }) {
        EXPECT_EQ(ease(row.function, row.from, row.to, row.t), row.expected)
            << easingFunctionNames()[std::size_t(row.function)] << " at " << row.t;
    }
}

TEST(Ease, ExponentialCurvesAreExactAtTheirEnds) {
    double const a = -0.0;
    double const b = 1e-320;
    EXPECT_EQ(tests::bits(ease(EF::ExponentialIn, a, 7.0, 0.0)), tests::bits(a));
    EXPECT_EQ(tests::bits(ease(EF::ExponentialIn, a, 7.0, -0.0)), tests::bits(a));
    EXPECT_EQ(tests::bits(ease(EF::ExponentialOut, 1e300, b, 1.0)), tests::bits(b));
    EXPECT_EQ(tests::bits(ease(EF::ExponentialInOut, a, 7.0, 0.0)), tests::bits(a));
    EXPECT_EQ(tests::bits(ease(EF::ExponentialInOut, 1e300, b, 1.0)), tests::bits(b));
    EXPECT_EQ(ease(EF::ExponentialIn, LLONG_MAX, 0LL, 0.0), LLONG_MAX);
    EXPECT_EQ(ease(EF::ExponentialOut, 0LL, LLONG_MAX, 1.0), LLONG_MAX);
    EXPECT_EQ(ease(EF::ExponentialInOut, LLONG_MAX - 1, 0LL, 0.0), LLONG_MAX - 1);
    EXPECT_EQ(ease(EF::ExponentialInOut, 0LL, LLONG_MAX - 1, 1.0), LLONG_MAX - 1);
}

TEST(Ease, DoublesMatchTheFormulaToTheLastBit) {
    tests::Random random(51);
    for (int i = 0; i < 200000; ++i) {
        bool const wild = random.below(4) == 0;
        double const from = wild ? random.anyDouble() : random.number() / 3;
        double const to = wild ? random.anyDouble() : random.number() / 7;
        double const t = randomProgress(random);
        int const f = static_cast<int>(random.below(kCurves));
        SCOPED_TRACE(testing::Message() << f << ": " << from << " to " << to << " at " << t);
        expectSame(ease(EF(f), from, to, t), curve(f, from, to, t));
        if (f == 9) expectSame(easeExponentialInOut(from, to, t), curve(f, from, to, t));
        if (HasFailure()) return;
    }
}

TEST(Ease, IntegersAreTruncatedTowardsZero) {
    struct Row {
        char const* what;
        EF function;
        long long from, to;
        double t;
        long long expected;
    };
    for (Row const& row : {
             Row{"not rounded", EF::Linear, 0, 10, 0.99, 9},
             Row{"negative", EF::Linear, 0, -10, 0.99, -9},
             Row{"midpoint 1, first half", EF::ExponentialInOut, 0, 3, 0.49, 0},
             Row{"midpoint 1", EF::ExponentialInOut, 0, 3, 0.5, 1},
             Row{"midpoint 1, second half", EF::ExponentialInOut, 0, 3, 0.51, 1},
             Row{"end", EF::ExponentialInOut, 0, 3, 1, 3},
             Row{"NaN", EF::Linear, 5, 10, NAN, 0},
             Row{"too far", EF::Linear, 0, 10, 1e30, LLONG_MAX},
             Row{"too far back", EF::Linear, 0, 10, -1e30, LLONG_MIN},
             Row{"difference that wraps", EF::Linear, LLONG_MIN, LLONG_MAX, 1.0, LLONG_MIN},
             // -2^63 is its own negative in 64 bits: (0.5 - 2) * (-2^63 * 0.5).
             Row{"the middle of such a difference", EF::QuadraticInOut, 0, LLONG_MIN, 0.5,
                 4611686018427387904},
             Row{"difference that is its own negative", EF::QuadraticOut, 0, LLONG_MIN, 0.5,
                 6917529027641081856},
             Row{"quadratic", EF::QuadraticOut, 0, 100, 0.5, 75},
             Row{"sinusoidal", EF::SinusoidalIn, 0, 100, 0.5, 29},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(ease(row.function, row.from, row.to, row.t), row.expected);
    }
}

TEST(Ease, IntegersMatchTheFormula) {
    tests::Random random(52);
    for (int i = 0; i < 200000; ++i) {
        bool const wild = random.below(3) == 0;
        auto const number = [&] {
            return wild ? static_cast<long long>(random.word())
                        : static_cast<long long>(random.below(2001)) - 1000;
        };
        long long const from = number();
        long long const to = number();
        double const t = randomProgress(random);
        int const f = static_cast<int>(random.below(kCurves));
        ASSERT_EQ(ease(EF(f), from, to, t), integerCurve(f, from, to, t))
            << f << ": " << from << " to " << to << " at " << t;
        if (f == 9) {
            ASSERT_EQ(easeExponentialInOut(from, to, t), integerCurve(f, from, to, t));
        }
    }
}

TEST(Ease, VectorsAreEasedByComponent) {
    tests::Random random(53);
    for (int i = 0; i < 100000; ++i) {
        double from[4];
        double to[4];
        bool const wild = random.below(4) == 0;
        for (double& d : from) d = wild ? random.anyDouble() : random.number() / 3;
        for (double& d : to) d = wild ? random.anyDouble() : random.number() / 7;
        double const t = randomProgress(random);
        int const f = static_cast<int>(random.below(kCurves));
        SCOPED_TRACE(testing::Message() << f << " at " << t);
        FloatVec4 const a{from[0], from[1], from[2], from[3]};
        FloatVec4 const b{to[0], to[1], to[2], to[3]};
        FloatVec4 const four = ease(EF(f), a, b, t);
        FloatVec3 const three = ease(EF(f), FloatVec3{a.x, a.y, a.z}, FloatVec3{b.x, b.y, b.z}, t);
        FloatVec2 const two = ease(EF(f), FloatVec2{a.x, a.y}, FloatVec2{b.x, b.y}, t);
        for (double x : {four.x, three.x, two.x}) expectSame(x, curve(f, a.x, b.x, t));
        for (double y : {four.y, three.y, two.y}) expectSame(y, curve(f, a.y, b.y, t));
        for (double z : {four.z, three.z}) expectSame(z, curve(f, a.z, b.z, t));
        expectSame(four.w, curve(f, a.w, b.w, t));
        if (f == 9) {
            expectSame(easeExponentialInOut(a, b, t).w, four.w);
            expectSame(
                easeExponentialInOut(FloatVec3{a.x, a.y, a.z}, FloatVec3{b.x, b.y, b.z}, t).z,
                three.z);
            expectSame(easeExponentialInOut(FloatVec2{a.x, a.y}, FloatVec2{b.x, b.y}, t).y, two.y);
        }
        if (HasFailure()) return;
    }
}

template <class T>
void expectEachIsTheSingleOne(T const& from, T const& to) {
    tests::Random random(16);
    std::vector<double> progress{0.0, -0.0, 0.5, 1.0, -1.0, 1.5, NAN, INFINITY, -INFINITY, 5e-324};
    while (progress.size() < 150)
        progress.push_back(static_cast<double>(random.below(30001)) / 10000.0 - 1.0);
    for (int f = -1; f <= kCurves; ++f) {
        // Around the block size of the implementation.
        for (std::size_t const count : {0u, 1u, 31u, 32u, 33u, 64u, 65u, 150u}) {
            SCOPED_TRACE("curve " + std::to_string(f) + ", " + std::to_string(count));
            std::vector<T> results(count + 1, from);
            easeEach(EF(f), from, to, progress.data(), count, results.data());
            for (std::size_t i = 0; i < count; ++i) {
                T const single = ease(EF(f), from, to, progress[i]);
                ASSERT_EQ(std::memcmp(&results[i], &single, sizeof(T)), 0) << progress[i];
            }
            // Nothing is written past the end.
            ASSERT_EQ(std::memcmp(&results[count], &from, sizeof(T)), 0);
        }
    }
}

TEST(EaseEach, MatchesSingleCallsBitForBit) {
    expectEachIsTheSingleOne(3.0, 7.25);
    expectEachIsTheSingleOne(1e300, -1e300);
    expectEachIsTheSingleOne<long long>(-7, 1000000);
    expectEachIsTheSingleOne(LLONG_MIN, LLONG_MAX);
    expectEachIsTheSingleOne(FloatVec2{1, -2}, FloatVec2{0.1, 0.3});
    expectEachIsTheSingleOne(FloatVec3{1, -2, 3}, FloatVec3{0.1, 0.3, -0.7});
    expectEachIsTheSingleOne(FloatVec4{1, -2, 3, -4}, FloatVec4{0.1, 0.3, -0.7, 1e9});
}

TEST(EaseEach, MayOverwriteItsInput) {
    for (int f = 0; f < kCurves; ++f) {
        std::vector<double> progress;
        for (int i = 0; i < 100; ++i) progress.push_back(i * 0.01);
        std::vector<double> expected;
        for (double const t : progress) expected.push_back(ease(EF(f), 3.0, 7.0, t));
        easeEach(EF(f), 3.0, 7.0, progress.data(), progress.size(), progress.data());
        EXPECT_EQ(progress, expected);
    }
}

TEST(Ease, UndefinedEnumeratorsStayAtTheStart) {
    for (int number : {-1, 13, 14, 1000, INT_MIN, INT_MAX}) {
        EF const f = outOfRange(number);
        EXPECT_EQ(ease(f, 5.0, 9.0, 0.5), 5.0);
        EXPECT_EQ(ease(f, LLONG_MAX, 9LL, 0.5), LLONG_MAX);
        EXPECT_EQ(ease(f, FloatVec2{1, 2}, FloatVec2{3, 4}, 0.5), (FloatVec2{1, 2}));
        EXPECT_EQ(ease(f, FloatVec3{1, 2, 3}, FloatVec3{}, 0.5), (FloatVec3{1, 2, 3}));
        EXPECT_EQ(ease(f, FloatVec4{1, 2, 3, 4}, FloatVec4{}, 0.5), (FloatVec4{1, 2, 3, 4}));
        EXPECT_EQ(ease(f, Value("5"), Value(9.0), 0.5), Value(5.0));
        EXPECT_EQ(ease(f, Value(5.0), Value("9"), 0.5), Value(0.0));
    }
}

TEST(Ease, PropagatesNaNProgress) {
    for (int f = 0; f < kCurves; ++f) {
        EXPECT_TRUE(std::isnan(ease(EF(f), 1.0, 2.0, double(NAN)))) << f;
        EXPECT_TRUE(std::isnan(ease(EF(f), FloatVec2{1, 2}, FloatVec2{3, 4}, double(NAN)).y)) << f;
        EXPECT_EQ(ease(EF(f), 1LL, 2LL, double(NAN)), 0) << f;
    }
}

TEST(EaseValue, MatchesTheCurvesOfEachType) {
    tests::Random random(54);
    for (int i = 0; i < 20000; ++i) {
        double const t = randomProgress(random);
        EF const f = EF(random.below(kCurves));
        FloatVec4 const a{random.number(), random.number(), random.number(), random.number()};
        FloatVec4 const b{random.number(), random.number(), random.number(), random.number()};
        SCOPED_TRACE(testing::Message() << int(f) << " at " << t);
        FloatVec3 const a3{a.x, a.y, a.z};
        FloatVec3 const b3{b.x, b.y, b.z};
        FloatVec4 const four = ease(f, Value(a), Value(b), t);
        FloatVec4 const expected = ease(f, a, b, t);
        expectSame(four.x, expected.x);
        expectSame(four.w, expected.w);
        expectSame(FloatVec3(ease(f, Value(a3), Value(b3), t)).z, expected.z);
        expectSame(FloatVec2(ease(f, Value(a3), Value(FloatVec2{b.x, b.y}), t)).y, expected.y);
        expectSame(double(ease(f, Value(a), Value(b.x), t)), expected.x);
        long long const from = static_cast<long long>(a.x);
        long long const to = static_cast<long long>(b.x);
        EXPECT_EQ(static_cast<long long>(ease(f, Value(from), Value(to), t)), ease(f, from, to, t));
        for (Value const& end : {Value(true), Value("9"), Value(Path()), Value(FloatMat4()),
                                 Value::Image(9), Value(Unstructured(9.0))}) {
            EXPECT_EQ(ease(f, Value(a), end, t), Value(0.0));
            EXPECT_EQ(ease(f, end, end, t), Value(0.0));
        }
        if (HasFailure()) return;
    }
}

TEST(EaseValue, TheTypeOfTheEndDecides) {
    struct Row {
        char const* what;
        Value from;
        Value to;
        Value expected;
    };
    FloatMat4 const matrix;
    for (Row const& row : {
             Row{"doubles", 0.0, 10.0, 5.0},
             Row{"double to integer", 1.5, 10, 5},
             Row{"integer to double", 1, 10.0, 5.5},
             Row{"string to double", "4", 10.0, 7.0},
             Row{"nonsense to double", "four", 10.0, 5.5},
             Row{"vectors", FloatVec2{0, 2}, FloatVec2{10, 4}, FloatVec2{5, 3}},
             Row{"double to vector", 2.0, FloatVec3{4, 6, 8}, FloatVec3{3, 4, 5}},
             Row{"vector to double", FloatVec3{2, 9, 9}, 4.0, 3.0},
             Row{"bool to vector", true, FloatVec4{3, 3, 3, 3}, FloatVec4{2, 2, 2, 2}},
             Row{"shorter vector", FloatVec2{2, 2}, FloatVec4{4, 4, 4, 4}, FloatVec4{3, 3, 2, 2}},
             Row{"path to integer", Path(), 10, 5},
             Row{"bool", 1.0, true, 0.0},
             Row{"matrix", matrix, matrix, 0.0},
             Row{"image", 5.0, Value::Image(4), 0.0},
             Row{"video", 5.0, Value::Video(4), 0.0},
             Row{"sound", 5.0, Value::Sound(4), 0.0},
             Row{"model", 5.0, Value::Model(4), 0.0},
             Row{"path", 5.0, Path(), 0.0},
             Row{"string", "5", "5", 0.0},
             Row{"data", 5.0, Unstructured(5.0), 0.0},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(ease(EF::Linear, row.from, row.to, 0.5), row.expected);
    }
    EXPECT_EQ(ease(EF::CubicOut, Value(0.0), Value(100.0), 0.5), Value(87.5));
}
