// Engine/Base/patch.h: the node graph, its evaluation form, queries and debug output.
//
//     Patch const* patch = findPatchRecursive(root, 7);
//     for (Connection const& c : findOutgoingConnectionsFromPort(root, portId)) { follow(c); }
//     EvalPatch evaluated(root);

#ifndef TARN_ENGINE_BASE_PATCH_H
#define TARN_ENGINE_BASE_PATCH_H

#include <Engine/Base/export.h>
#include <Engine/Base/layers.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <cstddef>
#include <functional>
#include <initializer_list>
#include <iosfwd>
#include <map>
#include <memory>
#include <string>
#include <type_traits>
#include <unordered_set>
#include <utility>
#include <vector>

namespace tarn::engine {

/// A shared, immutable list: copying a record copies the pointer. Never null in a record, except in
/// a moved-from record, which may only be assigned to or destroyed. Where a list is null all the
/// same (`{}` in a braced initialiser makes one), the first function that reads it aborts with an
/// assertion failure that names it, such as `children != nullptr`.
template <class T>
using Array = std::shared_ptr<std::vector<T> const>;

/// A shared list whose elements can be changed in place, for everyone who shares it.
template <class T>
using MutableArray = std::shared_ptr<std::vector<T>>;

struct Port;
struct Connection;
struct Patch;

namespace detail {

// The empty lists that all new records share. They have no reference count and are never destroyed,
// so threads do not contend for them: `use_count()` is 0.
TARN_API Array<Port> emptyPorts() noexcept;
TARN_API Array<Connection> emptyConnections() noexcept;
TARN_API Array<Patch> emptyPatches() noexcept;

template <class T>
Array<T> emptyArray() {
    return std::make_shared<std::vector<T> const>();
}
template <>
inline Array<Port> emptyArray() {
    return emptyPorts();
}
template <>
inline Array<Connection> emptyArray() {
    return emptyConnections();
}
template <>
inline Array<Patch> emptyArray() {
    return emptyPatches();
}

[[noreturn]] TARN_API void listIsNull(char const* condition) noexcept;

// The elements of a list. A null list is an assertion failure, whose condition names the list.
template <class Pointer>
typename Pointer::element_type& elementsOf(Pointer const& list, char const* condition) {
    if (!list) listIsNull(condition);
    return *list;
}

}  // namespace detail

/// A list of these elements: one allocation, in addition to those of the vector. Empty lists of
/// ports, connections and patches allocate nothing: they are the lists that new records share.
template <class T>
Array<T> arrayOf(std::vector<T> elements) {
    if (elements.empty()) return detail::emptyArray<T>();
    return std::make_shared<std::vector<T> const>(std::move(elements));
}
template <class T>
Array<T> arrayOf(std::initializer_list<T> elements) {
    return arrayOf(std::vector<T>(elements));
}

/// An input or output of a patch.
struct Port {
    /// Unique among all ports of a document.
    unsigned long long id = 0;
    /// Identifies the port among those of its patch.
    unsigned long long tag = 0;
    std::string name = {};
    TypeInfo typeInfo = {};
    Value defaultValue = {};
    std::map<std::string, Unstructured> attributes = {};

    /// Field by field.
    TARN_API bool operator==(Port const& other) const;
    TARN_API bool operator!=(Port const& other) const;
};

/// From an output port to an input port. Stored in the parent of the patches that it connects.
struct Connection {
    /// The identifiers of both ends. A port's identifier alone is unique in the document.
    unsigned long long fromPatchId = 0;
    unsigned long long fromPortId = 0;
    unsigned long long toPatchId = 0;
    unsigned long long toPortId = 0;

    /// Compares all four identifiers.
    TARN_API bool operator==(Connection const& other) const;
    TARN_API bool operator!=(Connection const& other) const;
};

}  // namespace tarn::engine

/// Combines the four fields in their order with `seed ^= v + 0x9e3779b9 + (seed << 6) + (seed >>
/// 2)` in 64 bits. The result is the same on every platform; where `std::size_t` has 32 bits, it is
/// the lower half.
template <>
struct std::hash<tarn::engine::Connection> {
    TARN_API std::size_t operator()(tarn::engine::Connection const& connection) const noexcept;
};

