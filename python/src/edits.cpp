// Edits of a graph, and differences between two graphs.

#include "conversions.h"
#include "module.h"
#include "records.h"

#include <Engine/Base/patch_changes.h>
#include <Engine/Base/patch_edit.h>

#include <pybind11/stl.h>

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

using namespace tarn::engine;

namespace tarn_python {

namespace {

using Id = unsigned long long;
using Position = std::optional<std::size_t>;

// An edit that tracks the depth of the graph, which is limited.
struct Edit {
    PatchEdit edit;
    // Empty after the commit: while an edit shares an index's tables, updating that is slow.
    Optional<PatchIndex> before;
    // For patches that the edit added or moved.
    std::unordered_map<Id, Id> parents = {};
    // For all added or moved patches together.
    std::size_t levels = 0;

    explicit Edit(PatchIndex const& index) : edit(index), before(index) {}

    std::size_t levelOf(Id id) const {
        if (!before) return 1;
        std::size_t level = 1;
        // With repeated identifiers the search may run in a cycle: `commit` checks the result.
        while (level < kMostLevels) {
            auto const found = parents.find(id);
            Patch const* const parent = found == parents.end() ? before->parentOf(id) : nullptr;
            if (found != parents.end()) {
                id = found->second;
            } else if (parent != nullptr) {
                id = parent->id;
            } else {
                return level;
            }
            ++level;
        }
        return level;
    }

    Patch commit() {
        before = Optional<PatchIndex>();
        Patch root = edit.commit();
        if (levels > 0) requireLevels(levelsOf(root));
        return root;
    }

    bool addPatch(Id parent, Patch const& patch, Position position) {
        requireLevels(levelOf(parent) + levelsOf(patch));
        if (!edit.addPatch(parent, patch, position.value_or(PatchEdit::kEnd))) return false;
        parents[patch.id] = parent;
        std::vector<Patch const*> pending{&patch};
        while (!pending.empty()) {
            Patch const& added = *pending.back();
            pending.pop_back();
            for (Patch const& child : *added.children) {
                parents[child.id] = added.id;
                pending.push_back(&child);
            }
        }
        levels += levelsOf(patch);
        return true;
    }

    bool movePatch(Id id, Id parent, Position position) {
        Patch const* const moved = before ? before->findPatch(id) : nullptr;
        std::size_t const inside = levels + (moved != nullptr ? levelsOf(*moved) : 0);
        requireLevels(levelOf(parent) + inside);
        if (!edit.movePatch(id, parent, position.value_or(PatchEdit::kEnd))) return false;
        parents[id] = parent;
        levels = inside;
        return true;
    }

    void assignChildren(Id id, std::vector<Patch> children) {
        Patch changed = *edit.patch(id);
        changed.children = arrayOf(std::move(children));
        std::size_t const inside = levelsOf(changed);
        requireLevels(levelOf(id) - 1 + inside);
        edit.patch(id)->children = std::move(changed.children);
        levels += inside;
    }
};

using SharedEdit = std::shared_ptr<Edit>;

// Looked up at each use, so that nothing dangles after the commit.
struct PatchInEdit {
    SharedEdit edit;
    Id id;

    Patch& get() const {
        Patch* const patch = edit->edit.patch(id);
        if (patch == nullptr) {
            throw py::value_error("patch " + std::to_string(id) +
                                  " was removed, or the edit is committed");
        }
        return *patch;
    }
};

struct PortInEdit {
    SharedEdit edit;
    Id id;
    bool isInput;

