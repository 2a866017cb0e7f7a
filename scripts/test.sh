#!/usr/bin/env bash
# make test: set-up and build, a throwaway PostgreSQL server, every test on
# both engines, the server stopped. Extra arguments go to ctest (-R NAME ...).
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/setup.sh
export QT_QPA_PLATFORM=offscreen
source scripts/postgres.sh fast
ctest --test-dir build --output-on-failure -j2 "$@"
