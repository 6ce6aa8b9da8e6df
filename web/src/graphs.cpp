// Patches, indexes, edits and changes.

#include "graphs.h"
#include "native.h"
#include "wire.h"

#include <Engine/Base/base.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <unordered_map>
#include <unordered_set>
#include <utility>
#include <vector>

using namespace tarn::engine;
using emscripten::val;

namespace web {

namespace {

using Bytes = std::string;

// The same limit as in graphs.js and for documents.
constexpr std::size_t kDeepest = 1000;

Address addressOf(Patch const* patch) { return reinterpret_cast<Address>(patch); }

Root makeRoot(Bytes const& patch) { return Root(Reader(patch).patch()); }
Address rootAddress(Root const& root) { return addressOf(root.patch.get()); }

// A patch without its children, followed by their addresses.
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
// 0 for none and 1 for the root, whose address is different there.
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

// An edit that tracks the depth of patches: destroying a graph is recursive, and browsers have
// small stacks.
class Edit {
public:
    explicit Edit(PatchIndex const& index)
        : changes(index), before(std::make_unique<PatchIndex>(index)) {}

    PatchEdit changes;

    // Whether a patch with this many levels may be added there.
    bool fits(unsigned long long parent, std::size_t levels) const {
        return depthOf(parent) + levels <= kDeepest;
    }
    static std::size_t levelsOf(Patch const& added) {
        return levelsBelow(added.id, &added, nullptr);
    }
    // The levels of a patch in the edit. Removed patches still count.
    std::size_t levelsOf(unsigned long long id) const {
        return levelsBelow(id, before->findPatch(id), this);
    }

    void wasMoved(unsigned long long id, unsigned long long parent) {
        parents[id] = parent;
        children[parent].insert(id);
    }
    void wasAdded(Patch const& added, unsigned long long parent) {
        std::vector<std::pair<Patch const*, unsigned long long>> pending{{&added, parent}};
        while (!pending.empty()) {
            auto const [patch, above] = pending.back();
            pending.pop_back();
            wasMoved(patch->id, above);
            for (Patch const& child : *patch->children) pending.emplace_back(&child, patch->id);
        }
    }

    Root commit() {
        before = nullptr;  // Updating an index that shares its tables is slow.
        return Root(changes.commit());
    }
    bool isDone() const { return before == nullptr; }

private:
    // The levels of a patch, before or in the edit. Stops at the limit: with repeated identifiers,
    // a moved patch may seem to contain itself.
    static std::size_t levelsBelow(unsigned long long id, Patch const* patch, Edit const* edit) {
        struct Open {
            unsigned long long id;
            Patch const* patch;  // Null for an added patch.
            std::size_t level;
        };
        std::size_t levels = 0;
        std::vector<Open> pending{{id, patch, 1}};
        while (!pending.empty() && levels <= kDeepest) {
            Open const top = pending.back();
            pending.pop_back();
            levels = std::max(levels, top.level);
            if (top.patch != nullptr) {
                for (Patch const& child : *top.patch->children) {
                    bool const isElsewhere = edit != nullptr && edit->parents.count(child.id) != 0;
                    if (!isElsewhere) pending.push_back({child.id, &child, top.level + 1});
                }
            }
            if (edit == nullptr) continue;
            auto const further = edit->children.find(top.id);
            if (further == edit->children.end()) continue;
            for (unsigned long long const child : further->second) {
                if (edit->parents.at(child) != top.id) continue;
                pending.push_back({child, edit->before->findPatch(child), top.level + 1});
            }
        }
        return levels;
    }

    std::size_t depthOf(unsigned long long id) const {
        std::size_t depth = 1;
        for (; depth <= kDeepest; ++depth) {
            auto const moved = parents.find(id);
            if (moved != parents.end()) {
                id = moved->second;
            } else if (Patch const* const parent = before->parentOf(id)) {
                id = parent->id;
            } else {
                break;
            }
        }
        return depth;
    }

