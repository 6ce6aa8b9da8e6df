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

// What follows from frames. The sections are HTML, and empty where nothing is drawn or changes over
// time; `data` is what they play, as JSON.
struct FilmSections {
    std::string animation;
    std::string outputs;
    std::string data;
};
// Ends with the frames that were computed after so many seconds, one at least.
FilmSections filmSections(Document const& document, long long frames,
                          double seconds = std::numeric_limits<double>::infinity());

// What follows from the graph alone, as HTML. `changes` is empty without marks, and `attributes`
// where there are none.
struct GraphSections {
    std::string changes;
    std::string graph;
    std::string attributes;
};
GraphSections graphSections(tarn::engine::Patch const& root, Marks const* marks = nullptr);

// `fileName` is shown as the heading; `frames` are evaluated and played. Where there are `marks`,
// the changes are listed and marked in the graph.
std::string pageText(Document const& document, std::string const& fileName, long long frames,
                     Marks const* marks = nullptr);

#endif
