#include "bench.h"
#include "graph_documents.h"

#include <Engine/Document/document.h>

#include <nlohmann/json.hpp>

#include <string>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr std::size_t kPatches = 100000;

// One repetition for each process: what it leaves in the heap must not affect the next.
template <class Make, class Work>
bench::Implementation once(Make make, Work work) {
    return [=](int) {
        auto const input = make();
        return std::vector<double>{bench::secondsOf(work, input) * 1e6};
    };
}

void forDocument(std::string const& name, std::size_t groupSize) {
    auto const graph = [groupSize] { return bench::documentOf(kPatches, groupSize); };
    auto const text = [graph] { return writeDocument(graph()); };
    auto const json = [text] { return nlohmann::json::parse(text()); };
    bench::agreement([graph, text] {
        bench::agree(readDocument(text()) == graph(), "the document that was written");
    });
    bench::operation("read a document of 100,000 patches, " + name)
        .ours(once(text, [](std::string const& t) { return readDocument(t); }))
        .peer("nlohmann::json::parse",
              once(text, [](std::string const& t) { return nlohmann::json::parse(t); }))
        .atMost(1.3);
    bench::operation("write a document of 100,000 patches, " + name)
        .ours(once([text] { return *readDocument(text()); },
                   [](Patch const& root) { return writeDocument(root); }))
        .peer("nlohmann::json::dump",
              once(json, [](nlohmann::json const& data) { return data.dump(); }))
        .atMost(1.2);
}

}  // namespace

void bench::documentFiles() {
    forDocument("in groups of 100", 100);
    forDocument("flat", kPatches);
}
