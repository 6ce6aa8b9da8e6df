// python/src/conversions.h: converts between Python objects and the library's types.
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

/// Throws a Python exception.
[[noreturn]] void raise(PyObject* type, std::string const& sentence);

/// The name of the object's type, for messages.
std::string nameOfType(py::handle object);

/// Strings are UTF-8. Invalid bytes are lone surrogates in Python, as in file names. Throws
/// TypeError for objects that are neither str nor bytes.
std::string toString(py::handle object);
py::str fromString(std::string const& text);

/// The kind of an object. Strings do not count as sequences; arrays do.
bool isArray(py::handle object);
bool isMapping(py::handle object);
bool isSequence(py::handle object);
bool isInteger(py::handle object);
/// A real number, of Python or NumPy.
bool isNumber(py::handle object);
tarn::engine::Optional<bool> ifBool(py::handle object);

/// Copies, since converting the elements may run any code.
py::tuple copiedTuple(py::handle sequence);
py::dict copiedDict(py::handle mapping);

/// Converts to an exact integer, an identifier or a float. Throws TypeError for other types, and
/// OverflowError for integers out of range.
py::object toIndex(py::handle object);
unsigned long long toUnsigned(py::handle object);
double toDouble(py::handle object);

/// The class `Unsigned`: an `int` that represents the unsigned integers of unstructured data.
void defineUnsigned(py::module_& module);

/// Converts `None`, numbers, strings, sequences and mappings of any depth. Throws a Python
/// exception for integers beyond 64 bits, for data that contains itself, and for other types.
tarn::engine::Unstructured toData(py::handle object);
py::object fromData(tarn::engine::Unstructured const& data);

/// An expression for `eval`: non-finite floats have no literal.
std::string reprOf(py::handle object);

/// Two, three or four numbers in a sequence; otherwise empty.
tarn::engine::Optional<std::vector<double>> ifVector(py::handle object);
/// Throws TypeError for anything but two numbers.
tarn::engine::FloatVec2 toVec2(py::handle object);
py::tuple fromVector(tarn::engine::FloatVec2 const& v);
py::tuple fromVector(tarn::engine::FloatVec3 const& v);
py::tuple fromVector(tarn::engine::FloatVec4 const& v);
/// An array of four rows.
py::array_t<double> fromMatrix(tarn::engine::FloatMat4 const& matrix);

/// What `Value(object)` makes in Python: a value of the corresponding type.
tarn::engine::Value toValue(py::handle object);
/// The object that `toValue` converts to an equal value; none for a resource.
py::object payloadOf(tarn::engine::Value const& value);

/// Objects made without `__init__` raise TypeError when used: pybind11 would use uninitialised
/// memory. An `__init__` that calls itself while converting its argument raises TypeError too:
/// pybind11 would construct the object twice.
void guardInit(py::handle type);
template <class T>
void requireInit() {
    py::detail::get_type_info(typeid(T))->operator_new = [](std::size_t) -> void* {
        throw py::type_error("the object was never initialised: __init__ was not called");
    };
    guardInit(py::type::of<T>());
}

}  // namespace tarn_python

/// For function arguments: pybind11's casters would truncate identifiers and hide exceptions of
/// conversions.
template <>
struct pybind11::detail::type_caster<double> {
    PYBIND11_TYPE_CASTER(double, const_name("float"));
    bool load(handle object, bool) {
        value = tarn_python::toDouble(object);
        return true;
    }
    static handle cast(double number, return_value_policy, handle) {
        return PyFloat_FromDouble(number);
    }
};
template <>
struct pybind11::detail::type_caster<unsigned long long> {
    PYBIND11_TYPE_CASTER(unsigned long long, const_name("int"));
    bool load(handle object, bool) {
        value = tarn_python::toUnsigned(object);
        return true;
    }
    static handle cast(unsigned long long number, return_value_policy, handle) {
        return PyLong_FromUnsignedLongLong(number);
    }
};

#endif
