// What the program prints, as texts.

#ifndef DOCUMENT_ROAD_REPORT_H
#define DOCUMENT_ROAD_REPORT_H

#include "document.h"
#include "evaluator.h"

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

// A column of a table takes no more bytes.
constexpr std::size_t kWidestCell = 40;

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

// "Number [type: float] from 0 to 1, default 0".
std::string portTypeText(tarn::engine::Port const& port);

// "1 input", "2 inputs".
std::string counted(std::size_t count, std::string const& one, std::string const& more);

// How many patches, ports and connections there are, and of which types; what was left out.
std::string countsText(Document const& document);

// What a patch (a port) is, where it belongs, and what it is connected to. Empty where no patch
// (port) has the identifier.
std::string patchText(Document const& document, unsigned long long id);
std::string portText(Document const& document, unsigned long long id);

// One row for each `every`-th of the frames 0 to `frames` - 1, one column for each of the root's
// outputs, or for each output without a connection where the root has none. `progress` is called
// before each frame.
std::string framesText(Document const& document, long long frames, long long every,
                       std::function<void(long long frame)> const& progress);

#endif
