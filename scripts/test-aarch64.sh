#!/usr/bin/env bash
# Cross-builds the library and the tests for Linux on 64-bit ARM with
# Debian's g++-aarch64-linux-gnu, GoogleTest included from the sources that
# libgtest-dev installs, and runs the bit-exact suite (the digest test
# included) and the scan for fused multiply-adds under qemu-user. Installs
# what is missing, as root.
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh g++-aarch64-linux-gnu qemu-user

build=build-aarch64
cmake -S . -B "$build" -DCMAKE_BUILD_TYPE=Release \
    -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchains/aarch64-linux-gnu.cmake" \
    -DKESTACCEL_GTEST_SOURCE_DIR=/usr/src/googletest \
    -DKESTACCEL_BUILD_BENCHMARKS=OFF -DKESTACCEL_BUILD_EXAMPLES=OFF -DKESTACCEL_INSTALL=OFF
cmake --build "$build" -j "$(nproc)"

# The reference loop of this test converts floats beyond the range of int
# with static_cast, which C++ leaves undefined: x86 gives INT_MIN, the value
# the library produces on purpose (HandWorkedCorners checks it), while
# AArch64 saturates, so the test's expectation is wrong there. Skipped on
# this build until its loop forms that value explicitly.
export GTEST_FILTER='-MulConstantShort.MatchesTheStagedDefinitionOnRandomData'
ctest --test-dir "$build" --output-on-failure --timeout 900 -j "$(nproc)" -L 'bitexact|isa'
