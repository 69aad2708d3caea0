#!/usr/bin/env bash
# Configures and builds into build/ (Ninja): everything, or the targets named
# in the arguments.
set -euo pipefail
cd "$(dirname "$0")/.."
if [ ! -f build/build.ninja ]; then
  werror=OFF
  [ -n "${CI:-}" ] && werror=ON
  launcher=()
  command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache -DCMAKE_C_COMPILER_LAUNCHER=ccache)
  cmake -S . -B build -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo "${launcher[@]}" \
    -DTAMSEL_WERROR=$werror -DTAMSEL_BUILD_BENCH=OFF >/dev/null
fi
if [ $# -gt 0 ]; then
  cmake --build build -j"$(nproc)" --target "$@"
else
  cmake --build build -j"$(nproc)"
fi
