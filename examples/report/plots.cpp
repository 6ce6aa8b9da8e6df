#include "report/plots.h"

#include "animation/labels.h"
#include "animation/markup.h"

#include <algorithm>
#include <cmath>
#include <string>

using namespace tarn::engine;

namespace {

// A line through all values, 0 at the top and 100 at the bottom; or steps between them.
std::string lineData(std::vector<double> const& values, double least, double most, bool isStepped) {
    std::string data;
    bool isDrawing = false;
    for (std::size_t i = 0; i < values.size(); ++i) {
        if (!std::isfinite(values[i])) {
            isDrawing = false;
            continue;
        }
        // Halves, because the range itself may overflow.
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

Element headingOf(Plot const& plot) {
    Element const type = Element("span")
                             .set("class", "type")
                             .text(portNameForTypeInfo(plot.typeInfo, plot.longestLoop > 1));
    return Element("h3").text(plot.name + " ").add(type);
}

// The legend: the names of the first lines in their colours.
Element keysOf(Plot const& plot) {
    Element keys("p");
    keys.set("class", "keys").text("");
    for (std::size_t i = 0; i < plot.lines.size() && i <= 4; ++i) {
        Line const& line = plot.lines[i];
        if (i > 0 && line.color == 0) break;
        keys.add(Element("span").set("class", "key c" + std::to_string(line.color)).text(line.name))
            .add(" ");
    }
    if (plot.longestLoop > 1) {
        keys.add(Element("span").text(std::to_string(plot.longestLoop) + " in the loop"));
    }
    if (plot.lines.empty()) {
        keys.add(Element("span").text(counted(plot.changes.size(), "change", "changes")));
    }
    return keys;
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
    Element section("div");
    section.set("class", "plot").add(headingOf(plot)).add("\n").add(keysOf(plot)).add("\n");
    Element curves("svg");
    curves.set("aria-hidden", "true")
        .set("preserveAspectRatio", "none")
        .set("viewBox", "0 -3 " + std::to_string(std::max(frames - 1, 1LL)) + " 106");
    bool const isStepped = plot.typeInfo.type == Type::Boolean || plot.typeInfo.type == Type::Int;
    for (Line const& line : plot.lines) {
        curves.add(Element("path")
                       .set("class", "line c" + std::to_string(line.color))
                       .set("d", lineData(line.values, least, most, isStepped)));
    }
    if (plot.lines.empty()) {
        std::string data = "M0 50H" + std::to_string(std::max(frames - 1, 1LL));
        for (long long const frame : plot.changes) data += "M" + std::to_string(frame) + " 25V75";
        curves.add(Element("path").set("class", "line c0").set("d", data));
    }
    curves.add(Element("path").set("class", "cursor").set("d", "M0 -3V103"));
    section
        .add(Element("div")
                 .set("class", "chart")
                 .set("role", "slider")
                 .set("tabindex", 0)
                 .set("data-plot", position)
                 .set("aria-label", plot.name + " over time")
                 .set("aria-valuemin", 0)
                 .set("aria-valuemax", frames - 1)
                 .set("aria-valuenow", 0)
                 .set("aria-valuetext", "frame 0: " + firstText)
                 .add(curves))
        .add("\n");
    if (least <= most) {
        std::string const range = to_string(Value(least)) + " to " + to_string(Value(most));
        section.add(Element("p").set("class", "range").add(Element("span").text(range))).add("\n");
    }
    section.add(Element("p")
                    .set("class", "now")
                    .set("role", "group")
                    .set("tabindex", 0)
                    .set("aria-label", plot.name + ", the value")
                    .add(Element("span").set("class", "frame").text("frame 0"))
                    .add(" ")
                    .add(Element("span").set("class", "value").text(firstText)));
    return section.markup() + "\n";
}
