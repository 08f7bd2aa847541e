#!/usr/bin/env python3
"""Prints each kernel's median time and its ratio to the other implementations
measured in the same run.

Usage: report.py results.json   (Google Benchmark JSON, run with repetitions)
Benchmarks are named "<kernel>/<implementation>/<size>"; the ratio shown is
our median time divided by the other implementation's: below 1 we are faster.
"""
import json
import sys
from collections import defaultdict


def main(path):
    with open(path) as f:
        data = json.load(f)
    medians, singles = {}, {}
    for b in data["benchmarks"]:
        name = b.get("run_name", b["name"])
        entry = b["real_time"], b.get("time_unit", "ns")
        if b.get("run_type") == "aggregate":
            if b.get("aggregate_name") == "median":
                medians[name] = entry
        else:
            singles.setdefault(name, entry)
    for name, entry in singles.items():
        medians.setdefault(name, entry)
    groups = defaultdict(dict)
    for name, (time, unit) in medians.items():
        parts = name.split("/")
        if len(parts) < 3:
            continue
        kernel, impl, size = parts[0], parts[1], "/".join(parts[2:])
        groups[(kernel, size)][impl] = (time, unit)
    for (kernel, size), impls in sorted(groups.items()):
        ours = impls.get("kestaccel")
        line = f"{kernel:32s} {size:>9s}"
        if ours:
            line += f"  kestaccel {ours[0]:12.1f} {ours[1]}"
        for impl, (time, unit) in sorted(impls.items()):
            if impl == "kestaccel":
                continue
            line += f"  | {impl} {time:10.1f} {unit}"
            if ours and time > 0:
                line += f" (ratio {ours[0] / time:5.2f})"
        print(line)


if __name__ == "__main__":
    main(sys.argv[1])
