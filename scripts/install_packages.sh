#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# install_packages.sh PACKAGE…: installs Debian packages, as root, without questions. Installing the
# PostgreSQL server leaves no cluster behind that was not there before, and no changed setting.
set -euo pipefail
export DEBIAN_FRONTEND=noninteractive LC_ALL=C.UTF-8

readonly cluster_conf=/etc/postgresql-common/createcluster.conf
readonly kept_conf=$cluster_conf.before-mediidx
log=$(mktemp)
trap 'rm -f -- "$log"' EXIT

# quietly PROGRAM…: its output is shown only when it fails.
quietly() {
  if ! "$@" </dev/null >"$log" 2>&1; then
    tail -n 30 -- "$log" >&2
    printf 'install_packages: this failed: %s\n' "$*" >&2
    exit 1
  fi
}

install() {
  quietly apt-get install --yes --no-install-recommends -o DPkg::Lock::Timeout=300 \
    -o Dpkg::Options::=--force-confdef -o Dpkg::Options::=--force-confold -- "$@"
}

restore_cluster_conf() {
  if [ -e "$kept_conf" ]; then mv -f -- "$kept_conf" "$cluster_conf"; fi
}

# The server's package makes and starts a cluster "main" when it is installed for the first time,
# unless the settings of the common package say no: they do so for as long as this takes.
install_server() {
  install postgresql-common
  restore_cluster_conf # Left over, if the last time was cut short.
  cp --preserve=all -- "$cluster_conf" "$kept_conf"
  trap 'restore_cluster_conf; rm -f -- "$log"' EXIT
  sed -i '/^[[:space:]]*create_main_cluster\>/d' "$cluster_conf"
  echo 'create_main_cluster = false' >>"$cluster_conf"
  install "$@"
  restore_cluster_conf
}

servers=()
others=()
for package in "$@"; do
  if [[ $package =~ ^postgresql-[0-9]+$ ]]; then servers+=("$package"); else others+=("$package"); fi
done
started=$SECONDS
quietly apt-get update -o DPkg::Lock::Timeout=300
if [ "${#servers[@]}" -gt 0 ]; then install_server "${servers[@]}"; fi
if [ "${#others[@]}" -gt 0 ]; then install "${others[@]}"; fi
printf 'install_packages: done in %s s\n' "$((SECONDS - started))"
