// Patches, their index, edits and changes.
//
// A patch is known by its address: JavaScript keeps the root that it lives in for as long as it has
// it.

#include "graphs.h"
#include "native.h"
#include "wire.h"

#include <Engine/Base/base.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

using namespace tarn::engine;
using emscripten::val;

namespace web {

namespace {

using Bytes = std::string;
using Address = std::uintptr_t;

Patch const& patchAt(Address address) { return *reinterpret_cast<Patch const*>(address); }
Address addressOf(Patch const* patch) { return reinterpret_cast<Address>(patch); }

Root makeRoot(Bytes const& patch) { return Root(Reader(patch).patch()); }
Address rootAddress(Root const& root) { return addressOf(root.patch.get()); }

// All of a patch but its children, then their addresses.
val patchRecord(Address address) {
    Patch const& patch = patchAt(address);
    Writer out;
    out.integer(patch.id).integer(patch.builtin).text(patch.name).text(patch.descriptor);
    out.data(patch.attributes).modelLayer(patch.modelLayer);
    out.ports(*patch.inputs).ports(*patch.outputs).count(patch.connections->size());
    for (Connection const& connection : *patch.connections) out.connection(connection);
    out.count(patch.children->size());
    for (Patch const& child : *patch.children) out.count(addressOf(&child));
    return bytesOf(out.bytes);
}
bool patchEquals(Address a, Address b) { return patchAt(a) == patchAt(b); }
Address findPatch(Address root, unsigned low, unsigned high) {
    return addressOf(findPatchRecursive(patchAt(root), idOf(low, high)));
}

val optionalPort(Port const* port) {
    return port == nullptr ? val::null() : bytesOf(Writer().port(*port).bytes);
}
val inputForTag(Address patch, unsigned low, unsigned high) {
    return optionalPort(inPortForTag(patchAt(patch), idOf(low, high)));
}
val outputForTag(Address patch, unsigned low, unsigned high) {
    return optionalPort(outPortForTag(patchAt(patch), idOf(low, high)));
}

PatchIndex makeIndex(Address root) { return PatchIndex(patchAt(root)); }
void updateIndex(PatchIndex& index, Address root) { index.update(patchAt(root)); }
// 0 for none, and 1 for the root, which is in another place there.
Address inIndex(PatchIndex const& index, Patch const* patch) {
    return patch == &index.root() ? 1 : addressOf(patch);
}
Address indexPatch(PatchIndex const& index, unsigned low, unsigned high) {
    return inIndex(index, index.findPatch(idOf(low, high)));
}
Address indexParent(PatchIndex const& index, unsigned low, unsigned high) {
    return inIndex(index, index.parentOf(idOf(low, high)));
}
Address indexOwner(PatchIndex const& index, unsigned low, unsigned high) {
    return inIndex(index, index.ownerOfPort(idOf(low, high)));
}
val indexInput(PatchIndex const& index, unsigned low, unsigned high) {
    return optionalPort(index.findInputPort(idOf(low, high)));
}
val indexOutput(PatchIndex const& index, unsigned low, unsigned high) {
    return optionalPort(index.findOutputPort(idOf(low, high)));
}
val connections(ConnectionView const& view) {
    Writer out;
    out.count(view.size());
    for (Connection const& connection : view) out.connection(connection);
    return bytesOf(out.bytes);
}
val indexOutgoing(PatchIndex const& index, unsigned low, unsigned high) {
    return connections(index.outgoingConnections(idOf(low, high)));
}
val indexIncoming(PatchIndex const& index, unsigned low, unsigned high) {
    Connection const* const found = index.incomingConnection(idOf(low, high));
    return found == nullptr ? val::null() : bytesOf(Writer().connection(*found).bytes);
}
val indexIncomingToPatch(PatchIndex const& index, unsigned low, unsigned high) {
    return connections(index.incomingConnectionsToPatch(idOf(low, high)));
}
val indexOutgoingFromPatch(PatchIndex const& index, unsigned low, unsigned high) {
    return connections(index.outgoingConnectionsFromPatch(idOf(low, high)));
}

PatchEdit makeEdit(PatchIndex const& index) { return PatchEdit(index); }
Address editPatch(PatchEdit& edit, unsigned low, unsigned high) {
    return addressOf(edit.patch(idOf(low, high)));
}
Port* portOf(PatchEdit& edit, bool isInput, unsigned long long id) {
    return isInput ? edit.inputPort(id) : edit.outputPort(id);
}
val editPort(PatchEdit& edit, bool isInput, unsigned low, unsigned high) {
    return optionalPort(portOf(edit, isInput, idOf(low, high)));
}

// The field of a patch that `Reader` finds in the bytes; false where there is no such patch.
bool setPatchField(PatchEdit& edit, unsigned low, unsigned high, std::string const& field,
                   Bytes const& content) {
    Patch* const patch = edit.patch(idOf(low, high));
    if (patch == nullptr) return false;
    Reader in(content);
    if (field == "builtin") patch->builtin = in.integer();
    if (field == "name") patch->name = in.text();
    if (field == "descriptor") patch->descriptor = in.text();
    if (field == "attributes") patch->attributes = in.map();
    if (field == "modelLayer") patch->modelLayer = in.modelLayer();
    return true;
}
bool setPortField(PatchEdit& edit, bool isInput, unsigned low, unsigned high,
                  std::string const& field, Bytes const& content) {
    Port* const port = portOf(edit, isInput, idOf(low, high));
    if (port == nullptr) return false;
    Reader in(content);
    if (field == "tag") port->tag = in.integer();
    if (field == "name") port->name = in.text();
    if (field == "typeInfo") port->typeInfo = in.typeInfo();
    if (field == "defaultValue") port->defaultValue = in.value();
    if (field == "attributes") port->attributes = in.map();
    return true;
}

// A negative position is the end.
std::size_t placeOf(double position) {
    return position < 0 ? PatchEdit::kEnd : static_cast<std::size_t>(position);
}
bool addPort(PatchEdit& edit, bool isInput, unsigned low, unsigned high, Bytes const& port,
             double position) {
    Port added = Reader(port).port();
    unsigned long long const patch = idOf(low, high);
    return isInput ? edit.addInputPort(patch, std::move(added), placeOf(position))
                   : edit.addOutputPort(patch, std::move(added), placeOf(position));
}
bool removePort(PatchEdit& edit, bool isInput, unsigned low, unsigned high) {
    unsigned long long const id = idOf(low, high);
    return isInput ? edit.removeInputPort(id) : edit.removeOutputPort(id);
}
bool addPatch(PatchEdit& edit, unsigned low, unsigned high, Address patch, double position) {
    return edit.addPatch(idOf(low, high), patchAt(patch), placeOf(position));
}
bool removePatch(PatchEdit& edit, unsigned low, unsigned high) {
    return edit.removePatch(idOf(low, high));
}
bool movePatch(PatchEdit& edit, unsigned low, unsigned high, unsigned parentLow,
               unsigned parentHigh, double position) {
    return edit.movePatch(idOf(low, high), idOf(parentLow, parentHigh), placeOf(position));
}
bool connect(PatchEdit& edit, Bytes const& connection) {
    return edit.connect(Reader(connection).connection());
}
bool disconnect(PatchEdit& edit, Bytes const& connection) {
    return edit.disconnect(Reader(connection).connection());
}
std::string freshPatchId(PatchEdit& edit) { return std::to_string(edit.freshPatchId()); }
std::string freshPortId(PatchEdit& edit) { return std::to_string(edit.freshPortId()); }
Root commit(PatchEdit& edit) { return Root(edit.commit()); }

// For each change its kind, its patch's identifier, both addresses and its text.
val changes(Address before, Address after) {
    Writer out;
    std::vector<PatchChange> const list = patchChanges(patchAt(before), patchAt(after));
    out.count(list.size());
    for (PatchChange const& change : list) {
        out.byte(static_cast<unsigned char>(change.kind)).integer(change.id);
        out.count(addressOf(change.before)).count(addressOf(change.after));
        out.text(to_string(change));
    }
    return bytesOf(out.bytes);
}
std::string changesText(Address before, Address after) {
    return to_string(patchChanges(patchAt(before), patchAt(after)));
}

}  // namespace

EMSCRIPTEN_BINDINGS(graphs) {
    emscripten::class_<Root>("Root");
    emscripten::class_<PatchIndex>("Index");
    emscripten::class_<PatchEdit>("Edit");
    native<&makeRoot>("makeRoot");
    native<&rootAddress>("rootAddress");
    native<&patchRecord>("patchRecord");
    native<&patchEquals>("patchEquals");
    native<&findPatch>("findPatchRecursive");
    native<&inputForTag>("inPortForTag");
    native<&outputForTag>("outPortForTag");
    native<&makeIndex>("makeIndex");
    native<&updateIndex>("updateIndex");
    native<&indexPatch>("indexPatch");
    native<&indexParent>("indexParent");
    native<&indexOwner>("indexOwner");
    native<&indexInput>("indexInput");
    native<&indexOutput>("indexOutput");
    native<&indexOutgoing>("indexOutgoing");
    native<&indexIncoming>("indexIncoming");
    native<&indexIncomingToPatch>("indexIncomingToPatch");
    native<&indexOutgoingFromPatch>("indexOutgoingFromPatch");
    native<&makeEdit>("makeEdit");
    native<&editPatch>("editPatch");
    native<&editPort>("editPort");
    native<&setPatchField>("setPatchField");
    native<&setPortField>("setPortField");
    native<&addPort>("addPort");
    native<&removePort>("removePort");
    native<&addPatch>("addPatch");
    native<&removePatch>("removePatch");
    native<&movePatch>("movePatch");
    native<&connect>("connect");
    native<&disconnect>("disconnect");
    native<&freshPatchId>("freshPatchId");
    native<&freshPortId>("freshPortId");
    native<&commit>("commit");
    native<&changes>("patchChanges");
    native<&changesText>("patchChangesText");
}

}  // namespace web
