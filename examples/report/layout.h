// The layout of a graph: Graphviz places the patches, level by level.
//
//     std::vector<Level> const levels = layOut(document.root);
//     Box const& box = levels.front().boxes.front();

#ifndef REPORT_LAYOUT_H
#define REPORT_LAYOUT_H

#include <Engine/Base/patch.h>

#include <cstddef>
#include <string>
#include <vector>

// All lengths are in pixels; y points down.
struct Box {
    tarn::engine::Patch const* patch;
    double x = 0.0;
    double y = 0.0;
    double width = 0.0;
    double height = 0.0;
};

// The children of one patch.
struct Level {
    tarn::engine::Patch const* group;
    double width = 0.0;
    double height = 0.0;
    // The children in order, up to `kMostBoxes`.
    std::vector<Box> boxes;
    // Graphviz took too long: the boxes are in rows, in the order of the document.
    bool isInRows = false;
};

// More would take too long and could not be read.
constexpr std::size_t kMostBoxes = 2500;

// A patch is drawn with a heading, a row for each output, and a row for each input.
constexpr double kHeadingHeight = 26.0;
constexpr double kRowHeight = 18.0;
constexpr double kCharacterWidth = 6.65;  // Of the fixed-width font at 11 pixels.
constexpr std::size_t kLongestLabel = 32;

// The heading of a patch: its name, cut to `kLongestLabel`.
std::string headingOf(tarn::engine::Patch const& patch);
// "radius Number".
std::string labelOf(tarn::engine::Port const& port);

// A level for each patch with children, the root's first, in the order of the document; one empty
// level for a root without children. Throws a std::runtime_error where Graphviz is missing or
// fails.
std::vector<Level> layOut(tarn::engine::Patch const& root);
// Only the root's level.
Level layOutOne(tarn::engine::Patch const& root);

#endif
