// Engine/Document/detail/own_reader.h: reads documents of our own form.

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

/// Reads a document record by record: what is complete waits in a list for the record around it.
class OwnReader : public JsonReader {
public:
    OwnReader() : JsonReader(DataBuilder::Strictness::Own) {}

    /// After `read` was true: whether the document is right as a whole.
    bool finish();
    Patch root;
    double framesPerSecond = 60.0;
    /// Why `read` was false, where it was since the document has "nodes".
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
        Key key;               // Of a record: the field that is being read.
        std::uint32_t seen;    // Of a record: a bit for each field that is there.
        std::size_t position;  // Of a list: of the element that is being read.
    };
    // What a port's values are read from, once its type is known.
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
    std::deque<std::deque<Patch>> patches;  // Of each open list.
    std::deque<ModelLayer> openLayers;
    std::deque<std::deque<ModelLayer>> layers;
    Port port;
    PortFields portFields;  // As new between ports.
    bool areFieldsSet = false;
    std::vector<Port> ports;
    Connection connection;
    std::deque<Connection> connections;
    // What is wrong around the root: it counts unless the document turns out to be a node graph.
    Optional<DocumentError> deferred;
    bool hasRoot = false;
    bool mayHaveAnyIdentifiers = false;
};

}  // namespace tarn::engine::detail

#endif
