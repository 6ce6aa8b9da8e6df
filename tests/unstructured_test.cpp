#include <Engine/Base/unstructured.h>

#include <Engine/Base/path.h>

#include "support/allocations.h"
#include "support/print.h"
#include "support/random.h"
#include "support/stack.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <functional>
#include <sstream>

using namespace tarn::engine;

namespace {

using Map = Unstructured::Map;
using List = Unstructured::Array;
using Kind = Unstructured::Type;

}  // namespace

TEST(Unstructured, StoresEverySourceAsItsKind) {
    Map const map{{"a", 1}};
    List const list{1, 2.5, "three"};
    std::string const text = "text";
    struct Row {
        char const* what;
        Unstructured value;
        Kind kind;
        int number;
    };
    for (Row const& row : {
             Row{"nothing", Unstructured(), Kind::Null, 0},
             Row{"undefined", Unstructured::Undefined(), Kind::Null, 0},
             Row{"map", Unstructured(map), Kind::Map, 1},
             Row{"map, moved", Unstructured(Map{}), Kind::Map, 1},
             Row{"array", Unstructured(list), Kind::Array, 2},
             Row{"array, moved", Unstructured(List{}), Kind::Array, 2},
             Row{"double", Unstructured(2.5), Kind::Float, 3},
             Row{"float", Unstructured(2.5f), Kind::Float, 3},
             Row{"long long", Unstructured(1LL), Kind::Integer, 4},
             Row{"int", Unstructured(1), Kind::Integer, 4},
             Row{"int64", Unstructured(std::int64_t(1)), Kind::Integer, 4},
             Row{"signed char", Unstructured(static_cast<signed char>(1)), Kind::Integer, 4},
             Row{"unsigned long long", Unstructured(1ULL), Kind::UnsignedInteger, 5},
             Row{"unsigned", Unstructured(1u), Kind::UnsignedInteger, 5},
             Row{"uint64", Unstructured(std::uint64_t(1)), Kind::UnsignedInteger, 5},
             Row{"unsigned char", Unstructured(static_cast<unsigned char>(1)),
                 Kind::UnsignedInteger, 5},
             Row{"string", Unstructured(text), Kind::String, 6},
             Row{"string, moved", Unstructured(std::string("x")), Kind::String, 6},
             Row{"literal", Unstructured("x"), Kind::String, 6},
             Row{"null string", Unstructured(static_cast<char const*>(nullptr)), Kind::String, 6},
             Row{"value", Unstructured(Value(2.5)), Kind::Float, 3},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.value.type(), row.kind);
        EXPECT_EQ(static_cast<int>(row.kind), row.number);
    }
    EXPECT_EQ(Unstructured("a\0b").asString(), "a");
    EXPECT_EQ(Unstructured(std::string("a\0b", 3)).asString(), std::string("a\0b", 3));
    EXPECT_EQ(Unstructured(static_cast<char const*>(nullptr)).asString(), "");
    static_assert(sizeof(Kind) == 1 && std::is_unsigned_v<std::underlying_type_t<Kind>>);
    static_assert(std::is_nothrow_move_constructible_v<Unstructured>);
    static_assert(std::is_nothrow_move_assignable_v<Unstructured>);
}

