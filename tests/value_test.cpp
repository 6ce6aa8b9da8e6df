#include <Engine/Base/value.h>

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>

#include "support/allocations.h"
#include "support/death.h"
#include "support/locales.h"
#include "support/print.h"
#include "support/random.h"
#include "support/types.h"

#include <gtest/gtest.h>

#include <array>
#include <cerrno>
#include <climits>
#include <cmath>
#include <cstring>
#include <functional>
#include <set>
#include <sstream>
#include <unordered_set>
#include <vector>

using namespace tarn::engine;

namespace {

FloatMat4 countingMatrix() {
    FloatMat4 matrix;
    for (int i = 0; i < 16; ++i) matrix.elements[i] = i + 0.5;
    return matrix;
}

FloatMat4 identityMatrix() { return {{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}}; }

bool sameBytes(FloatMat4 const& a, FloatMat4 const& b) {
    return std::memcmp(&a, &b, sizeof a) == 0;
}

Path linePath() { return PathBuilder().moveTo({1, 2}).lineTo({3, 4}).build(); }

Unstructured smallMap() {
    return Unstructured::Map{{"X", 1.5}, {"Y", 2}, {"Z", "no"}, {"W", Unstructured(7u)}};
}

Value movedFrom(Value value) {
    Value taken = std::move(value);
    return value;  // NOLINT(bugprone-use-after-move): what is left is what is tested.
}

// A value of each type, not zero, and unstructured data of two kinds.
std::vector<Value> everyAlternative() {
    return {7,
            2.5,
            FloatVec2{1, 2},
            FloatVec3{1, 2, 3},
            FloatVec4{1, 2, 3, 4},
            countingMatrix(),
            true,
            Value::Image(11),
            Value::Video(12),
            Value::Sound(13),
            Value::Model(14),
            linePath(),
            smallMap(),
            Unstructured("s"),
            "15"};
}

// The address of shared content.
void const* payload(Value const& value) {
    if (void const* path = value.ifPath()) return path;
    if (void const* text = value.ifString()) return text;
    if (void const* data = value.ifUnstructured()) return data;
    return value.asFloatMat4();
}

Value nullPath() { return Value(std::shared_ptr<Path const>()); }
Value nullMatrix() { return movedFrom(countingMatrix()); }
Value nullString() { return movedFrom("text"); }
Value nullData() { return movedFrom(Unstructured(5)); }

}  // namespace

TEST(Type, HasItsNumberNameAndProperties) {
    struct Row {
        int number;
        Type type;
        char const* name;
        bool resource;
        bool copied;
    };
    for (Row const& row : {
             Row{0, Type::Float, "float", false, true},
             Row{1, Type::Vec2, "vec2", false, true},
             Row{2, Type::Vec3, "vec3", false, true},
             Row{3, Type::Vec4, "vec4", false, true},
             Row{4, Type::Mat4, "mat4", false, true},
             Row{5, Type::Boolean, "boolean", false, true},
             Row{6, Type::Int, "int", false, true},
             Row{7, Type::Image, "image", true, true},
             Row{8, Type::Video, "video", true, true},
             Row{9, Type::Sound, "sound", true, true},
             Row{10, Type::Path, "path", false, false},
             Row{11, Type::String, "string", false, true},
             Row{12, Type::Model, "model", true, false},
             Row{13, Type::Unstructured, "unstructured", false, false},
         }) {
        SCOPED_TRACE(row.name);
        EXPECT_EQ(static_cast<int>(row.type), row.number);
        EXPECT_EQ(typeToString(row.type), row.name);
        ASSERT_TRUE(stringToType(row.name).hasValue());
        EXPECT_EQ(stringToType(row.name).value(), row.type);
        EXPECT_EQ(typeIsResource(row.type), row.resource);
        EXPECT_EQ(typeShouldCopyAcrossDeletedConnections(row.type), row.copied);
    }
    static_assert(std::is_same_v<std::underlying_type_t<Type>, unsigned char>);
}

TEST(Type, IsNotFoundByAnyOtherName) {
    for (char const* name : {"Float", " int", "int ", "", "float4", "vec", "UNSTRUCTURED"}) {
        EXPECT_FALSE(stringToType(name).hasValue()) << name;
    }
    EXPECT_FALSE(stringToType(std::string("int\0", 4)).hasValue());
}

TEST(Type, UndefinedEnumeratorsHaveNoProperties) {
    for (int byte = 14; byte < 256; ++byte) {
        EXPECT_FALSE(typeIsResource(Type(byte))) << byte;
        EXPECT_FALSE(typeShouldCopyAcrossDeletedConnections(Type(byte))) << byte;
    }
}

TEST(TypeDeathTest, RejectsUndefinedEnumerators) {
    EXPECT_ENDS(typeToString(tests::kNoType),
                tests::failedAssertion("0", "typeToString", "Engine/Base/value"));
}

