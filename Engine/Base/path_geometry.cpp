#include <Engine/Base/path_geometry.h>

#include <Engine/Base/vector_math.h>

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>

namespace tarn::engine {

namespace {

std::size_t pointsOf(PathInstruction instruction) {
    switch (instruction) {
        case PathInstruction::moveTo:
        case PathInstruction::lineTo: return 1;
        case PathInstruction::curveTo: return 3;
        case PathInstruction::quadCurveTo: return 2;
        case PathInstruction::close: return 0;
    }
    return 0;
}

// The range of the numbers that were added; initially empty.
struct Range {
    double min = std::numeric_limits<double>::infinity();
    double max = -std::numeric_limits<double>::infinity();

    void add(double x) {
        if (x < min) min = x;
        if (x > max) max = x;
    }
    bool has(double x) const { return x >= min && x <= max; }
    bool isEmpty() const { return !(min <= max); }
};

// The exponent of two that scales the largest number close to 1, so that products neither overflow
// nor underflow; 0 where there is none.
template <std::size_t count>
int scaleOf(double const (&numbers)[count]) {
    double largest = 0.0;
    for (double x : numbers) largest = std::max(largest, std::abs(x));
    return largest > 0.0 && std::isfinite(largest) ? -std::ilogb(largest) : 0;
}

// Adds the extrema of the curve on this axis: the zeros of its derivative.
void addCubic(Range& range, double p0, double p1, double p2, double p3) {
    range.add(p0);
    range.add(p3);
    // A Bézier curve stays within the range of its control points.
    if (range.has(p1) && range.has(p2)) return;
    if (std::isinf(p1)) range.add(p1);
    if (std::isinf(p2)) range.add(p2);
    int const scale = scaleOf({p0, p1, p2, p3});
    double const q0 = std::ldexp(p0, scale);
    double const q1 = std::ldexp(p1, scale);
    double const q2 = std::ldexp(p2, scale);
    double const q3 = std::ldexp(p3, scale);
    double const a = q3 - 3.0 * q2 + 3.0 * q1 - q0;
    double const b = 2.0 * (q2 - 2.0 * q1 + q0);
    double const c = q1 - q0;
    auto const addAt = [&](double t) {
        if (!(t > 0.0 && t < 1.0)) return;
        double const s = 1.0 - t;
        range.add(std::ldexp(
            s * s * s * q0 + 3.0 * s * s * t * q1 + 3.0 * s * t * t * q2 + t * t * t * q3, -scale));
    };
    double const discriminant = b * b - 4.0 * a * c;
    if (!(discriminant >= 0.0)) return;
    // Avoids cancellation.
    double const q = -0.5 * (b + std::copysign(std::sqrt(discriminant), b));
    if (a != 0.0) addAt(q / a);
    if (q != 0.0) addAt(c / q);
}

void addQuadratic(Range& range, double p0, double p1, double p2) {
    range.add(p0);
    range.add(p2);
    if (range.has(p1)) return;
    if (std::isinf(p1)) range.add(p1);
    int const scale = scaleOf({p0, p1, p2});
    double const q0 = std::ldexp(p0, scale);
    double const q1 = std::ldexp(p1, scale);
    double const q2 = std::ldexp(p2, scale);
    double const t = (q0 - q1) / (q0 - 2.0 * q1 + q2);
    double const s = 1.0 - t;
    if (t > 0.0 && t < 1.0) {
        range.add(std::ldexp(s * s * q0 + 2.0 * s * t * q1 + t * t * q2, -scale));
    }
}

template <class Change>
Path eachPoint(Path path, Change change) {
    for (PathElement& element : path.elements) {
        for (FloatVec2& point : element.points) point = change(point);
    }
    return path;
}

bool correspond(PathElement const& a, PathElement const& b) {
    return a.instruction == b.instruction && a.points.size() == b.points.size();
}

}  // namespace

Optional<Bounds> bounds(Path const& path) {
    Range x;
    Range y;
    FloatVec2 start;
    FloatVec2 current;
    for (PathElement const& element : path.elements) {
        Points const& p = element.points;
        std::size_t const count = pointsOf(element.instruction);
        if (p.size() < count) continue;
        switch (element.instruction) {
            case PathInstruction::lineTo:
                x.add(current.x);
                y.add(current.y);
                [[fallthrough]];
            case PathInstruction::moveTo:
                x.add(p[0].x);
                y.add(p[0].y);
                break;
            case PathInstruction::curveTo:
                addCubic(x, current.x, p[0].x, p[1].x, p[2].x);
                addCubic(y, current.y, p[0].y, p[1].y, p[2].y);
                break;
            case PathInstruction::quadCurveTo:
                addQuadratic(x, current.x, p[0].x, p[1].x);
                addQuadratic(y, current.y, p[0].y, p[1].y);
                break;
            case PathInstruction::close: break;
        }
        current = count == 0 ? start : p[count - 1];
        if (element.instruction == PathInstruction::moveTo) start = current;
    }
    if (x.isEmpty() || y.isEmpty()) return std::nullopt;
    return Bounds{{x.min, y.min}, {x.max, y.max}};
}

Path translated(Path const& path, FloatVec2 offset) {
    return eachPoint(path, [&](FloatVec2 point) { return point + offset; });
}

Path scaled(Path const& path, FloatVec2 factors) {
    return eachPoint(path, [&](FloatVec2 point) {
        return FloatVec2{point.x * factors.x, point.y * factors.y};
    });
}

Optional<Path> interpolate(Path const& a, Path const& b, double t) {
    if (!std::equal(a.elements.begin(), a.elements.end(), b.elements.begin(), b.elements.end(),
                    correspond)) {
        return std::nullopt;
    }
    if (t == 0.0) return a;
    if (t == 1.0) return b;
    Path path = a;
    for (std::size_t i = 0; i < path.elements.size(); ++i) {
        Points& points = path.elements[i].points;
        Points const& ends = b.elements[i].points;
        for (std::size_t j = 0; j < points.size(); ++j) {
            points[j] = points[j] + (ends[j] - points[j]) * t;
        }
    }
    return path;
}

}  // namespace tarn::engine
