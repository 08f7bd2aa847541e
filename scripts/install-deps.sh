#!/usr/bin/env bash
# Installs, as root, the Debian packages that the build and the tests need and
# that are missing, and any further packages named as arguments.
set -euo pipefail

# libsndfile and OpenSSL for the kestaccel tool (tool/), built with the rest.
packages=(cmake g++ make pkg-config python3 binutils libeigen3-dev libgtest-dev libgmock-dev libbenchmark-dev
          libsndfile1-dev libssl-dev "$@")
missing=()
# The Python bindings (python/) and their tests.
packages+=(pybind11-dev python3-dev python3-numpy python3-scipy python3-pytest)
for p in "${packages[@]}"; do
    dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed' || missing+=("$p")
done
if [ ${#missing[@]} -gt 0 ]; then
    if [ "$(id -u)" -ne 0 ]; then
        echo "missing packages: ${missing[*]}; run this script as root to install them" >&2
        exit 1
    fi
    echo "installing: ${missing[*]}"
    export DEBIAN_FRONTEND=noninteractive
    apt-get update -qq
    apt-get install -y -qq "${missing[@]}"
fi