TEST(TarnType, MapsCppTypesToTypes) {
    static_assert(TarnType<double>() == Type::Float);
    static_assert(TarnType<FloatVec2>() == Type::Vec2);
    static_assert(TarnType<FloatVec3>() == Type::Vec3);
    static_assert(TarnType<FloatVec4>() == Type::Vec4);
    static_assert(TarnType<FloatMat4>() == Type::Mat4);
    static_assert(TarnType<bool>() == Type::Boolean);
    static_assert(TarnType<long long>() == Type::Int);
    static_assert(TarnType<unsigned long long>() == Type::Image);
    static_assert(TarnType<Path>() == Type::Path);
    static_assert(TarnType<std::string>() == Type::String);
    static_assert(TarnType<Unstructured>() == Type::Unstructured);
}

TEST(Vectors, CompareAsFloatingPointNumbers) {
    EXPECT_TRUE((FloatVec2{1, 0.0} == FloatVec2{1, -0.0}));
    EXPECT_TRUE((FloatVec2{1, 2} != FloatVec2{1, 3}));
    EXPECT_TRUE((FloatVec2{0, 2} != FloatVec2{1, 2}));
    EXPECT_TRUE((FloatVec2{NAN, 0} != FloatVec2{NAN, 0}));
    EXPECT_FALSE((FloatVec2{NAN, 0} == FloatVec2{NAN, 0}));
    EXPECT_TRUE((FloatVec3{1, 2, 3} == FloatVec3{1, 2, 3}));
    EXPECT_TRUE((FloatVec3{1, 2, 3} != FloatVec3{1, 2, 4}));
    EXPECT_TRUE((FloatVec3{1, 0, 3} != FloatVec3{1, 2, 3}));
    EXPECT_TRUE((FloatVec3{0, 2, 3} != FloatVec3{1, 2, 3}));
    EXPECT_TRUE((FloatVec4{1, 2, 3, 4} == FloatVec4{1, 2, 3, 4}));
    EXPECT_TRUE((FloatVec4{0, 2, 3, 4} != FloatVec4{1, 2, 3, 4}));
    EXPECT_TRUE((FloatVec4{1, 0, 3, 4} != FloatVec4{1, 2, 3, 4}));
    EXPECT_TRUE((FloatVec4{1, 2, 0, 4} != FloatVec4{1, 2, 3, 4}));
    EXPECT_TRUE((FloatVec4{1, 2, 3, 0} != FloatVec4{1, 2, 3, 4}));
    static_assert(sizeof(FloatVec2) == 16 && sizeof(FloatVec3) == 24 && sizeof(FloatVec4) == 32);
    static_assert(std::is_aggregate_v<FloatVec2> && std::is_aggregate_v<FloatMat4>);
}

TEST(Value, StoresEverySourceAsItsType) {
    struct Row {
        char const* what;
        Value value;
        Type type;
        std::string text;
    };
    char buffer[] = "buffer";
    for (Row const& row : {
             Row{"nothing", Value(), Type::Float, "0"},
             Row{"double", Value(3.0), Type::Float, "3"},
             Row{"float", Value(0.5f), Type::Float, "0.5"},
             Row{"long long", Value(3LL), Type::Int, "3"},
             Row{"int", Value(5), Type::Int, "5"},
             Row{"int64", Value(std::int64_t(-5)), Type::Int, "-5"},
             Row{"short", Value(short(6)), Type::Int, "6"},
             Row{"signed char", Value(static_cast<signed char>(-7)), Type::Int, "-7"},
             Row{"bool", Value(true), Type::Boolean, "1"},
             Row{"vector of 2", Value(FloatVec2{1, 2}), Type::Vec2, "1, 2"},
             Row{"vector of 3", Value(FloatVec3{1, 2, 3}), Type::Vec3, "1, 2, 3"},
             Row{"vector of 4", Value(FloatVec4{1, 2, 3, 4}), Type::Vec4, "1, 2, 3, 4"},
             Row{"matrix", Value(FloatMat4()), Type::Mat4,
                 "0 0 0 0 \n0 0 0 0 \n0 0 0 0 \n0 0 0 0 \n"},
             Row{"literal", Value("text"), Type::String, "text"},
             Row{"char array", Value(buffer), Type::String, "buffer"},
             Row{"null string", Value(static_cast<char const*>(nullptr)), Type::String, ""},
             Row{"string", Value(std::string("a\0b", 3)), Type::String, std::string("a\0b", 3)},
             Row{"path", Value(linePath()), Type::Path, "Path"},
             Row{"shared path", Value(Path::EmptyPath()), Type::Path, "Empty Path"},
             Row{"null path", nullPath(), Type::Path, "Empty Path"},
             Row{"data", Value(smallMap()), Type::Unstructured, "unstructured"},
             Row{"image", Value(5, Type::Image), Type::Image, "5"},
             Row{"video", Value(6, Type::Video), Type::Video, "6"},
             Row{"sound", Value(7, Type::Sound), Type::Sound, "7"},
             Row{"model", Value(ULLONG_MAX, Type::Model), Type::Model, "18446744073709551615"},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.value.type(), row.type);
        EXPECT_EQ(to_string(row.value), row.text);
    }
    EXPECT_EQ(tests::bits(double(Value())), tests::bits(0.0));
}

