// Types, values, types of ports, and unstructured data.

#include "casters.h"
#include "conversions.h"
#include "module.h"
#include "value_type.h"

#include <pybind11/stl.h>

#include <memory>
#include <string>
#include <vector>

using namespace tarn::engine;

namespace tarn_python {

namespace {

std::string makerOf(Type type) {
    switch (type) {
        case Type::Image: return "image";
        case Type::Video: return "video";
        case Type::Sound: return "sound";
        case Type::Model: return "model";
        default: return "";
    }
}

std::string valueRepr(Value const& value) {
    std::string const maker = makerOf(value.type());
    if (!maker.empty()) {
        return "Value." + maker + "(" + std::to_string(static_cast<unsigned long long>(value)) +
               ")";
    }
    return "Value(" + reprOf(payloadOf(value)) + ")";
}

py::object optionalValue(Optional<Value> const& value) {
    return value ? py::cast(*value) : py::object(py::none());
}
Optional<Value> toOptional(py::handle object) {
    if (object.is_none()) return {};
    return toValue(object);
}

void defineTypes(py::module_& module) {
    defineEnumeration<Type>(module, "Type",
                            "The types of values, with the numbers that documents store.",
                            {{"FLOAT", Type::Float},
                             {"VEC2", Type::Vec2},
                             {"VEC3", Type::Vec3},
                             {"VEC4", Type::Vec4},
                             {"MAT4", Type::Mat4},
                             {"BOOLEAN", Type::Boolean},
                             {"INT", Type::Int},
                             {"IMAGE", Type::Image},
                             {"VIDEO", Type::Video},
                             {"SOUND", Type::Sound},
                             {"PATH", Type::Path},
                             {"STRING", Type::String},
                             {"MODEL", Type::Model},
                             {"UNSTRUCTURED", Type::Unstructured}});
    module.def("type_to_string", &typeToString, py::arg("type"),
               "The name that documents store, \"float\" to \"unstructured\".");
    module.def(
        "string_to_type",
        [](std::string const& name) -> py::object {
            Optional<Type> const type = stringToType(name);
            return type ? py::cast(*type) : py::object(py::none());
        },
        py::arg("name"), "The type of that name, or None.");
    module.def("type_is_resource", &typeIsResource, py::arg("type"),
               "True for images, videos, sounds and models.");
}

void defineData(py::module_& module) {
    using Kind = Unstructured::Type;
    defineUnsigned(module);
    defineEnumeration<Kind>(module, "UnstructuredType", "The kinds of data.",
                            {{"NULL", Kind::Null},
                             {"MAP", Kind::Map},
                             {"ARRAY", Kind::Array},
                             {"FLOAT", Kind::Float},
                             {"INTEGER", Kind::Integer},
                             {"UNSIGNED_INTEGER", Kind::UnsignedInteger},
                             {"STRING", Kind::String}});
    py::class_<Unstructured, std::shared_ptr<Unstructured>>(
        module, "Unstructured",
        "JSON-like data: None, numbers, strings, lists and dicts with string keys, of any depth. "
        "Immutable. True and False become 1 and 0, and an `Unsigned` an unsigned integer.")
        .def(py::init([](py::object const& data) { return toData(data); }),
             py::arg("data") = py::none(),
             "Copies the data. Raises TypeError for other objects, OverflowError for integers "
             "beyond 64 bits and ValueError for data that contains itself.")
        .def_property_readonly("data", &fromData, "The same as Python's own objects, new ones.")
        .def_property_readonly("type", &Unstructured::type, "The kind of the outermost part.")
        .def("__len__", &Unstructured::size)
        .def(
            "to_text",
            [](Unstructured const& data, std::size_t maxBytes, std::size_t maxDepth) {
                return fromString(data.toText(maxBytes, maxDepth));
            },
            py::arg("max_bytes") = 4096, py::arg("max_depth") = 16,
            "One line for people, limited to this many bytes and levels.")
        .def(
            "__eq__", [](Unstructured const& a, Unstructured const& b) { return a == b; },
            py::is_operator())
        .def(
            "__ne__", [](Unstructured const& a, Unstructured const& b) { return a != b; },
            py::is_operator())
        .def("__hash__", [](Unstructured const& data) { return std::hash<Value>()(Value(data)); })
        .def(
            "__repr__",
            [](Unstructured const& data) { return "Unstructured(" + reprOf(fromData(data)) + ")"; })
        .def("__reduce__", [](Unstructured const& data) {
            return py::make_tuple(py::type::of<Unstructured>(), py::make_tuple(fromData(data)));
        });
    requireInit<Unstructured>();
}

template <class Function, class... Extra>
void defineMethod(py::handle type, char const* name, Function function, Extra const&... extra) {
    type.attr(name) = py::cpp_function(function, py::name(name), py::is_method(type), extra...);
}

template <class Function>
void defineProperty(py::handle type, char const* name, char const* documentation,
                    Function function) {
    auto const property =
        py::reinterpret_borrow<py::object>(reinterpret_cast<PyObject*>(&PyProperty_Type));
    type.attr(name) = property(py::cpp_function(function, py::is_method(type)), py::none(),
                               py::none(), documentation);
}

void defineMakers(py::handle type) {
    struct Row {
        char const* name;
        Value (*make)(unsigned long long);
        char const* documentation;
    };
    for (Row const& row : {
             Row{"image", &Value::Image, "The image of that number; 0 is none."},
             Row{"video", &Value::Video, "The video of that number; 0 is none."},
             Row{"sound", &Value::Sound, "The sound of that number; 0 is none."},
             Row{"model", &Value::Model, "The model of that number; 0 is none."},
         }) {
        type.attr(row.name) = py::staticmethod(py::cpp_function(
            row.make, py::name(row.name), py::scope(type), py::arg("id"), row.documentation));
    }
    type.attr("default") = py::staticmethod(py::cpp_function(
        [](Type of, unsigned char qualifier) { return Value::defaultValue(of, qualifier); },
        py::name("default"), py::scope(type), py::arg("type"), py::arg("qualifier") = 0,
        "The value of a new port of that type. The qualifier 4 makes a colour opaque."));
}

void defineValue(py::module_& module) {
    py::handle const type(reinterpret_cast<PyObject*>(valueType()));
    module.attr("Value") = type;
    defineMakers(type);
    defineProperty(type, "type", "A Type.", [](Value const& v) { return v.type(); });
    defineProperty(type, "vec2", "Two floats, as a tuple.",
                   [](Value const& v) { return fromVector(FloatVec2(v)); });
    defineProperty(type, "vec3", "Three floats, as a tuple.",
                   [](Value const& v) { return fromVector(FloatVec3(v)); });
    defineProperty(type, "vec4", "Four floats, as a tuple; of a colour red, green, blue, opacity.",
                   [](Value const& v) { return fromVector(FloatVec4(v)); });
    defineProperty(type, "mat4", "An array of shape (4, 4): the matrix, else the identity.",
                   [](Value const& v) { return fromMatrix(FloatMat4(v)); });
    defineProperty(type, "id", "The number of a resource, or the identifier of data; else 0.",
                   [](Value const& v) { return static_cast<unsigned long long>(v); });
    defineProperty(
        type, "path", "The path, shared with the value; else the empty one.", [](Value const& v) {
            std::shared_ptr<Path const> path = v.sharedPath();
            if (path == nullptr) path = Path::EmptyPath();
            return std::const_pointer_cast<Path>(path);  // Paths are immutable in Python.
        });
    defineProperty(type, "data",
                   "Numbers, strings and data as Python's own objects, a vector as a dict of "
                   "\"X\", \"Y\", \"Z\", \"W\"; else None.",
                   [](Value const& v) { return fromData(v.asUnstructured()); });
    defineProperty(type, "unstructured", "The same as an Unstructured.",
                   [](Value const& v) { return v.asUnstructured(); });
    defineMethod(
        type, "as_type", [](Value const& v, Type wanted) { return v.asType(wanted); },
        py::arg("type"), "The value converted to that type.");
    defineMethod(type, "__str__", [](Value const& v) { return fromString(to_string(v)); });
    defineMethod(type, "__repr__", &valueRepr);
    defineMethod(type, "__reduce__", [type](Value const& v) {
        std::string const maker = makerOf(v.type());
        if (maker.empty()) return py::make_tuple(type, py::make_tuple(payloadOf(v)));
        // Functions in C++ cannot be pickled, but a call of one by name can.
        py::object const call = py::module_::import("operator").attr("methodcaller");
        return py::make_tuple(call(maker, static_cast<unsigned long long>(v)),
                              py::make_tuple(type));
    });
}

void defineTypeInfo(py::module_& module) {
    py::class_<TypeInfo>(module, "TypeInfo", "The type of a port and the bounds of its values.")
        .def(
            py::init([](Type type, unsigned char subtype, py::object const& min,
                        py::object const& max, py::object const& extra) {
                return TypeInfo{type, subtype, toOptional(min), toOptional(max), toOptional(extra)};
            }),
            py::arg("type") = Type::Float, py::arg("subtype") = 0, py::arg("min") = py::none(),
            py::arg("max") = py::none(), py::arg("extra") = py::none())
        .def_readwrite("type", &TypeInfo::type, "A Type.")
        .def_readwrite("subtype", &TypeInfo::subtype,
                       "1 marks a boolean port as a pulse and an unstructured one as a layer.")
        .def_property(
            "min", [](TypeInfo const& i) { return optionalValue(i.min); },
            [](TypeInfo& i, py::object const& v) { i.min = toOptional(v); },
            "The lower bound of a float port, or None.")
        .def_property(
            "max", [](TypeInfo const& i) { return optionalValue(i.max); },
            [](TypeInfo& i, py::object const& v) { i.max = toOptional(v); },
            "The upper bound of a float port, or None.")
        .def_property(
            "extra", [](TypeInfo const& i) { return optionalValue(i.extra); },
            [](TypeInfo& i, py::object const& v) { i.extra = toOptional(v); },
            "Stored and compared, but not interpreted. A Value or None.")
        .def(
            "__eq__", [](TypeInfo const& a, TypeInfo const& b) { return a == b; },
            py::is_operator())
        .def("__repr__",
             [](TypeInfo const& i) {
                 std::string text =
                     "TypeInfo(Type." + py::cast<std::string>(py::cast(i.type).attr("name"));
                 if (i.subtype != 0) text += ", subtype=" + std::to_string(i.subtype);
                 if (i.min) text += ", min=" + valueRepr(*i.min);
                 if (i.max) text += ", max=" + valueRepr(*i.max);
                 if (i.extra) text += ", extra=" + valueRepr(*i.extra);
                 return text + ")";
             })
        .def("__reduce__", [](TypeInfo const& i) {
            return py::make_tuple(py::type::of<TypeInfo>(),
                                  py::make_tuple(i.type, i.subtype, optionalValue(i.min),
                                                 optionalValue(i.max), optionalValue(i.extra)));
        });
    requireInit<TypeInfo>();
    module.def("port_name_for_type_info", &portNameForTypeInfo, py::arg("type_info"),
               py::arg("plural") = false, "\"Number\", \"Colors\" and the like.");
    module.def(
        "cast_value_to_type",
        [](py::object const& value, TypeInfo const& info) {
            return castValueToType(toValue(value), info);
        },
        py::arg("value"), py::arg("type_info"),
        "The value, clamped to the bounds of a float port.");
    module.def(
        "index_loop_casting",
        [](std::vector<Value> const& loop, TypeInfo const& info, unsigned long long index) {
            return indexLoopCasting(loop, info, index);
        },
        py::arg("loop"), py::arg("type_info"), py::arg("index"),
        "The element at the index, wrapped around the loop and cast to the port; an empty loop "
        "counts as one 0.0.");
}

}  // namespace

void defineValues(py::module_& module) {
    defineTypes(module);
    defineData(module);
    defineValue(module);
    defineTypeInfo(module);
}

}  // namespace tarn_python
