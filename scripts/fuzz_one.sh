#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# fuzz_one.sh BUILD_FOLDER SECONDS NAME: one fuzzer for so long, and a line on what came of it. Fails
# on a find, which is kept, and when it reaches less than nine in ten lines of its parser. The lines
# that it does not reach are left in BUILD_FOLDER/unreached/NAME.
set -euo pipefail

top=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd)
readonly top build=$1 seconds=$2 name=$3 least=90
readonly program=$build/bin/fuzz_$name corpus=$build/corpus/$name finds=$build/finds/$name
readonly words=$top/tests/fuzz/dictionaries/$name.dict unreached=$build/unreached/$name
work=$(mktemp -d)
readonly work
trap 'rm -rf -- "$work"' EXIT

IFS=: read -r _ parser functions seeds < <(grep -- "^$name:" "$build/fuzzers.txt")
IFS=';' read -ra parser <<<"$parser"
IFS=';' read -ra functions <<<"$functions"
IFS=';' read -ra seeds <<<"$seeds"
mkdir -p -- "$corpus" "$finds" "$build/unreached"

# What a fuzzer writes for its parser to read never reaches a disk.
[ ! -w /dev/shm ] || export TMPDIR=/dev/shm
export LLVM_PROFILE_FILE=$work/%m.profraw
export ASAN_OPTIONS=${ASAN_OPTIONS:-detect_leaks=1:detect_stack_use_after_return=1}
export UBSAN_OPTIONS=${UBSAN_OPTIONS:-print_stacktrace=1}
options=(-max_total_time="$seconds" -timeout=10 -rss_limit_mb=2048 -print_final_stats=1
  -artifact_prefix="$finds/")
[ ! -e "$words" ] || options+=(-dict="$words")
if ! "$program" "${options[@]}" "$corpus" "${seeds[@]}" >"$work/log" 2>&1; then
  cat -- "$work/log" >"$finds/log"
  grep -a -m 3 -E 'ERROR|runtime error|SUMMARY' "$work/log" || tail -n 3 -- "$work/log"
  printf '%s: a find in %s; its log is beside it\n' "$name" "$finds"
  exit 1
fi

objects=()
for library in "$build"/lib/libtavo*.so; do objects+=(-object "$library"); done
llvm-profdata-19 merge -sparse -o "$work/profile" "$work"/*.profraw
llvm-cov-19 show -use-color=0 -show-instantiations=0 -instr-profile="$work/profile" \
  "${functions[@]/#/-name-regex=}" "$program" "${objects[@]}" -sources "${parser[@]/#/$top/}" \
  >"$work/lines" 2>"$work/complaints" || cat -- "$work/complaints"

# A line that names the file or the function, and then "   12|  3.4k|text" for each of its lines.
awk -F '|' -v top="$top/" -v unreached="$unreached" -v name="$name" -v least="$least" \
  -v log_file="$work/log" -v place="${parser[0]}" '
  function after(line, mark) { return substr(line, index(line, mark) + length(mark)) }
  # Lines without code, such as those of a comment, end no run of lines.
  function end_run() {
    if (first) printf "%s:%s\n", place, first == last ? first : first "-" last >unreached
    first = 0
  }
  BEGIN {
    printf "" >unreached
    while ((getline line < log_file) > 0) {
      if (line ~ /number_of_executed_units/) runs = after(line, "units:")
      if (line ~ /average_exec_per_sec/) speed = after(line, "per_sec:")
      if (line ~ / corp: /) corpus = after(line, " corp: ")
    }
  }
  NF == 1 && /:$/ {
    end_run()
    if (index($0, top) == 1) place = substr($0, length(top) + 1, length($0) - length(top) - 1)
  }
  NF > 2 && $1 ~ /^ *[0-9]+$/ && $2 ~ /[0-9]/ {
    lines++
    if ($2 + 0 > 0) {
      end_run()
      reached++
    } else {
      if (!first) first = $1 + 0
      last = $1 + 0
    }
  }
  END {
    end_run()
    share = lines ? 100 * reached / lines : 0
    printf "%-18s %9d runs %7d/s  corpus %4d  %5.1f %% of %d lines\n", name, runs, speed, corpus,
           share, lines
    exit share < least
  }' "$work/lines"
