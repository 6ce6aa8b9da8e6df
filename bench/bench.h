// bench/bench.h: the benchmarked operations, each with the library's implementation and those of
// other libraries. Every implementation runs in its own process.
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

/// Runs the measured code and returns a figure for each repetition: microseconds, or another unit
/// that the figure has.
using Implementation = std::function<std::vector<double>(int repetitions)>;

/// Times `run`, which returns the seconds of one iteration, with Google Benchmark.
std::vector<double> timed(int repetitions, std::function<double()> const& run);

/// The seconds that `work(input)` takes. `work` returns its result, so that its destruction is not
/// timed.
template <class Work, class Input>
double secondsOf(Work const& work, Input& input) {
    auto const start = std::chrono::steady_clock::now();
    auto result = work(input);
    benchmark::DoNotOptimize(result);
    benchmark::ClobberMemory();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

/// `work` on one input, constructed before.
template <class Make, class Work>
Implementation on(Make make, Work work) {
    return [=](int repetitions) {
        auto const input = make();
        return timed(repetitions, [&] { return secondsOf(work, input); });
    };
}

/// `work` on a new input each time, whose construction is not timed.
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

/// The number of bytes that `count()` returns.
template <class Count>
Implementation bytes(Count count) {
    return [=](int) { return std::vector<double>{static_cast<double>(count())}; };
}

/// A row of the table.
struct Operation {
    /// The library's name and implementation; ours is first.
    struct Entry {
        std::string who;
        Implementation run;
    };

    Operation& ours(Implementation run) { return peer("ours", std::move(run)); }
    Operation& peer(std::string who, Implementation run);
    /// The library to compare with, where it is not the fastest one.
    Operation& against(std::string peerName);
    /// The target: ours may cost this multiple of the fastest or of the named library.
    Operation& atMost(double multiple, std::string peerName = "");
    /// One of the rows that `--quick` measures.
    Operation& quick();
    /// The figures are numbers of bytes instead of microseconds.
    Operation& inBytes();

    std::string name;
    std::vector<Entry> entries = {};
    double target = 0.0;
    std::string comparedWith = {};
    bool isQuick = false;
    bool isInBytes = false;
};

/// Returns the row with this name; adds it if needed.
Operation& operation(std::string const& name);

/// A check before anything is measured: that all libraries agree.
void agreement(std::function<void()> check);

/// Ends the program where the libraries' results differ.
void agree(bool same, char const* what);

/// The bytes of the heap in use.
double heapBytes();

/// Like "100,000".
std::string grouped(std::size_t number);

// One for each subject.
void values();
void toString();
void data();
void paths();
void easing();
void graphs();
void edits();
void documentFiles();

}  // namespace bench

#endif
