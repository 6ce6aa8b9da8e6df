// python/src/records.h: defines the fields of ports and patches, both for records and for those
// inside an edit.
//
//     definePortFields(portClass, [](Port& port) -> Port& { return port; });

#ifndef TARN_PYTHON_RECORDS_H
#define TARN_PYTHON_RECORDS_H

#include "casters.h"
#include "conversions.h"

#include <Engine/Base/patch.h>

#include <cstddef>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace tarn_python {

/// The depth of a patch, counting itself. Visits shared lists once, and is not recursive.
std::size_t levelsOf(tarn::engine::Patch const& patch);
/// Raises ValueError beyond the depth that a thread's stack can compare, copy and write.
constexpr std::size_t kMostLevels = 10000;
void requireLevels(std::size_t levels);

using Attributes = std::map<std::string, tarn::engine::Unstructured>;

/// A read-only mapping: assignments to it would be lost.
py::object fromAttributes(Attributes const& attributes);
Attributes toAttributes(py::handle object);

/// Converts a list to a tuple, and an iterable to a list.
template <class T>
py::tuple fromList(std::vector<T> const& list) {
    py::tuple elements(list.size());
    for (std::size_t i = 0; i < list.size(); ++i) elements[i] = py::cast(list[i]);
    return elements;
}
template <class T>
std::vector<T> toList(py::handle iterable) {
    std::vector<T> list;
    for (py::handle const element : copiedTuple(iterable)) {
        if (!py::isinstance<T>(element)) {
            throw py::type_error("expected elements of type " +
                                 py::cast<std::string>(py::type::of<T>().attr("__name__")) +
                                 ", not " + nameOfType(element));
        }
        list.push_back(element.cast<T const&>());
    }
    return list;
}

template <class Class, class Get>
void definePortFields(Class& cls, Get get) {
    using Self = typename Class::type;
    cls.def_property(
           "tag", [get](Self& s) { return get(s).tag; },
           [get](Self& s, unsigned long long tag) { get(s).tag = tag; },
           "Identifies the port among those of its patch.")
        .def_property(
            "name", [get](Self& s) { return fromString(get(s).name); },
            [get](Self& s, py::str const& name) { get(s).name = toString(name); },
            "The displayed name.")
        .def_property(
            "type_info", [get](Self& s) { return get(s).typeInfo; },
            [get](Self& s, tarn::engine::TypeInfo const& i) { get(s).typeInfo = i; },
            "A copy: assign a changed one.")
        .def_property(
            "default_value", [get](Self& s) { return get(s).defaultValue; },
            [get](Self& s, py::object const& v) { get(s).defaultValue = toValue(v); },
            "A Value; anything that converts to one can be assigned.")
        .def_property(
            "attributes", [get](Self& s) { return fromAttributes(get(s).attributes); },
            [get](Self& s, py::object const& d) { get(s).attributes = toAttributes(d); },
            "A read-only mapping of strings to data: assign a changed dict.");
}

/// `assignChildren(self, list)` replaces the list of children.
template <class Class, class Get, class Assign>
void definePatchFields(Class& cls, Get get, Assign assignChildren) {
    using namespace tarn::engine;
    using Self = typename Class::type;
    cls.def_property(
           "builtin", [get](Self& s) { return get(s).builtin; },
           [get](Self& s, unsigned long long kind) { get(s).builtin = kind; },
           "The number of the built-in kind.")
        .def_property(
            "descriptor", [get](Self& s) { return fromString(get(s).descriptor); },
            [get](Self& s, py::str const& d) { get(s).descriptor = toString(d); },
            "A second name: compared, but neither printed nor evaluated.")
        .def_property(
            "name", [get](Self& s) { return fromString(get(s).name); },
            [get](Self& s, py::str const& name) { get(s).name = toString(name); },
            "The displayed name.")
        .def_property(
            "model_layer", [get](Self& s) { return get(s).modelLayer; },
            [get](Self& s, ModelLayer const& layer) { get(s).modelLayer = layer; },
            "The layers of its 3D model. A copy: assign a changed one.")
        .def_property(
            "inputs", [get](Self& s) { return fromList(*get(s).inputs); },
            [get](Self& s, py::object const& list) { get(s).inputs = arrayOf(toList<Port>(list)); },
            "A tuple of ports: assign another list.")
        .def_property(
            "outputs", [get](Self& s) { return fromList(*get(s).outputs); },
            [get](Self& s, py::object const& list) {
                get(s).outputs = arrayOf(toList<Port>(list));
            },
            "A tuple of ports: assign another list.")
        .def_property(
            "connections", [get](Self& s) { return fromList(*get(s).connections); },
            [get](Self& s, py::object const& list) {
                get(s).connections = arrayOf(toList<Connection>(list));
            },
            "A tuple of the connections between the children: assign another list.")
        .def_property(
            "children", [get](Self& s) { return fromList(*get(s).children); },
            [assignChildren](Self& s, py::object const& list) {
                assignChildren(s, toList<Patch>(list));
            },
            "A tuple of the child patches: assign another list. Raises ValueError where "
            "patches would nest deeper than 10,000 levels.")
        .def_property(
            "attributes", [get](Self& s) { return fromAttributes(get(s).attributes); },
            [get](Self& s, py::object const& d) { get(s).attributes = toAttributes(d); },
            "A read-only mapping of strings to data: assign a changed dict.");
}

}  // namespace tarn_python

#endif
