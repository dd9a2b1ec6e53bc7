#!/usr/bin/env bash
# Configures and builds into ./build; the compiler's output is shown only on failure.
set -euo pipefail
cd "$(dirname "$0")/.."
[ -d "$HOME/.pyenv/bin" ] && export PATH="$HOME/.pyenv/bin:$PATH"
mkdir -p build
if ! { cmake -S . -B build -DCMAKE_BUILD_TYPE=RelWithDebInfo && cmake --build build -j"$(nproc)"; } > build/build.log 2>&1; then
  cat build/build.log
  echo "build failed" >&2
  exit 1
fi
echo "built into build/"
