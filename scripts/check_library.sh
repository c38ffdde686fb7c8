#!/bin/sh
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# check_library.sh LIBRARY LIST: the library exports exactly the symbols of the list, keeps them
# open to definitions that stand before them, and reaches the platform across its border.
set -eu
LC_ALL=C
export LC_ALL

library=$1
list=$2
bad=0

reject() {
  echo "check_library: $*" >&2
  bad=1
}

exported=$(nm -D --defined-only --with-symbol-versions -- "$library" |
  awk '$2 != "A" { print $3 }' | sort)
[ -n "$exported" ] || reject 'exports nothing'
if ! printf '%s\n' "$exported" | diff -u -- "$list" - >&2; then
  reject 'exported symbols differ from the list'
fi
if printf '%s\n' "$exported" | grep -E '^_Z(N|NK|T[VISTC]N?|GVN?)?(S[tabsiod]|K?4Json)'; then
  reject 'exports symbols of another library'
fi

closed=$(readelf --dyn-syms -W -- "$library" |
  awk '$7 != "UND" && $5 ~ /^(GLOBAL|WEAK)$/ && $6 != "DEFAULT" { print $8 }')
[ -z "$closed" ] || reject "symbols that nothing can stand before: $closed"

dynamic=$(readelf -dW -- "$library")
has() {
  printf '%s\n' "$dynamic" | grep -qE -- "$1"
}
has '\(SONAME\).*\[libmediidx\.so\.1\]' || reject 'the SONAME is not libmediidx.so.1'
for name in tavodb tavocore tavosdk tavoindex; do
  has "\\(NEEDED\\).*\\[lib$name\\.so" || reject "does not need lib$name"
done
! has '\(SYMBOLIC\)|\(FLAGS\).*SYMBOLIC' || reject 'is linked -Bsymbolic'
! has '\(TEXTREL\)|\(FLAGS\).*TEXTREL' || reject 'has text relocations'

exit "$bad"