TEST(Unstructured, ConvertsEveryKind) {
    Map const map{{"X", 1.0}};
    List const list{1, 2};
    double const two64 = 18446744073709551616.0;
    struct Row {
        char const* what;
        Unstructured value;
        Map asMap;
        List asArray;
        long long integer;
        double number;
        bool truth;
        unsigned long long id;
        std::string text;
    };
    for (Row const& row : {
             Row{"null", {}, {}, {}, 0, 0.0, false, 0, ""},
             Row{"map", map, map, {}, 0, 0.0, true, 0, ""},
             Row{"empty map", Map{}, {}, {}, 0, 0.0, true, 0, ""},
             Row{"array", list, {}, list, 0, 0.0, true, 0, ""},
             Row{"empty array", List{}, {}, {}, 0, 0.0, true, 0, ""},
             Row{"double", 2.9, {}, {}, 2, 2.9, true, 2, ""},
             Row{"negative double", -2.9, {}, {}, -2, -2.9, true, 0, ""},
             Row{"small double", 0.5, {}, {}, 0, 0.5, true, 0, ""},
             Row{"negative fraction", -0.5, {}, {}, 0, -0.5, true, 0, ""},
             Row{"zero", 0.0, {}, {}, 0, 0.0, false, 0, ""},
             Row{"negative zero", -0.0, {}, {}, 0, -0.0, false, 0, ""},
             Row{"too large", 1e300, {}, {}, LLONG_MAX, 1e300, true, ULLONG_MAX, ""},
             Row{"2^64", two64, {}, {}, LLONG_MAX, two64, true, ULLONG_MAX, ""},
             Row{"below 2^64",
                 18446744073709549568.0,
                 {},
                 {},
                 LLONG_MAX,
                 18446744073709549568.0,
                 true,
                 18446744073709549568ULL,
                 ""},
             Row{"2^63", two64 / 2, {}, {}, LLONG_MAX, two64 / 2, true, 1ULL << 63, ""},
             Row{"too small", -1e300, {}, {}, LLONG_MIN, -1e300, true, 0, ""},
             Row{"infinite", INFINITY, {}, {}, LLONG_MAX, INFINITY, true, ULLONG_MAX, ""},
             Row{"minus infinite", -INFINITY, {}, {}, LLONG_MIN, -INFINITY, true, 0, ""},
             Row{"integer", 3, {}, {}, 3, 3.0, true, 3, ""},
             Row{"negative integer", -1LL, {}, {}, -1, -1.0, true, ULLONG_MAX, ""},
             Row{"integer zero", 0, {}, {}, 0, 0.0, false, 0, ""},
             Row{"unsigned", 7ULL, {}, {}, 0, 0.0, true, 7, ""},
             Row{"unsigned zero", 0ULL, {}, {}, 0, 0.0, false, 0, ""},
             Row{"string", "12", {}, {}, 0, 0.0, true, 0, "12"},
             Row{"false", "false", {}, {}, 0, 0.0, true, 0, "false"},
             Row{"empty string", "", {}, {}, 0, 0.0, false, 0, ""},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.value.asMap(), row.asMap);
        EXPECT_EQ(row.value.asArray(), row.asArray);
        EXPECT_EQ(row.value.asInteger(), row.integer);
        EXPECT_EQ(tests::bits(row.value.asFloat()), tests::bits(row.number));
        EXPECT_EQ(row.value.asBool(), row.truth);
        EXPECT_EQ(row.value.asId(), row.id);
        EXPECT_EQ(row.value.asString(), row.text);
        EXPECT_EQ(row.value.ifMap() != nullptr, row.value.type() == Kind::Map);
        EXPECT_EQ(row.value.ifArray() != nullptr, row.value.type() == Kind::Array);
        EXPECT_EQ(row.value.ifString() != nullptr, row.value.type() == Kind::String);
    }
    Unstructured const nan = double(NAN);
    EXPECT_EQ(nan.asInteger(), 0);
    EXPECT_EQ(nan.asId(), 0u);
    EXPECT_TRUE(nan.asBool());
    EXPECT_TRUE(std::isnan(nan.asFloat()));
}

TEST(Unstructured, ReturnsPointersToItsContent) {
    Unstructured const map = Map{{"k", "v"}};
    Unstructured const list = List{1, 2};
    Unstructured const text = "text";
    EXPECT_EQ(map.ifMap()->size(), 1u);
    EXPECT_EQ(list.ifArray()->size(), 2u);
    EXPECT_EQ(*text.ifString(), "text");
    EXPECT_EQ(map.asInteger() + list.asInteger() + text.asInteger(), 0);
}

TEST(Unstructured, OrdersKeysByBytes) {
    Unstructured const data = Map{{"\xff", 1}, {"b", 2}, {"B", 3}, {"", 4}, {"\x80", 5}};
    std::vector<std::string> keys;
    for (auto const& entry : *data.ifMap()) keys.push_back(entry.first);
    EXPECT_EQ(keys, (std::vector<std::string>{"", "B", "b", "\x80", "\xff"}));
}

TEST(Unstructured, ReturnsCopies) {
    Unstructured const map = Map{{"a", 1}};
    Unstructured const list = List{1};
    Map mapCopy = map.asMap();
    mapCopy["a"] = 2;
    List listCopy = list.asArray();
    listCopy[0] = 2;
    EXPECT_EQ(map, Unstructured(Map{{"a", 1}}));
    EXPECT_EQ(list, Unstructured(List{1}));
}

TEST(Unstructured, ComparesWithConvertibleTypes) {
    Unstructured const five = 5;
    EXPECT_TRUE(five == 5 && 5 == five && five != 5u && 5u != five && five != 5.0);
    Unstructured const text = "text";
    EXPECT_TRUE(text == "text" && "text" == text && text != "other" && "other" != text);
    EXPECT_FALSE(five != 5 || 5 != five || text == "other" || "other" == text);
    Unstructured const point = Map{{"X", 1}, {"Y", 2}};
    EXPECT_TRUE(point == (FloatVec2{1, 2}) && (FloatVec2{1, 2}) == point);
}

