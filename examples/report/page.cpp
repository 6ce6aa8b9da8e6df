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

std::string viewText(Bounds const& bounds) {
    return "viewBox=\"" + number(bounds.left) + " " + number(bounds.top) + " " +
           number(bounds.right - bounds.left) + " " + number(bounds.bottom - bounds.top) + "\"";
}

std::string dataText(Film const& film, Document const& document) {
    Json plots = Json::array();
    for (Plot const& plot : film.plots) plots.push_back(plot.texts);
    return jsonText({{"framesPerSecond", document.info.framesPerSecond},
                     {"texts", film.texts.json()},
                     {"frames", film.frames},
                     {"plots", plots}});
}

std::string animationText(Film const& film, long long frames) {
    if (film.bounds.isEmpty) return "";
    auto const shown = static_cast<long long>(film.frames.size());
    std::string cutShort;
    if (shown < frames) {
        cutShort = paragraph("The page keeps the first " + std::to_string(shown) + " of " +
                             std::to_string(frames) +
                             " frames: more would be too large, or take too long.");
    }
    return fillTemplate(page_files::kAnimationHtml, {{"VIEW", viewText(film.bounds)},
                                                     {"SCENE", scenePaths(film.first) + "\n"},
                                                     {"LAST_FRAME", std::to_string(shown - 1)},
                                                     {"CUT_SHORT", cutShort}});
}

std::string outputsText(Film const& film) {
    auto const shown = static_cast<long long>(film.frames.size());
    std::string plots;
    std::size_t constant = 0;
    for (std::size_t i = 0; i < film.plots.size(); ++i) {
        Plot const& plot = film.plots[i];
        if (isConstant(plot)) {
            ++constant;
        } else {
            plots += plotText(plot, i, shown, film.texts.at(plot.texts.front()));
        }
    }
    if (plots.empty()) return "";
    std::string const leftOut =
        counted(constant, "output that never changes", "outputs that never change");
    return fillTemplate(
        page_files::kOutputsHtml,
        {{"PLOTS", plots},
         {"CONSTANT", constant == 0 ? "" : paragraph("Not shown: " + leftOut + ".")}});
}

// Escapes everything that could end the script element.
std::string inScript(std::string const& json) {
    std::string text;
    for (char const c : json) text += c == '<' ? std::string("\\u003c") : std::string(1, c);
    return text;
}

}  // namespace

FilmSections filmSections(Document const& document, long long frames, double seconds) {
    Film const film = filmOf(document, frames, seconds);
    return {animationText(film, frames), outputsText(film), dataText(film, document)};
}

GraphSections graphSections(Patch const& root, Marks const* marks) {
    Patch const& shown = marks != nullptr ? marks->shown : root;
    std::string const levels = levelsText(shown, marks);
    std::string const changes = changesText(marks, levels);
    std::string const attributes = attributesText(root);
    GraphSections sections;
    sections.graph =
        fillTemplate(page_files::kGraphHtml, {{"LEGEND", legendText(shown)}, {"LEVELS", levels}});
    if (!changes.empty()) {
        sections.changes = fillTemplate(page_files::kChangesHtml, {{"CHANGES", changes}});
    }
    if (!attributes.empty()) {
        sections.attributes =
            fillTemplate(page_files::kAttributesHtml, {{"ATTRIBUTES", attributes}});
    }
    return sections;
}

std::string pageText(Document const& document, std::string const& fileName, long long frames,
                     Marks const* marks) {
    FilmSections const film = filmSections(document, frames);
    GraphSections const graph = graphSections(document.root, marks);
    return fillTemplate(page_files::kPageHtml, {{"TITLE", escaped(printable(fileName))},
                                                {"NAME", escaped(nameOf(document.root))},
                                                {"COUNTS", paragraphs(countsText(document))},
                                                {"GRAPH_CSS", page_files::kGraphCss},
                                                {"CSS", page_files::kPageCss},
                                                {"SCRIPT", page_files::kPageJs},
                                                {"CHANGES", graph.changes},
                                                {"ANIMATION", film.animation},
                                                {"GRAPH", graph.graph},
                                                {"OUTPUTS", film.outputs},
                                                {"CURVES", curvesText()},
                                                {"SHAPES", shapesText()},
                                                {"ATTRIBUTES", graph.attributes},
                                                {"DATA", inScript(film.data)}});
}
