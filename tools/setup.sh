#!/usr/bin/env bash
# Installs what the build needs and is missing on a Debian 12 machine.
set -euo pipefail

need=()
command -v cmake >/dev/null || need+=(cmake)
command -v g++ >/dev/null || need+=(g++)
command -v make >/dev/null || need+=(make)
[ -f /usr/include/boost/any.hpp ] || need+=(libboost-dev)
[ -f /usr/include/gtest/gtest.h ] || need+=(libgtest-dev)
[ -f /usr/include/benchmark/benchmark.h ] || need+=(libbenchmark-dev)
# The Windows leg: the mingw-w64 cross compiler, GoogleTest's sources (from
# libgtest-dev) and Wine to run the programs.
command -v x86_64-w64-mingw32-g++-posix >/dev/null || need+=(g++-mingw-w64-x86-64-posix)
[ -f /usr/src/googletest/CMakeLists.txt ] || need+=(googletest)
command -v wine >/dev/null && [ -e /usr/lib/wine/wine64 ] || need+=(wine wine64)
if [ ${#need[@]} -gt 0 ]; then
  echo "Installing: ${need[*]}"
  SUDO=""
  [ "$(id -u)" -eq 0 ] || SUDO="sudo"
  $SUDO apt-get update -qq
  DEBIAN_FRONTEND=noninteractive $SUDO apt-get install -y -qq "${need[@]}"
fi

# CPython 2.7 with headers: pyenv's 2.7.18, else python2.7-config on the PATH.
if command -v pyenv >/dev/null && pyenv prefix 2.7.18 >/dev/null 2>&1; then
  :
elif [ -x "$HOME/.pyenv/bin/pyenv" ] && "$HOME/.pyenv/bin/pyenv" prefix 2.7.18 >/dev/null 2>&1; then
  :
elif command -v python2.7-config >/dev/null; then
  :
else
  echo "CPython 2.7 with headers is needed (pyenv install 2.7.18)" >&2
  exit 1
fi

# CPython 3 with headers, under pyenv: the tests run the module under 3.8 and 3.13.
pyenv_root="$( (pyenv root || "$HOME/.pyenv/bin/pyenv" root) 2>/dev/null || echo "${PYENV_ROOT:-$HOME/.pyenv}")"
for v in 3.8 3.13; do
  if ! ls "$pyenv_root"/versions/$v.*/include/python$v/Python.h >/dev/null 2>&1; then
    echo "CPython $v with headers is needed (pyenv install 3.8.18 3.13.0)" >&2
    exit 1
  fi
done
