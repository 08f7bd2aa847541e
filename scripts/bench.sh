#!/usr/bin/env bash
# Installs the peer libraries used for comparison (VOLK, FFTW, kissfft,
# liquid-dsp), builds the benchmarks and prints same-run median ratios.
# Arguments go to the benchmark program, e.g. --benchmark_filter='^FIR'.
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh libvolk2-dev libfftw3-dev libkissfft-dev libliquid-dev
cmake -S . -B build -DCMAKE_BUILD_TYPE=Release
cmake --build build --target kestaccel_bench -j "$(nproc)"
out=$(mktemp --suffix=.json)
./build/bench/kestaccel_bench --benchmark_repetitions=5 --benchmark_report_aggregates_only=true \
    --benchmark_out="$out" --benchmark_out_format=json "$@" >/dev/null
python3 bench/report.py "$out"
