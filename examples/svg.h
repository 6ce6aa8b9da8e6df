// Paths and curves of the library as parts of SVG pictures.
//
//     std::cout << "<path d='" << svg::pathData(PathBuilder().circle({0, 0}, 5.0).build()) <<
//     "'/>";

#ifndef EXAMPLES_SVG_H
#define EXAMPLES_SVG_H

#include <Engine/Base/easing.h>
#include <Engine/Base/path.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <string>

namespace svg {

// Six digits, which is what viewers calculate with. SVG has no NaN and no infinity: what is not a
// number is 0, and what is too large is cut.
inline std::string number(double value) {
    constexpr double kLargest = 1e9;
    char text[32];
    double const shown = std::isnan(value) ? 0.0 : std::clamp(value, -kLargest, kLargest);
    std::snprintf(text, sizeof text, "%.6g", shown);
    return text;
}

inline std::string point(tarn::engine::FloatVec2 p) { return number(p.x) + " " + number(p.y); }

// The text of a `d` attribute, "M 5 0 C 5 2.76 ...". Elements with too few points are left out; a
// path that does not begin with a moveTo begins at the origin, as that of a builder does.
inline std::string pathData(tarn::engine::Path const& path) {
    using tarn::engine::PathInstruction;
    std::string data;
    for (tarn::engine::PathElement const& element : path.elements) {
        char letter = 'Z';
        std::size_t count = 0;
        switch (element.instruction) {
            case PathInstruction::moveTo: letter = 'M', count = 1; break;
            case PathInstruction::lineTo: letter = 'L', count = 1; break;
            case PathInstruction::curveTo: letter = 'C', count = 3; break;
            case PathInstruction::quadCurveTo: letter = 'Q', count = 2; break;
            case PathInstruction::close: break;
        }
        if (element.points.size() < count) continue;
        if (data.empty() && letter != 'M') data = "M 0 0";
        if (!data.empty()) data += ' ';
        data += letter;
        for (std::size_t i = 0; i < count; ++i) data += " " + point(element.points[i]);
    }
    return data;
}

// Progress that is shown of a curve: the way from 0 to 1, and what it overshoots on either side.
constexpr double kCurveStart = -0.25;
constexpr double kCurveEnd = 1.25;

// The curve as straight lines, `size` wide and high from 0 to 1 and upwards from the origin.
inline std::string curveData(tarn::engine::EasingFunction function, double size) {
    constexpr int kSteps = 90;
    tarn::engine::PathBuilder builder;
    for (int i = 0; i <= kSteps; ++i) {
        double const t = kCurveStart + (kCurveEnd - kCurveStart) * i / kSteps;
        tarn::engine::FloatVec2 const p{t * size, -tarn::engine::ease(function, 0.0, size, t)};
        if (i == 0)
            builder.moveTo(p);
        else
            builder.lineTo(p);
    }
    return pathData(std::move(builder).build());
}

// The text as content or as an attribute in quotes of either kind, of SVG or HTML. What may not
// stand in XML is left out: control characters, and the two last of the first plane.
inline std::string escaped(std::string const& text) {
    std::string result;
    for (std::size_t i = 0; i < text.size(); ++i) {
        char const c = text[i];
        if (text.compare(i, 3, "\xef\xbf\xbe") == 0 || text.compare(i, 3, "\xef\xbf\xbf") == 0) {
            i += 2;
            continue;
        }
        switch (c) {
            case '&': result += "&amp;"; break;
            case '<': result += "&lt;"; break;
            case '>': result += "&gt;"; break;
            case '"': result += "&quot;"; break;
            case '\'': result += "&#39;"; break;
            default:
                if (static_cast<unsigned char>(c) >= 0x20 || c == '\n') result += c;
        }
    }
    return result;
}

}  // namespace svg

#endif
