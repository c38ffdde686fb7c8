#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# fuzz.sh BUILD_FOLDER [SECONDS [NAME…]]: the fuzzers, or those named, for so long each (30 seconds
# unless told); then the lines of their parsers that they did not reach.
set -euo pipefail

scripts=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")" && pwd)
readonly scripts build=$1 seconds=${2:-30}
shift $(($# < 2 ? $# : 2))
if [ $# -eq 0 ]; then
  mapfile -t names < <(cut -d : -f 1 -- "$build/fuzzers.txt")
  set -- "${names[@]}"
fi

status=0
printf '%s\n' "$@" |
  xargs -P "${MEDIIDX_FUZZ_JOBS:-$(nproc)}" -n 1 "$scripts/fuzz_one.sh" "$build" "$seconds" || status=1
for name in "$@"; do
  [ ! -s "$build/unreached/$name" ] ||
    printf '%s does not reach %s\n' "$name" "$(paste -sd ' ' -- "$build/unreached/$name")"
done
exit "$status"
