#!/usr/bin/env python3
"""Prints what the benchmarks measured as one table: ours, the bare loop beside it, and the ratio of the two.
Takes the benchmarks' JSON reports; the median of their repetitions counts."""

import json
import sys

MEASURES = (  # counter, its heading, digits, whether more is better
    ("per_second", "a second", 0, True),
    ("p99_us", "p99, us", 1, False),
)


def medians(paths):
    found = {}
    for path in paths:
        with open(path, encoding="utf-8") as report:
            benchmarks = json.load(report)["benchmarks"]
        for run in benchmarks:
            if run.get("error_occurred"):
                sys.exit(f"{run['run_name']}: {run['error_message']}")
            if run.get("aggregate_name") != "median":
                continue
            name, side = run["run_name"].split("/")[:2]
            found.setdefault(name, {})[side] = run
    return found


def rows(found):
    for name, sides in found.items():
        for counter, heading, digits, is_rate in MEASURES:
            if counter not in sides["ours"]:
                continue
            ours, bare = sides["ours"][counter], sides["bare"][counter]
            ratio = ours / bare if is_rate else bare / ours
            yield name, heading, f"{ours:,.{digits}f}", f"{bare:,.{digits}f}", f"{ratio:.2f}"


def main():
    table = [("", "", "ours", "bare", "ratio"), *rows(medians(sys.argv[1:]))]
    widths = [max(len(row[i]) for row in table) for i in range(5)]
    for row in table:
        left = [cell.ljust(width) for cell, width in zip(row[:2], widths[:2])]
        right = [cell.rjust(width) for cell, width in zip(row[2:], widths[2:])]
        print("  ".join(left + right))
    print("A ratio above 1 means that ours is the faster one.")


if __name__ == "__main__":
    main()
