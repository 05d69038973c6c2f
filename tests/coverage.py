#!/usr/bin/env python3
"""Tells how much of the code the tests have run, and what of it they have not.

usage: coverage.py <source folder> < <output of llvm-cov export>

The libraries' own code has to be covered: every line, and of each 100 ways that a condition can go,
95. A line that can't be reached says why in a comment that begins with UNREACHABLE:, and is left
out, with the branches on it. What was not counted at all is not covered.
"""

import collections
import json
import pathlib
import sys

AREAS = {"libraries": "src/libraries/", "command": "src/tools/cfg32/"}
LEAST_LINES, LEAST_BRANCHES = 1.0, 0.95


class Segment:
    """Where a count begins to hold."""

    def __init__(self, line, column, count, has_count, is_entry, is_gap=False):
        self.line, self.count, self.has_count = line, count, has_count
        self.is_skipped = is_entry and not has_count
        self.is_start = is_entry and has_count and not is_gap


def line_counts(segments):
    """The count of each line that has code: as llvm-cov's own report counts."""
    by_line = collections.defaultdict(list)
    for segment in segments:
        by_line[segment[0]].append(Segment(*segment))
    counts, wrapped = {}, None
    for line in range(min(by_line, default=0), max(by_line, default=-1) + 1):
        here = by_line.get(line, [])
        starts = [segment.count for segment in here if segment.is_start]
        is_wrapped = wrapped is not None and wrapped.has_count
        if not (here and here[0].is_skipped) and (is_wrapped or starts):
            counts[line] = max(starts + ([wrapped.count] if is_wrapped else []))
        wrapped = here[-1] if here else wrapped
    return counts


def branch_counts(functions):
    """How often each condition of each file was true, and false, in all instances of a template."""
    counts = collections.defaultdict(lambda: [0, 0])
    for function in functions:
        for *place, if_true, if_false, file, _, _ in function["branches"]:
            count = counts[(function["filenames"][file], *place)]
            count[0] += if_true
            count[1] += if_false
    by_file = collections.defaultdict(dict)
    for (file, *place), count in counts.items():
        by_file[file][tuple(place)] = count
    return by_file


class Area:
    def __init__(self):
        self.lines, self.lines_run, self.branches, self.branches_run = 0, 0, 0, 0
        self.missed = []

    def add(self, name, lines, branches):
        """The lines of a file with their counts, and its branches."""
        self.lines += len(lines)
        self.lines_run += sum(count > 0 for count in lines.values())
        self.missed += [(name, line, "not run") for line, count in lines.items() if count == 0]
        for (line, column, *_), (if_true, if_false) in branches.items():
            self.branches += 2
            self.branches_run += (if_true > 0) + (if_false > 0)
            if lines.get(line) and (if_true == 0 or if_false == 0):
                never = "true" if if_true == 0 else "false"
                self.missed.append((name, line, f"never {never}, column {column}"))

    def is_measured(self):
        return self.lines > 0 and self.branches > 0

    def is_covered(self):
        return (self.lines_run >= LEAST_LINES * self.lines
                and self.branches_run >= LEAST_BRANCHES * self.branches)

    def print(self, name):
        def part(run, total):
            return f"{run} of {total}" + (f" ({100 * run / total:.2f} %)" if total else "")

        for place in sorted(self.missed):
            print("%s:%d: %s" % place)
        print(f"{name}: {part(self.lines_run, self.lines)} lines,"
              f" {part(self.branches_run, self.branches)} branches")


def lines_left_out(text):
    """What can't be reached, and the braces behind it, which are no code."""
    return [number for number, line in enumerate(text.split("\n"), 1)
            if "UNREACHABLE:" in line or line.strip() == "}"]


def main(root):
    data = json.load(sys.stdin)["data"][0]
    branches = branch_counts(data["functions"])
    areas = {name: Area() for name in AREAS}
    for file in data["files"]:
        path = pathlib.Path(file["filename"]).resolve()
        name = str(path.relative_to(root)) if path.is_relative_to(root) else ""
        left_out = lines_left_out(path.read_text("utf-8")) if name else []
        lines = {line: count for line, count in line_counts(file["segments"]).items()
                 if line not in left_out}
        conditions = {place: count for place, count in branches[file["filename"]].items()
                      if place[0] not in left_out}
        for area, folder in AREAS.items():
            if name.startswith(folder):
                areas[area].add(name, lines, conditions)
    for name, area in areas.items():
        area.print(name)
        if not area.is_measured():
            print(f"{name}: no lines, or no branches, were counted below {root}/{AREAS[name]}")
    is_measured = all(area.is_measured() for area in areas.values())
    return 0 if is_measured and areas["libraries"].is_covered() else 1


sys.exit(main(pathlib.Path(sys.argv[1]).resolve()))
