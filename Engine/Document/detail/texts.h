// Engine/Document/detail/texts.h: what documents have for texts and numbers that JSON cannot
// express.
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

/// U+001A, "substitute": in a text of a document, it and two hexadecimal digits stand for a byte.
constexpr char kByteEscape = '\x1a';

/// Puts such bytes in their places. False where digits are missing.
bool decodeText(std::string& text);

/// What people read of a text: control characters as "\n" or "\x1f".
std::string printable(std::string_view text);

/// A step of a JSON pointer, with the slash before it.
std::string pointerStep(std::string_view key);
std::string pointerStep(std::size_t index);

/// A number that is none of JSON's: "inf", "-inf", "nan", or "nan:" and the sixteen hexadecimal
/// digits of another NaN's bits.
std::string nonFiniteText(double number);
Optional<double> nonFiniteNumber(std::string_view text);

/// An integer beyond the 53 bits that every reader of JSON keeps, in decimal digits.
Optional<long long> integerOfText(std::string_view text);
Optional<unsigned long long> identifierOfText(std::string_view text);

/// The largest integer that is written as a number.
constexpr long long kLargestNumber = 9007199254740992;  // 2^53

/// What a value is, for an error: "number 5", "string \"x\"", "array".
std::string describe(Unstructured const& data);

}  // namespace tarn::engine::detail

#endif
