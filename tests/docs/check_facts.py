#!/usr/bin/env python3
"""Compares versions, limits and sizes in the documentation with the sources that define them.

    check_facts.py SOURCE_DIR
"""

import re
import sys
from pathlib import Path

# What it is, the file and the pattern that define it, and the files and patterns that repeat it. A pattern
# has one group; figures are compared without thousands separators. Words may be separated by line ends.
FACTS = [
    ("minor version", "Engine/Base/version.h", r"VERSION_MINOR (\d+)", [
        ("README.md", r"Version 1\.(\d+)\."),
        ("CHANGELOG.md", r"\A.*?\n## 1\.(\d+)\."),
    ]),
    ("CMake", "CMakeLists.txt", r"cmake_minimum_required\(VERSION ([\d.]+)\)", [
        ("README.md", r"CMake ([\d.]+\d)"),
        ("README.md", r"cmake_minimum_required\(VERSION ([\d.]+)\)"),
        ("docs/first_program.md", r"cmake_minimum_required\(VERSION ([\d.]+)\)"),
        ("docs/platforms.md", r"\| CMake, to build[^|]*\| ([\d.]+) \|"),
    ]),
    ("Boost", "CMakeLists.txt", r"TARN_ENGINE_BASE_BOOST ([\d.]+)", [
        ("README.md", r"Boost headers ([\d.]+) or later"),
        ("README.md", r"Boost ([\d.]+) to"),
        ("docs/platforms.md", r"\| Boost \(headers\) \| ([\d.]+) \|"),
        ("docs/platforms.md", r"any Boost from ([\d.]+) to"),
        ("docs/platforms.md", r"and Boost ([\d.]+\d)\.\n"),
    ]),
    ("g++", "docs/platforms.md", r"\| g\+\+ \| ([\d.]+) \|", [
        ("README.md", r"g\+\+ ([\d.]+) or clang"),
        ("docs/platforms.md", r"smallest versions are g\+\+ ([\d.]+\d),"),
        ("docs/platforms.md", r"from g\+\+ ([\d.]+) and clang"),
    ]),
    ("levels of patches", "Engine/Document/detail/own_reader.cpp", r"kDeepest = (\d+)", [
        ("Engine/Document/document.h", r"nest at most ([\d,]+) levels"),
        ("docs/documents.md", r"a list of patches, ([\d,]+) levels"),
        ("docs/pitfalls.md", r"refuses more than ([\d,]+) levels"),
        ("docs/python.md", r"nest ([\d,]+) levels at most"),
    ]),
    ("levels of patches in browsers", "web/CMakeLists.txt", r"DEEPEST=(\d+)", [
        ("docs/javascript.md", r"more than ([\d,]+) levels"),
        ("docs/pitfalls.md", r"\(([\d,]+) on WebAssembly\)"),
    ]),
    ("levels of groups", "Engine/Document/detail/node_graph.h", r"kDeepestGroups = (\d+)", [
        ("Engine/Document/document.h", r"groups of a node graph at most ([\d,]+\d)"),
    ]),
    ("levels handled recursively", "Engine/Base/unstructured.cpp", r"kDeepestRecursion = (\d+)", [
        ("Engine/Base/unstructured.h", r"more than (\d+) levels"),
        ("docs/design.md", r"up to (\d+) levels"),
    ]),
    ("MiB of copies", "Engine/Document/detail/node_graph.cpp", r"size_t\((\d+)\) << 20", [
        ("docs/documents.md", r"(\d+) MiB of copies"),
    ]),
    ("kilobytes of the module", "web/sizes.mjs", r"\.wasm\": \[(\d+)e3", [
        ("docs/javascript.md", r"(\d+) KB, \d+ KB compressed"),
    ]),
    ("kilobytes of the compressed module", "web/sizes.mjs", r"\.wasm\": \[\d+e3, (\d+)e3\]", [
        ("docs/javascript.md", r"\d+ KB, (\d+) KB compressed"),
    ]),
    ("control factor of arcs", "Engine/Base/path.cpp", r"kQuarterArc = (0\.\d+)", [
        ("Engine/Base/path.h", r"control factor is (0\.\d+)"),
    ]),
    ("deviation of arcs", "Engine/Base/path.h", r"at most ([\d.]+e-\d+) of the radius", [
        ("docs/paths.md", r"([\d.]+e-\d+) of the radius outside"),
    ]),
]

