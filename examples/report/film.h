// What a page plays of a document: its frames, and the values of its outputs over time.
//
//     Film const film = filmOf(document, 120);

#ifndef REPORT_FILM_H
#define REPORT_FILM_H

#include "animation/document.h"
#include "animation/scene.h"
#include "report/drawing.h"

#include <cstddef>
#include <limits>
#include <string>
#include <unordered_map>
#include <vector>

// Texts that repeat from frame to frame are kept once.
class Texts {
public:
    std::size_t add(std::string const& text) {
        auto const [place, isNew] = places.emplace(text, list.size());
        if (isNew) {
            list.push_back(text);
            total += text.size();
        }
        return place->second;
    }
    std::string const& at(std::size_t place) const { return list[place]; }
    // Of all of them.
    std::size_t bytes() const { return total; }
    Json json() const { return list; }

private:
    std::size_t total = 0;
    std::vector<std::string> list;
    std::unordered_map<std::string, std::size_t> places;
};

// A line of a plot, one value for each frame.
struct Line {
    std::string name;
    std::size_t color;
    std::vector<double> values;
};

struct Plot {
    std::string name;
    tarn::engine::TypeInfo typeInfo;
    std::vector<Line> lines;
    // Where the output has no numbers: the frames at which it changes.
    std::vector<long long> changes;
    tarn::engine::Loop last;
    std::vector<std::size_t> texts;
    std::size_t longestLoop = 1;
};

// All that is played.
struct Film {
    Texts texts;
    std::vector<Plot> plots;
    Json frames = Json::array();
    Bounds bounds;
    std::vector<Drawn> first;
};

// Ends before `frames` where the page would become too large or so much time has passed, but not
// before the first.
Film filmOf(Document const& document, long long frames,
            double seconds = std::numeric_limits<double>::infinity());

// The plot of an output that stays as it is shows nothing.
bool isConstant(Plot const& plot);

#endif
