#!/usr/bin/env bash
# Installs what is missing, builds everything and runs the whole test suite:
#   1. the release build (tests, export check, installed-consumer check, and
#      the kestaccel tool's tests);
#   2. the same suite under AddressSanitizer and UndefinedBehaviorSanitizer;
#   3. the bit-exact tests of builds for x86-64-v3 and x86-64-v4 (AVX-512),
#      which must give the same bits as the baseline build;
#   4. the bit-exact tests built by g++ at -O0, and by clang at the baseline
#      and for x86-64-v4;
#   5. the whole suite cross-built for 64-bit Windows and run under Wine;
#   6. the bit-exact tests cross-built for Linux on AArch64, run under qemu.
# Every build checks the digests of tests/digest/digests.txt (the digest
# test; KESTACCEL_DIGEST_WRITE=1 records them instead, see docs/same-bits.md).
# Set KESTACCEL_QUICK=1 to run only the first; KESTACCEL_SKIP_WINDOWS=1 skips
# the fifth, KESTACCEL_SKIP_AARCH64=1 the sixth. The time of each stage is
# printed at the end.
set -euo pipefail
cd "$(dirname "$0")/.."

jobs=$(nproc)
scripts/install-deps.sh

# Each stage's wall time, and the processor time of its commands (on a busy
# machine the second tells more).
cpu() { local f; read -r -a f < /proc/$$/stat; echo $(( (f[15] + f[16]) / $(getconf CLK_TCK) )); }
stage=""
times=()
step() {
    [ -z "$stage" ] || times+=("$(printf '%6d s %6d s cpu  %s' $((SECONDS - started)) $(($(cpu) - cpu0)) "$stage")")
    stage="$*"
    started=$SECONDS
    cpu0=$(cpu)
    [ -z "$stage" ] || printf '\n== %s\n' "$*"
}
trap 'step ""; printf "\n== stage times\n"; printf "%s\n" "${times[@]}"' EXIT

# The library and the tests alone, with the bit-exact tests and the scan for
# fused multiply-adds.
bitexact_build() {
    local dir=$1
    shift
    cmake -S . -B "$dir" -DKESTACCEL_BUILD_BENCHMARKS=OFF -DKESTACCEL_BUILD_EXAMPLES=OFF -DKESTACCEL_INSTALL=OFF \
        -DKESTACCEL_BUILD_TOOL=OFF -DKESTACCEL_BUILD_PYTHON=OFF "$@"
    cmake --build "$dir" -j "$jobs"
    ctest --test-dir "$dir" --output-on-failure --timeout 600 -j "$jobs" -L 'bitexact|isa'
}

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
    bitexact_build "build-$isa" -DCMAKE_BUILD_TYPE=Release -DKESTACCEL_ISA=$isa "-DCMAKE_CXX_FLAGS=-O3"
done

step "g++ -O0 build: the same bits unoptimised"
bitexact_build build-O0 -DCMAKE_BUILD_TYPE=Debug

scripts/install-deps.sh clang
for isa in "" x86-64-v4; do
    step "clang build${isa:+ for $isa}: the same bits from another compiler"
    bitexact_build "build-clang${isa:+-$isa}" -DCMAKE_BUILD_TYPE=Release -DCMAKE_CXX_COMPILER=clang++ \
        -DKESTACCEL_ISA=$isa
done

if [ "${KESTACCEL_SKIP_WINDOWS:-0}" != 1 ]; then
    step "Windows build (MinGW-w64), tests under Wine"
    scripts/test-windows.sh
fi

if [ "${KESTACCEL_SKIP_AARCH64:-0}" != 1 ]; then
    step "Linux AArch64 build, bit-exact tests under qemu-user"
    scripts/test-aarch64.sh
fi
