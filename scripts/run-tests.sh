#!/usr/bin/env bash
# Installs what is missing, checks the formatting, builds, runs every test,
# then runs them again built with the sanitizers: what CI runs.
#
# Extra arguments go to ctest (for example -L unit, or -L integration), and
# then only that normal run is made: a quick run while working.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/setup.sh
bash scripts/check-format.sh
bash scripts/build.sh
(cd build && ctest --output-on-failure -j"$(nproc)" "$@")
[ $# -gt 0 ] && exit 0
exec bash scripts/run-sanitizer-tests.sh
