// Compares conversions with tables/conversions.json, a document: each input port has a value as its
// default, and its attributes are the expected conversions. The tests of other languages use the
// same file.

#include <Engine/Base/base.h>
#include <Engine/Document/document.h>

#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <set>
#include <sstream>
#include <string>

using namespace tarn::engine;

namespace {

Patch const& table() {
    static Patch const root = [] {
        DocumentError error;
        Optional<Patch> const read =
            loadDocument(TARN_TESTS_TABLES_DIR "/conversions.json", &error);
        EXPECT_TRUE(read) << error;
        return read ? *read : Patch();
    }();
    return root;
}

template <class Vector>
void compareComponents(Vector const& v, Unstructured const& expected) {
    double components[sizeof v / sizeof(double)];
    std::memcpy(components, &v, sizeof v);
    ASSERT_EQ(std::size(components), expected.size());
    for (std::size_t i = 0; i < expected.size(); ++i) {
        EXPECT_EQ(tests::bits(components[i]), tests::bits(expected.ifArray()->at(i).asFloat()))
            << i;
    }
}

void compare(Value const& value, std::string const& target, Unstructured const& expected) {
    if (target == "integer") {
        EXPECT_EQ(static_cast<long long>(value), expected.asInteger());
        EXPECT_EQ(static_cast<std::int64_t>(value), expected.asInteger());
    } else if (target == "number") {
        EXPECT_EQ(tests::bits(double(value)), tests::bits(expected.asFloat()));
    } else if (target == "boolean") {
        EXPECT_EQ(bool(value), expected.asInteger() == 1);
    } else if (target == "identifier") {
        EXPECT_EQ(static_cast<unsigned long long>(value), expected.asId());
        EXPECT_EQ(static_cast<std::uint64_t>(value), expected.asId());
    } else if (target == "vec2") {
        compareComponents(FloatVec2(value), expected);
    } else if (target == "vec3") {
        compareComponents(FloatVec3(value), expected);
    } else if (target == "vec4") {
        compareComponents(FloatVec4(value), expected);
    } else if (target == "string") {
        EXPECT_EQ(std::string(value), *expected.ifString());
    } else {
        ASSERT_EQ(target, "to_string");
        EXPECT_EQ(to_string(value), *expected.ifString());
        std::ostringstream stream;
        stream << "<";
        EXPECT_EQ(&(stream << value), &stream);
        stream << ">";
        EXPECT_EQ(stream.str(), "<" + *expected.ifString() + ">");
    }
}

}  // namespace

TEST(Conversions, MatchTheTable) {
    std::size_t compared = 0;
    for (Port const& row : *table().inputs) {
        SCOPED_TRACE(row.name);
        EXPECT_EQ(row.defaultValue.type(), row.typeInfo.type);
        for (auto const& [target, expected] : row.attributes) {
            compare(row.defaultValue, target, expected);
            ++compared;
        }
    }
    EXPECT_EQ(compared, 434u);
}

TEST(Conversions, HaveRowsForEveryTypeAndTarget) {
    std::set<Type> types;
    std::set<std::string> targets;
    for (Port const& row : *table().inputs) {
        types.insert(row.defaultValue.type());
        for (auto const& [target, expected] : row.attributes) targets.insert(target);
    }
    EXPECT_EQ(types.size(), 14u);
    EXPECT_EQ(targets, (std::set<std::string>{"identifier", "integer", "number", "string",
                                              "to_string", "boolean", "vec2", "vec3", "vec4"}));
}
