#!/usr/bin/env bash
# Installs what is missing, builds, and opens the editor on the sample
# recording (or on the movie named in the arguments, which go to
# tamsel-edit). Without a display it runs the typical use as a demo instead.
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/setup.sh
bash scripts/build.sh tamsel-edit tamsel-video-editor tamsel_sample_recording tamsel_resources
if [ -z "${DISPLAY:-}" ] && [ -z "${WAYLAND_DISPLAY:-}" ]; then
  echo "No display: running the demo (the typical use, driven by automation)." >&2
  exec build/bin/tamsel-edit --demo "$@"
fi
exec build/bin/tamsel-edit "$@"
