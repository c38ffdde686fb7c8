#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# fresh_machine.sh [root|user|all] [COMMAND]: the front door on a machine with nothing installed.
# Unpacks a minimal Debian 12 below build-fresh/, clones the last commit into it, and runs the
# build, the command (twice) and the tests there: as root, and in a second copy as a user with
# sudo, in a folder with a blank in its name. A COMMAND is run in their place. Needs root, and a
# Debian 12 as the host, whose package sources are used.
#
# Everything below runs in namespaces of its own: whatever happens, mounts and processes go away
# with the script.
set -euo pipefail

if [ "${MEDIIDX_FRESH_NAMESPACE:-}" != yes ]; then
  [ "$(id -u)" -eq 0 ] || {
    echo 'fresh_machine: needs root' >&2
    exit 1
  }
  MEDIIDX_FRESH_NAMESPACE=yes exec unshare --mount --pid --ipc --fork --kill-child \
    --propagation private -- "${BASH_SOURCE[0]}" "$@"
fi

top=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd)
readonly top
readonly as=${1:-all}
readonly command=${2:-}
# shellcheck source=scripts/debian_tree.sh
. "$top/scripts/debian_tree.sh"

# clone_into TREE FOLDER: the last commit of this checkout.
clone_into() {
  git -c safe.directory='*' clone --quiet --no-hardlinks -- "$top" "$1$2"
}

# timed LABEL COMMAND…: its output goes to the screen and to a log.
timed() {
  local label=$1 started=$SECONDS
  shift
  say "== $label"
  "$@" 2>&1 | tee -- "$here/last.log" || fail "$label"
  say "== $label: good, $((SECONDS - started)) s"
}

# What has to hold after every verb.
check_system() {
  local tree=$1 clusters
  clusters=$(inside "$tree" pg_lsclusters --no-header)
  [ -z "$clusters" ] || fail "a cluster was left behind: $clusters"
  ! grep -q '^create_main_cluster' "$tree/etc/postgresql-common/createcluster.conf" ||
    fail 'the settings for new clusters were changed'
  ! grep -qsx postgres "$tree"/proc/[0-9]*/comm || fail 'a server was left running'
}

check_build() {
  local build=$1 file
  for file in lib/libmediidx.so lib/libmediidx.so.1 lib/libtavodb.so lib/libtavocore.so \
    lib/libtavosdk.so lib/libtavoindex.so bin/mediidx; do
    [ -e "$build/$file" ] || fail "$file is not there"
  done
}

check_nothing_installed() {
  ! grep -q 'dev: installing' "$here/last.log" || fail 'the second call installed something'
}

# The sample library holds files that cannot be indexed, all of them in one folder.
check_sample() {
  grep -q '/damaged/' "$here/last.log" || fail 'the damaged files were not named'
  ! grep 'not indexed:' "$here/last.log" | grep -qv '/damaged/' || fail 'a good file was not indexed'
}

# The second time nothing is read again, and the damaged files are left alone.
check_unchanged() {
  grep -q '^added 0, changed 0, moved 0, removed 0' "$here/last.log" || fail 'something was read again'
  grep -q '^  left alone  ' "$here/last.log" || fail 'the damaged files were forgotten'
}

# front_door TREE FOLDER RUNNER…: the verbs, through a runner that takes a shell command.
front_door() {
  local tree=$1 folder=$2
  shift 2
  if [ -n "$command" ]; then
    timed "$command" "$@" "$command"
    return
  fi
  timed 'build' "$@" './dev build'
  check_build "$tree$folder/build"
  timed 'run' "$@" './dev run'
  check_sample
  check_system "$tree"
  timed 'run again' "$@" './dev run'
  check_unchanged
  check_nothing_installed
  check_system "$tree"
  timed 'test' "$@" './dev test'
  check_system "$tree"
}

root_shell() {
  inside "$here/root" /bin/bash -c "cd /root/mediidx && $1"
}

as_root() {
  say 'a fresh machine, as root'
  make_tree "$here/root"
  clone_into "$here/root" /root/mediidx
  front_door "$here/root" /root/mediidx root_shell
}

readonly user_folder='/home/tester/my projects/mediidx'

user_shell() {
  inside "$here/user" /bin/su - tester -s /bin/bash -c "cd '$user_folder' && $1"
}

as_user() {
  local tree=$here/user
  say 'a fresh machine, as a user'
  make_tree "$tree"
  inside "$tree" apt-get -qq update
  inside "$tree" env DEBIAN_FRONTEND=noninteractive \
    apt-get -qq install --no-install-recommends sudo >/dev/null 2>&1
  inside "$tree" useradd --create-home --shell /bin/bash tester
  echo 'tester ALL=(ALL) NOPASSWD: ALL' >"$tree/etc/sudoers.d/tester"
  mkdir -p -- "$tree$(dirname -- "$user_folder")"
  clone_into "$tree" "$user_folder"
  inside "$tree" chown -R tester: /home/tester
  front_door "$tree" "$user_folder" user_shell
  [ -z "$command" ] || return 0
  rm -- "$tree/etc/sudoers.d/tester"
  timed 'run, without any right to install' user_shell './dev run'
  check_nothing_installed
  check_system "$tree"
}

case $as in
  root) as_root ;;
  user) as_user ;;
  all)
    as_root
    as_user
    ;;
  *) fail "root, user or all, not '$as'" ;;
esac
say 'all good'
