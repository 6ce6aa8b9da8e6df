#include "bench.h"

#include <Engine/Document/document.h>

#include <nlohmann/json.hpp>

#include <memory>
#include <string>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr std::size_t kPatches = 100000;

// Patches with an input, an output and a position, each connected with the one before, in groups of
// so many.
Patch graphInGroupsOf(std::size_t size) {
    Patch root;
    root.id = 1;
    unsigned long long next = 1;
    std::vector<Patch> groups;
    while (groups.size() * size < kPatches) {
        Patch group;
        group.id = ++next;
        group.name = "group";
        std::vector<Patch> children;
        std::vector<Connection> connections;
        for (std::size_t i = 0; i < size; ++i) {
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

void forDocument(std::string const& name, std::size_t groupSize) {
    static std::vector<std::unique_ptr<Patch>> graphs;
    static std::vector<std::unique_ptr<std::string>> texts;
    static std::vector<std::unique_ptr<nlohmann::json>> trees;
    graphs.push_back(std::make_unique<Patch>(graphInGroupsOf(groupSize)));
    Patch const& graph = *graphs.back();
    texts.push_back(std::make_unique<std::string>(writeDocument(graph)));
    std::string const& text = *texts.back();
    bench::agree(readDocument(text) == graph, "the document that was written");
    trees.push_back(std::make_unique<nlohmann::json>(nlohmann::json::parse(text)));

    std::string const read = "read a document of 100,000 patches, " + name;
    bench::measureOn(read, "ours", text, [](std::string const& t) { return readDocument(t); });
    bench::measureOn(read, "nlohmann::json::parse", text,
                     [](std::string const& t) { return nlohmann::json::parse(t); });
    bench::target(read, 1.3);
    std::string const written = "write a document of 100,000 patches, " + name;
    bench::measureOn(written, "ours", graph, [](Patch const& p) { return writeDocument(p); });
    bench::measureOn(written, "nlohmann::json::dump", *trees.back(),
                     [](nlohmann::json const& j) { return j.dump(); });
    bench::target(written, 1.2);
}

}  // namespace

void bench::documentFiles() {
    forDocument("in groups of 100", 100);
    forDocument("flat", kPatches);
}
