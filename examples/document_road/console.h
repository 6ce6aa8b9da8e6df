// What the program prints, as strings.
//
//     std::cout << countsText(document) << framesText(document, 3, 1, [](long long) {});

#ifndef DOCUMENT_ROAD_CONSOLE_H
#define DOCUMENT_ROAD_CONSOLE_H

#include "animation/document.h"

#include <functional>
#include <string>

// What a patch (a port) is, where it belongs, and what it is connected to. Empty where no patch
// (port) has the identifier.
std::string patchText(Document const& document, unsigned long long id);
std::string portText(Document const& document, unsigned long long id);

// One row for each `every`-th of the frames 0 to `frames` - 1, one column for each of the root's
// outputs, or for each output without a connection where the root has none. `progress` is called
// before each frame.
std::string framesText(Document const& document, long long frames, long long every,
                       std::function<void(long long frame)> const& progress);

// "frame 0, ring: M 5 0 ...", a line for each outline of each `every`-th frame.
std::string pathsText(Document const& document, long long frames, long long every);

#endif
