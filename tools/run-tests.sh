#!/usr/bin/env bash
# Sets up, builds, and runs every test (C++ unit tests and the Python module tests).
set -euo pipefail
cd "$(dirname "$0")/.."
tools/setup.sh
tools/build.sh
cd build
ctest --output-on-failure -j"$(nproc)"
