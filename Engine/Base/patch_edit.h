// Engine/Base/patch_edit.h: edits a document, which itself stays unchanged.
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

/// Collects changes to the document of an index and makes a new root from them. The document, its
/// index and their values stay unchanged.
///
/// `commit` copies a list at most once, however many changes touch it: the lists that are changed,
/// and the lists on the path from the root to them. The new root shares every other list with the
/// old one. A list is copied record by record, so an edit costs the number of siblings of the
/// change, on each level above it: keep groups small.
///
/// A call that names something that does not exist, is already in use or does not fit returns false
/// or null and changes nothing. A failing allocation throws and changes nothing. Where identifiers
/// repeat, a call affects the patch or port that the index finds, until that is removed. Each call
/// takes constant time on average, plus the lists of the patch that it changes and the levels above
/// it. Not thread-safe.
class PatchEdit {
public:
    /// A position after all others.
    static constexpr std::size_t kEnd = std::numeric_limits<std::size_t>::max();

    /// Shares the tables of the index until `commit`; the index may be updated, assigned to or
    /// destroyed before.
    TARN_API explicit PatchEdit(PatchIndex const& index);
    /// A moved-from edit may only be assigned to or destroyed.
    TARN_API PatchEdit(PatchEdit&& other) noexcept;
    TARN_API PatchEdit& operator=(PatchEdit&& other) noexcept;
    TARN_API ~PatchEdit();

    /// The patch (the port) after the changes so far, to be changed in place; null where it does
    /// not exist or is removed. The lists of the patch are those from before the edit, without what
    /// the functions below changed in them. Valid until `commit`, whatever else is changed. The
    /// `id` cannot be changed: what is written there is ignored. A list that is assigned to the
    /// patch replaces the former one and all changes made to it; the edit does not look into it.
    /// (All empty lists of new records and of `arrayOf` are the same object: assigning it where it
    /// was changes nothing.)
    TARN_API Patch* patch(unsigned long long id);
    TARN_API Port* inputPort(unsigned long long portId);
    TARN_API Port* outputPort(unsigned long long portId);

    /// Adds a port to the patch, before the one at `position`. False where the port's identifier is
    /// 0 or in use.
    TARN_API bool addInputPort(unsigned long long patchId, Port port, std::size_t position = kEnd);
    TARN_API bool addOutputPort(unsigned long long patchId, Port port, std::size_t position = kEnd);
    /// Removes the port, and the connections to it (from it) in the parent of its patch.
    TARN_API bool removeInputPort(unsigned long long portId);
    TARN_API bool removeOutputPort(unsigned long long portId);

    /// Adds a patch, with everything in it, to the children of another, before the one at
    /// `position`. False where an identifier in it is 0, repeats or is in use. Linear in its size.
    TARN_API bool addPatch(unsigned long long parentId, Patch patch, std::size_t position = kEnd);
    /// Removes the patch with everything in it, and the connections of its parent to and from it.
    /// The root cannot be removed.
    TARN_API bool removePatch(unsigned long long id);
    /// Moves the patch to the children of another, before the one that is then at `position`. Where
    /// it leaves a parent, that parent's connections to and from it are removed. False for the
    /// root, and for a parent that is the patch itself or inside it.
    TARN_API bool movePatch(unsigned long long id, unsigned long long parentId,
                            std::size_t position = kEnd);

    /// Adds the connection; an input may have several. False where the connection exists, and where
    /// its ends are not an output and an input of children of the same patch. (Both may belong to
    /// one child.)
    TARN_API bool connect(Connection connection);
    /// Removes every occurrence of the connection from the parent of one of its ends; the other end
    /// need not exist. False where there is none.
    TARN_API bool disconnect(Connection connection);

    /// An identifier that never occurred in the old document or in this edit, also not in what was
    /// removed; each call returns another one. 0 where there is none left.
    TARN_API unsigned long long freshPatchId();
    TARN_API unsigned long long freshPortId();

    /// Makes the new root. A change that was undone, to the last bit, is no change: a root without
    /// changes has the lists of the old one. Afterwards the edit is finished: every function
    /// returns null or false, and `commit` returns the same root again.
    TARN_API Patch commit();

private:
    class State;
    std::unique_ptr<State> state;
};

}  // namespace tarn::engine

#endif
