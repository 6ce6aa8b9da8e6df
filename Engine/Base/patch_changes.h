// Engine/Base/patch_changes.h: the differences between two documents.
//
//     for (PatchChange const& change : patchChanges(before, after)) std::cout << change << "\n";

#ifndef TARN_ENGINE_BASE_PATCH_CHANGES_H
#define TARN_ENGINE_BASE_PATCH_CHANGES_H

#include <Engine/Base/export.h>
#include <Engine/Base/patch.h>

#include <iosfwd>
#include <string>
#include <vector>

namespace tarn::engine {

/// The fields of a port that may differ.
enum class PortField : unsigned char {
    Tag = 0,
    Name = 1,
    TypeInfo = 2,
    DefaultValue = 3,
    Attributes = 4,
};

/// The fields of a patch that may differ, in addition to its ports and connections. An order
/// differs where the ports, connections or children that are in both documents stand in another
/// order.
enum class PatchField : unsigned char {
    /// Only for the root: all other patches are matched by their identifiers.
    Id = 0,
    Builtin = 1,
    Descriptor = 2,
    ModelLayer = 3,
    Name = 4,
    Attributes = 5,
    InputOrder = 6,
    OutputOrder = 7,
    ConnectionOrder = 8,
    ChildOrder = 9,
};

/// An input or output that was added to a patch, removed from it or changed.
struct PortChange {
    /// `before` is null for an added port, `after` for a removed one.
    Port const* before = nullptr;
    Port const* after = nullptr;
    /// True for an input, false for an output.
    bool isInput = false;
    /// The fields that differ, where the port is in both; ordered by enumerator.
    std::vector<PortField> fields = {};

    /// The identifier of the port.
    unsigned long long id() const { return (before != nullptr ? before : after)->id; }
};

/// One change of one patch. Points into the two documents and lives as long as they do.
struct PatchChange {
    /// Whether the patch is in one document only, has another parent, or differs in itself. A patch
    /// may be both moved and changed.
    enum class Kind : unsigned char { Added = 0, Removed = 1, Moved = 2, Changed = 3 };

    /// The kind of change, and the identifier of the patch. A root with another identifier has the
    /// former one here.
    Kind kind = Kind::Changed;
    unsigned long long id = 0;
    /// The patch in both documents; `before` is null for an added one, `after` for a removed one.
    Patch const* before = nullptr;
    Patch const* after = nullptr;
    /// The parents; null for the root, and where the patch is null.
    Patch const* parentBefore = nullptr;
    Patch const* parentAfter = nullptr;

    /// For `Changed` only: what differs. Fields are ordered by enumerator, inputs come before
    /// outputs and removed ports before the others; connections are those of the patch's children.
    std::vector<PatchField> fields = {};
    std::vector<PortChange> ports = {};
    std::vector<Connection> connectionsAdded = {};
    std::vector<Connection> connectionsRemoved = {};
};

/// The changes that lead from `before` to `after`; empty exactly where the two are equal. Patches
/// and ports are matched by their identifiers. Repeated identifiers are matched in order, as far as
/// they are in the same list. Everything is compared as `==` does. Changes of an added or removed
/// patch are followed by those of the patches inside it. Comparing in the other direction gives the
/// same changes in another order, with before and after exchanged.
///
/// Lists that are the same object are skipped: comparing a document with its edited copy costs what
/// the edit copied; otherwise it is linear. (Where patches are added while others are removed,
/// everything in the removed ones is searched.) Not recursive.
TARN_API std::vector<PatchChange> patchChanges(Patch const& before, Patch const& after);

/// One line for people, without a line end: what happened to which patch, with names and values.
/// Long values and more than twenty connections are cut. Example: `changed patch 7 "fade": input 31
/// "progress" default 0.5 -> 0.75`
TARN_API std::string to_string(PatchChange const& change);
/// All changes, one line each, with line ends.
TARN_API std::string to_string(std::vector<PatchChange> const& changes);

/// Writes `to_string(change)`.
TARN_API std::ostream& operator<<(std::ostream& stream, PatchChange const& change);

}  // namespace tarn::engine

#endif
