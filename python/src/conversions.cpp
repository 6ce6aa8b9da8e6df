#include "conversions.h"

#include "value_type.h"

#include <algorithm>
#include <iterator>
#include <unordered_set>
#include <utility>

using namespace tarn::engine;

namespace tarn_python {

void raise(PyObject* type, std::string const& sentence) {
    PyErr_SetObject(type, fromString(sentence).ptr());
    throw py::error_already_set();
}

std::string nameOfType(py::handle object) {
    return toString(py::type::handle_of(object).attr("__name__"));
}

bool isArray(py::handle object) { return py::isinstance<py::array>(object); }

bool isMapping(py::handle object) {
    return PyDict_Check(object.ptr()) || Py_TYPE(object.ptr()) == &PyDictProxy_Type;
}

bool isSequence(py::handle object) {
    PyObject* const o = object.ptr();
    return PyList_Check(o) || PyTuple_Check(o) || isArray(object) ||
           (PySequence_Check(o) != 0 && !PyUnicode_Check(o) && !PyBytes_Check(o) &&
            !PyByteArray_Check(o) && !isMapping(object));
}

py::tuple copiedTuple(py::handle sequence) {
    py::object copy = py::reinterpret_steal<py::object>(PySequence_Tuple(sequence.ptr()));
    if (!copy) throw py::error_already_set();
    return copy;
}

py::dict copiedDict(py::handle mapping) {
    py::handle const type(reinterpret_cast<PyObject*>(&PyDict_Type));
    return type(mapping);
}

Optional<bool> ifBool(py::handle object) {
    static py::handle const numpyBool =
        py::object(py::module_::import("numpy").attr("bool_")).release();
    if (PyBool_Check(object.ptr())) return object.ptr() == Py_True;
    if (Py_TYPE(object.ptr()) != reinterpret_cast<PyTypeObject*>(numpyBool.ptr())) return {};
    return PyObject_IsTrue(object.ptr()) == 1;
}

bool isInteger(py::handle object) { return PyIndex_Check(object.ptr()) != 0; }

bool isNumber(py::handle object) {
    if (PyFloat_Check(object.ptr()) || PyLong_Check(object.ptr())) return true;
    if (isArray(object)) return false;
    if (isInteger(object)) return true;
    // NumPy's scalar types of real numbers.
    return py::hasattr(object, "dtype") && !py::hasattr(object, "__len__") &&
           toString(py::str(object.attr("dtype").attr("kind"))) == "f";
}

double toDouble(py::handle object) {
    double const number = PyFloat_AsDouble(object.ptr());
    if (number == -1.0 && PyErr_Occurred()) throw py::error_already_set();
    return number;
}

py::object toIndex(py::handle object) {
    py::object index = py::reinterpret_steal<py::object>(PyNumber_Index(object.ptr()));
    if (!index) throw py::error_already_set();
    return index;
}

std::string toString(py::handle object) {
    if (PyBytes_Check(object.ptr())) return object.cast<std::string>();
    if (!PyUnicode_Check(object.ptr())) {
        raise(PyExc_TypeError, "expected a string, not " + nameOfType(object));
    }
    py::object const bytes = py::reinterpret_steal<py::object>(
        PyUnicode_AsEncodedString(object.ptr(), "utf-8", "surrogateescape"));
    if (!bytes) throw py::error_already_set();
    return bytes.cast<std::string>();
}

py::str fromString(std::string const& text) {
    PyObject* const made =
        PyUnicode_DecodeUTF8(text.data(), static_cast<Py_ssize_t>(text.size()), "surrogateescape");
    if (made == nullptr) throw py::error_already_set();
    return py::reinterpret_steal<py::str>(made);
}

Optional<std::vector<double>> ifVector(py::handle object) {
    if (!isSequence(object)) return {};
    py::ssize_t const size = PySequence_Size(object.ptr());
    if (size < 0) throw py::error_already_set();
    if (size < 2 || size > 4) return {};
    // A copy: converting an element may change the list.
    py::tuple const elements = copiedTuple(object);
    if (elements.size() < 2 || elements.size() > 4) return {};
    std::vector<double> numbers;
    for (py::handle const element : elements) {
        if (!isNumber(element)) return {};
        numbers.push_back(toDouble(element));
    }
    return numbers;
}

FloatVec2 toVec2(py::handle object) {
    Optional<std::vector<double>> const numbers = ifVector(object);
    if (!numbers || numbers->size() != 2) {
        raise(PyExc_TypeError, "expected two numbers, as in (1.0, 2.0)");
    }
    return {(*numbers)[0], (*numbers)[1]};
}

py::tuple fromVector(FloatVec2 const& v) { return py::make_tuple(v.x, v.y); }
py::tuple fromVector(FloatVec3 const& v) { return py::make_tuple(v.x, v.y, v.z); }
py::tuple fromVector(FloatVec4 const& v) { return py::make_tuple(v.x, v.y, v.z, v.w); }

py::array_t<double> fromMatrix(FloatMat4 const& matrix) {
    py::array_t<double> array({4, 4});
    std::copy(std::begin(matrix.elements), std::end(matrix.elements), array.mutable_data());
    return array;
}

void guardInit(py::handle type) {
    if (!type.attr("__dict__").contains("__init__")) return;
    py::object const init = type.attr("__init__");
    py::object const guarded = py::cpp_function(
        [init](py::object const& self, py::args const& arguments, py::kwargs const& named) {
            static std::unordered_set<PyObject*> running;
            if (!running.insert(self.ptr()).second) {
                throw py::type_error("__init__ was called again by its argument");
            }
            struct Done {
                PyObject* object;
                ~Done() { running.erase(object); }
            } const done{self.ptr()};
            init(self, *arguments, **named);
        },
        py::is_method(type), toString(init.attr("__doc__")).c_str());
    type.attr("__init__") = guarded;
}

unsigned long long toUnsigned(py::handle object) {
    std::string const wanted = "expected an integer from 0 to 2**64 - 1";
    if (!isInteger(object)) raise(PyExc_TypeError, wanted + ", not " + nameOfType(object));
    py::object const index = toIndex(object);
    unsigned long long const number = PyLong_AsUnsignedLongLong(index.ptr());
    if (PyErr_Occurred()) {
        PyErr_Clear();
        raise(PyExc_OverflowError, wanted);
    }
    return number;
}

namespace {

long long toInteger(py::handle object) {
    py::object const index = toIndex(object);
    int overflow = 0;
    long long const integer = PyLong_AsLongLongAndOverflow(index.ptr(), &overflow);
    if (overflow != 0) raise(PyExc_OverflowError, "the integer does not fit into 64 bits");
    return integer;
}

// Four rows of four numbers.
Optional<FloatMat4> ifMatrix(py::handle object) {
    if (!isSequence(object) || py::len_hint(object) != 4) return {};
    FloatMat4 matrix;
    py::tuple const rows = copiedTuple(object);
    if (rows.size() != 4) return {};
    for (std::size_t i = 0; i < 4; ++i) {
        Optional<std::vector<double>> const row = ifVector(rows[i]);
        if (!row || row->size() != 4) return {};
        std::copy(row->begin(), row->end(), matrix.elements + 4 * i);
    }
    return matrix;
}

Value fromNumbers(std::vector<double> const& v) {
    if (v.size() == 2) return FloatVec2{v[0], v[1]};
    if (v.size() == 3) return FloatVec3{v[0], v[1], v[2]};
    return FloatVec4{v[0], v[1], v[2], v[3]};
}

}  // namespace

Value toValue(py::handle object) {
    if (PyFloat_Check(object.ptr())) return PyFloat_AS_DOUBLE(object.ptr());
    if (isValue(object)) return valueOf(object);
    if (Optional<bool> const truth = ifBool(object)) return *truth;
    if (isArray(object) && py::len(object.attr("shape")) == 0) {
        py::object const item = object.attr("item")();
        if (!isArray(item)) return toValue(item);
    }
    if (isNumber(object))
        return isInteger(object) ? Value(toInteger(object)) : Value(toDouble(object));
    if (py::isinstance<py::str>(object)) return Value(toString(object));
    if (py::isinstance<Path>(object)) {
        object.cast<Path const&>();  // Throws for a path whose `__init__` was not called.
        return Value(std::shared_ptr<Path const>(object.cast<std::shared_ptr<Path>>()));
    }
    if (py::isinstance<Unstructured>(object)) return Value(object.cast<Unstructured const&>());
    if (isMapping(object)) return Value(toData(object));
    if (Optional<std::vector<double>> const numbers = ifVector(object))
        return fromNumbers(*numbers);
    if (Optional<FloatMat4> const matrix = ifMatrix(object)) return *matrix;
    if (isSequence(object)) {
        raise(PyExc_TypeError,
              "a sequence converts to Value if it has 2, 3 or 4 numbers, or 4 rows "
              "of 4; for data write Value(Unstructured([...]))");
    }
    raise(PyExc_TypeError, "expected an object that converts to Value, not " + nameOfType(object));
}

py::object payloadOf(Value const& value) {
    struct Payload {
        py::object operator()(long long i) const { return py::int_(i); }
        py::object operator()(double d) const { return py::float_(d); }
        py::object operator()(FloatVec2 const& v) const { return fromVector(v); }
        py::object operator()(FloatVec3 const& v) const { return fromVector(v); }
        py::object operator()(FloatVec4 const& v) const { return fromVector(v); }
        py::object operator()(FloatMat4 const& m) const {
            py::tuple rows(4);
            for (std::size_t i = 0; i < 4; ++i) {
                double const* const row = m.elements + 4 * i;
                rows[i] = py::make_tuple(row[0], row[1], row[2], row[3]);
            }
            return rows;
        }
        py::object operator()(bool b) const { return py::bool_(b); }
        py::object operator()(Value::ImageID) const { return {}; }
        py::object operator()(Value::VideoID) const { return {}; }
        py::object operator()(Value::SoundID) const { return {}; }
        py::object operator()(Value::ModelID) const { return {}; }
        py::object operator()(Path const& path) const {
            return py::cast(std::make_shared<Path>(path));
        }
        py::object operator()(Unstructured const& data) const { return py::cast(data); }
        py::object operator()(std::string const& text) const { return fromString(text); }
    };
    return value.visit(Payload());
}

}  // namespace tarn_python
