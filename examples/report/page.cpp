#include "report/page.h"

#include "animation/labels.h"
#include "animation/markup.h"
#include "page_files.h"
#include "report/film.h"
#include "report/plots.h"
#include "report/sections.h"
#include "report/template.h"

#include <sstream>

using namespace tarn::engine;

namespace {

std::string paragraphs(std::string const& lines) {
    std::istringstream stream(lines);
    std::string text;
    for (std::string line; std::getline(stream, line);) text += paragraph(line);
    return text;
}

std::string stageText(Film const& film) {
    if (film.bounds.isEmpty) return "";
    Bounds const& bounds = film.bounds;
    return "viewBox=\"" + number(bounds.left) + " " + number(bounds.top) + " " +
           number(bounds.right - bounds.left) + " " + number(bounds.bottom - bounds.top) + "\"";
}

std::string dataText(Film const& film, Document const& document) {
    Json plots = Json::array();
    for (Plot const& plot : film.plots) plots.push_back(plot.texts);
    Json const data = {{"framesPerSecond", document.info.framesPerSecond},
                       {"texts", film.texts.json()},
                       {"frames", film.frames},
                       {"plots", plots}};
    std::string const json = jsonText(data);
    // Nothing in it may look like the end of the element that it stands in.
    std::string text;
    for (char const c : json) text += c == '<' ? std::string("\\u003c") : std::string(1, c);
    return text;
}

}  // namespace

std::string pageText(Document const& document, std::string const& fileName, long long frames,
                     Marks const* marks) {
    Film const film = filmOf(document, frames);
    auto const shown = static_cast<long long>(film.frames.size());
    std::ostringstream plots;
    std::size_t constant = 0;
    for (std::size_t i = 0; i < film.plots.size(); ++i) {
        Plot const& plot = film.plots[i];
        if (isConstant(plot)) {
            ++constant;
        } else {
            plots << plotText(plot, i, shown, film.texts.at(plot.texts.front()));
        }
    }
    std::string const levels = levelsText(marks != nullptr ? marks->shown : document.root, marks);
    std::string const name = escaped(printable(fileName));
    return fillTemplate(
        page_files::kPageHtml,
        {{"TITLE", name},
         {"NAME", escaped(nameOf(document.root))},
         {"COUNTS", paragraphs(countsText(document))},
         {"GRAPH_CSS", page_files::kGraphCss},
         {"CSS", page_files::kPageCss},
         {"SCRIPT", page_files::kPageJs},
         {"CHANGES", changesText(marks, levels)},
         {"VIEW", stageText(film)},
         {"SCENE", film.bounds.isEmpty ? "" : scenePaths(film.first) + "\n"},
         {"LAST_FRAME", std::to_string(shown - 1)},
         {"CUT_SHORT",
          shown == frames
              ? ""
              : paragraph("The page keeps the first " + std::to_string(shown) + " of " +
                          std::to_string(frames) + " frames: more would be too large.")},
         {"LEGEND", legendText(marks != nullptr ? marks->shown : document.root)},
         {"LEVELS", levels},
         {"PLOTS", plots.str()},
         {"CONSTANT", constant == 0 ? ""
                                    : paragraph("Not shown: " +
                                                counted(constant, "output that never changes",
                                                        "outputs that never change") +
                                                ".")},
         {"CURVES", curvesText()},
         {"SHAPES", shapesText()},
         {"ATTRIBUTES", attributesText(document.root)},
         {"DATA", dataText(film, document)}});
}
