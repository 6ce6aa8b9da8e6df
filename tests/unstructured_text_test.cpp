#include <Engine/Base/unstructured.h>

#include "support/locales.h"
#include "support/print.h"
#include "support/random.h"
#include "support/stack.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cfenv>
#include <climits>
#include <cmath>
#include <cstdint>
#include <iterator>

using namespace tarn::engine;

namespace {

using Map = Unstructured::Map;
using List = Unstructured::Array;

}  // namespace

TEST(UnstructuredText, ShowsEveryKind) {
    struct Row {
        Unstructured data;
        char const* text;
    };
    for (Row const& row : {
             Row{{}, "null"},
             Row{0, "0"},
             Row{-7, "-7"},
             Row{LLONG_MIN, "-9223372036854775808"},
             Row{LLONG_MAX, "9223372036854775807"},
             Row{0u, "0u"},
             Row{ULLONG_MAX, "18446744073709551615u"},
             Row{0.0, "0.0"},
             Row{-0.0, "-0.0"},
             Row{80.0, "80.0"},
             Row{50.5, "50.5"},
             Row{0.1 + 0.2, "0.30000000000000004"},
             Row{1e20, "100000000000000000000.0"},
             Row{1e21, "1e21"},
             Row{-1.5e-7, "-1.5e-7"},
             Row{5e-324, "5e-324"},
             Row{double(NAN), "nan"},
             Row{std::copysign(double(NAN), -1.0), "-nan"},
             Row{double(INFINITY), "inf"},
             Row{-double(INFINITY), "-inf"},
             Row{"", "\"\""},
             Row{"text", "\"text\""},
             Row{Map{}, "{}"},
             Row{List{}, "[]"},
             Row{List{1}, "[1]"},
             Row{List{1, 1u, 1.0, "1", {}}, "[1, 1u, 1.0, \"1\", null]"},
             Row{Map{{"a", 1}}, "{\"a\": 1}"},
             Row{Map{{"b", List{}}, {"", Map{}}, {"a b", "{"}},
                 "{\"\": {}, \"a b\": \"{\", \"b\": []}"},
             Row{List{List{List{}, List{2}}, Map{{"k", List{3, 4}}}},
                 "[[[], [2]], {\"k\": [3, 4]}]"},
             Row{List{"[", 1, "{", 2}, "[\"[\", 1, \"{\", 2]"},
         }) {
        EXPECT_EQ(row.data.toText(), row.text);
    }
}

