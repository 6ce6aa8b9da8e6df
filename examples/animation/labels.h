// What people are shown of patches, ports and values, as strings of one line.
//
//     std::cout << nameOf(patch) << ": " << shownValues(port.values) << "\n";

#ifndef ANIMATION_LABELS_H
#define ANIMATION_LABELS_H

#include "animation/document.h"

#include <Engine/Base/patch.h>

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

// Every patch with its level, which is 1 for the root, each before its children.
void forEachPatch(
    tarn::engine::Patch const& root,
    std::function<void(tarn::engine::Patch const& patch, std::size_t level)> const& visit);

// A column of a table takes no more bytes.
constexpr std::size_t kWidestCell = 40;
// A value on the page takes no more bytes.
constexpr std::size_t kLongestText = 1000;

// The string, cut between two characters and ended with "..." where it has more bytes.
std::string cutToBytes(std::string text, std::size_t longest = kWidestCell);

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
