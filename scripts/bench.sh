#!/usr/bin/env bash
# make bench: the benchmark program on SQLite and on a durable PostgreSQL
# server. Extra arguments go to quotas-bench (--members 2000,20000 --json
# NAME ...). The Release build has a folder of its own, build-rel/, so that
# the tests' build keeps its settings.
set -euo pipefail
cd "$(dirname "$0")/.."
BUILD_DIR=build-rel BUILD_TYPE=Release scripts/setup.sh
export QT_QPA_PLATFORM=offscreen
source scripts/postgres.sh
build-rel/bench/quotas-bench "$@"
