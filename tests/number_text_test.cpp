#include <Engine/Base/value.h>

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>

#include "support/locales.h"
#include "support/number_text.h"
#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <cfenv>
#include <climits>
#include <cmath>
#include <iomanip>
#include <sstream>
#include <string>

using namespace tarn::engine;

TEST(NumberText, HasNoTrailingZeros) {
    struct Row {
        double number;
        char const* text;
    };
    for (Row const& row : {
             Row{3.0, "3"},
             Row{2.5, "2.5"},
             Row{0.5, "0.5"},
             Row{1234.56, "1234.6"},
             Row{999.999, "1000"},
             Row{100.0, "100"},
             Row{-0.001, "0"},
             Row{1000.0, "1000"},
             Row{999.994, "999.99"},
             Row{-1234.56, "-1234.6"},
             Row{-0.0, "0"},
             Row{-0.004, "0"},
             Row{-0.006, "-0.01"},
             Row{0.0, "0"},
             Row{0.125, "0.12"},
             Row{0.375, "0.38"},
             Row{0.005, "0.01"},
             Row{0.015, "0.01"},
             Row{999.995, "1000"},
             Row{1000.05, "1000"},
             Row{1000.25, "1000.2"},
             Row{-999.999, "-1000"},
             Row{20.0, "20"},
             Row{-1000.0, "-1000"},
             Row{1e15, "1000000000000000"},
             Row{5e-324, "0"},
             Row{-5e-324, "0"},
             Row{0.1, "0.1"},
             Row{10.10, "10.1"},
             Row{100.05, "100.05"},
         }) {
        EXPECT_EQ(to_string(Value(row.number)), row.text) << row.number;
    }
}

TEST(NumberText, AppendTextMatchesToString) {
    Value const nullText = std::shared_ptr<Path const>();
    std::string text = "before ";
    std::string expected = text;
    for (Value const& value : {Value(),
                               Value(1234.56),
                               Value(-0.0),
                               Value(-0.001),
                               Value(1e300),
                               Value(double(NAN)),
                               Value(-double(INFINITY)),
                               Value(0LL),
                               Value(LLONG_MIN),
                               Value(LLONG_MAX),
                               Value(true),
                               Value(false),
                               Value(FloatVec2{1, 2.5}),
                               Value(FloatVec3{1, 2.5, -3}),
                               Value(FloatVec4{1, 2.5, -3, 1e6}),
                               Value(FloatMat4()),
                               Value::Image(ULLONG_MAX),
                               Value::Model(0),
                               Value("a string"),
                               Value(""),
                               Value(Path()),
                               nullText,
                               Value(PathBuilder().circle({0, 0}, 1).build()),
                               Value(Unstructured("a string of data")),
                               Value(Unstructured(1))}) {
        appendText(text, value);
        expected += to_string(value);
        ASSERT_EQ(text, expected);
    }
}

TEST(NumberText, IsCutAfter127Characters) {
    struct Row {
        char const* what;
        double number;
        std::size_t length;
    };
    for (Row const& row : {
             Row{"125 digits, the point and its zero", 1e125, 125},
             Row{"126 digits and the point", 1e126, 126},
             Row{"127 digits", std::ldexp(1.0, 421), 127},
             Row{"the sign and 125 digits and the point", -1e125, 126},
             Row{"the sign and 126 digits", -std::ldexp(1.0, 418), 127},
             Row{"128 digits", 2e127, 127},
             Row{"301 digits", 1e300, 127},
             Row{"the largest", -1.7976931348623157e308, 127},
         }) {
        SCOPED_TRACE(row.what);
        std::string const text = to_string(Value(row.number));
        EXPECT_EQ(text.size(), row.length);
        EXPECT_EQ(text.find('.'), std::string::npos);
        EXPECT_EQ(text, tests::modelNumberText(row.number, '.', '.'));
    }
}

TEST(NumberText, NonFiniteNumbersLookTheSameEverywhere) {
    EXPECT_EQ(to_string(Value(double(INFINITY))), "inf");
    EXPECT_EQ(to_string(Value(-double(INFINITY))), "-inf");
    EXPECT_EQ(to_string(Value(std::copysign(double(NAN), 1.0))), "nan");
    EXPECT_EQ(to_string(Value(std::copysign(double(NAN), -1.0))), "-nan");
}

TEST(NumberText, MatchesAnExactDecimalModel) {
    tests::Random random(128);
    for (int i = 0; i < 60000; ++i) {
        double const number = random.anyDouble();
        ASSERT_EQ(to_string(Value(number)), tests::modelNumberText(number, '.', '.'))
            << std::hexfloat << number;
    }
}

