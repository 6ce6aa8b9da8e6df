#include "marks.h"

#include <Engine/Base/patch_edit.h>
#include <Engine/Base/patch_index.h>

using namespace tarn::engine;

std::string kindOfChange(PatchChange::Kind kind) {
    switch (kind) {
        case PatchChange::Kind::Added: return "added";
        case PatchChange::Kind::Removed: return "removed";
        case PatchChange::Kind::Moved: return "moved";
        case PatchChange::Kind::Changed: return "changed";
    }
    return "";
}

std::string signOfChange(std::string const& kind) {
    if (kind == "added") return "+";
    if (kind == "removed") return "\u2212";
    return kind == "moved" ? ">" : "~";
}

Marks marksOf(Patch const& before, Patch const& after) {
    Marks marks;
    marks.changes = patchChanges(before, after);
    PatchEdit edit{PatchIndex(after)};
    for (PatchChange const& change : marks.changes) {
        // A moved patch may be changed too.
        marks.kinds.emplace(change.id, kindOfChange(change.kind));
        marks.words[change.id].push_back(to_string(change));
        marks.added.insert(change.connectionsAdded.begin(), change.connectionsAdded.end());
        if (!change.connectionsRemoved.empty())
            marks.removed[change.id] = change.connectionsRemoved;
        // Inside of another that was removed it is shown already.
        if (change.kind == PatchChange::Kind::Removed) {
            edit.addPatch(change.parentBefore->id, *change.before);
        }
    }
    marks.shown = edit.commit();
    return marks;
}
