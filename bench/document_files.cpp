#include "bench.h"
#include "graph_documents.h"

#include <Engine/Document/document.h>

#include <nlohmann/json.hpp>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

#include <unistd.h>

using namespace tarn::engine;

namespace {

constexpr std::size_t kPatches = 100000;
constexpr int kRepetitions = 9;

std::string contentsOf(std::string const& file) {
    std::ifstream stream(file, std::ios::binary);
    return std::string((std::istreambuf_iterator<char>(stream)), {});
}

template <class Work>
double microseconds(Work work) {
    auto const start = std::chrono::steady_clock::now();
    auto result = work();
    benchmark::DoNotOptimize(result);
    return std::chrono::duration<double, std::micro>(std::chrono::steady_clock::now() - start)
        .count();
}

// In a process of its own: what another operation leaves in the heap is no part of it.
double measuredApart(std::string const& operation, std::string const& file) {
    std::string const self = std::filesystem::read_symlink("/proc/self/exe").string();
    std::string const command = "'" + self + "' --apart '" + operation + "' '" + file + "'";
    std::FILE* const pipe = popen(command.c_str(), "r");
    char line[64] = "";
    bench::agree(pipe != nullptr && std::fgets(line, sizeof line, pipe) != nullptr &&
                     pclose(pipe) == 0,
                 "a process of its own");
    return std::strtod(line, nullptr);
}

void forDocument(std::string const& name, std::size_t groupSize) {
    std::string const read = "read a document of 100,000 patches, " + name;
    std::string const written = "write a document of 100,000 patches, " + name;
    bench::target(read, 1.3);
    bench::target(written, 1.2);
    if (!bench::isWanted(read) && !bench::isWanted(written)) return;
    std::string const file = (std::filesystem::temp_directory_path() /
                              ("tarn_bench_" + std::to_string(::getpid()) + ".json"))
                                 .string();
    {
        Patch const graph = bench::documentOf(kPatches, groupSize);
        bench::agree(saveDocument(file, graph), "a document that is saved");
        bench::agree(loadDocument(file) == graph, "the document that was written");
    }
    for (int i = 0; i < kRepetitions; ++i) {
        bench::record(read, "ours", measuredApart("read", file));
        bench::record(read, "nlohmann::json::parse", measuredApart("parse", file));
        bench::record(written, "ours", measuredApart("write", file));
        bench::record(written, "nlohmann::json::dump", measuredApart("dump", file));
    }
    std::filesystem::remove(file);
}

}  // namespace

double bench::documentOperation(std::string const& operation, std::string const& file) {
    std::string const text = contentsOf(file);
    if (operation == "read") return microseconds([&] { return readDocument(text); });
    if (operation == "parse") return microseconds([&] { return nlohmann::json::parse(text); });
    if (operation == "write") {
        Patch const graph = *readDocument(text);
        return microseconds([&] { return writeDocument(graph); });
    }
    nlohmann::json const json = nlohmann::json::parse(text);
    return microseconds([&] { return json.dump(); });
}

void bench::documentFiles() {
    forDocument("in groups of 100", 100);
    forDocument("flat", kPatches);
}
