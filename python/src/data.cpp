// Unstructured data: converts Python objects to and from `Unstructured`.

#include "conversions.h"

#include <unordered_set>
#include <utility>
#include <vector>

using namespace tarn::engine;

namespace tarn_python {

namespace {

py::handle& unsignedType() {
    static py::handle type;
    return type;
}

Unstructured integerData(py::handle object) {
    py::object const index = toIndex(object);
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

// A map or an array that is being filled. An explicit stack: data may be of any depth.
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
    Open open{py::reinterpret_borrow<py::object>(object), {}, isMapping(object)};
    if (open.isMap) {
        for (auto const& [key, member] : copiedDict(object)) {
            if (!py::isinstance<py::str>(key)) {
                raise(PyExc_TypeError, "keys of data must be strings, not " + nameOfType(key));
            }
            open.members.emplace_back(toString(key), py::reinterpret_borrow<py::object>(member));
        }
    } else {
        py::object const elements = isArray(object) ? object.attr("tolist")() : open.source;
        for (py::handle const element : copiedTuple(elements)) {
            open.members.emplace_back("", py::reinterpret_borrow<py::object>(element));
        }
    }
    return open;
}

// Data other than maps and arrays.
bool scalarData(py::handle object, Unstructured& data) {
    if (object.is_none()) {
        data = Unstructured();
    } else if (py::isinstance<Unstructured>(object)) {
        data = object.cast<Unstructured const&>();
    } else if (Optional<bool> const truth = ifBool(object)) {
        data = *truth ? 1 : 0;
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

void defineUnsigned(py::module_& module) {
    py::dict members;
    members["__module__"] = "tarn_engine_base";
    members["__doc__"] =
        "An unsigned integer of data, such as an identifier: 0 to 2**64 - 1. An `int` in every "
        "other respect; data tells the two apart.";
    members["__slots__"] = py::tuple();
    // Prints like an integer; only `repr` differs.
    members["__str__"] = py::handle(reinterpret_cast<PyObject*>(&PyLong_Type)).attr("__repr__");
    members["__repr__"] = py::cpp_function(
        [](py::int_ const& self) {
            return "Unsigned(" + py::cast<std::string>(py::str(toIndex(self))) + ")";
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
        if (isArray(current) && py::len(current.attr("shape")) == 0) {
            current = current.attr("item")();
            if (isArray(current)) raise(PyExc_ValueError, "the data contains itself");
        }
        if (!scalarData(current, data)) {
            if (!isMapping(current) && !isSequence(current)) {
                raise(PyExc_TypeError, "expected None, a number, a string, a list or a dict, not " +
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

std::string reprOf(py::handle object) {
    if (PyFloat_Check(object.ptr())) {
        std::string const digits = py::cast<std::string>(py::repr(object));
        return Py_IS_FINITE(PyFloat_AS_DOUBLE(object.ptr())) ? digits : "float('" + digits + "')";
    }
    bool const isList = py::isinstance<py::list>(object);
    bool const isTuple = py::isinstance<py::tuple>(object);
    if (!isList && !isTuple && !isMapping(object)) {
        return py::cast<std::string>(fromString(toString(py::repr(object))));
    }
    if (Py_EnterRecursiveCall(" in a representation") != 0) throw py::error_already_set();
    std::string text;
    if (isMapping(object)) {
        for (auto const& [key, member] : copiedDict(object)) {
            text += (text.empty() ? "" : ", ") + reprOf(key) + ": " + reprOf(member);
        }
        text = "{" + text + "}";
    } else {
        py::tuple const elements = copiedTuple(object);
        for (py::handle const element : elements) {
            text += (text.empty() ? "" : ", ") + reprOf(element);
        }
        if (isTuple && elements.size() == 1) text += ",";
        text = isList ? "[" + text + "]" : "(" + text + ")";
    }
    Py_LeaveRecursiveCall();
    return text;
}

}  // namespace tarn_python
