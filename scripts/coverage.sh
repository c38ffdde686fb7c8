#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# coverage.sh BUILD_FOLDER: what the tests that ran in a coverage build reached of src/: lines and
# branches of each file, and what they did not reach. Branches are those of the source: each condition
# both ways, not what the compiler adds for exceptions. What runs when the library is compiled only
# (support/statement.h) counts as not reached.
set -euo pipefail

top=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd)
readonly top build=$1

# Functions go by their names: what test programs with objects of the library reached counts too.
llvm-profdata-19 merge -sparse -o "$build/coverage.profile" "$build"/profiles/*.profraw
llvm-cov-19 export -format=lcov -instr-profile="$build/coverage.profile" "$build/lib/libmediidx.so" \
  -sources "$top/src" 2>/dev/null |
  awk -F '[:,]' -v top="$top/" '
    function share(some, all) { return all ? 100 * some / all : 100 }
    function row(name, lines, hit_lines, branches, hit_branches) {
      printf "%6.1f %% of %5d lines  %6.1f %% of %5d branches  %s\n", share(hit_lines, lines),
             lines, share(hit_branches, branches), branches, name
    }
    function end_run() {
      if (first) missed = missed " " (first == last ? first : first "-" last)
      first = 0
    }
    /^SF:/ {
      file = substr($2, length(top) + 1)
      lines = hit_lines = branches = hit_branches = first = 0
      missed = one_way = line_before = ""
    }
    /^DA:/ {
      lines++
      if ($3 > 0) {
        hit_lines++
        end_run()
      } else {
        if (!first) first = $2
        last = $2
      }
    }
    /^BRDA:/ {
      branches++
      if ($5 + 0 > 0) hit_branches++
      else if ($2 != line_before) one_way = one_way " " (line_before = $2)
    }
    /^end_of_record/ {
      end_run()
      row(file, lines, hit_lines, branches, hit_branches)
      if (missed) not_reached = not_reached file ": lines" missed "\n"
      if (one_way) not_reached = not_reached file ": a branch of lines" one_way "\n"
      all_lines += lines; all_hit_lines += hit_lines
      all_branches += branches; all_hit_branches += hit_branches
    }
    END {
      row("src", all_lines, all_hit_lines, all_branches, all_hit_branches)
      printf "\nnot reached:\n%s", not_reached
    }'
