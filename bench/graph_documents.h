// bench/graph_documents.h: the graphs for benchmarks.

#ifndef TARN_BENCH_GRAPH_DOCUMENTS_H
#define TARN_BENCH_GRAPH_DOCUMENTS_H

#include <Engine/Base/patch.h>

#include <cstddef>
#include <string>
#include <utility>
#include <vector>

namespace bench {

/// Patches with an input, an output and a position, each connected to the previous one, in groups
/// of this size. Identifiers are consecutive; the root has 1.
inline tarn::engine::Patch documentOf(std::size_t patches, std::size_t groupSize) {
    using namespace tarn::engine;
    Patch root;
    root.id = 1;
    unsigned long long next = 1;
    std::vector<Patch> groups;
    while (groups.size() * groupSize < patches) {
        Patch group;
        group.id = ++next;
        group.name = "group";
        std::vector<Patch> children;
        std::vector<Connection> connections;
        for (std::size_t i = 0; i < groupSize; ++i) {
            Patch patch;
            patch.id = ++next;
            patch.builtin = 8;
            patch.name = "patch " + std::to_string(next);
            auto const number = static_cast<double>(next);
            patch.inputs =
                arrayOf<Port>({Port{next * 2, 1, "in", TypeInfo{Type::Float}, number * 0.5}});
            patch.outputs = arrayOf<Port>(
                {Port{next * 2 + 1, 1, "out", TypeInfo{Type::Vec2}, FloatVec2{number, -number}}});
            patch.attributes["position"] = Unstructured::Array{static_cast<long long>(i), 20};
            if (i > 0) {
                connections.push_back({next - 1, next * 2 - 1, next, next * 2});
            }
            children.push_back(std::move(patch));
        }
        group.children = arrayOf(std::move(children));
        group.connections = arrayOf(std::move(connections));
        groups.push_back(std::move(group));
    }
    root.children = arrayOf(std::move(groups));
    return root;
}

}  // namespace bench

#endif
