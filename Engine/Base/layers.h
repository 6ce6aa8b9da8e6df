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

/// A tree of 3D model layers. Copying and comparing are deep. 8 MiB of stack are enough for 10,000
/// levels of everything here.
struct ModelLayer {
    /// The layer, and those beneath it.
    unsigned long long id = 0;
    std::vector<ModelLayer> children = {};
    /// Compared and copied, but not part of the debug output.
    std::vector<ModelLayer> additionalLayers = {};

    /// The same identifiers in the same trees.
    TARN_API bool operator==(ModelLayer const& other) const;
    TARN_API bool operator!=(ModelLayer const& other) const;
};

/// One layer as the renderer knows it.
struct RenderLayer {
    /// The renderer's own; carried, copied and compared.
    unsigned long long rendererState = 0;
    unsigned long long id = 0;

    /// Both fields.
    TARN_API bool operator==(RenderLayer const& other) const;
    TARN_API bool operator!=(RenderLayer const& other) const;
};

/// A layer with those that are drawn ahead of it and those nested in it. 8 MiB of stack are enough
/// for 10,000 levels of everything here; the output of n levels has about n * n / 2 dashes.
struct RenderLayerHierarchy {
    /// The layer, those drawn ahead of it, and those nested in it.
    RenderLayer layer = {};
    std::vector<RenderLayerHierarchy> leadingLayers = {};
    std::vector<RenderLayerHierarchy> children = {};

    /// The same layers in the same trees.
    TARN_API bool operator==(RenderLayerHierarchy const& other) const;
    TARN_API bool operator!=(RenderLayerHierarchy const& other) const;
};

/// How an outline is stroked. The first three fields are the renderer's: carried, copied and
/// compared, and not looked at by `isVisible`.
struct StrokeSettings {
    /// The shapes of ends and corners, and how far a corner may reach, as the renderer counts them.
    unsigned char cap = 0;
    unsigned char join = 0;
    double miterLimit = 0.0;
    /// In the units of the path's points.
    double width = 0.0;
    /// From 0, unseen, to 1, opaque.
    double opacity = 0.0;
    /// The part of the outline that is drawn, as fractions of its length.
    double start = 0.0;
    double end = 0.0;
    /// Draw it even where `start` and `end` coincide.
    bool forceVisible = false;

    /// Whether the stroke is drawn at all: its opacity is not 0.0001 or less, its width is not 0.01
    /// or less, and either it is forced or `start` and `end` differ by at least the machine
    /// epsilon. A NaN hides nothing.
    TARN_API bool isVisible() const;

    /// Field by field, without a tolerance.
    TARN_API bool operator==(StrokeSettings const& other) const;
    TARN_API bool operator!=(StrokeSettings const& other) const;
};

/// The worker behind the hierarchy's output. Each line is a dash, `prefix`, "v" where `marked`, and
/// the layer; leading layers come first and are marked, children follow with one dash more.
TARN_API void _helper(std::ostream& stream, RenderLayerHierarchy const& hierarchy,
                      std::string prefix, bool marked);

/// One line for each layer, its `id` after as many dashes as it is deep. Every line is flushed.
TARN_API std::ostream& operator<<(std::ostream& stream, ModelLayer const& layer);

/// Writes the `id` alone.
TARN_API std::ostream& operator<<(std::ostream& stream, RenderLayer const& layer);

/// The lines of `_helper`, from an empty prefix, unmarked. Every line is flushed.
TARN_API std::ostream& operator<<(std::ostream& stream, RenderLayerHierarchy const& hierarchy);

}  // namespace tarn::engine

#endif
