// bench/table.h: prints the results as a table, and compares it with a saved one.

#ifndef TARN_BENCH_TABLE_H
#define TARN_BENCH_TABLE_H

#include <string>
#include <vector>

namespace bench {

/// The figures of one implementation.
struct Result {
    std::string who;
    std::vector<double> figures;
};

/// The results of an operation, ours first, and the target: at most that multiple of the named or
/// the fastest library. 0 is no target.
struct Row {
    std::string name;
    std::vector<Result> results;
    double target;
    std::string against;
    bool isInBytes;
};

/// Formats a Markdown table.
std::string tableOf(std::vector<Row> const& rows);

/// One line for each row whose ratio is above its target.
std::string aboveLimit(std::vector<Row> const& rows);

/// One line for each row whose ratio is worse by more than a tenth than in the table of the file
/// `kept`. Ends the program where the file has no such table.
std::string whatIsWorse(std::vector<Row> const& rows, std::string const& kept);

}  // namespace bench

#endif
