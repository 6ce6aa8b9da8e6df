// Braced initialisers of records, compiled with warnings as errors.

#include <Engine/Base/layers.h>
#include <Engine/Base/patch.h>
#include <Engine/Base/path.h>
#include <Engine/Base/value.h>

using namespace tarn::engine;

void inOrder() {
    [[maybe_unused]] TypeInfo const info{Type::Float};
    [[maybe_unused]] TypeInfo const pulse{Type::Boolean, 1};
    [[maybe_unused]] TypeInfo const bounded{Type::Float, 0, Value(0.0)};
    [[maybe_unused]] Port const port{1};
    [[maybe_unused]] Port const named{1, 2, "radius", {Type::Float}};
    [[maybe_unused]] Connection const connection{1, 2};
    [[maybe_unused]] Patch const patch{1};
    [[maybe_unused]] Patch const described{1, 2, "text"};
    [[maybe_unused]] ModelLayer const layer{1};
    [[maybe_unused]] ModelLayer const layers{1, {ModelLayer{2}}};
    [[maybe_unused]] RenderLayer const render{1};
    [[maybe_unused]] RenderLayerHierarchy const hierarchy{{0, 1}};
    [[maybe_unused]] StrokeSettings const stroke{1};
    [[maybe_unused]] PathElement const element{PathInstruction::close};
    [[maybe_unused]] PathBuilder const builder{{1, 2}};
    [[maybe_unused]] FloatVec3 const vector{1};
    [[maybe_unused]] FloatMat4 const matrix{{1}};
}

#if __cplusplus >= 202002L
void byName() {
    [[maybe_unused]] TypeInfo const info{.type = Type::Float, .max = Value(1.0)};
    [[maybe_unused]] Port const port{.id = 1, .name = "radius", .defaultValue = 2.5};
    [[maybe_unused]] Connection const connection{.fromPortId = 1, .toPortId = 2};
    [[maybe_unused]] Patch const patch{.id = 1, .inputs = arrayOf({port})};
    [[maybe_unused]] ModelLayer const layer{.id = 1};
    [[maybe_unused]] RenderLayerHierarchy const hierarchy{.layer = {.id = 1}};
    [[maybe_unused]] StrokeSettings const stroke{.width = 1, .opacity = 1};
    [[maybe_unused]] PathElement const element{.instruction = PathInstruction::close};
    [[maybe_unused]] FloatVec4 const colour{.x = 1, .w = 1};
}
#endif
