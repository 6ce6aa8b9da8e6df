// Engine/Base/layers.h: what the renderer draws: model layers, layer hierarchies and strokes.
//
//     ModelLayer scene{1, {ModelLayer{2}}};
//     std::cout << scene;  // "1\n-2\n"

#ifndef TARN_ENGINE_BASE_LAYERS_H
#define TARN_ENGINE_BASE_LAYERS_H

#include <Engine/Base/export.h>

#include <iosfwd>
#include <string>
#include <vector>

namespace tarn::engine {

/// A tree of 3D model layers. Copying and comparing are deep. All operations are recursive: 8 MiB
/// of stack are enough for 10,000 levels.
struct ModelLayer {
    /// The layer's identifier, and the layers below it.
    unsigned long long id = 0;
    std::vector<ModelLayer> children = {};
    /// Compared and copied, but not printed.
    std::vector<ModelLayer> additionalLayers = {};

    /// Compares identifiers, recursively.
    TARN_API bool operator==(ModelLayer const& other) const;
    TARN_API bool operator!=(ModelLayer const& other) const;
};

/// One layer, as the renderer identifies it.
struct RenderLayer {
    /// For the renderer: carried, copied and compared.
    unsigned long long rendererState = 0;
    unsigned long long id = 0;

    /// Compares both fields.
    TARN_API bool operator==(RenderLayer const& other) const;
    TARN_API bool operator!=(RenderLayer const& other) const;
};

/// A layer with its leading layers, which are drawn before it, and its children. All operations are
/// recursive: 8 MiB of stack are enough for 10,000 levels. The output of n nested levels has about
/// n * n / 2 dashes.
struct RenderLayerHierarchy {
    /// The layer, the layers drawn before it, and its children.
    RenderLayer layer = {};
    std::vector<RenderLayerHierarchy> leadingLayers = {};
    std::vector<RenderLayerHierarchy> children = {};

    /// Compares recursively.
    TARN_API bool operator==(RenderLayerHierarchy const& other) const;
    TARN_API bool operator!=(RenderLayerHierarchy const& other) const;
};

/// How an outline is stroked. The renderer defines the first three fields: they are carried, copied
/// and compared, but `isVisible` ignores them.
struct StrokeSettings {
    /// Line cap, line join and miter limit, in the renderer's own numbers.
    unsigned char cap = 0;
    unsigned char join = 0;
    double miterLimit = 0.0;
    /// In the units of the path's points.
    double width = 0.0;
    /// From 0 (transparent) to 1 (opaque).
    double opacity = 0.0;
    /// The part of the outline that is drawn, as fractions of its length.
    double start = 0.0;
    double end = 0.0;
    /// Draw the stroke even where `start` and `end` coincide.
    bool forceVisible = false;

    /// Whether the stroke is drawn at all: the opacity is not 0.0001 or less, the width is not 0.01
    /// or less, and either `forceVisible` is set or `start` and `end` differ by at least the
    /// machine epsilon. A NaN passes each of these tests.
    TARN_API bool isVisible() const;

    /// Field by field, without a tolerance.
    TARN_API bool operator==(StrokeSettings const& other) const;
    TARN_API bool operator!=(StrokeSettings const& other) const;
};

/// Implements the hierarchy's output. Each line is a dash, `prefix`, "v" where `marked`, and the
/// layer; leading layers come first and are marked, children follow with one dash more.
TARN_API void _helper(std::ostream& stream, RenderLayerHierarchy const& hierarchy,
                      std::string prefix, bool marked);

/// Writes a line for each layer: its `id` after as many dashes as it is deep. Flushes every line.
TARN_API std::ostream& operator<<(std::ostream& stream, ModelLayer const& layer);

/// Writes the `id` alone.
TARN_API std::ostream& operator<<(std::ostream& stream, RenderLayer const& layer);

/// Calls `_helper` with an empty prefix, unmarked. Flushes every line.
TARN_API std::ostream& operator<<(std::ostream& stream, RenderLayerHierarchy const& hierarchy);

}  // namespace tarn::engine

#endif
