#include <Engine/Base/unstructured.h>

#include <Engine/Base/detail/shortest_number.h>
#include <Engine/Base/detail/utf8.h>

#include <algorithm>
#include <cmath>
#include <string_view>

namespace tarn::engine {

namespace {

// Writes a tree until the string is long enough.
class Writer {
public:
    Writer(std::size_t maxBytes, std::size_t maxDepth)
        : byteLimit(maxBytes), depthLimit(maxDepth) {}

    std::string take(Unstructured const& tree) {
        write(tree);
        while (!open.empty() && !isFull()) step();
        if (isFull()) cut();
        return std::move(text);
    }

private:
    // A map or an array that is being written.
    struct Level {
        Unstructured::Map const* map;
        Unstructured::Map::const_iterator nextEntry;
        Unstructured::Array const* array;
        std::size_t nextElement;
    };

    bool isFull() const { return text.size() > byteLimit; }

    // Cuts the string to the limit, dots included, at a character boundary.
    void cut() {
        constexpr std::string_view kDots = "...";
        std::size_t length = byteLimit - std::min(byteLimit, kDots.size());
        while (length > 0 && detail::isUtf8Continuation(text[length])) --length;
        text.resize(length);
        text += kDots.substr(0, byteLimit);
    }

    // Writes the next element of the innermost level, or closes it.
    void step() {
        Level& level = open.back();
        bool const isFirst = text.back() == '{' || text.back() == '[';
        if (level.map != nullptr) {
            if (level.nextEntry == level.map->end()) return close('}');
            auto const& [key, element] = *level.nextEntry++;
            if (!isFirst) text += ", ";
            writeString(key);
            text += ": ";
            write(element);
        } else {
            if (level.nextElement == level.array->size()) return close(']');
            if (!isFirst) text += ", ";
            write((*level.array)[level.nextElement++]);
        }
    }

    void close(char bracket) {
        text += bracket;
        open.pop_back();
    }

    void write(Unstructured const& data) {
        switch (data.type()) {
            case Unstructured::Type::Null: text += "null"; break;
            case Unstructured::Type::Map:
            case Unstructured::Type::Array: writeContainer(data); break;
            case Unstructured::Type::Float: writeFloat(data.asFloat()); break;
            case Unstructured::Type::Integer: text += std::to_string(data.asInteger()); break;
            case Unstructured::Type::UnsignedInteger:
                text += std::to_string(data.asId()) + "u";
                break;
            case Unstructured::Type::String: writeString(*data.ifString()); break;
        }
    }

    void writeContainer(Unstructured const& data) {
        Unstructured::Map const* const map = data.ifMap();
        if (data.empty()) {
            text += map != nullptr ? "{}" : "[]";
        } else if (open.size() >= depthLimit) {
            text += map != nullptr ? "{...}" : "[...]";
        } else {
            text += map != nullptr ? '{' : '[';
            open.push_back({map,
                            map != nullptr ? map->begin() : Unstructured::Map::const_iterator(),
                            data.ifArray(), 0});
        }
    }

    void writeFloat(double number) {
        if (!std::isfinite(number)) {
            if (std::signbit(number)) text += '-';
            text += std::isnan(number) ? "nan" : "inf";
            return;
        }
        std::size_t const begin = text.size();
        detail::appendShortest(text, number);
        if (text.find_first_of(".e", begin) == std::string::npos) text += ".0";
    }

    void writeString(std::string_view string) {
        text += '"';
        while (!string.empty() && !isFull()) {
            std::size_t const length = detail::utf8Length(string);
            auto const byte = static_cast<unsigned char>(string[0]);
            if (length == 0 || byte < 0x20 || byte == 0x7f) {
                writeEscape(string[0]);
            } else {
                if (byte == '"' || byte == '\\') text += '\\';
                text += string.substr(0, length);
            }
            string.remove_prefix(std::max<std::size_t>(length, 1));
        }
        text += '"';
    }

    void writeEscape(char c) {
        constexpr std::string_view kHexDigits = "0123456789abcdef";
        text += '\\';
        switch (c) {
            case '\n': text += 'n'; break;
            case '\r': text += 'r'; break;
            case '\t': text += 't'; break;
            default: {
                auto const byte = static_cast<unsigned char>(c);
                text += 'x';
                text += kHexDigits[byte >> 4u];
                text += kHexDigits[byte & 15u];
            }
        }
    }

    std::size_t byteLimit;
    std::size_t depthLimit;
    std::string text;
    std::vector<Level> open;
    detail::NearestRounding rounding;
};

}  // namespace

std::string Unstructured::toText(std::size_t maxBytes, std::size_t maxDepth) const {
    return Writer(maxBytes, maxDepth).take(*this);
}

}  // namespace tarn::engine
