#!/usr/bin/env bash
# make bench: the benchmark program on SQLite and on a durable PostgreSQL
# server. Extra arguments go to quotas-bench (--members 2000,20000 NAME ...).
set -euo pipefail
cd "$(dirname "$0")/.."
BUILD_TYPE=Release scripts/setup.sh
export QT_QPA_PLATFORM=offscreen
source scripts/postgres.sh
build/bench/quotas-bench "$@"
