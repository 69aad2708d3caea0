#!/usr/bin/env bash
# Builds the tests with AddressSanitizer and UndefinedBehaviorSanitizer into
# build-asan/ (-O1, no benchmarks, no fuzzers) and runs them; the first
# report fails its test. Extra arguments go to ctest (-L unit, say).
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/setup.sh
build=build-asan
if [ ! -f $build/build.ninja ]; then
  werror=OFF
  [ -n "${CI:-}" ] && werror=ON
  launcher=()
  command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache -DCMAKE_C_COMPILER_LAUNCHER=ccache)
  cmake -S . -B $build -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo "${launcher[@]}" \
    -DTAMSEL_WERROR=$werror -DTAMSEL_SANITIZE=ON -DTAMSEL_BUILD_BENCH=OFF >/dev/null
fi
cmake --build $build -j"$(nproc)"
# The same options the tests carry, for the few that are not gtest's.
supp=$PWD/tests/sanitizers
export ASAN_OPTIONS=detect_leaks=1:detect_stack_use_after_return=0:strict_init_order=1:check_initialization_order=1
export LSAN_OPTIONS=suppressions=$supp/lsan.supp:print_suppressions=0
export UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1:suppressions=$supp/ubsan.supp
cd $build
ctest --output-on-failure -j"$(nproc)" "$@"
