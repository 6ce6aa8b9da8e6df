#include <Engine/Base/optional.h>
#include <Engine/Base/value.h>

#include "support/allocations.h"
#include "support/death.h"
#include "support/print.h"

#include <gtest/gtest.h>

#include <cmath>
#include <optional>
#include <string>

using tarn::engine::Optional;
using tarn::engine::Type;
using tarn::engine::TypeInfo;
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
    struct Constant {
        int const number;
    };
    EXPECT_EQ(Optional<Constant>(std::optional<Constant>(Constant{5}))->number, 5);
    static_assert(!std::is_convertible_v<Optional<int>, std::optional<int>>);
    static_assert(!std::is_constructible_v<Optional<Value>, std::optional<double>>);
}

// The value of an `Optional<Value>` is an allocation of its own, which a move hands over.
TEST(Optional, OfAValueHasTheSizeOfAPointer) {
    static_assert(sizeof(Optional<Value>) == sizeof(void*));
    static_assert(sizeof(TypeInfo) == 4 * sizeof(void*));
    static_assert(std::is_nothrow_move_constructible_v<Optional<Value>>);
    static_assert(std::is_nothrow_move_assignable_v<Optional<Value>>);

    Optional<Value> const text(Value("a text that is too long to be held in place"));
    Optional<Value> copy = text;
    EXPECT_NE(&*copy, &*text);
    EXPECT_EQ(copy, text);
    EXPECT_EQ(copy->ifString(), text->ifString()) << "the payload is shared, as by all values";
    *copy = 2.5;
    EXPECT_EQ(*copy, Value(2.5));
    EXPECT_EQ(text->type(), Type::String);

    Value const* const place = &*copy;
    Optional<Value> moved = std::move(copy);
    EXPECT_EQ(&*moved, place);
    EXPECT_FALSE(copy.hasValue()) << "moved from";  // NOLINT(bugprone-use-after-move)
    copy = std::move(moved);
    EXPECT_EQ(&*copy, place);
    EXPECT_FALSE(moved.hasValue()) << "moved from";  // NOLINT(bugprone-use-after-move)
}

TEST(Optional, OfAValueIsAssignedInPlace) {
    Optional<Value> const empty;
    Optional<Value> const five(Value(5));
    struct Row {
        char const* what;
        void (*assign)(Optional<Value>& target, Optional<Value> const& five);
    };
    for (Row const &row : {
             Row{"a copy", [](auto&target, auto const&source) { target = source; }},
             Row{"a temporary",
                 [](auto&target, auto const&source) { target = Optional<Value>(source); }},
             Row{"a value", [](auto&target, auto const&source) { target = *source; }},
             Row{"a std::optional",
                 [](auto&target, auto const&source) { target = std::optional<Value>(*source); }},
             Row{"itself",
                 [](auto&target, auto const&source) {
                     target = source;
                     target = *&target;
                 }},
         }) {
        SCOPED_TRACE(row.what);
        Optional<Value> target(Value("before"));
        Value const& before = *target;
        row.assign(target, five);
        EXPECT_EQ(before, Value(5));
        EXPECT_EQ(&*target, &before) << "references to the value stay valid";

        Optional<Value> other;
        row.assign(other, five);
        EXPECT_EQ(other, five);
        EXPECT_NE(&*other, &*five);
        other = empty;
        EXPECT_FALSE(other.hasValue());
    }
}

TEST(Optional, OfAValueConvertsEmplacesAndSwaps) {
    Optional<Value> const seven(Value(7));
    auto const standard = static_cast<std::optional<Value>>(seven);
    ASSERT_TRUE(standard.has_value());
    EXPECT_EQ(*standard, Value(7));
    EXPECT_FALSE(static_cast<std::optional<Value>>(Optional<Value>()).has_value());
    EXPECT_FALSE(Optional<Value>(std::optional<Value>()).hasValue());
    EXPECT_EQ(static_cast<std::optional<Value>>(Optional<Value>(standard)), standard);
    EXPECT_EQ(seven.value_or(Value(1)), Value(7));
    EXPECT_EQ(Optional<Value>().value_or(Value(1)), Value(1));

    Optional<Value> image;
    Value& made = image.emplace(4ull, Type::Image);
    EXPECT_EQ(&made, &*image);
    EXPECT_EQ(made, Value::Image(4));
    image.emplace(2.5);
    EXPECT_EQ(made, Value(2.5)) << "references to the value stay valid";
    EXPECT_EQ(&*image, &made);
    image.emplace(*image);
    EXPECT_EQ(*image, Value(2.5));
    Optional<Value> swapped;
    swap(image, swapped);
    EXPECT_FALSE(image.hasValue());
    EXPECT_EQ(*swapped, Value(2.5));
    EXPECT_EQ(*std::move(swapped), Value(2.5));
    swapped.reset();
    EXPECT_FALSE(swapped.hasValue());
}

TEST(Optional, OfAValueKeepsItsValueWhenAnAllocationFails) {
    Optional<Value> const five(Value(5));
    Optional<Value> target;
    EXPECT_EQ(
        tests::failEachAllocation([&] { target = five; }, [&] { EXPECT_FALSE(target.hasValue()); }),
        1u);
    EXPECT_EQ(target, five);
    target = Value(6);
    EXPECT_EQ(tests::failEachAllocation([&] { target = Value(7); },
                                        [&] { EXPECT_EQ(*target, Value(6)); }),
              1u);
    EXPECT_EQ(*target, Value(7));
    EXPECT_EQ(tests::failEachAllocation([&] { target.emplace(8.0); }, [] {}), 0u);
    EXPECT_EQ(*target, Value(8.0));
    std::string const text(100, 'x');
    EXPECT_GT(tests::failEachAllocation([&] { target.emplace(text); },
                                        [&] { EXPECT_EQ(*target, Value(8.0)); }),
              0u);
    EXPECT_EQ(*target, Value(text));
    target.reset();
    EXPECT_EQ(tests::failEachAllocation([&] { target.emplace(9.0); },
                                        [&] { EXPECT_FALSE(target.hasValue()); }),
              1u);
    EXPECT_EQ(*target, Value(9.0));

    TypeInfo const bounded{Type::Float, 0, Value(1.0), Value(2.0), Value(3.0)};
    TypeInfo copy;
    EXPECT_EQ(tests::failEachAllocation([&] { copy = TypeInfo(bounded); },
                                        [&] { EXPECT_EQ(copy, TypeInfo()); }),
              3u);
    EXPECT_EQ(copy, bounded);

    // Field by field, and after a failure the assignment can be repeated.
    TypeInfo assigned{Type::Vec2};
    EXPECT_EQ(tests::failEachAllocation([&] { assigned = bounded; },
                                        [&] {
                                            EXPECT_EQ(assigned.type, Type::Float);
                                            EXPECT_FALSE(assigned.extra.hasValue());
                                        }),
              2u);
    EXPECT_EQ(assigned, bounded);
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
    Optional<Value> noValue;
    EXPECT_ENDS(noValue.value(), line);
    EXPECT_ENDS(*std::as_const(noValue), line);
    EXPECT_ENDS(static_cast<void>(noValue->type()), line);
}
