// bench/processes.h: runs this program again for a part of its work.

#ifndef TARN_BENCH_PROCESSES_H
#define TARN_BENCH_PROCESSES_H

#include <string>
#include <vector>

namespace bench {

/// Runs this program with these arguments and returns the numbers that it prints, one per line.
/// Ends this process where the other fails.
std::vector<double> figuresOfProcess(std::vector<std::string> const& arguments);

}  // namespace bench

#endif