TEST(Unstructured, EqualsTheSameKindWithEqualContent) {
    struct Row {
        char const* what;
        Unstructured a;
        Unstructured b;
        bool equal;
    };
    for (Row const& row : {
             Row{"nulls", {}, {}, true},
             Row{"null and zero", {}, 0, false},
             Row{"null and empty map", {}, Map{}, false},
             Row{"integers", 1, 1, true},
             Row{"integer and double", 1, 1.0, false},
             Row{"integer and unsigned", 1, 1u, false},
             Row{"unsigned and double", 1u, 1.0, false},
             Row{"integers that are one double", 9007199254740992, 9007199254740993, false},
             Row{"unsigned that are one double", 9007199254740992u, 9007199254740993u, false},
             Row{"strings up to a zero byte", std::string("a\0b", 3), std::string("a\0c", 3),
                 false},
             Row{"other integers", 1, -1, false},
             Row{"unsigned", 1u, 1u, true},
             Row{"other unsigned", 1u, 2u, false},
             Row{"doubles", 0.5, 0.5, true},
             Row{"zeros", 0.0, -0.0, true},
             Row{"NaN", double(NAN), double(NAN), false},
             Row{"strings", "a", "a", true},
             Row{"other strings", "a", "A", false},
             Row{"longer string", "a", "ab", false},
             Row{"arrays", List{1, "b"}, List{1, "b"}, true},
             Row{"double and integer in arrays", List{1.0}, List{1}, false},
             Row{"integer and double in arrays", List{1}, List{1.0}, false},
             Row{"double and unsigned in maps", Map{{"a", 1.0}}, Map{{"a", 1u}}, false},
             Row{"zero and null in arrays", List{0.0}, List{Unstructured()}, false},
             Row{"order", List{1, 2}, List{2, 1}, false},
             Row{"longer array", List{1}, List{1, 2}, false},
             Row{"maps", Map{{"a", 1}, {"b", 2}}, Map{{"b", 2}, {"a", 1}}, true},
             Row{"other key", Map{{"a", 1}}, Map{{"b", 1}}, false},
             Row{"other entry", Map{{"a", 1}}, Map{{"a", 2}}, false},
             Row{"larger map", Map{{"a", 1}}, Map{{"a", 1}, {"b", 1}}, false},
             Row{"deep", Map{{"a", List{Map{{"b", 1}}}}}, Map{{"a", List{Map{{"b", 1}}}}}, true},
             Row{"deep difference", Map{{"a", List{Map{{"b", 1}}}}},
                 Map{{"a", List{Map{{"b", 2}}}}}, false},
             Row{"empty map and empty array", Map{}, List{}, false},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.a == row.b, row.equal);
        EXPECT_EQ(row.b == row.a, row.equal);
        EXPECT_EQ(row.a != row.b, !row.equal);
    }
}

TEST(Unstructured, CopiesDeeplyAndMovesInConstantTime) {
    Unstructured const original =
        Map{{"list", List{1, 2, "three"}}, {"text", std::string(50, 'x')}};
    Unstructured copy = original;
    EXPECT_EQ(copy, original);
    EXPECT_NE(copy.ifMap(), original.ifMap());
    EXPECT_NE(copy.ifMap()->at("list").ifArray(), original.ifMap()->at("list").ifArray());

    Map const* const content = copy.ifMap();
    tests::AllocationCounter counter;
    Unstructured moved = std::move(copy);
    EXPECT_EQ(moved.ifMap(), content);
    EXPECT_EQ(copy.type(), Kind::Null);  // NOLINT(bugprone-use-after-move)
    copy = std::move(moved);
    EXPECT_EQ(copy.ifMap(), content);
    EXPECT_EQ(moved.type(), Kind::Null);  // NOLINT(bugprone-use-after-move)
    EXPECT_EQ(counter.count(), 0u);
}

TEST(Unstructured, MovesItsContentIn) {
    Map map{{"a", List{1, 2, 3}}};
    List list{Map{{"b", 1}}, "text"};
    std::string text(100, 'x');
    auto const* const entry = &map.at("a");
    auto const* const element = list.data();
    char const* const letters = text.data();
    Unstructured const fromMap = std::move(map);
    Unstructured const fromList = std::move(list);
    Unstructured const fromText = std::move(text);
    EXPECT_EQ(&fromMap.ifMap()->at("a"), entry);
    EXPECT_EQ(fromList.ifArray()->data(), element);
    EXPECT_EQ(fromText.ifString()->data(), letters);
}

