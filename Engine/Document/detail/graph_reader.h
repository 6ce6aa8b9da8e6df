// Engine/Document/detail/graph_reader.h: parses node graphs of browser-based editors.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_GRAPH_READER_H
#define TARN_ENGINE_DOCUMENT_DETAIL_GRAPH_READER_H

#include <Engine/Document/detail/json_reader.h>
#include <Engine/Document/detail/node_graph.h>

#include <deque>
#include <memory>
#include <string>
#include <vector>

namespace tarn::engine::detail {

/// Parses nodes, links and shared definitions into a `NodeGraph`. Everything else becomes
/// attributes of the record that it is in.
class GraphReader : public JsonReader {
public:
    GraphReader() : JsonReader(DataBuilder::Strictness::Lenient) {}

    NodeGraph graph;
    std::deque<Definition> definitions;

private:
    enum class Place : unsigned char {
        Graph,  // The document, an inline subgraph or a shared definition.
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
        std::string key;           // Objects: the current member.
        std::size_t position = 0;  // Lists: the current element.
        bool hasId = false;        // Nodes only.
        bool hasType = false;
        bool isDefinition = false;  // Graphs only.
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
    // Either inputs or outputs.
    std::deque<Port>* openPorts = nullptr;
    std::vector<Port>* openDefinitionPorts = nullptr;
    Unstructured::Map otherDefinitions;
};

}  // namespace tarn::engine::detail

#endif
