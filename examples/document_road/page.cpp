#include "page.h"

#include "curve.h"
#include "drawing.h"
#include "evaluator.h"
#include "markup.h"
#include "page_files.h"
#include "report.h"

#include <Engine/Base/easing.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <map>
#include <sstream>
#include <unordered_map>
#include <unordered_set>

using namespace tarn::engine;

namespace {

// Browsers nest elements no deeper than some hundred levels.
constexpr int kDeepestTree = 64;
// The frames of a page take about so many bytes at most.
constexpr std::size_t kMostBytes = 32u << 20;
constexpr std::size_t kBytesOfAPlace = 16;
constexpr std::size_t kLongestText = 1000;

// Texts that repeat from frame to frame are kept once.
class Texts {
public:
    std::size_t add(std::string const& text) {
        auto const [place, isNew] = places.emplace(text, list.size());
        if (isNew) {
            list.push_back(text);
            total += text.size();
        }
        return place->second;
    }
    std::string const& at(std::size_t place) const { return list[place]; }
    // Of all of them.
    std::size_t bytes() const { return total; }
    Json json() const { return list; }

private:
    std::size_t total = 0;
    std::vector<std::string> list;
    std::unordered_map<std::string, std::size_t> places;
};

// A line of a plot, one value for each frame.
struct Line {
    std::string name;
    std::size_t color;
    std::vector<double> values;
};

struct Plot {
    std::string name;
    TypeInfo typeInfo;
    std::vector<Line> lines;
    // Where the output has no numbers: the frames at which it changes.
    std::vector<long long> changes;
    Loop last;
    std::vector<std::size_t> texts;
    std::size_t longestLoop = 1;
};

struct Component {
    char const* name;
    double value;
};

// What there is to plot of a value; nothing where it has no numbers.
std::vector<Component> components(Value const& value) {
    switch (value.type()) {
        case Type::Float:
        case Type::Int:
        case Type::Boolean: return {{"value", double(value)}};
        case Type::Vec2: {
            FloatVec2 const v = value;
            return {{"x", v.x}, {"y", v.y}};
        }
        case Type::Vec3: {
            FloatVec3 const v = value;
            return {{"x", v.x}, {"y", v.y}, {"z", v.z}};
        }
        case Type::Vec4: {
            FloatVec4 const v = value;
            return {{"red", v.x}, {"green", v.y}, {"blue", v.z}, {"opacity", v.w}};
        }
        case Type::Path: {
            Bounds bounds;
            bounds.add(*value.ifPath());
            return {{"left", bounds.left},
                    {"right", bounds.right},
                    {"top", bounds.top},
                    {"bottom", bounds.bottom}};
        }
        case Type::Mat4:
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::String:
        case Type::Model:
        case Type::Unstructured: break;
    }
    return {};
}

void addFrame(Plot& plot, Loop const& values, long long frame) {
    plot.longestLoop = std::max(plot.longestLoop, values.size());
    bool hasNumbers = false;
    std::size_t line = 0;
    for (Value const& value : values) {
        std::size_t color = 0;
        for (Component const& component : components(value)) {
            hasNumbers = true;
            if (line == plot.lines.size()) {
                plot.lines.push_back({component.name, color, {}});
                // It was not there before.
                plot.lines.back().values.assign(static_cast<std::size_t>(frame), NAN);
            }
            plot.lines[line++].values.push_back(component.value);
            ++color;
        }
    }
    for (; line < plot.lines.size(); ++line) plot.lines[line].values.push_back(NAN);
    if (!hasNumbers && frame > 0 && values != plot.last) plot.changes.push_back(frame);
    plot.last = values;
}

// All that is played.
struct Film {
    Texts texts;
    std::vector<Plot> plots;
    Json frames = Json::array();
    Bounds bounds;
    std::vector<Drawn> first;
};

Film filmOf(Document const& document, long long frames) {
    Film film;
    Evaluator evaluator(document);
    Scene const scene(document, evaluator.root());
    std::vector<ShownOutput> const outputs = shownOutputs(document, evaluator.root());
    for (ShownOutput const& output : outputs) {
        film.plots.push_back({printable(output.name), output.port->typeInfo, {}, {}, {}, {}, 1});
    }
    double widest = 0.0;
    std::size_t places = 0;
    for (long long frame = 0; frame < frames; ++frame) {
        if (film.texts.bytes() + kBytesOfAPlace * places > kMostBytes) break;
        evaluator.evaluate(frame);
        for (std::size_t i = 0; i < outputs.size(); ++i) {
            addFrame(film.plots[i], outputs[i].port->values, frame);
            film.plots[i].texts.push_back(
                film.texts.add(shownValues(outputs[i].port->values, kLongestText)));
        }
        std::vector<Drawn> drawn = scene.now();
        Json items = Json::array();
        for (Drawn const& outline : drawn) {
            film.bounds.add(outline.path);
            if (outline.isLayer && std::isfinite(outline.width)) {
                widest = std::max(widest, outline.width);
            }
            Json item = {film.texts.add(outline.data)};
            if (outline.isLayer) {
                item.push_back(film.texts.add(colorText(outline.color)));
                item.push_back(film.texts.add(number(outline.width)));
            }
            items.push_back(std::move(item));
        }
        film.frames.push_back(std::move(items));
        places += 3 * drawn.size() + outputs.size();
        for (Plot const& plot : film.plots) places += plot.lines.size();
        if (frame == 0) film.first = std::move(drawn);
    }
    film.bounds = film.bounds.widened(widest / 2.0 + film.bounds.size() / 20.0);
    return film;
}

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

// The root is in no level: its ports are listed.
std::string rootPortsText(Drawing const& drawing, Patch const& root) {
    std::string items;
    auto const add = [&](Port const& port, bool isInput) {
        std::string line;
        for (std::string const& part : drawing.describe(port, isInput)) {
            line += (line.empty() ? "" : "; ") + part;
        }
        items += "<li>" + escaped(line) + "</li>\n";
    };
    for (Port const& input : *root.inputs) add(input, true);
    for (Port const& output : *root.outputs) add(output, false);
    if (items.empty()) return "";
    return "<details><summary>The document's own ports, " +
           std::to_string(root.inputs->size() + root.outputs->size()) +
           "</summary><ul class=\"ports\">\n" + items + "</ul></details>\n";
}

// The plots of outputs that stay as they are show nothing.
bool isConstant(Plot const& plot) {
    auto const isFlat = [](Line const& line) {
        return std::adjacent_find(line.values.begin(), line.values.end(), std::not_equal_to<>()) ==
               line.values.end();
    };
    return plot.changes.empty() && std::all_of(plot.lines.begin(), plot.lines.end(), isFlat);
}

std::string levelsText(Patch const& root, Marks const* marks) {
    std::vector<Level> const levels = layOut(root);
    std::unordered_map<Patch const*, Level const*> levelOf;
    for (Level const& level : levels) levelOf.emplace(level.group, &level);
    Drawing const drawing(root, marks);
    std::ostringstream text;
    // A level's figure holds those of the groups in it: closing it closes them.
    std::function<void(Level const&, int)> const write = [&](Level const& level, int depth) {
        Patch const& group = *level.group;
        std::string const name = escaped(nameOf(group));
        text << "<figure class=\"level\" tabindex=\"-1\" id=\"level-" << group.id << "\""
             << (depth > 1 ? " hidden" : "") << ">\n<figcaption><span class=\"name\">" << name
             << "</span> <span class=\"type\">level " << depth << ", patch " << group.id << ", "
             << group.children->size() << (group.children->size() == 1 ? " patch" : " patches")
             << " inside</span>";
        if (!level.boxes.empty()) {
            text << " <button type=\"button\" class=\"zoom\" data-factor=\"0.8\" aria-label=\"Draw "
                 << name
                 << " smaller\">\u2212</button> <button type=\"button\" class=\"zoom\" "
                    "data-factor=\"1.25\" aria-label=\"Draw "
                 << name << " larger\">+</button>";
        }
        if (depth > 1)
            text << " <button type=\"button\" class=\"close\">Close " << name << "</button>";
        text << "</figcaption>\n";
        if (level.boxes.size() < group.children->size()) {
            text << "<p>Shown are the first " << level.boxes.size() << ".</p>\n";
        }
        if (level.isInRows) {
            text << "<p>Graphviz takes too long for this level: its patches are in rows, in the "
                    "order of the document.</p>\n";
        }
        if (depth == 1) text << rootPortsText(drawing, group);
        if (level.boxes.empty()) {
            text << "<p>There is nothing inside.</p>\n";
        } else {
            text << "<div class=\"scroll\" tabindex=\"-1\">"
                 << drawing.graph(level, "role=\"group\" aria-label=\"Graph of " + name +
                                             "\" aria-describedby=\"graph-keys\"")
                 << "</div>\n<div class=\"info\" aria-hidden=\"true\"></div>\n";
        }
        for (Patch const& child : *group.children) {
            auto const inner = levelOf.find(&child);
            if (inner != levelOf.end()) write(*inner->second, depth + 1);
        }
        text << "</figure>\n";
    };
    write(levels.front(), 1);
    return text.str();
}

std::string legendText(Patch const& root) {
    std::map<std::string, std::string> types;
    std::function<void(Patch const&)> const add = [&](Patch const& patch) {
        for (auto const& list : {patch.inputs, patch.outputs}) {
            for (Port const& port : *list) {
                types.emplace(portNameForTypeInfo(port.typeInfo, false) + " (" +
                                  typeToString(port.typeInfo.type) + ")",
                              typeToString(port.typeInfo.type));
            }
        }
        for (Patch const& child : *patch.children) add(child);
    };
    add(root);
    std::string text;
    for (auto const& [name, type] : types) {
        text += "<li class=\"t-" + type + "\">" + name + "</li>\n";
    }
    return text;
}

std::string curvesText() {
    constexpr double kSize = 100.0;
    double const side = (kCurveEnd - kCurveStart) * kSize;
    double const margin = -kCurveStart * kSize;
    std::ostringstream text;
    std::vector<std::string> const names = easingFunctionNames();
    for (std::size_t i = 0; i < names.size(); ++i) {
        text << "<figure class=\"curve\"><svg role=\"img\" aria-label=\"" << escaped(names[i])
             << "\" viewBox=\"" << -margin << " " << margin - side << " " << side << " " << side
             << "\"><rect class=\"beyond\" x=\"" << -margin << "\" y=\"" << margin - side
             << "\" width=\"" << side << "\" height=\"" << side << "\"/><rect class=\"way\" y=\""
             << -kSize << "\" width=\"" << kSize << "\" height=\"" << kSize << "\"/><path d=\""
             << pathData(curve(EasingFunction(i), kSize)) << "\"/></svg><figcaption>"
             << escaped(names[i]) << "</figcaption></figure>\n";
    }
    return text.str();
}

std::string shapesText() {
    struct Shape {
        char const* call;
        Path path;
    };
    Path const leaf = PathBuilder().moveTo({0, 0}).quadCurveTo({20, -20}, {40, 0}).close().build();
    std::vector<Shape> const shapes{
        {"moveTo, lineTo, close",
         PathBuilder().moveTo({0, 30}).lineTo({20, 0}).lineTo({40, 30}).close().build()},
        {"curveTo", PathBuilder().moveTo({0, 30}).curveTo({0, 0}, {40, 40}, {40, 0}).build()},
        {"quadCurveTo", PathBuilder().moveTo({0, 30}).quadCurveTo({20, -20}, {40, 30}).build()},
        {"arcTo, vertical first", PathBuilder().moveTo({0, 30}).arcTo({40, 0}, true).build()},
        {"arcTo, horizontal first", PathBuilder().moveTo({0, 30}).arcTo({40, 0}, false).build()},
        {"circle", PathBuilder().circle({0, 0}, 20).build()},
        {"ellipse", PathBuilder().ellipse({0, 0}, {28, 16}).build()},
        {"roundRect", PathBuilder().roundRect({0, 0}, {50, 32}, 9).build()},
        {"hexaRect", PathBuilder().hexaRect({0, 0}, {50, 32}, 9).build()},
        {"append", PathBuilder().append(leaf).circle({20, 14}, 8).build()},
    };
    std::ostringstream text;
    for (Shape const& shape : shapes) {
        Bounds bounds;
        bounds.add(shape.path);
        bounds = bounds.widened(5.0);
        text << "<figure class=\"shape\"><figcaption>" << shape.call
             << "</figcaption><svg class=\"points\" role=\"img\" aria-label=\"" << shape.call
             << "\" viewBox=\"" << number(bounds.left) << " " << number(bounds.top) << " "
             << number(bounds.right - bounds.left) << " " << number(bounds.bottom - bounds.top)
             << "\"><path class=\"outline\" d=\"" << pathData(shape.path) << "\"/></svg>\n<ol>";
        for (PathElement const& element : shape.path.elements) {
            text << "<li>" << pathInstructionToString(element.instruction);
            char const* before = " ";
            for (FloatVec2 const p : element.points) {
                text << before << point(p);
                before = ", ";
            }
            text << "</li>\n";
        }
        text << "</ol></figure>\n";
    }
    return text.str();
}

void writeTree(std::ostream& stream, std::string const& name, Unstructured const& data, int depth) {
    Unstructured::Map const* const map = data.ifMap();
    Unstructured::Array const* const array = data.ifArray();
    if (map == nullptr && array == nullptr) {
        stream << "<li><span class=\"name\">" << escaped(printable(name)) << "</span> "
               << escaped(data.toText(kLongestText)) << "</li>\n";
        return;
    }
    std::size_t const size = map != nullptr ? map->size() : array->size();
    stream << "<li><details><summary><span class=\"name\">" << escaped(printable(name))
           << "</span> " << (map != nullptr ? "{" : "[") << size << (map != nullptr ? "}" : "]")
           << "</summary><ul>\n";
    if (depth == kDeepestTree) {
        stream << "<li>nested deeper than this page shows</li>\n";
    } else if (map != nullptr) {
        for (auto const& [key, member] : *map) writeTree(stream, key, member, depth + 1);
    } else {
        for (std::size_t i = 0; i < array->size(); ++i) {
            writeTree(stream, std::to_string(i), (*array)[i], depth + 1);
        }
    }
    stream << "</ul></details></li>\n";
}

void writeAttributes(std::ostream& stream, std::string const& owner,
                     std::map<std::string, Unstructured> const& attributes) {
    if (attributes.empty()) return;
    stream << "<li><details><summary>" << escaped(owner) << " {" << attributes.size()
           << "}</summary><ul>\n";
    for (auto const& [key, value] : attributes) writeTree(stream, key, value, 1);
    stream << "</ul></details></li>\n";
}

std::string attributesText(Document const& document) {
    std::ostringstream text;
    std::function<void(Patch const&)> const write = [&](Patch const& patch) {
        std::string const owner = nameOf(patch) + " (patch " + std::to_string(patch.id) + ")";
        writeAttributes(text, owner, patch.attributes);
        for (auto const& list : {patch.inputs, patch.outputs}) {
            for (Port const& port : *list) {
                writeAttributes(text,
                                owner + ", " + printable(port.name) + " (port " +
                                    std::to_string(port.id) + ")",
                                port.attributes);
            }
        }
        for (Patch const& child : *patch.children) write(child);
    };
    write(document.root);
    std::string const list = text.str();
    return list.empty() ? "" : "<ul class=\"tree\">\n" + list + "</ul>\n";
}

// The values of the attributes `id` that begin with `prefix`.
std::unordered_set<std::string> idsIn(std::string const& markup, std::string const& prefix) {
    std::unordered_set<std::string> ids;
    std::string const start = " id=\"" + prefix;
    for (std::size_t at = markup.find(start); at != std::string::npos;
         at = markup.find(start, at + 1)) {
        ids.insert(markup.substr(at + 5, markup.find('"', at + 5) - at - 5));
    }
    return ids;
}

// A change leads to its patch; where that is not drawn, to the level that it is in.
std::string changesText(Marks const* marks, std::string const& levels) {
    constexpr std::size_t kMostChanges = 2000;
    if (marks == nullptr) return "";
    if (marks->changes.empty() && marks->frameRates.empty()) {
        return "<p>The documents are the same.</p>\n";
    }
    std::unordered_set<std::string> const patches = idsIn(levels, "patch-");
    std::unordered_set<std::string> const groups = idsIn(levels, "level-");
    std::string text = "<ul tabindex=\"0\" aria-label=\"Changes\">\n";
    for (std::size_t i = 0; i < std::min(marks->changes.size(), kMostChanges); ++i) {
        PatchChange const& change = marks->changes[i];
        Patch const& patch = change.after != nullptr ? *change.after : *change.before;
        Patch const* const parent =
            change.after != nullptr ? change.parentAfter : change.parentBefore;
        std::string const kind = kindOfChange(change.kind);
        std::string const line = escaped(to_string(change).substr(kind.size() + 1));
        std::string id = "patch-" + std::to_string(patch.id);
        bool isThere = parent != nullptr && patches.count(id) != 0;
        if (!isThere) {
            id = "level-" + std::to_string(parent != nullptr ? parent->id : patch.id);
            isThere = groups.count(id) != 0;
        }
        text += "<li><span class=\"mark\">" + signOfChange(kind) + " " + kind + "</span> " +
                (isThere ? "<a href=\"#" + id + "\">" + line + "</a>" : line) + "</li>\n";
    }
    if (!marks->frameRates.empty()) text += "<li>" + escaped(marks->frameRates) + "</li>\n";
    text += "</ul>\n";
    if (marks->changes.size() > kMostChanges) {
        text += "<p>" + std::to_string(marks->changes.size() - kMostChanges) + " more.</p>\n";
    }
    return text;
}

std::string paragraphs(std::string const& lines) {
    std::istringstream stream(lines);
    std::string text;
    for (std::string line; std::getline(stream, line);) text += "<p>" + escaped(line) + "</p>\n";
    return text;
}

std::string stageText(Film const& film) {
    if (film.bounds.isEmpty) return "";
    Bounds const& bounds = film.bounds;
    return "viewBox=\"" + number(bounds.left) + " " + number(bounds.top) + " " +
           number(bounds.right - bounds.left) + " " + number(bounds.bottom - bounds.top) + "\"";
}

std::string dataText(Film const& film, Document const& document) {
    Json plots = Json::array();
    for (Plot const& plot : film.plots) plots.push_back(plot.texts);
    Json const data = {{"framesPerSecond", document.info.framesPerSecond},
                       {"texts", film.texts.json()},
                       {"frames", film.frames},
                       {"plots", plots}};
    std::string const json = jsonText(data);
    // Nothing in it may look like the end of the element that it stands in.
    std::string text;
    for (char const c : json) text += c == '<' ? std::string("\\u003c") : std::string(1, c);
    return text;
}

// The template with its {{NAMES}} filled in; what is from {{#NAME}} to {{/NAME}} stays where that
// part is not empty.
std::string filled(std::string const& page, std::map<std::string, std::string> const& parts) {
    std::string text;
    std::size_t done = 0;
    for (std::size_t open = page.find("{{"); open != std::string::npos;
         open = page.find("{{", done)) {
        std::size_t const close = page.find("}}", open);
        text += page.substr(done, open - done);
        std::string const name = page.substr(open + 2, close - open - 2);
        done = close + 2;
        if (name[0] == '#' && parts.at(name.substr(1)).empty()) {
            std::string const end = "{{/" + name.substr(1) + "}}";
            done = page.find(end, done) + end.size();
        } else if (name[0] != '#' && name[0] != '/') {
            text += parts.at(name);
        }
    }
    return text + page.substr(done);
}

}  // namespace

