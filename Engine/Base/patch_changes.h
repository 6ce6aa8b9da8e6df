// Engine/Base/patch_changes.h: what differs between two documents.
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

/// What may differ in a port that is in both documents.
enum class PortField : unsigned char {
    Tag = 0,
    Name = 1,
    TypeInfo = 2,
    DefaultValue = 3,
    Attributes = 4,
};

/// What may differ in a patch that is in both documents, beside its ports and connections. The
/// orders are those of what is in both: of the ports, the connections, the children.
enum class PatchField : unsigned char {
    /// Of the root alone: all others are known by it.
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

/// An input or an output that was added to a patch, removed from it or changed.
struct PortChange {
    /// An added one is null before, a removed one after.
    Port const* before = nullptr;
    Port const* after = nullptr;
    /// Otherwise it is an output.
    bool isInput = false;
    /// What differs, where the port is in both; in the order of the enumerators.
    std::vector<PortField> fields = {};

    /// That of the port.
    unsigned long long id() const { return (before != nullptr ? before : after)->id; }
};

/// One change of one patch. Points into the two documents, and lives as long as they do.
struct PatchChange {
    /// A patch that is in one document only; one that has another parent; one that differs in what
    /// is its own. A patch may be moved and changed.
    enum class Kind : unsigned char { Added = 0, Removed = 1, Moved = 2, Changed = 3 };

    /// What happened, and the identifier of the patch: of a root that has another one, the former.
    Kind kind = Kind::Changed;
    unsigned long long id = 0;
    /// The patch; null before for an added one, null after for a removed one.
    Patch const* before = nullptr;
    Patch const* after = nullptr;
    /// Those whose children it is one of; null for the root, and where the patch is null.
    Patch const* parentBefore = nullptr;
    Patch const* parentAfter = nullptr;

    /// What is changed, for `Changed` alone. Fields in the order of the enumerators; inputs before
    /// outputs, removed ports before the others; connections of the patch's children.
    std::vector<PatchField> fields = {};
    std::vector<PortChange> ports = {};
    std::vector<Connection> connectionsAdded = {};
    std::vector<Connection> connectionsRemoved = {};
};

/// What differs, as changes from `before` to `after`; empty exactly where the two are equal.
/// Patches and ports are known by their identifiers, those that repeat by their turns as far as
/// they stand in one place; everything is compared as `==` does. A patch that is added or removed
/// with others inside it is followed by theirs. Changes of the same documents the other way round
/// are the same with before and after exchanged, in another order.
///
/// Lists that are one object are not looked at: to compare a document with its edited copy costs
/// what the edit copied, else it is linear. (Where patches are added while others are removed, all
/// that is in the removed ones is looked at.) Nothing recurses.
TARN_API std::vector<PatchChange> patchChanges(Patch const& before, Patch const& after);

/// A line for people, without its end: what happened to which patch, with names and values; long
/// values are cut, and so are more than twenty connections. `changed patch 7 "fade": input 31
/// "progress" default 0.5 -> 0.75`
TARN_API std::string to_string(PatchChange const& change);
/// All of them, each on a line of its own with its end.
TARN_API std::string to_string(std::vector<PatchChange> const& changes);

/// Writes that line.
TARN_API std::ostream& operator<<(std::ostream& stream, PatchChange const& change);

}  // namespace tarn::engine

#endif
