// Engine/Base/fwd.h: forward declarations of all public types.
//
//     #include <Engine/Base/fwd.h>
//     void draw(tarn::engine::Path const& path);

#ifndef TARN_ENGINE_BASE_FWD_H
#define TARN_ENGINE_BASE_FWD_H

#include <cstdint>

namespace tarn::engine {

// value.h
enum class Type : unsigned char;
struct FloatVec2;
struct FloatVec3;
struct FloatVec4;
struct FloatMat4;
class Value;
struct TypeInfo;

// optional.h
template <class T>
class Optional;

// unstructured.h
class Unstructured;

// patch.h
struct Port;
struct Connection;
struct Patch;
struct EvalPort;
struct EvalPatch;

// patch_index.h
class ConnectionView;
class PatchIndex;
class EvalPatchIndex;

// patch_edit.h
class PatchEdit;

// patch_changes.h
enum class PortField : unsigned char;
enum class PatchField : unsigned char;
struct PortChange;
struct PatchChange;

// points.h, path.h
class Points;
enum class PathInstruction : unsigned char;
struct PathElement;
struct Path;
class PathBuilder;

// easing.h
enum class EasingFunction : std::int32_t;

// layers.h
struct ModelLayer;
struct RenderLayer;
struct RenderLayerHierarchy;
struct StrokeSettings;

// media.h
enum class ImageFormat : unsigned char;
enum class MediaContainer : unsigned char;

}  // namespace tarn::engine

#endif
