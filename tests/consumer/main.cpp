// A program outside this repository: a little of every module, from the installed headers and
// library.

#include <Engine/Base/easing.h>
#include <Engine/Base/fwd.h>
#include <Engine/Base/layers.h>
#include <Engine/Base/media.h>
#include <Engine/Base/patch_index.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <iostream>

using namespace tarn::engine;

int main() {
    Patch root;
    root.id = 7;
    root.name = "root";
    PatchIndex const index(root);
    Value const eased = ease(EasingFunction::CubicOut, Value(0.0), Value(100.0), 0.5);
    Value const path = PathBuilder().circle({0, 0}, 1).build();
    Unstructured const data = Unstructured::Map{{"X", 1.5}};
    std::cout << index.findPatch(7)->name << " " << eased << " " << path << " "
              << Value(FloatVec2(data)) << " " << easingFunctionNames().size() << " "
              << keyboardTypes().size() << " " << ModelLayer{3, {}, {}};
}
