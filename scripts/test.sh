#!/usr/bin/env bash
# Installs what is missing, builds everything and runs the whole test suite:
#   1. the release build (tests, export check, installed-consumer check, and
#      the kestaccel tool's tests);
#   2. the same suite under AddressSanitizer and UndefinedBehaviorSanitizer;
#   3. the bit-exact tests of builds for x86-64-v3 and x86-64-v4 (AVX-512),
#      which must give the same bits as the baseline build;
#   4. the whole suite cross-built for 64-bit Windows and run under Wine.
# Set KESTACCEL_QUICK=1 to run only the first; KESTACCEL_SKIP_WINDOWS=1 skips
# the fourth.
set -euo pipefail
cd "$(dirname "$0")/.."

jobs=$(nproc)
scripts/install-deps.sh

step() { printf '\n== %s\n' "$*"; }

step "release build and tests"
cmake -S . -B build -DCMAKE_BUILD_TYPE=Release
cmake --build build -j "$jobs"
ctest --test-dir build --output-on-failure --timeout 600 -j "$jobs"

if [ "${KESTACCEL_QUICK:-0}" = 1 ]; then
    exit 0
fi

step "sanitizer build and tests (address, undefined)"
# handle_sigfpe=0: the multi-rate filter's divide fault must reach its death
# test as the signal itself, not as AddressSanitizer's report of it.
cmake -S . -B build-sanitize -DCMAKE_BUILD_TYPE=RelWithDebInfo \
    -DKESTACCEL_BUILD_BENCHMARKS=OFF -DKESTACCEL_BUILD_EXAMPLES=OFF -DKESTACCEL_INSTALL=OFF -DKESTACCEL_BUILD_TOOL=OFF \
    "-DCMAKE_CXX_FLAGS=-fsanitize=address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer" \
    -DKESTACCEL_BUILD_PYTHON=OFF \
    "-DCMAKE_EXE_LINKER_FLAGS=-fsanitize=address,undefined" \
    "-DCMAKE_SHARED_LINKER_FLAGS=-fsanitize=address,undefined"
cmake --build build-sanitize -j "$jobs"
ASAN_OPTIONS=detect_leaks=1:halt_on_error=1:handle_sigfpe=0 UBSAN_OPTIONS=halt_on_error=1:print_stacktrace=1 \
    LSAN_OPTIONS="suppressions=$PWD/scripts/lsan-suppressions.txt:print_suppressions=0" \
    ctest --test-dir build-sanitize --output-on-failure --timeout 900 -j "$jobs" -L bitexact

for isa in x86-64-v3 x86-64-v4; do
    step "$isa build: the same bits as the baseline"
    cmake -S . -B "build-$isa" -DCMAKE_BUILD_TYPE=Release -DKESTACCEL_ISA=$isa "-DCMAKE_CXX_FLAGS=-O3" \
        -DKESTACCEL_BUILD_BENCHMARKS=OFF -DKESTACCEL_BUILD_EXAMPLES=OFF -DKESTACCEL_INSTALL=OFF \
        -DKESTACCEL_BUILD_TOOL=OFF -DKESTACCEL_BUILD_PYTHON=OFF
    cmake --build "build-$isa" -j "$jobs"
    ctest --test-dir "build-$isa" --output-on-failure --timeout 600 -j "$jobs" -L 'bitexact|isa'
done

if [ "${KESTACCEL_SKIP_WINDOWS:-0}" != 1 ]; then
    step "Windows build (MinGW-w64), tests under Wine"
    scripts/test-windows.sh
fi
