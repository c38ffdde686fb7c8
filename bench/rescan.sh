#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# rescan.sh COMMAND FILES...: for each number of songs, twelve to an album, what a first index and a
# scan of the unchanged tree cost: statements that the server got, seconds, and the peak memory of
# the command in kilobytes. On a private server in a folder of its own, gone afterwards.
set -euo pipefail

command=$(realpath -- "$1")
shift
work=$(mktemp -d)
trap 'rm -rf -- "$work"' EXIT
chmod 755 "$work"

# songs N FOLDER: small MP3 files with tags of their own, the same in every run.
songs() {
  python3 - "$@" <<'PYTHON'
import os, sys
count, folder = int(sys.argv[1]), sys.argv[2]
# MPEG 1 layer III, 32 kbit/s, 44.1 kHz, mono: silence.
frame = b"\xff\xfb\x10\xc0" + bytes(100)

def text_frame(name, text):
    body = b"\x03" + text.encode()
    return name + len(body).to_bytes(4, "big") + b"\0\0" + body

for i in range(count):
    album = i // 12
    place = f"{folder}/artist {album // 5}/album {album}"
    os.makedirs(place, exist_ok=True)
    tag = (text_frame(b"TIT2", f"Song {i}") + text_frame(b"TALB", f"Album {album}") +
           text_frame(b"TPE1", f"Artist {album // 5}") + text_frame(b"TRCK", f"{i % 12 + 1}/12") +
           text_frame(b"TCON", f"Genre {album % 9}"))
    head = b"ID3\x03\0\0" + bytes([len(tag) >> 21 & 127, len(tag) >> 14 & 127, len(tag) >> 7 & 127,
                                   len(tag) & 127])
    with open(f"{place}/{i % 12 + 1:02} song.mp3", "wb") as file:
        file.write(head + tag + frame * 40)
PYTHON
}

statements() {
  echo "SELECT xact_commit + xact_rollback FROM pg_stat_database WHERE datname = 'mediaserver'" |
    "$command" --data-dir "$work/data" db shell | sed -n 's/^ *\([0-9][0-9]*\)$/\1/p'
}

# measured WORDS...: seconds and kilobytes of one run.
measured() {
  /usr/bin/time -f '%e s, %M kB' "$command" --data-dir "$work/data" "$@" --full-speed \
    2>&1 >/dev/null | tail -n 1
}

for count in "$@"; do
  rm -rf -- "$work/data" "$work/music"
  songs "$count" "$work/music"
  printf '%s files: first index %s' "$count" "$(measured index "$work/music")"
  measured scan >/dev/null # The server's statistics settle.
  before=$(statements)
  rescan=$(measured scan)
  printf '; unchanged %s, %s transactions\n' "$rescan" "$(($(statements) - before))"
done
