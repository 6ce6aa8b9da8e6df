#include "bench.h"
#include "graph_documents.h"

#include <Engine/Document/document.h>

#include <nlohmann/json.hpp>

#include <memory>
#include <string>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr std::size_t kPatches = 100000;

void forDocument(std::string const& name, std::size_t groupSize) {
    static std::vector<std::unique_ptr<Patch>> graphs;
    static std::vector<std::unique_ptr<std::string>> texts;
    static std::vector<std::unique_ptr<nlohmann::json>> trees;
    graphs.push_back(std::make_unique<Patch>(bench::documentOf(kPatches, groupSize)));
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
