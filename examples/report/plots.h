// Draws the values of an output over time.
//
//     std::string const section = plotText(film.plots[0], 0, 120, "0.5");

#ifndef REPORT_PLOTS_H
#define REPORT_PLOTS_H

#include "report/film.h"

#include <cstddef>
#include <string>

// `position` is the index of the plot in the film; `firstText` is the value in frame 0.
std::string plotText(Plot const& plot, std::size_t position, long long frames,
                     std::string const& firstText);

#endif
