#include <Engine/Base/optional.h>

#include "support/death.h"

#include <gtest/gtest.h>

#include <cmath>
#include <string>

using tarn::engine::Optional;

TEST(Optional, IsEmptyUntilGivenAValue) {
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

TEST(OptionalDeathTest, ReadingAnEmptyOneStopsTheProgram) {
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
