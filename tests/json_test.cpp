#include <Engine/Base/json.h>

#include "support/allocations.h"
#include "support/print.h"
#include "support/random.h"
#include "support/stack.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <functional>

using namespace tarn::engine;
using nlohmann::json;

namespace {

using Map = Unstructured::Map;
using List = Unstructured::Array;

}  // namespace

TEST(Json, ConvertsToUnstructured) {
    struct Row {
        char const* text;
        Unstructured data;
    };
    for (Row const& row : {
             Row{"null", {}},
             Row{"true", 1},
             Row{"false", 0},
             Row{"0", 0},
             Row{"-0", 0},
             Row{"-0.0", -0.0},
             Row{"1", 1},
             Row{"1.0", 1.0},
             Row{"1e3", 1000.0},
             Row{"-9223372036854775808", LLONG_MIN},
             Row{"9223372036854775807", LLONG_MAX},
             Row{"9223372036854775808", 9223372036854775808u},
             Row{"18446744073709551615", ULLONG_MAX},
             Row{"18446744073709551616", 18446744073709551616.0},
             Row{"\"\"", ""},
             Row{R"("a\u0000\u00e9")", std::string("a\0\xc3\xa9", 4)},
             Row{"{}", Map{}},
             Row{"[]", List{}},
             Row{"[[], {}, [1], null]", List{List{}, Map{}, List{1}, {}}},
             Row{R"({"b": {"": true}, "a": [{}, {"k": 0.5}, 2], "c": null})",
                 Map{{"a", List{Map{}, Map{{"k", 0.5}}, 2}}, {"b", Map{{"", 1}}}, {"c", {}}}},
         }) {
        Unstructured const data = fromJson(json::parse(row.text));
        EXPECT_EQ(data, row.data) << row.text;
        EXPECT_EQ(data.toText(), row.data.toText()) << row.text;  // Compares the sign of zero too.
    }
    EXPECT_EQ(fromJson(json::binary({1, 2})), Unstructured());
    EXPECT_EQ(fromJson(json(json::value_t::discarded)), Unstructured());
    EXPECT_EQ(fromJson(json(5u)), 5);  // An integer constructed as unsigned.
}

TEST(Json, ConvertsFromUnstructured) {
    struct Row {
        Unstructured data;
        char const* text;
    };
    for (Row const& row : {
             Row{{}, "null"},
             Row{1, "1"},
             Row{LLONG_MIN, "-9223372036854775808"},
             Row{7u, "7"},
             Row{ULLONG_MAX, "18446744073709551615"},
             Row{2.0, "2.0"},
             Row{-0.0, "-0.0"},
             Row{0.1 + 0.2, "0.30000000000000004"},
             Row{double(NAN), "null"},
             Row{-double(INFINITY), "null"},
             Row{"text\n", R"("text\n")"},
             Row{Map{}, "{}"},
             Row{List{}, "[]"},
             Row{List{List{}, Map{}, List{1, 2}, {}}, "[[],{},[1,2],null]"},
             Row{Map{{"b", Map{{"", "x"}}}, {"a", List{Map{{"k", 0.5}}, 2}}},
                 R"({"a":[{"k":0.5},2],"b":{"":"x"}})"},
         }) {
        EXPECT_EQ(toJson(row.data).dump(), row.text);
    }
    EXPECT_TRUE(toJson(7u).is_number_unsigned());
    EXPECT_TRUE(toJson(7).is_number_integer());
    EXPECT_EQ(toJson("\xff").get<std::string>(), "\xff");
}

TEST(Json, RoundTrips) {
    tests::Random random(31);
    std::function<json(std::size_t)> const randomJson = [&](std::size_t depth) -> json {
        switch (random.below(depth == 0 ? 5 : 7)) {
            case 0: return nullptr;
            case 1: return random.text(3);
            case 2: return static_cast<std::int64_t>(random.word());
            case 3: return random.word() | 1ull << 63;
            case 4: return random.number();
            case 5: {
                json array = json::array();
                for (std::size_t n = random.below(4); n > 0; --n) {
                    array.push_back(randomJson(depth - 1));
                }
                return array;
            }
            default: {
                json object = json::object();
                for (std::size_t n = random.below(4); n > 0; --n) {
                    object[random.text(2)] = randomJson(depth - 1);
                }
                return object;
            }
        }
    };
    for (int i = 0; i < 5000; ++i) {
        json const document = randomJson(5);
        Unstructured const data = fromJson(document);
        ASSERT_EQ(toJson(data), document);
        ASSERT_EQ(toJson(data).dump(-1, ' ', false, json::error_handler_t::replace),
                  document.dump(-1, ' ', false, json::error_handler_t::replace));
        ASSERT_EQ(fromJson(toJson(data)), data);
    }
}

TEST(Json, HandlesDeepTrees) {
    constexpr std::size_t kLevels = 200000;
    for (char const* ends : {"[]", "{}"}) {
        std::string text;
        for (std::size_t i = 0; i < kLevels; ++i) text += ends[0] == '[' ? "[" : "{\"\":";
        text += "7" + std::string(kLevels, ends[1]);
        tests::onStackOf(512 * 1024, [&text] {
            Unstructured const data = fromJson(json::parse(text));
            Unstructured const* inner = &data;
            for (std::size_t i = 0; i < kLevels; ++i) {
                inner = inner->isArray() ? inner->find(0) : inner->find("");
                ASSERT_NE(inner, nullptr);
            }
            EXPECT_EQ(*inner, 7);
            EXPECT_EQ(fromJson(toJson(data)), data);
        });
    }
}

TEST(Json, SurvivesFailingAllocations) {
    json const document = json::parse(
        R"({"list": [1, [2, "a text that is longer than a short one"]], "map": {"k": {}}})");
    Unstructured const expected = fromJson(document);
    Unstructured data;
    EXPECT_GT(tests::failEachAllocation([&] { data = fromJson(document); },
                                        [&] { EXPECT_TRUE(data.isNull()); }),
              10u);
    EXPECT_EQ(data, expected);
}
