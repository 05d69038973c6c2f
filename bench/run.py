#!/usr/bin/env python3
"""Runs the benchmarks of the parts and prints a table.

usage: run.py PROGRAM [OTHER_PROGRAM]

With another build of the same benchmarks the two run in turn, round after round, and each row has
the ratio of this one's time to the other's: the median of the rounds' ratios, and their range. Only
ratios can be compared between two runs; a shared machine drifts.
"""

import json
import statistics
import subprocess
import sys

ROUNDS = 7
SECONDS_EACH = 0.05


def times(program):
    """The nanoseconds per iteration of each benchmark, and its rate if it has one."""
    printed = subprocess.run(
        [program, "--benchmark_format=json", f"--benchmark_min_time={SECONDS_EACH}"],
        check=True, capture_output=True, text=True).stdout
    unit = {"ns": 1, "us": 1e3, "ms": 1e6, "s": 1e9}
    return {each["name"]: (each["real_time"] * unit[each["time_unit"]],
                           each.get("bytes_per_second"), each.get("items_per_second"))
            for each in json.loads(printed)["benchmarks"]}


def shown_time(nanoseconds):
    for unit, size in (("s", 1e9), ("ms", 1e6), ("µs", 1e3)):
        if nanoseconds >= size:
            return f"{nanoseconds / size:.3g} {unit}"
    return f"{nanoseconds:.3g} ns"


def shown_rate(bytes_per_second, items_per_second):
    if bytes_per_second:
        return f"{bytes_per_second / 1e6:.0f} MB/s"
    return f"{1e9 / items_per_second:.0f} ns each" if items_per_second else ""


def shown_ratio(ratios):
    return f"{statistics.median(ratios):.2f} ({min(ratios):.2f}-{max(ratios):.2f})"


def main(programs):
    rounds = [[times(program) for program in programs] for _ in range(ROUNDS)]
    heading = ["benchmark", "time", "rate"] + ["ratio to the other"] * (len(programs) - 1)
    print("| " + " | ".join(heading) + " |\n|" + "---|" * len(heading))
    for name in rounds[0][0]:
        own = [each[0][name] for each in rounds]
        middle = sorted(own)[ROUNDS // 2]
        row = [f"`{name}`", shown_time(middle[0]), shown_rate(*middle[1:])]
        if len(programs) == 2:
            known = name in rounds[0][1]
            row.append(shown_ratio([each[0][name][0] / each[1][name][0] for each in rounds])
                       if known else "new")
        print("| " + " | ".join(row) + " |")


if __name__ == "__main__":
    if len(sys.argv) not in (2, 3):
        sys.exit(__doc__)
    main(sys.argv[1:])
