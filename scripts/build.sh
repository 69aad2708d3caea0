#!/usr/bin/env bash
# Configures and builds into build/ (Ninja). Extra arguments go to the build.
set -euo pipefail
cd "$(dirname "$0")/.."
if [ ! -f build/build.ninja ]; then
  werror=OFF
  [ -n "${CI:-}" ] && werror=ON
  cmake -S . -B build -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
    -DTAMSEL_WERROR=$werror -DTAMSEL_BUILD_BENCH=OFF >/dev/null
fi
cmake --build build -j"$(nproc)" "$@"
