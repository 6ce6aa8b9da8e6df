// A rounded rectangle that becomes a circle and changes its colour: 60 frames in one animated SVG.
//
//     morph > morph.svg

#include <Engine/Base/easing.h>
#include <Engine/Base/path.h>
#include <Engine/Base/svg_path.h>

#include <cmath>
#include <iostream>

using namespace tarn::engine;

int main() {
    constexpr int kFrames = 60;
    Value const orange = FloatVec4{1.0, 0.6, 0.2, 1.0};
    Value const blue = FloatVec4{0.1, 0.4, 0.9, 1.0};
    std::string outlines;
    std::string colors;
    for (int frame = 0; frame < kFrames; ++frame) {
        double const t = frame / (kFrames - 1.0);
        double const radius =
            std::round(ease(EasingFunction::CubicInOut, 4.0, 40.0, t) * 100.0) / 100.0;
        Path const outline = PathBuilder().roundRect({10, 10}, {80, 80}, radius).build();
        FloatVec4 const color = ease(EasingFunction::SinusoidalInOut, orange, blue, t);
        char const* const separator = frame == 0 ? "" : ";";
        outlines += separator + svgPathData(outline);
        auto const percent = [](double part) { return std::to_string(std::lround(part * 100.0)); };
        colors += separator;
        colors +=
            "rgb(" + percent(color.x) + "%," + percent(color.y) + "%," + percent(color.z) + "%)";
    }
    std::cout << "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"0 0 100 100\">\n<path>\n"
              << "<animate attributeName=\"d\" dur=\"2s\" repeatCount=\"indefinite\" values=\""
              << outlines << "\"/>\n"
              << "<animate attributeName=\"fill\" dur=\"2s\" repeatCount=\"indefinite\" values=\""
              << colors << "\"/>\n</path>\n</svg>\n";
}
