#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# abi.sh compare|record LIBRARY RECORD: compares the interface of a built library with that of the
# last release, which the record holds; additions are fine, anything else is not. Or writes the
# record anew, for a release.
set -euo pipefail

top=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd)
readonly top what=$1 library=$2 record=$3
readonly left_out=(--suppressions "$top/packaging/abi/left_out.suppr")

if [ "$what" = record ]; then
  # What the exported headers declare, and nothing of how it is made.
  abidw "${left_out[@]}" --headers-dir "$top/include" --drop-private-types \
    --exported-interfaces-only --no-corpus-path --no-comp-dir-path --no-show-locs \
    --out-file "$record" "$library"
  exit
fi
# The same options here would hide changes of records: abidiff 2.2 takes those for private.
status=0
abidiff "${left_out[@]}" --no-added-syms "$record" "$library" || status=$?
# The bits of the status: 1 an error, 2 called wrongly, 4 a change, 8 a change that breaks programs.
if [ "$status" -ne 0 ]; then
  echo "abi: the interface is not that of the last release (status $status)" >&2
  exit 1
fi
