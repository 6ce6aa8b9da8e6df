// One-line strings that describe patches, ports and values.
//
//     std::cout << nameOf(patch) << ": " << shownValues(port.values) << "\n";

#ifndef ANIMATION_LABELS_H
#define ANIMATION_LABELS_H

#include "animation/document.h"

#include <Engine/Base/patch.h>

#include <cstddef>
#include <string>
#include <vector>

// Calls `visit(patch, level)` for every patch, parents before children; the root's level is 1.
template <class AnyPatch, class Visit>
void forEachPatch(AnyPatch const& root, Visit const& visit, std::size_t level = 1) {
    visit(root, level);
    for (AnyPatch const& child : *root.children) forEachPatch(child, visit, level + 1);
}

// The longest column of a table, in bytes.
constexpr std::size_t kWidestCell = 40;
// The longest value on the page, in bytes.
constexpr std::size_t kLongestText = 1000;

// Cuts the string at a character boundary and appends "..." where it has more bytes.
std::string cutToBytes(std::string text, std::size_t longest = kWidestCell);
// The same with columns of a fixed-width font and an ellipsis.
std::string shortened(std::string const& text, std::size_t longest);
// The number of columns that the string takes.
std::size_t columnsOf(std::string const& text);

// An output whose values are shown.
struct ShownOutput {
    std::string name;
    tarn::engine::EvalPort const* port;
};

// The root's outputs; where it has none, the unconnected outputs of its children, up to twelve.
std::vector<ShownOutput> shownOutputs(Document const& document,
                                      tarn::engine::EvalPatch const& root);

// The value in one line; of a loop all values: "[1 | 2]". Cut after `longest` bytes.
std::string shownValues(tarn::engine::Loop const& values, std::size_t longest = kWidestCell);

// "oscillator".
std::string kindName(tarn::engine::Patch const& patch);

// The patch's name; its kind where it has none.
std::string nameOf(tarn::engine::Patch const& patch);

// "Number [type: float] from 0 to 1, default 0".
std::string portTypeText(tarn::engine::Port const& port);

// "1 input", "2 inputs".
std::string counted(std::size_t count, std::string const& one, std::string const& more);

// The numbers of patches, ports of each type and connections, and what was left out.
std::string countsText(Document const& document);

#endif
