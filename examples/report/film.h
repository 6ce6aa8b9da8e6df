// The animation of a page: all frames, and the values of the outputs over time.
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

// Stores each distinct string once.
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
    // The total size of the strings.
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
    // For outputs without numbers: the frames in which the value changes.
    std::vector<long long> changes;
    tarn::engine::Loop last;
    std::vector<std::size_t> texts;
    std::size_t longestLoop = 1;
};

// The complete animation.
struct Film {
    Texts texts;
    std::vector<Plot> plots;
    Json frames = Json::array();
    Bounds bounds;
    std::vector<Drawn> first;
};

// Stops before `frames` where the page would become too large or the time is up, but not before the
// first.
Film filmOf(Document const& document, long long frames,
            double seconds = std::numeric_limits<double>::infinity());

// Whether the output never changes, so that a plot would show nothing.
bool isConstant(Plot const& plot);

#endif
