// Graphs: records, queries and indexes.

#include "conversions.h"
#include "module.h"
#include "records.h"

#include <Engine/Base/patch_index.h>
#include <Engine/Document/document.h>

#include <pybind11/stl.h>

#include <algorithm>
#include <cstddef>
#include <sstream>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

using namespace tarn::engine;

namespace tarn_python {

py::object fromAttributes(Attributes const& attributes) {
    py::dict made;
    for (auto const& [key, data] : attributes) made[fromString(key)] = fromData(data);
    static py::handle const proxy =
        py::object(py::module_::import("types").attr("MappingProxyType")).release();
    return proxy(made);
}

Attributes toAttributes(py::handle object) {
    if (!isMapping(object)) {
        raise(PyExc_TypeError,
              "attributes are a mapping of strings to data, not " + nameOfType(object));
    }
    Attributes attributes;
    for (auto const& [key, data] : copiedDict(object)) {
        if (!py::isinstance<py::str>(key)) {
            throw py::type_error("the keys of attributes are strings");
        }
        attributes.insert_or_assign(toString(key), toData(data));
    }
    return attributes;
}

std::size_t levelsOf(Patch const& patch) {
    struct Open {
        std::vector<Patch> const* list;
        bool isShared;
        std::size_t next;
        std::size_t levels;
    };
    std::unordered_map<std::vector<Patch> const*, std::size_t> known;
    std::vector<Open> open;
    std::size_t done = 0;  // For the list that was compared last.
    auto const enter = [&](Array<Patch> const& list) {
        done = 0;
        if (list->empty()) return false;
        bool const isShared = list.use_count() > 1;
        auto const found = isShared ? known.find(list.get()) : known.end();
        if (found != known.end()) {
            done = found->second;
            return false;
        }
        open.push_back({list.get(), isShared, 0, 0});
        return true;
    };
    enter(patch.children);
    while (!open.empty()) {
        Open& top = open.back();
        if (top.next < top.list->size()) {
            if (enter((*top.list)[top.next++].children)) continue;
        } else {
            done = top.levels + 1;
            if (top.isShared) known.emplace(top.list, done);
            open.pop_back();
            if (open.empty()) break;
        }
        open.back().levels = std::max(open.back().levels, done);
    }
    return done + 1;
}

void requireLevels(std::size_t levels) {
    if (levels > kMostLevels)
        throw py::value_error("patches and layers nest 10,000 levels at most");
}

namespace {

std::size_t levelsOfLayer(ModelLayer const& layer) {
    std::vector<std::pair<ModelLayer const*, std::size_t>> pending{{&layer, 1}};
    std::size_t deepest = 0;
    while (!pending.empty()) {
        auto const [next, level] = pending.back();
        pending.pop_back();
        deepest = std::max(deepest, level);
        for (ModelLayer const& child : next->children) pending.emplace_back(&child, level + 1);
        for (ModelLayer const& more : next->additionalLayers)
            pending.emplace_back(&more, level + 1);
    }
    return deepest;
}

template <class T>
py::object copyOrNone(T const* found) {
    return found != nullptr ? py::cast(*found) : py::object(py::none());
}

py::list fromView(ConnectionView const& view) {
    py::list list;
    for (Connection const& connection : view) list.append(py::cast(connection));
    return list;
}

template <class T>
std::string textOf(T const& object) {
    std::ostringstream text;
    text << object;
    return text.str();
}

// Pickled as documents: exact, at any depth.
Patch readBack(py::bytes const& document) {
    Optional<Patch> patch = readDocument(static_cast<std::string>(document));
    if (!patch) throw py::value_error("invalid pickled patch");
    return *std::move(patch);
}

void defineModelLayer(py::module_& module) {
    py::class_<ModelLayer>(module, "ModelLayer", "A tree of 3D model layers.")
        .def(py::init([](unsigned long long id, py::object const& children,
                         py::object const& additional) {
                 ModelLayer layer{id, toList<ModelLayer>(children), toList<ModelLayer>(additional)};
                 requireLevels(levelsOfLayer(layer));
                 return layer;
             }),
             py::arg("id") = 0, py::arg("children") = py::tuple(),
             py::arg("additional_layers") = py::tuple())
        .def_readonly("id", &ModelLayer::id, "The number of the layer.")
        .def_property_readonly(
            "children", [](ModelLayer const& l) { return fromList(l.children); },
            "The layers below it, as a tuple.")
        .def_property_readonly(
            "additional_layers", [](ModelLayer const& l) { return fromList(l.additionalLayers); },
            "A tuple; compared and copied, but not printed by `str`.")
        .def(
            "__eq__", [](ModelLayer const& a, ModelLayer const& b) { return a == b; },
            py::is_operator())
        .def("__str__", [](ModelLayer const& l) { return textOf(l); })
        .def("__reduce__", [](ModelLayer const& l) {
            return py::make_tuple(
                py::type::of<ModelLayer>(),
                py::make_tuple(l.id, fromList(l.children), fromList(l.additionalLayers)));
        });
    requireInit<ModelLayer>();
}

void defineConnection(py::module_& module) {
    py::class_<Connection>(module, "Connection",
                           "From an output port to an input port of two patches inside one. Never "
                           "changes.")
        .def(py::init<unsigned long long, unsigned long long, unsigned long long,
                      unsigned long long>(),
             py::arg("from_patch_id"), py::arg("from_port_id"), py::arg("to_patch_id"),
             py::arg("to_port_id"))
        .def_readonly("from_patch_id", &Connection::fromPatchId, "The patch of the output.")
        .def_readonly("from_port_id", &Connection::fromPortId, "The output.")
        .def_readonly("to_patch_id", &Connection::toPatchId, "The patch of the input.")
        .def_readonly("to_port_id", &Connection::toPortId, "The input.")
        .def(
            "__eq__", [](Connection const& a, Connection const& b) { return a == b; },
            py::is_operator())
        .def("__hash__", [](Connection const& c) { return std::hash<Connection>()(c); })
        .def("__str__", [](Connection const& c) { return textOf(c); })
        .def("__repr__",
             [](Connection const& c) {
                 return "Connection(" + std::to_string(c.fromPatchId) + ", " +
                        std::to_string(c.fromPortId) + ", " + std::to_string(c.toPatchId) + ", " +
                        std::to_string(c.toPortId) + ")";
             })
        .def("__reduce__", [](Connection const& c) {
            return py::make_tuple(
                py::type::of<Connection>(),
                py::make_tuple(c.fromPatchId, c.fromPortId, c.toPatchId, c.toPortId));
        });
    requireInit<Connection>();
}

void definePort(py::module_& module) {
    py::class_<Port> port(module, "Port", "An input or output of a patch.");
    port.def(py::init([](unsigned long long id, unsigned long long tag, py::str const& name,
                         TypeInfo const& typeInfo, py::object const& defaultValue,
                         py::object const& attributes) {
                 return Port{id,
                             tag,
                             toString(name),
                             typeInfo,
                             toValue(defaultValue),
                             toAttributes(attributes)};
             }),
             py::arg("id") = 0, py::arg("tag") = 0, py::arg("name") = "",
             py::arg("type_info") = TypeInfo(), py::arg("default_value") = 0.0,
             py::arg("attributes") = py::dict())
        .def_readwrite("id", &Port::id, "Unique among all ports of a document.")
        .def(
            "__eq__", [](Port const& a, Port const& b) { return a == b; }, py::is_operator())
        .def("__str__", [](Port const& p) { return fromString(textOf(p)); })
        .def("__repr__",
             [](py::object const& self) {
                 std::string text = "Port(id=" + py::cast<std::string>(py::repr(self.attr("id")));
                 for (char const* const field : {"tag", "name", "type_info", "default_value"}) {
                     text += std::string(", ") + field + "=" +
                             py::cast<std::string>(py::repr(self.attr(field)));
                 }
                 py::object const attributes = self.attr("attributes");
                 if (py::len(attributes) != 0) text += ", attributes=" + reprOf(attributes);
                 return text + ")";
             })
        .def("__reduce__", [](py::object const& self) {
            Port const& p = self.cast<Port const&>();
            return py::make_tuple(py::type::of<Port>(),
                                  py::make_tuple(p.id, p.tag, fromString(p.name), p.typeInfo,
                                                 p.defaultValue,
                                                 py::dict(self.attr("attributes"))));
        });
    definePortFields(port, [](Port& p) -> Port& { return p; });
    requireInit<Port>();
}

void definePatch(py::module_& module) {
    py::class_<Patch> patch(module, "Patch",
                            "A node of the graph: its ports, the patches inside it and the "
                            "connections between those. Copies share their lists.");
    patch
        .def(py::init([](unsigned long long id, unsigned long long builtin, py::str const& name,
                         py::object const& inputs, py::object const& outputs,
                         py::object const& children, py::object const& connections,
                         py::object const& attributes, py::str const& descriptor,
                         ModelLayer const& modelLayer) {
                 Patch made;
                 made.id = id;
                 made.builtin = builtin;
                 made.descriptor = toString(descriptor);
                 made.modelLayer = modelLayer;
                 made.name = toString(name);
                 made.inputs = arrayOf(toList<Port>(inputs));
                 made.outputs = arrayOf(toList<Port>(outputs));
                 made.attributes = toAttributes(attributes);
                 made.connections = arrayOf(toList<Connection>(connections));
                 made.children = arrayOf(toList<Patch>(children));
                 requireLevels(levelsOf(made));
                 return made;
             }),
             py::arg("id") = 0, py::arg("builtin") = 0, py::arg("name") = "",
             py::arg("inputs") = py::tuple(), py::arg("outputs") = py::tuple(),
             py::arg("children") = py::tuple(), py::arg("connections") = py::tuple(),
             py::arg("attributes") = py::dict(), py::arg("descriptor") = "",
             py::arg("model_layer") = ModelLayer())
        .def_readwrite("id", &Patch::id, "Never 0 in a document: that means no patch.")
        .def(
            "__eq__", [](Patch const& a, Patch const& b) { return a == b; }, py::is_operator())
        .def("__str__", [](Patch const& p) { return fromString(textOf(p)); })
        .def("__repr__",
             [](Patch const& p) {
                 return "<Patch " + std::to_string(p.id) + " " +
                        py::cast<std::string>(py::repr(fromString(p.name))) + ": " +
                        std::to_string(p.inputs->size()) + " inputs, " +
                        std::to_string(p.outputs->size()) + " outputs, " +
                        std::to_string(p.children->size()) + " children>";
             })
        .def(py::pickle([](Patch const& p) { return py::bytes(writeDocument(p)); }, &readBack))
        .def("__reduce_ex__", [](py::object const& self, py::object const&) {
            // All protocols pickle like the newer ones.
            return py::make_tuple(py::module_::import("copyreg").attr("__newobj__"),
                                  py::make_tuple(py::type::of<Patch>()),
                                  self.attr("__getstate__")());
        });
    definePatchFields(
        patch, [](Patch& p) -> Patch& { return p; },
        [](Patch& p, std::vector<Patch> children) {
            Patch changed = p;
            changed.children = arrayOf(std::move(children));
            requireLevels(levelsOf(changed));
            p = std::move(changed);
        });
    requireInit<Patch>();
}

void defineQueries(py::module_& module) {
    module.def(
        "find_patch_recursive",
        [](Patch const& root, unsigned long long id) {
            return copyOrNone(findPatchRecursive(root, id));
        },
        py::arg("root"), py::arg("id"),
        "The patch with this identifier in the whole graph, or None.");
    module.def(
        "in_port_for_tag",
        [](Patch const& patch, unsigned long long tag) {
            return copyOrNone(inPortForTag(patch, tag));
        },
        py::arg("patch"), py::arg("tag"), "The first input of the patch with this tag, or None.");
    module.def(
        "out_port_for_tag",
        [](Patch const& patch, unsigned long long tag) {
            return copyOrNone(outPortForTag(patch, tag));
        },
        py::arg("patch"), py::arg("tag"), "The first output of the patch with this tag, or None.");
}

void defineIndex(py::module_& module) {
    using Id = unsigned long long;
    py::class_<PatchIndex>(module, "PatchIndex",
                           "Queries a graph in constant time. It keeps the graph; what it "
                           "gives are records of their own.")
        .def(py::init([](Patch root) {
                 py::gil_scoped_release const released;
                 return std::make_unique<PatchIndex>(std::move(root));
             }),
             py::arg("root"))
        .def_property_readonly(
            "root", [](PatchIndex const& i) { return i.root(); },
            "The patch that the index was made from.")
        .def(
            "find_patch", [](PatchIndex const& i, Id id) { return copyOrNone(i.findPatch(id)); },
            py::arg("id"), "The patch anywhere in the graph, or None.")
        .def(
            "parent_of", [](PatchIndex const& i, Id id) { return copyOrNone(i.parentOf(id)); },
            py::arg("id"), "The patch that this one is inside of, or None for the root.")
        .def(
            "find_input_port",
            [](PatchIndex const& i, Id id) { return copyOrNone(i.findInputPort(id)); },
            py::arg("port_id"), "The input anywhere in the graph, or None.")
        .def(
            "find_output_port",
            [](PatchIndex const& i, Id id) { return copyOrNone(i.findOutputPort(id)); },
            py::arg("port_id"), "The output anywhere in the graph, or None.")
        .def(
            "owner_of_port",
            [](PatchIndex const& i, Id id) { return copyOrNone(i.ownerOfPort(id)); },
            py::arg("port_id"), "The patch of the port, or None.")
        .def(
            "incoming_connection",
            [](PatchIndex const& i, Id id) { return copyOrNone(i.incomingConnection(id)); },
            py::arg("port_id"), "The connection that leads to the input, or None.")
        .def(
            "outgoing_connections",
            [](PatchIndex const& i, Id id) { return fromView(i.outgoingConnections(id)); },
            py::arg("port_id"), "The connections that start at the output.")
        .def(
            "incoming_connections_to_patch",
            [](PatchIndex const& i, Id id) { return fromView(i.incomingConnectionsToPatch(id)); },
            py::arg("id"), "The connections of its parent that lead to the patch.")
        .def(
            "outgoing_connections_from_patch",
            [](PatchIndex const& i, Id id) { return fromView(i.outgoingConnectionsFromPatch(id)); },
            py::arg("id"), "The connections of its parent that start at the patch.")
        .def("update", &PatchIndex::update, py::arg("root"),
             "Makes this the index of another root; the cost depends on the differences.");
    requireInit<PatchIndex>();
}

}  // namespace

void defineGraphs(py::module_& module) {
    defineModelLayer(module);
    defineConnection(module);
    definePort(module);
    definePatch(module);
    defineQueries(module);
    defineIndex(module);
}

}  // namespace tarn_python
