// Engine/Document/detail/texts.h: encodes strings and numbers that JSON cannot express.
//
//     std::string name = "\x1a" "ff";
//     bool isRight = decodeText(name);  // The byte 0xff.

#ifndef TARN_ENGINE_DOCUMENT_DETAIL_TEXTS_H
#define TARN_ENGINE_DOCUMENT_DETAIL_TEXTS_H

#include <Engine/Base/optional.h>
#include <Engine/Base/unstructured.h>

#include <string>
#include <string_view>

namespace tarn::engine::detail {

/// U+001A, "substitute": in a document, this character and two hexadecimal digits encode one byte.
constexpr char kByteEscape = '\x1a';

/// Decodes such bytes. False where digits are missing.
bool decodeText(std::string& text);

/// A string for people: control characters are escaped as "\n" or "\x1f".
std::string printable(std::string_view text);

/// A step of a JSON pointer, with its slash.
std::string pointerStep(std::string_view key);
std::string pointerStep(std::size_t index);

/// The string for a number that JSON lacks: "inf", "-inf", "nan", or "nan:" and the sixteen
/// hexadecimal digits of another NaN's bits.
std::string nonFiniteText(double number);
Optional<double> nonFiniteNumber(std::string_view text);

/// Parses an integer beyond the 53 bits that every JSON reader keeps, in decimal digits.
Optional<long long> integerOfText(std::string_view text);
Optional<unsigned long long> identifierOfText(std::string_view text);

/// The largest integer that is written as a number.
constexpr long long kLargestNumber = 9007199254740992;  // 2^53

/// Describes a value in an error: "number 5", "string \"x\"", "array".
std::string describe(Unstructured const& data);

}  // namespace tarn::engine::detail

#endif
