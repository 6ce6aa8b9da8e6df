#include <Engine/Document/detail/json_reader.h>

#include <Engine/Base/detail/shortest_number.h>
#include <Engine/Document/detail/texts.h>

#include <algorithm>
#include <utility>

namespace tarn::engine::detail {

namespace {

constexpr std::string_view kSpace = " \t\r\n";
constexpr char kWrongEscape[] = "U+001A must be followed by two hexadecimal digits";

void setPlace(std::string_view text, std::size_t offset, DocumentError& error) {
    std::string_view const before = text.substr(0, offset);
    error.line = 1 + static_cast<std::size_t>(std::count(before.begin(), before.end(), '\n'));
    std::size_t const lineEnd = before.rfind('\n');
    error.column = before.size() - (lineEnd == std::string_view::npos ? 0 : lineEnd + 1) + 1;
}

// Scans a document, which must be valid JSON up to the place that is looked for.
class Scanner {
public:
    explicit Scanner(std::string_view scanned) : text(scanned) {
        constexpr std::string_view kMark = "\xef\xbb\xbf";
        if (text.substr(0, kMark.size()) == kMark) position = kMark.size();
        skipSpace();
    }

    std::size_t offset() const { return position; }
    char current() const { return position < text.size() ? text[position] : '\0'; }

    // Enters the object or array; false where it is empty.
    bool enter() {
        ++position;
        skipSpace();
        return current() != '}' && current() != ']' && current() != '\0';
    }

    // Moves to the next key or element; false at the end.
    bool next() {
        skipSpace();
        if (current() != ',') return false;
        ++position;
        skipSpace();
        return true;
    }

    // Reads a key, decoded as far as comparing needs it, and moves to its value.
    std::string key() {
        std::size_t const begin = position;
        skipString();
        std::string_view const token = text.substr(begin, position - begin);
        skipSpace();
        if (current() == ':') ++position;
        skipSpace();
        nlohmann::json const decoded = nlohmann::json::parse(token, nullptr, false);
        return decoded.is_string() ? decoded.get<std::string>() : std::string();
    }

    void skipValue() {
        std::size_t depth = 0;
        do {
            char const c = current();
            if (c == '"') {
                skipString();
            } else {
                if (c == '[' || c == '{') ++depth;
                if ((c == ']' || c == '}') && depth > 0) --depth;
                ++position;
                if (c != '[' && c != '{' && c != ']' && c != '}' && c != ',' && c != ':') {
                    position =
                        std::min(text.find_first_of(",:]}[{\" \t\r\n", position), text.size());
                }
            }
            skipSpace();
        } while (depth > 0 && position < text.size());
    }

private:
    void skipSpace() { position = std::min(text.find_first_not_of(kSpace, position), text.size()); }
    void skipString() {
        for (++position; position < text.size() && text[position] != '"'; ++position) {
            if (text[position] == '\\') ++position;
        }
        position = std::min(position + 1, text.size());
    }

