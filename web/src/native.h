// web/src/native.h: exports functions to JavaScript. They are compiled without exceptions, which
// would be a third of the module: JavaScript checks the arguments, and running out of memory ends
// the module.
//
//     native<&valueText>("valueText");

#ifndef WEB_NATIVE_H
#define WEB_NATIVE_H

#include <emscripten/bind.h>
#include <emscripten/val.h>

#include <string>

namespace web {

// The bytes of a result as a new Uint8Array. Strings are returned so too: embind would remove a
// byte order mark and replace invalid bytes.
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
