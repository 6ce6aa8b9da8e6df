// Engine/Document/detail/node_graph.h: a parsed node graph, and its conversion to patches.

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

/// The limit of nested groups.
constexpr std::size_t kDeepestGroups = 1000;

/// The name of a node in links: a number or a string.
struct NodeName {
    long long number = 0;
    std::shared_ptr<std::string const> text = nullptr;

    bool operator<(NodeName const& other) const;
};

struct GraphNode {
    NodeName name;
    /// The patch identifier that it keeps, or 0.
    unsigned long long id = 0;
    std::string type;
    /// All other members, including the title.
    std::map<std::string, Unstructured> attributes;
    struct Ports {
        std::deque<Port> inputs;
        std::deque<Port> outputs;
    };
    /// Null where there are no ports.
    std::unique_ptr<Ports> ports;
    /// Null for a node without an inline subgraph.
    std::unique_ptr<NodeGraph> inside;
};

struct GraphLink {
    std::size_t position = 0;  // In the list of links.
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
    /// For each link with additional members, an object with those.
    Unstructured::Array linkMembers;

    /// For an inline subgraph, the graph around it and the position of its node there. For a shared
    /// definition, null and its position in the list of definitions.
    NodeGraph const* around = nullptr;
    std::size_t position = 0;
    bool isDefinition = false;
};

/// A graph that nodes refer to by its `id`.
struct Definition {
    NodeGraph graph;
    std::string id;
    std::string title;
    std::vector<Port> inputs;
    std::vector<Port> outputs;
    /// The nodes that represent the inputs and the outputs inside.
    Unstructured inputNode;
    Unstructured outputNode;
};

/// The JSON pointer of the graph. Linear in its depth.
std::string pointerTo(NodeGraph const& graph);

/// Converts a graph and the shared definitions that its nodes use. False where that is impossible;
/// then `error` says why. The graph is consumed.
bool toPatches(NodeGraph& graph, std::deque<Definition>& definitions, Patch& root,
               DocumentInfo& info, DocumentError& error);

}  // namespace tarn::engine::detail

#endif
