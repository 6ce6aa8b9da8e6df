#include "report/marks.h"

#include <Engine/Base/patch_index.h>

#include <utility>

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

namespace {

using Removed = std::unordered_map<Patch const*, std::vector<Patch>>;

// The patch including what was removed from it and from the patches inside it.
Patch withRemoved(Patch const& patch, Removed const& removed) {
    Patch result = patch;
    std::vector<Patch> children;
    for (Patch const& child : *patch.children) children.push_back(withRemoved(child, removed));
    auto const found = removed.find(&patch);
    if (found != removed.end()) {
        children.insert(children.end(), found->second.begin(), found->second.end());
    }
    result.children = arrayOf(std::move(children));
    return result;
}

// A removed patch with the removed patches inside it.
Patch removedAlone(Patch const& patch, std::unordered_set<Patch const*> const& removed) {
    Patch result = patch;
    std::vector<Patch> children;
    for (Patch const& child : *patch.children) {
        if (removed.count(&child) != 0) children.push_back(removedAlone(child, removed));
    }
    result.children = arrayOf(std::move(children));
    return result;
}

}  // namespace

Marks marksOf(Document const& documentBefore, Document const& documentAfter) {
    Patch const& before = documentBefore.root;
    Patch const& after = documentAfter.root;
    Marks marks;
    double const rateBefore = documentBefore.info.framesPerSecond;
    double const rateAfter = documentAfter.info.framesPerSecond;
    if (rateBefore != rateAfter) {
        marks.frameRates = "changed frames per second " + Unstructured(rateBefore).toText() +
                           " -> " + Unstructured(rateAfter).toText() + "\n";
    }
    marks.changes = patchChanges(before, after);
    PatchIndex const index(after);
    std::unordered_set<Patch const*> gone;
    for (PatchChange const& change : marks.changes) {
        if (change.after == nullptr) gone.insert(change.before);
    }
    Removed removed;
    for (PatchChange const& change : marks.changes) {
        Patch const& patch = change.after != nullptr ? *change.after : *change.before;
        // The root has no box. A moved patch may also be changed.
        if (&patch != &after) marks.kinds.emplace(patch.id, kindOfChange(change.kind));
        marks.words[patch.id].push_back(to_string(change));
        marks.added.insert(change.connectionsAdded.begin(), change.connectionsAdded.end());
        if (!change.connectionsRemoved.empty()) marks.removed[patch.id] = change.connectionsRemoved;
        // Inside another removed patch it is shown there.
        if (change.after != nullptr || gone.count(change.parentBefore) != 0) continue;
        Patch const* const parent = index.findPatch(change.parentBefore->id);
        // The index has its own copy of the root.
        bool const isInRoot = change.parentBefore == &before || parent == &index.root();
        removed[isInRoot ? &after : parent].push_back(removedAlone(*change.before, gone));
    }
    marks.shown = removed.empty() ? after : withRemoved(after, removed);
    return marks;
}
