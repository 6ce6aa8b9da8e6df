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

// The position of the port in this row of a box; outputs come first.
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
    return Element("path")
               .set("class", "t-" + typeToString(from.type) + mark)
               .set("data-from", connection.fromPortId)
               .set("data-to", connection.toPortId)
               .set("d", pathData(path))
               .markup() +
           "\n";
}

void addAttributes(std::vector<std::string>& parts,
                   std::map<std::string, Unstructured> const& attributes) {
    for (auto const& [key, value] : attributes) {
        parts.push_back(printable(key) + ": " + value.toText(kLongestAttribute));
    }
}

// A JSON array for the page's script.
std::string partsText(std::vector<std::string> const& parts) { return jsonText(Json(parts)); }

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
    std::string const whole = labelOf(port);
    std::string const type = portNameForTypeInfo(port.typeInfo, false);
    std::string const name = whole.substr(0, whole.size() - type.size());
    Element label("text");
    label.set("x", isInput ? kTextIndent : width - kTextIndent).set("y", y + 4);
    if (!isInput) label.set("class", "end");
    label.text(name).add(Element("tspan").set("class", "type").text(type));
    return Element("g")
               .set("class", "port t-" + typeToString(port.typeInfo.type))
               .set("role", "img")
               .set("tabindex", -1)
               .set("data-port", port.id)
               .set("data-parts", partsText(describe(port, isInput)))
               .add(Element("rect")
                        .set("class", "row")
                        .set("x", 1)
                        .set("y", y - kRowHeight / 2)
                        .set("width", width - 2)
                        .set("height", kRowHeight))
               .add(Element("circle").set("cx", isInput ? 0.0 : width).set("cy", y).set("r", 5))
               .add(label)
               .markup() +
           "\n";
}

std::string Drawing::box(Box const& box) const {
    Patch const& patch = *box.patch;
    bool const isGroup = !patch.children->empty();
    std::string const mark = markOf(patch);
    Element heading("g");
    heading.set("class", "heading")
        .set("tabindex", -1)
        .set("data-parts", partsText(describe(patch)));
    if (!mark.empty()) heading.set("id", "patch-" + std::to_string(patch.id));
    if (isGroup) {
        heading.set("role", "button")
            .set("aria-expanded", "false")
            .set("data-level", "level-" + std::to_string(patch.id));
    } else {
        heading.set("role", "img");
    }
    heading
        .add(Element("rect")
                 .set("class", "bar")
                 .set("width", box.width)
                 .set("height", kHeadingHeight)
                 .set("rx", 6))
        .add(Element("text").set("x", kTextIndent).set("y", 17).text(headingOf(patch)));
    if (!mark.empty()) {
        heading.add(Element("text").set("x", 4).set("y", 17).text(signOfChange(mark)));
    }
    if (isGroup) {
        heading.add(Element("text")
                        .set("class", "fold end")
                        .set("x", box.width - kTextIndent)
                        .set("y", 17)
                        .text("+"));
    }
    Element drawn("g");
    drawn.set("class", mark.empty() ? "patch" : "patch " + mark)
        .set("transform", "translate(" + number(box.x) + " " + number(box.y) + ")")
        .add(Element("rect")
                 .set("class", "body")
                 .set("width", box.width)
                 .set("height", box.height)
                 .set("rx", 6))
        .add(heading)
        .add("\n");
    std::size_t row = 0;
    for (Port const& output : *patch.outputs) {
        drawn.add(port(output, false, box.width, rowMiddle(row++)));
    }
    for (Port const& input : *patch.inputs) {
        drawn.add(port(input, true, box.width, rowMiddle(row++)));
    }
    return drawn.markup() + "\n";
}

std::string Drawing::graph(Level const& level, std::string const& label) const {
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
    Element wires("g");
    wires.set("class", "wires").set("aria-hidden", "true").add("\n");
    auto const addWire = [&](Connection const& connection, std::string const& mark) {
        auto const from = outputs.find(connection.fromPortId);
        auto const to = inputs.find(connection.toPortId);
        if (from != outputs.end() && to != inputs.end()) {
            wires.add(wire(connection, from->second, to->second, mark));
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
    Element picture("svg");
    picture.set("class", "graph");
    if (!label.empty()) {
        picture.set("role", "group").set("aria-label", label).set("aria-describedby", "graph-keys");
    }
    picture.set("width", level.width)
        .set("height", level.height)
        .setView(0, 0, level.width, level.height)
        .add("\n")
        .add(wires)
        .add("\n");
    for (Box const& drawn : level.boxes) picture.add(box(drawn));
    return picture.markup() + "\n";
}

std::string scenePaths(std::vector<Drawn> const& scene) {
    std::string text;
    for (Drawn const& drawn : scene) {
        Element path("path");
        path.set("class", drawn.isLayer ? "layer" : "outline").set("d", drawn.data);
        if (drawn.isLayer) {
            path.set("stroke", colorText(drawn.color)).set("stroke-width", drawn.width);
        }
        text += path.markup() + "\n";
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
    Element picture("svg");
    picture.set("xmlns", "http://www.w3.org/2000/svg")
        .setView(0, 0, level.width, height)
        .set("role", "img")
        .set("aria-label", "The graph of " + nameOf(document.root) +
                               ", and what it draws in frame " + std::to_string(frame))
        .add("\n")
        .add(Element("style").add(std::string("\n") + page_files::kGraphCss))
        .add("\n")
        .add(Element("rect").set("class", "paper").set("width", level.width).set("height", height))
        .add("\n")
        .add(Drawing(document.root).graph(level));
    if (isDrawn) {
        Element stage("rect");
        stage.set("class", "stage")
            .set("x", -100000)
            .set("y", -100000)
            .set("width", 200000)
            .set("height", 200000);
        Element inner("svg");
        inner.set("class", "scene")
            .set("x", kGap)
            .set("y", level.height + kGap)
            .set("width", level.width - 2 * kGap)
            .set("height", kSceneHeight)
            .setView(bounds.left, bounds.top, bounds.right - bounds.left,
                     bounds.bottom - bounds.top)
            .add("\n")
            .add(stage)
            .add("\n")
            .add(scenePaths(drawn));
        picture.add(inner).add("\n");
    }
    return picture.markup() + "\n";
}
