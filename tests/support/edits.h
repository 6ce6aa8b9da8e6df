// tests/support/edits.h: random edits of documents, by the library and by a model.

#ifndef TARN_TESTS_SUPPORT_EDITS_H
#define TARN_TESTS_SUPPORT_EDITS_H

#include "support/graphs.h"
#include "support/random.h"

#include <Engine/Base/patch_edit.h>

#include <algorithm>
#include <cstddef>
#include <functional>
#include <list>
#include <vector>

namespace tests {

/// A document with ordinary lists that are changed in place.
struct Model {
    Patch fields;  // Its lists are not used.
    std::vector<Port> inputs;
    std::vector<Port> outputs;
    std::vector<Connection> connections;
    std::list<Model> children;
    // Whether it existed before the edits.
    bool isOriginal = false;
    // What has changed since construction.
    bool hasOtherInputs = false;
    bool hasOtherOutputs = false;
    bool hasOtherConnections = false;
    bool hasOtherChildren = false;

    explicit Model(Patch const& patch)
        : fields(patch),
          inputs(*patch.inputs),
          outputs(*patch.outputs),
          connections(*patch.connections) {
        for (Patch const& child : *patch.children) children.emplace_back(child);
    }

    Patch toPatch() const {
        Patch result = withPorts(fields, inputs, outputs);
        std::vector<Patch> list;
        for (Model const& child : children) list.push_back(child.toPatch());
        result.children = arrayOf(std::move(list));
        result.connections = arrayOf(connections);
        return result;
    }

    void forEach(std::function<void(Model&, Model*)> const& function, Model* parent = nullptr) {
        function(*this, parent);
        for (Model& child : children) child.forEach(function, this);
    }

    struct Found {
        Model* patch = nullptr;
        Model* parent = nullptr;
    };
    Found find(unsigned long long id) {
        Found found;
        forEach([&](Model& model, Model* parent) {
            if (model.fields.id == id && id != 0 && found.patch == nullptr)
                found = {&model, parent};
        });
        return found;
    }

    /// The list with the port, and the patch with the list.
    struct FoundPort {
        std::vector<Port>* list = nullptr;
        std::vector<Port>::iterator place = {};
        Model* owner = nullptr;
        Model* parent = nullptr;
    };
    FoundPort findPort(unsigned long long id, std::vector<Port> Model::*ports) {
        FoundPort found;
        forEach([&](Model& model, Model* parent) {
            std::vector<Port>& list = model.*ports;
            auto const place =
                std::find_if(list.begin(), list.end(), [id](Port const& p) { return p.id == id; });
            if (place != list.end() && !found.owner) found = {&list, place, &model, parent};
        });
        return found;
    }
    bool isPortTaken(unsigned long long id) {
        return findPort(id, &Model::inputs).owner || findPort(id, &Model::outputs).owner;
    }

    void disconnectIf(std::function<bool(Connection const&)> const& isMeant) {
        auto const end = std::remove_if(connections.begin(), connections.end(), isMeant);
        hasOtherConnections = hasOtherConnections || end != connections.end();
        connections.erase(end, connections.end());
    }

    // The operations of `PatchEdit`, called on the root.

    bool addPort(unsigned long long patchId, Port const& port, std::size_t position,
                 std::vector<Port> Model::*ports) {
        Found const found = find(patchId);
        if (!found.patch || port.id == 0 || isPortTaken(port.id)) return false;
        std::vector<Port>& list = found.patch->*ports;
        list.insert(list.begin() + static_cast<std::ptrdiff_t>(std::min(position, list.size())),
                    port);
        (ports == &Model::inputs ? found.patch->hasOtherInputs : found.patch->hasOtherOutputs) =
            true;
        return true;
    }

    bool removePort(unsigned long long portId, std::vector<Port> Model::*ports) {
        FoundPort const found = findPort(portId, ports);
        if (!found.owner) return false;
        bool const isInput = ports == &Model::inputs;
        if (found.parent) {
            unsigned long long const owner = found.owner->fields.id;
            found.parent->disconnectIf([&](Connection const& c) {
                return isInput ? c.toPatchId == owner && c.toPortId == portId
                               : c.fromPatchId == owner && c.fromPortId == portId;
            });
        }
        found.list->erase(found.place);
        (isInput ? found.owner->hasOtherInputs : found.owner->hasOtherOutputs) = true;
        return true;
    }

