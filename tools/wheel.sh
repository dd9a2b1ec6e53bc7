#!/usr/bin/env bash
# Writes a wheel of PyOrvXml for the interpreter PYTHON (2.7, or 3.8 and later)
# into OUTDIR and prints its path. The same build backend that pip uses for
# Python 3, run directly: pip 19 of Python 2.7 can't load it from the tree.
#   tools/wheel.sh ~/.pyenv/versions/2.7.18/bin/python dist/
#   python2.7 -m pip install --no-index --target DIR dist/pyorvxml-*-cp27-*.whl
set -euo pipefail
if [ $# -ne 2 ]; then
  echo "usage: tools/wheel.sh PYTHON OUTDIR" >&2
  exit 2
fi
root="$(cd "$(dirname "$0")/.." && pwd)"
exec "$1" "$root/tools/pybuild/orvxml_backend.py" "$2"
