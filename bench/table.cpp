#include "table.h"

#include "bench.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <map>
#include <sstream>

namespace bench {

namespace {

double minimum(Result const& result) {
    return *std::min_element(result.figures.begin(), result.figures.end());
}

// Two significant digits, or all digits before the point.
std::string shortened(double figure) {
    char text[64];
    std::snprintf(text, sizeof text, figure < 9.95 ? "%.2g" : "%.0f", figure);
    return text;
}

// Like "3.1 µs" or "120 kB".
std::string withUnit(double figure, bool isInBytes) {
    constexpr std::array<char const*, 4> kTimes{"ns", "µs", "ms", "s"};
    constexpr std::array<char const*, 4> kSizes{"bytes", "kB", "MB", "GB"};
    double scaled = isInBytes ? figure : 1000.0 * figure;
    std::size_t unit = 0;
    while (scaled >= 999.5 && unit + 1 < kTimes.size()) {
        scaled /= 1000.0;
        ++unit;
    }
    return shortened(scaled) + " " + (isInBytes ? kSizes : kTimes)[unit];
}

// Two decimals, fewer for large ratios and more for small ones.
std::string ratioText(double ratio) {
    char text[64];
    std::snprintf(text, sizeof text,
                  ratio >= 9.95  ? "%.0f"
                  : ratio >= 0.1 ? "%.2f"
                                 : "%.2g",
                  ratio);
    return text;
}

// The ratio of ours to the library to compare with; 0 where there is none. Uses minima, since noise
// only ever slows a run down.
double ratioOf(Row const& row) {
    double reference = 0.0;
    for (std::size_t i = 1; i < row.results.size(); ++i) {
        Result const& other = row.results[i];
        if (!row.against.empty() && other.who != row.against) continue;
        double const figure = minimum(other);
        reference = reference == 0.0 ? figure : std::min(reference, figure);
    }
    return reference == 0.0 ? 0.0 : minimum(row.results.front()) / reference;
}

std::string lineOf(Row const& row) {
    std::string others;
    for (std::size_t i = 1; i < row.results.size(); ++i) {
        Result const& other = row.results[i];
        others += (others.empty() ? "" : ", ") + other.who + " " +
                  withUnit(minimum(other), row.isInBytes);
    }
    double const ratio = ratioOf(row);
    std::string line =
        "| " + row.name + " | " + withUnit(minimum(row.results.front()), row.isInBytes);
    line += " | " + others + " | " + (ratio == 0.0 ? "" : ratioText(ratio));
    if (!row.against.empty()) line += " of " + row.against;
    return line + " |\n";
}

// The ratios of a table by operation.
std::map<std::string, double> ratiosIn(std::string const& file) {
    std::map<std::string, double> ratios;
    std::ifstream stream(file);
    for (std::string line; std::getline(stream, line);) {
        std::istringstream cells(line);
        std::vector<std::string> columns;
        for (std::string cell; std::getline(cells, cell, '|');) columns.push_back(cell);
        if (columns.size() != 5 || columns[1].size() < 3) continue;
        double const ratio = std::strtod(columns[4].c_str(), nullptr);
        if (ratio > 0.0) ratios[columns[1].substr(1, columns[1].size() - 2)] = ratio;
    }
    agree(!ratios.empty(), ("there is no table in " + file).c_str());
    return ratios;
}

}  // namespace

std::string tableOf(std::vector<Row> const& rows) {
    std::string text = "| operation | this library | others | ratio |\n|---|---|---|---|\n";
    for (Row const& row : rows) text += lineOf(row);
    return text;
}

std::string aboveLimit(std::vector<Row> const& rows) {
    std::string text;
    for (Row const& row : rows) {
        double const ratio = ratioOf(row);
        if (row.target == 0.0 || ratio <= row.target) continue;
        text += row.name + ": " + ratioText(ratio) + ", limit " + ratioText(row.target) + "\n";
    }
    return text;
}

std::string whatIsWorse(std::vector<Row> const& rows, std::string const& kept) {
    std::map<std::string, double> const before = ratiosIn(kept);
    std::string text;
    for (Row const& row : rows) {
        auto const known = before.find(row.name);
        double const ratio = ratioOf(row);
        if (known == before.end() || ratio <= 1.1 * known->second) continue;
        text += row.name + ": " + ratioText(ratio) + ", was " + ratioText(known->second) + "\n";
    }
    return text;
}

}  // namespace bench
