#include <Engine/Base/value.h>

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>

#include "support/death.h"
#include "support/print.h"
#include "support/random.h"
#include "support/types.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <sstream>
#include <string>
#include <vector>

using namespace tarn::engine;

TEST(TypeInfo, IsAFloatWithoutBoundsByDefault) {
    TypeInfo const info;
    EXPECT_EQ(info.type, Type::Float);
    EXPECT_EQ(info.subtype, 0);
    EXPECT_FALSE(info.min.hasValue() || info.max.hasValue() || info.extra.hasValue());
    static_assert(std::is_aggregate_v<TypeInfo>);
    static_assert(std::is_same_v<decltype(info.subtype), unsigned char>);
    TypeInfo const all{Type::Int, 1, Value(1), std::nullopt, Value("x")};
    EXPECT_EQ(*reinterpret_cast<unsigned char const*>(&all), 6);
    EXPECT_EQ(all.min.value(), Value(1));
    EXPECT_EQ(all.extra.value(), Value("x"));
}

TEST(TypeInfo, CopiesItsOptionalsAndReleasesTheLastFirst) {
    std::string released;
    auto const noted = [&released](char name) {
        return Value(std::shared_ptr<Path const>(new Path(), [&released, name](Path const* path) {
            released += name;
            delete path;
        }));
    };
    {
        TypeInfo copy;
        {
            TypeInfo const info{Type::Path, 0, noted('i'), noted('a'), noted('e')};
            copy = info;
            EXPECT_EQ(copy.max.value().ifPath(), info.max.value().ifPath());
        }
        EXPECT_EQ(released, "");
    }
    EXPECT_EQ(released, "eai");
}

