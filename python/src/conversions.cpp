#include "conversions.h"

#include "enumerations.h"
#include "value_type.h"

#include <algorithm>
#include <unordered_set>
#include <utility>

using namespace tarn::engine;

namespace tarn_python {

namespace {

py::handle& unsignedType() {
    static py::handle type;
    return type;
}

[[noreturn]] void raise(PyObject* type, std::string const& sentence) {
    PyErr_SetString(type, sentence.c_str());
    throw py::error_already_set();
}

bool isInteger(py::handle object) { return PyIndex_Check(object.ptr()) != 0; }

bool isNumber(py::handle object) {
    return PyFloat_Check(object.ptr()) || isInteger(object) ||
           (PyNumber_Check(object.ptr()) && py::hasattr(object, "dtype") &&
            !py::hasattr(object, "__len__"));
}

bool isArray(py::handle object) { return py::isinstance<py::array>(object); }

py::object indexOf(py::handle object) {
    py::object index = py::reinterpret_steal<py::object>(PyNumber_Index(object.ptr()));
    if (!index) throw py::error_already_set();
    return index;
}

long long toInteger(py::handle object) {
    py::object const index = indexOf(object);
    int overflow = 0;
    long long const integer = PyLong_AsLongLongAndOverflow(index.ptr(), &overflow);
    if (overflow != 0) raise(PyExc_OverflowError, "the integer does not fit into 64 bits");
    return integer;
}

Unstructured integerData(py::handle object) {
    py::object const index = indexOf(object);
    bool const isUnsigned = py::isinstance(object, unsignedType());
    int overflow = 0;
    long long const integer = PyLong_AsLongLongAndOverflow(index.ptr(), &overflow);
    if (overflow == 0 && !isUnsigned) return integer;
    if (overflow < 0 || (overflow == 0 && integer < 0)) {
        raise(PyExc_OverflowError, "the integer does not fit into 64 bits");
    }
    unsigned long long const identifier = PyLong_AsUnsignedLongLong(index.ptr());
    if (PyErr_Occurred()) {
        PyErr_Clear();
        raise(PyExc_OverflowError, "the integer does not fit into 64 bits");
    }
    return identifier;
}

bool isSequence(py::handle object) {
    return py::isinstance<py::list>(object) || py::isinstance<py::tuple>(object);
}

// A map or an array that is being filled: no call of its own for a level, however deep they are.
struct Open {
    py::object source;
    std::vector<std::pair<std::string, py::object>> members;
    bool isMap = false;
    std::size_t next = 0;
    Unstructured::Map map = {};
    Unstructured::Array array = {};

