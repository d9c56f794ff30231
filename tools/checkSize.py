#!/usr/bin/env python3
"""Prints what has grown long: headers over 150 lines, sources over 400, functions over 40.

A reader decides what to do about it; the check fails nobody. Functions are found by the layout of
the formatter: a line that opens a body, until the next brace that closes in its column or left of it.
"""

import pathlib
import re
import subprocess

HEADER_LINES, SOURCE_LINES, FUNCTION_LINES = 150, 400, 40
NO_FUNCTION = re.compile(r"^\s*(namespace|class|struct|union|enum|extern|template|if|for|while|"
                         r"switch|do|else|try|case|default)\b|^\s*\{|=\s*\{$")


def long_functions(lines):
    start = None
    for number, line in enumerate(lines, 1):
        if start is None and line.endswith("{") and ")" in line and not NO_FUNCTION.match(line):
            indent = len(line) - len(line.lstrip())
            start = (number, indent, line.strip(" {"))
        elif start is not None and re.match(r" {0,%d}\}" % start[1], line):
            if number - start[0] - 1 > FUNCTION_LINES:
                yield start[0], number - start[0] - 1, start[2]
            start = None


def report(name, text):
    lines = text.splitlines()
    limit = HEADER_LINES if name.endswith(".h") else SOURCE_LINES
    if len(lines) > limit:
        print(f"{name}:1: {len(lines)} lines, more than {limit}")
    for number, length, function in long_functions(lines):
        print(f"{name}:{number}: {length} lines in {function}")


def main():
    root = pathlib.Path(__file__).resolve().parent.parent
    names = subprocess.run(
        ["git", "ls-files", "src", "apps", "examples", "tests", "bench"], cwd=root, check=True,
        capture_output=True, text=True).stdout.split()
    for name in names:
        if name.endswith((".h", ".cpp", ".imp")) and (root / name).exists():
            report(name, (root / name).read_text(encoding="utf-8"))


if __name__ == "__main__":
    main()
