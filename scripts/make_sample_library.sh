#!/usr/bin/env bash
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
#
# make_sample_library.sh FOLDER: makes the sample library, about 50 small media files, in FOLDER.
# tests/fixtures/README.md says what is in it. A FOLDER that this script made before is replaced;
# any other folder that is not empty is left alone. Needs ffmpeg, flac, vorbis-tools, opus-tools
# and exiv2.
set -euo pipefail
export LC_ALL=C.UTF-8

fail() {
  printf 'make_sample_library: %s\n' "$*" >&2
  exit 1
}

[ $# -eq 1 ] || fail 'usage: make_sample_library.sh FOLDER'
for program in ffmpeg flac metaflac oggenc opusenc exiv2; do
  command -v "$program" >/dev/null || fail "$program is not installed"
done

# Says that a folder is ours to replace; no media file, so nothing indexes it.
readonly marker=.sample-library
readonly dated=202106121030.00
# The same bytes from every run.
readonly exact=(-flags +bitexact -fflags +bitexact)
target=$1
if [ -e "$target" ] && [ ! -e "$target/$marker" ] && [ -n "$(ls -A -- "$target")" ]; then
  fail "$target is there and is no sample library"
fi
mkdir -p -- "$(dirname -- "$target")"
target=$(cd -- "$(dirname -- "$target")" && pwd)/$(basename -- "$target")
out=$(mktemp -d -- "$target.XXXXXX")
work=$(mktemp -d)
trap 'rm -rf -- "$out" "$work"' EXIT
chmod 755 -- "$out"

quiet_ffmpeg() {
  ffmpeg -nostdin -v error -y "$@"
}

# -- Raw material: one sound and one picture for each format ------------------------------------

# tones SECONDS FREQUENCY FILE: a sine tone as WAV.
tones() {
  quiet_ffmpeg -f lavfi -i "sine=frequency=$2:sample_rate=22050:duration=$1" \
    "${exact[@]}" -c:a pcm_s16le "$3"
}

make_sounds() {
  tones 2 440 "$work/a.wav"
  tones 1 523 "$work/b.wav"
  tones 3 392 "$work/image.wav"
  quiet_ffmpeg -i "$work/a.wav" -i "$work/b.wav" \
    -map 0 "${exact[@]}" -c:a libmp3lame -b:a 64k -write_xing 0 -id3v2_version 0 "$work/a.mp3" \
    -map 1 "${exact[@]}" -c:a libmp3lame -b:a 64k -write_xing 0 -id3v2_version 0 "$work/b.mp3" \
    -map 0 "${exact[@]}" -c:a aac -b:a 48k "$work/aac.m4a" \
    -map 1 "${exact[@]}" -c:a alac "$work/alac.m4a"
  flac --silent --no-padding --output-name="$work/a.flac" "$work/a.wav"
  flac --silent --no-padding --output-name="$work/image.flac" "$work/image.wav"
}

make_pictures() {
  quiet_ffmpeg -f lavfi -i testsrc=size=64x64:rate=1 -f lavfi -i color=c=teal:size=64x64:rate=1 \
    -map 0 -frames:v 1 "${exact[@]}" -q:v 5 "$work/photo.jpg" \
    -map 1 -frames:v 1 "${exact[@]}" -q:v 5 "$work/cover.jpg" \
    -map 0 -frames:v 1 "${exact[@]}" "$work/photo.png"
}

make_films() {
  quiet_ffmpeg -f lavfi -i testsrc=size=64x64:rate=10:duration=1 -i "$work/b.wav" \
    "${exact[@]}" -c:v libx264 -preset ultrafast -pix_fmt yuv420p -c:a aac -b:a 48k \
    "$work/film.mp4"
}

# -- Tagging -------------------------------------------------------------------------------------

# place FILE: the path of FILE in the library, its folders made.
place() {
  mkdir -p -- "$out/$(dirname -- "$1")"
  printf '%s' "$out/$1"
}

# ffmpeg_tagged SOURCE FILE TAG=VALUE…: a copy of the streams of SOURCE with these tags alone.
ffmpeg_tagged() {
  local source=$1 file tag arguments=()
  file=$(place "$2")
  shift 2
  for tag in "$@"; do arguments+=(-metadata "$tag"); done
  quiet_ffmpeg -i "$source" -map 0 -map_metadata -1 "${exact[@]}" -c copy "${arguments[@]}" \
    "file:$file"
}

# ffmpeg_covered SOURCE FILE TAG=VALUE…: the same with the cover embedded.
ffmpeg_covered() {
  local source=$1 file tag arguments=()
  file=$(place "$2")
  shift 2
  for tag in "$@"; do arguments+=(-metadata "$tag"); done
  quiet_ffmpeg -i "$source" -i "$work/cover.jpg" -map 0:a -map 1:v -map_metadata -1 \
    "${exact[@]}" -c copy -disposition:v:0 attached_pic -metadata:s:v comment='Cover (front)' \
    "${arguments[@]}" "file:$file"
}

# flac_tagged SOURCE FILE NAME=VALUE…: a FLAC with a cover; a name may be given more than once.
flac_tagged() {
  local source=$1 file tag arguments=()
  file=$(place "$2")
  shift 2
  for tag in "$@"; do arguments+=("--set-tag=$tag"); done
  cp -- "$source" "$file"
  metaflac --no-utf8-convert "${arguments[@]}" --import-picture-from="$work/cover.jpg" "$file"
}

# vorbis_tagged FILE NAME=VALUE…: an Ogg Vorbis; a name may be given more than once.
vorbis_tagged() {
  local file tag arguments=()
  file=$(place "$1")
  shift
  for tag in "$@"; do arguments+=(-c "$tag"); done
  oggenc --quiet --quality 1 --serial 1 --utf8 "${arguments[@]}" -o "$file" "$work/a.wav"
}

# opus_tagged FILE NAME=VALUE…: an Opus with a cover; a name may be given more than once.
opus_tagged() {
  local file tag arguments=()
  file=$(place "$1")
  shift
  for tag in "$@"; do arguments+=(--comment "$tag"); done
  opusenc --quiet --bitrate 24 --serial 1 "${arguments[@]}" --picture "3||||$work/cover.jpg" \
    "$work/a.wav" "$file"
}

byte() {
  printf '%b' "\\x$(printf '%02x' "$1")"
}

# id3_size BYTES: a size as ID3v2.4 writes it, seven bits a byte.
id3_size() {
  local shift
  for shift in 21 14 7 0; do byte $((($1 >> shift) & 127)); done
}

# id3_frame NAME VALUE…: a text frame in UTF-8 with one value or more.
id3_frame() {
  local name=$1 body=$work/frame
  shift
  { byte 3 && printf '%s\0' "$@"; } >"$body"
  printf '%s' "$name"
  id3_size "$(wc -c <"$body")"
  printf '\0\0'
  cat "$body"
}

# mp3_with_frames FILE: the MP3 behind a tag of the frames on standard input.
mp3_with_frames() {
  local file frames=$work/frames
  file=$(place "$1")
  cat >"$frames"
  {
    printf 'ID3\4\0\0'
    id3_size "$(wc -c <"$frames")"
    cat "$frames" "$work/a.mp3"
  } >"$file"
}

# photo FILE "EXIF COMMAND"…: a JPEG with these EXIF fields.
photo() {
  local file field arguments=()
  file=$(place "$1")
  shift
  for field in "$@"; do arguments+=(-M "set $field"); done
  cp -- "$work/photo.jpg" "$file"
  exiv2 "${arguments[@]}" "$file"
}

plain() {
  local file
  file=$(place "$2")
  cp -- "$1" "$file"
}

text() {
  local file
  file=$(place "$1")
  cat >"$file"
}

# -- The library ---------------------------------------------------------------------------------

# A whole album as it should be: album artist, two genres a track, replay gain, covers, two discs.
tagged_album() {
  local folder='music/Harbour Lights/Low Tide' number=0 title
  for title in 'Slack Water' 'The Neap & the Spring' 'A Long Ebb'; do
    number=$((number + 1))
    flac_tagged "$work/a.flac" "$folder/0$number - $title.flac" "TITLE=$title" \
      'ARTIST=Harbour Lights' 'ALBUMARTIST=Harbour Lights' 'ALBUM=Low Tide' 'DATE=2019' \
      'GENRE=Folk' 'GENRE=Sea Songs' "TRACKNUMBER=$number" "DISCNUMBER=$((number / 3 + 1))" \
      'COMPOSER=Ada Brandt' 'COMMENT=recorded at the quay' \
      "REPLAYGAIN_TRACK_GAIN=-$number.50 dB" 'REPLAYGAIN_TRACK_PEAK=0.912000' \
      'REPLAYGAIN_ALBUM_GAIN=-2.25 dB' 'REPLAYGAIN_ALBUM_PEAK=0.950000'
  done
  plain "$work/cover.jpg" "$folder/cover.jpg"
}

# Several artists and no album artist, so that one has to be found.
many_artists() {
  local number=0 artist
  for artist in 'Ada Brandt' 'Bo Lindqvist' 'The Ferrymen'; do
    number=$((number + 1))
    ffmpeg_covered "$work/b.mp3" "music/Quay Sessions/0$number - $artist.mp3" \
      "title=Session $number" "artist=$artist" 'album=Quay Sessions' "track=$number/3" \
      'date=2020' 'genre=Live' 'REPLAYGAIN_TRACK_GAIN=-4.20 dB' 'REPLAYGAIN_TRACK_PEAK=0.88' \
      'REPLAYGAIN_ALBUM_GAIN=-3.90 dB' 'REPLAYGAIN_ALBUM_PEAK=0.97'
  done
}

# Several values in one field: MP3 (ID3v2.4), Ogg Vorbis and Opus, the last with its own gains.
many_values() {
  {
    id3_frame TIT2 'Two Rivers' && id3_frame TPE1 'Ada Brandt' 'Bo Lindqvist'
    id3_frame TALB 'Confluence' && id3_frame TPE2 'The Ferrymen'
    id3_frame TCON 'Jazz' 'Folk' 'Field Recording' && id3_frame TRCK '1'
    id3_frame TDRC '2018-05-04' && id3_frame TCOM 'Ada Brandt' 'Mina Okafor'
  } | mp3_with_frames 'music/Confluence/01 Two Rivers.mp3'
  vorbis_tagged 'music/Confluence/02 Weir.ogg' 'TITLE=Weir' 'ARTIST=Ada Brandt' \
    'ARTIST=Mina Okafor' 'ALBUM=Confluence' 'ALBUMARTIST=The Ferrymen' 'GENRE=Jazz' 'GENRE=Folk' \
    'TRACKNUMBER=2' 'DATE=2018' 'REPLAYGAIN_TRACK_GAIN=+1.30 dB' 'REPLAYGAIN_TRACK_PEAK=0.5' \
    'REPLAYGAIN_ALBUM_GAIN=-0.70 dB' 'REPLAYGAIN_ALBUM_PEAK=0.9'
  opus_tagged 'music/Confluence/03 Lock.opus' 'TITLE=Lock' 'ARTIST=Bo Lindqvist' \
    'ALBUM=Confluence' 'ALBUMARTIST=The Ferrymen' 'GENRE=Jazz' 'GENRE=Ambient' 'TRACKNUMBER=3' \
    'DATE=2018' 'R128_TRACK_GAIN=-1280' 'R128_ALBUM_GAIN=-640'
}

# M4A with AAC and with ALAC.
apple_album() {
  ffmpeg_covered "$work/aac.m4a" 'music/Mina Okafor/Tide Tables/01 High Water.m4a' \
    'title=High Water' 'artist=Mina Okafor' 'album_artist=Mina Okafor' 'album=Tide Tables' \
    'genre=Electronic;Ambient' 'track=1/2' 'disc=1/1' 'date=2022' 'composer=Mina Okafor'
  ffmpeg_tagged "$work/alac.m4a" 'music/Mina Okafor/Tide Tables/02 Low Water.m4a' \
    'title=Low Water' 'artist=Mina Okafor' 'album_artist=Mina Okafor' 'album=Tide Tables' \
    'genre=Electronic' 'track=2/2' 'disc=1/1' 'date=2022'
}

# No tags at all, and little: what the file name and the folders say has to do.
untagged() {
  plain "$work/a.mp3" 'music/Untagged/tape side A.mp3'
  plain "$work/b.wav" 'music/Untagged/tape side B.wav'
  vorbis_tagged 'music/Untagged/tape side C.ogg'
  ffmpeg_tagged "$work/b.wav" 'music/Untagged/tape side D.wav' 'title=Side D' 'artist=Bo Lindqvist'
}

# Cyrillic, CJK, accents in two forms, right to left, and a letter beyond the first plane.
other_scripts() {
  vorbis_tagged 'music/Мельница/Вода и камень/01 Запруда.ogg' 'TITLE=Запруда' 'ARTIST=Мельница' \
    'ALBUM=Вода и камень' 'GENRE=Фолк' 'TRACKNUMBER=1' 'DATE=2017'
  flac_tagged "$work/a.flac" 'music/夜の港/灯台/01 波止場.flac' 'TITLE=波止場' 'ARTIST=夜の港' \
    'ALBUM=灯台' 'ALBUMARTIST=夜の港' 'GENRE=ロック' 'TRACKNUMBER=1' 'DATE=2021'
  ffmpeg_tagged "$work/b.mp3" 'music/夜の港/灯台/02 霧笛.mp3' 'title=霧笛' 'artist=夜の港' \
    'album=灯台' 'album_artist=夜の港' 'genre=ロック' 'track=2' 'date=2021'
  ffmpeg_tagged "$work/b.mp3" $'music/Other Scripts/caf\u00e9.mp3' $'title=Caf\u00e9' 'artist=Zoë Ångström'
  ffmpeg_tagged "$work/b.mp3" $'music/Other Scripts/cafe\u0301.mp3' $'title=Cafe\u0301' 'artist=Zoë Ångström'
  ffmpeg_tagged "$work/b.mp3" 'music/Other Scripts/מזח 🌊.mp3' 'title=מזח 🌊' 'artist=נמל'
}

# Names that an SQL text, a pattern or a format could trip over, and one with a line break.
odd_names() {
  local folder='music/Odd Names'
  ffmpeg_tagged "$work/b.mp3" "$folder/it's \"quoted\".mp3" \
    "title=It's \"Quoted\"" "artist=O'Neill" 'album=Odd Names'
  ffmpeg_tagged "$work/b.mp3" "$folder/100% sure %s %d.mp3" \
    'title=100% Sure %s %n' 'artist=Per%cent' 'album=Odd Names'
  ffmpeg_tagged "$work/b.mp3" "$folder/under_score.mp3" \
    'title=Under_score' 'artist=Under_Score' 'album=Odd Names'
  ffmpeg_tagged "$work/b.mp3" "$folder/underXscore.mp3" \
    'title=UnderXscore' 'artist=UnderXScore' 'album=Odd Names'
  ffmpeg_tagged "$work/b.mp3" "$folder/back\\slash\\.mp3" \
    'title=Back\Slash' "artist=C:\\Artist\\" 'album=Odd Names'
  ffmpeg_tagged "$work/b.mp3" "$folder/'; DROP TABLE track; --.mp3" \
    "title='; DROP TABLE track; --" "artist=x' OR '1'='1" 'album=Odd Names'
  ffmpeg_tagged "$work/b.mp3" "$folder"$'/line\nbreak.mp3' $'title=Line\nBreak' 'artist=O'"'"'Neill' \
    'album=Odd Names'
  ffmpeg_tagged "$work/b.mp3" "$folder/@TAVO:VAR.mp3" 'title=@TAVO:VAR' 'artist=@TAVO:INT' \
    'album=Odd Names'
  plain "$work/a.mp3" "$folder/100%/50_50/back\\slash/deep.mp3"
}

# ferry_cue WAV: a cue sheet in Cyrillic with CRLF line ends.
ferry_cue() {
  printf '%s\r\n' 'PERFORMER "Мельница"' 'TITLE "Ночной паром"' "FILE \"$1\" WAVE" \
    '  TRACK 01 AUDIO' '    TITLE "Причал"' '    INDEX 01 00:00:00' \
    '  TRACK 02 AUDIO' '    TITLE "Маяк"' '    INDEX 01 00:00:37'
}

# Cue sheets: beside a FLAC image, beside a WAV in UTF-16, and one whose sound is not there.
cue_sheets() {
  flac_tagged "$work/image.flac" 'music/Night Ferry/Night Ferry.flac' 'TITLE=Night Ferry' \
    'ARTIST=The Ferrymen' 'ALBUM=Night Ferry' 'DATE=2016' 'GENRE=Folk'
  text 'music/Night Ferry/Night Ferry.cue' <<'CUE'
REM GENRE Folk
REM DATE 2016
PERFORMER "The Ferrymen"
TITLE "Night Ferry"
FILE "Night Ferry.flac" WAVE
  TRACK 01 AUDIO
    TITLE "Boarding"
    PERFORMER "The Ferrymen"
    INDEX 01 00:00:00
  TRACK 02 AUDIO
    TITLE "Open Sea"
    PERFORMER "Ada Brandt"
    INDEX 00 00:00:70
    INDEX 01 00:01:00
  TRACK 03 AUDIO
    TITLE "Landfall"
    PERFORMER "The Ferrymen"
    INDEX 01 00:02:37
CUE
  plain "$work/b.wav" 'music/Паром/parom.wav'
  {
    printf '\377\376'
    ferry_cue parom.wav | iconv -f UTF-8 -t UTF-16LE
  } | text 'music/Паром/parom.cue'
  text 'music/Night Ferry/lost.cue' <<'CUE'
PERFORMER "The Ferrymen"
TITLE "Lost Tapes"
FILE "lost.flac" WAVE
  TRACK 01 AUDIO
    TITLE "Gone"
    INDEX 01 00:00:00
CUE
}

photos() {
  photo 'photos/2021 Harbour/IMG_0001.jpg' 'Exif.Image.Make Lumen' 'Exif.Image.Model L-1' \
    'Exif.Image.Orientation 6' 'Exif.Photo.DateTimeOriginal 2021:06:12 10:30:00' \
    'Exif.Image.ImageDescription Low tide at noon' 'Exif.Photo.FNumber 28/10' \
    'Exif.Photo.ISOSpeedRatings 200' 'Exif.Photo.ExposureTime 1/125' \
    'Exif.GPSInfo.GPSLatitudeRef N' 'Exif.GPSInfo.GPSLatitude 53/1 32/1 36/1' \
    'Exif.GPSInfo.GPSLongitudeRef E' 'Exif.GPSInfo.GPSLongitude 9/1 58/1 12/1'
  photo 'photos/2021 Harbour/IMG_0002.jpg' 'Exif.Image.Make Lumen' 'Exif.Image.Model L-1' \
    'Exif.Photo.DateTimeOriginal 2021:06:12 10:31:07' 'Exif.Image.Orientation 1'
  photo 'photos/2021 Harbour/Impossible date.jpg' \
    'Exif.Photo.DateTimeOriginal 2021:02:31 25:61:00'
  plain "$work/photo.jpg" 'photos/2021 Harbour/scan without exif.JPG'
  plain "$work/photo.png" "photos/drawings/O'Hara's 50% sketch_1.png"
  plain "$work/photo.png" 'photos/旅行/東京.png'
}

videos() {
  ffmpeg_tagged "$work/film.mp4" 'videos/harbour.mp4' 'title=A Day at the Harbour' \
    'artist=Mina Okafor' 'date=2021' 'creation_time=2021-06-12T10:30:00Z'
  ffmpeg_tagged "$work/film.mp4" 'videos/Ferry Tales/S01E01 - Cast Off.mkv' 'title=Cast Off'
  ffmpeg_tagged "$work/film.mp4" 'videos/Ferry Tales/S01E02 - 海へ.mkv'
}

playlists() {
  text 'playlists/evening.m3u8' <<'M3U'
#EXTM3U
#EXTINF:2,Harbour Lights - Slack Water
../music/Harbour Lights/Low Tide/01 - Slack Water.flac
#EXTINF:2,夜の港 - 波止場
../music/夜の港/灯台/01 波止場.flac
#EXTINF:-1,Quay Radio
http://radio.example/quay.mp3
M3U
  printf '%s\r\n' '#EXTM3U' '..\music\Quay Sessions\01 - Ada Brandt.mp3' \
    '..\music\Quay Sessions\02 - Bo Lindqvist.mp3' '..\music\not there.mp3' |
    text 'playlists/windows.m3u'
  text 'playlists/rivers.pls' <<'PLS'
[playlist]
File1=../music/Confluence/01 Two Rivers.mp3
Title1=Two Rivers
Length1=2
File2=../music/Confluence/02 Weir.ogg
NumberOfEntries=2
Version=2
PLS
  text "playlists/Ferry's.wpl" <<'WPL'
<?wpl version="1.0"?>
<smil>
  <head><title>Ferry&apos;s</title></head>
  <body>
    <seq>
      <media src="..\music\Harbour Lights\Low Tide\02 - The Neap &amp; the Spring.flac"/>
      <media src="..\music\Odd Names\it&apos;s &quot;quoted&quot;.mp3"/>
    </seq>
  </body>
</smil>
WPL
  text 'playlists/empty.m3u' </dev/null
}

# What cannot be read, and what is no medium at all. The cue sheet is in windows-1251, which nobody
# can know without the setting for it.
damaged() {
  ferry_cue '../music/Паром/parom.wav' | iconv -f UTF-8 -t CP1251 | text 'damaged/windows-1251.cue'
  text 'damaged/empty.mp3' </dev/null
  text 'damaged/empty.jpg' </dev/null
  head -c 700 "$work/a.mp3" | text 'damaged/truncated.mp3'
  head -c 2000 "$work/film.mp4" | text 'damaged/truncated.mp4'
  text 'damaged/not a picture.jpg' <<<'These bytes are no picture.'
  text 'damaged/notes.txt' <<<'No medium: left out of the index.'
}

# Two lines of work, for the two cores that most machines have at least.
make_sounds
make_pictures
make_films &
tagged_album
many_artists
wait "$!"
apple_album
photos &
other=$!
many_values
untagged
other_scripts
wait "$other"
odd_names &
other=$!
cue_sheets
videos
playlists
damaged
wait "$other"

find "$out" -exec touch -h -t "$dated" {} +
touch -- "$out/$marker"
rm -rf -- "$target"
mv -T -- "$out" "$target"
