#include "report/drawing.h"

#include "animation/evaluator.h"
#include "animation/labels.h"
#include "animation/markup.h"
#include "page_files.h"

#include <algorithm>
#include <cmath>
#include <sstream>
#include <unordered_map>

using namespace tarn::engine;

namespace {

constexpr double kTextIndent = 14.0;
constexpr std::size_t kLongestAttribute = 200;

// Where the port at this row of a box is; outputs come first.
double rowMiddle(std::size_t row) {
    return kHeadingHeight + (static_cast<double>(row) + 0.5) * kRowHeight + 2.0;
}

struct Anchor {
    double x;
    double y;
    Type type;
};

std::string wire(Connection const& connection, Anchor const& from, Anchor const& to,
                 std::string const& mark) {
    double const bend = std::clamp(std::abs(to.x - from.x) / 2.0, 30.0, 160.0);
    Path const path = PathBuilder()
                          .moveTo({from.x, from.y})
                          .curveTo({from.x + bend, from.y}, {to.x - bend, to.y}, {to.x, to.y})
                          .build();
    return "<path class=\"t-" + typeToString(from.type) + mark + "\" data-from=\"" +
           std::to_string(connection.fromPortId) + "\" data-to=\"" +
           std::to_string(connection.toPortId) + "\" d=\"" + pathData(path) + "\"/>\n";
}

void addAttributes(std::vector<std::string>& parts,
                   std::map<std::string, Unstructured> const& attributes) {
    for (auto const& [key, value] : attributes) {
        parts.push_back(printable(key) + ": " + value.toText(kLongestAttribute));
    }
}

// As an attribute in quotes.
std::string partsText(std::vector<std::string> const& parts) {
    return escaped(jsonText(Json(parts)));
}

}  // namespace

void Bounds::add(Path const& path) {
    for (PathElement const& element : path.elements) {
        for (FloatVec2 const p : element.points) {
            if (!std::isfinite(p.x) || !std::isfinite(p.y)) continue;
            left = isEmpty ? p.x : std::min(left, p.x);
            top = isEmpty ? p.y : std::min(top, p.y);
            right = isEmpty ? p.x : std::max(right, p.x);
            bottom = isEmpty ? p.y : std::max(bottom, p.y);
            isEmpty = false;
        }
    }
}

double Bounds::size() const { return std::max(right - left, bottom - top); }

Bounds Bounds::widened(double margin) const {
    return {left - margin, top - margin, right + margin, bottom + margin, isEmpty};
}

std::string colorText(FloatVec4 color) {
    auto const byte = [](double part) {
        return number(std::isnan(part) ? 0.0 : std::round(std::clamp(part, 0.0, 1.0) * 255.0));
    };
    double const opacity = std::isnan(color.w) ? 0.0 : std::clamp(color.w, 0.0, 1.0);
    return "rgb(" + byte(color.x) + " " + byte(color.y) + " " + byte(color.z) + " / " +
           number(opacity) + ")";
}

std::string Drawing::portName(unsigned long long patchId, unsigned long long portId) const {
    Patch const* const patch = index.findPatch(patchId);
    Port const* const output = index.findOutputPort(portId);
    Port const* const port = output != nullptr ? output : index.findInputPort(portId);
    std::string text = patch != nullptr ? nameOf(*patch) : std::to_string(patchId);
    if (port != nullptr && !port->name.empty()) text += " " + printable(port->name);
    return text;
}

std::vector<std::string> Drawing::describe(Port const& port, bool isInput) const {
    std::vector<std::string> parts{
        (isInput ? "input " : "output ") + printable(port.name), portTypeText(port),
        "port " + std::to_string(port.id) + ", tag " + std::to_string(port.tag)};
    if (isInput) {
        Connection const* const incoming = index.incomingConnection(port.id);
        if (incoming != nullptr) {
            parts.push_back("from " + portName(incoming->fromPatchId, incoming->fromPortId));
        }
    }
    for (Connection const& outgoing : index.outgoingConnections(port.id)) {
        parts.push_back("to " + portName(outgoing.toPatchId, outgoing.toPortId));
    }
    addAttributes(parts, port.attributes);
    return parts;
}