TEST(Value, FactoriesMatchTheConstructor) {
    EXPECT_EQ(Value::ResourceID<Type::Image>().id, 0u);
    EXPECT_EQ(Value::Image(42), Value(42, Type::Image));
    EXPECT_EQ(Value::Video(42), Value(42, Type::Video));
    EXPECT_EQ(Value::Sound(42), Value(42, Type::Sound));
    EXPECT_EQ(Value::Model(42), Value(42, Type::Model));
}

TEST(ValueDeathTest, RejectsIdentifiersOfOtherTypes) {
    for (Type type : {Type::Float, Type::Vec2, Type::Vec3, Type::Vec4, Type::Mat4, Type::Boolean,
                      Type::Int, Type::Path, Type::String, Type::Unstructured, tests::kNoType}) {
        SCOPED_TRACE(int(type));
        EXPECT_ENDS(Value(5, type), tests::failedAssertion("0", "Value", "Engine/Base/value", 161));
    }
}

TEST(Value, DefaultsAreNeutral) {
    struct Row {
        Type type;
        Value expected;
    };
    for (Row const& row : {
             Row{Type::Float, 0.0},
             Row{Type::Vec2, FloatVec2{0, 0}},
             Row{Type::Vec3, FloatVec3{0, 0, 0}},
             Row{Type::Vec4, FloatVec4{0, 0, 0, 0}},
             Row{Type::Mat4, identityMatrix()},
             Row{Type::Boolean, false},
             Row{Type::Int, 0},
             Row{Type::Image, Value::Image(0)},
             Row{Type::Video, Value::Video(0)},
             Row{Type::Sound, Value::Sound(0)},
             Row{Type::Path, Path()},
             Row{Type::String, ""},
             Row{Type::Model, Value::Model(0)},
             Row{Type::Unstructured, Unstructured::Undefined()},
         }) {
        SCOPED_TRACE(typeToString(row.type));
        EXPECT_EQ(Value::defaultValue(row.type), row.expected);
        EXPECT_EQ(Value::defaultValue(row.type).type(), row.type);
        for (int qualifier = 0; qualifier < 256; ++qualifier) {
            bool const opaque = row.type == Type::Vec4 && qualifier == 4;
            EXPECT_EQ(Value::defaultValue(row.type, static_cast<unsigned char>(qualifier)),
                      opaque ? Value(FloatVec4{0, 0, 0, 1}) : row.expected)
                << qualifier;
        }
    }
    // Returns a new payload at each call.
    Value const path = Value::defaultValue(Type::Path);
    EXPECT_NE(Value::defaultValue(Type::Path).ifPath(), path.ifPath());
    EXPECT_NE(Value::defaultValue(Type::Path).ifPath(), Path::EmptyPath().get());
    Value const matrix = Value::defaultValue(Type::Mat4);
    Value const text = Value::defaultValue(Type::String);
    Value const data = Value::defaultValue(Type::Unstructured);
    EXPECT_NE(Value::defaultValue(Type::Mat4).asFloatMat4(), matrix.asFloatMat4());
    EXPECT_NE(Value::defaultValue(Type::String).ifString(), text.ifString());
    EXPECT_NE(Value::defaultValue(Type::Unstructured).ifUnstructured(), data.ifUnstructured());
}

TEST(ValueDeathTest, HasNoDefaultForUndefinedEnumerators) {
    EXPECT_ENDS(Value::defaultValue(tests::kNoType),
                tests::failedAssertion("0", "defaultValue", "Engine/Base/value"));
}

TEST(Value, IsIndependentOfItsSource) {
    std::string text = "text";
    Path path = linePath();
    FloatMat4 matrix = countingMatrix();
    Value const ofText = text;
    Value const ofPath = path;
    Value const ofMatrix = matrix;
    text = "changed";
    path.elements.clear();
    matrix.elements[0] = 99;
    EXPECT_EQ(std::string(ofText), "text");
    EXPECT_EQ(Path(ofPath), linePath());
    EXPECT_TRUE(sameBytes(FloatMat4(ofMatrix), countingMatrix()));
}

TEST(Value, CopiesShareTheirPayload) {
    Value const text = "shared";
    Value const path = linePath();
    Value const data = smallMap();
    Value const matrix = countingMatrix();
    Value const textCopy = text;
    Value const pathCopy = path;
    Value const dataCopy = data;
    Value matrixCopy;
    matrixCopy = matrix;
    EXPECT_EQ(textCopy.ifString(), text.ifString());
    EXPECT_EQ(pathCopy.ifPath(), path.ifPath());
    EXPECT_EQ(dataCopy.ifUnstructured(), data.ifUnstructured());
    EXPECT_EQ(matrixCopy.asFloatMat4(), matrix.asFloatMat4());
}

