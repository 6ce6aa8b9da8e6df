// Engine/Base/path.h: vector paths and their builder.
//
//     Path ring = PathBuilder().circle({0, 0}, 2.0).circle({0, 0}, 1.0).build();
//     Value value = ring;

#ifndef TARN_ENGINE_BASE_PATH_H
#define TARN_ENGINE_BASE_PATH_H

#include <Engine/Base/export.h>
#include <Engine/Base/optional.h>
#include <Engine/Base/points.h>
#include <Engine/Base/value.h>

#include <cstddef>
#include <iosfwd>
#include <memory>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace tarn::engine {

/// What an element draws, and the points that the builder stores for it.
enum class PathInstruction : unsigned char {
    moveTo = 0,       // the new current point
    lineTo = 1,       // the end
    curveTo = 2,      // first control point, second control point, end
    quadCurveTo = 3,  // control point, end
    close = 4,        // none
};

/// "moveTo" to "close". An undefined enumerator is an assertion failure.
TARN_API std::string pathInstructionToString(PathInstruction instruction);

/// The inverse, compared byte by byte. Any other string is an assertion failure with the condition
/// `0`.
TARN_API PathInstruction stringToPathInstruction(std::string const& name);

/// The same, but empty for any other string.
TARN_API Optional<PathInstruction> parsePathInstruction(std::string const& name);

/// Writes the name, or "PathInstruction(77)" for an undefined enumerator.
TARN_API std::ostream& operator<<(std::ostream& stream, PathInstruction instruction);

/// One instruction with its points. The number of points is not checked.
struct PathElement {
    /// What is drawn.
    PathInstruction instruction = PathInstruction::moveTo;
    /// Up to three points allocate nothing.
    Points points = {};

    /// Equal instructions and equal points, compared as floating-point numbers: an element that
    /// contains a NaN is unequal to itself.
    TARN_API bool operator==(PathElement const& other) const;
    TARN_API bool operator!=(PathElement const& other) const;
};

/// A vector path: elements in drawing order. Copying is deep.
struct Path {
    /// In drawing order.
    std::vector<PathElement> elements;

    /// Empty, from elements, or a copy. A move takes constant time.
    TARN_API Path();
    TARN_API Path(std::vector<PathElement> drawn);
    TARN_API Path(Path const& other);
    TARN_API Path(Path&& other) noexcept;
    TARN_API Path& operator=(Path const& other);
    TARN_API Path& operator=(Path&& other) noexcept;
    TARN_API ~Path();

    /// The same number of elements, equal in order.
    TARN_API bool operator==(Path const& other) const;
    TARN_API bool operator!=(Path const& other) const;

    /// The empty path that everyone shares: the same object at every call.
    TARN_API static std::shared_ptr<Path const> EmptyPath();
};
static_assert(std::is_nothrow_move_constructible_v<PathElement>, "elements move when paths grow");

/// Appends drawing instructions. Every function except `build` returns the builder, so that calls
/// can be chained. Nothing is checked: coordinates are stored as given, NaN included, and a path
/// may begin with any instruction. A failing allocation leaves the builder as it was before the
/// instruction (or the `append`).
class PathBuilder {
public:
    /// The end of the last instruction that has one; initially (0, 0). `close` and `append` do not
    /// change it.
    FloatVec2 currentPoint = {};
    std::vector<PathElement> elements = {};

    /// Sets the current point to p.
    TARN_API PathBuilder& moveTo(FloatVec2 p);
    /// Sets the current point to p.
    TARN_API PathBuilder& lineTo(FloatVec2 p);
    /// A cubic Bézier curve with the control points c1 and c2. Sets the current point to p.
    TARN_API PathBuilder& curveTo(FloatVec2 c1, FloatVec2 c2, FloatVec2 p);
    /// A quadratic Bézier curve with the control point c. Sets the current point to p.
    TARN_API PathBuilder& quadCurveTo(FloatVec2 c, FloatVec2 p);
    /// Does not change the current point: it is not the start of the outline.
    TARN_API PathBuilder& close();
    /// Appends every element of `path`, or none where an allocation fails. Does not change the
    /// current point: it is not the end of `path`.
    TARN_API PathBuilder& append(Path path);

    /// A quarter of an axis-parallel ellipse, as one cubic curve. It is at most 2.726e-4 of the
    /// radius outside of the ellipse, since the control factor is 0.552284749. `verticalFirst`:
    /// leave along y and arrive along x; otherwise the reverse. Sets the current point to p.
    TARN_API PathBuilder& arcTo(FloatVec2 p, bool verticalFirst);

    // Closed outlines.

    /// `radii` are half the width and half the height, `radius` is both; not checked, a negative
    /// one mirrors the outline on its axis. Starts at the largest x and continues towards the
    /// largest y (for positive radii). Sets the current point to that start.
    TARN_API PathBuilder& ellipse(FloatVec2 center, FloatVec2 radii);
    TARN_API PathBuilder& circle(FloatVec2 center, double radius);
    /// `origin` is the corner with the smallest x and y. `size` is not checked; a negative one
    /// mirrors the outline on its axis. `radius` is limited to half the width and half the height;
    /// a NaN is the largest. Sets the current point to (origin.x + radius, origin.y).
    TARN_API PathBuilder& roundRect(FloatVec2 origin, FloatVec2 size, double radius);
    /// A rectangle whose corners are cut off: `cut` is the length along either edge, not limited.
    /// `size` is not checked; a negative one mirrors the outline on its axis. Sets the current
    /// point to (origin.x, origin.y + cut), where its last line ends.
    TARN_API PathBuilder& hexaRect(FloatVec2 origin, FloatVec2 size, double cut);

    /// A path with all elements so far. The builder keeps them and can go on.
    /// `std::move(builder).build()` moves the elements instead of copying them.
    TARN_API Path build() const&;
    TARN_API Path build() &&;

    /// The same elements and the same current point.
    TARN_API bool operator==(PathBuilder const& other) const;
    TARN_API bool operator!=(PathBuilder const& other) const;

private:
    void reserve(std::size_t more);
};

}  // namespace tarn::engine

#endif
