#!/usr/bin/env bash
# Runs clang-tidy (the checks in .clang-tidy, every warning an error) over the
# product's C++ sources (src, host, cli), with the compile commands of build/
# (scripts/setup.sh makes it). Arguments: files to check instead of those.
#
# Reading the Qt headers is most of what checking a file costs, so the files
# of each folder are checked together, as one translation unit that includes
# them all (the compile command of the folder's first file): the headers are
# read once per folder. A folder whose files cannot stand in one unit (two
# helpers of one name) is checked file by file. Two runs at a time: the
# machine has two cores.
set -euo pipefail
cd "$(dirname "$0")/.."
build=${TIDY_BUILD:-build}
db=$build/compile_commands.json
[ -f $db ] || { echo "no $db: run scripts/setup.sh first" >&2; exit 2; }
if (($#)); then files=("$@"); else mapfile -t files < <(git ls-files 'src/*.cpp' 'host/*.cpp' 'cli/*.cpp'); fi

units=$(mktemp -d)
trap 'rm -rf "$units"' EXIT
# One unit per folder, and a compile database that names them.
declare -A folder_files
for f in "${files[@]}"; do
    folder_files[$(dirname "$f")]+="$PWD/$f "
done
{
    echo '['
    sep=
    for folder in "${!folder_files[@]}"; do
        unit=$units/${folder//\//_}.cpp
        read -ra members <<<"${folder_files[$folder]}"
        printf '#include "%s"\n' "${members[@]}" >"$unit"
        # CMake writes each entry as "directory", "command", "file" lines.
        awk -v file="${members[0]}" -v unit="$unit" -v sep="$sep" '
            /"directory":/ { dir = $0 }
            /"command":/ { cmd = $0 }
            index($0, "\"file\": \"" file "\"") {
                gsub(/-c [^ ]*\.cpp/, "-c " unit, cmd)
                printf "%s{\n%s\n%s\n  \"file\": \"%s\"\n}\n", sep, dir, cmd, unit
                exit
            }' "$db"
        sep=,
    done
    echo ']'
} >"$units/compile_commands.json"

check() {
    set -o pipefail
    clang-tidy --quiet --config-file="$PWD/.clang-tidy" "$@" 2>&1 | { grep -v '^[0-9]* warnings\?\( and [0-9]* errors\?\)\? generated\.$\|^Suppressed [0-9]* warnings\|^Use -header-filter\|^$' || true; }
}
export -f check
rc=0
# A unit that does not compile is checked again file by file.
for unit in "$units"/*.cpp; do echo "$unit"; done |
    xargs -P2 -I{} bash -c 'check -p "$0" "$1" >"$1.out" || echo "$1" >>"$0/failed"' "$units" {} || true
for unit in "$units"/*.cpp; do
    if grep -q 'clang-diagnostic-error' "$unit.out"; then
        echo "$(basename "$unit" .cpp | tr _ /): checked file by file (its files do not compile as one unit)" >&2
        sed 's/^#include "\(.*\)"$/\1/' "$unit" >>"$units/separately"
    elif [ -s "$unit.out" ] || grep -qxF "$unit" "$units/failed" 2>/dev/null; then
        cat "$unit.out"
        rc=1
    fi
done
if [ -s "$units/separately" ]; then
    xargs -P2 -n1 bash -c 'check -p "'"$build"'" "$0"' <"$units/separately" || rc=1
fi
exit $rc
