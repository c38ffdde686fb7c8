#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# make_pictures.sh MEDIIDX LIBRARY: makes the pictures of the README in docs/images, of a scan of the
# folder LIBRARY by the program MEDIIDX and of its report. In them the library lies in /srv/media.
set -euo pipefail

[ $# -eq 2 ] || {
  echo 'usage: make_pictures.sh MEDIIDX LIBRARY' >&2
  exit 2
}
program=$(realpath -- "$1")
library=$(realpath -- "$2")
images=$(cd -- "$(dirname -- "${BASH_SOURCE[0]}")/.." && pwd)/docs/images
work=$(mktemp -d)
trap 'rm -rf -- "$work"' EXIT
chmod 755 -- "$work" # The database server may run as another user.
mkdir -p -- "$images" "$work/bin"
export PATH=$work/bin:$PATH XDG_DATA_HOME=$work
readonly shown=/srv/media
data=$work/mediidx

# Short words in the picture: where the data lies is nobody's concern.
cat >"$work/bin/mediidx" <<SCRIPT
#!/bin/sh
exec '$program' --data-dir '$data' "\$@"
SCRIPT
chmod 755 -- "$work/bin/mediidx"

"$(dirname -- "${BASH_SOURCE[0]}")/terminal_picture.py" "$images/scan.svg" \
  "$shown=$library" "/var/lib/mediidx=$data" -- \
  mediidx index --full-speed "$library" -- mediidx list albums

mediidx report "$work/report.html"
grep -q '<figure ' "$work/report.html" || {
  echo 'make_pictures: the index is empty' >&2
  exit 1
}
sed -i "s|$library|$shown|g" "$work/report.html"
chromium --headless=new --no-sandbox --disable-gpu --disable-dev-shm-usage --hide-scrollbars \
  --disable-background-networking --host-resolver-rules='MAP * ~NOTFOUND' \
  --user-data-dir="$work/chromium" --force-color-profile=srgb --window-size=1180,1520 \
  --screenshot="$work/report.png" "file://$work/report.html" 2>"$work/log" || {
  cat -- "$work/log" >&2
  exit 1
}
# A page of few colours needs no more of them.
ffmpeg -nostdin -v error -y -i "$work/report.png" \
  -vf 'split[a][b];[a]palettegen=max_colors=192[p];[b][p]paletteuse=dither=none' \
  "$images/report.png"
