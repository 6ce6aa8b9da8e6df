// Compares random calls of the builder with a list of plain instructions: elements to the last bit,
// the current point, equality, and outlines rotated about the origin.

#include "fuzz.h"

#include <Engine/Base/path.h>

#include <vector>

using namespace fuzz;
using namespace tarn::engine;

namespace {

using I = PathInstruction;

enum class Operation : unsigned char {
    MoveTo,
    LineTo,
    CurveTo,
    QuadCurveTo,
    Close,
    ArcTo,
    Ellipse,
    Circle,
    RoundRect,
    HexaRect,
    Append,
};
constexpr std::size_t kOperations = std::size_t(Operation::Append) + 1;

struct Call {
    Operation operation;
    FloatVec2 a, b, c;
    double number;
    bool flag;
};

struct Drawing {
    struct Step {
        PathInstruction instruction;
        std::vector<FloatVec2> points;
    };
    std::vector<Step> steps;
    FloatVec2 at;

    void draw(PathInstruction instruction, std::vector<FloatVec2> points) {
        if (!points.empty()) at = points.back();
        steps.push_back({instruction, std::move(points)});
    }
    void arc(FloatVec2 p, bool verticalFirst) {
        double const k = 0.552284749;
        double const rest = 0.447715251;
        double const dx = p.x - at.x;
        double const dy = p.y - at.y;
        if (verticalFirst) {
            draw(I::curveTo, {{at.x, k * dy + at.y}, {rest * dx + at.x, dy + at.y}, p});
        } else {
            draw(I::curveTo, {{k * dx + at.x, at.y}, {at.x + dx, rest * dy + at.y}, p});
        }
    }

    void perform(Call const& call) {
        double const x = call.a.x;
        double const y = call.a.y;
        switch (call.operation) {
            case Operation::MoveTo: draw(I::moveTo, {call.a}); break;
            case Operation::LineTo: draw(I::lineTo, {call.a}); break;
            case Operation::CurveTo: draw(I::curveTo, {call.a, call.b, call.c}); break;
            case Operation::QuadCurveTo: draw(I::quadCurveTo, {call.a, call.b}); break;
            case Operation::Close: draw(I::close, {}); break;
            case Operation::ArcTo: arc(call.a, call.flag); break;
            case Operation::Ellipse: ellipse(x, y, call.b.x, call.b.y); break;
            case Operation::Circle: ellipse(x, y, call.number, call.number); break;
            case Operation::RoundRect: {
                double const right = call.b.x + x;
                double const bottom = call.b.y + y;
                double const m = call.b.y * 0.5 < call.b.x * 0.5 ? call.b.y * 0.5 : call.b.x * 0.5;
                double const r = call.number < m ? call.number : m;
                draw(I::moveTo, {{r + x, y}});
                draw(I::lineTo, {{right - r, y}});
                arc({right, r + y}, false);
                draw(I::lineTo, {{right, bottom - r}});
                arc({right - r, bottom}, true);
                draw(I::lineTo, {{r + x, bottom}});
                arc({x, bottom - r}, false);
                draw(I::lineTo, {{x, r + y}});
                arc({r + x, y}, true);
                draw(I::close, {});
                break;
            }
            case Operation::HexaRect: {
                double const right = call.b.x + x;
                double const bottom = call.b.y + y;
                double const k = call.number;
                draw(I::moveTo, {{x + k, y}});
                for (FloatVec2 const& p :
                     {FloatVec2{right - k, y}, FloatVec2{right, y + k},
                      FloatVec2{right, bottom - k}, FloatVec2{right - k, bottom},
                      FloatVec2{x + k, bottom}, FloatVec2{x, bottom - k}, FloatVec2{x, y + k}}) {
                    draw(I::lineTo, {p});
                }
                draw(I::close, {});
                break;
            }
            case Operation::Append: {  // Appends a copy of everything so far.
                std::vector<Step> const again = steps;
                steps.insert(steps.end(), again.begin(), again.end());
                break;
            }
        }
    }

