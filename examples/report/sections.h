// The other sections of a page, as HTML.
//
//     std::string const section = curvesText();

#ifndef REPORT_SECTIONS_H
#define REPORT_SECTIONS_H

#include "report/marks.h"

#include <Engine/Base/patch.h>

#include <string>

// A figure for each level of the graph, nested like the levels; marked where `marks` are given.
std::string levelsText(tarn::engine::Patch const& root, Marks const* marks);

// The types of all ports as list items.
std::string legendText(tarn::engine::Patch const& root);

// All easing functions, and an example of each shape with its elements.
std::string curvesText();
std::string shapesText();

// The attributes of all patches and ports as trees; empty where there are none.
std::string attributesText(tarn::engine::Patch const& root);

// The changes, each with a link to its patch in `levels` or, where that is not drawn, to its level.
// Empty without `marks`.
std::string changesText(Marks const* marks, std::string const& levels);

#endif
