#!/usr/bin/env bash
# Sets up, builds, and converts every bundled example through the Python module.
set -euo pipefail
cd "$(dirname "$0")/.."
tools/setup.sh
tools/build.sh
PY="$(cmake -L -N build 2>/dev/null | sed -n 's/^PYTHON27_EXECUTABLE:FILEPATH=//p')"
PYTHONPATH=build "$PY" examples/convert.py examples/*.orvmat examples/*.lumat examples/*.orvopt examples/*.luopt
