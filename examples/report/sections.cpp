#include "report/sections.h"

#include "animation/labels.h"
#include "animation/markup.h"
#include "curve.h"
#include "report/drawing.h"

#include <Engine/Base/easing.h>

#include <algorithm>
#include <functional>
#include <map>
#include <sstream>
#include <unordered_map>
#include <unordered_set>

using namespace tarn::engine;

namespace {

// Browsers nest elements no deeper than some hundred levels.
constexpr int kDeepestTree = 64;

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

}  // namespace

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
    forEachPatch(root, [&](Patch const& patch, std::size_t) {
        for (auto const& list : {patch.inputs, patch.outputs}) {
            for (Port const& port : *list) {
                types.emplace(portNameForTypeInfo(port.typeInfo, false) + " (" +
                                  typeToString(port.typeInfo.type) + ")",
                              typeToString(port.typeInfo.type));
            }
        }
    });
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

std::string attributesText(Patch const& root) {
    std::ostringstream text;
    forEachPatch(root, [&](Patch const& patch, std::size_t) {
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
    });
    std::string const list = text.str();
    return list.empty() ? "" : "<ul class=\"tree\">\n" + list + "</ul>\n";
}

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
