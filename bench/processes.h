// bench/processes.h: this program, run again for a part of its work.

#ifndef TARN_BENCH_PROCESSES_H
#define TARN_BENCH_PROCESSES_H

#include <string>
#include <vector>

namespace bench {

/// The numbers that this program prints, a line each, when it is run with these arguments. A
/// process that fails ends this one too.
std::vector<double> figuresOfProcess(std::vector<std::string> const& arguments);

}  // namespace bench

#endif
