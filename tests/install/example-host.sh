#!/usr/bin/env bash
# The example host, built against tamsel-host as installed: `cmake --install`
# into a scratch prefix, the example configured with find_package(TamselHost)
# and built, a second build through pkg-config, and a run that opens the
# installed editor on a recording and hears what the user did.
#
# usage: example-host.sh BUILD_DIR SOURCE_DIR
set -euo pipefail
build=$(realpath "$1")
source=$(realpath "$2")
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
prefix=$scratch/prefix

cmake --install "$build" --prefix "$prefix" >/dev/null

echo "== find_package(TamselHost)"
cmake -S "$source/examples/recorder-host" -B "$scratch/example" -G Ninja \
  -DCMAKE_PREFIX_PATH="$prefix" -DCMAKE_BUILD_TYPE=Release >/dev/null
cmake --build "$scratch/example" >/dev/null

echo "== pkg-config tamsel-host"
pcdir=$(dirname "$(find "$prefix" -name tamsel-host.pc)")
flags=$(PKG_CONFIG_PATH=$pcdir pkg-config --cflags --libs tamsel-host)
# shellcheck disable=SC2086
c++ -std=c++17 "$source/examples/recorder-host/main.cpp" -o "$scratch/recorder-host-pc" $flags
libdir=$(PKG_CONFIG_PATH=$pcdir pkg-config --variable=libdir tamsel-host)
status=0
LD_LIBRARY_PATH=$libdir "$scratch/recorder-host-pc" 2>/dev/null || status=$?
[ "$status" -eq 2 ] || { echo "the pkg-config build should print its usage, got $status"; exit 1; }

echo "== the example opens the installed editor"
mkdir -p "$scratch/mobile" "$scratch/album"
"$build/bin/tamsel-make-media" --quiet --seconds 3 --size 320x240 "$scratch/recording.mp4"
cat >"$scratch/script.txt" <<'SCRIPT'
wait ready
drag end 1.5
tap trimButton
wait exporting=false 60
tap doneButton
SCRIPT
out=$(env QT_QPA_PLATFORM=offscreen TAMSEL_AUDIO=null TAMSEL_MOBILE_ROOT="$scratch/mobile" \
  TAMSEL_ALBUM_DIR="$scratch/album" \
  "$scratch/example/recorder-host" "$scratch/recording.mp4" --automation "$scratch/script.txt")
echo "$out"
grep -qx 'The user completed: org.tamsel.activity.SaveToAlbum' <<<"$out"
[ "$(find "$scratch/album" -type f | wc -l)" -eq 1 ] || { echo "no clip in the album"; exit 1; }
echo "ok"
