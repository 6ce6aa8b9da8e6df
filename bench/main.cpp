// Measures the library and its alternatives, and prints one table.
//
//     bench --quick --compare docs/benchmark_table.md

#include "bench.h"
#include "processes.h"
#include "table.h"

#include <CLI/CLI.hpp>

#include <malloc.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <iostream>
#include <random>
#include <regex>
#include <string>
#include <thread>
#include <vector>

namespace bench {

namespace {

std::deque<Operation>& operations() {
    static std::deque<Operation> list;
    return list;
}

std::vector<std::function<void()>>& agreements() {
    static std::vector<std::function<void()>> list;
    return list;
}

void describeAll() {
    values();
    toString();
    data();
    paths();
    easing();
    graphs();
    edits();
    documentFiles();
}

// Runs one implementation of one operation, in a child process.
int runOne(std::string const& name, std::string const& who, int repetitions) {
    for (Operation::Entry const& entry : operation(name).entries) {
        if (entry.who != who) continue;
        for (double const figure : entry.run(repetitions)) std::printf("%.17g\n", figure);
        return 0;
    }
    return 1;
}

// Measures all implementations of an operation, in another order in each round.
Row measured(Operation const& operation, int rounds, int repetitions) {
    static std::mt19937 random(1);
    Row row{operation.name, {}, operation.target, operation.comparedWith, operation.isInBytes};
    for (Operation::Entry const& entry : operation.entries) row.results.push_back({entry.who, {}});
    std::vector<std::size_t> order(row.results.size());
    for (std::size_t i = 0; i < order.size(); ++i) order[i] = i;
    for (int round = 0; round < rounds; ++round) {
        std::shuffle(order.begin(), order.end(), random);
        for (std::size_t const i : order) {
            Result& result = row.results[i];
            for (double const figure : figuresOfProcess(
                     {"--run", operation.name, result.who, std::to_string(repetitions)})) {
                result.figures.push_back(figure);
            }
        }
    }
    std::fprintf(stderr, ".");
    return row;
}

void requireKnownPeers() {
    for (Operation const& operation : operations()) {
        bool isKnown = operation.comparedWith.empty();
        for (auto const& entry : operation.entries) isKnown |= entry.who == operation.comparedWith;
        agree(isKnown, ("unknown library to compare with: " + operation.name).c_str());
        // Setting a target for a misspelt name would add an empty row.
        agree(!operation.entries.empty(), ("no implementations: " + operation.name).c_str());
    }
}

}  // namespace

Operation& Operation::peer(std::string who, Implementation run) {
    entries.push_back({std::move(who), std::move(run)});
    return *this;
}
Operation& Operation::atMost(double multiple, std::string peerName) {
    target = multiple;
    return against(std::move(peerName));
}
Operation& Operation::against(std::string peerName) {
    comparedWith = std::move(peerName);
    return *this;
}
Operation& Operation::quick() {
    isQuick = true;
    return *this;
}

Operation& Operation::inBytes() {
    isInBytes = true;
    return *this;
}

Operation& operation(std::string const& name) {
    auto const found = std::find_if(operations().begin(), operations().end(),
                                    [&](Operation const& o) { return o.name == name; });
    return found != operations().end() ? *found : operations().emplace_back(Operation{name});
}

void agreement(std::function<void()> check) { agreements().push_back(std::move(check)); }

void agree(bool same, char const* what) {
    if (same) return;
    std::cerr << "check failed: " << what << "\n";
    std::exit(1);
}

std::string grouped(std::size_t number) {
    std::string digits = std::to_string(number);
    for (std::size_t i = digits.size(); i > 3; i -= 3) digits.insert(i - 3, ",");
    return digits;
}

double heapBytes() {
    struct mallinfo2 const info = mallinfo2();
    return static_cast<double>(info.uordblks + info.hblkhd);
}

}  // namespace bench

namespace {

struct Options {
    bool quick = false;
    std::string filter;
    std::string kept;
    int rounds = 3;

    explicit Options(CLI::App& app) {
        app.add_flag("--quick", quick, "Measure only the main operations, with one round");
        app.add_option("--filter", filter, "Measure only the operations whose names match")
            ->type_name("REGEX");
        app.add_option("--compare", kept,
                       "List the operations whose ratio is worse by more than a tenth than in this "
                       "table; exit with 1 where there are any")
            ->type_name("TABLE");
        app.add_option("--rounds", rounds,
                       "Processes per implementation, with three repetitions each")
            ->check(CLI::Range(1, 100))
            ->capture_default_str();
    }
};

// libstdc++ counts references without atomics while a program has only one thread.
class SecondThread {
public:
    SecondThread() = default;
    ~SecondThread() {
        done = true;
        thread.join();
    }
    SecondThread(SecondThread const&) = delete;
    SecondThread& operator=(SecondThread const&) = delete;

private:
    std::atomic<bool> done{false};
    std::thread thread{[this] {
        while (!done) std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }};
};

int measure(Options const& options) {
    bench::requireKnownPeers();
    static_cast<void>(bench::figuresOfProcess({"--agree"}));
    std::vector<bench::Row> rows;
    for (bench::Operation const& operation : bench::operations()) {
        bool const wanted = std::regex_search(operation.name, std::regex(options.filter));
        if (!wanted || (options.quick && !operation.isQuick)) continue;
        rows.push_back(bench::measured(operation, options.quick ? 1 : options.rounds, 3));
    }
    std::fprintf(stderr, "\n");
    std::cout << bench::tableOf(rows);
    std::string const above = bench::aboveLimit(rows);
    if (!above.empty()) std::cout << "\nAbove the limits in bench/:\n" << above;
    if (options.kept.empty()) return 0;
    std::string const worse = bench::whatIsWorse(rows, options.kept);
    std::cout << "\n" << (worse.empty() ? "No operation is worse by more than a tenth.\n" : worse);
    return worse.empty() ? 0 : 1;
}

}  // namespace

int main(int argc, char** argv) {
    // As in a process that has run for a while: freed memory stays with the process, and the kernel
    // does not affect the measurement.
    mallopt(M_MMAP_THRESHOLD, 1 << 30);
    mallopt(M_TRIM_THRESHOLD, 1 << 30);
    SecondThread const second;

    bench::describeAll();
    if (argc == 5 && std::string(argv[1]) == "--run") {
        return bench::runOne(argv[2], argv[3], std::atoi(argv[4]));
    }
    if (argc == 2 && std::string(argv[1]) == "--agree") {
        for (auto const& check : bench::agreements()) check();
        return 0;
    }

    CLI::App app("Measures the library and its alternatives, and prints a table. Every "
                 "implementation of an operation runs in its own process.");
    Options options(app);
    try {
        app.parse(argc, argv);
    } catch (CLI::ParseError const& error) {
        return app.exit(error);
    }
    return measure(options);
}
