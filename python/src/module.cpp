#include "module.h"

#include <Engine/Base/version.h>

#include <string>

PYBIND11_MODULE(_native, module) {
    module.doc() = "Values, paths, curves and documents of a node-based animation tool.";
    module.attr("__version__") = std::to_string(TARN_ENGINE_BASE_VERSION_MAJOR) + "." +
                                 std::to_string(TARN_ENGINE_BASE_VERSION_MINOR) + "." +
                                 std::to_string(TARN_ENGINE_BASE_VERSION_PATCH);
    tarn_python::defineValues(module);
    tarn_python::definePaths(module);
    tarn_python::defineEasing(module);
    tarn_python::defineGraphs(module);
    tarn_python::defineEdits(module);
    tarn_python::defineDocuments(module);
}
