#!/bin/sh
# Runs a command in a private D-Bus session whose Secret Service is a GNOME
# keyring unlocked with a test password, in a throwaway home: the user's own
# keyring is never touched.
set -eu
home=$(mktemp -d "${TMPDIR:-/tmp}/tamsel-keyring.XXXXXX")
trap 'rm -rf "$home"' EXIT INT TERM
export HOME="$home" XDG_DATA_HOME="$home/data" XDG_CONFIG_HOME="$home/config" \
  XDG_CACHE_HOME="$home/cache" XDG_RUNTIME_DIR="$home/run"
mkdir -p "$XDG_DATA_HOME" "$XDG_CONFIG_HOME" "$XDG_CACHE_HOME" "$XDG_RUNTIME_DIR"
chmod 700 "$XDG_RUNTIME_DIR"
unset DISPLAY WAYLAND_DISPLAY GNOME_KEYRING_CONTROL
export TAMSEL_TEST_KEYRING=1
dbus-run-session -- sh -c '
  printf %s tamsel-test-password | gnome-keyring-daemon --unlock --components=secrets >/dev/null
  exec "$@"' keyring "$@"
