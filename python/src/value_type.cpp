#include "value_type.h"

#include "conversions.h"

#include <functional>
#include <memory>
#include <new>

using namespace tarn::engine;

namespace tarn_python {

namespace {

// Translates C++ exceptions to Python exceptions.
template <class Function>
PyObject* raising(Function function) {
    try {
        return function();
    } catch (py::error_already_set& error) {
        error.restore();
    } catch (py::builtin_exception const& error) {
        error.set_error();
    } catch (std::bad_alloc const&) {
        PyErr_NoMemory();
    }
    return nullptr;
}

PyObject* allocate(PyTypeObject* type, Value value) {
    PyObject* const object = type->tp_alloc(type, 0);
    if (object == nullptr) throw py::error_already_set();
    new (&reinterpret_cast<ValueObject*>(object)->value) Value(std::move(value));
    return object;
}

// Value(), Value(x) and Value(value=x).
PyObject* make(PyTypeObject* type, PyObject* const* arguments, Py_ssize_t count,
               PyObject* keyword) {
    return raising([&]() -> PyObject* {
        if (count > 1) throw py::type_error("Value takes at most one argument");
        if (keyword != nullptr && PyUnicode_CompareWithASCIIString(keyword, "value") != 0) {
            throw py::type_error("the only keyword argument of Value is \"value\"");
        }
        return allocate(type, count == 0 ? Value() : toValue(*arguments));
    });
}

PyObject* callVector(PyObject* type, PyObject* const* arguments, std::size_t flags,
                     PyObject* names) {
    Py_ssize_t const named = names != nullptr ? PyTuple_GET_SIZE(names) : 0;
    return make(reinterpret_cast<PyTypeObject*>(type), arguments, PyVectorcall_NARGS(flags) + named,
                named != 0 ? PyTuple_GET_ITEM(names, 0) : nullptr);
}

// For subclasses in Python.
PyObject* callTuple(PyTypeObject* type, PyObject* arguments, PyObject* named) {
    PyObject* const* const items = PySequence_Fast_ITEMS(arguments);
    Py_ssize_t const count = PyTuple_GET_SIZE(arguments);
    if (named == nullptr || PyDict_GET_SIZE(named) == 0) return make(type, items, count, nullptr);
    PyObject* key = nullptr;
    PyObject* object = nullptr;
    Py_ssize_t position = 0;
    PyDict_Next(named, &position, &key, &object);
    return make(type, &object, count + PyDict_GET_SIZE(named), key);
}

void destroy(PyObject* object) {
    PyTypeObject* const type = Py_TYPE(object);
    std::destroy_at(&reinterpret_cast<ValueObject*>(object)->value);
    type->tp_free(object);
    Py_DECREF(type);
}

Py_hash_t hash(PyObject* object) {
    auto const bits = static_cast<Py_hash_t>(std::hash<Value>()(valueOf(object)));
    return bits == -1 ? -2 : bits;  // -1 signals an error.
}

PyObject* compare(PyObject* a, PyObject* b, int operation) {
    if ((operation != Py_EQ && operation != Py_NE) || !isValue(a) || !isValue(b)) {
        Py_RETURN_NOTIMPLEMENTED;
    }
    return PyBool_FromLong((valueOf(a) == valueOf(b)) == (operation == Py_EQ));
}

PyObject* asFloat(PyObject* object) { return PyFloat_FromDouble(double(valueOf(object))); }
PyObject* asInteger(PyObject* object) {
    return PyLong_FromLongLong(static_cast<long long>(valueOf(object)));
}
int asBool(PyObject* object) { return bool(valueOf(object)) ? 1 : 0; }

template <class Function>
void* slot(Function* function) {
    return reinterpret_cast<void*>(function);
}

PyTypeObject* makeType() {
    static char const* const documentation =
        "A value of one of the fourteen types. Immutable; every value converts to every type "
        "without an error.\n\n"
        "Value(value=0.0) is the value of a float, an int, a bool, a str, 2, 3 or 4 numbers (a "
        "vector), 4 rows of 4 numbers (a matrix), a Path, an Unstructured or a dict. Raises "
        "TypeError or ValueError for what is none of them, OverflowError for an int beyond 64 "
        "bits.";
    PyType_Slot slots[] = {{Py_tp_doc, const_cast<char*>(documentation)},
                           {Py_tp_new, slot(callTuple)},
                           {Py_tp_dealloc, slot(destroy)},
                           {Py_tp_hash, slot(hash)},
                           {Py_tp_richcompare, slot(compare)},
                           {Py_nb_float, slot(asFloat)},
                           {Py_nb_int, slot(asInteger)},
                           {Py_nb_bool, slot(asBool)},
                           {0, nullptr}};
    PyType_Spec layout = {"tarn_engine_base.Value", static_cast<int>(sizeof(ValueObject)), 0,
                          Py_TPFLAGS_DEFAULT | Py_TPFLAGS_BASETYPE, slots};
    PyObject* const made = PyType_FromSpec(&layout);
    if (made == nullptr) throw py::error_already_set();
    auto* const type = reinterpret_cast<PyTypeObject*>(made);
    type->tp_vectorcall = callVector;
    return type;
}

}  // namespace

PyTypeObject* valueType() {
    static PyTypeObject* const type = makeType();
    return type;
}

PyObject* newValue(Value value) { return allocate(valueType(), std::move(value)); }

}  // namespace tarn_python
