// A program to break in `here`, with one object of every type that the debuggers' printers support.

#include <Engine/Base/patch_index.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <memory>
#include <vector>

using namespace tarn::engine;

namespace {

Port port(unsigned long long id, char const* name) {
    Port result;
    result.id = id;
    result.name = name;
    return result;
}

int volatile stops = 0;

}  // namespace

// Takes the addresses of all objects, so that none is optimised away.
extern "C" void here(std::initializer_list<void const*> everything) {
    stops = stops + static_cast<int>(everything.size());
}

int main() {
    Value integer = -7;
    Value number = 2.5;
    Value pair = FloatVec2{1, 0.1};
    Value color = FloatVec4{0.5, 0.25, 0, 1};
    Value matrix = FloatMat4();
    Value truth = true;
    Value image = Value::Image(42);
    Value text = "say \"so\"";
    Value none = std::shared_ptr<Path const>();

    Unstructured data(Unstructured::Map{
        {"list", Unstructured::Array{1, 2.5, 3u, "four", Unstructured::Undefined()}},
        {"name", "tree"},
        {"nested", Unstructured::Map{{"X", 1.5}}}});
    Value tree = data;

    Path path = PathBuilder().moveTo({1, 2}).quadCurveTo({3, 4}, {5, 6}).close().build();
    Value drawn = path;
    Points many{{1, 1}, {2, 2}, {3, 3}, {4, 4}};
    PathElement element{PathInstruction::curveTo, {{1, 2}, {3, 4}, {5, 6}}};

    TypeInfo bounded{Type::Float, 0, Value(0.0), Value(1.0), {}};
    TypeInfo pulse{Type::Boolean, 1, {}, {}, {}};
    Optional<Value> some = Value(3);
    Optional<Value> nothing;

    Patch inner;
    inner.id = 2;
    inner.name = "inner";
    Port input = port(21, "in");
    input.typeInfo = bounded;
    input.defaultValue = 0.5;
    input.attributes.emplace("hint", "a half");
    inner.inputs = arrayOf<Port>({input});
    inner.outputs = arrayOf<Port>({port(22, "out")});
    Patch root;
    root.id = 1;
    root.name = "root";
    root.builtin = 9;
    root.children = arrayOf<Patch>({inner});
    root.connections = arrayOf<Connection>({{2, 22, 2, 21}});
    EvalPatch evaluated(root);
    PatchIndex index(root);
    EvalPatchIndex evaluatedIndex(evaluated);

    here({&integer, &number, &pair,  &color, &matrix, &truth,     &image,         &text,  &none,
          &data,    &tree,   &path,  &drawn, &many,   &element,   &bounded,       &pulse, &some,
          &nothing, &inner,  &input, &root,  &index,  &evaluated, &evaluatedIndex});
}
