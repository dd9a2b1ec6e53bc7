#!/usr/bin/env bash
# Configures and builds into ./build.
set -euo pipefail
cd "$(dirname "$0")/.."
[ -d "$HOME/.pyenv/bin" ] && export PATH="$HOME/.pyenv/bin:$PATH"
cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo >/dev/null
cmake --build build -j"$(nproc)"
