// bench/bench.h: operations, done by us and by each of our peers, every one in a process of its
// own.
//
//     operation("copy numbers").ours(on(numbers<Value>, copy)).peer("std::any",
//     twins).atMost(1.15);

#ifndef TARN_BENCH_BENCH_H
#define TARN_BENCH_BENCH_H

#include <benchmark/benchmark.h>

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace bench {

/// Runs what is measured as often as asked for, and gives a figure for each time: microseconds, or
/// what the figure is in.
using Implementation = std::function<std::vector<double>(int repetitions)>;

/// Times `run`, which gives the seconds that one iteration took, with Google Benchmark.
std::vector<double> timed(int repetitions, std::function<double()> const& run);

/// The seconds that `work(input)` takes. It returns what it made, so that its destruction is not
/// timed.
template <class Work, class Input>
double secondsOf(Work const& work, Input& input) {
    auto const start = std::chrono::steady_clock::now();
    auto result = work(input);
    benchmark::DoNotOptimize(result);
    benchmark::ClobberMemory();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

/// `work` on one input, made before.
template <class Make, class Work>
Implementation on(Make make, Work work) {
    return [=](int repetitions) {
        auto const input = make();
        return timed(repetitions, [&] { return secondsOf(work, input); });
    };
}

/// `work` on an input of its own each time. Making that is not timed.
template <class Make, class Work>
Implementation onEach(Make make, Work work) {
    return [=](int repetitions) {
        return timed(repetitions, [&] {
            auto input = make();
            return secondsOf(work, input);
        });
    };
}

/// `work` without an input.
template <class Work>
Implementation doing(Work work) {
    return on([] { return 0; }, [work](int) { return work(); });
}

/// Something that is no time, such as a number of bytes.
template <class Figure>
Implementation figure(Figure figure) {
    return [=](int) { return std::vector<double>{figure()}; };
}

/// A row of the table.
struct Operation {
    /// Who does it, and how; ours is first.
    struct Entry {
        std::string who;
        Implementation run;
    };

    Operation& ours(Implementation run) { return peer("ours", std::move(run)); }
    Operation& peer(std::string who, Implementation run);
    /// Whom ours is compared with, where that is not the best peer.
    Operation& against(std::string peerName);
    /// What ours may cost, as a multiple of the best peer or of the one that is named.
    Operation& atMost(double multiple, std::string peerName = "");
    /// One of the rows that `--quick` measures.
    Operation& quick();

    std::string name;
    std::vector<Entry> entries = {};
    double target = 0.0;
    std::string comparedWith = {};
    bool isQuick = false;
};

/// The row of this name, which is made where there is none.
Operation& operation(std::string const& name);

/// Something that is checked before anything is measured: that peers and library agree.
void agreement(std::function<void()> check);

/// Stops the program where peers and library do not agree on a result.
void agree(bool same, char const* what);

/// The bytes of the heap that are in use.
double heapBytes();

// One for each subject.
void values();
void texts();
void data();
void paths();
void easing();
void graphs();
void edits();
void documentFiles();

}  // namespace bench

#endif