TEST(UnstructuredText, IsUtf8WithoutControlCharacters) {
    using std::string;
    struct Row {
        char const* what;
        string bytes;
        char const* text;
    };
    for (Row const& row : {
             Row{"quotes", "say \"x\" \\ y", R"("say \"x\" \\ y")"},
             Row{"line ends and tabulators", "a\nb\rc\td", R"("a\nb\rc\td")"},
             Row{"zero", string("\0", 1), R"("\x00")"},
             Row{"first", "\x01", R"("\x01")"},
             Row{"last of the low ones", "\x1f", R"("\x1f")"},
             Row{"space", " ~", R"(" ~")"},
             Row{"delete", "\x7f", R"("\x7f")"},
             Row{"two bytes", "\xc2\x80\xdf\xbf", "\"\xc2\x80\xdf\xbf\""},
             Row{"three bytes", "\xe0\xa0\x80\xef\xbf\xbf", "\"\xe0\xa0\x80\xef\xbf\xbf\""},
             Row{"around the surrogates", "\xed\x9f\xbf\xee\x80\x80",
                 "\"\xed\x9f\xbf\xee\x80\x80\""},
             Row{"four bytes", "\xf0\x90\x80\x80\xf4\x8f\xbf\xbf",
                 "\"\xf0\x90\x80\x80\xf4\x8f\xbf\xbf\""},
             Row{"continuation alone", "\x80\xbf", R"("\x80\xbf")"},
             Row{"overlong, two", "\xc0\xaf\xc1\xbf", R"("\xc0\xaf\xc1\xbf")"},
             Row{"overlong, three", "\xe0\x9f\xbf", R"("\xe0\x9f\xbf")"},
             Row{"overlong, four", "\xf0\x8f\xbf\xbf", R"("\xf0\x8f\xbf\xbf")"},
             Row{"surrogate", "\xed\xa0\x80", R"("\xed\xa0\x80")"},
             Row{"beyond the last", "\xf4\x90\x80\x80", R"("\xf4\x90\x80\x80")"},
             Row{"no first byte", "\xf5\x80\x80\x80\xff", R"("\xf5\x80\x80\x80\xff")"},
             Row{"cut short", "\xe2\x82", R"("\xe2\x82")"},
             Row{"interrupted", "\xe2\x82z", R"("\xe2\x82z")"},
             Row{"cut short, then whole", "\xe2\xe2\x82\xac", "\"\\xe2\xe2\x82\xac\""},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(Unstructured(row.bytes).toText(), row.text);
        EXPECT_EQ(Unstructured(Map{{row.bytes, 1}}).toText(), "{" + string(row.text) + ": 1}");
    }
}

TEST(UnstructuredText, LimitsTheLevels) {
    Unstructured const data = Map{{"a", List{Map{{"b", List{}}, {"c", List{1}}}}}, {"m", Map{}}};
    struct Row {
        std::size_t depth;
        char const* text;
    };
    for (Row const& row : {
             Row{0, "{...}"},
             Row{1, "{\"a\": [...], \"m\": {}}"},
             Row{2, "{\"a\": [{...}], \"m\": {}}"},
             Row{3, "{\"a\": [{\"b\": [], \"c\": [...]}], \"m\": {}}"},
             Row{4, "{\"a\": [{\"b\": [], \"c\": [1]}], \"m\": {}}"},
             Row{SIZE_MAX, "{\"a\": [{\"b\": [], \"c\": [1]}], \"m\": {}}"},
         }) {
        EXPECT_EQ(data.toText(4096, row.depth), row.text) << row.depth;
    }
    EXPECT_EQ(Unstructured(5).toText(10, 0), "5");
    EXPECT_EQ(Unstructured(List{}).toText(10, 0), "[]");
}

TEST(UnstructuredText, LimitsTheBytes) {
    Unstructured const data = List{"caf\xc3\xa9", 12345};  // ["café", 12345], 16 bytes
    struct Row {
        std::size_t bytes;
        char const* text;
    };
    for (Row const& row : {
             Row{SIZE_MAX, "[\"caf\xc3\xa9\", 12345]"},
             Row{16, "[\"caf\xc3\xa9\", 12345]"},
             Row{15, "[\"caf\xc3\xa9\", 12..."},
             Row{11, "[\"caf\xc3\xa9\"..."},
             Row{10, "[\"caf\xc3\xa9..."},
             Row{9, "[\"caf..."},
             Row{8, "[\"caf..."},
             Row{4, "[..."},
             Row{3, "..."},
             Row{2, ".."},
             Row{1, "."},
             Row{0, ""},
         }) {
        EXPECT_EQ(data.toText(row.bytes), row.text) << row.bytes;
    }
}

TEST(UnstructuredText, CostIsProportionalToItsLength) {
    Unstructured const text = std::string(std::size_t(1) << 26, 'x');
    Unstructured const many = List(std::size_t(1) << 20, Unstructured(1));
    for (int i = 0; i < 10000; ++i) {
        ASSERT_EQ(text.toText(8), "\"xxxx...");
        ASSERT_EQ(many.toText(8), "[1, 1...");
    }
}

TEST(UnstructuredText, ShowsDeepTreesOnASmallStack) {
    constexpr std::size_t kLevels = 1000000;
    Unstructured tree = 7;
    for (std::size_t i = 0; i < kLevels; ++i) {
        List list;
        list.push_back(std::move(tree));
        tree = std::move(list);
    }
    tests::onStackOf(512 * 1024, [&tree] {
        EXPECT_EQ(tree.toText(), std::string(16, '[') + "[...]" + std::string(16, ']'));
        EXPECT_EQ(tree.toText(SIZE_MAX, SIZE_MAX),
                  std::string(kLevels, '[') + "7" + std::string(kLevels, ']'));
    });
}

TEST(UnstructuredText, IgnoresLocaleAndRoundingMode) {
    Unstructured const data = List{0.3, 1.5};
    {
        tests::CLocaleWithComma comma;
        ASSERT_TRUE(comma.isSet());
        EXPECT_EQ(data.toText(), "[0.3, 1.5]");
    }
#if defined(FE_UPWARD)
    for (int mode : {FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        std::fesetround(mode);
        std::string const text = data.toText();
        int const after = std::fegetround();
        std::fesetround(FE_TONEAREST);
        EXPECT_EQ(text, "[0.3, 1.5]");
        EXPECT_TRUE(after == mode || after == FE_TONEAREST);
    }
#endif
}

namespace {

// A tree and its expected string.
struct Told {
    Unstructured tree;
    std::string text;
};

Told randomTree(tests::Random& random, std::size_t depth) {
    static Told const leaves[] = {{{}, "null"},
                                  {-3, "-3"},
                                  {3u, "3u"},
                                  {2.25, "2.25"},
                                  {4.0, "4.0"},
                                  {"", "\"\""},
                                  {"\n\"", "\"\\n\\\"\""},
                                  {"\xc3\xa9\xff", "\"\xc3\xa9\\xff\""}};
    std::size_t const kind = random.below(depth == 0 ? 1 : 3);
    if (kind == 0) return leaves[random.below(std::size(leaves))];
    std::string text;
    Map map;
    List list;
    for (std::size_t i = 0, count = random.below(5); i < count; ++i) {
        Told element = randomTree(random, depth - 1);
        if (i > 0) text += ", ";
        if (kind == 1) {
            list.push_back(std::move(element.tree));
            text += element.text;
        } else {
            std::string const key(1, static_cast<char>('a' + i));
            map.emplace(key, std::move(element.tree));
            text += "\"" + key + "\": " + element.text;
        }
    }
    if (kind == 1) return {std::move(list), "[" + text + "]"};
    return {std::move(map), "{" + text + "}"};
}

}  // namespace

TEST(UnstructuredText, MatchesAModelOnRandomTrees) {
    tests::Random random(24);
    for (int i = 0; i < 5000; ++i) {
        Told const told = randomTree(random, 5);
        ASSERT_EQ(told.tree.toText(SIZE_MAX), told.text);
        std::size_t const limit = random.below(told.text.size() + 5);
        std::string const cut = told.tree.toText(limit);
        if (limit >= told.text.size()) {
            ASSERT_EQ(cut, told.text);
            continue;
        }
        // At most three bytes are left out to keep a character whole.
        ASSERT_LE(cut.size(), limit);
        ASSERT_GE(cut.size() + 3, limit);
        std::size_t const kept = cut.size() - std::min<std::size_t>(limit, 3);
        ASSERT_EQ(cut, told.text.substr(0, kept) + std::string(cut.size() - kept, '.'));
    }
}