TEST(Value, SharesAPathGivenByPointer) {
    auto const path = std::make_shared<Path const>(linePath());
    EXPECT_EQ(Value(path).ifPath(), path.get());
    EXPECT_EQ(Value(Path::EmptyPath()).ifPath(), Path::EmptyPath().get());
}

TEST(Value, PayloadsLiveAsLongAsTheLastCopy) {
    Value kept;
    {
        Value const first = std::string(100, 'x');
        kept = first;
    }
    EXPECT_EQ(std::string(kept), std::string(100, 'x'));
}

// conversions_test.cpp compares all other conversions with tables/conversions.json.
TEST(Value, ConvertsANaNToZeroAndTrue) {
    EXPECT_EQ(static_cast<long long>(Value(FloatVec2{NAN, 0})), 0);
    EXPECT_EQ(static_cast<long long>(Value(FloatVec3{NAN, 0, 0})), 0);
    EXPECT_EQ(static_cast<long long>(Value(FloatVec4{NAN, 0, 0, 0})), 0);
    Value const nan = NAN;
    EXPECT_EQ(static_cast<long long>(nan), 0);
    EXPECT_TRUE(std::isnan(double(nan)));
    EXPECT_TRUE(bool(nan));
    EXPECT_TRUE(bool(Value(Unstructured(double(NAN)))));
}

TEST(Value, ConvertsHugeNumbersInStringsToInfinity) {
    errno = 0;
    EXPECT_EQ(double(Value("1e999")), INFINITY);
    EXPECT_EQ(errno, 0);
    EXPECT_TRUE(std::isnan(double(Value("nan"))));
    EXPECT_EQ(static_cast<long long>(Value("nan")), 0);
}

TEST(Value, ConvertsDigitsToTheExactNumber) {
    tests::Random random(161);
    for (int i = 0; i < 100000; ++i) {
        double const number = random.anyDouble();
        if (!std::isfinite(number)) continue;
        char digits[64];
        std::snprintf(digits, sizeof digits, random.chance() ? "%.17g" : "%a", number);
        std::string const space = std::array<char const*, 3>{"", " ", "\n\t"}[random.below(3)];
        std::string const rest =
            std::array<std::string, 5>{"", "", " ", "q", std::string(1, '\0')}[random.below(5)];
        double const expected = rest.empty() ? number : 1.0;
        EXPECT_EQ(tests::bits(double(Value(space + digits + rest))), tests::bits(expected))
            << space << digits << rest;
    }
}

TEST(Value, ConvertsStringsWithTheDecimalPointOfTheCLibrary) {
    tests::CLocaleWithComma comma;
    ASSERT_TRUE(comma.isSet());
    EXPECT_EQ(double(Value("1,5")), 1.5);
    EXPECT_EQ(double(Value("1.5")), 1.0);
}

// Returns the type that it was called with.
struct Kinds {
    std::string operator()(long long const& i) const { return "integer " + std::to_string(i); }
    std::string operator()(double const& d) const { return "double " + to_string(Value(d)); }
    std::string operator()(FloatVec2 const& v) const { return "vec2 " + to_string(Value(v)); }
    std::string operator()(FloatVec3 const& v) const { return "vec3 " + to_string(Value(v)); }
    std::string operator()(FloatVec4 const& v) const { return "vec4 " + to_string(Value(v)); }
    std::string operator()(FloatMat4 const& m) const {
        return "matrix " + to_string(Value(m.elements[0])) + to_string(Value(m.elements[1]));
    }
    std::string operator()(bool const& b) const { return b ? "true" : "false"; }
    std::string operator()(Value::ImageID const& r) const {
        return "image " + std::to_string(r.id);
    }
    std::string operator()(Value::VideoID const& r) const {
        return "video " + std::to_string(r.id);
    }
    std::string operator()(Value::SoundID const& r) const {
        return "sound " + std::to_string(r.id);
    }
    std::string operator()(Value::ModelID const& r) const {
        return "model " + std::to_string(r.id);
    }
    std::string operator()(Path const& p) const {
        return "path " + std::to_string(p.elements.size());
    }
    std::string operator()(Unstructured const& u) const {
        return "data " + std::to_string(int(u.type()));
    }
    std::string operator()(std::string const& s) const { return "string " + s; }
    template <class T>
    std::string operator()(T const&) const = delete;
};