std::string pageText(Document const& document, std::string const& fileName, long long frames,
                     Marks const* marks) {
    Film const film = filmOf(document, frames);
    auto const shown = static_cast<long long>(film.frames.size());
    std::ostringstream plots;
    std::size_t constant = 0;
    for (std::size_t i = 0; i < film.plots.size(); ++i) {
        Plot const& plot = film.plots[i];
        if (isConstant(plot)) {
            ++constant;
        } else {
            plots << plotText(plot, i, shown, film.texts.at(plot.texts.front()));
        }
    }
    std::string const levels = levelsText(marks != nullptr ? marks->shown : document.root, marks);
    std::string const name = escaped(printable(fileName));
    return filled(
        page_files::kPageHtml,
        {{"TITLE", name},
         {"NAME", escaped(nameOf(document.root))},
         {"COUNTS", paragraphs(countsText(document))},
         {"GRAPH_CSS", page_files::kGraphCss},
         {"CSS", page_files::kPageCss},
         {"SCRIPT", page_files::kPageJs},
         {"CHANGES", changesText(marks, levels)},
         {"VIEW", stageText(film)},
         {"SCENE", film.bounds.isEmpty ? "" : scenePaths(film.first) + "\n"},
         {"LAST_FRAME", std::to_string(shown - 1)},
         {"CUT_SHORT", shown == frames ? std::string()
                                       : "<p>The page keeps the first " + std::to_string(shown) +
                                             " of " + std::to_string(frames) +
                                             " frames: more would be too large.</p>\n"},
         {"LEGEND", legendText(marks != nullptr ? marks->shown : document.root)},
         {"LEVELS", levels},
         {"PLOTS", plots.str()},
         {"CONSTANT", constant == 0 ? ""
                                    : "<p>Not shown: " + counted(constant, "output", "outputs") +
                                          (constant == 1 ? " that never changes.</p>\n"
                                                         : " that never change.</p>\n")},
         {"CURVES", curvesText()},
         {"SHAPES", shapesText()},
         {"ATTRIBUTES", attributesText(document)},
         {"DATA", dataText(film, document)}});
}
