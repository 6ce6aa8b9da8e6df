// Draws a path as an SVG picture: its outline, its points, and lines from each point to its control
// points.
//
//     path_to_svg > path.svg

#include <Engine/Base/svg_path.h>

#include <iostream>

using namespace tarn::engine;

namespace {

// A line from every point to its control points, and dots for both. The elements must have all
// their points, as a builder makes them.
struct Handles {
    PathBuilder lines;
    std::vector<FloatVec2> points;
    std::vector<FloatVec2> controls;
};

Handles handlesOf(Path const& path) {
    Handles handles;
    FloatVec2 start{0.0, 0.0};  // The start of the outline; in SVG, `close` returns to it.
    FloatVec2 current = start;
    for (PathElement const& element : path.elements) {
        Points const& p = element.points;
        switch (element.instruction) {
            case PathInstruction::moveTo: start = current = p.at(0); break;
            case PathInstruction::lineTo: current = p.at(0); break;
            case PathInstruction::curveTo:
                handles.lines.moveTo(current).lineTo(p.at(0)).moveTo(p.at(2)).lineTo(p.at(1));
                handles.controls.insert(handles.controls.end(), {p[0], p[1]});
                current = p[2];
                break;
            case PathInstruction::quadCurveTo:
                handles.lines.moveTo(current).lineTo(p.at(0)).lineTo(p.at(1));
                handles.controls.push_back(p[0]);
                current = p[1];
                break;
            case PathInstruction::close: current = start; continue;
        }
        handles.points.push_back(current);
    }
    return handles;
}

void writeDots(std::vector<FloatVec2> const& dots, char const* color) {
    for (FloatVec2 const p : dots) {
        std::cout << "<circle cx=\"" << p.x << "\" cy=\"" << p.y << "\" r=\"1.2\" fill=\"" << color
                  << "\"/>\n";
    }
}

}  // namespace

int main() {
    Path const path = PathBuilder()
                          .roundRect({10.0, 10.0}, {80.0, 50.0}, 15.0)
                          .circle({35.0, 35.0}, 12.0)
                          .moveTo({55.0, 45.0})
                          .quadCurveTo({65.0, 10.0}, {80.0, 45.0})
                          .build();
    Handles const handles = handlesOf(path);
    std::cout
        << "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"0 0 100 70\" role=\"img\" "
           "aria-label=\"A path with its points and handles\">\n"
        << "<rect width=\"100\" height=\"70\" fill=\"#1b2028\"/>\n"
        << "<path d=\"" << svgPathData(path)
        << "\" fill=\"#2b4a63\" fill-rule=\"evenodd\" stroke=\"#8fd0ff\" stroke-width=\"0.8\"/>\n"
        << "<path d=\"" << svgPathData(handles.lines.build())
        << "\" fill=\"none\" stroke=\"#ffb454\" stroke-width=\"0.4\"/>\n";
    writeDots(handles.controls, "#ffb454");
    writeDots(handles.points, "#ffffff");
    std::cout << "</svg>\n";
}
