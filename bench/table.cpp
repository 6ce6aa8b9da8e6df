#include "table.h"

#include "bench.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <map>
#include <sstream>

namespace bench {

namespace {

double median(std::vector<double> figures) {
    std::sort(figures.begin(), figures.end());
    return figures[figures.size() / 2];
}

double minimum(std::vector<double> const& figures) {
    return *std::min_element(figures.begin(), figures.end());
}

// Two or three digits, or all of those before the point.
std::string shown(double figure) {
    char text[64];
    char const* const format = figure >= 100.0  ? "%.0f"
                               : figure >= 10.0 ? "%.1f"
                               : figure >= 0.1  ? "%.2f"
                                                : "%.2g";
    std::snprintf(text, sizeof text, format, figure);
    return text;
}

// Of ours to the peer that counts; 0 where there is no peer. Of minima: the machine is slower at
// some times than at others, and never faster than it can be.
double ratioOf(Row const& row) {
    double reference = 0.0;
    for (std::size_t i = 1; i < row.results.size(); ++i) {
        Result const& peer = row.results[i];
        if (!row.against.empty() && peer.who != row.against) continue;
        double const figure = minimum(peer.figures);
        reference = reference == 0.0 ? figure : std::min(reference, figure);
    }
    return reference == 0.0 ? 0.0 : minimum(row.results.front().figures) / reference;
}

std::string lineOf(Row const& row) {
    std::string peers;
    for (std::size_t i = 1; i < row.results.size(); ++i) {
        Result const& peer = row.results[i];
        peers += (peers.empty() ? "" : ", ") + peer.who + " " + shown(median(peer.figures));
    }
    std::vector<double> const& ours = row.results.front().figures;
    double const ratio = ratioOf(row);
    std::string line = "| " + row.name + " | " + shown(median(ours));
    if (ours.size() > 1) line += " (" + shown(minimum(ours)) + ")";
    line += " | " + peers + " | " + (ratio == 0.0 ? "" : shown(ratio));
    if (!row.against.empty()) line += " of " + row.against;
    line += " | ";
    if (row.target != 0.0) line += shown(row.target) + (ratio <= row.target ? "" : " (missed)");
    return line + " |\n";
}

// The ratios of a table, by the names of the operations.
std::map<std::string, double> ratiosIn(std::string const& file) {
    std::map<std::string, double> ratios;
    std::ifstream stream(file);
    for (std::string line; std::getline(stream, line);) {
        std::istringstream cells(line);
        std::vector<std::string> columns;
        for (std::string cell; std::getline(cells, cell, '|');) columns.push_back(cell);
        if (columns.size() != 6 || columns[1].size() < 3) continue;
        double const ratio = std::strtod(columns[4].c_str(), nullptr);
        if (ratio > 0.0) ratios[columns[1].substr(1, columns[1].size() - 2)] = ratio;
    }
    agree(!ratios.empty(), ("there is no table in " + file).c_str());
    return ratios;
}

}  // namespace

std::string tableOf(std::vector<Row> const& rows) {
    std::string text = "| operation | ours | peers | ratio | at most |\n|---|---|---|---|---|\n";
    for (Row const& row : rows) text += lineOf(row);
    return text;
}

std::string whatIsWorse(std::vector<Row> const& rows, std::string const& kept) {
    std::map<std::string, double> const before = ratiosIn(kept);
    std::string text;
    for (Row const& row : rows) {
        auto const known = before.find(row.name);
        double const ratio = ratioOf(row);
        if (known == before.end() || ratio <= 1.1 * known->second) continue;
        text += row.name + ": " + shown(ratio) + ", was " + shown(known->second) + "\n";
    }
    return text;
}

}  // namespace bench
