// Engine/Base/patch.h: the graph of patches, its evaluation form, its queries and its debug output.
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

/// A list that records share: copying a record copies the pointer. Never null in a record, except
/// in one that was moved from, which is only to be assigned to or destroyed. Where a list is null
/// all the same (`{}` in braces makes one), whoever reads it first ends the program with an
/// assertion failure that names it, such as `children != nullptr`.
template <class T>
using Array = std::shared_ptr<std::vector<T> const>;

/// The same with elements that change in place, for everyone who shares it.
template <class T>
using MutableArray = std::shared_ptr<std::vector<T>>;

struct Port;
struct Connection;
struct Patch;

namespace detail {

// The empty lists that all new records share. They are never counted and never destroyed, so that
// threads do not contend for them: `use_count()` is 0.
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

// What a list has. A null list is an assertion failure with the condition, which names it.
template <class Pointer>
typename Pointer::element_type& elementsOf(Pointer const& list, char const* condition) {
    if (!list) listIsNull(condition);
    return *list;
}

}  // namespace detail

/// A list of these elements. One allocation, and what the elements take. Empty lists of ports,
/// connections and patches are the ones that new records share: they take none.
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
    /// Finds the port among those of its own patch.
    unsigned long long tag = 0;
    std::string name = {};
    TypeInfo typeInfo = {};
    Value defaultValue = {};
    std::map<std::string, Unstructured> attributes = {};

    /// Field by field.
    TARN_API bool operator==(Port const& other) const;
    TARN_API bool operator!=(Port const& other) const;
};

/// From an output port to an input port. Held by the patch whose children both ends are.
struct Connection {
    /// The identifiers of both ends; each port by itself is unique in the document.
    unsigned long long fromPatchId = 0;
    unsigned long long fromPortId = 0;
    unsigned long long toPatchId = 0;
    unsigned long long toPortId = 0;

    /// All four identifiers.
    TARN_API bool operator==(Connection const& other) const;
    TARN_API bool operator!=(Connection const& other) const;
};

}  // namespace tarn::engine

/// The four fields in their order, each combined as
/// `seed ^= v + 0x9e3779b9 + (seed << 6) + (seed >> 2)` in 64 bits. The same on every platform;
/// where `std::size_t` has 32 bits, its lower half.
template <>
struct std::hash<tarn::engine::Connection> {
    TARN_API std::size_t operator()(tarn::engine::Connection const& connection) const noexcept;
};

namespace tarn::engine {

/// A node of the graph: its ports, its children and the connections between the children's ports.
/// Copies share the lists. 8 MiB of stack are enough for 10,000 levels of everything here, queries
/// and debug output included.
struct Patch {
    /// Never 0 in a document: that means no patch.
    unsigned long long id = 0;
    /// The number of the built-in kind; the evaluator owns the table.
    unsigned long long builtin = 0;
    /// A second string; compared, but neither printed nor evaluated.
    std::string descriptor = {};
    ModelLayer modelLayer = {};
    std::string name = {};
    Array<Port> inputs = detail::emptyPorts();
    Array<Port> outputs = detail::emptyPorts();
    /// "inputCount" and "outputCount" are the configured numbers of ports.
    std::map<std::string, Unstructured> attributes = {};
    Array<Connection> connections = detail::emptyConnections();
    Array<Patch> children = detail::emptyPatches();

    /// Deep and in order. Lists that are one object are equal without a look at them.
    TARN_API bool operator==(Patch const& other) const;
    TARN_API bool operator!=(Patch const& other) const;
};
static_assert(std::is_nothrow_move_constructible_v<Port>, "lists of ports move when they grow");
static_assert(std::is_nothrow_move_constructible_v<Patch>, "lists of patches move when they grow");

/// A port as the evaluator keeps it: with a list of the values that it has now.
struct EvalPort {
    /// Those of the port.
    unsigned long long id = 0;
    unsigned long long tag = 0;
    /// The evaluator's own; zero and false at first, and not looked at here.
    unsigned long long evaluatorState = 0;
    bool evaluatorFlag = false;
    TypeInfo typeInfo;
    /// At first one element, the port's default value.
    std::vector<Value> values;
    std::string name;

    /// Without values, or with the default value of `port` as the one that it has.
    TARN_API EvalPort();
    TARN_API explicit EvalPort(Port const& port);

    /// Field by field, the evaluator's own included.
    TARN_API bool operator==(EvalPort const& other) const;
    TARN_API bool operator!=(EvalPort const& other) const;
};

/// A patch as the evaluator keeps it. Copies share the lists; two conversions do not. 8 MiB of
/// stack are enough for 10,000 levels of everything here.
struct EvalPatch {
    /// Those of the patch.
    unsigned long long id = 0;
    unsigned long long builtin = 0;
    MutableArray<EvalPort> inputs = std::make_shared<std::vector<EvalPort>>();
    MutableArray<EvalPort> outputs = std::make_shared<std::vector<EvalPort>>();
    std::string name;
    MutableArray<EvalPatch> children = std::make_shared<std::vector<EvalPatch>>();
    ModelLayer modelLayer;
    /// Whether the patch's attributes have the keys "inputCount" and "outputCount", of any value.
    bool hasInputCount = false;
    bool hasOutputCount = false;

