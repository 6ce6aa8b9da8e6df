#include <Engine/Base/optional.h>
#include <Engine/Base/value.h>

#include "support/death.h"
#include "support/print.h"

#include <gtest/gtest.h>

#include <cmath>
#include <optional>
#include <string>

using tarn::engine::Optional;
using tarn::engine::Value;

TEST(Optional, IsInitiallyEmpty) {
    Optional<std::string> text;
    EXPECT_FALSE(text.hasValue());
    EXPECT_FALSE(text.has_value());
    EXPECT_FALSE(bool(text));
    text = std::string("given");
    EXPECT_TRUE(text.hasValue());
    EXPECT_TRUE(text.has_value());
    EXPECT_TRUE(bool(text));
    EXPECT_EQ(text.value(), "given");
    EXPECT_EQ(*text, "given");
    EXPECT_EQ(text->size(), 5u);
    text.value() += "!";
    *text += "!";
    text->push_back('!');
    Optional<std::string> const copy = text;
    EXPECT_EQ(copy.value(), "given!!!");
    EXPECT_EQ(*copy, "given!!!");
    EXPECT_EQ(copy->size(), 8u);
    EXPECT_EQ(*std::move(text), "given!!!");
    text.reset();
    EXPECT_FALSE(text.hasValue());
    EXPECT_TRUE(copy.hasValue());
    text = std::nullopt;
    EXPECT_FALSE(text.hasValue());
}

TEST(Optional, ComparesEmptinessThenValues) {
    Optional<double> const empty;
    Optional<double> const one = 1.0;
    Optional<double> const nan = double(NAN);
    EXPECT_TRUE(empty == Optional<double>());
    EXPECT_TRUE(one == Optional<double>(1.0));
    EXPECT_TRUE(one == 1.0);
    EXPECT_TRUE(1.0 == one);
    EXPECT_TRUE(empty == std::nullopt);
    EXPECT_TRUE(one != std::nullopt);
    EXPECT_TRUE(one != 2.0);
    EXPECT_TRUE(one != empty);
    EXPECT_TRUE(empty != one);
    EXPECT_FALSE(nan == nan);
    EXPECT_TRUE(nan != nan);
}

TEST(Optional, ComparesWithAValue) {
    Optional<Value> const empty;
    Optional<Value> const one(Value(1));
    struct Row {
        char const* what;
        Optional<Value> optional;
        Value value;
        bool equal;
    };
    for (Row const& row :
         {Row{"equal", Value(1), Value(1), true}, Row{"another", Value(1), Value(2), false},
          Row{"of another alternative", Value(1), Value(1.0), false},
          Row{"none", std::nullopt, Value(0.0), false},
          Row{"a NaN", Value(double(NAN)), Value(double(NAN)), false}}) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(row.optional == row.value, row.equal);
        EXPECT_EQ(row.value == row.optional, row.equal);
        EXPECT_EQ(row.optional != row.value, !row.equal);
        EXPECT_EQ(row.value != row.optional, !row.equal);
    }
}

TEST(Optional, ReturnsTheAlternativeWhenEmpty) {
    EXPECT_EQ(Optional<int>().value_or(3), 3);
    EXPECT_EQ(Optional<int>(2).value_or(3), 2);
    Optional<std::string> text(std::string("a text that is too long to be held in place"));
    char const* const before = text->data();
    EXPECT_EQ(text.value_or("none"), "a text that is too long to be held in place");
    std::string const moved = std::move(text).value_or("none");
    EXPECT_EQ(moved.data(), before);
}

TEST(Optional, EmplacesAndSwaps) {
    Optional<std::string> a;
    std::string& made = a.emplace(3, 'x');
    EXPECT_EQ(&made, &*a);
    EXPECT_EQ(*a, "xxx");
    a.emplace("other");
    EXPECT_EQ(*a, "other");
    Optional<std::string> b;
    a.swap(b);
    EXPECT_FALSE(a.hasValue());
    EXPECT_EQ(*b, "other");
    swap(a, b);
    EXPECT_EQ(*a, "other");
    EXPECT_FALSE(b.hasValue());
    static_assert(std::is_nothrow_swappable_v<Optional<Value>>);
}

TEST(Optional, ConvertsToAndFromStdOptional) {
    Optional<int> const fromEmpty = std::optional<int>();
    EXPECT_FALSE(fromEmpty.hasValue());
    Optional<int> const fromSet = std::optional<int>(5);
    EXPECT_EQ(*fromSet, 5);
    EXPECT_EQ(static_cast<std::optional<int>>(fromSet), std::optional<int>(5));
    EXPECT_EQ(static_cast<std::optional<int>>(Optional<int>()), std::nullopt);
    static_assert(!std::is_convertible_v<Optional<int>, std::optional<int>>);
    static_assert(!std::is_constructible_v<Optional<Value>, std::optional<double>>);
}

TEST(OptionalDeathTest, ReadingAnEmptyOneAborts) {
    Optional<std::string> empty;
    Optional<std::string> const constant;
    auto const line = tests::failedAssertion("hasValue()", "value", "Engine/Base/optional");
    EXPECT_ENDS(empty.value(), line);
    EXPECT_ENDS(*empty, line);
    EXPECT_ENDS(static_cast<void>(empty->size()), line);
    EXPECT_ENDS(constant.value(), line);
    EXPECT_ENDS(*constant, line);
    EXPECT_ENDS(static_cast<void>(constant->size()), line);
    EXPECT_ENDS(Optional<std::string>().value(), line);
    EXPECT_ENDS(*Optional<std::string>(), line);
}
