#!/usr/bin/env bash
# Fails, naming the files, when a tracked C++ file is not formatted as the
# repository's .clang-format says (clang-format 14, as Debian 12 ships it).
set -euo pipefail
cd "$(dirname "$0")/.."
format=$(command -v clang-format-14 || command -v clang-format || true)
if [ -z "$format" ]; then
  echo "clang-format is not installed; run scripts/setup.sh" >&2
  exit 1
fi
if git rev-parse --is-inside-work-tree >/dev/null 2>&1; then
  mapfile -t files < <(git ls-files -- '*.cpp' '*.h')
else
  mapfile -t files < <(find src apps plugins tests bench fuzz resources -name '*.cpp' -o -name '*.h' 2>/dev/null)
fi
if ! "$format" --dry-run -Werror --style=file "${files[@]}"; then
  echo "Unformatted files above; fix them with: clang-format -i FILE" >&2
  exit 1
fi
