// The number of heap allocations of each operation, exactly, for every module.

#include <Engine/Base/easing.h>
#include <Engine/Base/patch_index.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include "support/allocations.h"
#include "support/graphs.h"

#include <gtest/gtest.h>

#include <climits>
#include <memory>
#include <string>
#include <vector>

using namespace tarn::engine;
using namespace tests;

namespace {

std::string const kLongText(100, 'x');

struct Inputs {
    Value number = 2.5;
    Value text = kLongText;
    Value data = Unstructured(Unstructured::Map{{"X", 1.5}, {"Y", 2}});
    Value path = PathBuilder().circle({0, 0}, 1).build();
    Value matrix = FloatMat4();
    std::shared_ptr<Path const> shared = Path::EmptyPath();
    Loop loop{number, text, data, path, matrix};
    TypeInfo bounded{Type::Float, 0, Value(1.0), Value(2.0), {}};
    Unstructured numbers = Unstructured::Array{1, 2.5, 3u};
    Unstructured map = Unstructured::Map{{"X", 1.5}, {"Y", 2}};
    Unstructured word = kLongText;
    Patch root = withPorts(
        patch(1, {withPorts(patch(2), {port(21)}, {port(22)}), patch(3)}, {{2, 22, 2, 21}}),
        {port(11)}, {port(12)});
    EvalPatch evaluated{root};
    EvalPatchIndex evaluatedIndex{evaluated};
};

std::string withRoom(std::size_t bytes) {
    std::string text;
    text.reserve(bytes);
    return text;
}

// Results live until the count is read, since their content was allocated too.
struct Kept {
    Value value;
    Unstructured data;
    Path path;
    PathBuilder builder;
    Patch patch;
    std::vector<Value> values;
    TypeInfo info;
    TypeInfo bounded{Type::Float, 0, Value(3.0), Value(4.0), {}};
    std::string text;
    std::string roomy = withRoom(1000);
    double number = 0.0;
};

struct Row {
    char const* operation;
    std::size_t blocks;
    void (*run)(Inputs const&, Kept&);
};

template <class Vector>
double sum(Vector v) {
    return v.x + v.y;
}

std::vector<Row> const kRows{
    // Values: nothing for inline content, one allocation for shared content.
    {"value of nothing", 0, [](Inputs const&, Kept& k) { k.value = Value(); }},
    {"value of a double", 0, [](Inputs const&, Kept& k) { k.value = 2.5; }},
    {"value of an integer", 0, [](Inputs const&, Kept& k) { k.value = 7; }},
    {"value of a boolean", 0, [](Inputs const&, Kept& k) { k.value = true; }},
    {"value of two doubles", 0,
     [](Inputs const&, Kept& k) {
         k.value = FloatVec2{1, 2};
     }},
    {"value of three doubles", 0,
     [](Inputs const&, Kept& k) {
         k.value = FloatVec3{1, 2, 3};
     }},
    {"value of four doubles", 0,
     [](Inputs const&, Kept& k) {
         k.value = FloatVec4{1, 2, 3, 4};
     }},
    {"value of an image", 0, [](Inputs const&, Kept& k) { k.value = Value::Image(7); }},
    {"value of a video", 0, [](Inputs const&, Kept& k) { k.value = Value::Video(7); }},
    {"value of a sound", 0, [](Inputs const&, Kept& k) { k.value = Value::Sound(7); }},
    {"value of a model", 0, [](Inputs const&, Kept& k) { k.value = Value::Model(7); }},
    {"value of a matrix", 1, [](Inputs const&, Kept& k) { k.value = FloatMat4(); }},
    {"value of a short string", 1, [](Inputs const&, Kept& k) { k.value = "short"; }},
    {"value of a long string", 2, [](Inputs const&, Kept& k) { k.value = kLongText; }},
    {"value of an empty path", 1, [](Inputs const&, Kept& k) { k.value = Path(); }},
    {"value of a shared path", 0, [](Inputs const& in, Kept& k) { k.value = in.shared; }},
    {"value of shared data", 0,
     [](Inputs const& in, Kept& k) { k.value = in.data.sharedUnstructured(); }},
    {"value of null data", 1, [](Inputs const&, Kept& k) { k.value = Unstructured(); }},

    {"copy of a number", 0, [](Inputs const& in, Kept& k) { k.value = in.number; }},
    {"copy of a string", 0, [](Inputs const& in, Kept& k) { k.value = in.text; }},
    {"copy of data", 0, [](Inputs const& in, Kept& k) { k.value = in.data; }},
    {"copy of a path value", 0, [](Inputs const& in, Kept& k) { k.value = in.path; }},
    {"copy of a matrix", 0, [](Inputs const& in, Kept& k) { k.value = in.matrix; }},
    {"copy of a loop", 1, [](Inputs const& in, Kept& k) { k.values = in.loop; }},

    {"type of every value", 0,
     [](Inputs const& in, Kept& k) {
         for (Value const& v : in.loop) k.number += static_cast<double>(v.type());
     }},
    {"long long of every value", 0,
     [](Inputs const& in, Kept& k) {
         for (Value const& v : in.loop) k.number += double(static_cast<long long>(v));
     }},
    {"double of every value", 0,
     [](Inputs const& in, Kept& k) {
         for (Value const& v : in.loop) k.number += double(v);
     }},
    {"bool of every value", 0,
     [](Inputs const& in, Kept& k) {
         for (Value const& v : in.loop) k.number += bool(v) ? 1 : 0;
     }},
    {"identifier of every value", 0,
     [](Inputs const& in, Kept& k) {
         for (Value const& v : in.loop) k.number += double(static_cast<unsigned long long>(v));
     }},
    {"vectors of every value", 0,
     [](Inputs const& in, Kept& k) {
         for (Value const& v : in.loop) {
             k.number += sum(FloatVec2(v)) + sum(FloatVec3(v)) + sum(FloatVec4(v));
         }
     }},
    {"matrix of every value", 0,
     [](Inputs const& in, Kept& k) {
         for (Value const& v : in.loop) k.number += FloatMat4(v).elements[0];
     }},
    {"payloads of every value", 0,
     [](Inputs const& in, Kept& k) {
         for (Value const& v : in.loop) {
             k.number += v.asFloatMat4() || v.ifPath() || v.ifString() || v.ifUnstructured();
         }
     }},
    {"equality of loops", 0,
     [](Inputs const& in, Kept& k) { k.number += in.loop == in.loop ? 1 : 0; }},
    {"cast to a port with bounds", 0,
     [](Inputs const& in, Kept& k) {
         k.number += double(castValueToType(in.number, in.bounded)) +
                     double(indexLoopCasting(in.loop, in.bounded, 17)) +
                     double(indexLoopCasting(nullLoop(), in.bounded, 17));
     }},
    // A bound is an allocation of its own, which is assigned to in place.
    {"type of a port without bounds", 0,
     [](Inputs const&, Kept& k) { k.info = TypeInfo{Type::Vec2}; }},
    {"type of a port with two bounds", 2, [](Inputs const& in, Kept& k) { k.info = in.bounded; }},
    {"type of a port with bounds, assigned to one with bounds", 0,
     [](Inputs const& in, Kept& k) { k.bounded = in.bounded; }},
    {"bound of a port", 1, [](Inputs const& in, Kept& k) { k.info.extra = in.text; }},
    {"string of a number", 0, [](Inputs const& in, Kept& k) { k.text = to_string(in.number); }},
    {"strings of numbers, appended within the capacity", 0,
     [](Inputs const&, Kept& k) {
         for (Value const& value : {Value(1234.56), Value(-1e300), Value(LLONG_MIN), Value(true),
                                    Value(FloatVec4()), Value::Image(ULLONG_MAX)}) {
             appendText(k.roomy, value);
         }
     }},
    {"lists of no ports, connections and patches", 0,
     [](Inputs const&, Kept& k) {
         k.patch.inputs = arrayOf<Port>({});
         k.patch.connections = arrayOf(std::vector<Connection>());
         k.patch.children = arrayOf<Patch>({});
     }},
    {"list of ports", 2, [](Inputs const&, Kept& k) { k.patch.inputs = arrayOf({Port{1}}); }},
    {"string of a string", 1, [](Inputs const& in, Kept& k) { k.text = to_string(in.text); }},
    {"number as a number again", 0,
     [](Inputs const& in, Kept& k) { k.value = in.number.asType(Type::Vec4); }},
    {"number as a string", 1,
     [](Inputs const& in, Kept& k) { k.value = in.number.asType(Type::String); }},

    // Unstructured data: one allocation for each map, array and string, plus those of the standard
    // containers.
    {"null data", 0, [](Inputs const&, Kept& k) { k.data = Unstructured(); }},
    {"data of a number", 0, [](Inputs const&, Kept& k) { k.data = 2.5; }},
    {"data of integers", 0,
     [](Inputs const&, Kept& k) {
         k.data = 7;
         k.data = 7u;
     }},
    {"data of a short string", 1, [](Inputs const&, Kept& k) { k.data = "short"; }},
    {"data of a long string", 2, [](Inputs const&, Kept& k) { k.data = kLongText; }},
    {"data of an empty map", 1, [](Inputs const&, Kept& k) { k.data = Unstructured::Map(); }},
    {"data of an empty array", 1, [](Inputs const&, Kept& k) { k.data = Unstructured::Array(); }},
    {"copy of an array of three", 2, [](Inputs const& in, Kept& k) { k.data = in.numbers; }},
    {"copy of a map of two", 3, [](Inputs const& in, Kept& k) { k.data = in.map; }},
    {"conversions of data", 0,
     [](Inputs const& in, Kept& k) {
         for (Unstructured const* u : {&in.numbers, &in.map, &in.word}) {
             k.number += u->asFloat() + double(u->asInteger()) + double(u->asId()) +
                         (u->asBool() ? 1 : 0) + sum(FloatVec2(*u)) + sum(FloatVec3(*u)) +
                         sum(FloatVec4(*u));
         }
     }},
    {"content of data in place", 0,
     [](Inputs const& in, Kept& k) {
         k.number += in.map.ifMap() && in.numbers.ifArray() && in.word.ifString();
     }},
    {"equality of data", 0,
     [](Inputs const& in, Kept& k) { k.number += in.map == in.map && in.numbers != in.word; }},

    // Paths: only the list of elements.
    {"path of 100 elements of up to three points", 1,
     [](Inputs const&, Kept& k) {
         k.path.elements.reserve(100);
         for (int i = 0; i < 25; ++i) {
             k.path.elements.push_back({PathInstruction::moveTo, {{1, 2}}});
             k.path.elements.push_back({PathInstruction::curveTo, {{1, 2}, {3, 4}, {5, 6}}});
             k.path.elements.push_back({PathInstruction::quadCurveTo, {{1, 2}, {3, 4}}});
             k.path.elements.push_back({PathInstruction::close, {}});
         }
     }},
    {"an ellipse", 1,
     [](Inputs const&, Kept& k) {
         k.builder.ellipse({0, 0}, {1, 2});
     }},
    {"a rounded rectangle", 1,
     [](Inputs const&, Kept& k) {
         k.builder.roundRect({}, {4, 4}, 1);
     }},
    {"a rectangle with cut corners", 1,
     [](Inputs const&, Kept& k) {
         k.builder.hexaRect({}, {4, 4}, 1);
     }},
    {"copy of a path", 1, [](Inputs const& in, Kept& k) { k.path = *in.path.ifPath(); }},
    {"equality of paths", 0,
     [](Inputs const& in, Kept& k) { k.number += *in.path.ifPath() == k.path ? 1 : 0; }},
    {"the empty path", 0,
     [](Inputs const&, Kept& k) { k.number += Path::EmptyPath()->elements.empty() ? 1 : 0; }},

    // Easing.
    {"ease of numbers and vectors", 0,
     [](Inputs const&, Kept& k) {
         for (int i = 0; i <= 12; ++i) {
             k.number += ease(EasingFunction(i), 0.0, 1.0, 0.3) +
                         sum(ease(EasingFunction(i), FloatVec4(), FloatVec4{1, 1, 1, 1}, 0.3));
         }
     }},
    {"ease of many numbers", 0,
     [](Inputs const&, Kept& k) {
         double progress[40] = {};
         easeEach(EasingFunction::QuadraticIn, 0.0, 1.0, progress, 40, progress);
         k.number += progress[0];
     }},
    {"cast of a range of indices", 0,
     [](Inputs const& in, Kept& k) {
         Value const* results[40];
         indexLoopCasting(in.loop, in.bounded, 7, 40, results);
         k.number += double(*results[0]);
     }},
    {"ease of values", 0,
     [](Inputs const& in, Kept& k) {
         k.value = ease(EasingFunction::CubicIn, in.number, in.number, 0.5);
     }},

    // Graphs: queries allocate only the sets that they return, queries of an index nothing.
    {"copy of a patch", 0, [](Inputs const& in, Kept& k) { k.patch = in.root; }},
    {"equality of patches", 0,
     [](Inputs const& in, Kept& k) { k.number += in.root == in.root ? 1 : 0; }},
    {"queries", 0,
     [](Inputs const& in, Kept& k) {
         k.number += findPatchRecursive(in.root, 3) && findPatchRecursive(in.evaluated, 3) &&
                     findInputPort(in.evaluated, 21) && findOutputPort(in.evaluated, 22) &&
                     inPortForTag(in.root, 1) && outPortForTag(in.evaluated, 1) &&
                     findIncomingConnectionToPort(in.root, 21);
     }},
    {"queries of an index of the evaluation form", 0,
     [](Inputs const& in, Kept& k) {
         for (unsigned long long id = 0; id < 50; ++id) {
             k.number += in.evaluatedIndex.findPatch(id) || in.evaluatedIndex.parentOf(id) ||
                         in.evaluatedIndex.findInputPort(id) ||
                         in.evaluatedIndex.findOutputPort(id) || in.evaluatedIndex.ownerOfPort(id);
         }
     }},
};

}  // namespace

TEST(Allocations, MatchTheTable) {
    Inputs const inputs;
    for (Row const& row : kRows) {
        Kept kept;
        AllocationCounter const counter;
        row.run(inputs, kept);
        EXPECT_EQ(counter.count(), row.blocks) << row.operation;
    }
}

TEST(Allocations, AreFreed) {
    auto const use = [](Row const& row) {
        Inputs const inputs;
        Kept kept;
        row.run(inputs, kept);
        // Assignments to existing objects, by copy and by move.
        Kept const copy = kept;
        row.run(inputs, kept);
        kept = copy;
        kept.data = inputs.map;
        kept.data = Unstructured(inputs.numbers);
        kept.data = 5;
        kept.value = inputs.text;
        kept.value = Value(inputs.path);
        kept.patch = Patch(inputs.root);
        kept.path.elements.emplace_back();
        kept.path = Path();
    };
    for (Row const& row : kRows) {
        use(row);  // Lazily initialised statics stay allocated.
        AllocationCounter const counter;
        use(row);
        EXPECT_EQ(counter.held(), 0u) << row.operation;
    }
}
