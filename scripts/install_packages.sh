#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# install_packages.sh PACKAGE…: installs Debian packages, as root, without questions. Installing the
# PostgreSQL server leaves no cluster behind that was not there before, and no changed setting.
# Installing the media servers that the benchmark compares with leaves no service running or enabled.
set -euo pipefail
export DEBIAN_FRONTEND=noninteractive LC_ALL=C.UTF-8

readonly cluster_conf=/etc/postgresql-common/createcluster.conf
readonly kept_conf=$cluster_conf.before-mediidx
# What Debian's packages ask whether they may start a service.
readonly policy=/usr/sbin/policy-rc.d
readonly kept_policy=$policy.before-mediidx
readonly policy_mark='# Only while mediidx installs packages.'
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

restore_policy() {
  if grep -qsxF "$policy_mark" "$policy"; then rm -f -- "$policy"; fi
  if [ -e "$kept_policy" ]; then mv -f -- "$kept_policy" "$policy"; fi
}

packages_here() {
  dpkg-query --show --showformat='${db:Status-Status} ${Package}\n' | sed -n 's/^installed //p' | sort
}

# disable_services PACKAGE…: none of theirs starts at boot, at a log-in or on a connection.
disable_services() {
  local package file
  for package in "$@"; do
    # Debian's helper takes orders from a package's scripts only.
    local helper=(env DPKG_MAINTSCRIPT_PACKAGE="$package" deb-systemd-helper)
    while read -r file; do
      case $file in
        */systemd/system/*.service | */systemd/system/*.socket)
          quietly "${helper[@]}" disable "${file##*/}"
          ;;
        */systemd/user/*.service | */systemd/user/*.socket)
          quietly "${helper[@]}" --user disable "${file##*/}"
          ;;
        /etc/init.d/*) quietly update-rc.d "${file##*/}" disable ;;
      esac
    done < <(dpkg-query --listfiles "$package")
  done
}

# Nothing is started for as long as this takes; what came with a service is told not to start later.
install_without_services() {
  local before added
  before=$(packages_here)
  restore_policy # Left over, if the last time was cut short.
  trap 'restore_policy; rm -f -- "$log"' EXIT
  if [ -e "$policy" ]; then mv -- "$policy" "$kept_policy"; fi
  printf '#!/bin/sh\n%s\nexit 101\n' "$policy_mark" >"$policy"
  chmod 755 "$policy"
  install "$@"
  mapfile -t added < <(comm -13 <(printf '%s\n' "$before") <(packages_here))
  if [ "${#added[@]}" -gt 0 ]; then disable_services "${added[@]}"; fi
  restore_policy
}

servers=()
peers=()
others=()
for package in "$@"; do
  case $package in
    postgresql-[0-9]*) servers+=("$package") ;;
    mpd | minidlna | pgbouncer) peers+=("$package") ;;
    *) others+=("$package") ;;
  esac
done
started=$SECONDS
quietly apt-get update -o DPkg::Lock::Timeout=300
if [ "${#servers[@]}" -gt 0 ]; then install_server "${servers[@]}"; fi
if [ "${#peers[@]}" -gt 0 ]; then install_without_services "${peers[@]}"; fi
if [ "${#others[@]}" -gt 0 ]; then install "${others[@]}"; fi
printf 'install_packages: done in %s s\n' "$((SECONDS - started))"
