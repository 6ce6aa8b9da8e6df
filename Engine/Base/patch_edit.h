// Engine/Base/patch_edit.h: changes to a document, made at once.
//
//     PatchIndex index(root);
//     PatchEdit edit(index);
//     if (Port* port = edit.inputPort(31)) port->defaultValue = 0.75;
//     edit.connect({2, 21, 3, 31});
//     Patch const next = edit.commit();  // `root` is as it was.

#ifndef TARN_ENGINE_BASE_PATCH_EDIT_H
#define TARN_ENGINE_BASE_PATCH_EDIT_H

#include <Engine/Base/export.h>
#include <Engine/Base/patch.h>
#include <Engine/Base/patch_index.h>

#include <cstddef>
#include <limits>
#include <memory>

namespace tarn::engine {

/// Collects changes to the document of an index and makes a new root of them. The document, its
/// index and their values stay as they are.
///
/// `commit` copies a list at most once, however many changes touch it: the lists on the way from
/// the root to each change, and those that are changed themselves. Every other list of the new root
/// is the very object that the former one has. A list is copied record by record, so that an edit
/// costs what stands beside the change, on each level above it: groups are best kept small.
///
/// What is not there, what is taken or what does not fit answers false or null and changes nothing;
/// so does a failing allocation, which throws. Where identifiers repeat, the patch and the port are
/// those that the index finds, until they are removed. Each call takes constant time on average,
/// but for the lists of the patch that it changes and for the levels above it. One thread at a
/// time.
class PatchEdit {
public:
    /// The place behind all others.
    static constexpr std::size_t kEnd = std::numeric_limits<std::size_t>::max();

    /// Shares the tables of the index until `commit`, whatever becomes of the index.
    TARN_API explicit PatchEdit(PatchIndex const& index);
    /// One that was moved from is only to be assigned to or destroyed.
    TARN_API PatchEdit(PatchEdit&& other) noexcept;
    TARN_API PatchEdit& operator=(PatchEdit&& other) noexcept;
    TARN_API ~PatchEdit();

    /// The patch (the port) as it will be, to be changed in place; null for one that is not there
    /// or is removed. Valid until `commit`, whatever else is changed. The `id` stays, whatever is
    /// written there. Another list that is assigned to the patch takes the place of the former one
    /// and of all changes made to that; the edit knows nothing of what is in it. (All empty lists
    /// of new records and of `arrayOf` are one: assigning it where it was is no change.)
    TARN_API Patch* patch(unsigned long long id);
    TARN_API Port* inputPort(unsigned long long portId);
    TARN_API Port* outputPort(unsigned long long portId);

    /// Adds a port to the patch, ahead of the one at `position`. False where the identifier of the
    /// port is 0 or taken.
    TARN_API bool addInputPort(unsigned long long patchId, Port port, std::size_t position = kEnd);
    TARN_API bool addOutputPort(unsigned long long patchId, Port port, std::size_t position = kEnd);
    /// Removes the port, and the connections to it (from it) on the level of its patch.
    TARN_API bool removeInputPort(unsigned long long portId);
    TARN_API bool removeOutputPort(unsigned long long portId);

    /// Adds a patch, with all that is in it, to the children of another, ahead of the one at
    /// `position`. False where an identifier in it is 0, occurs twice or is taken. Linear in its
    /// size.
    TARN_API bool addPatch(unsigned long long parentId, Patch patch, std::size_t position = kEnd);
    /// Removes the patch with all that is in it, and the connections of its parent that begin or
    /// end at it. The root stays.
    TARN_API bool removePatch(unsigned long long id);
    /// Moves the patch to the children of another, ahead of the one that is then at `position`.
    /// Connections of a parent that it leaves are removed. False for the root, and for a parent
    /// that is the patch itself or inside it.
    TARN_API bool movePatch(unsigned long long id, unsigned long long parentId,
                            std::size_t position = kEnd);

    /// Adds the connection; an input may have several. False where it is there already, and where
    /// its ends are not an output and an input of two children of one patch, or of one child.
    TARN_API bool connect(Connection connection);
    /// Removes the connection, wherever it stands in the list of the patch that one of its ends is
    /// a child of. False where there is none.
    TARN_API bool disconnect(Connection connection);

    /// An identifier that neither the former document has nor this edit has seen; each call gives
    /// another. 0 where there is none left.
    TARN_API unsigned long long freshPatchId();
    TARN_API unsigned long long freshPortId();

    /// The new root. What was changed back to what it was before, to the last bit, is no change: a
    /// root without any has the lists of the former one. Afterwards the edit is done: it answers
    /// null and false, and the same root again.
    TARN_API Patch commit();

private:
    class State;
    std::unique_ptr<State> state;
};

}  // namespace tarn::engine

#endif
