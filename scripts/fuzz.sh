#!/usr/bin/env bash
# Builds the fuzz harnesses with clang (libFuzzer, AddressSanitizer,
# UndefinedBehaviorSanitizer) into build-fuzz/ and runs each in turn for
# SECONDS (60 unless given), one at a time. Extra arguments name the
# harnesses to run (all of them otherwise: see fuzz/CMakeLists.txt).
#
# New inputs that reach new code go to build-fuzz/fuzz-corpus/<name>/ (kept
# between runs); an input that crashes goes to build-fuzz/fuzz-artifacts/.
# Each harness ends with one line: its executions, the code it covered and
# what it found. Keep a crashing input as a regression test by copying it to
# fuzz/regressions/<name>/.
#
#   scripts/fuzz.sh 600 media_open
set -euo pipefail
cd "$(dirname "$0")/.."
seconds=${1:-60}
[ $# -gt 0 ] && shift
build=${TAMSEL_FUZZ_BUILD:-build-fuzz}

if [ ! -f "$build/build.ninja" ]; then
  launcher=()
  command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache -DCMAKE_C_COMPILER_LAUNCHER=ccache)
  cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo "${launcher[@]}" \
    -DCMAKE_C_COMPILER=clang-14 -DCMAKE_CXX_COMPILER=clang++-14 -DTAMSEL_FUZZ=ON >/dev/null
fi
mapfile -t all < <(sed -n 's/^ *tamsel_add_fuzzer(\([a-z_0-9]*\).*/\1/p' fuzz/CMakeLists.txt)
names=("$@")
[ ${#names[@]} -eq 0 ] && names=("${all[@]}")
targets=()
for name in "${names[@]}"; do targets+=("fuzz_$name"); done
cmake --build "$build" -j"$(nproc)" --target "${targets[@]}"

export QT_QPA_PLATFORM=offscreen
export ASAN_OPTIONS=detect_leaks=1
export LSAN_OPTIONS=suppressions=$PWD/tests/sanitizers/lsan.supp:print_suppressions=0
export UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1:suppressions=$PWD/tests/sanitizers/ubsan.supp
status=0
for name in "${names[@]}"; do
  work=$build/fuzz-corpus/$name
  mkdir -p "$work" "$build/fuzz-artifacts"
  log=$build/fuzz-artifacts/$name.log
  corpora=("$work" "fuzz/corpus/$name")
  [ -d "fuzz/regressions/$name" ] && corpora+=("fuzz/regressions/$name")
  if "$build/bin/fuzz_$name" -max_total_time="$seconds" -timeout=10 -rss_limit_mb=2048 \
       -print_final_stats=1 -artifact_prefix="$build/fuzz-artifacts/$name-" \
       "${corpora[@]}" >"$log" 2>&1; then
    found="nothing"
  else
    found="a failure: $(grep -m1 -E 'ERROR: |runtime error|SUMMARY' "$log" || echo see "$log")"
    status=1
  fi
  runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)
  cov=$(grep -E '^#[0-9]+' "$log" | tail -1 | sed -n 's/.* cov: \([0-9]*\) ft: \([0-9]*\) corp: \([0-9]*\).*/\1 edges, \2 features, corpus \3/p')
  echo "$name: ${runs:-?} executions in ${seconds}s; ${cov:-coverage unknown}; found $found"
done
exit $status
