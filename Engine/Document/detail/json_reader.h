// Engine/Document/detail/json_reader.h: what readers of documents share: the events of a JSON text,
// and where they come from.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_JSON_READER_H
#define TARN_ENGINE_DOCUMENT_DETAIL_JSON_READER_H

#include <Engine/Document/detail/data_builder.h>
#include <Engine/Document/document.h>

#include <nlohmann/json.hpp>

#include <cstddef>
#include <string>
#include <string_view>

namespace tarn::engine::detail {

/// A value without parts, or one that was captured.
struct Scalar {
    /// As data; true and false are 1 and 0.
    Unstructured data = {};
    /// Whether it is true or false, or has them among its parts.
    bool isBoolean = false;
    /// An integer beyond 64 bits, which `data` has as a double.
    bool isBeyond64Bits = false;
};

/// Takes the events of a JSON text in the way that nlohmann-json gives them. What a reader does not
/// take itself it has captured as data.
class JsonReader {
public:
    explicit JsonReader(DataBuilder::Strictness chosen) : strictness(chosen), builder(chosen) {}
    virtual ~JsonReader() = default;
    JsonReader(JsonReader const&) = delete;
    JsonReader& operator=(JsonReader const&) = delete;

    /// False where the text is refused; then `fault` says why. Its line and column are 0 unless the
    /// text is not JSON.
    bool read(std::string_view text);
    DocumentError fault;

    // The events.
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
    // What a reader does with them while nothing is captured. All but `keyOf` answer false where
    // they refuse the text.
    virtual bool onScalar(Scalar& scalar) = 0;
    virtual bool onString(std::string& text) = 0;
    virtual bool onOpen(bool isObject) = 0;
    virtual bool onKey(std::string& key) = 0;
    virtual bool onClose() = 0;
    /// What was captured.
    virtual bool onData(Scalar& captured) = 0;
    virtual bool onMap(Unstructured::Map map) = 0;
    /// The JSON pointer of the value that is being read.
    virtual std::string pointer() const = 0;

    /// From `onOpen`: this object or array is captured, and `onData` gets it; or this object, and
    /// `onMap` gets it; or nothing of it is looked at.
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
    /// Decodes a text of our own form, or refuses it.
    bool decode(std::string& text);

    std::string_view input;

private:
    bool scalar(Scalar scalar);
    bool startLevel(bool isObject);
    bool endLevel();

    DataBuilder::Strictness strictness;
    DataBuilder builder;
    std::size_t ignoredLevels = 0;
    bool hasBoolean = false;  // What is being captured.
};

/// Fills in line and column from the pointer. The text is JSON up to there; one of spaces alone has
/// no such place.
void locate(std::string_view text, DocumentError& error);

}  // namespace tarn::engine::detail

#endif
