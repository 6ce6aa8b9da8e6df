// bench/table.h: what was measured, as a table, and beside one that was kept.

#ifndef TARN_BENCH_TABLE_H
#define TARN_BENCH_TABLE_H

#include <string>
#include <vector>

namespace bench {

/// What one implementation took, each time.
struct Result {
    std::string who;
    std::vector<double> figures;
};

/// The results of an operation, ours first, and what ours may be: that multiple of the peer named,
/// or of the best one. 0 is no target.
struct Row {
    std::string name;
    std::vector<Result> results;
    double target;
    std::string against;
};

/// A Markdown table.
std::string tableOf(std::vector<Row> const& rows);

/// A line for each row whose ratio is larger by more than a tenth than in the table of the file
/// `kept`. Stops the program where the file has no such table.
std::string whatIsWorse(std::vector<Row> const& rows, std::string const& kept);

}  // namespace bench

#endif