# Rows of the full benchmark table, and the file, row and column that repeat the first figure of each.
FIGURES = [
    ("copy 10,000 mixed values", "docs/benchmark.md", "copy 10,000 mixed values", 1),
    ("double(v) of 10,000 numbers", "docs/benchmark.md", "convert 10,000 numbers to `double`", 1),
    ("== of 10,000 mixed values, shared", "docs/benchmark.md", "`==` of 10,000 mixed values, shared", 1),
    ("copy and destroy a catalogue", "docs/benchmark.md", "copy and destroy unstructured data, a catalogue", 1),
    ("easeEach of 4,000 doubles, linear and quadratic", "docs/benchmark.md",
     "ease 4,000 numbers in one call (`easeEach`)", 1),
    ("build an index, 100,000 patches", "docs/benchmark.md", "build an index of 100,000 patches", 1),
    ("edit a port, 100,000 patches in groups", "docs/benchmark.md",
     "edit one port among 100,000 patches, in groups of 100", 1),
    ("edit a port, 100,000 patches in groups", "docs/editing.md",
     "an edit of one port's default value, deep inside", 1),
    ("edit a port, 100,000 patches in one list", "docs/editing.md",
     "an edit of one port's default value, deep inside", 2),
    ("update the index after the edit, 100,000 patches in groups", "docs/editing.md", "`PatchIndex::update` after it", 1),
    ("update the index after the edit, 100,000 patches in one list", "docs/editing.md", "`PatchIndex::update` after it",
     2),
    ("patchChanges of the edit, 100,000 patches in groups", "docs/editing.md", "`patchChanges` of both", 1),
    ("patchChanges of the edit, 100,000 patches in one list", "docs/editing.md", "`patchChanges` of both", 2),
    ("memory of an undo step, 100,000 patches in groups", "docs/editing.md",
     "memory that the former root adds to a history", 1),
    ("memory of an undo step, 100,000 patches in one list", "docs/editing.md",
     "memory that the former root adds to a history", 2),
]


def main() -> int:
    root = Path(sys.argv[1])

    def found(file: str, pattern: str) -> list[str]:
        # The signs of comments would stand between the words.
        text = re.sub(r"\n\s*//+", "\n", (root / file).read_text())
        pattern = pattern.replace(" ", r"\s+")
        return [figure.replace(",", "") for figure in re.findall(pattern, text, re.DOTALL)]

    def cell(file: str, row: str, column: int) -> str:
        rows = [line.strip("| ").split(" | ") for line in (root / file).read_text().split("\n") if line.startswith("|")]
        cells = [cells[column] for cells in rows if cells[0] == row]
        return cells[0] if len(cells) == 1 else f"{len(cells)} rows of that name"

    faults = []
    compared = 0
    for name, source, definition, places in FACTS:
        defined = found(source, definition)
        if len(set(defined)) != 1:
            faults.append(f"{name}: {source} has {defined} for {definition}")
            continue
        for file, pattern in places:
            figures = found(file, pattern)
            compared += len(figures)
            if set(figures) != set(defined):
                faults.append(f"{name}: {source} says {defined[0]}, {file} says {figures}")
    for name, file, row, column in FIGURES:
        figure, repeated = cell("docs/benchmark_table.md", name, 1), cell(file, row, column)
        compared += 1
        if figure != repeated or figure.endswith("name"):
            faults.append(f"{name}: docs/benchmark_table.md says {figure}, {file} says {repeated}")
    print("\n".join(faults) if faults else f"{compared} figures agree with the sources")
    return 1 if faults else 0


sys.exit(main())
