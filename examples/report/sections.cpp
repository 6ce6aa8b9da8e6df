#include "report/sections.h"

#include "animation/labels.h"
#include "animation/markup.h"
#include "curve.h"
#include "report/drawing.h"

#include <Engine/Base/easing.h>

#include <algorithm>
#include <functional>
#include <map>
#include <unordered_map>
#include <unordered_set>

using namespace tarn::engine;

namespace {

// Browsers limit nested elements to some hundred levels.
constexpr int kDeepestTree = 64;
constexpr int kDeepestLevel = 256;

// The root is in no level, so its ports are listed here.
std::string rootPortsText(Drawing const& drawing, Patch const& root) {
    Element list("ul");
    list.set("class", "ports").add("\n");
    auto const add = [&](Port const& port, bool isInput) {
        std::string line;
        for (std::string const& part : drawing.describe(port, isInput)) {
            line += (line.empty() ? "" : "; ") + part;
        }
        list.add(Element("li").text(line)).add("\n");
    };
    for (Port const& input : *root.inputs) add(input, true);
    for (Port const& output : *root.outputs) add(output, false);
    std::size_t const count = root.inputs->size() + root.outputs->size();
    if (count == 0) return "";
    Element details("details");
    details.add(Element("summary").text("The document's own ports, " + std::to_string(count)))
        .add(list);
    return details.markup() + "\n";
}

// A collapsible list.
std::string foldedList(Element const& summary, std::string const& items) {
    Element const details = Element("details").add(summary).add(Element("ul").add("\n" + items));
    return Element("li").add(details).markup() + "\n";
}

std::string treeText(std::string const& name, Unstructured const& data, int depth) {
    Element const shownName = Element("span").set("class", "name").text(printable(name));
    Unstructured::Map const* const map = data.ifMap();
    Unstructured::Array const* const array = data.ifArray();
    if (map == nullptr && array == nullptr) {
        return Element("li").add(shownName).add(" ").text(data.toText(kLongestText)).markup() +
               "\n";
    }
    std::string items;
    if (depth == kDeepestTree) {
        items = Element("li").text("nested deeper than this page shows").markup() + "\n";
    } else if (map != nullptr) {
        for (auto const& [key, member] : *map) items += treeText(key, member, depth + 1);
    } else {
        for (std::size_t i = 0; i < array->size(); ++i) {
            items += treeText(std::to_string(i), (*array)[i], depth + 1);
        }
    }
    std::string const size = std::to_string(map != nullptr ? map->size() : array->size());
    std::string const brackets = map != nullptr ? "{" + size + "}" : "[" + size + "]";
    return foldedList(Element("summary").add(shownName).text(" " + brackets), items);
}

std::string attributesOf(std::string const& owner,
                         std::map<std::string, Unstructured> const& attributes) {
    if (attributes.empty()) return "";
    std::string items;
    for (auto const& [key, value] : attributes) items += treeText(key, value, 1);
    return foldedList(
        Element("summary").text(owner + " {" + std::to_string(attributes.size()) + "}"), items);
}

// The values of all `id` attributes that begin with `prefix`.
std::unordered_set<std::string> idsIn(std::string const& markup, std::string const& prefix) {
    std::unordered_set<std::string> ids;
    std::string const start = " id=\"" + prefix;
    for (std::size_t at = markup.find(start); at != std::string::npos;
         at = markup.find(start, at + 1)) {
        ids.insert(markup.substr(at + 5, markup.find('"', at + 5) - at - 5));
    }
    return ids;
}

Element zoomButton(char const* factor, std::string const& label, char const* sign) {
    return Element("button")
        .set("type", "button")
        .set("class", "zoom")
        .set("data-factor", factor)
        .set("aria-label", label)
        .text(sign);
}

Element captionOf(Level const& level, int depth) {
    Patch const& group = *level.group;
    std::string const name = nameOf(group);
    Element caption("figcaption");
    caption.add(Element("span").set("class", "name").text(name))
        .add(" ")
        .add(Element("span")
                 .set("class", "type")
                 .text("level " + std::to_string(depth) + ", patch " + std::to_string(group.id) +
                       ", " + counted(group.children->size(), "patch", "patches") + " inside"));
    if (!level.boxes.empty()) {
        caption.add(" ")
            .add(zoomButton("0.8", "Draw " + name + " smaller", "\u2212"))
            .add(" ")
            .add(zoomButton("1.25", "Draw " + name + " larger", "+"));
    }
    if (depth > 1) {
        caption.add(" ").add(
            Element("button").set("type", "button").set("class", "close").text("Close " + name));
    }
    return caption;
}

}  // namespace

