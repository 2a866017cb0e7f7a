#!/usr/bin/env bash
# Runs clang-tidy (the checks in .clang-tidy, every warning an error) over the
# tracked C++ sources, with the compile commands of build/ (scripts/setup.sh
# makes it). Arguments: files to check instead of all of them.
set -euo pipefail
cd "$(dirname "$0")/.."
build=${TIDY_BUILD:-build}
[ -f $build/compile_commands.json ] || { echo "no $build/compile_commands.json: run scripts/setup.sh first" >&2; exit 2; }
if (($#)); then files=("$@"); else mapfile -t files < <(git ls-files '*.cpp'); fi
# Two at a time: the machine has two cores. xargs fails when any run does.
rc=0
out=$(printf '%s\n' "${files[@]}" | xargs -P2 -n4 clang-tidy -p "$build" --quiet 2>&1) || rc=$?
grep -v '^[0-9]* warnings\? generated\.$\|^Suppressed [0-9]* warnings\|^Use -header-filter\|^$' <<<"$out" || true
exit $rc
