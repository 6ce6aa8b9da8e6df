// Engine/Document/detail/json_reader.h: the base class of the document readers, which receives
// parser events.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_JSON_READER_H
#define TARN_ENGINE_DOCUMENT_DETAIL_JSON_READER_H

#include <Engine/Document/detail/data_builder.h>
#include <Engine/Document/document.h>

#include <nlohmann/json.hpp>

#include <cstddef>
#include <string>
#include <string_view>

namespace tarn::engine::detail {

/// A number, string, boolean or null; or data that was captured.
struct Scalar {
    /// The value; booleans are 1 and 0.
    Unstructured data = {};
    /// Whether it is a boolean or contains one.
    bool isBoolean = false;
    /// An integer beyond 64 bits, which `data` stores as a double.
    bool isBeyond64Bits = false;
};

/// Receives the events of nlohmann-json's parser. A derived class handles each event itself or has
/// the value captured as unstructured data.
class JsonReader {
public:
    explicit JsonReader(DataBuilder::Strictness chosen) : strictness(chosen), builder(chosen) {}
    virtual ~JsonReader() = default;
    JsonReader(JsonReader const&) = delete;
    JsonReader& operator=(JsonReader const&) = delete;

    /// False where the document is invalid; then `fault` says why. Line and column are 0 unless it
    /// is not JSON.
    bool read(std::string_view text);
    DocumentError fault;

    // Parser events.
    bool null();
    bool boolean(bool value);
    bool number_integer(nlohmann::json::number_integer_t value);
    bool number_unsigned(nlohmann::json::number_unsigned_t value);
    bool number_float(nlohmann::json::number_float_t value, std::string const& text);
    bool string(std::string& value);
    bool binary(nlohmann::json::binary_t& value);
    bool start_object(std::size_t count);
    bool key(std::string& value);
    bool end_object();
    bool start_array(std::size_t count);
    bool end_array();
    bool parse_error(std::size_t position, std::string const& token,
                     nlohmann::json::exception const& error);

protected:
    // Handlers for events while nothing is captured. All except `keyOf` return false to reject the
    // document.
    virtual bool onScalar(Scalar& scalar) = 0;
    virtual bool onString(std::string& text) = 0;
    virtual bool onOpen(bool isObject) = 0;
    virtual bool onKey(std::string& key) = 0;
    virtual bool onClose() = 0;
    /// Receives the captured data.
    virtual bool onData(Scalar& captured) = 0;
    virtual bool onMap(Unstructured::Map map) = 0;
    /// The JSON pointer of the current value.
    virtual std::string pointer() const = 0;

    /// To be called from `onOpen`: captures this object or array for `onData`, or for `onMap`, or
    /// skips it.
    bool capture(bool isObject) {
        return builder.open(isObject) || refuse("there are too many values");
    }
    bool captureMap() { return builder.openMap(); }
    bool ignore() {
        ignoredLevels = 1;
        return true;
    }
    bool refuse(std::string problem) { return refuseAt(pointer(), std::move(problem)); }
    bool refuseAt(std::string place, std::string problem);
    /// Decodes a string of our own format; false where it is invalid.
    bool decode(std::string& text);

    std::string_view input;

private:
    bool scalar(Scalar scalar);
    bool startLevel(bool isObject);
    bool endLevel();

    DataBuilder::Strictness strictness;
    DataBuilder builder;
    std::size_t ignoredLevels = 0;
    bool hasBoolean = false;  // Of the captured data.
};

/// Sets line and column from the pointer. The string must be valid JSON up to there; one of spaces
/// only has no such place.
void locate(std::string_view text, DocumentError& error);

}  // namespace tarn::engine::detail

#endif
