// Engine/Base/path_geometry.h: bounding boxes, transformations and interpolation of paths.
//
//     Path circle = PathBuilder().circle({0, 0}, 5).build();
//     Optional<Bounds> box = bounds(circle);  // (-5, -5) to (5, 5)

#ifndef TARN_ENGINE_BASE_PATH_GEOMETRY_H
#define TARN_ENGINE_BASE_PATH_GEOMETRY_H

#include <Engine/Base/export.h>
#include <Engine/Base/optional.h>
#include <Engine/Base/path.h>
#include <Engine/Base/value.h>

namespace tarn::engine {

/// An axis-parallel box, in the units of the points that it encloses.
struct Bounds {
    /// The corners with the smallest and with the largest coordinates.
    FloatVec2 min = {};
    FloatVec2 max = {};

    /// Compares both corners.
    friend constexpr bool operator==(Bounds const& a, Bounds const& b) {
        return a.min == b.min && a.max == b.max;
    }
    friend constexpr bool operator!=(Bounds const& a, Bounds const& b) { return !(a == b); }
};

/// The smallest box around what the path draws, to within rounding: curves count by their extrema,
/// not by their control points. Every `moveTo` counts as a point; a path that does not begin with
/// one begins at (0, 0). Empty for a path without a point that has numbers as coordinates. Where a
/// control point is infinite, the box is infinite. Elements with fewer points than their
/// instruction needs are skipped, and so is a coordinate that is a NaN. Linear.
TARN_API Optional<Bounds> bounds(Path const& path);

/// The path with `offset` added to every point.
TARN_API Path translated(Path const& path, FloatVec2 offset);

/// The path with every point's coordinates multiplied by `factors`: scaled about the origin.
TARN_API Path scaled(Path const& path, FloatVec2 factors);

/// Interpolates from `a` to `b`: exactly `a` at `t` 0, exactly `b` at 1, and for every other `t`
/// each coordinate is x + (y - x) * t. Empty where the two differ in instructions or numbers of
/// points. Linear.
TARN_API Optional<Path> interpolate(Path const& a, Path const& b, double t);

}  // namespace tarn::engine

#endif
