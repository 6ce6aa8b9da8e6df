#include "input.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <limits>
#include <string_view>

using tarn::engine::Unstructured;

namespace {

// Where byte `offset` is, as people count.
std::string lineAndColumn(std::string_view text, std::size_t offset) {
    std::size_t line = 1;
    std::size_t column = 1;
    for (char const c : text.substr(0, offset)) {
        column = c == '\n' ? 1 : column + 1;
        line += c == '\n' ? 1 : 0;
    }
    return "line " + std::to_string(line) + ", column " + std::to_string(column);
}

// Whether a double, or an integer with or without a sign, can hold the number.
bool fitsIn64Bits(std::string_view token) {
    if (token.find_first_of(".eE") != std::string_view::npos) {
        return std::isfinite(std::strtod(std::string(token).c_str(), nullptr));
    }
    char const* const end = token.data() + token.size();
    long long number = 0;
    unsigned long long id = 0;
    std::errc const error = token.front() == '-' ? std::from_chars(token.data(), end, number).ec
                                                 : std::from_chars(token.data(), end, id).ec;
    return error != std::errc::result_out_of_range;
}

// What the parser would let pass, or take gigabytes for, is found before it sees the text.
void checkDepthAndNumbers(std::string_view text) {
    std::size_t depth = 0;
    for (std::size_t i = 0; i < text.size(); ++i) {
        char const c = text[i];
        if (c == '"') {
            for (++i; i < text.size() && text[i] != '"'; ++i) i += text[i] == '\\' ? 1 : 0;
        } else if (c == '[' || c == '{') {
            if (++depth > kDeepestNesting) {
                throw InputError(lineAndColumn(text, i),
                                 "nested deeper than " + std::to_string(kDeepestNesting));
            }
        } else if (c == ']' || c == '}') {
            depth -= depth > 0 ? 1 : 0;
        } else if (c == '-' || std::isdigit(static_cast<unsigned char>(c)) != 0) {
            std::size_t const end =
                std::min(text.find_first_not_of("-+.eE0123456789", i), text.size());
            std::string_view const token = text.substr(i, end - i);
            if (!fitsIn64Bits(token)) {
                throw InputError(lineAndColumn(text, i), "a number beyond 64 bits");
            }
            i = end - 1;
        }
    }
}

std::string escaped(std::string const& key) {
    std::string result;
    for (char const c : key) {
        if (c == '~') {
            result += "~0";
        } else if (c == '/') {
            result += "~1";
        } else {
            result += c;
        }
    }
    return result;
}

}  // namespace

std::string readFile(std::string const& name) {
    std::error_code error;
    if (!std::filesystem::exists(name, error)) throw InputError("", "there is no such file");
    if (std::filesystem::is_directory(name, error)) throw InputError("", "it is a folder");
    std::ifstream file(name, std::ios::binary);
    if (!file) throw InputError("", "it cannot be opened");
    std::string text((std::istreambuf_iterator<char>(file)), {});
    if (file.bad()) throw InputError("", "it cannot be read");
    return text;
}

Json parseJson(std::string const& text) {
    if (text.find_first_not_of(" \t\r\n") == std::string::npos) {
        throw InputError("", "it is empty");
    }
    checkDepthAndNumbers(text);
    try {
        return Json::parse(text);
    } catch (Json::parse_error const& error) {
        std::size_t const offset = error.byte > 0 ? error.byte - 1 : 0;
        bool const truncated = offset >= text.size();
        throw InputError(lineAndColumn(text, std::min(offset, text.size())),
                         truncated ? "the JSON ends too early" : "this is not valid JSON");
    }
}

Field Field::at(std::string const& key) const {
    auto const member = object().find(key);
    if (member == json->end()) refuse("\"" + printable(key) + "\" is missing");
    return Field(*this, *member, key);
}

bool Field::has(std::string const& key) const {
    auto const member = object().find(key);
    return member != json->end() && !member->is_null();
}

Field Field::element(std::size_t index) const {
    return Field(*this, array().at(index), std::to_string(index));
}

void Field::forEach(std::string const& key, std::function<void(Field const&)> const& visit) const {
    if (!has(key)) return;
    Field const list = at(key);
    for (std::size_t i = 0; i < list.array().size(); ++i) visit(list.element(i));
}

std::vector<double> Field::numbers(std::size_t count) const {
    if (array().size() != count) {
        refuse("expected " + std::to_string(count) + " numbers, found " +
               std::to_string(json->size()));
    }
    std::vector<double> result;
    for (std::size_t i = 0; i < count; ++i) result.push_back(element(i).number());
    return result;
}

Json const& Field::object() const {
    if (!json->is_object()) refuseType("an object");
    return *json;
}

Json const& Field::array() const {
    if (!json->is_array()) refuseType("an array");
    return *json;
}

std::string Field::text() const {
    if (!json->is_string()) refuseType("a text");
    return json->get<std::string>();
}

double Field::number() const {
    if (!json->is_number()) refuseType("a number");
    return json->get<double>();
}

long long Field::integer() const {
    if (!json->is_number_integer()) refuseType("an integer");
    if (json->is_number_unsigned() &&
        json->get<unsigned long long>() >
            static_cast<unsigned long long>(std::numeric_limits<long long>::max())) {
        refuse("an integer beyond the signed 64 bits");
    }
    return json->get<long long>();
}

bool Field::truth() const {
    if (!json->is_boolean()) refuseType("true or false");
    return json->get<bool>();
}

unsigned long long Field::identifier() const {
    if (!json->is_number_unsigned()) refuseType("an identifier, an integer from 1 on");
    auto const id = json->get<unsigned long long>();
    if (id == 0) refuse("the identifier 0 stands for nothing; identifiers start at 1");
    return id;
}

void Field::onlyKeys(std::vector<std::string> const& known) const {
    for (auto const& [key, member] : object().items()) {
        if (std::find(known.begin(), known.end(), key) == known.end()) {
            refuse("unknown key \"" + printable(key) + "\"");
        }
    }
}

std::string Field::pointer() const {
    if (parent == nullptr) return "";
    return parent->pointer() + "/" + escaped(step);
}

void Field::refuse(std::string const& problem) const {
    std::string const place = printable(pointer());
    throw InputError(place.empty() ? "the document" : place, problem);
}

void Field::refuseType(std::string const& wanted) const {
    std::string found = json->type_name();
    if (json->is_number() || json->is_boolean()) found += " " + json->dump();
    if (json->is_string())
        found += " \"" + printable(json->get<std::string>().substr(0, 40)) + "\"";
    refuse("expected " + wanted + ", found " + found);
}

std::string jsonText(Json const& json) {
    return json.dump(-1, ' ', false, Json::error_handler_t::replace);
}

std::string printable(std::string const& text) {
    std::string result;
    for (char const c : text) {
        auto const byte = static_cast<unsigned char>(c);
        if (c == '\n') {
            result += "\\n";
        } else if (byte < 0x20 || byte == 0x7f) {
            char const* const digits = "0123456789abcdef";
            result += std::string("\\x") + digits[byte >> 4] + digits[byte & 15];
        } else {
            result += c;
        }
    }
    return result;
}
