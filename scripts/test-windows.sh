#!/usr/bin/env bash
# Cross-builds the library as kestaccel.dll with MinGW-w64, with the kestcore
# stand-in and the whole GoogleTest suite, and runs that suite under Wine
# through ctest (the DLL export check and the installed-consumer build
# included). Installs what is missing, as root.
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh g++-mingw-w64-x86-64 wine wine64

build=build-windows
cmake -S . -B "$build" -DCMAKE_BUILD_TYPE=Release \
    -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchains/x86_64-w64-mingw32.cmake" \
    -DKESTACCEL_GTEST_SOURCE_DIR=/usr/src/googletest \
    -DKESTACCEL_BUILD_BENCHMARKS=OFF -DKESTACCEL_BUILD_EXAMPLES=ON
cmake --build "$build" -j "$(nproc)"

# Wine's background processes inherit ctest's output pipe and can stall it:
# start the server and the prefix first, silently, and stop them on exit.
export WINEPREFIX="$PWD/$build/wineprefix"
export WINEDEBUG=-all
export WINEDLLOVERRIDES="mscoree,mshtml="
trap 'wineserver -k >/dev/null 2>&1 || true' EXIT
wineboot --init >/dev/null 2>&1 </dev/null
wineserver -p >/dev/null 2>&1 </dev/null || true

ctest --test-dir "$build" --output-on-failure --timeout 600 -j "$(nproc)"