TEST(NumberText, ReadsTheDecimalPointOfCoutAtEachCall) {
    EXPECT_EQ(to_string(Value(2.5)), "2.5");
    {
        tests::CoutDecimalPoint comma(',');
        EXPECT_EQ(to_string(Value(2.5)), "2.50");
        EXPECT_EQ(to_string(Value(3.0)), "3.00");
        EXPECT_EQ(to_string(Value(-0.0)), "-0.00");
        EXPECT_EQ(to_string(FloatVec2{1, 2}), "1.00, 2.00");
        tests::CLocaleWithComma cComma;
        ASSERT_TRUE(cComma.isSet());
        EXPECT_EQ(to_string(Value(2.5)), "2,5");
        EXPECT_EQ(to_string(Value(-0.0)), "0");
        EXPECT_EQ(to_string(Value(1234.0)), "1234");
    }
    {
        tests::CLocaleWithComma cComma;
        ASSERT_TRUE(cComma.isSet());
        EXPECT_EQ(to_string(Value(2.5)), "2,50");
    }
    EXPECT_EQ(to_string(Value(2.5)), "2.5");
}

TEST(NumberText, MatchesTheModelForEveryPairOfDecimalPoints) {
    tests::Random random(44);
    for (char cout : {'.', ',', '\'', 'n'}) {
        tests::CoutDecimalPoint point(cout);
        for (int i = 0; i < 5000; ++i) {
            double const number = random.anyDouble();
            ASSERT_EQ(to_string(Value(number)), tests::modelNumberText(number, '.', cout))
                << std::hexfloat << number << " with " << cout;
        }
    }
    tests::CLocaleWithComma comma;
    ASSERT_TRUE(comma.isSet());
    for (char cout : {'.', ','}) {
        tests::CoutDecimalPoint point(cout);
        for (int i = 0; i < 5000; ++i) {
            double const number = random.anyDouble();
            ASSERT_EQ(to_string(Value(number)), tests::modelNumberText(number, ',', cout))
                << std::hexfloat << number << " with " << cout;
        }
    }
}

TEST(NumberText, FollowsTheRoundingMode) {
    struct Row {
        char const* what;
        int mode;
        char const* text;
        char const* negative;
    };
    for (Row const& row : {
             Row{"to the nearest", FE_TONEAREST, "0.12", "-0.12"},
#if defined(FE_UPWARD)  // Platforms with rounding modes.
                 Row{"up", FE_UPWARD, "0.13", "-0.12"}, Row{"down", FE_DOWNWARD, "0.12", "-0.13"},
                 Row{"towards zero", FE_TOWARDZERO, "0.12", "-0.12"},
#endif
         }) {
        SCOPED_TRACE(row.what);
        ASSERT_EQ(std::fesetround(row.mode), 0);
        if (std::fegetround() != row.mode) GTEST_SKIP() << "there is one rounding mode alone";
        std::string const text = to_string(Value(0.125));
        std::string const negative = to_string(Value(-0.125));
        std::fesetround(FE_TONEAREST);
        EXPECT_EQ(text, row.text);
        EXPECT_EQ(negative, row.negative);

        tests::Random random(29);
        for (int i = 0; i < 20000; ++i) {
            double const number = random.anyDouble();
            std::fesetround(row.mode);
            std::string const anyText = to_string(Value(number));
            std::fesetround(FE_TONEAREST);
            ASSERT_EQ(anyText, tests::modelNumberText(number, '.', '.', row.mode))
                << std::hexfloat << number;
        }
    }
}

TEST(NumberText, IsExactForManyDigits) {
    struct Row {
        double number;
        char const* text;
    };
    for (Row const& row : {
             Row{4503599627370495.5, "4503599627370495.5"},
             Row{4503599627370496.0, "4503599627370496"},
             Row{-4503599627370497.0, "-4503599627370497"},
             Row{2251799813685247.75, "2251799813685247.8"},
             Row{2251799813685247.25, "2251799813685247.2"},
             Row{9007199254740993.0, "9007199254740992"},
             Row{1e22, "10000000000000000000000"},
         }) {
        EXPECT_EQ(to_string(Value(row.number)), row.text);
    }
}

TEST(NumberText, IgnoresStreamFlags) {
    std::ostringstream stream;
    stream << std::setprecision(10) << std::scientific << Value(2.5) << std::hex << Value(255);
    EXPECT_EQ(stream.str(), "2.5255");
}
