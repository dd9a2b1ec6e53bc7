#!/usr/bin/env bash
# Sets up, builds, and runs every test (C++ unit tests and the Python module
# tests); then the Windows leg: the library, the command and the C++ unit
# tests cross-compiled into build-windows/ and run under Wine, with the
# Windows command's output compared to the Linux command's; then the C++ unit
# tests again under AddressSanitizer and UndefinedBehaviorSanitizer in
# build-asan/.
set -euo pipefail
cd "$(dirname "$0")/.."
tools/setup.sh
tools/build.sh
(cd build && ctest --output-on-failure -j"$(nproc)")

tools/build-windows.sh
# The first start makes Wine's prefix (about 15 s); the tests then share it.
WINEPREFIX="$PWD/build-windows/wineprefix" WINEDEBUG=-all LC_ALL=C.UTF-8 wine build-windows/orvxml.exe --version
(cd build-windows && ctest --output-on-failure -j"$(nproc)")

mkdir -p build-asan
# A unity build, as the Windows leg's: it compiles in less than half the time.
if ! { cmake -S . -B build-asan -DCMAKE_BUILD_TYPE=Debug -DORVXML_SANITIZE=ON \
         -DORVXML_BUILD_MODULE=OFF -DORVXML_BUILD_BENCH=OFF -DCMAKE_UNITY_BUILD=ON &&
       cmake --build build-asan -j"$(nproc)"; } > build-asan/build.log 2>&1; then
  cat build-asan/build.log
  echo "sanitizer build failed" >&2
  exit 1
fi
echo "built into build-asan/"
(cd build-asan && ctest --output-on-failure -j"$(nproc)")