TEST(Value, PassesItsContentToAVisitor) {
    struct Row {
        char const* what;
        Value value;
        char const* shown;
    };
    auto const null = [](auto pointer) {
        Value value = pointer;
        return value;
    };
    Value movedString("a text that is too long to be held in place");
    Value const taken = std::move(movedString);
    Value movedMatrix = FloatMat4{{7, 7}};
    Value const takenMatrix = std::move(movedMatrix);
    for (Row const& row : {
             Row{"integer", 5, "integer 5"},
             Row{"double", 2.5, "double 2.5"},
             Row{"vec2", FloatVec2{1, 2}, "vec2 1, 2"},
             Row{"vec3", FloatVec3{1, 2, 3}, "vec3 1, 2, 3"},
             Row{"vec4", FloatVec4{1, 2, 3, 4}, "vec4 1, 2, 3, 4"},
             Row{"matrix", FloatMat4{{7, 8}}, "matrix 78"},
             Row{"boolean", true, "true"},
             Row{"image", Value::Image(7), "image 7"},
             Row{"video", Value::Video(8), "video 8"},
             Row{"sound", Value::Sound(9), "sound 9"},
             Row{"model", Value::Model(10), "model 10"},
             Row{"path", PathBuilder().close().build(), "path 1"},
             Row{"data", Unstructured(1.5), "data 3"},
             Row{"string", "text", "string text"},
             Row{"null path", null(std::shared_ptr<Path const>()), "path 0"},
             Row{"null data", null(std::shared_ptr<Unstructured const>()), "data 0"},
             Row{"string moved from", movedString, "string "},
             Row{"matrix moved from", movedMatrix, "matrix 10"},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.value.visit(Kinds()), row.shown);
    }
    Value const held("payload");
    EXPECT_EQ(held.visit([](auto const& content) { return static_cast<void const*>(&content); }),
              held.ifString());
    int calls = 0;
    Value(1).visit([&calls](auto const&) { ++calls; });
    EXPECT_EQ(calls, 1);
}

TEST(Value, HasAHashThatAgreesWithEquality) {
    std::hash<Value> const hash;
    FloatMat4 plus{{0.0}};
    FloatMat4 minus{{-0.0}};
    Unstructured::Map const map{{"a", 1}, {"b", Unstructured::Array{2.0, "x", Unstructured()}}};
    Path const path = PathBuilder().circle({1, 2}, 3).build();
    std::vector<Value> const values{
        0,
        1,
        0.0,
        -0.0,
        1.0,
        double(INFINITY),
        FloatVec2{0.0, 1},
        FloatVec2{-0.0, 1},
        FloatVec3{0, 1, 2},
        FloatVec4{0, 1, 2, -0.0},
        FloatVec4{0, 1, 2, 0.0},
        plus,
        minus,
        FloatMat4(plus),
        true,
        false,
        Value::Image(1),
        Value::Video(1),
        Value::Sound(1),
        Value::Model(1),
        path,
        Path(path),
        Path(),
        std::shared_ptr<Path const>(),
        Unstructured(map),
        Unstructured(Unstructured::Map(map)),
        Unstructured(),
        Unstructured(0.0),
        Unstructured(-0.0),
        Unstructured(1u),
        std::shared_ptr<Unstructured const>(),
        "text",
        std::string("text"),
        "",
    };
    std::size_t equal = 0;
    for (Value const& a : values) {
        for (Value const& b : values) {
            if (!(a == b)) continue;
            EXPECT_EQ(hash(a), hash(b)) << a << " and " << b;
            ++equal;
        }
    }
    EXPECT_EQ(equal, values.size() + 2 * 8);
    // Hashes are spread: different values have nearly as many different hashes.
    std::set<std::size_t> hashes;
    for (Value const& value : values) hashes.insert(hash(value));
    EXPECT_GE(hashes.size(), values.size() - 8 - 3);
    static_assert(noexcept(hash(Value())));

    std::unordered_set<Value> set{1, 1.0, 1, "text", "text"};
    EXPECT_EQ(set.size(), 3u);
    EXPECT_EQ(set.count(Value("text")), 1u);

    tests::Random random(40);
    for (int i = 0; i < 2000; ++i) {
        double const d = random.anyDouble();
        EXPECT_EQ(hash(Value(d)), hash(Value(d)));
        EXPECT_EQ(hash(Value(FloatVec3{d, 1, -d})), hash(Value(FloatVec3{d, 1, -d})));
    }
}

TEST(Value, IsNoexceptWherePossible) {
    static_assert(std::is_nothrow_default_constructible_v<Value>);
    static_assert(std::is_nothrow_copy_constructible_v<Value>);
    static_assert(std::is_nothrow_copy_assignable_v<Value>);
    static_assert(std::is_nothrow_move_assignable_v<Value>);
    static_assert(std::is_nothrow_constructible_v<Value, double>);
    static_assert(std::is_nothrow_constructible_v<Value, int>);
    static_assert(std::is_nothrow_constructible_v<Value, FloatVec4>);
    static_assert(!std::is_nothrow_constructible_v<Value, char const*>);
    static_assert(noexcept(double(std::declval<Value const&>())));
    static_assert(noexcept((long long)(std::declval<Value const&>())));
    static_assert(noexcept(FloatVec4(std::declval<Value const&>())));
    static_assert(noexcept(std::declval<Value const&>().type()));
    static_assert(noexcept(std::declval<Value const&>().ifPath()));
    // Assigning between any two types allocates nothing, so nothing can fail.
    std::vector<Value> const values{
        1, 2.5, FloatVec4(), FloatMat4(), true, Value::Model(3), Path(), "text", Unstructured()};
    tests::AllocationCounter counter;
    for (Value const& from : values) {
        for (Value const& to : values) {
            Value changed = from;
            changed = to;
            Value moved = from;
            moved = std::move(changed);
        }
    }
    EXPECT_EQ(counter.count(), 0u);
}

