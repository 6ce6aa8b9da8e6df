// Measures the library beside what its users would otherwise pick, and prints one table.
//
//     bench [--benchmark_filter=REGEX] [--benchmark_repetitions=N]

#include "bench.h"

#include <malloc.h>

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <map>
#include <regex>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

namespace bench {

namespace {

std::vector<Target>& targets() {
    static std::vector<Target> list;
    return list;
}

std::string& filter() {
    static std::string pattern;
    return pattern;
}

// By operation, then by who did it: the time of each repetition.
using Times = std::map<std::string, std::vector<double>>;

struct Operation {
    std::string name;
    std::vector<std::string> order;
    Times times;
};

std::vector<Operation>& operations() {
    static std::vector<Operation> list;
    return list;
}

Operation& operationNamed(std::string const& name) {
    auto found = std::find_if(operations().begin(), operations().end(),
                              [&](Operation const& o) { return o.name == name; });
    if (found != operations().end()) return *found;
    operations().push_back({name, {}, {}});
    return operations().back();
}

std::vector<double>& timesOf(std::string const& operation, std::string const& who) {
    Operation& named = operationNamed(operation);
    if (named.times.count(who) == 0) named.order.push_back(who);
    return named.times[who];
}

double median(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    return values[values.size() / 2];
}

double minimum(std::vector<double> const& values) {
    return *std::min_element(values.begin(), values.end());
}

class Collector : public benchmark::BenchmarkReporter {
public:
    bool ReportContext(Context const&) override { return true; }
    void ReportRuns(std::vector<Run> const& runs) override {
        for (Run const& run : runs) {
            if (run.run_type != Run::RT_Iteration) continue;
            std::string const& name = run.run_name.function_name;
            std::size_t const bar = name.find('|');
            timesOf(name.substr(0, bar), name.substr(bar + 1)).push_back(run.GetAdjustedRealTime());
        }
        std::fprintf(stderr, ".");
    }
};

void printOperation(Operation const& operation) {
    auto const ours = operation.times.find("ours");
    if (ours == operation.times.end()) return;
    double best = 0.0;
    std::string peers;
    for (std::string const& who : operation.order) {
        std::vector<double> const& times = operation.times.at(who);
        if (who == "ours") continue;
        double const time = median(times);
        best = best == 0.0 ? time : std::min(best, time);
        char text[96];
        std::snprintf(text, sizeof text, "%s%s %.4g", peers.empty() ? "" : ", ", who.c_str(), time);
        peers += text;
    }
    double const own = median(ours->second);
    std::printf("| %s | %.4g (%.4g) | %s | ", operation.name.c_str(), own, minimum(ours->second),
                peers.c_str());
    if (best > 0.0) std::printf("%.3g", own / best);
    std::printf(" | ");
    char const* separator = "";
    for (Target const& t : targets()) {
        if (t.operation != operation.name) continue;
        bool const named = operation.times.count(t.against) != 0;
        double const reference = named ? median(operation.times.at(t.against)) : best;
        double const ratio = own / reference;
        std::printf("%s%.3g of %s, at most %.4g%s", separator, ratio, t.against.c_str(), t.atMost,
                    ratio <= t.atMost ? "" : " (missed)");
        separator = "; ";
    }
    std::printf(" |\n");
}

}  // namespace

void target(std::string operation, double atMost, std::string against) {
    targets().push_back({std::move(operation), atMost, std::move(against)});
}

bool isWanted(std::string const& operation) {
    return std::regex_search(operation, std::regex(filter()));
}

void announce(std::string const& operation) { operationNamed(operation); }

void record(std::string operation, std::string who, double figure) {
    timesOf(operation, who).push_back(figure);
}

}  // namespace bench

int main(int argc, char** argv) {
    // As in a process that has run for a while: memory that was given back is there, and the
    // kernel has no part in what is measured.
    mallopt(M_MMAP_THRESHOLD, 1 << 30);
    mallopt(M_TRIM_THRESHOLD, 1 << 30);

    // The C++ library counts references without atomics while a program has one thread.
    std::atomic<bool> done{false};
    std::thread second([&done] {
        while (!done) std::this_thread::sleep_for(std::chrono::milliseconds(50));
    });

    if (argc == 4 && std::string_view(argv[1]) == "--apart") {
        std::printf("%.1f\n", bench::documentOperation(argv[2], argv[3]));
        done = true;
        second.join();
        return 0;
    }
    constexpr std::string_view kFilter = "--benchmark_filter=";
    for (int i = 1; i < argc; ++i) {
        std::string_view const argument = argv[i];
        if (argument.substr(0, kFilter.size()) == kFilter) {
            bench::filter() = argument.substr(kFilter.size());
        }
    }

    std::vector<char*> arguments(argv, argv + argc);
    char interleave[] = "--benchmark_enable_random_interleaving=true";
    char repetitions[] = "--benchmark_repetitions=9";
    char shortest[] = "--benchmark_min_time=0.02";
    arguments.insert(arguments.begin() + 1, {interleave, repetitions, shortest});
    int count = static_cast<int>(arguments.size());

    bench::values();
    bench::texts();
    bench::data();
    bench::paths();
    bench::easing();
    bench::graphs();
    bench::edits();
    bench::documentFiles();

    benchmark::Initialize(&count, arguments.data());
    bench::Collector collector;
    benchmark::RunSpecifiedBenchmarks(&collector);
    std::fprintf(stderr, "\n");

    std::printf(
        "Microseconds unless said otherwise: the median of the repetitions (the minimum).\n\n");
    std::printf("| operation | ours | peers | to the best peer | to the target |\n");
    std::printf("|---|---|---|---|---|\n");
    for (auto const& operation : bench::operations()) bench::printOperation(operation);
    done = true;
    second.join();
}
