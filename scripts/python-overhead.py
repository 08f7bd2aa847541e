#!/usr/bin/python3
"""The cost of a call through the Python bindings: the same calls timed from
Python and from C++, at 64, 1024 and 65536 elements.

    /usr/bin/python3 scripts/python-overhead.py [build-dir]

Needs the build's module and benchmark program (cmake --build build). The
script pins itself, and so the C++ benchmark it starts, to CPU 1 (as
`taskset -c 1` would), times each Python call with timeit (the median of 15
repeats of about 0.05 s each) and reads the medians of 15 repetitions of the
C++ benchmarks CallOverhead_* (bench/bench_call_overhead.cpp). "given dst"
passes a preallocated destination, as the C++ call does; "new dst" lets the
bindings allocate it (for the FFT: the rfft helper, state cached).
"""

import json
import os
import subprocess
import sys
import timeit

import numpy as np

BUILD = sys.argv[1] if len(sys.argv) > 1 else "build"
sys.path.insert(0, os.path.join(BUILD, "python"))
import kestaccel as k  # noqa: E402

SIZES = (64, 1024, 65536)
REPEATS = 15


def median_ns(call):
    timer = timeit.Timer(call)
    number = max(1, int(0.05 / (timer.timeit(10) / 10)))
    return sorted(timer.repeat(REPEATS, number))[REPEATS // 2] / number * 1e9


def python_times(n):
    rng = np.random.default_rng(n)
    a, b = (rng.uniform(-1, 1, n).astype(np.float32) for _ in range(2))
    dst, spectrum = np.empty(n, np.float32), np.empty(n + 2, np.float32)
    state = k.FFTState_Float(n.bit_length() - 1)
    return {
        "Add_f32": (median_ns(lambda: k.Add(a, b, dst)), median_ns(lambda: k.Add(a, b))),
        "Sum_f32": (median_ns(lambda: k.Sum(a)), None),
        "FFTFwd_r32": (median_ns(lambda: k.FFTFwd(a, state, spectrum)), median_ns(lambda: k.rfft(a))),
    }


def cpp_times():
    program = os.path.join(BUILD, "bench", "kestaccel_bench")
    report = subprocess.run([program, "--benchmark_filter=^CallOverhead", "--benchmark_repetitions=%d" % REPEATS,
                             "--benchmark_min_time=0.05", "--benchmark_report_aggregates_only=true",
                             "--benchmark_format=json"],
                            check=True, capture_output=True, text=True).stdout
    scale = {"ns": 1, "us": 1e3, "ms": 1e6, "s": 1e9}
    times = {}
    for run in json.loads(report)["benchmarks"]:
        if run.get("aggregate_name") == "median":
            kernel, _, size = run["run_name"].split("/")
            times[kernel.replace("CallOverhead_", ""), int(size)] = run["real_time"] * scale[run["time_unit"]]
    return times


def main():
    os.sched_setaffinity(0, {1})
    cpp = cpp_times()
    print("%-11s %6s %10s %16s %10s %14s" % ("call", "n", "C++ ns", "Python ns (dst)", "overhead", "new dst ns"))
    for n in SIZES:
        for kernel, (given, fresh) in python_times(n).items():
            ours = cpp[kernel, n]
            print("%-11s %6d %10.0f %16.0f %10.0f %14s" % (kernel, n, ours, given, given - ours,
                                                             "-" if fresh is None else "%.0f" % fresh))


if __name__ == "__main__":
    main()
