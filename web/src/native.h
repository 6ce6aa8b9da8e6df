// web/src/native.h: how functions become JavaScript's. They are compiled without exceptions, which
// a third of the module would be: what JavaScript passes was looked at there, and where memory
// ends, so does the module.
//
//     native<&valueText>("valueText");

#ifndef WEB_NATIVE_H
#define WEB_NATIVE_H

#include <emscripten/bind.h>
#include <emscripten/val.h>

#include <string>

namespace web {

// Bytes of an answer, as a Uint8Array of its own. Texts are answered so too: embind would take a
// mark at their beginning away, and invent characters where bytes are none.
inline emscripten::val bytesOf(std::string const& bytes) {
    auto const* const first = reinterpret_cast<unsigned char const*>(bytes.data());
    return emscripten::val(emscripten::typed_memory_view(bytes.size(), first))
        .call<emscripten::val>("slice");
}

// An identifier or a count, which JavaScript passes as two halves.
inline unsigned long long idOf(unsigned low, unsigned high) {
    return static_cast<unsigned long long>(high) << 32 | low;
}

template <auto function>
void native(char const* name) {
    emscripten::function(name, function, emscripten::allow_raw_pointers());
}

}  // namespace web

#endif
