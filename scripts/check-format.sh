#!/usr/bin/env bash
# Fails when a tracked C++ file is not laid out as .clang-format says (the
# layout the tree was written in). With --fix it formats them in place.
set -euo pipefail
cd "$(dirname "$0")/.."
mapfile -t files < <(git ls-files '*.cpp' '*.h')
if [ "${1:-}" = "--fix" ]; then
  clang-format -i "${files[@]}"
  exit 0
fi
if ! out=$(clang-format --dry-run --Werror "${files[@]}" 2>&1); then
  grep -o '^[^:]*\.\(cpp\|h\):' <<<"$out" | sort -u | sed 's/:$//; s/^/not formatted: /' >&2
  echo "run scripts/check-format.sh --fix (or clang-format -i on those files)" >&2
  exit 1
fi
