// python/src/module.h: the parts of the module, each in its own source file.

#ifndef TARN_PYTHON_MODULE_H
#define TARN_PYTHON_MODULE_H

#include <pybind11/pybind11.h>

namespace tarn_python {

void defineValues(pybind11::module_& module);
void definePaths(pybind11::module_& module);
void defineEasing(pybind11::module_& module);
void defineGraphs(pybind11::module_& module);
void defineEdits(pybind11::module_& module);
void defineDocuments(pybind11::module_& module);

}  // namespace tarn_python

#endif
