// python/src/value_type.h: the Python type of values. It is not a pybind11 class: those take five
// times as long to construct, and programs construct a value for every number.
//
//     if (isValue(object)) return valueOf(object);
//     py::object made = py::cast(Value(2.5));

#ifndef TARN_PYTHON_VALUE_TYPE_H
#define TARN_PYTHON_VALUE_TYPE_H

#include <Engine/Base/value.h>

#include <pybind11/pybind11.h>

#include <utility>

namespace tarn_python {

struct ValueObject {
    PyObject_HEAD tarn::engine::Value value;
};

/// The type without the methods that are defined with pybind11. Lives as long as the process.
PyTypeObject* valueType();

inline bool isValue(pybind11::handle object) {
    return PyObject_TypeCheck(object.ptr(), valueType());
}
/// The value of such an object.
inline tarn::engine::Value const& valueOf(pybind11::handle object) {
    return reinterpret_cast<ValueObject*>(object.ptr())->value;
}
/// Makes a new object.
PyObject* newValue(tarn::engine::Value value);

}  // namespace tarn_python

/// Lets functions of the module take and return values.
template <>
struct pybind11::detail::type_caster<tarn::engine::Value> {
    static constexpr auto name = const_name("tarn_engine_base.Value");
    template <class>
    using cast_op_type = tarn::engine::Value const&;

    bool load(handle source, bool) {
        if (!tarn_python::isValue(source)) return false;
        object = source;
        return true;
    }
    static handle cast(tarn::engine::Value value, return_value_policy, handle) {
        return tarn_python::newValue(std::move(value));
    }
    operator tarn::engine::Value const&() { return tarn_python::valueOf(object); }

    handle object;
};

#endif