TEST(Type, IsPrintedByName) {
    std::ostringstream stream;
    for (int i = 0; i < 14; ++i) stream << Type(i) << " ";
    stream << Type(14) << " " << Type(255);
    EXPECT_EQ(
        stream.str(),
        "float vec2 vec3 vec4 mat4 boolean int image video sound path string model unstructured "
        "Type(14) Type(255)");
}

TEST(Value, ConvertsANegativeZeroToAVectorOfThem) {
    EXPECT_EQ(tests::bits(FloatVec2(Value(-0.0)).y), tests::bits(-0.0));
}

TEST(Value, ConvertsToAMatrix) {
    EXPECT_TRUE(sameBytes(FloatMat4(Value(countingMatrix())), countingMatrix()));
    EXPECT_TRUE(sameBytes(FloatMat4(nullMatrix()), identityMatrix()));
    for (Value const& value : everyAlternative()) {
        if (value.type() == Type::Mat4) continue;
        SCOPED_TRACE(to_string(value));
        EXPECT_TRUE(sameBytes(FloatMat4(value), identityMatrix()));
    }
}

TEST(Value, ConvertsToAPath) {
    EXPECT_EQ(Path(Value(linePath())), linePath());
    EXPECT_EQ(Path(nullPath()), Path());
    for (Value const& value : everyAlternative()) {
        if (value.type() == Type::Path) continue;
        SCOPED_TRACE(to_string(value));
        EXPECT_EQ(Path(value), Path());
    }
}

TEST(Value, ReturnsPointersToItsPayload) {
    Value const matrix = countingMatrix();
    Value const path = linePath();
    Value const data = smallMap();
    Value const text = "text";
    EXPECT_TRUE(sameBytes(*matrix.asFloatMat4(), countingMatrix()));
    EXPECT_EQ(*path.ifPath(), linePath());
    EXPECT_EQ(*data.ifUnstructured(), smallMap());
    EXPECT_EQ(*text.ifString(), "text");
    for (Value const& value :
         {matrix, path, data, text, Value(1.0), Value(1), Value(true), Value::Image(1),
          nullMatrix(), nullPath(), nullData(), nullString()}) {
        SCOPED_TRACE(to_string(value));
        EXPECT_EQ(value.asFloatMat4() != nullptr, value == matrix);
        EXPECT_EQ(value.ifPath() != nullptr, value == path);
        EXPECT_EQ(value.ifUnstructured() != nullptr, value == data);
        EXPECT_EQ(value.ifString() != nullptr, value == text);
    }
}

TEST(Value, SharesDataGivenByPointer) {
    auto const tree = std::make_shared<Unstructured const>(smallMap());
    Value const value = tree;
    EXPECT_EQ(value.type(), Type::Unstructured);
    EXPECT_EQ(value.ifUnstructured(), tree.get());
    EXPECT_EQ(value, Value(smallMap()));
}

TEST(Value, SharesAnElementAndKeepsItsDocumentAlive) {
    auto document = std::make_shared<Unstructured const>(
        Unstructured::Map{{"items", Unstructured::Array{1, Unstructured::Map{{"X", 2.5}}}}});
    std::weak_ptr<Unstructured const> const watched = document;
    Unstructured const& element = document->ifMap()->at("items").ifArray()->at(1);
    tests::AllocationCounter counter;
    Value const value = std::shared_ptr<Unstructured const>(document, &element);
    document.reset();
    EXPECT_EQ(counter.count(), 0u);
    EXPECT_FALSE(watched.expired());
    EXPECT_EQ(value.ifUnstructured(), &element);
    EXPECT_EQ(FloatVec2(value).x, 2.5);
}

TEST(Value, ReturnsSharedPointersToItsPayload) {
    std::vector<Value> const values{1,
                                    2.5,
                                    true,
                                    FloatVec2{1, 2},
                                    FloatVec3{1, 2, 3},
                                    FloatVec4{1, 2, 3, 4},
                                    Value::Image(5),
                                    Value::Video(5),
                                    Value::Sound(5),
                                    Value::Model(5),
                                    countingMatrix(),
                                    linePath(),
                                    "text",
                                    smallMap()};
    tests::AllocationCounter counter;
    for (Value const& value : values) {
        EXPECT_EQ(value.sharedFloatMat4().get(), value.asFloatMat4());
        EXPECT_EQ(value.sharedPath().get(), value.ifPath());
        EXPECT_EQ(value.sharedString().get(), value.ifString());
        EXPECT_EQ(value.sharedUnstructured().get(), value.ifUnstructured());
    }
    EXPECT_EQ(counter.count(), 0u);

    Value value = "kept";
    std::shared_ptr<std::string const> const text = value.sharedString();
    Value const again = Value(value).asType(Type::String);
    EXPECT_NE(again.sharedString(), text);
    value = 1;
    EXPECT_EQ(*text, "kept");
    EXPECT_EQ(text.use_count(), 1);
    EXPECT_EQ(Value(std::shared_ptr<Path const>()).sharedPath(), nullptr);
    Value const null = std::shared_ptr<Unstructured const>();
    EXPECT_EQ(null.type(), Type::Unstructured);
    EXPECT_EQ(null.sharedUnstructured(), nullptr);
    EXPECT_EQ(null.asUnstructured(), Unstructured());
    EXPECT_EQ(double(null), 0.0);
    EXPECT_EQ(std::string(null), "??");
    EXPECT_EQ(to_string(null), "unstructured");
    EXPECT_EQ(null, Value(std::shared_ptr<Unstructured const>()));
    EXPECT_NE(null, Value(Unstructured()));
}

