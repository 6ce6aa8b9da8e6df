// python/src/conversions.h: what Python's objects become here, and the other way round.
//
//     Value value = toValue(object);
//     py::object data = fromData(value.asUnstructured());

#ifndef TARN_PYTHON_CONVERSIONS_H
#define TARN_PYTHON_CONVERSIONS_H

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <pybind11/numpy.h>
#include <pybind11/pybind11.h>

#include <cstddef>
#include <memory>
#include <string>
#include <typeinfo>
#include <vector>

namespace tarn_python {

namespace py = pybind11;

/// Strings are UTF-8. Bytes that are none are lone surrogates in Python, as in the names of files.
std::string toString(py::handle object);
py::str fromString(std::string const& text);

/// A subclass of `int` that stands for the unsigned integers of data.
py::object unsignedClass();
void defineUnsigned(py::module_& module);

/// Data from `None`, numbers, strings, sequences and mappings, of any depth. Throws a Python
/// exception for integers beyond 64 bits, for data that contains itself, and for anything else.
tarn::engine::Unstructured toData(py::handle object);
py::object fromData(tarn::engine::Unstructured const& data);

/// Throws TypeError for what is no number.
double toDouble(py::handle object);
/// Two, three or four numbers as a tuple, a list or an array.
bool isVector(py::handle object);
std::vector<double> toNumbers(py::handle object);
tarn::engine::FloatVec2 toVec2(py::handle object);
py::tuple fromVector(tarn::engine::FloatVec2 const& v);
py::tuple fromVector(tarn::engine::FloatVec3 const& v);
py::tuple fromVector(tarn::engine::FloatVec4 const& v);
/// An array of four rows.
py::array_t<double> fromMatrix(tarn::engine::FloatMat4 const& matrix);

/// What `Value(object)` makes in Python: a value of the object's own type.
tarn::engine::Value toValue(py::handle object);
/// The object that `toValue` makes an equal value of; none for a resource.
py::object payloadOf(tarn::engine::Value const& value);

std::string nameOfType(py::handle object);

/// An object that was made without `__init__` raises TypeError where it is used. pybind11 would
/// have it stand for memory that nobody has written to.
template <class T>
void requireInit() {
    py::detail::get_type_info(typeid(T))->operator_new = [](std::size_t) -> void* {
        throw py::type_error("the object was never initialised: __init__ was not called");
    };
}

}  // namespace tarn_python

#endif