    Port& get() const {
        Port* const port = isInput ? edit->edit.inputPort(id) : edit->edit.outputPort(id);
        if (port == nullptr) {
            throw py::value_error("port " + std::to_string(id) +
                                  " was removed, or the edit is committed");
        }
        return *port;
    }
};

template <bool isInput>
py::object portIn(SharedEdit const& edit, Id id) {
    Port const* const port = isInput ? edit->edit.inputPort(id) : edit->edit.outputPort(id);
    return port != nullptr ? py::cast(PortInEdit{edit, id, isInput}) : py::object(py::none());
}

void defineParts(py::module_& module) {
    py::class_<PatchInEdit> patch(module, "PatchInEdit",
                                  "A patch in an edit. Raises ValueError once the "
                                  "patch is removed or the edit committed.");
    patch.def_property_readonly(
        "id", [](PatchInEdit const& p) { return p.get().id; }, "The identifier, which stays.");
    definePatchFields(
        patch, [](PatchInEdit& p) -> Patch& { return p.get(); },
        [](PatchInEdit& p, std::vector<Patch> children) {
            p.get();
            p.edit->assignChildren(p.id, std::move(children));
        });
    py::class_<PortInEdit> port(module, "PortInEdit",
                                "A port in an edit. Raises ValueError once the "
                                "port is removed or the edit committed.");
    port.def_property_readonly(
        "id", [](PortInEdit const& p) { return p.get().id; }, "The identifier, which stays.");
    definePortFields(port, [](PortInEdit& p) -> Port& { return p.get(); });
    requireInit<PatchInEdit>();
    requireInit<PortInEdit>();
}

void defineEdit(py::module_& module) {
    py::class_<Edit, SharedEdit>(module, "PatchEdit",
                                 "Collects changes to a graph; `commit` makes them. Functions that "
                                 "cannot do what is asked for give False or None and change "
                                 "nothing. Afterwards the edit is done: it gives None and False.")
        .def(py::init<PatchIndex const&>(), py::arg("index"))
        .def(
            "patch",
            [](SharedEdit const& e, Id id) -> py::object {
                if (e->edit.patch(id) == nullptr) return py::none();
                return py::cast(PatchInEdit{e, id});
            },
            py::arg("id"), "The patch as it will be, to be changed in place, or None.")
        .def("input_port", &portIn<true>, py::arg("port_id"),
             "The input in the edit, which can be changed in place, or None.")
        .def("output_port", &portIn<false>, py::arg("port_id"),
             "The output in the edit, which can be changed in place, or None.")
        .def(
            "add_input_port",
            [](Edit& e, Id id, Port const& port, Position position) {
                return e.edit.addInputPort(id, port, position.value_or(PatchEdit::kEnd));
            },
            py::arg("patch_id"), py::arg("port"), py::arg("position") = Position(),
            "Adds an input to the patch, before the one at `position`, or at the end. False "
            "where its identifier is 0 or taken.")
        .def(
            "add_output_port",
            [](Edit& e, Id id, Port const& port, Position position) {
                return e.edit.addOutputPort(id, port, position.value_or(PatchEdit::kEnd));
            },
            py::arg("patch_id"), py::arg("port"), py::arg("position") = Position(),
            "Adds an output to the patch, as `add_input_port` does an input.")
        .def(
            "remove_input_port", [](Edit& e, Id id) { return e.edit.removeInputPort(id); },
            py::arg("port_id"), "Removes the input and the connections that lead to it.")
        .def(
            "remove_output_port", [](Edit& e, Id id) { return e.edit.removeOutputPort(id); },
            py::arg("port_id"), "Removes the output and the connections that start at it.")
        .def("add_patch", &Edit::addPatch, py::arg("parent_id"), py::arg("patch"),
             py::arg("position") = Position(),
             "Adds a patch with everything in it, before the child at `position`, or at the "
             "end. False where an identifier in it is 0, repeated or taken; ValueError beyond "
             "10,000 levels.")
        .def(
            "remove_patch", [](Edit& e, Id id) { return e.edit.removePatch(id); }, py::arg("id"),
            "Removes the patch with everything in it, and its connections. The root cannot be "
            "removed.")
        .def("move_patch", &Edit::movePatch, py::arg("id"), py::arg("parent_id"),
             py::arg("position") = Position(),
             "Moves the patch to the children of another. Connections of a parent that it leaves "
             "are removed. False for the root and for a parent inside the patch; ValueError where "
             "10,000 levels may not be enough: then commit what was added and moved before.")
        .def(
            "connect", [](Edit& e, Connection const& c) { return e.edit.connect(c); },
            py::arg("connection"),
            "False where it is there already, and where its ends are not an output and an input "
            "of two children of one patch.")
        .def(
            "disconnect", [](Edit& e, Connection const& c) { return e.edit.disconnect(c); },
            py::arg("connection"), "False where there is no such connection.")
        .def(
            "fresh_patch_id", [](Edit& e) { return e.edit.freshPatchId(); },
            "An identifier that no patch has or had; each call returns another one.")
        .def(
            "fresh_port_id", [](Edit& e) { return e.edit.freshPortId(); },
            "An identifier that no port has or had; each call returns another one.")
        .def("commit", &Edit::commit,
             "The new root; it shares all unchanged lists. Raises ValueError where "
             "identifiers repeat and patches would nest deeper than 10,000 levels.");
    requireInit<Edit>();
}

// A change that owns its patches instead of pointing into two documents.
struct Change {
    PatchChange::Kind kind;
    Id id;
    py::object before;
    py::object after;
    std::string text;
};

py::object patchOf(Patch const* patch) {
    return patch != nullptr ? py::cast(*patch) : py::object(py::none());
}

void defineChanges(py::module_& module) {
    using Kind = PatchChange::Kind;
    defineEnumeration<Kind>(module, "PatchChangeKind", "What happened to a patch.",
                            {{"ADDED", Kind::Added},
                             {"REMOVED", Kind::Removed},
                             {"MOVED", Kind::Moved},
                             {"CHANGED", Kind::Changed}});
    py::class_<Change>(module, "PatchChange",
                       "One change of one patch; `str` describes it in one line.")
        .def_readonly("kind", &Change::kind, "A PatchChangeKind.")
        .def_readonly("id", &Change::id, "The patch.")
        .def_readonly("before", &Change::before, "The patch, or None for one that was added.")
        .def_readonly("after", &Change::after, "The patch, or None for one that was removed.")
        .def("__str__", [](Change const& c) { return fromString(c.text); })
        .def("__repr__", [](Change const& c) {
            return "<PatchChange: " + py::cast<std::string>(fromString(c.text)) + ">";
        });
    requireInit<Change>();
    module.def(
        "patch_changes",
        [](Patch const& before, Patch const& after) {
            py::list list;
            for (PatchChange const& c : patchChanges(before, after)) {
                list.append(py::cast(
                    Change{c.kind, c.id, patchOf(c.before), patchOf(c.after), to_string(c)}));
            }
            return list;
        },
        py::arg("before"), py::arg("after"),
        "What differs, as a list of changes; empty where the two are equal.");
}

}  // namespace

void defineEdits(py::module_& module) {
    defineParts(module);
    defineEdit(module);
    defineChanges(module);
}

}  // namespace tarn_python
