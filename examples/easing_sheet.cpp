// All easing curves in one SVG picture: progress 0 to 1 in the inner square, and the curve before
// and after it.
//
//     easing_sheet > easing_sheet.svg

#include "curve.h"

#include <Engine/Base/svg_path.h>

#include <iostream>

using namespace tarn::engine;

int main() {
    constexpr int kColumns = 5;
    constexpr double kSize = 100.0;  // Of the square from 0 to 1.
    constexpr double kCell = 170.0;
    std::vector<std::string> const names = easingFunctionNames();
    int const count = static_cast<int>(names.size());
    double const width = kColumns * kCell;
    double const height = (count + kColumns - 1) / kColumns * (kCell + 10.0);

    std::cout
        << "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"0 0 " << width << " " << height
        << "\" role=\"img\" aria-label=\"The easing curves\">\n"
        << "<style>\n"
           "  text { font: 13px sans-serif; fill: #1c2430; text-anchor: middle; }\n"
           "  .sheet { fill: #ffffff; } .beyond { fill: #e3e7ee; } .way { fill: #f6f8fb; }\n"
           "  .curve { fill: none; stroke: #0b62b8; stroke-width: 2; }\n"
           "  @media (prefers-color-scheme: dark) {\n"
           "    text { fill: #e6eaf0; } .sheet { fill: #14181f; } .beyond { fill: #262d38; }\n"
           "    .way { fill: #1b2028; } .curve { stroke: #7cc0ff; }\n"
           "  }\n"
           "</style>\n"
        << "<rect class=\"sheet\" width=\"" << width << "\" height=\"" << height << "\"/>\n";
    double const margin = -kCurveStart * kSize;
    double const side = (kCurveEnd - kCurveStart) * kSize;
    for (int i = 0; i < count; ++i) {
        // Each cell is a nested picture, which clips the curve.
        std::cout << "<svg x=\"" << i % kColumns * kCell + 10.0 << "\" y=\""
                  << i / kColumns * (kCell + 10.0) + 5.0 << "\" width=\"" << side << "\" height=\""
                  << side << "\" viewBox=\"" << -margin << " " << margin - side << " " << side
                  << " " << side << "\">\n"
                  << "<rect class=\"beyond\" x=\"" << -margin << "\" y=\"" << margin - side
                  << "\" width=\"" << side << "\" height=\"" << side << "\"/>\n"
                  << "<rect class=\"way\" y=\"" << -kSize << "\" width=\"" << kSize
                  << "\" height=\"" << kSize << "\"/>\n"
                  << "<path class=\"curve\" d=\"" << svgPathData(curve(EasingFunction(i), kSize))
                  << "\"/>\n</svg>\n"
                  << "<text x=\"" << i % kColumns * kCell + 10.0 + side / 2 << "\" y=\""
                  << i / kColumns * (kCell + 10.0) + side + 22.0 << "\">"
                  << names[static_cast<std::size_t>(i)] << "</text>\n";
    }
    std::cout << "</svg>\n";
}