TEST(Unstructured, CanBeAssignedAPartOfItself) {
    Unstructured tree = Map{{"inner", List{Map{{"leaf", "text"}}}}};
    Unstructured const inner = tree.ifMap()->at("inner");
    Unstructured copied = tree;
    copied = copied.ifMap()->at("inner");
    EXPECT_EQ(copied, inner);
    Unstructured moved = tree;
    moved = std::move(const_cast<Unstructured&>(moved.ifMap()->at("inner")));
    EXPECT_EQ(moved, inner);
    tree = *&tree;
    EXPECT_EQ(tree.ifMap()->at("inner"), inner);
    Unstructured& same = tree;
    tree = std::move(same);
    EXPECT_EQ(tree.ifMap()->at("inner"), inner);
}

TEST(Unstructured, FreesItsContent) {
    std::string const text = "a text that is longer than a short one";
    tests::AllocationCounter counter;
    {
        Unstructured tree = Map{{"list", List{1, text, Map{{"deep", text}}}}, {"text", text}};
        Unstructured copy = tree;
        Unstructured const moved = std::move(copy);
        copy = moved;
        copy = text;
        copy = 5;
        tree = List{moved, moved};
        EXPECT_GT(counter.held(), 10u);
    }
    EXPECT_EQ(counter.held(), 0u);
}

TEST(Unstructured, RemovesEmptyValuesOfTheTopLevel) {
    Unstructured const inner = Map{{"g", ""}};
    Map const map{{"a", ""}, {"b", List{}}, {"c", Map{}}, {"d", Unstructured::Undefined()},
                  {"e", 0},  {"f", inner}};
    Map const before = map;
    EXPECT_EQ(Unstructured::removeEmptyValues(map),
              (Map{{"d", Unstructured::Undefined()}, {"e", 0}, {"f", inner}}));
    EXPECT_EQ(map, before);
    EXPECT_EQ(Unstructured::removeEmptyValues({}), Map{});
    Map const kept{{"", 0.0}, {"array", List{""}}, {"text", " "}, {"u", 0u}};
    EXPECT_EQ(Unstructured::removeEmptyValues(kept), kept);
}

TEST(Unstructured, ConvertsToVectors) {
    struct Row {
        char const* what;
        Unstructured value;
        FloatVec4 expected;
    };
    for (Row const& row : {
             Row{"map", Map{{"X", 1.5}, {"Z", 3}}, {1.5, 0, 3, 0}},
             Row{"whole map",
                 Map{{"X", 1.0}, {"Y", 2.0}, {"Z", 3.0}, {"W", 4.0}, {"V", 5.0}},
                 {1, 2, 3, 4}},
             Row{"lower case", Map{{"x", 1.0}, {"y", 2.0}}, {}},
             Row{"map of no numbers", Map{{"X", 5u}, {"Y", "6"}, {"Z", Map{}}, {"W", {}}}, {}},
             Row{"array", List{2.0}, {2, 0, 0, 0}},
             Row{"long array", List{1, 2, 3, 4, 5}, {1, 2, 3, 4}},
             Row{"array of no numbers", List{5u, "6", List{1}, {}}, {}},
             Row{"array of maps", List{Map{{"X", 1}}, 2, Map{{"Y", 3}}, 4}, {0, 2, 0, 4}},
             Row{"map of arrays",
                 Map{{"X", List{1}}, {"Y", 2}, {"Z", List{3}}, {"W", 4}},
                 {0, 2, 0, 4}},
             Row{"empty array", List{}, {}},
             Row{"double", 0.5, {0.5, 0.5, 0.5, 0.5}},
             Row{"integer", -3, {-3, -3, -3, -3}},
             Row{"unsigned", 5u, {}},
             Row{"string", "5", {}},
             Row{"null", {}, {}},
         }) {
        SCOPED_TRACE(row.what);
        FloatVec4 const e = row.expected;
        EXPECT_EQ(FloatVec4(row.value), e);
        EXPECT_EQ(FloatVec3(row.value), (FloatVec3{e.x, e.y, e.z}));
        EXPECT_EQ(FloatVec2(row.value), (FloatVec2{e.x, e.y}));
    }
}

TEST(Unstructured, ConvertsFromValues) {
    struct Row {
        char const* what;
        Value value;
        Unstructured expected;
    };
    for (Row const& row : {
             Row{"integer", -5, -5},
             Row{"double", 2.5, 2.5},
             Row{"vector of 2", FloatVec2{1, 2}, Map{{"X", 1.0}, {"Y", 2.0}}},
             Row{"vector of 3", FloatVec3{1, 2, 3}, Map{{"X", 1.0}, {"Y", 2.0}, {"Z", 3.0}}},
             Row{"vector of 4", FloatVec4{1, 2, 3, 4},
                 Map{{"X", 1.0}, {"Y", 2.0}, {"Z", 3.0}, {"W", 4.0}}},
             Row{"matrix", FloatMat4(), {}},
             Row{"true", true, 1},
             Row{"false", false, 0},
             Row{"image", Value::Image(4), {}},
             Row{"video", Value::Video(4), {}},
             Row{"sound", Value::Sound(4), {}},
             Row{"model", Value::Model(4), {}},
             Row{"path", PathBuilder().circle({0, 0}, 1).build(), {}},
             Row{"data", Unstructured(List{1, "b"}), List{1, "b"}},
             Row{"string", std::string("a\0b", 3), std::string("a\0b", 3)},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.value.asUnstructured(), row.expected);
        EXPECT_EQ(Unstructured(row.value), row.expected);
    }
    EXPECT_NE(Value(true).asUnstructured(), Unstructured(1.0));
    EXPECT_EQ(FloatVec2(Value(FloatVec2{1, 2}).asUnstructured()), (FloatVec2{1, 2}));
}

