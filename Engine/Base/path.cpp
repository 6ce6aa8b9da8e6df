#include <Engine/Base/path.h>

#include <Engine/Base/detail/immortal.h>
#include <Engine/Base/detail/unreachable.h>

#include <algorithm>
#include <array>
#include <cstddef>
#include <iterator>
#include <ostream>
#include <string_view>

namespace tarn::engine {

namespace {

constexpr std::array<std::string_view, 5> kInstructionNames{"moveTo", "lineTo", "curveTo",
                                                            "quadCurveTo", "close"};
static_assert(kInstructionNames.size() == std::size_t(PathInstruction::close) + 1);

constexpr double kQuarterArc = 0.552284749;  // Deliberate: nine decimals, not 4(sqrt(2) - 1)/3.
constexpr double kQuarterArcRest = 0.447715251;
static_assert(kQuarterArcRest == 1.0 - kQuarterArc);

// Only growing the list can fail: up to three points fit in place.
template <class... Vectors>
void add(std::vector<PathElement>& elements, PathInstruction instruction, Vectors... points) {
    PathElement& element = elements.emplace_back();
    element.instruction = instruction;
    (element.points.push_back(points), ...);
}

}  // namespace

std::string pathInstructionToString(PathInstruction instruction) {
    if (std::size_t(instruction) >= kInstructionNames.size()) {
        TARN_ENGINE_BASE_UNREACHABLE("Engine/Base/path");
    }
    return std::string(kInstructionNames[std::size_t(instruction)]);
}

Optional<PathInstruction> parsePathInstruction(std::string const& name) {
    for (std::size_t i = 0; i < kInstructionNames.size(); ++i) {
        if (kInstructionNames[i] == name) return PathInstruction(i);
    }
    return std::nullopt;
}

PathInstruction stringToPathInstruction(std::string const& name) {
    Optional<PathInstruction> const instruction = parsePathInstruction(name);
    if (!instruction) TARN_ENGINE_BASE_UNREACHABLE("Engine/Base/path");
    return *instruction;
}

std::ostream& operator<<(std::ostream& stream, PathInstruction instruction) {
    if (std::size_t(instruction) >= kInstructionNames.size()) {
        return stream << "PathInstruction(" << int(instruction) << ")";
    }
    return stream << kInstructionNames[std::size_t(instruction)];
}

bool PathElement::operator==(PathElement const& other) const {
    return instruction == other.instruction && points == other.points;
}
bool PathElement::operator!=(PathElement const& other) const { return !(*this == other); }

Path::Path() = default;
Path::Path(std::vector<PathElement> drawn) : elements(std::move(drawn)) {}
Path::Path(Path const& other) = default;
Path::Path(Path&& other) noexcept = default;
Path& Path::operator=(Path const& other) = default;
Path& Path::operator=(Path&& other) noexcept = default;
Path::~Path() = default;

bool Path::operator==(Path const& other) const { return elements == other.elements; }
bool Path::operator!=(Path const& other) const { return !(*this == other); }

std::shared_ptr<Path const> Path::EmptyPath() {
    static detail::Immortal<std::shared_ptr<Path const>> const emptyPathSharedPtr(
        std::make_shared<Path const>());
    return emptyPathSharedPtr.value;
}

// Keeps growth geometric over many calls.
void PathBuilder::reserve(std::size_t more) {
    std::size_t const needed = elements.size() + more;
    if (needed > elements.capacity()) elements.reserve(std::max(needed, 2 * elements.capacity()));
}

PathBuilder& PathBuilder::moveTo(FloatVec2 p) {
    add(elements, PathInstruction::moveTo, p);
    currentPoint = p;
    return *this;
}

PathBuilder& PathBuilder::lineTo(FloatVec2 p) {
    add(elements, PathInstruction::lineTo, p);
    currentPoint = p;
    return *this;
}

PathBuilder& PathBuilder::curveTo(FloatVec2 c1, FloatVec2 c2, FloatVec2 p) {
    add(elements, PathInstruction::curveTo, c1, c2, p);
    currentPoint = p;
    return *this;
}

PathBuilder& PathBuilder::quadCurveTo(FloatVec2 c, FloatVec2 p) {
    add(elements, PathInstruction::quadCurveTo, c, p);
    currentPoint = p;
    return *this;
}

PathBuilder& PathBuilder::close() {
    add(elements, PathInstruction::close);
    return *this;
}

PathBuilder& PathBuilder::append(Path path) {
    reserve(path.elements.size());  // Everything that can fail comes first.
    elements.insert(elements.end(), std::make_move_iterator(path.elements.begin()),
                    std::make_move_iterator(path.elements.end()));
    return *this;
}

PathBuilder& PathBuilder::arcTo(FloatVec2 p, bool verticalFirst) {
    FloatVec2 const c = currentPoint;
    FloatVec2 const d{p.x - c.x, p.y - c.y};
    // The second control point lies on the end's line through c + d as computed, not through p.
    if (verticalFirst) {
        return curveTo({c.x, kQuarterArc * d.y + c.y}, {kQuarterArcRest * d.x + c.x, d.y + c.y}, p);
    }
    return curveTo({kQuarterArc * d.x + c.x, c.y}, {c.x + d.x, kQuarterArcRest * d.y + c.y}, p);
}

PathBuilder& PathBuilder::ellipse(FloatVec2 center, FloatVec2 radii) {
    auto const [x, y] = center;
    auto const [rx, ry] = radii;
    FloatVec2 const start{x + rx, y + 0.0};  // Deliberate: the sums with 0.0 lose a -0.0.
    reserve(6);
    return moveTo(start)
        .arcTo({0.0 + x, y + ry}, true)
        .arcTo({x - rx, y}, false)
        .arcTo({x, y - ry}, true)
        .arcTo(start, false)
        .close();
}

PathBuilder& PathBuilder::circle(FloatVec2 center, double radius) {
    return ellipse(center, {radius, radius});
}

PathBuilder& PathBuilder::roundRect(FloatVec2 origin, FloatVec2 size, double radius) {
    auto const [x, y] = origin;
    auto const [w, h] = size;
    double const right = w + x;
    double const bottom = h + y;
    double const largest = h * 0.5 < w * 0.5 ? h * 0.5 : w * 0.5;
    double const r = radius < largest ? radius : largest;
    reserve(10);
    return moveTo({r + x, y})
        .lineTo({right - r, y})
        .arcTo({right, r + y}, false)
        .lineTo({right, bottom - r})
        .arcTo({right - r, bottom}, true)
        .lineTo({r + x, bottom})
        .arcTo({x, bottom - r}, false)
        .lineTo({x, r + y})
        .arcTo({r + x, y}, true)
        .close();
}

PathBuilder& PathBuilder::hexaRect(FloatVec2 origin, FloatVec2 size, double cut) {
    auto const [x, y] = origin;
    auto const [w, h] = size;
    double const right = w + x;
    double const bottom = h + y;
    reserve(9);
    return moveTo({x + cut, y})
        .lineTo({right - cut, y})
        .lineTo({right, y + cut})
        .lineTo({right, bottom - cut})
        .lineTo({right - cut, bottom})
        .lineTo({x + cut, bottom})
        .lineTo({x, bottom - cut})
        .lineTo({x, y + cut})
        .close();
}

Path PathBuilder::build() const& { return elements; }
Path PathBuilder::build() && { return std::move(elements); }

bool PathBuilder::operator==(PathBuilder const& other) const {
    return currentPoint == other.currentPoint && elements == other.elements;
}
bool PathBuilder::operator!=(PathBuilder const& other) const { return !(*this == other); }

}  // namespace tarn::engine
