// Documents, their evaluation and drawing.

#include "graphs.h"
#include "native.h"
#include "wire.h"

#include "animation/evaluator.h"
#include "animation/scene.h"

#include <Engine/Base/patch_index.h>
#include <Engine/Document/document.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <utility>
#include <vector>

using namespace tarn::engine;
using emscripten::val;

namespace web {

namespace {

val errorOf(DocumentError const& error) {
    val object = val::object();
    object.set("message", bytesOf(error.message));
    object.set("pointer", bytesOf(error.pointer));
    object.set("line", static_cast<double>(error.line));
    object.set("column", static_cast<double>(error.column));
    return object;
}

// Returns {root, info} or {error}.
val read(std::string const& text) {
    val answer = val::object();
    DocumentError error;
    DocumentInfo info;
    Optional<Patch> root = readDocument(text, &error, &info);
    if (root) error.message = whatIsNotShown(*root);
    if (!root || !error.message.empty()) {
        answer.set("error", errorOf(error));
        return answer;
    }
    val notes = val::array();
    for (std::string const& note : info.notes) notes.call<void>("push", bytesOf(note));
    val about = val::object();
    about.set("form", int(info.form));
    about.set("framesPerSecond", info.framesPerSecond);
    about.set("renumberedNodes", static_cast<double>(info.renumberedNodes));
    about.set("omittedLinks", static_cast<double>(info.omittedLinks));
    about.set("unusedDefinitions", static_cast<double>(info.unusedDefinitions));
    about.set("notes", notes);
    about.set("summary", bytesOf(info.summary()));
    answer.set("info", about);
    answer.set("root", Root(std::move(*root)));
    return answer;
}
val write(Address root, double framesPerSecond) {
    return bytesOf(writeDocument(patchAt(root), framesPerSecond));
}
std::string kindName(unsigned low, unsigned high) { return kindToString(idOf(low, high)); }
val kindOfName(std::string const& name) {
    Optional<unsigned long long> const kind = stringToKind(name);
    return kind ? val(std::to_string(*kind)) : val::null();
}

// A document with its evaluator, which refers to the document.
struct Evaluation {
    Evaluation(Patch root, DocumentInfo info)
        : document{std::move(root), std::move(info)},
          evaluator(document),
          scene(document, evaluator.root()),
          index(evaluator.root()) {}

    Document document;
    Evaluator evaluator;
    Scene scene;
    EvalPatchIndex index;
};
struct EvaluationHandle {
    std::shared_ptr<Evaluation> held;
};

std::string notShown(Address root) { return whatIsNotShown(patchAt(root)); }
EvaluationHandle makeEvaluator(Address root, double framesPerSecond) {
    DocumentInfo info;
    info.framesPerSecond = framesPerSecond;
    return {std::make_shared<Evaluation>(patchAt(root), std::move(info))};
}
void evaluate(EvaluationHandle& evaluation, double frame) {
    evaluation.held->evaluator.evaluate(static_cast<long long>(frame));
}
val portValues(EvaluationHandle const& evaluation, bool isInput, unsigned low, unsigned high) {
    EvalPatchIndex const& index = evaluation.held->index;
    unsigned long long const id = idOf(low, high);
    EvalPort const* const port = isInput ? index.findInputPort(id) : index.findOutputPort(id);
    if (port == nullptr) return val::null();
    Writer out;
    out.count(port->values.size());
    for (Value const& value : port->values) out.value(value);
    return bytesOf(out.bytes);
}
val drawn(EvaluationHandle const& evaluation) {
    val list = val::array();
    for (Drawn const& outline : evaluation.held->scene.now()) {
        val object = val::object();
        object.set("name", bytesOf(outline.name));
        object.set("path", bytesOf(Writer().path(outline.path).bytes));
        object.set("svgPathData", outline.data);
        object.set("isLayer", outline.isLayer);
        object.set("color", bytesOf(Writer().value(outline.color).bytes));
        object.set("width", outline.width);
        list.call<void>("push", object);
    }
    return list;
}

}  // namespace

EMSCRIPTEN_BINDINGS(documents) {
    emscripten::class_<EvaluationHandle>("Evaluation");
    native<&read>("readDocument");
    native<&write>("writeDocument");
    native<&kindName>("kindToString");
    native<&kindOfName>("stringToKind");
    native<&notShown>("whatIsNotShown");
    native<&makeEvaluator>("makeEvaluator");
    native<&evaluate>("evaluate");
    native<&portValues>("portValues");
    native<&drawn>("drawn");
}

}  // namespace web
