// web/src/graphs.h: handles that JavaScript has for graphs.

#ifndef WEB_GRAPHS_H
#define WEB_GRAPHS_H

#include <Engine/Base/patch.h>

#include <cstdint>
#include <memory>
#include <utility>

namespace web {

// A handle for a patch: it keeps the root that contains it alive.
using Address = std::uintptr_t;
inline tarn::engine::Patch const& patchAt(Address address) {
    return *reinterpret_cast<tarn::engine::Patch const*>(address);
}

// A graph at a fixed address.
struct Root {
    explicit Root(tarn::engine::Patch root)
        : patch(std::make_shared<tarn::engine::Patch const>(std::move(root))) {}

    std::shared_ptr<tarn::engine::Patch const> patch;
};

}  // namespace web

#endif
