#include "module.h"

#include <Engine/Base/version.h>

#include <exception>
#include <string>

namespace {

newfunc makeInstance = nullptr;

// pybind11's base class cannot be instantiated: pybind11 would throw through the interpreter.
PyObject* makeDerived(PyTypeObject* type, PyObject* arguments, PyObject* named) {
    if (!pybind11::detail::all_type_info(type).empty()) {
        return makeInstance(type, arguments, named);
    }
    PyErr_Format(PyExc_TypeError, "%s cannot be instantiated", type->tp_name);
    return nullptr;
}

}  // namespace

PYBIND11_MODULE(_native, module) {
    module.doc() = "Values, paths, curves and documents of a node-based animation tool.";
    module.attr("__version__") = std::to_string(TARN_ENGINE_BASE_VERSION_MAJOR) + "." +
                                 std::to_string(TARN_ENGINE_BASE_VERSION_MINOR) + "." +
                                 std::to_string(TARN_ENGINE_BASE_VERSION_PATCH);
    pybind11::register_local_exception_translator([](std::exception_ptr thrown) {
        try {
            std::rethrow_exception(thrown);
        } catch (pybind11::cast_error const&) {
            PyErr_SetString(PyExc_TypeError, "expected an object of another type");
        }
    });
    auto* const base =
        reinterpret_cast<PyTypeObject*>(pybind11::detail::get_internals().instance_base);
    makeInstance = base->tp_new;
    base->tp_new = makeDerived;
    tarn_python::defineValues(module);
    tarn_python::definePaths(module);
    tarn_python::defineEasing(module);
    tarn_python::defineGraphs(module);
    tarn_python::defineEdits(module);
    tarn_python::defineDocuments(module);
}
