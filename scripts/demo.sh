#!/usr/bin/env bash
# Installs what is missing, builds the library and runs the demonstration.
# Arguments are passed to the demonstration program.
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh
cmake -S . -B build -DCMAKE_BUILD_TYPE=Release
cmake --build build --target kestaccel_demo -j "$(nproc)"
./build/examples/kestaccel_demo "$@"