    void ellipse(double x, double y, double rx, double ry) {
        FloatVec2 const start{x + rx, y + 0.0};
        draw(I::moveTo, {start});
        arc({0.0 + x, y + ry}, true);
        arc({x - rx, y}, false);
        arc({x, y - ry}, true);
        arc(start, false);
        draw(I::close, {});
    }
};

void perform(PathBuilder& builder, Call const& call) {
    switch (call.operation) {
        case Operation::MoveTo: builder.moveTo(call.a); break;
        case Operation::LineTo: builder.lineTo(call.a); break;
        case Operation::CurveTo: builder.curveTo(call.a, call.b, call.c); break;
        case Operation::QuadCurveTo: builder.quadCurveTo(call.a, call.b); break;
        case Operation::Close: builder.close(); break;
        case Operation::ArcTo: builder.arcTo(call.a, call.flag); break;
        case Operation::Ellipse: builder.ellipse(call.a, call.b); break;
        case Operation::Circle: builder.circle(call.a, call.number); break;
        case Operation::RoundRect: builder.roundRect(call.a, call.b, call.number); break;
        case Operation::HexaRect: builder.hexaRect(call.a, call.b, call.number); break;
        case Operation::Append: builder.append(builder.build()); break;
    }
}

bool same(FloatVec2 a, FloatVec2 b) { return fuzz::same(a.x, b.x) && fuzz::same(a.y, b.y); }

bool drawn(Path const& path, Drawing const& drawing) {
    if (path.elements.size() != drawing.steps.size()) return false;
    for (std::size_t i = 0; i < path.elements.size(); ++i) {
        auto const& [instruction, points] = path.elements[i];
        auto const& step = drawing.steps[i];
        if (instruction != step.instruction) return false;
        if (points.size() != step.points.size()) return false;
        for (std::size_t n = 0; n < points.size(); ++n) {
            if (!same(points[n], step.points[n])) return false;
        }
    }
    return true;
}

bool hasNaN(Path const& path) {
    for (PathElement const& element : path.elements) {
        for (FloatVec2 const& point : element.points) {
            if (std::isnan(point.x) || std::isnan(point.y)) return true;
        }
    }
    return false;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input input(data, size);
    PathBuilder builder;
    PathBuilder turned;  // All but the rectangles, whose corners change when rotated.
    Drawing drawing;
    bool turns = true;
    for (int i = 0; i < 40 && !input.ended() && drawing.steps.size() < 10000; ++i) {
        auto const point = [&] { return FloatVec2{input.anyDouble(), input.anyDouble()}; };
        auto const operation = Operation(input.below(kOperations));
        Call const call{operation, point(), point(), point(), input.anyDouble(), input.chance()};
        perform(builder, call);
        drawing.perform(call);
        check(same(builder.currentPoint, drawing.at), "the current point");

        Call opposite = call;
        for (FloatVec2* p : {&opposite.a, &opposite.b, &opposite.c}) *p = {-p->x, -p->y};
        opposite.number = -call.number;
        turns = turns && call.operation != Operation::RoundRect &&
                call.operation != Operation::HexaRect;
        perform(turned, opposite);
    }
    Path const path = builder.build();
    check(drawn(path, drawing), "the elements");

    Path const copy = path;
    check((copy == path) == !hasNaN(path), "equality with a copy");
    check((copy != path) == hasNaN(path), "inequality with a copy");
    if (!path.elements.empty()) {
        Path shorter = path;
        shorter.elements.pop_back();
        check(shorter != path && !(shorter == path), "inequality of lengths");
    }
    // Rounding is symmetric: a rotation by half a turn only changes signs.
    for (std::size_t i = 0; turns && i < path.elements.size(); ++i) {
        auto const& here = path.elements[i].points;
        auto const& there = turned.elements[i].points;
        for (std::size_t n = 0; n < here.size(); ++n) {
            auto const opposite = [](double a, double b) {
                return a == -b || (std::isnan(a) && std::isnan(b));
            };
            check(opposite(here[n].x, there[n].x) && opposite(here[n].y, there[n].y),
                  "the outline turned around the origin");
        }
    }
    check(std::move(builder).build().elements.size() == path.elements.size(), "the last build");
    return 0;
}
