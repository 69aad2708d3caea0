#!/usr/bin/env bash
# Installs the Debian 12 packages that building, testing and benchmarking need.
# Quick when everything is already there; safe to run again.
set -euo pipefail

packages=(
  clang-format # the formatting check of .ci/run
  clang-14 libclang-rt-14-dev # scripts/fuzz.sh: libFuzzer and the sanitizers' runtimes
  build-essential cmake ninja-build pkg-config git ccache
  qt6-base-dev libqt6opengl6-dev qt6-multimedia-dev qt6-base-dev-tools
  libavformat-dev libavcodec-dev libavutil-dev libswscale-dev libswresample-dev
  libmpv-dev libappstream-dev
  libgtest-dev libgmock-dev libbenchmark-dev
  xvfb xauth ffmpeg dbus-daemon
  libgl1-mesa-dri libegl1 fonts-dejavu-core adwaita-icon-theme
  qt6-networkauth-dev qtkeychain-qt6-dev libsecret-1-0 gnome-keyring curl hyperfine
  dpkg-dev desktop-file-utils appstream
)

missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed' || missing+=("$p")
done

if [ ${#missing[@]} -gt 0 ]; then
  if [ "$(id -u)" -ne 0 ]; then
    echo "Tamsel needs packages that are not installed: ${missing[*]}" >&2
    echo "Run this once, then try again:" >&2
    echo "  sudo $(realpath "$0")" >&2
    exit 1
  fi
  export DEBIAN_FRONTEND=noninteractive
  apt-get update -qq
  apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
fi
