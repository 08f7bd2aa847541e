#!/usr/bin/env python3
"""Prints each kernel's median time and its ratio to the other implementations
measured in the same run.

Usage: report.py [--time real|cpu] results.json
(Google Benchmark JSON, run with repetitions.) Benchmarks are named
"<kernel>/<implementation>/<size>"; the ratio shown is our median time divided
by the other implementation's: below 1 we are faster. --time chooses the time
compared: real (wall clock, the default) or cpu (the process's own CPU time,
less disturbed by other processes on a busy machine).

When the run holds AddMulPeak (bench_peak.cpp: independent adds and
multiplies of the library's vector width), each FFTFwd line also gives the
arithmetic bound of the radix-2 method at that throughput, 5 N log2 N
operations for a complex transform and 2.5 N log2 N for a real one, and the
fraction of it that our time reaches.
"""
import argparse
import json
import math
from collections import defaultdict

PEAK = "AddMulPeak"


def medians(data, field):
    """Median `field` time and unit of each benchmark (the single run when
    there are no repetitions), and its record, which holds its counters."""
    result, singles, counters = {}, {}, {}
    for b in data["benchmarks"]:
        name = b.get("run_name", b["name"])
        entry = b[field], b.get("time_unit", "ns")
        if b.get("run_type") == "aggregate":
            if b.get("aggregate_name") == "median":
                result[name] = entry
                counters[name] = b
        else:
            singles.setdefault(name, entry)
            counters.setdefault(name, b)
    for name, entry in singles.items():
        result.setdefault(name, entry)
    return result, counters


def to_ns(time, unit):
    return time * {"ns": 1.0, "us": 1e3, "ms": 1e6, "s": 1e9}[unit]


def fft_operations(kernel, size):
    """Operations of the radix-2 method for FFTFwd_<c|split|r><bits>, or None."""
    if not kernel.startswith("FFTFwd_"):
        return None
    n = float(size)
    return (2.5 if kernel.startswith("FFTFwd_r") else 5.0) * n * math.log2(n)


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--time", choices=("real", "cpu"), default="real")
    parser.add_argument("results")
    args = parser.parse_args()
    with open(args.results) as f:
        data = json.load(f)
    times, counters = medians(data, args.time + "_time")

    # Operations per nanosecond of the peak benchmarks, by element type.
    rates = {}
    for name, (time, unit) in times.items():
        parts = name.split("/")
        if parts[0] == PEAK and name in counters:
            rates[parts[1]] = counters[name]["ops"] / to_ns(time, unit)
            lanes = int(counters[name]["lanes"])
            print(f"{PEAK} {parts[1]}: {rates[parts[1]]:.1f} G adds and multiplies per second "
                  f"({lanes} lanes of {parts[2]} bytes, {args.time} time)")

    groups = defaultdict(dict)
    for name, entry in times.items():
        parts = name.split("/")
        if len(parts) < 3 or parts[0] == PEAK:
            continue
        kernel, impl, size = parts[0], parts[1], "/".join(parts[2:])
        groups[(kernel, size)][impl] = entry
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
        operations = fft_operations(kernel, size) if size.isdigit() else None
        rate = rates.get("f64" if kernel.endswith("64") else "f32")
        if ours and operations and rate:
            bound = operations / rate
            line += f"  | bound {bound:.1f} ns, {bound / to_ns(*ours):.0%} reached"
        print(line)


if __name__ == "__main__":
    main()
