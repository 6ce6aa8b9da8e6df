#include "report/plots.h"

#include "animation/markup.h"

#include <algorithm>
#include <cmath>
#include <sstream>

using namespace tarn::engine;

namespace {

// The line through all values, 0 being the top and 100 the bottom; or the steps between them.
std::string lineData(std::vector<double> const& values, double least, double most, bool isStepped) {
    std::string data;
    bool isDrawing = false;
    for (std::size_t i = 0; i < values.size(); ++i) {
        if (!std::isfinite(values[i])) {
            isDrawing = false;
            continue;
        }
        // Halves, since the whole may be more than there is.
        double const range = most / 2 - least / 2;
        double const y = range > 0.0 ? 100.0 - (values[i] / 2 - least / 2) / range * 100.0 : 50.0;
        std::string const frame = std::to_string(i);
        if (!isDrawing) {
            data += "M" + frame + " " + number(y) + "h0";  // A line of one point is a dot.
        } else if (isStepped) {
            data += "H" + frame + "V" + number(y);
        } else {
            data += "L" + frame + " " + number(y);
        }
        isDrawing = true;
    }
    return data;
}

}  // namespace

std::string plotText(Plot const& plot, std::size_t position, long long frames,
                     std::string const& firstText) {
    double least = INFINITY;
    double most = -INFINITY;
    for (Line const& line : plot.lines) {
        for (double const value : line.values) {
            if (!std::isfinite(value)) continue;
            least = std::min(least, value);
            most = std::max(most, value);
        }
    }
    std::string const name = escaped(plot.name);
    std::ostringstream text;
    text << "<div class=\"plot\"><h3>" << name << " <span class=\"type\">"
         << portNameForTypeInfo(plot.typeInfo, plot.longestLoop > 1)
         << "</span></h3>\n<p class=\"keys\">";
    for (std::size_t i = 0; i < plot.lines.size() && i <= 4; ++i) {
        Line const& line = plot.lines[i];
        if (i > 0 && line.color == 0) break;
        text << "<span class=\"key c" << line.color << "\">" << line.name << "</span> ";
    }
    if (plot.longestLoop > 1) text << "<span>" << plot.longestLoop << " in the loop</span>";
    if (plot.lines.empty()) {
        text << "<span>" << plot.changes.size()
             << (plot.changes.size() == 1 ? " change</span>" : " changes</span>");
    }
    text << "</p>\n<div class=\"chart\" role=\"slider\" tabindex=\"0\" data-plot=\"" << position
         << "\" aria-label=\"" << name << " over time\" aria-valuemin=\"0\" aria-valuemax=\""
         << frames - 1 << "\" aria-valuenow=\"0\" aria-valuetext=\"frame 0: " << escaped(firstText)
         << "\"><svg aria-hidden=\"true\" preserveAspectRatio=\"none\" viewBox=\"0 -3 "
         << std::max(frames - 1, 1LL) << " 106\">";
    bool const isStepped = plot.typeInfo.type == Type::Boolean || plot.typeInfo.type == Type::Int;
    for (Line const& line : plot.lines) {
        text << "<path class=\"line c" << line.color << "\" d=\""
             << lineData(line.values, least, most, isStepped) << "\"/>";
    }
    if (plot.lines.empty()) {
        text << "<path class=\"line c0\" d=\"M0 50H" << std::max(frames - 1, 1LL);
        for (long long const frame : plot.changes) text << "M" << frame << " 25V75";
        text << "\"/>";
    }
    text << "<path class=\"cursor\" d=\"M0 -3V103\"/></svg></div>\n";
    if (least <= most) {
        text << "<p class=\"range\"><span>" << to_string(Value(least)) << " to "
             << to_string(Value(most)) << "</span></p>\n";
    }
    text << "<p class=\"now\" role=\"group\" tabindex=\"0\" aria-label=\"" << name
         << ", the value\"><span class=\"frame\">frame 0</span> <span class=\"value\">"
         << escaped(firstText) << "</span></p></div>\n";
    return text.str();
}