TEST(Unstructured, IsNeutralForAMovedFromValue) {
    Value text = "text";
    Value data = Unstructured(5);
    Value const takenText = std::move(text);
    Value const takenData = std::move(data);
    EXPECT_EQ(text.asUnstructured(), Unstructured(""));  // NOLINT(bugprone-use-after-move)
    EXPECT_EQ(data.asUnstructured(), Unstructured());    // NOLINT(bugprone-use-after-move)
}

TEST(Unstructured, IsCopiedIntoAValue) {
    Unstructured tree = Map{{"a", 1}};
    Value const value = tree;
    tree = 5;
    EXPECT_EQ(*value.ifUnstructured(), Unstructured(Map{{"a", 1}}));
}

Unstructured settings() {
    Unstructured::Map render;
    render["size"] = Unstructured::Array{640, 480.0};
    render["scale"] = 1.5;
    render["name"] = "preview";
    render["alpha"] = 1;
    render["owner"] = 7u;
    render["none"] = Unstructured();
    Unstructured::Map root;
    root["render"] = std::move(render);
    root[""] = "the empty key";
    return root;
}

TEST(Unstructured, FindsItsElements) {
    Unstructured const data = settings();
    Unstructured const* const render = data.find("render");
    ASSERT_NE(render, nullptr);
    EXPECT_EQ(render, &data.ifMap()->at("render"));
    EXPECT_EQ(data.find(""), &data.ifMap()->at(""));
    EXPECT_EQ(data.find("Render"), nullptr);
    EXPECT_EQ(data.find(0), nullptr);
    Unstructured const* const size = render->find("size");
    ASSERT_NE(size, nullptr);
    EXPECT_EQ(*size->find(0), Unstructured(640));
    EXPECT_EQ(size->find(1), &size->ifArray()->back());
    EXPECT_EQ(size->find(2), nullptr);
    EXPECT_EQ(size->find("0"), nullptr);
    for (Unstructured const& scalar : {Unstructured(), Unstructured(1), Unstructured(1u),
                                       Unstructured(1.0), Unstructured("text")}) {
        EXPECT_EQ(scalar.find("x"), nullptr);
        EXPECT_EQ(scalar.find(0), nullptr);
        EXPECT_EQ(scalar.find({"x", 0}), nullptr);
        EXPECT_EQ(scalar.find({}), &scalar);
    }
}

TEST(Unstructured, FindsAlongAPath) {
    Unstructured const data = settings();
    Unstructured const* const size = data.find("render")->find("size");
    std::string const key = "size";
    EXPECT_EQ(data.find({"render", "size", 0}), size->find(0));
    EXPECT_EQ(data.find({"render", key, std::size_t(1)}), size->find(1));
    EXPECT_EQ(data.find({"render", "size"}), size);
    EXPECT_EQ(data.find({"render"}), data.find("render"));
    EXPECT_EQ(data.find({}), &data);
    EXPECT_EQ(data.find({"render", "size", 2}), nullptr);
    EXPECT_EQ(data.find({"render", "size", -1}), nullptr);
    EXPECT_EQ(data.find({"render", "size", -4294967296LL}), nullptr);
    EXPECT_EQ(data.find({"render", "size", 1LL << 32}), nullptr);
    EXPECT_EQ(data.find({"render", "size", ULLONG_MAX}), nullptr);
    EXPECT_EQ(data.find({static_cast<char const*>(nullptr)}), data.find(""));
    EXPECT_EQ(data.find({"render", 0}), nullptr);
    EXPECT_EQ(data.find({"render", "size", "0"}), nullptr);
    EXPECT_EQ(data.find({"nothing", "size", 0}), nullptr);
    EXPECT_EQ(data.find({"render", "scale", "deeper"}), nullptr);
}