    TARN_API EvalPatch();
    /// Converts the whole subtree. Linear in its size; each list is allocated once.
    TARN_API explicit EvalPatch(Patch const& patch);

    /// Deep and in order. Lists that are one object are equal without a look at them.
    TARN_API bool operator==(EvalPatch const& other) const;
    TARN_API bool operator!=(EvalPatch const& other) const;
};
static_assert(std::is_nothrow_move_constructible_v<EvalPort>, "lists of ports move");
static_assert(std::is_nothrow_move_constructible_v<EvalPatch>, "lists of patches move");

/// The constructors, to be passed to `map`.
TARN_API EvalPort toEvalPort(Port const& port);
TARN_API EvalPatch toEvalPatch(Patch const& patch);

/// A new list of what `std::invoke(function, element)` gives for each element, in order; allocated
/// once. Never null: `map(&Port::id, list)` is a list of identifiers.
template <class Function, class T>
MutableArray<std::decay_t<std::invoke_result_t<Function&, T const&>>> map(Function function,
                                                                          Array<T> const& list);

// Queries. None fails. All are linear in what they search, and allocate for their sets alone.

/// The patch of this id in the whole subtree, `root` included; null for id 0, even where a patch
/// carries it. Each level's children are all looked at before the first of them is entered; the
/// first found in this order wins. Linear in what it looks at. The pointer refers into the lists of
/// `root` (or is `root` itself), and lives as long as they do.
TARN_API Patch const* findPatchRecursive(Patch const& root, unsigned long long id);
TARN_API EvalPatch const* findPatchRecursive(EvalPatch const& root, unsigned long long id);

/// The port of this id among the inputs (outputs) of the patch, then of its children in order; not
/// of grandchildren; null where there is none. The pointer refers into the list that has the port,
/// and lives as long. Linear in the number of ports searched.
TARN_API EvalPort const* findInputPort(EvalPatch const& patch, unsigned long long portId);
TARN_API EvalPort const* findOutputPort(EvalPatch const& patch, unsigned long long portId);

/// The first of the patch's own connections that leads to the port; empty where none does. Linear.
TARN_API Optional<Connection> findIncomingConnectionToPort(Patch const& patch,
                                                           unsigned long long portId);

/// Those of the patch's own connections that lead to (start from) the patch `patchId`; an empty set
/// where there are none. Linear.
TARN_API std::unordered_set<Connection> findIncomingConnectionsToPatch(Patch const& patch,
                                                                       unsigned long long patchId);
TARN_API std::unordered_set<Connection>
findOutgoingConnectionsFromPatch(Patch const& patch, unsigned long long patchId);

/// The connections that start from the port, out of those of the first patch in the subtree with a
/// child that has the port among its outputs; searched from `root`, depth first. Empty where
/// that patch has none, and for a port of `root` itself. Linear in the size of the subtree.
TARN_API std::unordered_set<Connection> findOutgoingConnectionsFromPort(Patch const& root,
                                                                        unsigned long long portId);

/// The worker behind it: empty where no patch of the subtree has such a child.
TARN_API Optional<std::unordered_set<Connection>>
_findOutgoingConnectionsFromPort(Patch const& root, unsigned long long portId);

/// The first input (output) of the patch with this tag, or null; children are not searched. The
/// pointer refers into the list of the patch, and lives as long. Linear in the number of its ports.
TARN_API Port const* inPortForTag(Patch const& patch, unsigned long long tag);
TARN_API EvalPort const* inPortForTag(EvalPatch const& patch, unsigned long long tag);
TARN_API Port const* outPortForTag(Patch const& patch, unsigned long long tag);
TARN_API EvalPort const* outPortForTag(EvalPatch const& patch, unsigned long long tag);

// Debug output, for people; nothing parses it.

/// "[name:id tag: 1 typeInfo: [type: float] defaultValue: 0]", without an end of line. Numbers
/// follow the stream's flags here and below.
TARN_API std::ostream& operator<<(std::ostream& stream, Port const& port);

/// "[connection:12->34]", the ids of the ports, without an end of line.
TARN_API std::ostream& operator<<(std::ostream& stream, Connection const& connection);

/// The patch, its ports, its children's whole output and its connections. Deliberate: only a
/// patch without ports closes its bracket, and nesting is not indented. Every line end is
/// flushed: print to a string stream where the output is long.
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
            results.push_back(function(element));  // Without a detour: conversions recurse.
        }
    }
    return std::make_shared<std::vector<Result>>(std::move(results));
}

}  // namespace tarn::engine

#endif
