#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# package_test.sh OLD NEW: installs the packages in the folder OLD on a minimal Debian 12, indexes
# with them, upgrades to those in NEW, removes and purges them. Needs root.
set -euo pipefail

if [ "${MEDIIDX_FRESH_NAMESPACE:-}" != yes ]; then
  [ "$(id -u)" -eq 0 ] || {
    echo 'package_test: needs root' >&2
    exit 1
  }
  MEDIIDX_FRESH_NAMESPACE=yes exec unshare --mount --pid --ipc --fork --kill-child \
    --propagation private -- "${BASH_SOURCE[0]}" "$@"
fi

top=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd)
readonly top old=$1 new=$2
# shellcheck source=scripts/debian_tree.sh
. "$top/scripts/debian_tree.sh"
readonly system=$here/package
readonly log=$here/package.log

# quietly PROGRAM…: inside the tree; its output is shown only when it fails.
quietly() {
  if ! inside "$system" env DEBIAN_FRONTEND=noninteractive "$@" >"$log" 2>&1; then
    tail -n 30 -- "$log" >&2
    fail "$*"
  fi
}

# expect PATTERN PROGRAM…: its output has to have such a line.
expect() {
  local pattern=$1
  shift
  inside "$system" "$@" >"$log" 2>&1 || {
    cat -- "$log" >&2
    fail "$*"
  }
  grep -q -- "$pattern" "$log" || {
    cat -- "$log" >&2
    fail "no \"$pattern\" from: $*"
  }
}

install_packages() {
  rm -rf -- "$system/packages"
  cp -R -- "$1" "$system/packages"
  # shellcheck disable=SC2016 # the shell in the tree fills it in
  quietly sh -c 'apt-get install --yes --no-install-recommends $(ls /packages/*.deb | grep -v dbgsym) "$@"' \
    sh "${@:2}"
}

# write_song FILE: a second of silence.
write_song() {
  mkdir -p -- "$(dirname -- "$1")"
  {
    printf 'RIFF\x64\x1f\x00\x00WAVEfmt \x10\x00\x00\x00\x01\x00\x01\x00'
    printf '\x40\x1f\x00\x00\x40\x1f\x00\x00\x01\x00\x08\x00data\x40\x1f\x00\x00'
    head -c 8000 /dev/zero | tr '\0' '\200'
  } >"$1"
}


no_private_server() {
  ! grep -qsa -- '-c.listen_addresses=' "$system"/proc/[0-9]*/cmdline || fail 'a server was left running'
}

# What is named after us, but for the media and what a user keeps at home.
traces() {
  find "$system" -xdev \( -name '*mediidx*' -o -name '*tavo*' \) ! -path "$system/home/*" \
    ! -path "$system/packages/*" ! -path "$system/proc/*" ! -path "$system/var/cache/*" -printf '/%P\n' |
    grep -v '^/packages$' || true
}

installed() {
  # shellcheck disable=SC2016 # dpkg-query fills it in
  inside "$system" dpkg-query -W -f '${Package}\n'
}

version_of() {
  # shellcheck disable=SC2016 # dpkg-query fills it in
  inside "$system" dpkg-query -W -f '${Version}' "$1"
}

say 'a minimal system'
make_tree "$system"
quietly apt-get update
inside "$system" useradd --create-home tester
write_song "$system/srv/music/one.wav"
write_song "$system/home/tester/Music/two.wav"

say 'install'
install_packages "$old" postgresql-15
expect '^mediidx [0-9]' mediidx version
no_private_server
[ ! -e "$system/var/lib/mediidx" ] || fail 'the installation made a data folder'
for file in usr/share/man/man1/mediidx.1.gz usr/share/man/man5/index_folder.conf.5.gz \
  usr/share/bash-completion/completions/mediidx usr/share/mediidx/mediaserver.sql \
  lib/systemd/system/mediidx-watch.service usr/lib/systemd/user/mediidx-scan.timer; do
  [ -e "$system/$file" ] || fail "/$file is not there"
done

say 'scan, as root and as a user'
expect '^added 0, changed 0' mediidx scan
expect '^added 1, ' mediidx index --full-speed /srv/music
expect '/srv/music/one.wav' mediidx list music --json
expect '^added 1, ' su - tester -s /bin/sh -c 'mediidx index --full-speed ~/Music'
expect '^ok.*database' mediidx doctor
no_private_server

say 'upgrade'
before=$(version_of mediidx)
install_packages "$new"
after=$(version_of mediidx)
inside "$system" dpkg --compare-versions "$before" lt "$after" || fail "$before was not upgraded: $after"
expect '^added 0, changed 0, moved 0, removed 0' mediidx scan
expect '^added 0, changed 0, moved 0, removed 0' su - tester -s /bin/sh -c 'mediidx scan'
expect '/srv/music/one.wav' mediidx list music --json

say 'remove'
mapfile -t packages < <(installed | grep -E '^(lib)?(mediidx|tavo)')
quietly apt-get remove --yes "${packages[@]}"
[ -e "$system/var/lib/mediidx/postgres" ] || fail 'the index went with the package'
[ ! -e "$system/usr/bin/mediidx" ] || fail 'the command is still there'

say 'purge'
quietly dpkg --purge "${packages[@]}"
left=$(traces)
[ -z "$left" ] || fail "left behind: $left"
[ -e "$system/srv/music/one.wav" ] || fail 'media were removed'
say 'good'
