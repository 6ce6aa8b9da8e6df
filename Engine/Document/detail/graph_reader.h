// Engine/Document/detail/graph_reader.h: reads graphs of browser-based node editors.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_GRAPH_READER_H
#define TARN_ENGINE_DOCUMENT_DETAIL_GRAPH_READER_H

#include <Engine/Document/detail/json_reader.h>
#include <Engine/Document/detail/node_graph.h>

#include <deque>
#include <memory>
#include <string>
#include <vector>

namespace tarn::engine::detail {

/// Reads nodes, links and shared definitions into a `NodeGraph`; whatever else there is becomes
/// attributes of what it belongs to.
class GraphReader : public JsonReader {
public:
    GraphReader() : JsonReader(DataBuilder::Strictness::Lenient) {}

    NodeGraph graph;
    std::deque<Definition> definitions;

private:
    enum class Place : unsigned char {
        Graph,  // The whole, an inline subgraph or a shared definition.
        Nodes,
        Node,
        Ports,
        Port,
        Links,
        Definitions,
        DefinitionList,
    };
    struct Level {
        Place place;
        std::string key;           // Of an object: the member that is being read.
        std::size_t position = 0;  // Of a list: of the element that is being read.
        bool hasId = false;        // Of a node.
        bool hasType = false;
        bool isDefinition = false;  // Of a graph.
    };

    bool onScalar(Scalar& scalar) override;
    bool onString(std::string& text) override;
    bool onOpen(bool isObject) override;
    bool onKey(std::string& key) override;
    bool onClose() override;
    bool onData(Scalar& captured) override;
    bool onMap(Unstructured::Map) override { return true; }
    std::string pointer() const override;

    bool push(Place place);
    bool openGraph(NodeGraph& opened, bool isDefinition);
    void keepLinkMembers(Unstructured const& link);
    bool openInGraph(bool isObject);
    bool openInNode(bool isObject);
    bool set(Scalar& scalar);
    bool setGraphMember(Unstructured& data);
    bool setNodeMember(Unstructured& data);
    bool setPortMember(Unstructured& data);
    bool addLink(Unstructured const& data);
    bool setName(NodeName& name, Unstructured const& data, std::string const& step);
    bool setInteger(long long& number, Unstructured const& data, std::string const& step);
    bool refuseType(char const* wanted, Unstructured const& found, std::string const& step = "");

    std::vector<Level> levels;
    std::vector<NodeGraph*> openGraphs;
    std::vector<GraphNode*> openNodes;
    // One of the two.
    std::deque<Port>* openPorts = nullptr;
    std::vector<Port>* openDefinitionPorts = nullptr;
    Unstructured::Map otherDefinitions;
};

}  // namespace tarn::engine::detail

#endif
