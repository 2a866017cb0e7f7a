#!/usr/bin/env bash
# make run: set-up and build of the two programs, then on first run a demo settings file and a
# demo SQLite database under var/, then the host application.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/setup.sh quotas-host quotas-cli  # only what the demo needs: no tests, no benchmark
mkdir -p var
export QUOTAS_REGISTRY=${QUOTAS_REGISTRY:-$PWD/var/registry.reg}
if [ ! -f "$QUOTAS_REGISTRY" ]; then
  build/cli/quotas config --data-source "$PWD/var/quotas.db"
  build/cli/quotas init-db --demo 300
fi
if [ -z "${DISPLAY:-}${WAYLAND_DISPLAY:-}" ] && [ -z "${QT_QPA_PLATFORM:-}" ]; then
  echo "No display: quotas-host needs one (or QT_QPA_PLATFORM=offscreen, or xvfb-run)." >&2
  exit 1
fi
exec build/host/quotas-host
