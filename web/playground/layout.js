// Places the boxes of a graph with dagre and answers in Graphviz's format, since browsers have no
// Graphviz.

import dagre from "dagre";

// More would take seconds, during which nothing else is shown.
const mostBoxes = 300;
const mostLines = 1000;
const longestMilliseconds = 2000;
const pixelsPerInch = 72;

const box = /^ {2}(\d+) \[width=(\S+), height=(\S+)\];$/;
const line = /^ {2}(\d+) -> (\d+);$/;

function placed(boxes, lines) {
  const graph = new dagre.graphlib.Graph({ multigraph: true });
  graph.setGraph({ rankdir: "LR", nodesep: 20, ranksep: 50 });
  for (const [, name, width, height] of boxes) {
    graph.setNode(name, { width: width * pixelsPerInch, height: height * pixelsPerInch });
  }
  for (const [i, [, from, to]] of lines.entries()) graph.setEdge(from, to, {}, String(i));
  dagre.layout(graph);
  const { width, height } = graph.graph();
  const inInches = (...lengths) => lengths.map((length) => (length / pixelsPerInch).toFixed(4)).join(" ");
  const places = graph.nodes().map((name) => {
    const { x, y } = graph.node(name);
    return `node ${name} ${inInches(x, height - y)}\n`;
  });
  return `graph 1 ${inInches(width, height)}\n${places.join("")}stop\n`;
}

const answers = new Map();

/** The output of `dot -Tplain` for the graphs that the report's layout.cpp writes, or null where it would take too long. */
export function answerOfDot(text) {
  if (answers.has(text)) return answers.get(text);
  const started = performance.now();
  let answer = "";
  for (const graph of text.split("digraph {").slice(1)) {
    const rows = graph.split("\n");
    const boxes = rows.map((row) => box.exec(row)).filter((found) => found !== null);
    const lines = rows.map((row) => line.exec(row)).filter((found) => found !== null);
    if (boxes.length > mostBoxes || lines.length > mostLines || performance.now() - started > longestMilliseconds) {
      answer = null;
      break;
    }
    answer += placed(boxes, lines);
  }
  answers.set(text, answer);
  return answer;
}

/** Discards the layouts of a document that is no longer shown. */
export function forgetAnswers() {
  answers.clear();
}
