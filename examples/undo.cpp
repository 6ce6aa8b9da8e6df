// A history of a document: edits, undo and redo, and what each step changed.
//
//     undo

#include <Engine/Base/patch_changes.h>
#include <Engine/Base/patch_edit.h>

#include <iostream>

using namespace tarn::engine;

// Keeps every state. States share all lists that no edit between them has changed.
class History {
public:
    explicit History(Patch root) : index(root), states{std::move(root)} {}

    PatchEdit edit() const { return PatchEdit(index); }
    void commit(PatchEdit edit) {
        states.resize(current + 1);  // Undone edits cannot be redone after a new edit.
        states.push_back(edit.commit());
        goTo(current + 1, "edit");
    }
    void undo() {
        if (current > 0) goTo(current - 1, "undo");
    }
    void redo() {
        if (current + 1 < states.size()) goTo(current + 1, "redo");
    }

private:
    void goTo(std::size_t next, char const* what) {
        std::cout << what << "\n" << to_string(patchChanges(states[current], states[next]));
        current = next;
        index.update(states[current]);
    }

    PatchIndex index;
    std::vector<Patch> states;
    std::size_t current = 0;
};

int main() {
    Patch fade{2};
    fade.name = "fade";
    fade.inputs = arrayOf<Port>({Port{21, 1, "progress", {}, 0.5}});
    Patch root{1};
    root.children = arrayOf<Patch>({fade});
    History history(root);

    PatchEdit edit = history.edit();
    edit.inputPort(21)->defaultValue = 0.75;
    edit.addPatch(1, Patch{edit.freshPatchId()});
    history.commit(std::move(edit));
    history.undo();
    history.redo();
}