TEST(TypeInfo, ComparesAllFields) {
    TypeInfo const base{Type::Float, 0, Value(0.0), Value(1.0), Value("e")};
    struct Row {
        char const* what;
        TypeInfo other;
        bool equal;
    };
    for (Row const& row : {
             Row{"same", {Type::Float, 0, Value(0.0), Value(1.0), Value("e")}, true},
             Row{"type", {Type::Int, 0, Value(0.0), Value(1.0), Value("e")}, false},
             Row{"subtype", {Type::Float, 1, Value(0.0), Value(1.0), Value("e")}, false},
             Row{"min", {Type::Float, 0, Value(0.5), Value(1.0), Value("e")}, false},
             Row{"min of another type", {Type::Float, 0, Value(0), Value(1.0), Value("e")}, false},
             Row{"no min", {Type::Float, 0, {}, Value(1.0), Value("e")}, false},
             Row{"max", {Type::Float, 0, Value(0.0), Value(2.0), Value("e")}, false},
             Row{"no max", {Type::Float, 0, Value(0.0), {}, Value("e")}, false},
             Row{"extra", {Type::Float, 0, Value(0.0), Value(1.0), Value("f")}, false},
             Row{"no extra", {Type::Float, 0, Value(0.0), Value(1.0), {}}, false},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(base == row.other, row.equal);
        EXPECT_EQ(row.other == base, row.equal);
        EXPECT_EQ(base != row.other, !row.equal);
    }
    EXPECT_EQ(TypeInfo(), TypeInfo());
    TypeInfo nan;
    nan.min = Value(double(NAN));
    EXPECT_NE(nan, TypeInfo(nan));
}

TEST(TypeInfo, PrintsOnlyItsType) {
    for (Type type : tests::kAllTypes) {
        std::ostringstream stream;
        EXPECT_EQ(&(stream << TypeInfo{type, 1, Value(0.0), Value(1.0), Value(2)}), &stream);
        EXPECT_EQ(stream.str(), "[type: " + typeToString(type) + "]");
    }
}

TEST(TypeInfo, NamesItsPort) {
    struct Row {
        Type type;
        int subtype;
        char const* plural;
        char const* singular;
    };
    for (Row const& row : {
             Row{Type::Float, 0, "Numbers", "Number"},
             Row{Type::Float, 1, "Numbers", "Number"},
             Row{Type::Int, 0, "Numbers", "Number"},
             Row{Type::Vec2, 0, "Positions", "Position"},
             Row{Type::Vec3, 0, "3D Points", "Point 3D"},
             Row{Type::Vec4, 0, "Colors", "Color"},
             Row{Type::Mat4, 0, "Matrices", "Matrix"},
             Row{Type::Boolean, 1, "Pulses", "Pulse"},
             Row{Type::Boolean, 0, "Booleans", "Boolean"},
             Row{Type::Boolean, 2, "Booleans", "Boolean"},
             Row{Type::Boolean, 255, "Booleans", "Boolean"},
             Row{Type::Image, 1, "Images", "Image"},
             Row{Type::Video, 0, "Videos", "Video"},
             Row{Type::Sound, 0, "Sounds", "Sound"},
             Row{Type::Path, 0, "Paths", "Path"},
             Row{Type::String, 0, "Strings", "String"},
             Row{Type::Model, 0, "Models", "Model"},
             Row{Type::Unstructured, 1, "Layers", "Layer"},
             Row{Type::Unstructured, 0, "Unstructured", "Unstructured"},
             Row{Type::Unstructured, 2, "Unstructured", "Unstructured"},
         }) {
        TypeInfo info;
        info.type = row.type;
        info.subtype = static_cast<unsigned char>(row.subtype);
        EXPECT_EQ(portNameForTypeInfo(info, true), row.plural);
        EXPECT_EQ(portNameForTypeInfo(info, false), row.singular);
    }
}

TEST(TypeInfo, SubtypesMatterForTwoTypesOnly) {
    for (Type type : tests::kAllTypes) {
        bool const marked = type == Type::Boolean || type == Type::Unstructured;
        for (int subtype = 0; subtype < 256; ++subtype) {
            TypeInfo info{type, static_cast<unsigned char>(subtype), {}, {}, {}};
            TypeInfo const plain{type, 0, {}, {}, {}};
            for (bool plural : {false, true}) {
                EXPECT_EQ(portNameForTypeInfo(info, plural) == portNameForTypeInfo(plain, plural),
                          !(marked && subtype == 1))
                    << typeToString(type) << " " << subtype;
            }
        }
    }
}

TEST(TypeInfoDeathTest, RejectsUndefinedEnumerators) {
    TypeInfo info;
    info.type = tests::kNoType;
    EXPECT_ENDS(portNameForTypeInfo(info, false),
                tests::failedAssertion("0", "portNameForTypeInfo", "Engine/Base/value"));
}

TEST(CastValueToType, ClampsFloatPortsWithoutConverting) {
    Optional<Value> const none;
    struct Row {
        char const* what;
        Value value;
        Optional<Value> min;
        Optional<Value> max;
        char from;
    };
    for (Row const& row : {
             Row{"no bounds", -3.0, none, none, 'v'},
             Row{"below", -3.0, Value(0.0), none, '<'},
             Row{"above", 3.0, none, Value(1.0), '>'},
             Row{"inside", 0.5, Value(0.0), Value(1.0), 'v'},
             Row{"at min", 0.0, Value(0.0), Value(1.0), 'v'},
             Row{"at max", 1.0, Value(0.0), Value(1.0), 'v'},
             Row{"negative zero at min", -0.0, Value(0.0), none, 'v'},
             Row{"crossed bounds, below both", 0.0, Value(5.0), Value(2.0), '<'},
             Row{"crossed bounds, between", 3.0, Value(5.0), Value(2.0), '<'},
             Row{"crossed bounds, at min", 5.0, Value(5.0), Value(2.0), '>'},
             Row{"crossed bounds, above both", 6.0, Value(5.0), Value(2.0), '>'},
             Row{"NaN", NAN, Value(0.0), Value(1.0), 'v'},
             Row{"NaN bounds", 5.0, Value(double(NAN)), Value(double(NAN)), 'v'},
             Row{"string above", "7", none, Value(5.0), '>'},
             Row{"string inside", "3", none, Value(5.0), 'v'},
             Row{"integer bound", 9.5, none, Value(5), '>'},
             Row{"string bound", 9.5, none, Value("5"), '>'},
             Row{"vector by its x", FloatVec2{-1, 9}, Value(0.0), none, '<'},
             Row{"true by its number", true, none, Value(0.5), '>'},
         }) {
        SCOPED_TRACE(row.what);
        TypeInfo const info{Type::Float, 0, row.min, row.max, {}};
        Value const* const expected = row.from == '<'   ? &info.min.value()
                                      : row.from == '>' ? &info.max.value()
                                                        : &row.value;
        EXPECT_EQ(&castValueToType(row.value, info), expected);
        Value argument = row.value;
        Value const copy = castValueToType(std::move(argument), info);
        EXPECT_EQ(copy.type(), expected->type());
        EXPECT_EQ(to_string(copy), to_string(*expected));
        // Copied, not moved.
        EXPECT_EQ(to_string(argument), to_string(row.value));  // NOLINT(bugprone-use-after-move)
    }
}

TEST(CastValueToType, CopiesNothingAndNeverClampsOtherPorts) {
    Value const value = -3.0;
    Value const text = "-3";
    for (Type type : tests::kAllTypes) {
        TypeInfo const info{type, 0, Value(0.0), Value(1.0), {}};
        EXPECT_EQ(&castValueToType(value, info), type == Type::Float ? &info.min.value() : &value);
    }
    Value argument = text;
    EXPECT_EQ(castValueToType(std::move(argument), TypeInfo()).ifString(), text.ifString());
    EXPECT_EQ(argument.ifString(), text.ifString());  // NOLINT(bugprone-use-after-move)
}

TEST(IndexLoopCasting, WrapsAroundAndClamps) {
    Loop const loop{10.0, "20", 30};
    TypeInfo const plain{Type::String, 0, {}, {}, {}};
    TypeInfo const bounded{Type::Float, 0, Value(15.0), Value(25.0), {}};
    EXPECT_EQ(&indexLoopCasting(loop, plain, 0), &loop[0]);
    EXPECT_EQ(&indexLoopCasting(loop, plain, 7), &loop[1]);
    EXPECT_EQ(&indexLoopCasting(loop, plain, ULLONG_MAX), &loop[ULLONG_MAX % 3]);
    EXPECT_EQ(&indexLoopCasting(loop, bounded, 3), &bounded.min.value());
    EXPECT_EQ(&indexLoopCasting(loop, bounded, 4), &loop[1]);
    EXPECT_EQ(&indexLoopCasting(loop, bounded, 5), &bounded.max.value());
}

TEST(IndexLoopCasting, ARangeMatchesSingleIndices) {
    TypeInfo const bounded{Type::Float, 0, Value(1.0), Value(2.0), {}};
    TypeInfo const plain;
    for (Loop const& loop : {Loop(), Loop{0.5}, Loop{0.5, 1.5, 2.5}, Loop(100, 0.5)}) {
        for (unsigned long long const first : {0ULL, 1ULL, 250ULL, ULLONG_MAX - 3, ULLONG_MAX}) {
            for (std::size_t const count : {0u, 1u, 2u, 7u, 300u}) {
                for (TypeInfo const* const info : {&bounded, &plain}) {
                    SCOPED_TRACE(std::to_string(loop.size()) + " from " + std::to_string(first));
                    std::vector<Value const*> results(count + 1, nullptr);
                    indexLoopCasting(loop, *info, first, count, results.data());
                    for (std::size_t i = 0; i < count; ++i) {
                        ASSERT_EQ(results[i], &indexLoopCasting(loop, *info, first + i)) << i;
                    }
                    ASSERT_EQ(results[count], nullptr);
                }
            }
        }
    }
}

TEST(IndexLoopCasting, TreatsAnEmptyLoopAsZero) {
    TypeInfo const plain;
    TypeInfo const bounded{Type::Float, 0, Value(1.0), {}, {}};
    Value const& zero = indexLoopCasting(nullLoop(), plain, 5);
    EXPECT_EQ(zero, Value(0.0));
    EXPECT_EQ(&zero, &indexLoopCasting(Loop(), plain, 9));
    EXPECT_EQ(&indexLoopCasting(nullLoop(), bounded, 5), &bounded.min.value());
}

TEST(NullLoop, IsTheSameEmptyLoopEveryTime) {
    EXPECT_TRUE(nullLoop().empty());
    EXPECT_EQ(&nullLoop(), &nullLoop());
}

// The definition of clamping: the lower bound is tested first.
TEST(CastValueToType, AgreesWithAModelOnRandomNumbers) {
    tests::Random random(15);
    for (int i = 0; i < 100000; ++i) {
        double const value = random.chance() ? random.anyDouble() : double(random.below(4));
        double const low = random.chance() ? random.anyDouble() : double(random.below(4));
        double const high = random.chance() ? random.anyDouble() : double(random.below(4));
        TypeInfo info;
        if (random.chance()) info.min = Value(low);
        if (random.chance()) info.max = Value(high);
        double expected = value;
        if (info.max && value > high) expected = high;
        if (info.min && value < low) expected = low;
        ASSERT_EQ(tests::bits(double(castValueToType(Value(value), info))), tests::bits(expected))
            << value << " in " << low << ", " << high;
    }
}