namespace tarn::engine {

/// A node of the graph: its ports, its child patches and the connections between the children's
/// ports. Copies share the lists. All operations, queries and debug output included, are recursive:
/// 8 MiB of stack are enough for 10,000 levels.
struct Patch {
    /// Never 0 in a document: 0 means no patch.
    unsigned long long id = 0;
    /// The number of the built-in kind. The evaluator defines the kinds.
    unsigned long long builtin = 0;
    /// A second name; compared, but neither printed nor part of the evaluation form.
    std::string descriptor = {};
    ModelLayer modelLayer = {};
    std::string name = {};
    Array<Port> inputs = detail::emptyPorts();
    Array<Port> outputs = detail::emptyPorts();
    /// The keys "inputCount" and "outputCount" configure the numbers of ports.
    std::map<std::string, Unstructured> attributes = {};
    Array<Connection> connections = detail::emptyConnections();
    Array<Patch> children = detail::emptyPatches();

    /// Compares deeply and in order. Lists that are the same object are equal without a comparison.
    TARN_API bool operator==(Patch const& other) const;
    TARN_API bool operator!=(Patch const& other) const;
};
static_assert(std::is_nothrow_move_constructible_v<Port>, "lists of ports move when they grow");
static_assert(std::is_nothrow_move_constructible_v<Patch>, "lists of patches move when they grow");

/// A port in the evaluation form: it holds a list of its current values.
struct EvalPort {
    /// Copied from the port.
    unsigned long long id = 0;
    unsigned long long tag = 0;
    /// For the evaluator: zero and false at first; this library only copies and compares them.
    unsigned long long evaluatorState = 0;
    bool evaluatorFlag = false;
    TypeInfo typeInfo;
    /// At first one element: the port's default value.
    std::vector<Value> values;
    std::string name;

    /// Without values; or with the default value of `port` as the only value.
    TARN_API EvalPort();
    TARN_API explicit EvalPort(Port const& port);

    /// Compares every field, the evaluator's included.
    TARN_API bool operator==(EvalPort const& other) const;
    TARN_API bool operator!=(EvalPort const& other) const;
};

/// A patch in the evaluation form. Copies share the lists; each conversion makes new ones. All
/// operations are recursive: 8 MiB of stack are enough for 10,000 levels.
struct EvalPatch {
    /// Copied from the patch.
    unsigned long long id = 0;
    unsigned long long builtin = 0;
    MutableArray<EvalPort> inputs = std::make_shared<std::vector<EvalPort>>();
    MutableArray<EvalPort> outputs = std::make_shared<std::vector<EvalPort>>();
    std::string name;
    MutableArray<EvalPatch> children = std::make_shared<std::vector<EvalPatch>>();
    ModelLayer modelLayer;
    /// Whether the patch's attributes contain the keys "inputCount" and "outputCount", with any
    /// value.
    bool hasInputCount = false;
    bool hasOutputCount = false;

    TARN_API EvalPatch();
    /// Converts the whole subtree. Linear in its size; allocates each list once.
    TARN_API explicit EvalPatch(Patch const& patch);

