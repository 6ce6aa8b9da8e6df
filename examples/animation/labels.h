// What people are shown of patches, ports and values, as strings of one line.
//
//     std::cout << nameOf(patch) << ": " << shownValues(port.values) << "\n";

#ifndef ANIMATION_LABELS_H
#define ANIMATION_LABELS_H

#include "animation/document.h"

#include <Engine/Base/patch.h>

#include <cstddef>
#include <string>
#include <vector>

// Calls `visit(patch, level)` for every patch, each before its children; the root's level is 1.
template <class AnyPatch, class Visit>
void forEachPatch(AnyPatch const& root, Visit const& visit, std::size_t level = 1) {
    visit(root, level);
    for (AnyPatch const& child : *root.children) forEachPatch(child, visit, level + 1);
}

// A column of a table takes no more bytes.
constexpr std::size_t kWidestCell = 40;
// A value on the page takes no more bytes.
constexpr std::size_t kLongestText = 1000;

// The string, cut between two characters and ended with "..." where it has more bytes.
std::string cutToBytes(std::string text, std::size_t longest = kWidestCell);
// The same by columns of a fixed-width face, with an ellipsis.
std::string shortened(std::string const& text, std::size_t longest);
// How many of them the string takes.
std::size_t columnsOf(std::string const& text);

// An output whose values are shown.
struct ShownOutput {
    std::string name;
    tarn::engine::EvalPort const* port;
};

// The root's outputs, or else those of its children that nothing is connected to, up to twelve.
std::vector<ShownOutput> shownOutputs(Document const& document,
                                      tarn::engine::EvalPatch const& root);

// The value in one line; of a loop, all of them: "[1 | 2]". Long ones are cut after `longest`
// bytes.
std::string shownValues(tarn::engine::Loop const& values, std::size_t longest = kWidestCell);

// "oscillator".
std::string kindName(tarn::engine::Patch const& patch);

// Its name, or else its kind.
std::string nameOf(tarn::engine::Patch const& patch);

// "Number [type: float] from 0 to 1, default 0".
std::string portTypeText(tarn::engine::Port const& port);

// "1 input", "2 inputs".
std::string counted(std::size_t count, std::string const& one, std::string const& more);

// How many patches, ports and connections there are, and of which types; what was left out.
std::string countsText(Document const& document);

#endif
