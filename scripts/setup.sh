#!/usr/bin/env bash
# Installs the Debian 12 packages the project needs (only the missing ones)
# and builds into build/ (or $BUILD_DIR, in $BUILD_TYPE): the targets named as
# arguments, else everything.
set -euo pipefail
cd "$(dirname "$0")/.."

packages=(
  cmake make g++                                  # the tool chain
  qt6-base-dev libqt6sql6-sqlite libqt6sql6-psql  # Qt 6.4 and its two SQL drivers
  postgresql-15                                   # the server engine and its tests
  fonts-liberation2                               # Arial / Times New Roman metrics for the reports
  poppler-utils                                   # pdftotext, pdftoppm: tests read PDFs back
  libcsv-dev                                      # the RFC 4180 parser of the CSV import source
  clang-format                                    # scripts/check-format.sh
  libpq-dev                                       # libpq's header: COPY when copying to a server
  qt6-translations-l10n                           # Qt's own texts in Portuguese (qtbase_pt_BR.qm)
  clang-tidy                                      # scripts/check-tidy.sh
  clang libclang-rt-dev llvm                      # the sanitizer build, libFuzzer, llvm-symbolizer
  dpkg-dev file                                   # make package: dpkg-shlibdeps computes the dependencies
  libsqlite3-dev                                  # the Portuguese collation registered on SQLite connections
)
missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing+=("$p")
done
if ((${#missing[@]})); then
  echo "Installing: ${missing[*]}"
  sudo=""
  [ "$(id -u)" -eq 0 ] || sudo="sudo"
  $sudo apt-get update -qq
  DEBIAN_FRONTEND=noninteractive $sudo apt-get install -y -qq --no-install-recommends "${missing[@]}"
fi

build_dir=${BUILD_DIR:-build}
cmake -S . -B "$build_dir" -DCMAKE_BUILD_TYPE="${BUILD_TYPE:-RelWithDebInfo}" >/dev/null
cmake --build "$build_dir" -j2 ${1:+--target "$@"}
