// Runs Graphviz, which places the boxes of a graph.
//
//     std::optional<std::string> const places = answerOfDot("digraph { 0 [width=1, height=1]; }");

#ifndef REPORT_GRAPHVIZ_H
#define REPORT_GRAPHVIZ_H

#include <optional>
#include <string>

// The output of `dot -Tplain` for the graphs in the string, or nothing where it takes too long.
// Throws a std::runtime_error where Graphviz is missing or fails.
std::optional<std::string> answerOfDot(std::string const& text);

#endif
