#!/usr/bin/env bash
# The YouTube publishing plug-in's upload throughput to the local fake of the
# service, against curl sending the same file to the same server: both timed
# as whole processes by hyperfine in one run, several runs each. Prints
#   upload_ms, curl_upload_ms          median wall time of one upload
#   ..._range                          fastest-slowest run
#   upload_mb_per_s, curl_upload_mb_per_s   the file's size over the median
#   upload_vs_curl_ratio               our median over curl's (below 1: faster)
#   upload_vs_curl_ratio_range         fastest over fastest - slowest over slowest
# Ours is a resumable upload in 16 MiB chunks, each answered before the next
# goes, as the editor publishes (sign-in refresh included); curl sends the
# file in one PUT after opening the session. The server counts the bytes
# without writing them, so the disk is not measured. TAMSEL_BENCH_CHUNK_MIB
# tries another chunk size.
#
# Usage: bench/upload-figures.sh [BUILD_DIR]  (bench/run calls it). The file
# (TAMSEL_BENCH_UPLOAD_MB, 256 MB of random bytes) is made once in the cache;
# TAMSEL_BENCH_UPLOAD_RUNS runs each (9).
set -euo pipefail

root=$(cd "$(dirname "$0")/.." && pwd)
build=${1:-${TAMSEL_BENCH_BUILD:-$root/build-bench}}
cache=${TAMSEL_BENCH_CACHE:-${XDG_CACHE_HOME:-$HOME/.cache}/tamsel-bench}
megabytes=${TAMSEL_BENCH_UPLOAD_MB:-256}
runs=${TAMSEL_BENCH_UPLOAD_RUNS:-9}
note() { echo "bench/upload: $*" >&2; }
for tool in hyperfine curl python3; do
  command -v "$tool" >/dev/null || { note "needs $tool (scripts/setup.sh installs it)"; exit 1; }
done

if [ ! -f "$build/build.ninja" ]; then
  note "configuring $build"
  cmake -S "$root" -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=Release -DTAMSEL_BUILD_TESTS=OFF >/dev/null
fi
cmake --build "$build" --target tamsel-upload-bench tamsel-fake-youtube >/dev/null

mkdir -p "$cache"
file=$cache/upload-${megabytes}MB-v1.bin
if [ ! -f "$file" ]; then
  note "making the ${megabytes} MB file (once)"
  head -c "$((megabytes * 1000 * 1000))" /dev/urandom >"$file.part"
  mv "$file.part" "$file"
fi
cat "$file" >/dev/null # the page cache holds it for both alike

work=$(mktemp -d "${TMPDIR:-/tmp}/tamsel-upload.XXXXXX")
server_pid=""
cleanup() {
  exec 9>&- 2>/dev/null || true
  [ -n "$server_pid" ] && wait "$server_pid" 2>/dev/null || true
  rm -rf "$work"
}
trap cleanup EXIT

# The server lives until its standard input closes.
mkfifo "$work/server-in"
"$build/bin/tamsel-fake-youtube" --discard --access-token bench-access \
  --refresh-token bench-refresh <"$work/server-in" >"$work/server.env" &
server_pid=$!
exec 9>"$work/server-in"
for _ in $(seq 100); do
  grep -q '^$' "$work/server.env" 2>/dev/null && break
  sleep 0.05
done
while IFS= read -r line; do
  [ -n "$line" ] && export "${line?}"
done <"$work/server.env"
export TAMSEL_BENCH_REFRESH_TOKEN=bench-refresh TAMSEL_BENCH_ACCESS_TOKEN=bench-access

note "uploading ${megabytes} MB, ${runs} runs each"
hyperfine -N --style none --warmup 1 --runs "$runs" --export-json "$work/upload.json" \
  -n ours "$build/bin/tamsel-upload-bench $file" \
  -n curl "$root/bench/upload-curl.sh $file" >/dev/null

python3 - "$work/upload.json" "$megabytes" <<'PY'
import json, sys
results = {r["command"]: r for r in json.load(open(sys.argv[1]))["results"]}
mb = float(sys.argv[2])
ours, curl = results["ours"], results["curl"]
for name, r in (("upload", ours), ("curl_upload", curl)):
    print(f'{name}_ms {r["median"] * 1000:.1f} ms')
    print(f'{name}_ms_range {r["min"] * 1000:.1f}-{r["max"] * 1000:.1f} ms')
    print(f'{name}_mb_per_s {mb / r["median"]:.1f} MB/s')
print(f'upload_vs_curl_ratio {ours["median"] / curl["median"]:.3f} x')
print(f'upload_vs_curl_ratio_range {ours["min"] / curl["min"]:.3f}-{ours["max"] / curl["max"]:.3f} x')
PY
