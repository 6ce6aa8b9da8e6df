#!/usr/bin/env python3
"""Tells Doxygen how comments are meant here: one speaks for all declarations that follow it, up to the
next comment, a blank line or the end of the class. Lines keep their numbers.

    filter.py HEADER
"""

import re
import sys

COMMENT = re.compile(r"^(\s*)/// ")
# What has members of its own is not one of several.
CONTAINER = re.compile(r"^\s*(template <.*>\s*)?(class|struct|enum|enum class|namespace)\b[^;]*\{?$")


def without_friend(line):
    """Doxygen lists friends, but gives them no place of their own."""
    return re.sub(r"^(\s*)friend .*;$", r"\1", line) if "{" not in line else line.replace("friend ", "", 1)


def without_private(lines):
    """What is private is nobody's, and a nested class of it would be linked to."""
    kept, indent = [], None
    for line in lines:
        if indent is not None and line == " " * indent + "};":
            indent = None
        if re.match(r"^\s*private:$", line):
            indent = len(line) - len(line.lstrip())
        kept.append("" if indent is not None and line.strip() != "private:" else line)
    return kept


def main():
    with open(sys.argv[1], encoding="utf-8") as file:
        lines = without_private(without_friend(line) for line in file.read().split("\n"))
    indent = None  # That of the comment whose group is open.
    i = 0
    while i < len(lines):
        line = lines[i]
        here = len(line) - len(line.lstrip())
        ends = not line.strip() or here < indent if indent is not None else False
        if ends or indent is not None and here == indent and re.match(r"^\s*//[/ ]", line):
            line, indent = "/** @} */" + line, None
        if COMMENT.match(lines[i]):
            end = i
            while COMMENT.match(lines[end]) or lines[end].strip() == "///":
                end += 1
            declared = lines[end]
            if declared.strip().startswith("template <") and declared.strip().endswith(">"):
                declared += " " + lines[end + 1].strip()
            if not CONTAINER.match(declared) and not declared.lstrip().startswith("#"):
                indent = here
                line = line.replace(lines[i], "/** @{ */" + lines[i])
            print(line)
            for comment in lines[i + 1:end]:
                print(comment)
            i = end
            continue
        print(line)
        i += 1


main()
