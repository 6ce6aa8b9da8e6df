// The report: one HTML file with the graph, the animation, its outputs over time, the curves, the
// shapes and the attributes. It needs no network and no other file.
//
//     std::ofstream("report.html") << pageText(document, "animation.json", 120);

#ifndef REPORT_PAGE_H
#define REPORT_PAGE_H

#include "animation/document.h"
#include "report/marks.h"

#include <limits>
#include <string>

// The parts that depend on frames. The sections are HTML, and empty where nothing is drawn or
// changes; `data` is the animation as JSON.
struct FilmSections {
    std::string animation;
    std::string outputs;
    std::string data;
};
// Stops computing after this many seconds, but not before the first frame.
FilmSections filmSections(Document const& document, long long frames,
                          double seconds = std::numeric_limits<double>::infinity());

// The parts that depend on the graph only, as HTML. `changes` is empty without marks, `attributes`
// where there are none.
struct GraphSections {
    std::string changes;
    std::string graph;
    std::string attributes;
};
GraphSections graphSections(tarn::engine::Patch const& root, Marks const* marks = nullptr);

// `fileName` is the heading; `frames` is the number of frames to compute. With `marks`, the changes
// are listed and marked in the graph.
std::string pageText(Document const& document, std::string const& fileName, long long frames,
                     Marks const* marks = nullptr);

#endif