    bool addPatch(unsigned long long parentId, Patch const& patch, std::size_t position) {
        Found const found = find(parentId);
        if (!found.patch) return false;
        Model added(patch);
        bool isNew = true;
        std::vector<unsigned long long> ids;
        std::vector<unsigned long long> portIds;
        added.forEach([&](Model& model, Model*) {
            ids.push_back(model.fields.id);
            isNew = isNew && model.fields.id != 0 && !find(model.fields.id).patch;
            for (auto const* ports : {&model.inputs, &model.outputs}) {
                for (Port const& port : *ports) {
                    portIds.push_back(port.id);
                    isNew = isNew && port.id != 0 && !isPortTaken(port.id);
                }
            }
        });
        for (auto* list : {&ids, &portIds}) {
            std::sort(list->begin(), list->end());
            isNew = isNew && std::adjacent_find(list->begin(), list->end()) == list->end();
        }
        if (!isNew) return false;
        std::list<Model>& siblings = found.patch->children;
        siblings.insert(std::next(siblings.begin(),
                                  static_cast<std::ptrdiff_t>(std::min(position, siblings.size()))),
                        std::move(added));
        found.patch->hasOtherChildren = true;
        return true;
    }

    bool removePatch(unsigned long long id) {
        Found const found = find(id);
        if (!found.parent) return false;
        leave(found, id);
        found.parent->children.remove_if([id](Model const& m) { return m.fields.id == id; });
        return true;
    }

    bool movePatch(unsigned long long id, unsigned long long parentId, std::size_t position) {
        Found const found = find(id);
        Found const target = find(parentId);
        if (!found.parent || !target.patch || found.patch->find(parentId).patch) return false;
        if (found.parent != target.patch) leave(found, id);
        std::list<Model> moved;
        std::list<Model>& siblings = found.parent->children;
        moved.splice(moved.end(), siblings,
                     std::find_if(siblings.begin(), siblings.end(),
                                  [&](Model const& m) { return &m == found.patch; }));
        std::list<Model>& others = target.patch->children;
        others.splice(std::next(others.begin(),
                                static_cast<std::ptrdiff_t>(std::min(position, others.size()))),
                      moved);
        found.parent->hasOtherChildren = true;
        target.patch->hasOtherChildren = true;
        return true;
    }

    bool connect(Connection const& connection) {
        Found const from = find(connection.fromPatchId);
        Found const to = find(connection.toPatchId);
        auto const has = [](std::vector<Port> const& ports, unsigned long long id) {
            return std::any_of(ports.begin(), ports.end(),
                               [id](Port const& p) { return p.id == id; });
        };
        if (!from.parent || from.parent != to.parent ||
            !has(from.patch->outputs, connection.fromPortId) ||
            !has(to.patch->inputs, connection.toPortId)) {
            return false;
        }
        std::vector<Connection>& list = from.parent->connections;
        if (std::find(list.begin(), list.end(), connection) != list.end()) return false;
        list.push_back(connection);
        from.parent->hasOtherConnections = true;
        return true;
    }

    bool disconnect(Connection const& connection) {
        for (unsigned long long const end : {connection.fromPatchId, connection.toPatchId}) {
            Found const found = find(end);
            if (!found.parent) continue;
            std::size_t const before = found.parent->connections.size();
            found.parent->disconnectIf([&](Connection const& c) { return c == connection; });
            if (found.parent->connections.size() != before) return true;
        }
        return false;
    }

private:
    static void leave(Found const& found, unsigned long long id) {
        found.parent->disconnectIf(
            [id](Connection const& c) { return c.fromPatchId == id || c.toPatchId == id; });
        found.parent->hasOtherChildren = true;
    }
};

/// A random document with distinct identifiers.
class AnyDocument {
public:
    explicit AnyDocument(Random& source) : random(source) {}

    Patch patch(int depth) {
        Patch result = withPorts(tests::patch(++lastPatch), ports(), ports());
        std::vector<Patch> children;
        for (std::size_t n = depth > 0 ? random.below(5) : 0; n > 0; --n) {
            children.push_back(patch(depth - 1));
        }
        std::vector<Connection> connections;
        for (std::size_t n = children.empty() ? 0 : random.below(30); n > 0; --n) {
            Patch const& from = children[random.below(children.size())];
            Patch const& to = children[random.below(children.size())];
            if (from.outputs->empty() || to.inputs->empty()) continue;
            Connection const c{from.id, from.outputs->at(random.below(from.outputs->size())).id,
                               to.id, to.inputs->at(random.below(to.inputs->size())).id};
            if (std::find(connections.begin(), connections.end(), c) == connections.end()) {
                connections.push_back(c);
            }
        }
        result.children = arrayOf(std::move(children));
        result.connections = arrayOf(std::move(connections));
        return result;
    }