    /// Compares deeply and in order. Lists that are the same object are equal without a comparison.
    TARN_API bool operator==(EvalPatch const& other) const;
    TARN_API bool operator!=(EvalPatch const& other) const;
};
static_assert(std::is_nothrow_move_constructible_v<EvalPort>, "lists of ports move");
static_assert(std::is_nothrow_move_constructible_v<EvalPatch>, "lists of patches move");

/// The converting constructors as functions, to pass to `map`.
TARN_API EvalPort toEvalPort(Port const& port);
TARN_API EvalPatch toEvalPatch(Patch const& patch);

/// A new list with the result of `std::invoke(function, element)` for each element, in order. The
/// elements are allocated once. Never null. `map(&Port::id, list)` is a list of identifiers.
template <class Function, class T>
MutableArray<std::decay_t<std::invoke_result_t<Function&, T const&>>> map(Function function,
                                                                          Array<T> const& list);

// Queries. They never fail, are linear in what they search, and allocate only the sets that they
// return.

/// The patch with this identifier in the whole subtree, `root` included; null for 0, even where a
/// patch has that identifier. The search compares all children of a patch before it descends into
/// the first of them, and returns the first match in this order. Linear in the number of patches
/// searched. The pointer points into the lists of `root` (or to `root` itself) and lives as long as
/// they do.
TARN_API Patch const* findPatchRecursive(Patch const& root, unsigned long long id);
TARN_API EvalPatch const* findPatchRecursive(EvalPatch const& root, unsigned long long id);

/// The port with this identifier among the inputs (outputs) of the patch, then among those of its
/// children, in order; grandchildren are not searched. Null where there is none. The pointer points
/// into the list with the port and lives as long as that. Linear in the number of ports searched.
TARN_API EvalPort const* findInputPort(EvalPatch const& patch, unsigned long long portId);
TARN_API EvalPort const* findOutputPort(EvalPatch const& patch, unsigned long long portId);

/// The first of the patch's own connections to the port; empty where there is none. Linear.
TARN_API Optional<Connection> findIncomingConnectionToPort(Patch const& patch,
                                                           unsigned long long portId);

/// All of the patch's own connections to (from) the patch `patchId`; an empty set where there are
/// none. Linear.
TARN_API std::unordered_set<Connection> findIncomingConnectionsToPatch(Patch const& patch,
                                                                       unsigned long long patchId);
TARN_API std::unordered_set<Connection>
findOutgoingConnectionsFromPatch(Patch const& patch, unsigned long long patchId);

/// The connections from the port, out of those of the first patch in the subtree (depth first from
/// `root`) with a child that has the port among its outputs. Empty where that patch has none, and
/// for ports of `root` itself. Linear in the size of the subtree.
TARN_API std::unordered_set<Connection> findOutgoingConnectionsFromPort(Patch const& root,
                                                                        unsigned long long portId);

/// Implements the function above: empty where no patch of the subtree has such a child.
TARN_API Optional<std::unordered_set<Connection>>
_findOutgoingConnectionsFromPort(Patch const& root, unsigned long long portId);

/// The first input (output) of the patch with this tag, or null; children are not searched. The
/// pointer points into the list of the patch and lives as long as that. Linear in the number of
/// ports.
TARN_API Port const* inPortForTag(Patch const& patch, unsigned long long tag);
TARN_API EvalPort const* inPortForTag(EvalPatch const& patch, unsigned long long tag);
TARN_API Port const* outPortForTag(Patch const& patch, unsigned long long tag);
TARN_API EvalPort const* outPortForTag(EvalPatch const& patch, unsigned long long tag);

// Debug output, for people only.

/// Writes "[name:id tag: 1 typeInfo: [type: float] defaultValue: 0]", without a line end. Here and
/// below, numbers follow the stream's flags.
TARN_API std::ostream& operator<<(std::ostream& stream, Port const& port);

/// Writes "[connection:12->34]", with the identifiers of the ports, without a line end.
TARN_API std::ostream& operator<<(std::ostream& stream, Connection const& connection);

/// Writes the patch, its ports, its children's whole output and its connections. Deliberate: only a
/// patch without ports closes its bracket, and nesting is not indented. Every line is flushed: for
/// long output, print to a string stream first.
TARN_API std::ostream& operator<<(std::ostream& stream, Patch const& patch);

// Implementation

template <class Function, class T>
MutableArray<std::decay_t<std::invoke_result_t<Function&, T const&>>> map(Function function,
                                                                          Array<T> const& list) {
    using Result = std::decay_t<std::invoke_result_t<Function&, T const&>>;
    std::vector<Result> results;
    std::vector<T> const& elements = detail::elementsOf(list, "list != nullptr");
    results.reserve(elements.size());
    for (T const& element : elements) {
        if constexpr (std::is_member_pointer_v<Function>) {
            results.push_back(std::invoke(function, element));
        } else {
            results.push_back(function(element));  // No helper in between: conversions recurse.
        }
    }
    return std::make_shared<std::vector<Result>>(std::move(results));
}

}  // namespace tarn::engine

#endif