TEST(Unstructured, LooksUpWithADefault) {
    using Lookup = Unstructured::Lookup;
    Unstructured const data = settings();
    struct Row {
        char const* key;
        double number;
        Lookup numberLookup;
        long long integer;
        Lookup integerLookup;
        bool truth;
        Lookup truthLookup;
        char const* text;
        Lookup textLookup;
    };
    auto const wrong = Lookup::WrongKind;
    auto const found = Lookup::Found;
    auto const missing = Lookup::Missing;
    for (Row const& row : {
             Row{"size", 9, wrong, 9, wrong, true, wrong, "else", wrong},
             Row{"scale", 1.5, found, 9, wrong, true, wrong, "else", wrong},
             Row{"name", 9, wrong, 9, wrong, true, wrong, "preview", found},
             Row{"alpha", 1, found, 1, found, true, found, "else", wrong},
             Row{"owner", 9, wrong, 9, wrong, true, wrong, "else", wrong},
             Row{"none", 9, wrong, 9, wrong, true, wrong, "else", wrong},
             Row{"other", 9, missing, 9, missing, true, missing, "else", missing},
         }) {
        SCOPED_TRACE(row.key);
        Lookup lookup = Lookup::Found;
        EXPECT_EQ(data.numberAt({"render", row.key}, 9, &lookup), row.number);
        EXPECT_EQ(lookup, row.numberLookup);
        EXPECT_EQ(data.integerAt({"render", row.key}, 9, &lookup), row.integer);
        EXPECT_EQ(lookup, row.integerLookup);
        EXPECT_EQ(data.boolAt({"render", row.key}, true, &lookup), row.truth);
        EXPECT_EQ(lookup, row.truthLookup);
        EXPECT_EQ(data.stringAt({"render", row.key}, "else", &lookup), row.text);
        EXPECT_EQ(lookup, row.textLookup);
        EXPECT_EQ(data.numberAt({"render", row.key}, 9), row.number);
    }
    Lookup lookup = Lookup::Missing;
    EXPECT_EQ(data.integerAt({"render", "size", 1}, 9, &lookup), 480);
    EXPECT_EQ(lookup, Lookup::Found);
    EXPECT_EQ(Unstructured(0).boolAt({}, true), false);
    EXPECT_EQ(Unstructured(2).boolAt({}, true, &lookup), true);
    EXPECT_EQ(lookup, Lookup::WrongKind);
    struct Double {
        char const* what;
        double in;
        long long out;
    };
    for (Double const& row : {Double{"whole", -3.0, -3}, Double{"with a fraction", 2.5, 9},
                              Double{"too large", 9223372036854775808.0, 9},
                              Double{"the smallest", -9223372036854775808.0, LLONG_MIN},
                              Double{"not a number", NAN, 9}, Double{"infinity", INFINITY, 9}}) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(Unstructured(row.in).integerAt({}, 9), row.out);
    }
}

TEST(Unstructured, HasAKindAndASize) {
    struct Row {
        Unstructured data;
        Kind kind;
        char const* name;
        std::size_t size;
        bool isNumber;
    };
    for (Row const& row : {
             Row{{}, Kind::Null, "null", 0, false},
             Row{Unstructured::Map{{"a", 1}, {"b", 2}}, Kind::Map, "map", 2, false},
             Row{Unstructured::Map(), Kind::Map, "map", 0, false},
             Row{Unstructured::Array{1, 2, 3}, Kind::Array, "array", 3, false},
             Row{Unstructured::Array(), Kind::Array, "array", 0, false},
             Row{2.5, Kind::Float, "float", 0, true},
             Row{5, Kind::Integer, "integer", 0, true},
             Row{5u, Kind::UnsignedInteger, "unsigned integer", 0, false},
             Row{"text", Kind::String, "string", 0, false},
         }) {
        SCOPED_TRACE(row.name);
        EXPECT_EQ(row.data.type(), row.kind);
        EXPECT_EQ(to_string(row.kind), row.name);
        std::ostringstream stream;
        stream << row.kind;
        EXPECT_EQ(stream.str(), row.name);
        EXPECT_EQ(row.data.size(), row.size);
        EXPECT_EQ(row.data.empty(), row.size == 0);
        EXPECT_EQ(row.data.isNull(), row.kind == Kind::Null);
        EXPECT_EQ(row.data.isMap(), row.kind == Kind::Map);
        EXPECT_EQ(row.data.isArray(), row.kind == Kind::Array);
        EXPECT_EQ(row.data.isNumber(), row.isNumber);
        EXPECT_EQ(row.data.isIdentifier(), row.kind == Kind::UnsignedInteger);
        EXPECT_EQ(row.data.isString(), row.kind == Kind::String);
    }
    EXPECT_EQ(to_string(Kind(7)), "Unstructured::Type(7)");
}

