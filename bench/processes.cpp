#include "processes.h"

#include "bench.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>

namespace bench {

namespace {

std::string quoted(std::string const& text) {
    std::string result = "'";
    for (char const c : text) result += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return result + "'";
}

// Collects the results of Google Benchmark: an adjusted time for each repetition.
class Collector : public benchmark::BenchmarkReporter {
public:
    bool ReportContext(Context const&) override { return true; }
    void ReportRuns(std::vector<Run> const& runs) override {
        for (Run const& run : runs) {
            if (run.run_type == Run::RT_Iteration) times.push_back(run.GetAdjustedRealTime());
        }
    }
    std::vector<double> times;
};

}  // namespace

std::vector<double> timed(int repetitions, std::function<double()> const& run) {
    benchmark::RegisterBenchmark("operation",
                                 [&run](benchmark::State& state) {
                                     for (auto _ : state) state.SetIterationTime(run());
                                 })
        ->UseManualTime()
        ->Unit(benchmark::kMicrosecond)
        ->MinTime(0.02)
        ->Repetitions(repetitions);
    Collector collector;
    benchmark::RunSpecifiedBenchmarks(&collector);
    return collector.times;
}

std::vector<double> figuresOfProcess(std::vector<std::string> const& arguments) {
    std::string command = quoted(std::filesystem::read_symlink("/proc/self/exe").string());
    for (std::string const& argument : arguments) command += " " + quoted(argument);
    std::FILE* const pipe = popen(command.c_str(), "r");
    agree(pipe != nullptr, "a process of its own");
    std::vector<double> figures;
    char line[64];
    while (std::fgets(line, sizeof line, pipe) != nullptr) {
        figures.push_back(std::strtod(line, nullptr));
    }
    agree(pclose(pipe) == 0, command.c_str());
    return figures;
}

}  // namespace bench