TEST(Value, ConvertsToAnyType) {
    std::vector<Value> values = everyAlternative();
    for (Value const& value : {nullPath(), nullData(), nullString(), nullMatrix()}) {
        values.push_back(value);
    }
    for (Value const& value : values) {
        SCOPED_TRACE(to_string(value));
        struct Row {
            Type type;
            Value expected;
        };
        unsigned long long const id = value;
        for (Row const& row : {
                 Row{Type::Float, double(value)},
                 Row{Type::Vec2, FloatVec2(value)},
                 Row{Type::Vec3, FloatVec3(value)},
                 Row{Type::Vec4, FloatVec4(value)},
                 Row{Type::Mat4, FloatMat4(value)},
                 Row{Type::Boolean, bool(value)},
                 Row{Type::Int, static_cast<long long>(value)},
                 Row{Type::Image, Value::Image(id)},
                 Row{Type::Video, Value::Video(id)},
                 Row{Type::Sound, Value::Sound(id)},
                 Row{Type::Model, Value::Model(id)},
                 Row{Type::Path, Path(value)},
                 Row{Type::String, std::string(value)},
                 Row{Type::Unstructured, Value(value.asUnstructured())},
             }) {
            EXPECT_EQ(value.asType(row.type), row.expected) << typeToString(row.type);
            EXPECT_EQ(value.asType(row.type).type(), row.type);
        }
    }
    EXPECT_EQ(std::string(Value(smallMap()).asType(Type::String)), "??");
}

TEST(Value, ConvertsToATypeWithItsOwnPayload) {
    Value const matrix = countingMatrix();
    Value const path = linePath();
    Value const data = smallMap();
    Value const text = "text";
    EXPECT_NE(matrix.asType(Type::Mat4).asFloatMat4(), matrix.asFloatMat4());
    EXPECT_NE(path.asType(Type::Path).ifPath(), path.ifPath());
    EXPECT_NE(data.asType(Type::Unstructured).ifUnstructured(), data.ifUnstructured());
    EXPECT_NE(text.asType(Type::String).ifString(), text.ifString());
    for (Value const& value : everyAlternative()) {
        SCOPED_TRACE(to_string(value));
        for (Type const type : {Type::Mat4, Type::Path, Type::Unstructured, Type::String}) {
            SCOPED_TRACE(typeToString(type));
            Value const first = value.asType(type);
            Value const second = value.asType(type);
            EXPECT_NE(payload(first), nullptr);
            EXPECT_NE(payload(first), payload(second));
            EXPECT_NE(payload(first), payload(value));
            EXPECT_NE(payload(first), Path::EmptyPath().get());
        }
    }
}

TEST(ValueDeathTest, RejectsConversionToUndefinedEnumerators) {
    EXPECT_ENDS(Value().asType(tests::kNoType),
                tests::failedAssertion("0", "asType", "Engine/Base/value"));
}