std::vector<std::string> Drawing::describe(Patch const& patch) const {
    std::vector<std::string> parts{nameOf(patch)};
    parts.push_back("patch " + std::to_string(patch.id) + ", " + kindName(patch));
    if (!patch.descriptor.empty()) parts.push_back(printable(patch.descriptor));
    parts.push_back(counted(patch.inputs->size(), "input", "inputs") + ", " +
                    counted(patch.outputs->size(), "output", "outputs"));
    if (!patch.children->empty()) {
        parts.push_back("a group of " + std::to_string(patch.children->size()));
    }
    addAttributes(parts, patch.attributes);
    if (marks != nullptr) {
        auto const words = marks->words.find(patch.id);
        if (words != marks->words.end()) {
            parts.insert(parts.end(), words->second.begin(), words->second.end());
        }
    }
    return parts;
}

std::string Drawing::markOf(Patch const& patch) const {
    if (marks == nullptr) return "";
    auto const kind = marks->kinds.find(patch.id);
    return kind == marks->kinds.end() ? "" : kind->second;
}

std::string Drawing::port(Port const& port, bool isInput, double width, double y) const {
    std::string const label = labelOf(port);
    std::string const type = portNameForTypeInfo(port.typeInfo, false);
    std::string const name = label.substr(0, label.size() - type.size());
    std::ostringstream text;
    text << "<g class=\"port t-" << typeToString(port.typeInfo.type)
         << "\" role=\"img\" tabindex=\"-1\" data-port=\"" << port.id << "\" data-parts=\""
         << partsText(describe(port, isInput)) << "\"><rect class=\"row\" x=\"1\" y=\""
         << number(y - kRowHeight / 2) << "\" width=\"" << number(width - 2) << "\" height=\""
         << number(kRowHeight) << "\"/><circle cx=\"" << number(isInput ? 0 : width) << "\" cy=\""
         << number(y) << "\" r=\"5\"/><text x=\""
         << number(isInput ? kTextIndent : width - kTextIndent) << "\" y=\"" << number(y + 4)
         << "\"" << (isInput ? "" : " class=\"end\"") << ">" << escaped(name)
         << "<tspan class=\"type\">" << escaped(type) << "</tspan></text></g>\n";
    return text.str();
}

std::string Drawing::box(Box const& box) const {
    Patch const& patch = *box.patch;
    bool const isGroup = !patch.children->empty();
    std::ostringstream text;
    std::string const mark = markOf(patch);
    text << "<g class=\"patch" << (mark.empty() ? "" : " " + mark) << "\" transform=\"translate("
         << number(box.x) << " " << number(box.y) << ")\"><rect class=\"body\" width=\""
         << number(box.width) << "\" height=\"" << number(box.height) << "\" rx=\"6\"/>"
         << "<g class=\"heading\" tabindex=\"-1\" data-parts=\"" << partsText(describe(patch))
         << "\"";
    if (!mark.empty()) text << " id=\"patch-" << patch.id << "\"";
    if (isGroup) {
        text << " role=\"button\" aria-expanded=\"false\" data-level=\"level-" << patch.id << "\"";
    } else {
        text << " role=\"img\"";
    }
    text << "><rect class=\"bar\" width=\"" << number(box.width) << "\" height=\""
         << number(kHeadingHeight) << "\" rx=\"6\"/><text x=\"" << number(kTextIndent)
         << "\" y=\"17\">" << escaped(headingOf(patch)) << "</text>";
    if (!mark.empty()) text << "<text x=\"4\" y=\"17\">" << signOfChange(mark) << "</text>";
    if (isGroup) {
        text << "<text class=\"fold end\" x=\"" << number(box.width - kTextIndent)
             << "\" y=\"17\">+</text>";
    }
    text << "</g>\n";
    std::size_t row = 0;
    for (Port const& output : *patch.outputs) {
        text << port(output, false, box.width, rowMiddle(row++));
    }
    for (Port const& input : *patch.inputs) text << port(input, true, box.width, rowMiddle(row++));
    text << "</g>\n";
    return text.str();
}

