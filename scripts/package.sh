#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# package.sh [VERSION]: builds the Debian packages of the files under version control, as they stand,
# into build-package/, and checks them. A VERSION that packaging/debian/changelog does not have yet
# is taken for the next one.
set -euo pipefail

top=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd)
readonly top
readonly here=$top/build-package
readonly tree=$here/tree # The same for every version: the compiler's cache knows paths.

say() {
  printf 'package: %s\n' "$*"
}

take_sources() {
  rm -rf -- "$tree"
  mkdir -p -- "$tree"
  git -C "$top" -c safe.directory="$top" ls-files -z --cached |
    tar -C "$top" --null --files-from=- -cf - | tar -C "$tree" -xf -
  cp -R -- "$top/packaging/debian" "$tree/debian"
}

next_version() {
  local changelog=$tree/debian/changelog
  {
    printf 'mediidx (%s) bookworm; urgency=medium\n\n  * Next version.\n\n -- %s  %s\n\n' \
      "$1" "$(sed -n 's/^Maintainer: //p' "$tree/debian/control")" "$(date --rfc-email)"
    cat -- "$top/packaging/debian/changelog"
  } >"$changelog"
}

build() {
  local log=$here/build.log
  say "building; the log is $log"
  if ! (cd -- "$tree" && DEB_BUILD_OPTIONS="parallel=$(nproc) ${DEB_BUILD_OPTIONS:-}" \
    dpkg-buildpackage --build=binary --no-sign) >"$log" 2>&1; then
    tail -n 40 -- "$log" >&2
    say 'dpkg-buildpackage failed' >&2
    exit 1
  fi
}

# The units, with the programs that they start where the package is unpacked.
check_units() {
  local unpacked=$here/unpacked
  rm -rf -- "$unpacked"
  dpkg-deb -x "$(ls "$here"/mediidx_"$version"_*.deb)" "$unpacked"
  say 'systemd-analyze verify'
  sed -i "s#=/usr/bin/#=$unpacked/usr/bin/#" "$unpacked"/lib/systemd/system/*.service
  systemd-analyze verify --man=no "$unpacked"/lib/systemd/system/mediidx-*
  for service in "$unpacked"/lib/systemd/system/*.service; do
    # 30 of 100: what is called "OK" begins at 45.
    systemd-analyze security --offline=true --threshold=30 --no-pager "$service" | tail -n 1
  done
  rm -rf -- "$unpacked"
}

mkdir -p -- "$here"
rm -f -- "$here"/*.deb "$here"/*.changes "$here"/*.buildinfo
take_sources
if [ $# -gt 0 ]; then next_version "$1"; fi
version=$(cd -- "$tree" && dpkg-parsechangelog -S Version)
build
say 'lintian'
(cd -- "$here" && lintian --fail-on error,warning --tag-display-limit 0 --allow-root ./*.changes)
check_units
say "good: $(cd -- "$here" && printf '%s ' ./*.deb)"