    std::string_view text;
    std::size_t position = 0;
};

}  // namespace

void locate(std::string_view text, DocumentError& error) {
    if (text.find_first_not_of(kSpace) == std::string_view::npos) return;
    Scanner scanner(text);
    std::string_view rest = error.pointer;
    while (!rest.empty()) {
        rest.remove_prefix(1);
        std::string_view const step = rest.substr(0, rest.find('/'));
        rest.remove_prefix(step.size());
        bool const isObject = scanner.current() == '{';
        std::size_t const whole = scanner.offset();
        bool found = false;
        std::size_t index = 0;
        for (bool isThere = scanner.enter(); isThere; isThere = scanner.next()) {
            std::string const name = isObject ? pointerStep(scanner.key()) : pointerStep(index++);
            if (std::string_view(name).substr(1) == step) {
                found = true;
                break;
            }
            scanner.skipValue();
        }
        if (!found) {
            setPlace(text, whole, error);
            return;
        }
    }
    setPlace(text, scanner.offset(), error);
}

bool JsonReader::read(std::string_view text) {
    input = text;
    NearestRounding const rounding;
    if (text.find_first_not_of(kSpace) == std::string_view::npos) {
        fault.message = "it is empty";
        return false;
    }
    return nlohmann::json::sax_parse(text.begin(), text.end(), this);
}

bool JsonReader::refuseAt(std::string place, std::string problem) {
    fault.pointer = std::move(place);
    fault.message = std::move(problem);
    return false;
}

bool JsonReader::decode(std::string& text) { return decodeText(text) || refuse(kWrongEscape); }

bool JsonReader::scalar(Scalar scalar) {
    if (ignoredLevels > 0) return true;
    if (!builder.isOpen()) return onScalar(scalar);
    if (scalar.isBeyond64Bits && strictness == DataBuilder::Strictness::Own) {
        return refuseAt(pointer() + builder.pointerToNext(), "an integer beyond 64 bits");
    }
    hasBoolean = hasBoolean || scalar.isBoolean;
    builder.add(std::move(scalar.data));
    return true;
}

bool JsonReader::null() { return scalar(Scalar()); }
bool JsonReader::boolean(bool value) { return scalar({value ? 1 : 0, true, false}); }
bool JsonReader::number_integer(nlohmann::json::number_integer_t value) {
    return scalar({static_cast<long long>(value), false, false});
}
bool JsonReader::number_unsigned(nlohmann::json::number_unsigned_t value) {
    auto const integer = static_cast<long long>(value);
    return scalar(
        {integer < 0 ? Unstructured(static_cast<unsigned long long>(value)) : Unstructured(integer),
         false, false});
}
bool JsonReader::number_float(nlohmann::json::number_float_t value, std::string const& text) {
    return scalar({value, false, text.find_first_of(".eE") == std::string::npos});
}

bool JsonReader::string(std::string& value) {
    if (ignoredLevels > 0) return true;
    if (!builder.isOpen()) return onString(value);
    if (strictness == DataBuilder::Strictness::Own && !decodeText(value)) {
        return refuseAt(pointer() + builder.pointerToNext(), kWrongEscape);
    }
    builder.add(std::move(value));
    return true;
}

bool JsonReader::binary(nlohmann::json::binary_t&) { return refuse("this is not valid JSON"); }

bool JsonReader::key(std::string& value) {
    if (ignoredLevels > 0) return true;
    if (!builder.isOpen()) return onKey(value);
    if (strictness == DataBuilder::Strictness::Own && !decodeText(value)) {
        return refuseAt(pointer() + builder.pointerToOpen(), kWrongEscape);
    }
    builder.key(value);
    return true;
}

bool JsonReader::startLevel(bool isObject) {
    if (ignoredLevels > 0) {
        ++ignoredLevels;
        return true;
    }
    return builder.isOpen() ? capture(isObject) : onOpen(isObject);
}

bool JsonReader::endLevel() {
    if (ignoredLevels > 0) {
        --ignoredLevels;
        return true;
    }
    if (!builder.isOpen()) return onClose();
    if (!builder.close()) {
        return refuseAt(pointer() + builder.pointerToOpen(), std::move(builder.problem));
    }
    if (builder.isOpen()) return true;
    if (builder.wantsMap()) {
        hasBoolean = false;
        return onMap(builder.takeMap());
    }
    Scalar captured{builder.take(), std::exchange(hasBoolean, false), false};
    return onData(captured);
}

bool JsonReader::start_object(std::size_t) { return startLevel(true); }
bool JsonReader::start_array(std::size_t) { return startLevel(false); }
bool JsonReader::end_object() { return endLevel(); }
bool JsonReader::end_array() { return endLevel(); }

bool JsonReader::parse_error(std::size_t position, std::string const&,
                             nlohmann::json::exception const& error) {
    constexpr int kNumberIsTooLarge = 406;
    std::size_t offset = position > 0 ? position - 1 : 0;
    fault.pointer = pointer();
    if (builder.isOpen()) fault.pointer += builder.pointerToNext();
    if (error.id == kNumberIsTooLarge) {
        fault.message = "a number beyond the range of a double";
        offset = std::min(position, input.size());
        while (offset > 0 && std::string_view("+-.eE0123456789").find(input[offset - 1]) !=
                                 std::string_view::npos) {
            --offset;
        }
    } else {
        fault.message =
            offset >= input.size() ? "the JSON is incomplete" : "this is not valid JSON";
    }
    setPlace(input, std::min(offset, input.size()), fault);
    return false;
}

}  // namespace tarn::engine::detail
