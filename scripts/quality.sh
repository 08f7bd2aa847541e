#!/usr/bin/env bash
# Installs the peers (libsamplerate, soxr, FFTW, kissfft), builds the quality
# program and writes docs/quality.md with its plots: the resampler presets
# beside libsamplerate and soxr, and the FFT's accuracy beside FFTW and
# kissfft, from one run pinned to one core. Arguments go to the program
# (--quick for a short run).
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh libsamplerate0-dev libsoxr-dev libfftw3-dev libkissfft-dev util-linux
# Forget earlier searches for the peers, which may have been installed since.
cmake -S . -B build -DCMAKE_BUILD_TYPE=Release -DKESTACCEL_BUILD_TOOL=ON -U 'PEER_*' -U '__pkg_config_checked_PEER_*' >/dev/null
cmake --build build --target kestaccel_quality -j "$(nproc)" >/dev/null
mkdir -p docs
model=$(lscpu | sed -n 's/^Model name: *//p' | head -n1)
core=1
[ "$(nproc)" -gt 1 ] || core=0
taskset -c "$core" ./build/tool/quality/kestaccel_quality docs \
    --machine "$model, $(nproc) cores ($(uname -m), $(. /etc/os-release && echo "$PRETTY_NAME"))" \
    --about "kissfft: Debian package libkissfft-dev $(dpkg-query -W -f='${Version}' libkissfft-dev)" "$@"
