// The report of a document, for the playground.

#include "../src/graphs.h"
#include "../src/native.h"

#include "animation/labels.h"
#include "report/drawing.h"
#include "report/graphviz.h"
#include "report/marks.h"
#include "report/page.h"

#include <Engine/Base/patch_index.h>

#include <optional>
#include <string>

using namespace tarn::engine;
using emscripten::val;

// In a browser, JavaScript computes the layout (layout.js).
std::optional<std::string> answerOfDot(std::string const& text) {
    val const answer = val::module_property("answerOfDot")(text);
    if (answer.isNull()) return std::nullopt;
    return answer.as<std::string>();
}

namespace web {

namespace {

Document documentOf(Address root, double framesPerSecond) {
    Document document{patchAt(root), {}};
    document.info.framesPerSecond = framesPerSecond;
    return document;
}

val film(Address root, double framesPerSecond, double frames, double seconds) {
    FilmSections const sections =
        filmSections(documentOf(root, framesPerSecond), static_cast<long long>(frames), seconds);
    val answer = val::object();
    answer.set("animation", bytesOf(sections.animation));
    answer.set("outputs", bytesOf(sections.outputs));
    answer.set("data", bytesOf(sections.data));
    return answer;
}

val answerOf(GraphSections const& sections) {
    val answer = val::object();
    answer.set("changes", bytesOf(sections.changes));
    answer.set("graph", bytesOf(sections.graph));
    answer.set("attributes", bytesOf(sections.attributes));
    return answer;
}
val graph(Address root) { return answerOf(graphSections(patchAt(root))); }
// With the changes since `before`.
val comparedGraph(Address root, double framesPerSecond, Address before,
                  double framesPerSecondBefore) {
    Document const from = documentOf(before, framesPerSecondBefore);
    Document const to = documentOf(root, framesPerSecond);
    Marks const marks = marksOf(from, to);
    return answerOf(graphSections(to.root, &marks));
}

// The description of an input in the graph, as JSON; null where there is none.
val input(Address root, unsigned low, unsigned high) {
    PatchIndex const index(patchAt(root));
    Port const* const port = index.findInputPort(idOf(low, high));
    Json parts;
    if (port != nullptr) parts = Drawing(patchAt(root)).describe(*port, true);
    return bytesOf(jsonText(parts));
}

val counts(Address root) { return bytesOf(countsText(documentOf(root, 0.0))); }

}  // namespace

EMSCRIPTEN_BINDINGS(report) {
    native<&film>("reportFilm");
    native<&graph>("reportGraph");
    native<&comparedGraph>("reportComparedGraph");
    native<&input>("reportInput");
    native<&counts>("reportCounts");
}

}  // namespace web
