// bench/bench.h: one measured piece of work, done by us and by each of our peers.
//
//     measure("copy numbers", "ours", [] { return numbers(); }, [](auto const& loop) { ... });

#ifndef TARN_BENCH_BENCH_H
#define TARN_BENCH_BENCH_H

#include <benchmark/benchmark.h>

#include <chrono>
#include <cstdlib>
#include <iostream>
#include <string>
#include <utility>

namespace bench {

/// What ours may cost, as a multiple: of the best peer, or of the one peer that is named.
struct Target {
    std::string operation;
    double atMost;
    std::string against;
};

/// States a target. Operations without one are measured for the record.
void target(std::string operation, double atMost, std::string against = "the best");

/// Stops the program where peers and library do not agree on a result.
inline void agree(bool same, char const* what) {
    if (same) return;
    std::cerr << "no agreement: " << what << "\n";
    std::exit(1);
}

/// Puts the operation in its place in the table: that of its first mention.
void announce(std::string const& operation);

/// Registers `work`, which is timed, on what `prepare` makes, which is not. `work` returns what it
/// made, so that its destruction is not timed either.
template <class Prepare, class Work>
void measure(std::string const& operation, std::string const& who, Prepare prepare, Work work) {
    announce(operation);
    benchmark::RegisterBenchmark((operation + "|" + who).c_str(),
                                 [=](benchmark::State& state) {
                                     for (auto _ : state) {
                                         auto input = prepare();
                                         auto const start = std::chrono::steady_clock::now();
                                         auto result = work(input);
                                         benchmark::DoNotOptimize(result);
                                         benchmark::ClobberMemory();
                                         auto const end = std::chrono::steady_clock::now();
                                         state.SetIterationTime(
                                             std::chrono::duration<double>(end - start).count());
                                     }
                                 })
        ->UseManualTime()
        ->Unit(benchmark::kMicrosecond);
}

/// The same for work whose input stays as it is, prepared once.
template <class Input, class Work>
void measureOn(std::string const& operation, std::string const& who, Input const& input,
               Work work) {
    measure(
        operation, who, [&input] { return &input; }, [work](Input const* in) { return work(*in); });
}

/// Whether the operation is one of those that were asked for.
bool isWanted(std::string const& operation);

/// Microseconds that the operation ("read", "parse", "write" or "dump") takes on the document in
/// that file. For a process that does nothing else.
double documentOperation(std::string const& operation, std::string const& file);

/// A figure that is no time, such as bytes, shown beside the others.
void record(std::string operation, std::string who, double figure);

// One for each subject: checks that everyone agrees, then registers what is measured.
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
