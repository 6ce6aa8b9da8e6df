// Engine/Base/path.h: vector outlines, and the builder that makes them.
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

/// What an element draws, and the points that the builder gives it.
enum class PathInstruction : unsigned char {
    moveTo = 0,       // the new current point
    lineTo = 1,       // the end
    curveTo = 2,      // first control point, second control point, end
    quadCurveTo = 3,  // control point, end
    close = 4,        // none
};

/// "moveTo" to "close". An enumerator out of range is an assertion failure.
TARN_API std::string pathInstructionToString(PathInstruction instruction);

/// The inverse, byte by byte. Any other string is an assertion failure, with the condition `0`.
TARN_API PathInstruction stringToPathInstruction(std::string const& name);

/// The same, empty for any other string.
TARN_API Optional<PathInstruction> parsePathInstruction(std::string const& name);

/// Writes the name; "PathInstruction(77)" for what is no enumerator.
TARN_API std::ostream& operator<<(std::ostream& stream, PathInstruction instruction);

/// One instruction with its points. Their number is not checked against the instruction.
struct PathElement {
    /// What is drawn.
    PathInstruction instruction = PathInstruction::moveTo;
    /// Up to three of them allocate nothing.
    Points points = {};

    /// Equal instructions, and as many points, equal as floating-point numbers are: with a NaN
    /// in it an element is unequal to itself.
    TARN_API bool operator==(PathElement const& other) const;
    TARN_API bool operator!=(PathElement const& other) const;
};

/// An outline: elements in drawing order. Copying is deep.
struct Path {
    /// In drawing order.
    std::vector<PathElement> elements;

    /// Empty, of the elements given, or a copy; a move takes constant time.
    TARN_API Path();
    TARN_API Path(std::vector<PathElement> drawn);
    TARN_API Path(Path const& other);
    TARN_API Path(Path&& other) noexcept;
    TARN_API Path& operator=(Path const& other);
    TARN_API Path& operator=(Path&& other) noexcept;
    TARN_API ~Path();

    /// As many elements, equal in order.
    TARN_API bool operator==(Path const& other) const;
    TARN_API bool operator!=(Path const& other) const;

    /// The one empty path that everyone shares: the same object at every call.
    TARN_API static std::shared_ptr<Path const> EmptyPath();
};
static_assert(std::is_nothrow_move_constructible_v<PathElement>, "elements move when paths grow");

/// Appends drawing instructions one after another. Every call but `build` returns the builder, so
/// that calls chain. Nothing is checked: any coordinates are kept as given, NaN included, and a
/// path may begin with any instruction. A failing allocation leaves the builder as it was before
/// the instruction (or the `append`) that needed it.
class PathBuilder {
public:
    /// The end of the last instruction that has one; at first (0, 0). `close` and `append` leave
    /// it where it was.
    FloatVec2 currentPoint = {};
    std::vector<PathElement> elements = {};

    /// Afterwards the current point is p.
    TARN_API PathBuilder& moveTo(FloatVec2 p);
    /// Afterwards the current point is p.
    TARN_API PathBuilder& lineTo(FloatVec2 p);
    /// A cubic curve with the control points c1 and c2. Afterwards the current point is p.
    TARN_API PathBuilder& curveTo(FloatVec2 c1, FloatVec2 c2, FloatVec2 p);
    /// A quadratic curve with the control point c. Afterwards the current point is p.
    TARN_API PathBuilder& quadCurveTo(FloatVec2 c, FloatVec2 p);
    /// Afterwards the current point is what it was, not the start of the outline.
    TARN_API PathBuilder& close();
    /// Every element of `path`, or none where memory fails. Afterwards the current point is what
    /// it was, not the end of `path`.
    TARN_API PathBuilder& append(Path path);

    /// A quarter of an ellipse with its axes along x and y, as one cubic curve. It is at
    /// most 2.726e-4 of the radius outside of the ellipse, since the control factor is 0.552284749.
    /// `verticalFirst`: leave along y and arrive along x; otherwise the reverse. Afterwards the
    /// current point is p.
    TARN_API PathBuilder& arcTo(FloatVec2 p, bool verticalFirst);

    // Closed outlines.

    /// `radii` are half the width and half the height, `radius` is both; not checked, negative ones
    /// turn the outline over. Starts at the largest x and runs through the largest y. Afterwards
    /// the current point is that start.
    TARN_API PathBuilder& ellipse(FloatVec2 center, FloatVec2 radii);
    TARN_API PathBuilder& circle(FloatVec2 center, double radius);
    /// `origin` is the corner of smallest x and y. `size` is not checked; a negative one turns the
    /// outline over. `radius` is at most half the width and half the height; a NaN is the largest.
    /// Afterwards the current point is (origin.x + radius, origin.y).
    TARN_API PathBuilder& roundRect(FloatVec2 origin, FloatVec2 size, double radius);
    /// A rectangle with each corner cut off, `cut` along either edge, not limited. `size` is not
    /// checked; a negative one turns the outline over. Afterwards the current point is (origin.x,
    /// origin.y + cut), where its last line ended.
    TARN_API PathBuilder& hexaRect(FloatVec2 origin, FloatVec2 size, double cut);

    /// A path of all elements so far. The builder keeps them and can go on; one that is done
    /// hands them over without a copy: `std::move(builder).build()`.
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
