#include "report/layout.h"

#include "animation/labels.h"
#include "report/graphviz.h"

#include <algorithm>
#include <cmath>
#include <optional>
#include <sstream>
#include <unordered_map>

using namespace tarn::engine;

namespace {

constexpr double kPixelsPerInch = 72.0;
constexpr double kPadding = 14.0;
constexpr double kMargin = 12.0;
constexpr std::size_t kNarrowest = 12;
// With this many boxes, a level gets its own process.
constexpr std::size_t kMany = 200;

Box sizedBox(Patch const& patch) {
    std::size_t columns = columnsOf(headingOf(patch)) + (patch.children->empty() ? 0 : 3);
    for (auto const& list : {patch.inputs, patch.outputs}) {
        for (Port const& port : *list) columns = std::max(columns, columnsOf(labelOf(port)));
    }
    Box box{&patch};
    box.width = static_cast<double>(std::max(columns, kNarrowest)) * kCharacterWidth + 2 * kPadding;
    auto const rows = static_cast<double>(patch.inputs->size() + patch.outputs->size());
    box.height = kHeadingHeight + rows * kRowHeight + 6.0;
    return box;
}

Level levelOf(Patch const& patch) {
    Level level{&patch, 0.0, 0.0, {}, false};
    for (Patch const& child : *patch.children) {
        if (level.boxes.size() == kMostBoxes) break;
        level.boxes.push_back(sizedBox(child));
    }
    return level;
}

void addLevels(Patch const& patch, std::vector<Level>& levels) {
    levels.push_back(levelOf(patch));
    for (Patch const& child : *patch.children) {
        if (!child.children->empty()) addLevels(child, levels);
    }
}

// Boxes are named by their index. Edges are not requested: they are drawn from port to port.
void writeDot(std::ostream& stream, Level const& level) {
    stream << "digraph {\n  graph [rankdir=LR, splines=false, nodesep=0.28, ranksep=0.7, "
              "nslimit=2, nslimit1=2, mclimit=0.5, maxiter=100];\n"
              "  node [shape=box, fixedsize=true, label=\"\"];\n";
    std::unordered_map<unsigned long long, std::size_t> positions;
    for (std::size_t i = 0; i < level.boxes.size(); ++i) {
        Box const& box = level.boxes[i];
        positions.emplace(box.patch->id, i);
        stream << "  " << i << " [width=" << box.width / kPixelsPerInch
               << ", height=" << box.height / kPixelsPerInch << "];\n";
    }
    for (Connection const& connection : *level.group->connections) {
        auto const from = positions.find(connection.fromPatchId);
        auto const to = positions.find(connection.toPatchId);
        if (from == positions.end() || to == positions.end()) continue;
        stream << "  " << from->second << " -> " << to->second << ";\n";
    }
    stream << "}\n";
}

// Parses "graph scale width height", "node name x y ..." with centres and y upwards, up to "stop".
void place(Level& level, std::istream& answer) {
    double height = 0.0;
    for (std::string line; std::getline(answer, line) && line != "stop";) {
        std::istringstream words(line);
        std::string word;
        words >> word;
        if (word == "graph") {
            double scale = 0.0;
            double width = 0.0;
            words >> scale >> width >> height;
            level.width = width * kPixelsPerInch + 2 * kMargin;
            level.height = height * kPixelsPerInch + 2 * kMargin;
        } else if (word == "node") {
            std::size_t position = 0;
            double x = 0.0;
            double y = 0.0;
            words >> position >> x >> y;
            Box& box = level.boxes.at(position);
            box.x = x * kPixelsPerInch - box.width / 2 + kMargin;
            box.y = (height - y) * kPixelsPerInch - box.height / 2 + kMargin;
        }
    }
}

// Places the boxes in rows, about as wide as high.
void placeInRows(Level& level) {
    level.isInRows = true;
    auto const inRow =
        static_cast<std::size_t>(std::ceil(std::sqrt(static_cast<double>(level.boxes.size()))));
    double x = kMargin;
    double y = kMargin;
    double rowHeight = 0.0;
    for (std::size_t i = 0; i < level.boxes.size(); ++i) {
        Box& box = level.boxes[i];
        if (i > 0 && i % inRow == 0) {
            x = kMargin;
            y += rowHeight + 2 * kMargin;
            rowHeight = 0.0;
        }
        box.x = x;
        box.y = y;
        x += box.width + 4 * kMargin;
        rowHeight = std::max(rowHeight, box.height);
        level.width = std::max(level.width, box.x + box.width + kMargin);
        level.height = std::max(level.height, box.y + box.height + kMargin);
    }
}

void placeAll(std::vector<Level*> const& levels) {
    std::ostringstream text;
    for (Level const* level : levels) writeDot(text, *level);
    std::optional<std::string> const answer = answerOfDot(text.str());
    std::istringstream lines(answer ? *answer : "");
    for (Level* level : levels) {
        if (answer) {
            place(*level, lines);
        } else {
            placeInRows(*level);
        }
    }
}

}  // namespace

std::string headingOf(Patch const& patch) { return shortened(nameOf(patch), kLongestLabel); }

std::string labelOf(Port const& port) {
    std::string const type = portNameForTypeInfo(port.typeInfo, false);
    if (port.name.empty()) return type;
    return shortened(printable(port.name), kLongestLabel - type.size() - 1) + " " + type;
}

Level layOutOne(Patch const& root) {
    std::vector<Level> levels{levelOf(root)};
    placeAll({&levels.front()});
    return std::move(levels.front());
}

std::vector<Level> layOut(Patch const& root) {
    std::vector<Level> levels;
    addLevels(root, levels);
    std::vector<Level*> small;
    for (Level& level : levels) {
        if (level.boxes.size() < kMany) {
            small.push_back(&level);
        } else {
            placeAll({&level});
        }
    }
    placeAll(small);
    return levels;
}
