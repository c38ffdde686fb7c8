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
readonly release=bookworm
readonly here=$top/build-fresh
readonly base=$here/base.tar
readonly archives=$here/archives
readonly as=${1:-all}
readonly command=${2:-}

say() {
  printf 'fresh: %s\n' "$*"
}

fail() {
  printf 'fresh: FAILED: %s\n' "$*" >&2
  exit 1
}

# The host's package sources of the release, one "URI suite component" a line.
host_sources() {
  # shellcheck disable=SC2016 # apt fills these in
  apt-get indextargets --format '$(CODENAME) $(REPO_URI) $(RELEASE) $(COMPONENT)' \
    'Created-By: Packages' | sed -n "s/^${release}[a-z-]* //p" | sort -u
}

# The minimal system, made once.
make_base() {
  local mirror tree=$here/base
  [ ! -e "$base" ] || return 0
  mirror=$(host_sources | awk -v suite="$release" '$2 == suite && $3 == "main" {print $1; exit}')
  [ -n "$mirror" ] || fail "the host has no package source of $release"
  say 'making the minimal system (once)'
  rm -rf -- "$tree"
  debootstrap --variant=minbase "$release" "$tree" "$mirror" >"$here/debootstrap.log" 2>&1 || {
    tail -n 20 "$here/debootstrap.log" >&2
    fail 'debootstrap'
  }
  tar -C "$tree" -cf "$base.new" .
  mv -- "$base.new" "$base"
  rm -rf -- "$tree"
}

# Device nodes in a file system of their own: nothing of the host's is reachable.
mount_devices() {
  local tree=$1 node
  mount -t tmpfs -o mode=755 none "$tree/dev"
  for node in 'null 1 3' 'zero 1 5' 'full 1 7' 'random 1 8' 'urandom 1 9' 'tty 5 0'; do
    # shellcheck disable=SC2086 # name, major and minor are three words
    set -- $node
    mknod -m 666 "$tree/dev/$1" c "$2" "$3"
  done
  ln -s /proc/self/fd "$tree/dev/fd"
  ln -s /proc/self/fd/0 "$tree/dev/stdin"
  ln -s /proc/self/fd/1 "$tree/dev/stdout"
  ln -s /proc/self/fd/2 "$tree/dev/stderr"
  mkdir "$tree/dev/shm" "$tree/dev/pts"
  mount -t tmpfs -o mode=1777 none "$tree/dev/shm"
  mount -t devpts -o newinstance,ptmxmode=666 none "$tree/dev/pts"
  ln -s pts/ptmx "$tree/dev/ptmx"
}

# make_tree TREE: the minimal system unpacked, with the host's network names, package sources and
# way of fetching, and packages that were fetched before.
make_tree() {
  local tree=$1
  [ ! -e "$tree" ] || rm -rf --one-file-system -- "$tree"
  mkdir -p -- "$tree" "$archives/partial"
  tar -C "$tree" -xf "$base"
  cp -L -- /etc/resolv.conf /etc/hosts "$tree/etc/"
  host_sources | sed 's/^/deb /' >"$tree/etc/apt/sources.list"
  apt-config dump | grep -E '^Acquire::(Check-|http|https|ftp)' \
    >"$tree/etc/apt/apt.conf.d/90host" || true
  mount -t proc none "$tree/proc"
  mount_devices "$tree"
  mount --bind "$archives" "$tree/var/cache/apt/archives"
}

inside() {
  local tree=$1
  shift
  chroot "$tree" /usr/bin/env -i PATH=/usr/local/sbin:/usr/local/bin:/usr/sbin:/usr/bin:/sbin:/bin \
    HOME=/root LANG=C.UTF-8 "$@" </dev/null
}

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

mkdir -p -- "$here"
make_base
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
