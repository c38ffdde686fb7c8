#!/bin/sh
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# check_includes.sh TREE: includes point only downwards, api over {database, playlist, indexfolder}
# over support over the platform's public headers, and only platform/db, tests and benchmarks know
# libpq.
set -eu

cd -- "$1"
if [ ! -d src ]; then
  echo "check_includes: no folder src in $1" >&2
  exit 1
fi

# includes FOLDER…: "file:header" for each include of the C and C++ files below.
includes() {
  for folder; do
    [ -d "$folder" ] || continue
    find "$folder/" -type f \( -name '*.h' -o -name '*.c' -o -name '*.cpp' \) \
      -exec grep -HE '^[[:space:]]*#[[:space:]]*include' {} + |
      sed -E 's/^([^:]*):[^"<]*["<]([^">]*)[">].*/\1:\2/; s,//,/,g'
  done
}

# Headers of the platform that are no one else's.
own_of_platform=$([ ! -d platform ] || find platform/ -name '*.h' ! -name 'tavo*.h' |
  sed 's,.*/,,' | tr '\n' ' ')

bad=$(
  includes src | awk -F: -v own="$own_of_platform" '
    BEGIN {
      rank["support"] = 1
      rank["database"] = rank["playlist"] = rank["indexfolder"] = 2
      rank["api"] = 3
      count = split(own, names, " ")
      for (i = 1; i <= count; ++i) forbidden[names[i]]
      split("platform tool tests schema bench . ..", names, " ")
      for (i in names) forbidden[names[i]]
    }
    {
      split($1, file, "/"); from = file[2]
      split($2, header, "/"); to = header[1]
      upward = to in rank && to != from && rank[to] >= rank[from]
      if (!(from in rank) || upward || to in forbidden) print $1 ": " $2
    }'
  includes platform | awk -F: '
    $2 ~ /^(api|database|playlist|indexfolder|support|src|tool|tests|\.\.)\// { print $1 ": " $2 }'
  includes src include platform tool | awk -F: '
    $2 ~ /(^|\/)libpq/ && $1 !~ /^platform\/db\// { print $1 ": " $2 }'
)
if [ -n "$bad" ]; then
  printf '%s\n' "$bad" | sort -u | sed 's/: / may not include /'
  exit 1
fi
