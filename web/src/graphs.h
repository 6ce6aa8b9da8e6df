// web/src/graphs.h: what JavaScript holds of a graph.

#ifndef WEB_GRAPHS_H
#define WEB_GRAPHS_H

#include <Engine/Base/patch.h>

#include <memory>
#include <utility>

namespace web {

// A graph in one place, whatever becomes of its owner.
struct Root {
    explicit Root(tarn::engine::Patch root)
        : patch(std::make_shared<tarn::engine::Patch const>(std::move(root))) {}

    std::shared_ptr<tarn::engine::Patch const> patch;
};

}  // namespace web

#endif
