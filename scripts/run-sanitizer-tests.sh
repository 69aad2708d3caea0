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
supp=$PWD/tests/sanitizers
export ASAN_OPTIONS=detect_leaks=1:detect_stack_use_after_return=0:strict_init_order=1:check_initialization_order=1
export LSAN_OPTIONS=suppressions=$supp/lsan.supp:print_suppressions=0
export UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1:suppressions=$supp/ubsan.supp
cd $build
# Under Xvfb, Qt would load Mesa's GL driver (to learn the graphics quality,
# and for the video view), which keeps state for the life of the process and
# is unloaded before LeakSanitizer looks, leaving no name to suppress it by.
# Without GL the programs draw in software, as on a machine without a GPU.
export QT_XCB_GL_INTEGRATION=none
# Left to the normal run: a test that measures the memory an export takes
# (it would measure the instrumented twin, whose sanitizers keep freed memory
# a while), and the packaging tests, which build programs against the
# installed package with a distribution's flags.
ctest --output-on-failure -j"$(nproc)" \
  -E 'OpenGLUnderXvfb|LongRecording.SavesHoursWithFlatMemory|^install_' "$@"
# The one test that is about GL, with everything checked but leaks.
ASAN_OPTIONS=${ASAN_OPTIONS/detect_leaks=1/detect_leaks=0} env -u QT_XCB_GL_INTEGRATION \
  ctest --output-on-failure -R 'OpenGLUnderXvfb' "$@"
