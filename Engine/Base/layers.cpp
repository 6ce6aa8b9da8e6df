#include <Engine/Base/layers.h>

#include <cmath>
#include <cstddef>
#include <functional>
#include <limits>
#include <ostream>

namespace tarn::engine {

bool ModelLayer::operator==(ModelLayer const& other) const {
    return id == other.id && children == other.children &&
           additionalLayers == other.additionalLayers;
}
bool ModelLayer::operator!=(ModelLayer const& other) const { return !(*this == other); }

bool RenderLayer::operator==(RenderLayer const& other) const {
    return rendererState == other.rendererState && id == other.id;
}
bool RenderLayer::operator!=(RenderLayer const& other) const { return !(*this == other); }

bool RenderLayerHierarchy::operator==(RenderLayerHierarchy const& other) const {
    return layer == other.layer && leadingLayers == other.leadingLayers &&
           children == other.children;
}
bool RenderLayerHierarchy::operator!=(RenderLayerHierarchy const& other) const {
    return !(*this == other);
}

bool StrokeSettings::operator==(StrokeSettings const& other) const {
    return cap == other.cap && join == other.join && miterLimit == other.miterLimit &&
           width == other.width && opacity == other.opacity && start == other.start &&
           end == other.end && forceVisible == other.forceVisible;
}
bool StrokeSettings::operator!=(StrokeSettings const& other) const { return !(*this == other); }

bool StrokeSettings::isVisible() const {
    if (0.0001 >= opacity) return false;
    if (0.01 >= width) return false;
    if (forceVisible) return true;
    return !(std::abs(start - end) < std::numeric_limits<double>::epsilon());
}

void _helper(std::ostream& stream, RenderLayerHierarchy const& hierarchy, std::string prefix,
             bool marked) {
    for (RenderLayerHierarchy const& leading : hierarchy.leadingLayers) {
        _helper(stream, leading, prefix, true);
    }
    stream << "-" << prefix << (marked ? "v" : "") << hierarchy.layer << std::endl;
    for (RenderLayerHierarchy const& child : hierarchy.children) {
        _helper(stream, child, prefix + "-", marked);
    }
}

std::ostream& operator<<(std::ostream& stream, ModelLayer const& layer) {
    std::function<void(ModelLayer const&, std::size_t)> const write = [&](ModelLayer const& current,
                                                                          std::size_t depth) {
        for (std::size_t i = 0; i < depth; ++i) stream << "-";
        stream << current.id << std::endl;
        for (ModelLayer const& child : current.children) write(child, depth + 1);
    };
    write(layer, 0);
    return stream;
}

std::ostream& operator<<(std::ostream& stream, RenderLayer const& layer) {
    return stream << layer.id;
}

std::ostream& operator<<(std::ostream& stream, RenderLayerHierarchy const& hierarchy) {
    _helper(stream, hierarchy, "", false);
    return stream;
}

}  // namespace tarn::engine
