#include "bench.h"
#include "graph_documents.h"

#include <Engine/Base/patch_changes.h>
#include <Engine/Base/patch_edit.h>
#include <Engine/Base/patch_index.h>

#include <memory>
#include <ostream>
#include <streambuf>
#include <string>
#include <utility>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr std::size_t kPatches = 100000;
constexpr std::size_t kMany = 1000000;
constexpr std::size_t kGroup = 100;

// The root with another default value of the input of the patch `id`, or of the next patch where
// that is a group.
Patch edited(PatchIndex const& index, unsigned long long id, double value) {
    PatchEdit edit(index);
    Port* const input = edit.inputPort(id * 2);
    (input != nullptr ? input : edit.inputPort(id * 2 + 2))->defaultValue = value;
    return edit.commit();
}

// A document, a copy that shares nothing, and one that differs by an edit deep inside.
struct Document {
    Document(std::size_t patches, std::size_t groupSize)
        : place(patches / 2 + 7),
          index(bench::documentOf(patches, groupSize)),
          twin(bench::documentOf(patches, groupSize)),
          first(index.root()),
          second(edited(index, place, -1.0)) {
        index.update(first);
        bench::agree(patchChanges(first, second).size() == 1, "what an edit changes");
    }

    unsigned long long place;
    PatchIndex index;
    Patch twin;
    Patch first;
    Patch second;
    bool isSecond = false;
};

struct NullBuffer : std::streambuf {
    std::streamsize xsputn(char const*, std::streamsize n) override { return n; }
    int overflow(int c) override { return c; }
};

auto edit(Document& d) { return edited(d.index, d.place, 0.25); }
auto update(Document& d) {
    d.isSecond = !d.isSecond;
    d.index.update(d.isSecond ? d.second : d.first);
    return d.isSecond;
}
auto changes(Document& d) { return patchChanges(d.first, d.second); }
auto build(Document& d) { return PatchIndex(d.first); }
auto compare(Document& d) { return d.first == d.twin; }
auto convert(Document& d) { return EvalPatch(d.first); }
auto text(Document& d) {
    NullBuffer buffer;
    std::ostream stream(&buffer);
    stream << d.first;
    return stream.good();
}

template <class Work>
bench::Implementation onDocument(std::size_t patches, std::size_t groupSize, Work work) {
    return bench::on([=] { return std::make_unique<Document>(patches, groupSize); },
                     [work](std::unique_ptr<Document> const& document) { return work(*document); });
}

// Compared with building an index, which an edit cost before.
template <class Work>
void besideAnIndex(std::string const& name, std::size_t groupSize, double atMost, Work work) {
    bench::operation(name + ", 100,000 patches " +
                     (groupSize == kPatches ? "in one list" : "in groups"))
        .ours(onDocument(kPatches, groupSize, work))
        .peer("building an index", onDocument(kPatches, groupSize, build))
        .atMost(atMost);
}

// A document of ten times the size, compared with ten times the work on the smaller one.
template <class Work>
void ofMany(std::string const& name, Work work) {
    bench::operation(name + ", 1,000,000 patches in groups")
        .ours(onDocument(kMany, kGroup, work))
        .peer("ten times 100,000", onDocument(kPatches, kGroup,
                                              [work](Document& d) {
                                                  for (int i = 0; i < 9; ++i) {
                                                      benchmark::DoNotOptimize(work(d));
                                                  }
                                                  return work(d);
                                              }))
        .atMost(2.0);
}

void memory() {
    for (std::size_t const patches : {kPatches, kMany}) {
        bench::operation("memory of a patch with two ports, " + bench::grouped(patches) +
                         " patches")
            .inBytes()
            .ours(bench::bytes([patches] {
                double const before = bench::heapBytes();
                Patch const root = bench::documentOf(patches, kGroup);
                return (bench::heapBytes() - before) / static_cast<double>(patches);
            }));
    }
    for (std::size_t const groupSize : {kGroup, kPatches}) {
        bool const isFlat = groupSize == kPatches;
        bench::operation(std::string("memory of an undo step, 100,000 patches ") +
                         (isFlat ? "in one list" : "in groups"))
            .inBytes()
            .ours(bench::bytes([groupSize, steps = isFlat ? 10ULL : 1000ULL] {
                PatchIndex index(bench::documentOf(kPatches, groupSize));
                std::vector<Patch> history;
                history.reserve(steps);
                double const before = bench::heapBytes();
                for (unsigned long long i = 0; i < steps; ++i) {
                    history.push_back(index.root());
                    index.update(edited(index, i * 97 + 7, 0.5));
                }
                return (bench::heapBytes() - before) / static_cast<double>(steps);
            }));
    }
}

}  // namespace

void bench::edits() {
    for (std::size_t const groupSize : {kGroup, kPatches}) {
        bool const isFlat = groupSize == kPatches;
        besideAnIndex("edit a port", groupSize, isFlat ? 10.0 : 0.01, edit);
        besideAnIndex("update the index after the edit", groupSize, isFlat ? 0.1 : 0.02, update);
        besideAnIndex("patchChanges of the edit", groupSize, isFlat ? 10.0 : 0.01, changes);
    }
    ofMany("build an index", build);
    ofMany("== unshared", compare);
    ofMany("convert for evaluation", convert);
    ofMany("debug output", text);
    ofMany("edit a port", edit);
    ofMany("update the index after the edit", update);
    ofMany("patchChanges of the edit", changes);
    memory();
}
