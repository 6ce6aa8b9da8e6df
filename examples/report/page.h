// The report: one HTML file with the graph, the animation, its outputs over time, the curves, the
// shapes and the attributes. It needs no network and no other file.
//
//     std::ofstream("report.html") << pageText(document, "animation.json", 120);

#ifndef REPORT_PAGE_H
#define REPORT_PAGE_H

#include "animation/document.h"
#include "report/marks.h"

#include <string>

// `fileName` is shown as the heading; `frames` are evaluated and played. Where there are `marks`,
// the changes are listed and marked in the graph.
std::string pageText(Document const& document, std::string const& fileName, long long frames,
                     Marks const* marks = nullptr);

#endif
