# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# Minimal Debian 12 systems in folders below build-fresh/, for bash to source: make_tree makes one,
# "inside" runs a program in it. `top` is the checkout, `arch` another architecture than the host's.
# Needs root, a mount and a process namespace of its own, and a Debian 12 as the host, whose package
# sources are used.
# shellcheck shell=bash

readonly release=bookworm
readonly here=${top:?}/build-fresh
readonly arch=${arch:-$(dpkg --print-architecture)}
readonly base=$here/base-$arch.tar
readonly archives=$here/archives

say() {
  printf '%s: %s\n' "${0##*/}" "$*"
}

fail() {
  printf '%s: FAILED: %s\n' "${0##*/}" "$*" >&2
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
  local mirror tree=$here/base-$arch
  mkdir -p -- "$here"
  [ ! -e "$base" ] || return 0
  mirror=$(host_sources | awk -v suite="$release" '$2 == suite && $3 == "main" {print $1; exit}')
  [ -n "$mirror" ] || fail "the host has no package source of $release"
  say "making the minimal system for $arch (once)"
  rm -rf -- "$tree"
  debootstrap --variant=minbase --arch="$arch" "$release" "$tree" "$mirror" >"$here/debootstrap.log" 2>&1 || {
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
  make_base
  [ ! -e "$tree" ] || rm -rf --one-file-system -- "$tree"
  mkdir -p -- "$tree" "$archives/partial"
  tar -C "$tree" -xf "$base"
  cp -L -- /etc/resolv.conf /etc/hosts "$tree/etc/"
  host_sources | sed 's/^/deb /' >"$tree/etc/apt/sources.list"
  apt-config dump | grep -E '^Acquire::(Check-|http|https|ftp)' \
    >"$tree/etc/apt/apt.conf.d/90host" || true
  mount_tree "$tree"
}

# mount_tree TREE: what a system needs besides files, for as long as the script runs.
mount_tree() {
  local tree=$1
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