TEST(Unstructured, SurvivesFailingAllocations) {
    Unstructured const before = List{"kept", Map{{"a", 1}}};
    Unstructured const source = Map{{"list", List{1, "a text that is longer than a short one"}},
                                    {"map", Map{{"deep", Map{{"deeper", "x"}}}}}};
    Unstructured target = before;
    EXPECT_GT(
        tests::failEachAllocation([&] { target = source; }, [&] { EXPECT_EQ(target, before); }),
        8u);
    EXPECT_EQ(target, source);
    EXPECT_GT(tests::failEachAllocation(
                  [&] { target = Unstructured(Unstructured::removeEmptyValues(*source.ifMap())); },
                  [&] { EXPECT_EQ(target, source); }),
              8u);
    EXPECT_EQ(target, source);
    Map map{{"a", 1}, {"b", "text"}};
    EXPECT_EQ(tests::failEachAllocation([&] { target = std::move(map); },
                                        [&] { EXPECT_EQ(map.size(), 2u); }),
              1u);
    List list{1, "text"};
    EXPECT_EQ(tests::failEachAllocation([&] { target = std::move(list); },
                                        [&] { EXPECT_EQ(list.size(), 2u); }),
              1u);
}

namespace {

// Nests `leaf` in arrays (`kind` 0), maps (1), or both alternately, with a sibling on each level.
Unstructured nested(std::size_t levels, int kind, Unstructured leaf) {
    for (std::size_t i = 0; i < levels; ++i) {
        if (kind == 0 || (kind == 2 && i % 2 == 0)) {
            List list;
            list.push_back("before");
            list.push_back(std::move(leaf));
            list.push_back(1);
            leaf = std::move(list);
        } else {
            Map map;
            map["a"] = List{1};
            map["b"] = std::move(leaf);
            map["c"] = "after";
            leaf = std::move(map);
        }
    }
    return leaf;
}

}  // namespace

TEST(Unstructured, SurvivesAMillionLevelsOnASmallStack) {
    constexpr std::size_t kLevels = 1000000;
    struct Row {
        char const* what;
        Unstructured (*around)(Unstructured inner);
    };
    for (Row const& row : {
             Row{"arrays",
                 [](Unstructured inner) {
                     List list;
                     list.push_back(std::move(inner));
                     return Unstructured(std::move(list));
                 }},
             Row{"maps",
                 [](Unstructured inner) {
                     Map map;
                     map.emplace("", std::move(inner));
                     return Unstructured(std::move(map));
                 }},
         }) {
        SCOPED_TRACE(row.what);
        tests::onStackOf(512 * 1024, [&row] {
            auto const built = [&row](Unstructured leaf) {
                for (std::size_t i = 0; i < kLevels; ++i) leaf = row.around(std::move(leaf));
                return leaf;
            };
            Unstructured tree = built(7);
            Unstructured copy = tree;
            EXPECT_TRUE(copy == tree);
            EXPECT_TRUE(built(8) != tree);
            EXPECT_FALSE(row.around(copy) == tree);
            Unstructured moved = std::move(copy);
            copy = moved;
            EXPECT_TRUE(copy == moved);
            copy = List{1};
            moved = copy;
            Value const value = tree;
            EXPECT_TRUE(value.asUnstructured() == tree);
            Map map;
            map.emplace("kept", std::move(tree));
            map.emplace("empty", Map{});
            EXPECT_EQ(Unstructured::removeEmptyValues(map).size(), 1u);
        });
    }
}

TEST(Unstructured, ComparesUpTo256LevelsWithoutAllocating) {
    auto const maps = [](std::size_t levels) {
        Unstructured tree = 1;
        for (std::size_t i = 0; i < levels; ++i) {
            Map map;
            map["a"] = std::move(tree);
            tree = std::move(map);
        }
        return tree;
    };
    auto const arrays = [](std::size_t levels) { return nested(levels, 0, 1); };
    auto const allocations = [](Unstructured const& tree, Unstructured const& twin) {
        tests::AllocationCounter counter;
        EXPECT_EQ(tree, twin);
        return counter.count();
    };
    EXPECT_EQ(allocations(arrays(256), arrays(256)), 0u);
    EXPECT_GT(allocations(arrays(257), arrays(257)), 0u);
    EXPECT_EQ(allocations(maps(256), maps(256)), 0u);
    EXPECT_GT(allocations(maps(257), maps(257)), 0u);
}

