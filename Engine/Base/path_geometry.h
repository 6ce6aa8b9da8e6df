// Engine/Base/path_geometry.h: where a path lies, and paths made of others.
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

/// A box with edges along the axes, in the units of the points it is of.
struct Bounds {
    /// The corners of the smallest and of the largest coordinates.
    FloatVec2 min = {};
    FloatVec2 max = {};

    /// Both corners.
    friend constexpr bool operator==(Bounds const& a, Bounds const& b) {
        return a.min == b.min && a.max == b.max;
    }
    friend constexpr bool operator!=(Bounds const& a, Bounds const& b) { return !(a == b); }
};

/// The smallest box around what the path draws: curves count by where they reach, not by their
/// control points, to within rounding. Every `moveTo` counts as a point; what begins without one
/// begins at (0, 0). Empty for a path without a point whose coordinates are
/// numbers; where a control point is infinite, so is the box. Elements with fewer points than their
/// instruction wants are left out, and so is a coordinate that is a NaN. Linear.
TARN_API Optional<Bounds> bounds(Path const& path);

/// The path with every point moved by `offset`.
TARN_API Path translated(Path const& path, FloatVec2 offset);

/// The path with every point's coordinates times `factors`: larger and smaller about the origin.
TARN_API Path scaled(Path const& path, FloatVec2 factors);

/// The path on the way from `a` to `b`: `a` itself at `t` 0, `b` itself at 1, and between and
/// beyond them every coordinate x + (y - x) * t. Empty where the two have different instructions or
/// numbers of points. Linear.
TARN_API Optional<Path> interpolate(Path const& a, Path const& b, double t);

}  // namespace tarn::engine

#endif
