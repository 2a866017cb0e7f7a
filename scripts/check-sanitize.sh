#!/usr/bin/env bash
# make check-sanitize: a Debug build with AddressSanitizer and
# UndefinedBehaviorSanitizer (clang) in build-sanitize/, every test that needs
# no server run in it, then each fuzz target for a fixed time from its seed
# corpus. Any sanitizer report, crash, leak or timeout fails the run.
# Set-up (scripts/setup.sh) must have run. FUZZ_SECONDS changes the time per
# target (0: no fuzzing); extra arguments go to ctest (-R NAME ...).
set -euo pipefail
cd "$(dirname "$0")/.."
export QT_QPA_PLATFORM=offscreen
build=build-sanitize
fuzz_seconds=${FUZZ_SECONDS:-30}

CC=clang CXX=clang++ cmake -S . -B $build -DCMAKE_BUILD_TYPE=Debug -DQUOTAS_SANITIZE=ON >/dev/null
cmake --build $build -j2

# No suppressions: Qt, its SQLite driver and libcsv report nothing here.
export ASAN_OPTIONS=detect_leaks=1:strict_string_checks=1:detect_stack_use_after_return=1:check_initialization_order=1
export UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1
ctest --test-dir $build --output-on-failure -j2 -L 'unit|sqlite' -LE server "$@"

((fuzz_seconds > 0)) || exit 0
# Each target runs alone in one process; two at a time, one per core.
fuzz() {
  local target=$1 work=$build/fuzz/$1
  rm -rf "$work" && mkdir -p "$work/corpus" "$work/crashes"
  # New inputs go to the scratch corpus; the seeds in tests/fuzz stay as committed.
  if $build/tests/fuzz/fuzz_$target -max_total_time="$fuzz_seconds" -timeout=10 -rss_limit_mb=2048 \
      -artifact_prefix="$work/crashes/" "$work/corpus" tests/fuzz/corpus/$target >"$work/log" 2>&1; then
    echo "fuzz_$target: $(grep -o 'Done [0-9]* runs in [0-9]* second(s)' "$work/log")"
  else
    tail -60 "$work/log"
    echo "fuzz_$target FAILED; the input is in $work/crashes/"
    return 1
  fi
}
status=0
for pair in "csv registry_file" "connection_string amount"; do
  pids=()
  for target in $pair; do fuzz "$target" & pids+=($!); done
  for pid in "${pids[@]}"; do wait "$pid" || status=1; done
done
exit $status