    std::unique_ptr<PatchIndex> before;
    // For added or moved patches.
    std::unordered_map<unsigned long long, unsigned long long> parents;
    std::unordered_map<unsigned long long, std::unordered_set<unsigned long long>> children;
};

Edit makeEdit(PatchIndex const& index) { return Edit(index); }
Address editPatch(Edit& edit, unsigned low, unsigned high) {
    return addressOf(edit.changes.patch(idOf(low, high)));
}
Port* portOf(Edit& edit, bool isInput, unsigned long long id) {
    return isInput ? edit.changes.inputPort(id) : edit.changes.outputPort(id);
}
val editPort(Edit& edit, bool isInput, unsigned low, unsigned high) {
    return optionalPort(portOf(edit, isInput, idOf(low, high)));
}

// Sets the field that `Reader` finds in the bytes; false where the patch does not exist.
bool setPatchField(Edit& edit, unsigned low, unsigned high, std::string const& field,
                   Bytes const& content) {
    Patch* const patch = edit.changes.patch(idOf(low, high));
    if (patch == nullptr) return false;
    Reader in(content);
    if (field == "builtin") patch->builtin = in.integer();
    if (field == "name") patch->name = in.text();
    if (field == "descriptor") patch->descriptor = in.text();
    if (field == "attributes") patch->attributes = in.map();
    if (field == "modelLayer") patch->modelLayer = in.modelLayer();
    return true;
}
bool setPortField(Edit& edit, bool isInput, unsigned low, unsigned high, std::string const& field,
                  Bytes const& content) {
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

// A negative position and one beyond the list mean the end.
std::size_t placeOf(double position) {
    bool const isPlace = position >= 0 && position < static_cast<double>(PatchEdit::kEnd);
    return isPlace ? static_cast<std::size_t>(position) : PatchEdit::kEnd;
}
bool addPort(Edit& edit, bool isInput, unsigned low, unsigned high, Bytes const& port,
             double position) {
    Port added = Reader(port).port();
    unsigned long long const patch = idOf(low, high);
    return isInput ? edit.changes.addInputPort(patch, std::move(added), placeOf(position))
                   : edit.changes.addOutputPort(patch, std::move(added), placeOf(position));
}
bool removePort(Edit& edit, bool isInput, unsigned low, unsigned high) {
    unsigned long long const id = idOf(low, high);
    return isInput ? edit.changes.removeInputPort(id) : edit.changes.removeOutputPort(id);
}
// The results for graphs.js when a patch is added or moved.
constexpr int kRefused = 0;
constexpr int kDone = 1;
constexpr int kTooDeep = 2;

int addPatch(Edit& edit, unsigned low, unsigned high, Address patch, double position) {
    Patch const& added = patchAt(patch);
    unsigned long long const parent = idOf(low, high);
    if (!edit.isDone() && !edit.fits(parent, Edit::levelsOf(added))) return kTooDeep;
    if (!edit.changes.addPatch(parent, added, placeOf(position))) return kRefused;
    edit.wasAdded(added, parent);
    return kDone;
}
bool removePatch(Edit& edit, unsigned low, unsigned high) {
    return edit.changes.removePatch(idOf(low, high));
}
int movePatch(Edit& edit, unsigned low, unsigned high, unsigned parentLow, unsigned parentHigh,
              double position) {
    unsigned long long const id = idOf(low, high);
    unsigned long long const parent = idOf(parentLow, parentHigh);
    if (!edit.isDone() && !edit.fits(parent, edit.levelsOf(id))) return kTooDeep;
    if (!edit.changes.movePatch(id, parent, placeOf(position))) return kRefused;
    edit.wasMoved(id, parent);
    return kDone;
}
bool connect(Edit& edit, Bytes const& connection) {
    return edit.changes.connect(Reader(connection).connection());
}
bool disconnect(Edit& edit, Bytes const& connection) {
    return edit.changes.disconnect(Reader(connection).connection());
}
std::string freshPatchId(Edit& edit) { return std::to_string(edit.changes.freshPatchId()); }
std::string freshPortId(Edit& edit) { return std::to_string(edit.changes.freshPortId()); }
Root commit(Edit& edit) { return edit.commit(); }

// For each change: its kind, its patch's identifier, both addresses and its description.
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

}  // namespace

EMSCRIPTEN_BINDINGS(graphs) {
    emscripten::class_<Root>("Root");
    emscripten::class_<PatchIndex>("Index");
    emscripten::class_<Edit>("Edit");
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
}

}  // namespace web
