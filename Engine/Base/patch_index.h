// Engine/Base/patch_index.h: the queries over a graph, in constant time.
//
//     PatchIndex index(root);
//     for (Connection const& c : index.outgoingConnections(portId)) { follow(c); }

#ifndef TARN_ENGINE_BASE_PATCH_INDEX_H
#define TARN_ENGINE_BASE_PATCH_INDEX_H

#include <Engine/Base/export.h>
#include <Engine/Base/patch.h>

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <memory>

namespace tarn::engine {

namespace detail {
struct PatchTables;
}

/// Some of the connections of one list, each once, in the order of the list. Nothing is copied: a
/// view and its references live as long as the index that gave it.
class ConnectionView {
public:
    /// Goes forward, over and over if wanted.
    class Iterator {
    public:
        /// As the standard library wants them.
        using iterator_category = std::forward_iterator_tag;
        using value_type = Connection;
        using difference_type = std::ptrdiff_t;
        using pointer = Connection const*;
        using reference = Connection const&;

        /// Equal to nothing but its like, or at a connection of the list.
        Iterator() = default;
        Iterator(Connection const* connections, std::uint32_t const* at)
            : list(connections), position(at) {}

        /// The very connection in the list.
        reference operator*() const { return list[*position]; }
        pointer operator->() const { return &list[*position]; }
        /// One further; the second form answers where it was.
        Iterator& operator++() {
            ++position;
            return *this;
        }
        Iterator operator++(int) { return {list, position++}; }
        /// Whether both are at one place of one view.
        friend bool operator==(Iterator a, Iterator b) { return a.position == b.position; }
        friend bool operator!=(Iterator a, Iterator b) { return a.position != b.position; }

    private:
        Connection const* list = nullptr;
        std::uint32_t const* position = nullptr;
    };

    /// Empty, or of the connections of a list at `count` positions.
    ConnectionView() = default;
    ConnectionView(Connection const* connections, std::uint32_t const* positions, std::size_t count)
        : list(connections), first(positions), length(count) {}

    /// As of a container that is only read. All take constant time.
    Iterator begin() const { return {list, first}; }
    Iterator end() const { return {list, first + length}; }
    std::size_t size() const { return length; }
    bool empty() const { return length == 0; }
    Connection const& operator[](std::size_t i) const { return list[first[i]]; }

private:
    Connection const* list = nullptr;
    std::uint32_t const* first = nullptr;
    std::size_t length = 0;
};

/// Answers about a graph exactly as the walking queries of patch.h do, duplicate identifiers and
/// identifier 0 included, in constant time and without an allocation, whatever the identifiers are.
/// (`findInputPort` and `findOutputPort` search the whole graph, where the walks know a patch and
/// its children.) Building takes one pass over the patches, ports and connections.
///
/// An index shares the lists of its root, which never change: it and its answers stay valid for its
/// own life, whatever happens to the caller's record. Copies share the tables; queries may run on
/// any number of threads. One that was moved from is only to be assigned to or destroyed.
class PatchIndex {
public:
    /// Positions take 32 bits: a graph of more than a thousand million patches, ports or
    /// connections, shared lists counted wherever they occur, may throw `std::length_error`. The
    /// stack does not grow with the depth.
    TARN_API explicit PatchIndex(Patch root);

    /// The patch that the index was made of, in the place where its answers refer to it.
    TARN_API Patch const& root() const;

    /// As `findPatchRecursive(root(), id)`.
    TARN_API Patch const* findPatch(unsigned long long id) const;
    /// The patch whose `children` hold `findPatch(id)`; null for the root and for unknown ids.
    TARN_API Patch const* parentOf(unsigned long long id) const;

    /// The input (output) of this id anywhere in the graph: the first in the order in which
    /// `findPatchRecursive` looks at patches; null where there is none.
    TARN_API Port const* findInputPort(unsigned long long portId) const;
    TARN_API Port const* findOutputPort(unsigned long long portId) const;
    /// The patch of the first port of this id, in the same order, inputs before outputs.
    TARN_API Patch const* ownerOfPort(unsigned long long portId) const;

    /// The connections of `findOutgoingConnectionsFromPort(root(), portId)`.
    TARN_API ConnectionView outgoingConnections(unsigned long long portId) const;
    /// What `findIncomingConnectionToPort` finds in the parent of the port's owner, or null.
    TARN_API Connection const* incomingConnection(unsigned long long portId) const;

    /// What `findIncomingConnectionsToPatch` (`findOutgoingConnectionsFromPatch`) finds in
    /// `parentOf(id)`; empty where that is null.
    TARN_API ConnectionView incomingConnectionsToPatch(unsigned long long id) const;
    TARN_API ConnectionView outgoingConnectionsFromPatch(unsigned long long id) const;

    /// Makes this the index of another root: afterwards its answers are those of
    /// `PatchIndex(root)`. The cost follows what differs from the root before, lists that are one
    /// object not being looked at. It is that of a new index where copies share this one's tables,
    /// where identifiers repeat or a connection leads to an output, and now and then after many
    /// updates.
    ///
    /// Views from before are no longer valid, and `root()` is another patch. Pointers to patches,
    /// ports and connections live as long as the lists that they refer into: those of the former
    /// root, while somebody holds it, and all that the new one shares with it. A failing
    /// allocation leaves the index as it was. Nobody may ask this index anything meanwhile.
    TARN_API void update(Patch root);

private:
    friend class PatchEdit;
    std::shared_ptr<detail::PatchTables> tables;
};

/// The same for the evaluation form, whose lists everyone who shares them may change. The index
/// keeps the lists of its root alive, but it does not see a patch or a port that was added, removed
/// or given another identifier: its answers dangle or are wrong until `rebuild()`. Values of ports
/// may change freely.
class EvalPatchIndex {
public:
    /// Shares the lists of `root`. Costs as that of `PatchIndex`.
    TARN_API explicit EvalPatchIndex(EvalPatch root);

    /// Looks at the graph again. Afterwards the answers are those of the lists as they are now. A
    /// failing allocation leaves the index as it was.
    TARN_API void rebuild();

    /// As those of `PatchIndex`. None allocates.
    TARN_API EvalPatch const& root() const;
    TARN_API EvalPatch const* findPatch(unsigned long long id) const;
    TARN_API EvalPatch const* parentOf(unsigned long long id) const;
    TARN_API EvalPort const* findInputPort(unsigned long long portId) const;
    TARN_API EvalPort const* findOutputPort(unsigned long long portId) const;
    TARN_API EvalPatch const* ownerOfPort(unsigned long long portId) const;

private:
    struct Tables;
    std::shared_ptr<EvalPatch const> shared;
    std::shared_ptr<Tables const> tables;
};

}  // namespace tarn::engine

#endif
