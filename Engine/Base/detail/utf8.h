// Engine/Base/detail/utf8.h: finds the characters of a UTF-8 string.
//
//     if (utf8Length(text) == 0) text.remove_prefix(1);  // A byte that begins none.

#ifndef TARN_ENGINE_BASE_DETAIL_UTF8_H
#define TARN_ENGINE_BASE_DETAIL_UTF8_H

#include <cstddef>
#include <string_view>

namespace tarn::engine::detail {

/// Whether this is a continuation byte.
inline bool isUtf8Continuation(char c) { return (static_cast<unsigned char>(c) & 0xc0u) == 0x80u; }

/// The number of bytes of the UTF-8 character that the non-empty string begins with; 0 where it is
/// invalid: overlong, a surrogate, or beyond U+10FFFF.
inline std::size_t utf8Length(std::string_view text) {
    auto const byte = [&](std::size_t i) { return static_cast<unsigned char>(text[i]); };
    unsigned const first = byte(0);
    std::size_t const length = first < 0x80                     ? 1
                               : first >= 0xc2 && first <= 0xdf ? 2
                               : first >= 0xe0 && first <= 0xef ? 3
                               : first >= 0xf0 && first <= 0xf4 ? 4
                                                                : 0;
    if (length == 0 || length > text.size()) return 0;
    for (std::size_t i = 1; i < length; ++i) {
        if (!isUtf8Continuation(text[i])) return 0;
    }
    bool const isRefused = (first == 0xe0 && byte(1) < 0xa0) ||
                           (first == 0xed && byte(1) >= 0xa0) ||
                           (first == 0xf0 && byte(1) < 0x90) || (first == 0xf4 && byte(1) >= 0x90);
    return isRefused ? 0 : length;
}

}  // namespace tarn::engine::detail

#endif
