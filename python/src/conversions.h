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

/// Throws a Python exception.
[[noreturn]] void raise(PyObject* type, std::string const& sentence);

/// The name of the object's type, for messages.
std::string nameOfType(py::handle object);

/// Strings are UTF-8. Bytes that are none are lone surrogates in Python, as in the names of files.
/// Throws TypeError for what is neither a str nor bytes.
std::string toString(py::handle object);
py::str fromString(std::string const& text);

/// What an object is. Strings are no sequences here; arrays are.
bool isArray(py::handle object);
bool isMapping(py::handle object);
bool isSequence(py::handle object);
bool isInteger(py::handle object);
/// A real number, Python's or NumPy's.
bool isNumber(py::handle object);
tarn::engine::Optional<bool> ifBool(py::handle object);

/// Copies, which stay as they are while the elements are converted: that may run any program.
py::tuple copiedTuple(py::handle sequence);
py::dict copiedDict(py::handle mapping);

/// As `int`, exactly; as an identifier; as `float`. Throw TypeError for what is no integer, no
/// number, and OverflowError for what is no identifier.
py::object toIndex(py::handle object);
unsigned long long toUnsigned(py::handle object);
double toDouble(py::handle object);

/// The class `Unsigned`: an `int` that stands for the unsigned integers of data.
void defineUnsigned(py::module_& module);

/// Data from `None`, numbers, strings, sequences and mappings, of any depth. Throws a Python
/// exception for integers beyond 64 bits, for data that contains itself, and for anything else.
tarn::engine::Unstructured toData(py::handle object);
py::object fromData(tarn::engine::Unstructured const& data);

/// What `eval` reads back: there is no literal for floats that are not finite.
std::string reprOf(py::handle object);

/// Two, three or four numbers in a sequence; else nothing.
tarn::engine::Optional<std::vector<double>> ifVector(py::handle object);
/// Throws TypeError for anything but two numbers.
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

/// An object that was made without `__init__` raises TypeError where it is used: pybind11 would
/// have it stand for memory that nobody has written to. And an `__init__` that is called by what it
/// converts raises TypeError: pybind11 would make the object twice.
void guardInit(py::handle type);
template <class T>
void requireInit() {
    py::detail::get_type_info(typeid(T))->operator_new = [](std::size_t) -> void* {
        throw py::type_error("the object was never initialised: __init__ was not called");
    };
    guardInit(py::type::of<T>());
}

}  // namespace tarn_python

/// For the arguments of functions: pybind11's own would cut identifiers to integers, and hide what
/// a conversion raises.
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