    /// One of the identifiers, occasionally none of them.
    unsigned long long patchId() { return random.below(static_cast<std::size_t>(lastPatch) + 2); }
    unsigned long long portId() { return random.below(static_cast<std::size_t>(lastPort) + 2); }

    Random& random;

private:
    std::vector<Port> ports() {
        std::vector<Port> list;
        for (std::size_t n = random.below(4); n > 0; --n) list.push_back(port(++lastPort));
        return list;
    }

    unsigned long long lastPatch = 0;
    unsigned long long lastPort = 0;
};

/// Makes the same random change to both. False where they disagree about whether it is possible.
inline bool editOnce(AnyDocument& any, tarn::engine::PatchEdit& edit, Model& model) {
    Random& random = any.random;
    unsigned long long const id = any.patchId();
    unsigned long long const portId = any.portId();
    std::size_t const position =
        random.below(3) == 0 ? tarn::engine::PatchEdit::kEnd : random.below(6);
    switch (random.below(12)) {
        case 0: {
            Patch* const patch = edit.patch(id);
            Model::Found const found = model.find(id);
            if ((patch == nullptr) != (found.patch == nullptr)) return false;
            if (patch == nullptr) return true;
            patch->name = found.patch->fields.name = "n" + std::to_string(random.below(1000));
            patch->attributes["a"] = found.patch->fields.attributes["a"] = random.number();
            return true;
        }
        case 1: {
            bool const isInput = random.chance();
            Port* const port = isInput ? edit.inputPort(portId) : edit.outputPort(portId);
            auto const found = model.findPort(portId, isInput ? &Model::inputs : &Model::outputs);
            if ((port == nullptr) != (found.owner == nullptr)) return false;
            if (port == nullptr) return true;
            port->defaultValue = found.place->defaultValue = random.number();
            port->id = random.word();  // Ignored.
            (isInput ? found.owner->hasOtherInputs : found.owner->hasOtherOutputs) = true;
            return true;
        }
        case 2: {
            Port const added = port(random.chance() ? edit.freshPortId() : portId, 7);
            return edit.addInputPort(id, added, position) ==
                   model.addPort(id, added, position, &Model::inputs);
        }
        case 3: {
            Port const added = port(random.chance() ? edit.freshPortId() : portId, 8);
            return edit.addOutputPort(id, added, position) ==
                   model.addPort(id, added, position, &Model::outputs);
        }
        case 4: return edit.removeInputPort(portId) == model.removePort(portId, &Model::inputs);
        case 5: return edit.removeOutputPort(portId) == model.removePort(portId, &Model::outputs);
        case 6: {
            Patch added = random.chance() ? any.patch(1) : patch(any.patchId());
            if (random.below(4) == 0) {
                Patch copy = added;  // Repeated identifiers.
                added.children = arrayOf<Patch>({copy});
            }
            return edit.addPatch(id, added, position) == model.addPatch(id, added, position);
        }
        case 7: return random.chance() || edit.removePatch(id) == model.removePatch(id);
        case 8: {
            unsigned long long const target = any.patchId();
            return edit.movePatch(id, target, position) == model.movePatch(id, target, position);
        }
        case 9: {
            Connection c{id, portId, any.patchId(), any.portId()};
            Model::Found const from = model.find(id);
            if (from.parent && !from.patch->outputs.empty() && random.below(5) != 0) {
                Model& to = *std::next(
                    from.parent->children.begin(),
                    static_cast<std::ptrdiff_t>(random.below(from.parent->children.size())));
                c.fromPortId = from.patch->outputs[random.below(from.patch->outputs.size())].id;
                c.toPatchId = to.fields.id;
                if (!to.inputs.empty()) c.toPortId = to.inputs[random.below(to.inputs.size())].id;
            }
            return edit.connect(c) == model.connect(c);
        }
        default: {
            Connection c{id, portId, any.patchId(), any.portId()};
            Model::Found const found = model.find(id);
            if (found.patch && !found.patch->connections.empty()) {
                c = found.patch->connections[random.below(found.patch->connections.size())];
            }
            if (random.chance()) return edit.disconnect(c) == model.disconnect(c);
            return edit.connect(c) == model.connect(c);
        }
    }
}

}  // namespace tests

#endif
