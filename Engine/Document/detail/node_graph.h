// Engine/Document/detail/node_graph.h: a graph as browser-based node editors export it, and the
// patches that it becomes.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_NODE_GRAPH_H
#define TARN_ENGINE_DOCUMENT_DETAIL_NODE_GRAPH_H

#include <Engine/Base/patch.h>
#include <Engine/Document/detail/lists.h>
#include <Engine/Document/document.h>

#include <cstddef>
#include <deque>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace tarn::engine::detail {

struct NodeGraph;

/// How deep groups may nest.
constexpr std::size_t kDeepestGroups = 1000;

/// How links name a node: by a number or by a text.
struct NodeName {
    long long number = 0;
    std::shared_ptr<std::string const> text = nullptr;

    bool operator<(NodeName const& other) const;
};

struct GraphNode {
    NodeName name;
    /// The identifier that it keeps, or 0.
    unsigned long long id = 0;
    std::string type;
    /// All other members, the title among them.
    std::map<std::string, Unstructured> attributes;
    struct Ports {
        std::deque<Port> inputs;
        std::deque<Port> outputs;
    };
    /// Null where there are none.
    std::unique_ptr<Ports> ports;
    /// Null for a node without an inline subgraph.
    std::unique_ptr<NodeGraph> inside;
};

struct GraphLink {
    std::size_t position = 0;  // In its list.
    long long id = 0;
    NodeName from;
    long long fromSlot = 0;
    NodeName to;
    long long toSlot = 0;
    /// False where one of the four is null.
    bool hasEnds = true;
};

struct NodeGraph {
    LazyList<GraphNode> nodes;
    LazyList<GraphLink> links;
    /// All other members.
    std::map<std::string, Unstructured> attributes;
    /// What there is of its links beside their ends, an object for each that has more.
    Unstructured::Array linkMembers;

    /// The graph that has it inside a node, and the position of that node; or else, of a shared
    /// definition, its position in the list of them.
    NodeGraph const* around = nullptr;
    std::size_t position = 0;
    bool isDefinition = false;
};

/// A graph that nodes use by its `id`.
struct Definition {
    NodeGraph graph;
    std::string id;
    std::string title;
    std::vector<Port> inputs;
    std::vector<Port> outputs;
    /// What is said of the nodes that stand for these ports inside.
    Unstructured inputNode;
    Unstructured outputNode;
};

/// The JSON pointer to the graph. Linear in how deep it is.
std::string pointerTo(NodeGraph const& graph);

/// Makes patches of a graph and of the shared definitions that its nodes use. False where that is
/// impossible; then `error` says why. The graph is used up.
bool toPatches(NodeGraph& graph, std::deque<Definition>& definitions, Patch& root,
               DocumentInfo& info, DocumentError& error);

}  // namespace tarn::engine::detail

#endif