    Unstructured close() {
        if (isMap) return Unstructured(std::move(map));
        return Unstructured(std::move(array));
    }
    void add(Unstructured data) {
        std::string& key = members[next++].first;
        if (isMap) {
            map.insert_or_assign(std::move(key), std::move(data));
        } else {
            array.push_back(std::move(data));
        }
    }
};

Open opened(py::handle object) {
    Open open{py::reinterpret_borrow<py::object>(object), {}, py::isinstance<py::dict>(object)};
    if (open.isMap) {
        for (auto const& [key, member] : py::reinterpret_borrow<py::dict>(object)) {
            if (!py::isinstance<py::str>(key)) {
                raise(PyExc_TypeError, "the keys of data are strings, not " + nameOfType(key));
            }
            open.members.emplace_back(toString(key), py::reinterpret_borrow<py::object>(member));
        }
    } else {
        for (py::handle const element : object) {
            open.members.emplace_back("", py::reinterpret_borrow<py::object>(element));
        }
    }
    return open;
}

// Data without parts.
bool scalarData(py::handle object, Unstructured& data) {
    if (object.is_none()) {
        data = Unstructured();
    } else if (py::isinstance<Unstructured>(object)) {
        data = object.cast<Unstructured const&>();
    } else if (PyBool_Check(object.ptr())) {
        data = object.ptr() == Py_True ? 1 : 0;
    } else if (py::isinstance<py::str>(object)) {
        data = toString(object);
    } else if (PyFloat_Check(object.ptr())) {
        data = toDouble(object);
    } else if (isInteger(object) && !isArray(object)) {
        data = integerData(object);
    } else if (isNumber(object)) {
        data = toDouble(object);
    } else {
        return false;
    }
    return true;
}

}  // namespace

std::string nameOfType(py::handle object) {
    return py::cast<std::string>(py::str(py::type::handle_of(object).attr("__name__")));
}

double toDouble(py::handle object) {
    double const number = PyFloat_AsDouble(object.ptr());
    if (number == -1.0 && PyErr_Occurred()) throw py::error_already_set();
    return number;
}

std::string toString(py::handle object) {
    if (py::isinstance<py::bytes>(object)) return object.cast<std::string>();
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

py::object unsignedClass() { return py::reinterpret_borrow<py::object>(unsignedType()); }

void defineUnsigned(py::module_& module) {
    py::dict members;
    members["__module__"] = "tarn_engine_base";
    members["__doc__"] =
        "An unsigned integer of data, such as an identifier: 0 to 2**64 - 1. An `int` in every "
        "other respect; data tells the two apart.";
    members["__slots__"] = py::tuple();
    members["__repr__"] = py::cpp_function(
        [](py::int_ const& self) {
            return "Unsigned(" + py::cast<std::string>(py::str(py::int_(indexOf(self)))) + ")";
        },
        py::is_method(module));
    py::object type = py::reinterpret_borrow<py::object>(reinterpret_cast<PyObject*>(&PyType_Type));
    py::object made = type("Unsigned",
                           py::make_tuple(py::reinterpret_borrow<py::object>(
                               reinterpret_cast<PyObject*>(&PyLong_Type))),
                           members);
    module.attr("Unsigned") = made;
    unsignedType() = made.release();
}

Unstructured toData(py::handle object) {
    Unstructured data;
    std::vector<Open> open;
    std::unordered_set<PyObject*> entered;
    py::object current = py::reinterpret_borrow<py::object>(object);
    for (;;) {
        if (isArray(current)) current = current.attr("tolist")();
        if (!scalarData(current, data)) {
            bool const hasParts = py::isinstance<py::dict>(current) || isSequence(current);
            if (!hasParts) {
                raise(PyExc_TypeError, "data is None, a number, a string, a list or a dict, not " +
                                           nameOfType(current));
            }
            if (!entered.insert(current.ptr()).second) {
                raise(PyExc_ValueError, "the data contains itself");
            }
            open.push_back(opened(current));
            if (!open.back().members.empty()) {
                current = open.back().members.front().second;
                continue;
            }
            data = open.back().close();
            entered.erase(open.back().source.ptr());
            open.pop_back();
        }
        for (;;) {
            if (open.empty()) return data;
            open.back().add(std::move(data));
            if (open.back().next < open.back().members.size()) break;
            data = open.back().close();
            entered.erase(open.back().source.ptr());
            open.pop_back();
        }
        current = open.back().members[open.back().next].second;
    }
}

py::object fromData(Unstructured const& data) {
    struct Level {
        Unstructured const* data;
        py::object made;
        Unstructured::Map::const_iterator member = {};
        std::size_t position = 0;
    };
    std::vector<Level> levels;
    auto const enter = [&](Unstructured const& entered) -> py::object {
        switch (entered.type()) {
            case Unstructured::Type::Null: return py::none();
            case Unstructured::Type::Float: return py::float_(entered.asFloat());
            case Unstructured::Type::Integer: return py::int_(entered.asInteger());
            case Unstructured::Type::UnsignedInteger: return unsignedType()(entered.asId());
            case Unstructured::Type::String: return fromString(*entered.ifString());
            case Unstructured::Type::Map:
                levels.push_back({&entered, py::dict(), entered.ifMap()->begin()});
                break;
            case Unstructured::Type::Array: levels.push_back({&entered, py::list()}); break;
        }
        return py::object();
    };
    py::object done = enter(data);
    while (!levels.empty()) {
        Level& level = levels.back();
        Unstructured::Map const* const map = level.data->ifMap();
        if (done) {
            if (map != nullptr) {
                level.made[fromString(level.member++->first)] = done;
            } else {
                py::reinterpret_borrow<py::list>(level.made).append(done);
                ++level.position;
            }
            done = py::object();
        }
        bool const isComplete = map != nullptr ? level.member == map->end()
                                               : level.position == level.data->ifArray()->size();
        if (isComplete) {
            done = std::move(level.made);
            levels.pop_back();
            if (levels.empty()) break;
        } else {
            done = enter(map != nullptr ? level.member->second
                                        : (*level.data->ifArray())[level.position]);
        }
    }
    return done;
}

std::vector<double> toNumbers(py::handle object) {
    std::vector<double> numbers;
    for (py::handle const element : object) {
        if (!isNumber(element)) {
            raise(PyExc_TypeError,
                  "the components of a vector are numbers, not " + nameOfType(element));
        }
        numbers.push_back(toDouble(element));
    }
    return numbers;
}

bool isVector(py::handle object) {
    if (isArray(object)) {
        auto const array = py::reinterpret_borrow<py::array>(object);
        return array.ndim() == 1 && array.shape(0) >= 2 && array.shape(0) <= 4;
    }
    if (!isSequence(object)) return false;
    std::size_t const size = py::len(object);
    if (size < 2 || size > 4) return false;
    for (py::handle const element : object) {
        if (!isNumber(element)) return false;
    }
    return true;
}

FloatVec2 toVec2(py::handle object) {
    std::vector<double> const numbers =
        isVector(object) ? toNumbers(object) : std::vector<double>();
    if (numbers.size() != 2) {
        raise(PyExc_TypeError, "a point is two numbers, as in (1.0, 2.0)");
    }
    return {numbers[0], numbers[1]};
}

py::tuple fromVector(FloatVec2 const& v) { return py::make_tuple(v.x, v.y); }
py::tuple fromVector(FloatVec3 const& v) { return py::make_tuple(v.x, v.y, v.z); }
py::tuple fromVector(FloatVec4 const& v) { return py::make_tuple(v.x, v.y, v.z, v.w); }

py::array_t<double> fromMatrix(FloatMat4 const& matrix) {
    py::array_t<double> array({4, 4});
    std::copy(std::begin(matrix.elements), std::end(matrix.elements), array.mutable_data());
    return array;
}

namespace {

// Four rows of four numbers.
bool isMatrix(py::handle object) {
    if (isArray(object)) {
        auto const array = py::reinterpret_borrow<py::array>(object);
        return array.ndim() == 2 && array.shape(0) == 4 && array.shape(1) == 4;
    }
    if (!isSequence(object) || py::len(object) != 4) return false;
    for (py::handle const row : object) {
        if (!isVector(row) || py::len(row) != 4) return false;
    }
    return true;
}

FloatMat4 toMatrix(py::handle object) {
    FloatMat4 matrix;
    std::size_t position = 0;
    for (py::handle const row : object) {
        for (double const number : toNumbers(row)) matrix.elements[position++] = number;
    }
    return matrix;
}

Value toVector(py::handle object) {
    std::vector<double> const v = toNumbers(object);
    if (v.size() == 2) return FloatVec2{v[0], v[1]};
    if (v.size() == 3) return FloatVec3{v[0], v[1], v[2]};
    return FloatVec4{v[0], v[1], v[2], v[3]};
}

}  // namespace

Value toValue(py::handle object) {
    if (PyFloat_Check(object.ptr())) return PyFloat_AS_DOUBLE(object.ptr());
    if (isValue(object)) return valueOf(object);
    if (PyBool_Check(object.ptr())) return object.ptr() == Py_True;
    if (py::isinstance<py::str>(object)) return Value(toString(object));
    if (py::isinstance<Path>(object)) {
        return Value(std::shared_ptr<Path const>(object.cast<std::shared_ptr<Path>>()));
    }
    if (py::isinstance<Unstructured>(object)) return Value(object.cast<Unstructured const&>());
    if (py::isinstance<py::dict>(object)) return Value(toData(object));
    if (isMatrix(object)) return toMatrix(object);
    if (isVector(object)) return toVector(object);
    if (isArray(object) && py::reinterpret_borrow<py::array>(object).ndim() != 0) {
        raise(PyExc_ValueError, "an array becomes a value if it has 2, 3 or 4 numbers, or 4 rows "
                                "of 4; for data write Value(Unstructured(array))");
    }
    if (isInteger(object)) return toInteger(object);
    if (isNumber(object)) return toDouble(object);
    if (isSequence(object)) {
        raise(PyExc_TypeError, "a sequence becomes a value if it has 2, 3 or 4 numbers, or 4 rows "
                               "of 4; for data write Value(Unstructured([...]))");
    }
    raise(PyExc_TypeError, "there is no value of a " + nameOfType(object));
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
