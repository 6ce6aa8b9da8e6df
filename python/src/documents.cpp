// Reading and writing documents.

#include "casters.h"
#include "conversions.h"
#include "module.h"

#include <Engine/Document/document.h>

#include <pybind11/stl.h>

#include <sstream>
#include <string>
#include <utility>

using namespace tarn::engine;

namespace tarn_python {

namespace {

py::handle& errorClass() {
    static py::handle found;
    return found;
}

// `file` is the name of the document's file, or empty.
[[noreturn]] void raiseDocumentError(DocumentError const& error, std::string const& file) {
    std::ostringstream line;
    if (!file.empty()) line << file << ": ";
    line << error;
    py::object const raised = errorClass()(fromString(line.str()));
    raised.attr("message") = fromString(error.message);
    raised.attr("pointer") = fromString(error.pointer);
    raised.attr("line") = error.line;
    raised.attr("column") = error.column;
    raised.attr("file") = fromString(file);
    PyErr_SetObject(errorClass().ptr(), raised.ptr());
    throw py::error_already_set();
}

std::string fileName(py::object const& file) {
    std::string name = toString(py::module_::import("os").attr("fspath")(file));
    if (name.find('\0') != std::string::npos) raise(PyExc_ValueError, "embedded null character");
    return name;
}

struct Document {
    Patch root;
    DocumentInfo info;
};

Document read(std::string const& text, std::string const& file) {
    DocumentError error;
    DocumentInfo info;
    Optional<Patch> root;
    {
        py::gil_scoped_release const released;
        root = readDocument(text, &error, &info);
    }
    if (!root) raiseDocumentError(error, file);
    return {*std::move(root), std::move(info)};
}

Document fromText(py::object const& text) {
    if (PyByteArray_Check(text.ptr())) return read(py::bytes(text), "");
    return read(toString(text), "");
}

// Reads the file with Python, which raises its usual exceptions.
Document fromFile(py::object const& file) {
    std::string const name = fileName(file);
    py::object const opened = py::module_::import("io").attr("open")(file, "rb");
    py::object const bytes = opened.attr("read")();
    opened.attr("close")();
    return read(bytes.cast<std::string>(), name);
}

py::tuple pairOf(Document document) {
    return py::make_tuple(std::move(document.root), std::move(document.info));
}

void defineError(py::module_& module) {
    py::dict members;
    members["__module__"] = "tarn_engine_base";
    members["__doc__"] =
        "A document that cannot be read: `message`, where it is (`pointer`, a JSON pointer), "
        "`line` and `column`, from 1, and `file`, its name or an empty string.";
    py::object const type =
        py::reinterpret_borrow<py::object>(reinterpret_cast<PyObject*>(&PyType_Type));
    py::object made =
        type("DocumentError", py::make_tuple(py::reinterpret_borrow<py::object>(PyExc_ValueError)),
             members);
    module.attr("DocumentError") = made;
    errorClass() = made.release();
}

void defineInfo(py::module_& module) {
    defineEnumeration<DocumentInfo::Form>(
        module, "DocumentForm", "The forms that are read.",
        {{"OWN", DocumentInfo::Form::Own}, {"NODE_GRAPH", DocumentInfo::Form::NodeGraph}});
    py::class_<DocumentInfo>(
        module, "DocumentInfo",
        "What a document has in addition to its graph, and what reading it changed.")
        .def_readonly("form", &DocumentInfo::form, "A DocumentForm.")
        .def_readonly("frames_per_second", &DocumentInfo::framesPerSecond, "Above 0.")
        .def_readonly("renumbered_nodes", &DocumentInfo::renumberedNodes,
                      "The number of nodes of a node graph that got another identifier.")
        .def_readonly(
            "omitted_links", &DocumentInfo::omittedLinks,
            "The number of links of a node graph that were left out because an end does not exist.")
        .def_readonly("unused_definitions", &DocumentInfo::unusedDefinitions,
                      "The number of shared definitions of a node graph that no node uses.")
        .def_readonly("notes", &DocumentInfo::notes,
                      "The first hundred of those links, a line each.")
        .def("summary", &DocumentInfo::summary, "The counts in one line; empty where all are 0.");
    requireInit<DocumentInfo>();
}

}  // namespace

void defineDocuments(py::module_& module) {
    defineError(module);
    defineInfo(module);
    module.def(
        "read_document", [](py::object const& text) { return fromText(text).root; },
        py::arg("text"),
        "The graph of a document in our own format, or of a browser-based node editor's export, in "
        "a "
        "str or bytes. Raises DocumentError.");
    module.def(
        "read_document_with_info", [](py::object const& text) { return pairOf(fromText(text)); },
        py::arg("text"), "The graph, and a DocumentInfo.");
    module.def(
        "load_document", [](py::object const& file) { return fromFile(file).root; },
        py::arg("file"),
        "The graph of a file. Raises DocumentError, or OSError where it cannot be read.");
    module.def(
        "load_document_with_info", [](py::object const& file) { return pairOf(fromFile(file)); },
        py::arg("file"), "The graph of a file, and a DocumentInfo.");
    module.def(
        "write_document",
        [](Patch const& root, double framesPerSecond) {
            return fromString(writeDocument(root, framesPerSecond));
        },
        py::arg("root"), py::arg("frames_per_second") = 60.0,
        "The document in our own format; equal graphs give equal strings.");
    module.def(
        "save_document",
        [](py::object const& file, Patch root, double framesPerSecond) {
            std::string const name = fileName(file);
            DocumentError error;
            bool saved = false;
            {
                py::gil_scoped_release const released;
                saved = saveDocument(name, root, framesPerSecond, &error);
            }
            if (saved) return;
            raise(PyExc_OSError, name + ": " + error.message);
        },
        py::arg("file"), py::arg("root"), py::arg("frames_per_second") = 60.0,
        "Replaces the file atomically: readers see the old or the new content. "
        "Raises OSError on failure and leaves the file unchanged.");
    module.def("kind_to_string", &kindToString, py::arg("builtin"),
               "The name of a built-in kind, or an empty string.");
    module.def(
        "string_to_kind",
        [](std::string const& name) -> py::object {
            Optional<unsigned long long> const kind = stringToKind(name);
            return kind ? py::cast(*kind) : py::object(py::none());
        },
        py::arg("name"), "The number of the built-in kind of that name, or None.");
}

}  // namespace tarn_python
