// Engine/Document/detail/own_reader.h: parses documents of our own format.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_OWN_READER_H
#define TARN_ENGINE_DOCUMENT_DETAIL_OWN_READER_H

#include <Engine/Document/detail/json_reader.h>
#include <Engine/Document/detail/values.h>

#include <cstddef>
#include <cstdint>
#include <deque>
#include <map>
#include <string>
#include <vector>

namespace tarn::engine::detail {

/// Parses a document record by record. Finished records wait in a list for the record around them.
class OwnReader : public JsonReader {
public:
    OwnReader() : JsonReader(DataBuilder::Strictness::Own) {}

    /// After a successful `read`: validates the document as a whole.
    bool finish();
    Patch root;
    double framesPerSecond = 60.0;
    /// After a failed `read`: whether the document has "nodes" and may be a node graph.
    bool isNodeGraph = false;

private:
    enum class Place : unsigned char {
        Start,
        Document,
        Patch,
        Port,
        Connection,
        ModelLayer,
        Patches,
        Ports,
        Connections,
        ModelLayers,
        ConnectionEnd,
    };
    enum class Key : unsigned char;
    struct Level {
        Place place;
        Key key;               // Records: the current field.
        std::uint32_t seen;    // Records: a bit for each field that was seen.
        std::size_t position;  // Lists: the current element.
    };
    // The fields of a port that can only be converted once its type is known.
    struct PortFields {
        Optional<unsigned char> subtype;
        Pending defaultValue, min, max, extra;
    };

    bool onScalar(Scalar& scalar) override;
    bool onString(std::string& text) override;
    bool onOpen(bool isObject) override;
    bool onKey(std::string& key) override;
    bool onClose() override;
    bool onData(Scalar& captured) override;
    bool onMap(Unstructured::Map map) override;
    std::string pointer() const override;

    bool push(Place place);
    bool openPatch();
    bool openLayer();
    void setDocumentField(Scalar const& scalar);
    void defer(std::string problem);
    bool setPatchField(Scalar const& scalar);
    bool setPortField(Scalar& scalar);
    bool setLayerField(Scalar const& scalar);
    bool setEnd(Scalar const& scalar);
    bool setIdentifier(unsigned long long& id, Scalar const& scalar);
    bool setKind(Unstructured const& data);
    bool setType(Unstructured const& data);
    bool setValueType(Pending& pending, Unstructured const& data);
    bool setPending(Pending& pending, Scalar& scalar);
    bool setValue(Optional<Value>& value, Pending const& pending, Type usualType, Key key);
    Pending* pendingOf(Key key);

    bool closeRecord();
    bool closePatch();
    bool closePort();
    bool closeList();
    bool requireField(Key key);
    bool has(Key key) const;
    bool isAt(Place place) const { return levels.back().place == place; }
    bool refuseType(Unstructured const& found);
    static char const* wantedFor(Key key);

    std::vector<Level> levels;
    std::deque<Patch> openPatches;
    std::deque<std::deque<Patch>> patches;  // One for each open list.
    std::deque<ModelLayer> openLayers;
    std::deque<std::deque<ModelLayer>> layers;
    Port port;
    PortFields portFields;  // Reset after each port.
    bool areFieldsSet = false;
    std::vector<Port> ports;
    Connection connection;
    std::deque<Connection> connections;
    // An error outside the root, which only counts if the document is not a node graph.
    Optional<DocumentError> deferred;
    bool hasRoot = false;
    bool mayHaveAnyIdentifiers = false;
};

}  // namespace tarn::engine::detail

#endif