TEST(Unstructured, HandlesEveryDepthAlike) {
    for (std::size_t levels : {1u, 2u, 255u, 256u, 257u, 258u, 300u, 520u}) {
        for (int kind : {0, 1, 2}) {
            SCOPED_TRACE(testing::Message() << levels << " levels of kind " << kind);
            Unstructured const tree = nested(levels, kind, "leaf");
            Unstructured const copy = tree;
            EXPECT_EQ(copy, tree);
            EXPECT_NE(tree, nested(levels, kind, "Leaf"));
            EXPECT_NE(tree, nested(levels + 1, kind, "leaf"));
            EXPECT_NE(nested(levels + 1, kind, "leaf"), tree);
            if (levels > 1) {
                EXPECT_NE(tree, nested(levels, (kind + 1) % 3, "leaf"));
            }
        }
    }
    // Several deep branches.
    auto const bushy = [](char const* leaf) {
        return Unstructured(List{nested(400, 0, 1), Map{{"x", nested(300, 1, leaf)}, {"y", 5}},
                                 nested(300, 2, leaf), List{}});
    };
    EXPECT_EQ(bushy("a"), bushy("a"));
    EXPECT_NE(bushy("a"), bushy("b"));
    // Deep, and with other sizes or keys next to the deep part.
    Unstructured const deep = nested(400, 2, "leaf");
    std::vector<Unstructured> const different{List{deep},
                                              List{deep, 1},
                                              List{deep, 2},
                                              List{1, deep},
                                              List{deep, deep},
                                              Map{{"x", deep}},
                                              Map{{"y", deep}},
                                              Map{{"x", deep}, {"y", 1}},
                                              Map{{"x", deep}, {"z", 1}},
                                              Map{{"x", deep}, {"y", deep}},
                                              Map{{"a", 1}, {"x", deep}}};
    for (std::size_t i = 0; i < different.size(); ++i) {
        for (std::size_t j = 0; j < different.size(); ++j) {
            SCOPED_TRACE(testing::Message() << i << " and " << j);
            EXPECT_EQ(different[i] == different[j], i == j);
        }
    }
    Unstructured const copy = bushy("c");
    EXPECT_EQ(Unstructured(copy), bushy("c"));
}

TEST(Unstructured, DeepTreesSurviveFailingAllocations) {
    Unstructured const source = nested(300, 2, "a leaf that is long enough to be allocated");
    Unstructured target = 5;
    EXPECT_GT(tests::failEachAllocation([&] { target = source; },
                                        [&] { EXPECT_EQ(target, Unstructured(5)); }),
              300u);
    EXPECT_EQ(target, source);
}

namespace {

// A model of a tree: its kind and content written into one string.
struct Spelt {
    Unstructured tree;
    std::string text;
};

Spelt randomTree(tests::Random& random, int depth) {
    switch (random.below(depth > 0 ? 7 : 5)) {
        case 0: return {Unstructured(), "null"};
        case 1: {
            double const number = random.number();
            return {number, "d" + std::to_string(number)};
        }
        case 2: {
            auto const number = static_cast<long long>(random.below(5)) - 2;
            return {number, "i" + std::to_string(number)};
        }
        case 3: {
            auto const number = static_cast<unsigned long long>(random.below(3));
            return {number, "u" + std::to_string(number)};
        }
        case 4: {
            std::string const text = random.text(3);
            return {text, "s" + std::to_string(text.size()) + text};
        }
        case 5: {
            Spelt result{{}, "["};
            List list;
            for (std::size_t n = random.below(4); n > 0; --n) {
                Spelt element = randomTree(random, depth - 1);
                list.push_back(std::move(element.tree));
                result.text += element.text + ",";
            }
            result.tree = std::move(list);
            return result;
        }
        default: {
            Map map;
            std::map<std::string, std::string> texts;
            for (std::size_t n = random.below(4); n > 0; --n) {
                std::string const key = random.text(2);
                Spelt entry = randomTree(random, depth - 1);
                map[key] = std::move(entry.tree);
                texts[key] = entry.text;
            }
            Spelt result{std::move(map), "{"};
            for (auto const& [key, text] : texts) {
                result.text += std::to_string(key.size()) + key + text + ",";
            }
            return result;
        }
    }
}

}  // namespace

TEST(Unstructured, EqualsExactlyWhereAModelDoes) {
    tests::Random random(21);
    std::size_t equal = 0;
    for (int i = 0; i < 20000; ++i) {
        Spelt const a = randomTree(random, 3);
        Spelt const b = random.below(3) == 0 ? a : randomTree(random, 3);
        ASSERT_EQ(a.tree == b.tree, a.text == b.text) << a.text << " and " << b.text;
        ASSERT_EQ(a.tree != b.tree, a.text != b.text);
        Unstructured const copy = a.tree;
        ASSERT_EQ(copy, a.tree);
        ASSERT_EQ(Value(copy).asUnstructured(), a.tree);
        equal += a.tree == b.tree;
    }
    EXPECT_GT(equal, 5000u);
}
