// web/src/graphs.h: what JavaScript holds of a graph.

#ifndef WEB_GRAPHS_H
#define WEB_GRAPHS_H

#include <Engine/Base/patch.h>

#include <cstdint>
#include <memory>
#include <utility>

namespace web {

// A patch as JavaScript knows it: that keeps the root which it lives in for as long as it has it.
using Address = std::uintptr_t;
inline tarn::engine::Patch const& patchAt(Address address) {
    return *reinterpret_cast<tarn::engine::Patch const*>(address);
}

// A graph in one place, whatever becomes of its owner.
struct Root {
    explicit Root(tarn::engine::Patch root)
        : patch(std::make_shared<tarn::engine::Patch const>(std::move(root))) {}

    std::shared_ptr<tarn::engine::Patch const> patch;
};

}  // namespace web

#endif
