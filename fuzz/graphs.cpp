// Random trees with repeated identifiers: queries against a model and an index, edits, updates and
// changes, output, equality and conversion.

#include "fuzz.h"

#include "support/graph_model.h"

#include <Engine/Base/patch_changes.h>
#include <Engine/Base/patch_edit.h>
#include <Engine/Base/patch_index.h>

#include <algorithm>
#include <sstream>

using namespace fuzz;
using namespace tarn::engine;

namespace {

std::string textOf(Patch const& patch) {
    std::string const id = std::to_string(patch.id);
    std::string text =
        "[patch:" + id + " name: " + patch.name + " builtin: " + std::to_string(patch.builtin);
    bool const hasPorts = patch.inputs->size() + patch.outputs->size() > 0;
    if (!hasPorts) text += "]";
    for (auto const& list : {patch.inputs, patch.outputs}) {
        for (Port const& port : *list) {
            text += "  [" + port.name + ":" + std::to_string(port.id) +
                    " tag: " + std::to_string(port.tag) +
                    " typeInfo: [type: float] defaultValue: 0]\n";
        }
    }
    for (Patch const& child : *patch.children) text += textOf(child) + "\n";
    for (Connection const& connection : *patch.connections) {
        text += "[connection:" + std::to_string(connection.fromPortId) + "->" +
                std::to_string(connection.toPortId) + "]\n";
    }
    return text;
}

bool samePorts(std::vector<Port> const& ports, std::vector<EvalPort> const& evaluated) {
    if (ports.size() != evaluated.size()) return false;
    for (std::size_t i = 0; i < ports.size(); ++i) {
        if (ports[i].id != evaluated[i].id || ports[i].tag != evaluated[i].tag ||
            ports[i].name != evaluated[i].name || evaluated[i].values.size() != 1 ||
            evaluated[i].values[0] != ports[i].defaultValue) {
            return false;
        }
    }
    return true;
}

bool samePatches(Patch const& patch, EvalPatch const& evaluated) {
    if (patch.id != evaluated.id || patch.name != evaluated.name ||
        patch.children->size() != evaluated.children->size() ||
        !samePorts(*patch.inputs, *evaluated.inputs) ||
        !samePorts(*patch.outputs, *evaluated.outputs)) {
        return false;
    }
    for (std::size_t i = 0; i < patch.children->size(); ++i) {
        if (!samePatches((*patch.children)[i], (*evaluated.children)[i])) return false;
    }
    return true;
}

void checkView(ConnectionView const& view, std::unordered_set<Connection> const& expected) {
    check(std::unordered_set<Connection>(view.begin(), view.end()) == expected, "connections");
    check(view.size() == expected.size(), "each connection once");
    for (std::size_t i = 1; i < view.size(); ++i) {
        check(&view[i - 1] < &view[i], "connections in the order of their list");
    }
}

void checkQueries(PatchIndex const& index, unsigned long long id) {
    Patch const& root = index.root();
    Patch const* const found = tests::modelFind(root, id);
    check(findPatchRecursive(root, id) == found && index.findPatch(id) == found, "a patch");
    Patch const* const parent = found == nullptr ? nullptr : tests::modelParent(root, found);
    check(index.parentOf(id) == parent, "a parent");
    using Set = std::unordered_set<Connection>;
    checkView(index.incomingConnectionsToPatch(id),
              parent ? findIncomingConnectionsToPatch(*parent, id) : Set());
    checkView(index.outgoingConnectionsFromPatch(id),
              parent ? findOutgoingConnectionsFromPatch(*parent, id) : Set());

    check(index.findInputPort(id) == tests::modelPort(root, &Patch::inputs, id).port, "an input");
    check(index.findOutputPort(id) == tests::modelPort(root, &Patch::outputs, id).port,
          "an output");
    Patch const* const owner = tests::modelOwner(root, id);
    check(index.ownerOfPort(id) == owner, "an owner");
    Patch const* const above = owner == nullptr ? nullptr : tests::modelParent(root, owner);
    auto const incoming = above ? findIncomingConnectionToPort(*above, id) : Optional<Connection>();
    Connection const* const indexed = index.incomingConnection(id);
    check((indexed != nullptr) == incoming.hasValue(), "whether a connection comes in");
    check(indexed == nullptr || *indexed == *incoming, "the connection that comes in");

    auto const outgoing = tests::modelOutgoing(root, id);
    auto const walked = _findOutgoingConnectionsFromPort(root, id);
    check(outgoing.hasValue() == walked.hasValue(), "whether there is such an output");
    check(!outgoing || *outgoing == *walked, "the connections that go out");
    checkView(index.outgoingConnections(id), outgoing ? *outgoing : Set());
}

void checkEvaluation(EvalPatchIndex const& index, unsigned long long id) {
    EvalPatch const& root = index.root();
    EvalPatch const* const found = tests::modelFind(root, id);
    check(findPatchRecursive(root, id) == found && index.findPatch(id) == found,
          "a patch of the evaluation form");
    check(index.parentOf(id) == (found ? tests::modelParent(root, found) : nullptr),
          "a parent of the evaluation form");
}

// No edit changes the original document.
Patch edited(Input& input, PatchIndex const& index) {
    Patch const before = index.root();
    PatchEdit edit(index);
    for (std::size_t n = input.below(8); n > 0; --n) {
        unsigned long long const id = input.below(14);
        unsigned long long const other = input.below(14);
        switch (input.below(9)) {
            case 0: {
                Patch* const patch = edit.patch(id);
                if (patch != nullptr) patch->builtin = other;
                break;
            }
            case 1: {
                Port* const port = edit.inputPort(id);
                if (port != nullptr) port->tag = other;
                break;
            }
            case 2: edit.addInputPort(id, tests::port(other), input.below(3)); break;
            case 3: edit.removeOutputPort(id); break;
            case 4: edit.addPatch(id, tests::randomPatch(input, 1), input.below(3)); break;
            case 5: edit.removePatch(id); break;
            case 6: edit.movePatch(id, other, input.below(3)); break;
            case 7: edit.connect({id, input.below(12), other, input.below(12)}); break;
            default: edit.disconnect({input.below(4), id, input.below(4), other});
        }
    }
    Patch after = edit.commit();
    check(index.root() == before, "an edited document");
    return after;
}

void checkChanges(Patch const& before, Patch const& after) {
    std::vector<PatchChange> const changes = patchChanges(before, after);
    check(changes.empty() == (before == after), "changes");
    std::string const text = to_string(changes);
    check(static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n')) == changes.size(),
          "a line for each change");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input input(data, size);
    Patch root = tests::randomPatch(input, 4);
    for (std::size_t levels = input.below(50); levels > 0; --levels) {
        root = tests::patch(input.below(12), {std::move(root)});
    }
    Patch const other = tests::randomPatch(input, 2);

    std::ostringstream stream;
    stream << root;
    std::string const text = textOf(root);
    check(stream.str() == text, "debug output");

    EvalPatch const evaluated(root);
    check(samePatches(root, evaluated), "conversion");
    check(evaluated == EvalPatch(root), "equality of conversions");
    // The output shows everything that random patches differ in, except the patches of connections.
    if (root == other) check(text == textOf(other), "equality");
    check(root == Patch(root) && !(root != Patch(root)), "equality with a copy");

    PatchIndex const index(root);
    EvalPatchIndex const evaluatedIndex(evaluated);
    for (unsigned long long id = 0; id < 14; ++id) {
        checkQueries(index, id);
        checkEvaluation(evaluatedIndex, id);
    }

    Patch const next = edited(input, index);
    PatchIndex updated(root);
    for (Patch const& state : {next, other, edited(input, PatchIndex(other)), root}) {
        checkChanges(updated.root(), state);
        updated.update(state);
        for (unsigned long long id = 0; id < 14; ++id) checkQueries(updated, id);
    }
    return 0;
}
