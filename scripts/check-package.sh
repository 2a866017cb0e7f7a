#!/usr/bin/env bash
# CI: builds the Debian package from build/, checks it with lintian and
# appstreamcli, installs it (dpkg as root, else unpacked into a fresh
# prefix), and runs the installed programs in a temporary folder while the
# source tree, and the build tree in it, are out of reach: a path left over
# from the build fails here. Run after scripts/test.sh has built build/.
set -euo pipefail
cd "$(dirname "$0")/.."
src=$PWD
started=$SECONDS

# The checkers only this script needs.
need=()
for p in lintian appstream; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep >/dev/null "install ok installed" || need+=("$p")
done
if ((${#need[@]})); then
  sudo=""
  [ "$(id -u)" -eq 0 ] || sudo="sudo"
  install() { DEBIAN_FRONTEND=noninteractive $sudo apt-get install -y -qq --no-install-recommends "${need[@]}" >/dev/null; }
  install || { $sudo apt-get update -qq && install; }
fi
echo "check-package: checkers ready after $((SECONDS - started)) s"

rm -f build/quotas_*.deb
cmake --build build -j2 --target package >/dev/null
deb=$(ls build/quotas_*_amd64.deb)
echo "== $deb"
dpkg-deb --field "$deb"
dpkg-deb --contents "$deb"

echo "== lintian"
lintian --fail-on error --allow-root "$deb"

work=$(mktemp -d)
installed=""
cleanup() {
  [ -n "$installed" ] && dpkg --purge quotas >/dev/null
  rm -rf "$work"
}
trap cleanup EXIT

echo "== appstreamcli"
dpkg-deb -x "$deb" "$work/unpacked"
appstreamcli validate --no-net "$work"/unpacked/usr/share/metainfo/*.metainfo.xml

if [ "$(id -u)" -eq 0 ]; then
  # A real installation, removed again by the trap (purge: the conffile too).
  DEBIAN_FRONTEND=noninteractive apt-get install -y -qq --no-install-recommends "$src/$deb" >/dev/null
  installed=yes
  bin=/usr/bin
  # The administrator's letterhead is the conffile in /etc/quotas.
  sed -i 's/^nome = .*/nome = Sindicato de Ensaio/' /etc/quotas/letterhead.txt
  letterhead="Sindicato de Ensaio"
else
  bin=$work/unpacked/usr/bin
  letterhead="Sindicato dos Trabalhadores"
fi

# The installed programs, run from the temporary folder with the source tree
# hidden (a private mount over it) or, where that is not allowed, moved away.
cat > "$work/run.sh" <<RUN
set -euo pipefail
cd "$work"
test ! -e "$src/CMakeLists.txt"
export QT_QPA_PLATFORM=offscreen
unset QUOTAS_DATA_DIR QUOTAS_REGISTRY
q() { "$bin/quotas" --registry "$work/registry.reg" "\$@"; }
"$bin/quotas" --version
"$bin/quotas-host" --version
q config --data-source "$work/quotas.db"
q init-db --demo 20
status=0; q gerar --ano 2026 --mes 1 || status=\$?
[ \$status -eq 0 ] || [ \$status -eq 3 ]
q listagem --pdf "$work/listagem.pdf"
# The letterhead comes from /etc/quotas, else from the installation's example.
q cartas --pdf "$work/cartas.pdf"
pdftotext "$work/cartas.pdf" - | grep >/dev/null "$letterhead"
if [ -n "$installed" ]; then
  rm /etc/quotas/letterhead.txt
  q cartas --pdf "$work/cartas.pdf"
  pdftotext "$work/cartas.pdf" - | grep >/dev/null "Sindicato dos Trabalhadores"
fi
RUN
if unshare -m true 2>/dev/null; then
  unshare -m bash -c "mount -t tmpfs none '$src' && bash '$work/run.sh'"
else
  mv "$src" "$src.away"
  status=0
  bash "$work/run.sh" || status=$?
  mv "$src.away" "$src"
  exit $status
fi
echo "check-package: done in $((SECONDS - started)) s"
