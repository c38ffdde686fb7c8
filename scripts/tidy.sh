#!/bin/sh
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# tidy.sh BUILD_FOLDER FILE: clang-tidy on one file; its output in one piece, and only when it has
# something to say, so that several may run side by side.
if ! output=$(clang-tidy-19 --quiet --warnings-as-errors='*' -p "$1" "$2" 2>&1); then
  printf '%s\n' "$output"
  exit 1
fi
