// The program's output as strings.
//
//     std::cout << countsText(document) << framesText(document, 3, 1, [](long long) {});

#ifndef DOCUMENT_ROAD_CONSOLE_H
#define DOCUMENT_ROAD_CONSOLE_H

#include "animation/document.h"

#include <functional>
#include <string>

// Describes a patch (a port), its parent and its connections. Empty where no patch (port) has the
// identifier.
std::string patchText(Document const& document, unsigned long long id);
std::string portText(Document const& document, unsigned long long id);

// One row for each `every`-th of the frames 0 to `frames` - 1, one column for each of the root's
// outputs; where the root has none, for each unconnected output. `progress` is called before each
// frame.
std::string framesText(Document const& document, long long frames, long long every,
                       std::function<void(long long frame)> const& progress);

// "frame 0, ring: M 5 0 ...": one line for each path in each `every`-th frame.
std::string pathsText(Document const& document, long long frames, long long every);

#endif