std::string levelsText(Patch const& root, Marks const* marks) {
    std::vector<Level> const levels = layOut(root);
    std::unordered_map<Patch const*, Level const*> levelOf;
    for (Level const& level : levels) levelOf.emplace(level.group, &level);
    Drawing const drawing(root, marks);
    // The figure of a level contains those of its groups: closing it closes them.
    std::function<std::string(Level const&, int)> const figureOf = [&](Level const& level,
                                                                       int depth) {
        Patch const& group = *level.group;
        Element figure("figure");
        figure.set("class", "level")
            .set("tabindex", -1)
            .set("id", "level-" + std::to_string(group.id));
        if (depth > 1) figure.setMarkup("hidden");
        figure.add("\n").add(captionOf(level, depth)).add("\n");
        if (depth > kDeepestLevel) {
            figure.add(paragraph("Nested deeper than this page shows."));
            return figure.markup() + "\n";
        }
        if (level.boxes.size() < group.children->size()) {
            figure.add(
                paragraph("Shown are the first " + std::to_string(level.boxes.size()) + "."));
        }
        if (level.isInRows) {
            figure.add(
                paragraph("To place the patches of this level takes too long: they are in rows, in "
                          "the order of the document."));
        }
        if (depth == 1) figure.add(rootPortsText(drawing, group));
        if (level.boxes.empty()) {
            figure.add(paragraph("There is nothing inside."));
        } else {
            std::string const graph = drawing.graph(level, "Graph of " + nameOf(group));
            figure.add(Element("div").set("class", "scroll").set("tabindex", -1).add(graph))
                .add("\n")
                .add(Element("div").set("class", "info").set("aria-hidden", "true").text(""))
                .add("\n");
        }
        for (Patch const& child : *group.children) {
            auto const inner = levelOf.find(&child);
            if (inner != levelOf.end()) figure.add(figureOf(*inner->second, depth + 1));
        }
        return figure.markup() + "\n";
    };
    return figureOf(levels.front(), 1);
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
        text += Element("li").set("class", "t-" + type).text(name).markup() + "\n";
    }
    return text;
}

std::string curvesText() {
    constexpr double kSize = 100.0;
    double const side = (kCurveEnd - kCurveStart) * kSize;
    double const margin = -kCurveStart * kSize;
    std::string text;
    std::vector<std::string> const names = easingFunctionNames();
    for (std::size_t i = 0; i < names.size(); ++i) {
        Element picture("svg");
        picture.set("role", "img")
            .set("aria-label", names[i])
            .setView(-margin, margin - side, side, side)
            .add(Element("rect")
                     .set("class", "beyond")
                     .set("x", -margin)
                     .set("y", margin - side)
                     .set("width", side)
                     .set("height", side))
            .add(Element("rect")
                     .set("class", "way")
                     .set("y", -kSize)
                     .set("width", kSize)
                     .set("height", kSize))
            .add(Element("path").set("d", pathData(curve(EasingFunction(i), kSize))));
        Element figure("figure");
        figure.set("class", "curve").add(picture).add(Element("figcaption").text(names[i]));
        text += figure.markup() + "\n";
    }
    return text;
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
    std::string text;
    for (Shape const& shape : shapes) {
        Bounds bounds;
        bounds.add(shape.path);
        bounds = bounds.widened(5.0);
        Element picture("svg");
        picture.set("class", "points")
            .set("role", "img")
            .set("aria-label", shape.call)
            .setView(bounds.left, bounds.top, bounds.right - bounds.left,
                     bounds.bottom - bounds.top)
            .add(Element("path").set("class", "outline").set("d", pathData(shape.path)));
        Element elements("ol");
        for (PathElement const& element : shape.path.elements) {
            std::string line = pathInstructionToString(element.instruction);
            char const* before = " ";
            for (FloatVec2 const p : element.points) {
                line += before + point(p);
                before = ", ";
            }
            elements.add(Element("li").text(line)).add("\n");
        }
        Element figure("figure");
        figure.set("class", "shape")
            .add(Element("figcaption").text(shape.call))
            .add(picture)
            .add("\n")
            .add(elements);
        text += figure.markup() + "\n";
    }
    return text;
}

std::string attributesText(Patch const& root) {
    std::string items;
    forEachPatch(root, [&](Patch const& patch, std::size_t) {
        std::string const owner = nameOf(patch) + " (patch " + std::to_string(patch.id) + ")";
        items += attributesOf(owner, patch.attributes);
        for (auto const& list : {patch.inputs, patch.outputs}) {
            for (Port const& port : *list) {
                items += attributesOf(owner + ", " + printable(port.name) + " (port " +
                                          std::to_string(port.id) + ")",
                                      port.attributes);
            }
        }
    });
    if (items.empty()) return "";
    return Element("ul").set("class", "tree").add("\n" + items).markup() + "\n";
}

std::string changesText(Marks const* marks, std::string const& levels) {
    constexpr std::size_t kMostChanges = 2000;
    if (marks == nullptr) return "";
    if (marks->changes.empty() && marks->frameRates.empty()) {
        return paragraph("The documents are the same.");
    }
    std::unordered_set<std::string> const patches = idsIn(levels, "patch-");
    std::unordered_set<std::string> const groups = idsIn(levels, "level-");
    Element list("ul");
    list.set("tabindex", 0).set("aria-label", "Changes").add("\n");
    for (std::size_t i = 0; i < std::min(marks->changes.size(), kMostChanges); ++i) {
        PatchChange const& change = marks->changes[i];
        Patch const& patch = change.after != nullptr ? *change.after : *change.before;
        Patch const* const parent =
            change.after != nullptr ? change.parentAfter : change.parentBefore;
        std::string const kind = kindOfChange(change.kind);
        std::string const line = to_string(change).substr(kind.size() + 1);
        std::string id = "patch-" + std::to_string(patch.id);
        bool isThere = parent != nullptr && patches.count(id) != 0;
        if (!isThere) {
            id = "level-" + std::to_string(parent != nullptr ? parent->id : patch.id);
            isThere = groups.count(id) != 0;
        }
        Element item("li");
        item.add(Element("span").set("class", "mark").text(signOfChange(kind) + " " + kind))
            .add(" ");
        if (isThere) {
            item.add(Element("a").set("href", "#" + id).text(line));
        } else {
            item.text(line);
        }
        list.add(item).add("\n");
    }
    if (!marks->frameRates.empty()) list.add(Element("li").text(marks->frameRates)).add("\n");
    std::size_t const count = marks->changes.size();
    return list.markup() + "\n" +
           (count > kMostChanges ? paragraph(std::to_string(count - kMostChanges) + " more.") : "");
}
