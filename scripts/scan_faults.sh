#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# scan_faults.sh [SEEDS [FAULT…]]: puts one fault of one line at a time into a copy of the scanner and
# lives through random libraries, SEEDS of them at most (20 unless told), until a test fails. A fault
# that no seed finds says that the tests are not worth what they cost.
set -euo pipefail

top=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd)
readonly top seeds=${1:-20}
[ $# -eq 0 ] || shift
work=$(mktemp -d)
readonly work wanted=" $* " copy=$work/mediidx
trap 'rm -rf -- "$work"' EXIT

say() {
  printf 'scan_faults: %s\n' "$*"
}

# quietly PROGRAM…: its output is shown only when it fails.
quietly() {
  if ! "$@" >"$work/log" 2>&1; then
    tail -n 30 -- "$work/log" >&2
    say "this failed: $*" >&2
    exit 1
  fi
}

build() {
  quietly cmake --build "$copy/build-test" --parallel "$(nproc)" --target test_tool_scan_states
}

# finds SEED: true when that library does not end as it should.
finds() {
  MEDIIDX_SCAN_SEED=$1 "$copy/build-test/tests/integration/tool/scan/test_tool_scan_states" \
    --gtest_brief=1 --gtest_filter='*AFreshLibrary*' >"$work/log" 2>&1 || return 0
  return 1
}

found=0
missed=()
# try NAME FILE SED: the expression has to change one line of the file.
try() {
  local name=$1 file=$copy/tool/$2 seed
  [ "$wanted" = '  ' ] || [[ $wanted == *" $name "* ]] || return 0
  cp -p -- "$file" "$work/sound"
  sed -i -- "$3" "$file"
  if [ "$(diff -- "$work/sound" "$file" | grep -c '^[<>]')" -ne 2 ]; then
    say "$name: the fault does not fit $2 any more" >&2
    exit 1
  fi
  build
  for ((seed = 1; seed <= seeds; ++seed)); do
    if finds "$seed"; then break; fi
  done
  if [ "$seed" -le "$seeds" ]; then
    say "$name: found by seed $seed"
    found=$((found + 1))
  else
    missed+=("$name")
    say "$name: not found by $seeds seeds"
  fi
  cp -p -- "$work/sound" "$file"
  touch -- "$file"
}

mkdir -p -- "$copy"
git -C "$top" -c safe.directory="$top" ls-files -z | (cd -- "$top" && tar --null -T - -cf -) |
  tar -xf - -C "$copy"
(cd -- "$copy" && quietly cmake --preset test)
say 'building the sound scanner'
build
if finds 1; then
  tail -n 60 -- "$work/log" >&2
  say 'a test fails without a fault' >&2
  exit 1
fi

try newer_than scan/compare.cpp \
  's/std::abs(before.modified - now.modified) <=/now.modified - before.modified <=/'
try gone_files_stay scan/compare.cpp 's/return remove_file(file, What::kGone);/return;/'
try gone_folders_stay scan/compare.cpp 's/add_lost_folder(path, What::kGoneFolder);/;/'
try empty_is_there scan/scanner_looks.cpp 's/is_empty_folder(root.path)/root.path.empty()/'
try damaged_keeps_rows scan/scanner.cpp \
  's/^  return MediaInfoDBDelete(table_of(change.kind), change.path.c_str()) == 0;/  return true;/'
try stays_offline scan/scanner_looks.cpp 's/^      bring_online(path);$//'
try folders_stay_old scan/compare.cpp \
  's/\*known_.modified != now.modified/now.modified < 0/'
try sheets_keep_old_audio scan/scan_state.cpp \
  's/^const std::string kChangedAudio = ".*";$/const std::string kChangedAudio = "(SELECT path, folder FROM scan.change WHERE false)";/'
try albums_keep_history scan/scanner.cpp 's/if (!state_.has_unsettled()) return;/return;/'
try lost_rows_stay_lost scan/scan_state.cpp 's/^  mark_lost(folder);$//'

[ "${#missed[@]}" -eq 0 ] || { say "not found: ${missed[*]}" >&2 && exit 1; }
say "all $found faults are found"
