// The other sections of a page, as HTML.
//
//     std::string const section = curvesText();

#ifndef REPORT_SECTIONS_H
#define REPORT_SECTIONS_H

#include "report/marks.h"

#include <Engine/Base/patch.h>

#include <string>

// A figure for each level of the graph, each in that of the level around it; with what is marked,
// where there are `marks`.
std::string levelsText(tarn::engine::Patch const& root, Marks const* marks);

// The types of all ports, as the items of a list.
std::string legendText(tarn::engine::Patch const& root);

// All easing functions, and a shape of each kind with its elements.
std::string curvesText();
std::string shapesText();

// The attributes of all patches and ports, as trees; empty where there are none.
std::string attributesText(tarn::engine::Patch const& root);

// The changes, each leading to its patch in `levels` or, where that is not drawn, to the level
// that it is in. Empty without `marks`.
std::string changesText(Marks const* marks, std::string const& levels);

#endif