std::string Drawing::graph(Level const& level, std::string const& attributes) const {
    std::ostringstream text;
    text << "<svg class=\"graph\" " << attributes << " width=\"" << number(level.width)
         << "\" height=\"" << number(level.height) << "\" viewBox=\"0 0 " << number(level.width)
         << " " << number(level.height) << "\">\n<g class=\"wires\" aria-hidden=\"true\">\n";
    std::unordered_map<unsigned long long, Anchor> outputs;
    std::unordered_map<unsigned long long, Anchor> inputs;
    for (Box const& drawn : level.boxes) {
        std::size_t row = 0;
        for (Port const& port : *drawn.patch->outputs) {
            outputs[port.id] = {drawn.x + drawn.width, drawn.y + rowMiddle(row++),
                                port.typeInfo.type};
        }
        for (Port const& port : *drawn.patch->inputs) {
            inputs[port.id] = {drawn.x, drawn.y + rowMiddle(row++), port.typeInfo.type};
        }
    }
    auto const addWire = [&](Connection const& connection, std::string const& mark) {
        auto const from = outputs.find(connection.fromPortId);
        auto const to = inputs.find(connection.toPortId);
        if (from != outputs.end() && to != inputs.end()) {
            text << wire(connection, from->second, to->second, mark);
        }
    };
    for (Connection const& connection : *level.group->connections) {
        bool const isAdded = marks != nullptr && marks->added.count(connection) != 0;
        addWire(connection, isAdded ? " added" : "");
    }
    if (marks != nullptr) {
        auto const removed = marks->removed.find(level.group->id);
        if (removed != marks->removed.end()) {
            for (Connection const& connection : removed->second) addWire(connection, " removed");
        }
    }
    text << "</g>\n";
    for (Box const& drawn : level.boxes) text << box(drawn);
    text << "</svg>\n";
    return text.str();
}

std::string scenePaths(std::vector<Drawn> const& scene) {
    std::string text;
    for (Drawn const& drawn : scene) {
        text += "<path class=\"" + std::string(drawn.isLayer ? "layer" : "outline") + "\" d=\"" +
                drawn.data + "\"";
        if (drawn.isLayer) {
            text += " stroke=\"" + colorText(drawn.color) + "\" stroke-width=\"" +
                    number(drawn.width) + "\"";
        }
        text += "/>\n";
    }
    return text;
}

std::string pictureText(Document const& document, long long frame) {
    Evaluator evaluator(document);
    Scene const scene(document, evaluator.root());
    for (long long i = 0; i <= frame; ++i) evaluator.evaluate(i);
    std::vector<Drawn> const drawn = scene.now();
    Bounds bounds;
    for (Drawn const& outline : drawn) bounds.add(outline.path);
    bounds = bounds.widened(bounds.size() / 20.0);
    Level const level = layOutOne(document.root);

    constexpr double kSceneHeight = 220.0;
    constexpr double kGap = 12.0;
    bool const isDrawn = !bounds.isEmpty;
    double const height = level.height + (isDrawn ? kSceneHeight + 2 * kGap : 0.0);
    std::ostringstream text;
    text << "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"0 0 " << number(level.width) << " "
         << number(height) << "\" role=\"img\" aria-label=\"The graph of "
         << escaped(nameOf(document.root)) << ", and what it draws in frame " << frame << "\">\n"
         << "<style>\n"
         << page_files::kGraphCss << "</style>\n"
         << "<rect class=\"paper\" width=\"" << number(level.width) << "\" height=\""
         << number(height) << "\"/>\n"
         << Drawing(document.root).graph(level, "");
    if (isDrawn) {
        text << "<svg class=\"scene\" x=\"" << number(kGap) << "\" y=\""
             << number(level.height + kGap) << "\" width=\"" << number(level.width - 2 * kGap)
             << "\" height=\"" << number(kSceneHeight) << "\" viewBox=\"" << number(bounds.left)
             << " " << number(bounds.top) << " " << number(bounds.right - bounds.left) << " "
             << number(bounds.bottom - bounds.top) << "\">\n"
             << "<rect class=\"stage\" x=\"-100000\" y=\"-100000\" width=\"200000\" "
                "height=\"200000\"/>\n"
             << scenePaths(drawn) << "</svg>\n";
    }
    text << "</svg>\n";
    return text.str();
}
