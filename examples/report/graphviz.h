// Graphviz, which finds places for the boxes of a graph.
//
//     std::optional<std::string> const places = answerOfDot("digraph { 0 [width=1, height=1]; }");

#ifndef REPORT_GRAPHVIZ_H
#define REPORT_GRAPHVIZ_H

#include <optional>
#include <string>

// What `dot -Tplain` answers to the graphs in the text, or nothing where it takes too long. Throws
// a std::runtime_error where Graphviz is not there or fails.
std::optional<std::string> answerOfDot(std::string const& text);

#endif
