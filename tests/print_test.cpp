#include "support/print.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <string>

using namespace tarn::engine;
using testing::PrintToString;

TEST(Print, ShowsEveryDifferenceOfValues) {
    struct Row {
        Value value;
        char const* text;
    };
    for (Row const& row : {
             Row{1, "int 1"},
             Row{LLONG_MIN, "int -9223372036854775808"},
             Row{1.0, "float 1.0"},
             Row{-0.0, "float -0.0"},
             Row{0.1, "float 0.1"},
             Row{0.1 + 0.2, "float 0.30000000000000004"},
             Row{1e300, "float 1e+300"},
             Row{double(INFINITY), "float inf"},
             Row{double(NAN), "float nan"},
             Row{true, "boolean true"},
             Row{"1", "string \"1\""},
             Row{"a\nb", "string \"a\\nb\""},
             Row{FloatVec2{1, 2.5}, "vec2 (1.0, 2.5)"},
             Row{FloatVec3{1, 2, 3}, "vec3 (1.0, 2.0, 3.0)"},
             Row{FloatVec4{1, 2, 3, 4}, "vec4 (1.0, 2.0, 3.0, 4.0)"},
             Row{FloatMat4{{7}}, "mat4 (7.0, 0.0, 0.0, 0.0, 0.0, 0.0, 0.0, 0.0, 0.0, 0.0, 0.0, "
                                 "0.0, 0.0, 0.0, 0.0, 0.0)"},
             Row{Value::Image(7), "image 7"},
             Row{Value::Video(7), "video 7"},
             Row{Value::Sound(7), "sound 7"},
             Row{Value::Model(7), "model 7"},
             Row{PathBuilder().moveTo({1, 2}).close().build(),
                 "path path {moveTo (1.0, 2.0); close}"},
             Row{Path(), "path path {}"},
             Row{Unstructured(1), "unstructured data 1"},
             Row{Unstructured(1u), "unstructured data 1u"},
             Row{Unstructured(1.0), "unstructured data 1.0"},
             Row{Unstructured(Unstructured::Map{{"a", "b"}}), "unstructured data {\"a\": \"b\"}"},
         }) {
        EXPECT_EQ(PrintToString(row.value), row.text);
    }
}

TEST(Print, ShowsTypesInsteadOfBytes) {
    EXPECT_EQ(PrintToString(Type::Float), "float");
    EXPECT_EQ(PrintToString(FloatVec2{0.5, 1}), "(0.5, 1.0)");
    EXPECT_EQ(PrintToString(PathElement{PathInstruction::lineTo, {{1, 2}}}), "lineTo (1.0, 2.0)");
    EXPECT_EQ(PrintToString(Unstructured()), "data null");
    EXPECT_EQ(PrintToString(Optional<Value>()), "nothing");
    EXPECT_EQ(PrintToString(Optional<Type>(Type::Vec2)), "vec2");
    EXPECT_EQ(PrintToString(TypeInfo{Type::Float, 1, Value(0), {}, Value("mm")}),
              "float, subtype 1, int 0, nothing, string \"mm\"");
}
