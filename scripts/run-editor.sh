#!/usr/bin/env bash
# Installs what is missing, builds, and opens the editor. Arguments go to
# tamsel-edit (a movie path, --app-name, --bundle-id ...).
set -euo pipefail
cd "$(dirname "$0")/.."
bash scripts/setup.sh
bash scripts/build.sh tamsel-edit tamsel-video-editor
exec build/bin/tamsel-edit "$@"
