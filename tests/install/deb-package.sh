#!/usr/bin/env bash
# The Debian package: made with cpack from the build tree, its dependencies
# read by dpkg-shlibdeps, unpacked into a scratch root with dpkg -x, and run
# from there: the programs find their library, resources and sample beside
# themselves, wherever the root is.
#
# usage: deb-package.sh BUILD_DIR
set -euo pipefail
build=$(realpath "$1")
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT

start=$(date +%s)
(cd "$build" && cpack -G DEB -B "$scratch/out" >/dev/null)
deb=$(find "$scratch/out" -maxdepth 1 -name 'tamsel_*.deb')
[ -n "$deb" ] || { echo "cpack made no package"; exit 1; }
echo "== $(basename "$deb") in $(($(date +%s) - start)) s"

depends=$(dpkg-deb -f "$deb" Depends)
echo "Depends: $depends"
for lib in libqt6widgets6 libavformat libmpv libc6; do
  grep -q "$lib" <<<"$depends" || { echo "Depends lacks $lib"; exit 1; }
done
contents=$(dpkg-deb -c "$deb")
for path in ./usr/bin/tamsel-edit ./usr/bin/tamsel-video-editor \
  ./usr/share/applications/org.tamsel.Tamsel.desktop \
  ./usr/share/icons/hicolor/scalable/apps/org.tamsel.Tamsel.svg \
  ./usr/share/metainfo/org.tamsel.Tamsel.metainfo.xml ./usr/include/tamsel/VideoEditorHost.h \
  ./usr/share/tamsel/sample/recording.mp4; do
  grep -q " $path\( \|$\)" <<<"$contents" || { echo "the package lacks $path"; exit 1; }
done
grep -q 'libtamsel-host.so.1 ' <<<"$contents" || { echo "the package lacks libtamsel-host"; exit 1; }

root=$scratch/root
dpkg -x "$deb" "$root"
env=(env QT_QPA_PLATFORM=offscreen TAMSEL_AUDIO=null TAMSEL_MOBILE_ROOT="$scratch/mobile"
  TAMSEL_ALBUM_DIR="$scratch/album")
mkdir -p "$scratch/mobile" "$scratch/album"

echo "== the resources come from the root"
# Masks of half the size make an overlay button of half the size: only the
# root's resources can have told the editor so.
framework=$root/usr/share/tamsel/System/Library/Frameworks/Tamsel.framework
for mask in "$framework"/TXVideoOverlay*Mask*.png; do
  ffmpeg -v error -y -i "$mask" -vf 'scale=iw/2:ih/2' "$scratch/half.png"
  mv "$scratch/half.png" "$mask"
done
printf 'wait ready\ndump\n' >"$scratch/look.txt"
look=$("${env[@]}" "$root/usr/bin/tamsel-edit" --automation "$scratch/look.txt")
grep -q '"videoOverlayPlayButton":\[[0-9]*,[0-9]*,40,40\]' <<<"$look" ||
  { echo "the editor did not read the root's resources: $look"; exit 1; }

echo "== tamsel-edit --demo"
start=$(date +%s)
out=$("${env[@]}" "$root/usr/bin/tamsel-edit" --demo)
echo "$(tail -1 <<<"$out") in $(($(date +%s) - start)) s"
[ "$(tail -1 <<<"$out")" = '["org.tamsel.activity.SaveToAlbum"]' ]
[ "$(find "$scratch/album" -type f | wc -l)" -eq 1 ] || { echo "no clip in the album"; exit 1; }
echo "ok"
