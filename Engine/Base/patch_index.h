// Engine/Base/patch_index.h: the queries of patch.h in constant time.
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
/// view and its references live as long as the index that returned it.
class ConnectionView {
public:
    /// A forward iterator; it may pass over the view several times.
    class Iterator {
    public:
        /// The types that the standard library requires.
        using iterator_category = std::forward_iterator_tag;
        using value_type = Connection;
        using difference_type = std::ptrdiff_t;
        using pointer = Connection const*;
        using reference = Connection const&;

        /// Singular: equal only to another singular iterator.
        Iterator() = default;
        Iterator(Connection const* connections, std::uint32_t const* at)
            : list(connections), position(at) {}

        /// A reference to the connection in the list.
        reference operator*() const { return list[*position]; }
        pointer operator->() const { return &list[*position]; }
        /// Advances by one; the postfix form returns the former position.
        Iterator& operator++() {
            ++position;
            return *this;
        }
        Iterator operator++(int) { return {list, position++}; }
        /// Whether both are at the same position of the same view.
        friend bool operator==(Iterator a, Iterator b) { return a.position == b.position; }
        friend bool operator!=(Iterator a, Iterator b) { return a.position != b.position; }

    private:
        Connection const* list = nullptr;
        std::uint32_t const* position = nullptr;
    };

    /// An empty view, or a view of `count` connections at the given positions of a list.
    ConnectionView() = default;
    ConnectionView(Connection const* connections, std::uint32_t const* positions, std::size_t count)
        : list(connections), first(positions), length(count) {}

    /// As for a read-only container. All take constant time.
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

/// Returns exactly what the queries of patch.h return, also for repeated identifiers and identifier
/// 0, in constant time and without an allocation. Identifiers cannot be chosen to make lookups
/// slow. (`findInputPort` and `findOutputPort` search the whole graph, while the functions of
/// patch.h search one patch and its children.) Construction takes one pass over the patches, ports
/// and connections.
///
/// An index shares the immutable lists of its root: the index and what it returns stay valid for
/// its own lifetime, whatever happens to the caller's record. Copies share the tables. Queries are
/// thread-safe. A moved-from index may only be assigned to or destroyed.
class PatchIndex {
public:
    /// Positions take 32 bits: a graph with more than a thousand million patches, ports or
    /// connections, shared lists counted wherever they occur, may throw `std::length_error`. Not
    /// recursive.
    TARN_API explicit PatchIndex(Patch root);

    /// The index's own copy of the patch that it was made from; results point to it.
    TARN_API Patch const& root() const;

    /// Same as `findPatchRecursive(root(), id)`.
    TARN_API Patch const* findPatch(unsigned long long id) const;
    /// The patch whose `children` contain `findPatch(id)`; null for the root and for unknown
    /// identifiers.
    TARN_API Patch const* parentOf(unsigned long long id) const;

    /// The input (output) with this identifier anywhere in the graph: the first in the search order
    /// of `findPatchRecursive`; null where there is none.
    TARN_API Port const* findInputPort(unsigned long long portId) const;
    TARN_API Port const* findOutputPort(unsigned long long portId) const;
    /// The patch of the first port with this identifier, in the same order, inputs before outputs.
    TARN_API Patch const* ownerOfPort(unsigned long long portId) const;

    /// The connections that `findOutgoingConnectionsFromPort(root(), portId)` finds.
    TARN_API ConnectionView outgoingConnections(unsigned long long portId) const;
    /// The connection that `findIncomingConnectionToPort` finds in the parent of the port's patch,
    /// or null.
    TARN_API Connection const* incomingConnection(unsigned long long portId) const;

    /// The connections that `findIncomingConnectionsToPatch` (`findOutgoingConnectionsFromPatch`)
    /// finds in `parentOf(id)`; empty where that is null.
    TARN_API ConnectionView incomingConnectionsToPatch(unsigned long long id) const;
    TARN_API ConnectionView outgoingConnectionsFromPatch(unsigned long long id) const;

    /// Makes this the index of another root: afterwards it is equivalent to `PatchIndex(root)`. The
    /// cost depends on what differs from the former root; lists that are the same object are
    /// skipped. It costs as much as a new index where copies share this index's tables, where
    /// identifiers repeat or a connection leads to an output, and occasionally after many updates.
    ///
    /// Invalidates views and references to the root, which is another patch afterwards. Pointers to
    /// other patches, ports and connections live as long as the lists that they point into: those
    /// of the former root as long as someone holds it, and those that the new root shares with it.
    /// A failing allocation leaves the index unchanged. Must not run concurrently with any other
    /// use of this index.
    TARN_API void update(Patch root);

private:
    friend class PatchEdit;
    std::shared_ptr<detail::PatchTables> tables;
};

/// The same for the evaluation form, whose lists can be changed by everyone who shares them. The
/// index keeps the lists of its root alive, but does not notice patches or ports that are added,
/// removed or given another identifier: until `rebuild()`, results dangle or are wrong. Values of
/// ports may change freely.
class EvalPatchIndex {
public:
    /// Shares the lists of `root`. Costs as much as a `PatchIndex`.
    TARN_API explicit EvalPatchIndex(EvalPatch root);

    /// Builds the tables again from the lists as they are now. A failing allocation leaves the
    /// index unchanged.
    TARN_API void rebuild();

    /// Same as those of `PatchIndex`. None allocates.
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