TEST(Value, EqualsTheSameTypeWithEqualContent) {
    FloatMat4 zeroMatrix;
    FloatMat4 negativeZeroMatrix;
    negativeZeroMatrix.elements[7] = -0.0;
    FloatMat4 nanMatrix;
    nanMatrix.elements[15] = NAN;
    auto const nanPath = std::make_shared<Path const>(PathBuilder().moveTo({NAN, 0}).build());
    Value const sharedNanData = Unstructured(double(NAN));
    struct Row {
        char const* what;
        Value a;
        Value b;
        bool equal;
    };
    for (Row const& row : {
             Row{"integers", 1, 1, true},
             Row{"integers that are one double", 9007199254740992, 9007199254740993, false},
             Row{"strings up to a zero byte", std::string("a\0b", 3), std::string("a\0c", 3),
                 false},
             Row{"other integers", 1, 2, false},
             Row{"integer and double", 1, 1.0, false},
             Row{"integer and bool", 1, true, false},
             Row{"doubles", 1.5, 1.5, true},
             Row{"other doubles", 1.5, 1.25, false},
             Row{"zeros", 0.0, -0.0, true},
             Row{"NaN", NAN, NAN, false},
             Row{"vectors", FloatVec2{1, 0.0}, FloatVec2{1, -0.0}, true},
             Row{"vectors, NaN", FloatVec2{1, NAN}, FloatVec2{1, NAN}, false},
             Row{"vectors of 3", FloatVec3{1, 2, 3}, FloatVec3{1, 2, 4}, false},
             Row{"vectors of 4", FloatVec4{1, 2, 3, 4}, FloatVec4{1, 2, 3, 4}, true},
             Row{"vectors, x", FloatVec2{1, 2}, FloatVec2{9, 2}, false},
             Row{"vectors, y", FloatVec2{1, 2}, FloatVec2{1, 9}, false},
             Row{"vectors of 3, x", FloatVec3{1, 2, 3}, FloatVec3{9, 2, 3}, false},
             Row{"vectors of 3, y", FloatVec3{1, 2, 3}, FloatVec3{1, 9, 3}, false},
             Row{"vectors of 4, x", FloatVec4{1, 2, 3, 4}, FloatVec4{9, 2, 3, 4}, false},
             Row{"vectors of 4, y", FloatVec4{1, 2, 3, 4}, FloatVec4{1, 9, 3, 4}, false},
             Row{"vectors of 4, z", FloatVec4{1, 2, 3, 4}, FloatVec4{1, 2, 9, 4}, false},
             Row{"vectors of 4, w", FloatVec4{1, 2, 3, 4}, FloatVec4{1, 2, 3, 9}, false},
             Row{"vectors of two lengths", FloatVec2{1, 0}, FloatVec3{1, 0, 0}, false},
             Row{"matrices", countingMatrix(), countingMatrix(), true},
             Row{"matrices, zeros", zeroMatrix, negativeZeroMatrix, false},
             Row{"matrices, NaN", nanMatrix, nanMatrix, true},
             Row{"null matrix", nullMatrix(), zeroMatrix, false},
             Row{"null matrices", nullMatrix(), nullMatrix(), true},
             Row{"bools", true, true, true},
             Row{"other bools", true, false, false},
             Row{"images", Value::Image(4), Value::Image(4), true},
             Row{"other images", Value::Image(4), Value::Image(5), false},
             Row{"image and video", Value::Image(4), Value::Video(4), false},
             Row{"videos", Value::Video(4), Value::Video(4), true},
             Row{"other videos", Value::Video(4), Value::Video(5), false},
             Row{"sounds", Value::Sound(4), Value::Sound(4), true},
             Row{"other sounds", Value::Sound(4), Value::Sound(5), false},
             Row{"models", Value::Model(4), Value::Model(4), true},
             Row{"other models", Value::Model(4), Value::Model(5), false},
             Row{"paths", linePath(), linePath(), true},
             Row{"other paths", linePath(), Path(), false},
             Row{"path with NaN", *nanPath, *nanPath, false},
             Row{"shared path with NaN", nanPath, nanPath, true},
             Row{"null path and empty path", nullPath(), Path(), false},
             Row{"null paths", nullPath(), nullPath(), true},
             Row{"data", smallMap(), smallMap(), true},
             Row{"other data", smallMap(), Unstructured(), false},
             Row{"data with NaN", Unstructured(double(NAN)), Unstructured(double(NAN)), false},
             Row{"shared data with NaN", sharedNanData, sharedNanData, true},
             Row{"null data", nullData(), Unstructured(), false},
             Row{"both null data", nullData(), nullData(), true},
             Row{"strings", "text", "text", true},
             Row{"other strings", "text", "texT", false},
             Row{"longer string", "text", "text2", false},
             Row{"string and data", "text", Unstructured("text"), false},
             Row{"null string and empty string", nullString(), "", false},
             Row{"null strings", nullString(), nullString(), true},
             Row{"nulls of two alternatives", nullString(), nullPath(), false},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.a == row.b, row.equal);
        EXPECT_EQ(row.b == row.a, row.equal);
        EXPECT_EQ(row.a != row.b, !row.equal);
    }
}

TEST(Value, MovedFromCanBeUsedAgain) {
    Value value = "text";
    Value const taken = std::move(value);
    EXPECT_EQ(std::string(taken), "text");
    value = 5.0;  // NOLINT(bugprone-use-after-move)
    EXPECT_EQ(value, Value(5.0));
    value = *&value;
    EXPECT_EQ(value, Value(5.0));
}

TEST(Value, SurvivesFailingAllocations) {
    Value const before = "kept, and too long to be stored in place";
    Value value = before;
    Unstructured const tree = smallMap();
    EXPECT_GT(
        tests::failEachAllocation([&] { value = Value(tree); }, [&] { EXPECT_EQ(value, before); }),
        3u);
    EXPECT_EQ(value, Value(tree));
}

TEST(Value, BracesSetOnlyTheFirstComponent) {
    EXPECT_EQ(FloatVec2(Value(0.5)), (FloatVec2{0.5, 0.5}));
    EXPECT_EQ((FloatVec2{Value(0.5)}), (FloatVec2{0.5, 0}));
}
