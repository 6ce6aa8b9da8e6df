#include <Engine/Document/detail/texts.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace tarn::engine::detail {

namespace {

constexpr std::string_view kHexDigits = "0123456789abcdef";
constexpr std::string_view kNaN = "nan";

std::uint64_t bitsOf(double number) {
    std::uint64_t bits = 0;
    std::memcpy(&bits, &number, sizeof bits);
    return bits;
}

// Whether the whole string is that number, in the form in which it would be written.
template <class Integer>
bool isDecimal(std::string_view text, Integer& number) {
    char const* const end = text.data() + text.size();
    return std::from_chars(text.data(), end, number).ptr == end && std::to_string(number) == text;
}

template <class Integer>
Optional<Integer> decimal(std::string_view text) {
    Integer number = 0;
    if (!isDecimal(text, number)) return std::nullopt;
    return number;
}

}  // namespace

bool decodeText(std::string& text) {
    std::size_t position = text.find(kByteEscape);
    if (position == std::string::npos) return true;
    std::size_t end = position;
    while (position < text.size()) {
        if (text[position] != kByteEscape) {
            text[end++] = text[position++];
            continue;
        }
        if (text.size() - position < 3) return false;
        std::size_t const high = kHexDigits.find(text[position + 1]);
        std::size_t const low = kHexDigits.find(text[position + 2]);
        if (high == std::string_view::npos || low == std::string_view::npos) return false;
        text[end++] = static_cast<char>(static_cast<unsigned char>(high * 16 + low));
        position += 3;
    }
    text.resize(end);
    return true;
}

std::string printable(std::string_view text) {
    std::string result;
    for (char const c : text) {
        auto const byte = static_cast<unsigned char>(c);
        if (c == '\n') {
            result += "\\n";
        } else if (byte < 0x20 || byte == 0x7f) {
            result += "\\x";
            result += kHexDigits[byte >> 4u];
            result += kHexDigits[byte & 15u];
        } else {
            result += c;
        }
    }
    return result;
}

std::string pointerStep(std::string_view key) {
    std::string result = "/";
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

std::string pointerStep(std::size_t index) { return "/" + std::to_string(index); }

std::string nonFiniteText(double number) {
    if (std::isinf(number)) return number < 0.0 ? "-inf" : "inf";
    constexpr std::uint64_t kQuietNaN = 0x7ff8000000000000;
    std::uint64_t const bits = bitsOf(number);
    std::string text(kNaN);
    if (bits == kQuietNaN) return text;
    text += ':';
    for (unsigned shift = 64; shift > 0; shift -= 4) text += kHexDigits[bits >> (shift - 4) & 15u];
    return text;
}

Optional<double> nonFiniteNumber(std::string_view text) {
    double number = std::numeric_limits<double>::infinity();
    if (text == "inf") return number;
    if (text == "-inf") return -number;
    if (text.substr(0, kNaN.size()) != kNaN) return std::nullopt;
    std::uint64_t bits = 0x7ff8000000000000;
    if (text.size() == kNaN.size() + 17) {
        char const* const end = text.data() + text.size();
        std::from_chars(end - 16, end, bits, 16);
    }
    std::memcpy(&number, &bits, sizeof number);
    if (!std::isnan(number) || nonFiniteText(number) != text) return std::nullopt;
    return number;
}

Optional<long long> integerOfText(std::string_view text) { return decimal<long long>(text); }

Optional<unsigned long long> identifierOfText(std::string_view text) {
    return decimal<unsigned long long>(text);
}

std::string describe(Unstructured const& data) {
    constexpr std::size_t kLongest = 40;
    switch (data.type()) {
        case Unstructured::Type::Null: return "null";
        case Unstructured::Type::Map: return "object";
        case Unstructured::Type::Array: return "array";
        case Unstructured::Type::Float:
        case Unstructured::Type::Integer: return "number " + data.toText();
        case Unstructured::Type::UnsignedInteger: return "number " + std::to_string(data.asId());
        case Unstructured::Type::String: break;
    }
    std::string_view const text = *data.ifString();
    return "string \"" + printable(text.substr(0, kLongest)) + "\"";
}

}  // namespace tarn::engine::detail
