#!/usr/bin/env bash
# Installs the peer libraries used for comparison (VOLK, FFTW, kissfft,
# liquid-dsp), builds the benchmarks and prints same-run median ratios.
#   --isa LEVEL   builds the library for that ISA level (e.g. x86-64-v3) in
#                 build-bench-LEVEL; the benchmark program stays baseline,
#                 except the arithmetic peak, which measures the library's
#                 vectors;
#   --time cpu    compares CPU time instead of wall-clock time (steadier on
#                 a machine busy with other work).
# The runs are pinned to the last core and interleaved at random, five
# repetitions each. Other arguments go to the benchmark program, e.g.
# --benchmark_filter='^FIR'.
set -euo pipefail
cd "$(dirname "$0")/.."

isa=""
time=real
args=()
while [ $# -gt 0 ]; do
    case "$1" in
        --isa) isa=$2; shift 2 ;;
        --isa=*) isa=${1#--isa=}; shift ;;
        --time) time=$2; shift 2 ;;
        --time=*) time=${1#--time=}; shift ;;
        *) args+=("$1"); shift ;;
    esac
done

scripts/install-deps.sh libvolk2-dev libfftw3-dev libkissfft-dev libliquid-dev
if [ -n "$isa" ]; then
    dir=build-bench-$isa
    cmake -S . -B "$dir" -DCMAKE_BUILD_TYPE=Release -DKESTACCEL_ISA="$isa" \
        -DKESTACCEL_BUILD_TESTS=OFF -DKESTACCEL_BUILD_EXAMPLES=OFF -DKESTACCEL_INSTALL=OFF
else
    dir=build
    cmake -S . -B "$dir" -DCMAKE_BUILD_TYPE=Release
fi
cmake --build "$dir" --target kestaccel_bench -j "$(nproc)"
out=$(mktemp --suffix=.json)
core=$(($(nproc) - 1))
taskset -c "$core" "./$dir/bench/kestaccel_bench" --benchmark_repetitions=5 \
    --benchmark_enable_random_interleaving=true --benchmark_report_aggregates_only=true \
    --benchmark_out="$out" --benchmark_out_format=json ${args[@]+"${args[@]}"} >/dev/null
python3 bench/report.py --time "$time" "$out"
