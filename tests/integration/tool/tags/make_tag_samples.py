#!/usr/bin/python3
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
"""make_tag_samples.py FOLDER: one small file of each format, tagged in full, and the odd ones.

Encoded by stock tools and tagged by them or by mutagen, which is no kin of the readers under test.
Monkey's Audio, DSF, CR2, ORF and a HEIC with camera settings have no free writer: here stands a
minimal one for each.
"""

import os
import pathlib
import shutil
import struct
import subprocess
import sys
import tempfile

import mutagen.aiff
import mutagen.apev2
import mutagen.asf
import mutagen.dsf
import mutagen.flac
import mutagen.id3
import mutagen.mp4
import mutagen.oggflac
import mutagen.oggopus
import mutagen.oggspeex
import mutagen.oggvorbis
import mutagen.trueaudio
import mutagen.wave
from mutagen.id3 import APIC, COMM, RVA2, TALB, TCOM, TCON, TDRC, TIT2, TPE1, TPE2, TPOS, TRCK, TXXX

TITLE = "Slack Water"
ALBUM = "Low Tide"
ARTISTS = ["Ada Brandt", "Bo Lindqvist"]
ALBUM_ARTIST = "The Ferrymen"
GENRES = ["Folk", "Sea Songs"]
COMPOSERS = ["Mina Okafor", "Jo Reed"]
COMMENT = "recorded at the quay"
DATE = "2004-05"
GAINS = {
    "REPLAYGAIN_TRACK_GAIN": "-3.50 dB",
    "REPLAYGAIN_TRACK_PEAK": "0.912000",
    "REPLAYGAIN_ALBUM_GAIN": "-2.25 dB",
    "REPLAYGAIN_ALBUM_PEAK": "0.950000",
}
CYRILLIC = "Запруда"

work = pathlib.Path(tempfile.mkdtemp())


def run(*words):
    subprocess.run([str(word) for word in words], check=True, stdin=subprocess.DEVNULL,
                   stdout=subprocess.DEVNULL)


def ffmpeg(*words):
    run("ffmpeg", "-nostdin", "-v", "error", "-y", *words)


# -- Music -----------------------------------------------------------------------------------------


def make_sounds():
    ffmpeg("-f", "lavfi", "-i", "sine=frequency=440:sample_rate=44100:duration=1", "-ac", "2",
           "-c:a", "pcm_s16le", "-fflags", "+bitexact", work / "a.wav")
    ffmpeg("-f", "lavfi", "-i", "color=c=teal:size=16x16:rate=1", "-frames:v", "1",
           work / "cover.jpg")
    plain = ["-map_metadata", "-1", "-fflags", "+bitexact", "-strict", "experimental"]
    outputs = []
    for name, codec in (("a.mp3", "libmp3lame"), ("a.m4a", "aac"), ("alac.m4a", "alac"),
                        ("a.wma", "wmav2"), ("a.tta", "tta"), ("a.aiff", "pcm_s16be"),
                        ("a.mka", "flac"), ("a.aac", "aac"), ("a.mp2", "mp2"), ("a.ac3", "ac3"),
                        ("a.dts", "dca")):
        outputs += [*plain, "-c:a", codec, work / name]
    ffmpeg("-i", work / "a.wav", *outputs)
    ffmpeg("-i", work / "a.wav", *plain, "-ar", "16000", "-ac", "1", "-c:a", "libspeex",
           work / "a.spx")
    run("flac", "--silent", "-o", work / "a.flac", work / "a.wav")
    run("flac", "--silent", "--ogg", "-o", work / "a.oga", work / "a.wav")
    run("oggenc", "--quiet", "-o", work / "a.ogg", work / "a.wav")
    run("opusenc", "--quiet", work / "a.wav", work / "a.opus")
    run("wavpack", "-q", "-y", work / "a.wav", "-o", work / "a.wv")
    run("mpcenc", "--silent", "--overwrite", work / "a.wav", work / "a.mpc")
    make_monkey(work / "a.ape")
    make_dsf(work / "a.dsf")


def make_monkey(path):
    """A Monkey's Audio 3.99 of one second, its frames left out."""
    frames = 44100
    header = struct.pack("<HHIIIHHI", 2000, 0, 73728 * 4, frames, 1, 16, 2, 44100)
    descriptor = struct.pack("<4sHHIIIIIII", b"MAC ", 3990, 0, 52, len(header), 4, 44, 16000, 0, 0)
    path.write_bytes(descriptor + bytes(16) + header + bytes(4 + 44 + 16000))


def make_dsf(path):
    """A DSF of one second of silence, 64 times the rate of a CD."""
    rate, channels, block = 2822400, 2, 4096
    samples = rate
    blocks = -(-samples // 8 // block)
    data = b"\x69" * (blocks * block * channels)
    fmt = struct.pack("<4sQIIIIIIQII", b"fmt ", 52, 1, 0, 2, channels, rate, 1, samples, block, 0)
    chunk = struct.pack("<4sQ", b"data", 12 + len(data)) + data
    head = struct.pack("<4sQQQ", b"DSD ", 28, 28 + len(fmt) + len(chunk), 0)
    path.write_bytes(head + fmt + chunk)


def cover():
    return (work / "cover.jpg").read_bytes()


def copy(source, name):
    target = out / name
    target.parent.mkdir(parents=True, exist_ok=True)
    shutil.copy(work / source, target)
    return target


def id3_frames():
    frames = [
        TIT2(3, [TITLE]), TALB(3, [ALBUM]), TPE1(3, ARTISTS), TPE2(3, [ALBUM_ARTIST]),
        TCON(3, GENRES), TCOM(3, COMPOSERS), COMM(3, "eng", "", [COMMENT]),
        COMM(3, "eng", "iTunNORM", ["00000A"]), TDRC(3, [DATE]), TRCK(3, ["3/12"]),
        TPOS(3, ["2/3"]),
    ]
    frames += [TXXX(3, name, [value]) for name, value in GAINS.items()]
    frames += [APIC(3, "image/jpeg", 3, "front", cover()),
               APIC(3, "image/jpeg", 4, "back", cover())]
    return frames


def add_id3(path, file_type, frames, **how):
    file = file_type(path)
    if file.tags is None:
        file.add_tags()
    for frame in frames:
        file.tags.add(frame)
    file.save(**how)


def id3_only(path, frames, **how):
    tags = mutagen.id3.ID3()
    for frame in frames:
        tags.add(frame)
    tags.save(path, **how)


def xiph_fields():
    return {"TITLE": [TITLE], "ALBUM": [ALBUM], "ARTIST": ARTISTS, "ALBUMARTIST": [ALBUM_ARTIST],
            "GENRE": GENRES, "COMPOSER": COMPOSERS, "COMMENT": [COMMENT], "DATE": [DATE],
            "TRACKNUMBER": ["3/12"], "DISCNUMBER": ["2/3"],
            **{name: [value] for name, value in GAINS.items()}}


def picture_block():
    import base64
    picture = mutagen.flac.Picture()
    picture.type, picture.mime, picture.data = 3, "image/jpeg", cover()
    return base64.b64encode(picture.write()).decode()


def add_xiph(path, file_type, fields):
    file = file_type(path)
    for name, values in fields.items():
        file[name] = values
    file.save()


def ape_fields():
    return {"Title": [TITLE], "Album": [ALBUM], "Artist": ARTISTS, "Album Artist": [ALBUM_ARTIST],
            "Genre": GENRES, "Composer": COMPOSERS, "Comment": [COMMENT], "Year": [DATE],
            "Track": ["3/12"], "Disc": ["2/3"]}


def add_ape(path, fields):
    tags = mutagen.apev2.APEv2()
    for name, values in fields.items():
        tags[name] = values
    for name in ("Cover Art (Front)", "Cover Art (Back)"):
        tags[name] = mutagen.apev2.APEValue(b"a.jpg\0" + cover(), mutagen.apev2.BINARY)
    tags.save(path)


def tagged_in_full():
    flac = copy("a.flac", "full.flac")
    run("metaflac", "--no-utf8-convert",
        *[f"--set-tag={name}={value}" for name, values in xiph_fields().items()
          for value in values],
        f"--import-picture-from={work / 'cover.jpg'}",
        f"--import-picture-from=4||||{work / 'cover.jpg'}", flac)
    covers = {"METADATA_BLOCK_PICTURE": [picture_block(), picture_block()]}
    for name, file_type in (("ogg", mutagen.oggvorbis.OggVorbis),
                            ("spx", mutagen.oggspeex.OggSpeex), ("oga", mutagen.oggflac.OggFLAC)):
        add_xiph(copy("a." + name, "full." + name), file_type, {**xiph_fields(), **covers})
    fields = {**xiph_fields(), **covers, "R128_TRACK_GAIN": ["-1280"], "R128_ALBUM_GAIN": ["-640"]}
    for name in GAINS:
        del fields[name]
    add_xiph(copy("a.opus", "full.opus"), mutagen.oggopus.OggOpus, fields)
    for name in ("a.mp3", "a.mp2", "a.tta", "a.aac"):
        id3_only(copy(name, "full" + name[1:]), id3_frames(), v1=0)
    add_id3(copy("a.wav", "full.wav"), mutagen.wave.WAVE, id3_frames())
    add_id3(copy("a.aiff", "full.aiff"), mutagen.aiff.AIFF, id3_frames())
    add_id3(copy("a.dsf", "full.dsf"), mutagen.dsf.DSF, id3_frames())
    add_ape(copy("a.ape", "full.ape"), {**ape_fields(), **{n: [v] for n, v in GAINS.items()}})
    wavpack = copy("a.wv", "full.wv")
    # One value for each name is all that its own program writes.
    run("wvtag", "-q", "-y", *[word for name, values in {**ape_fields(), **{
        n: [v] for n, v in GAINS.items()}}.items() for word in ("-w", f"{name}={values[0]}")],
        "--write-binary-tag", f"Cover Art (Front)=@{work / 'cover.jpg'}", wavpack)
    add_ape(copy("a.mpc", "full.mpc"), ape_fields())
    run("mpcgain", out / "full.mpc")
    tag_m4a(copy("a.m4a", "full.m4a"))
    tag_m4a(copy("alac.m4a", "alac.m4a"))
    tag_wma(copy("a.wma", "full.wma"))
    ffmpeg("-i", work / "a.mka", "-c", "copy", *[
        word for name, value in {
            "title": TITLE, "album": ALBUM, "artist": ARTISTS[0], "album_artist": ALBUM_ARTIST,
            "genre": GENRES[0], "composer": COMPOSERS[0], "comment": COMMENT, "date": DATE,
            "track": "3/12", "disc": "2/3", **GAINS}.items()
        for word in ("-metadata", f"{name}={value}")],
        "-attach", work / "cover.jpg", "-metadata:s:t", "mimetype=image/jpeg",
        "-metadata:s:t", "filename=cover.jpg", out / "full.mka")


def tag_m4a(path):
    tags = mutagen.mp4.MP4(path)
    tags["\xa9nam"], tags["\xa9alb"], tags["\xa9ART"] = [TITLE], [ALBUM], ARTISTS
    tags["aART"], tags["\xa9gen"], tags["\xa9wrt"] = [ALBUM_ARTIST], GENRES, COMPOSERS
    tags["\xa9cmt"], tags["\xa9day"] = [COMMENT], [DATE]
    tags["trkn"], tags["disk"] = [(3, 12)], [(2, 3)]
    tags["covr"] = [mutagen.mp4.MP4Cover(cover()), mutagen.mp4.MP4Cover(cover())]
    for name, value in GAINS.items():
        tags["----:com.apple.iTunes:" + name.lower()] = [value.encode()]
    tags.save()


def tag_wma(path):
    tags = mutagen.asf.ASF(path)
    tags["Title"], tags["WM/AlbumTitle"], tags["Author"] = [TITLE], [ALBUM], ARTISTS
    tags["WM/AlbumArtist"], tags["WM/Genre"] = [ALBUM_ARTIST], GENRES
    tags["WM/Composer"] = COMPOSERS
    tags["Description"], tags["WM/Year"] = [COMMENT], [DATE]
    tags["WM/TrackNumber"] = [mutagen.asf.ASFDWordAttribute(3)]
    tags["WM/PartOfSet"] = ["2/3"]
    picture = struct.pack("<BI", 3, len(cover())) + "image/jpeg\0\0".encode("utf-16-le") + cover()
    tags["WM/Picture"] = [mutagen.asf.ASFByteArrayAttribute(picture)] * 2
    for name, value in GAINS.items():
        tags[name] = [value]
    tags.save()


def info_chunk(fields):
    body = b"INFO"
    for name, value in fields.items():
        value += b"\0"
        body += struct.pack("<4sI", name, len(value)) + value + b"\0" * (len(value) % 2)
    return struct.pack("<4sI", b"LIST", len(body)) + body


def info_wav(name, fields):
    wav = (work / "a.wav").read_bytes() + info_chunk(fields)
    target = out / name
    target.parent.mkdir(parents=True, exist_ok=True)
    target.write_bytes(b"RIFF" + struct.pack("<I", len(wav) - 8) + wav[8:])


def id3v1(title, artist, genre=17, track=7):
    def field(data, width):
        return data[:width].ljust(width, b"\0")
    return (b"TAG" + field(title, 30) + field(artist, 30) + field(b"Album", 30) + b"2004"
            + field(b"a comment", 28) + bytes([0, track, genre]))


def claimed(text, charset):
    """What a program writes that calls any text Latin-1."""
    return text.encode(charset).decode("latin-1")


def old_encodings():
    for name, text, charset in (
            ("cp1251", CYRILLIC, "cp1251"), ("cp932", "波止場", "cp932"), ("cp936", "灯塔", "gbk"),
            ("cp1250", "Łódź", "cp1250"), ("latin1", "Zoë Ångström", "latin-1"),
            ("utf8", "夜の港", "utf-8")):
        raw = claimed(text, charset)
        id3_only(copy("a.mp3", f"encodings/id3v2-{name}.mp3"),
                 [TIT2(0, [raw]), TPE1(0, [raw, raw + " 2"]), TPE2(0, [raw]),
                  COMM(0, "eng", "", [raw])], v1=0)
        with open(copy("a.mp3", f"encodings/id3v1-{name}.mp3"), "ab") as file:
            file.write(id3v1(text.encode(charset), text.encode(charset)))
        info_wav(f"encodings/info-{name}.wav", {b"INAM": text.encode(charset),
                                                b"IART": text.encode(charset)})
        add_id3(copy("a.dsf", f"encodings/dsf-{name}.dsf"), mutagen.dsf.DSF, [TIT2(0, [raw])])


def album_artist_spellings():
    for name in ("TPE2", "ALBUMARTIST", "ALBUM ARTIST", "Album_Artist", "Band"):
        frame = TPE2(3, [name]) if name == "TPE2" else TXXX(3, name, [name])
        id3_only(copy("a.mp3", f"spellings/{name}.mp3"), [frame], v1=0)
    for name in ("ALBUMARTIST", "album artist", "Album_Artist", "BAND"):
        add_xiph(copy("a.flac", f"spellings/{name}.flac"), mutagen.flac.FLAC, {name: [name]})
    for name in ("aART", "ALBUMARTIST", "Album Artist", "Band"):
        tags = mutagen.mp4.MP4(copy("a.m4a", f"spellings/{name}.m4a"))
        if name == "aART":
            tags[name] = [name]
        else:
            tags["----:com.apple.iTunes:" + name] = [name.encode()]
        tags.save()
    for name in ("Album Artist", "AlbumArtist", "ALBUM_ARTIST", "Band"):
        add_ape(copy("a.wv", f"spellings/{name}.wv"), {name: [name]})
    for name in ("WM/AlbumArtist", "AlbumArtist", "ALBUM ARTIST", "Band"):
        tags = mutagen.asf.ASF(copy("a.wma", f"spellings/{name.replace('/', '-')}.wma"))
        tags[name] = [name]
        tags.save()


def odd_ones():
    # ID3v2.3: UTF-16, TYER and TDAT, and a number for the genre.
    frames = [frame for frame in id3_frames() if frame.FrameID not in ("TCON", "TDRC")]
    id3_only(copy("a.mp3", "id3v2.3.mp3"), [*frames, TCON(1, ["(17)"]), TDRC(1, ["2004-05-01"])],
             v1=0, v2_version=3, v23_sep=None)
    # A gap in the first tag is filled from the next.
    both = copy("a.mp3", "id3v2-and-id3v1.mp3")
    id3_only(both, [TIT2(3, ["From ID3v2"])], v1=0)
    with open(both, "ab") as file:
        file.write(id3v1(b"From ID3v1", b"Old Artist"))
    id3_only(copy("a.mp3", "rva2.mp3"),
             [RVA2("track", 1, -4.5, 0.5), RVA2("album", 1, -3.25, 0.75)], v1=0)
    # As MP3Gain leaves files.
    gained = copy("a.mp3", "id3v1-and-ape.mp3")
    tags = mutagen.apev2.APEv2()
    tags["REPLAYGAIN_TRACK_GAIN"], tags["REPLAYGAIN_TRACK_PEAK"] = "-6.01 dB", "0.5"
    tags.save(gained)
    with open(gained, "ab") as file:
        file.write(id3v1(b"From ID3v1", b"Old Artist"))
    info_wav("info.wav", {b"INAM": b"Slack Water", b"IPRD": b"Low Tide", b"IART": b"Ada Brandt",
                          b"IGNR": b"Folk", b"ICMT": b"at the quay", b"ICRD": b"2004-05",
                          b"ITRK": b"3/12", b"IMUS": b"Jo Reed"})
    ffmpeg("-i", work / "a.wav", "-metadata", "title=Slack Water", "-metadata", "track=3",
           "-metadata", "date=2004-05", out / "info-of-ffmpeg.wav")
    shutil.copy(out / "full.opus", out / "output-gain.opus")
    set_output_gain(out / "output-gain.opus", 512)
    copy("a.dsf", "untagged.dsf")
    copy("a.ac3", "untagged.ac3")
    copy("a.dts", "untagged.dts")
    named = ["-metadata", "title=Slack Water", "-metadata", "artist=Ada Brandt"]
    ffmpeg("-i", work / "a.wav", *named, "-metadata", "album=Low Tide", out / "some.au")
    ffmpeg("-i", work / "a.wav", *named, "-metadata", "author=Ada Brandt", "-ar", "8000",
           "-ac", "1", "-c:a", "real_144", out / "some.ra")
    for name, value in (("day", "2004-05-01"), ("month", "2004-05"), ("year", "2004"),
                        ("compact", "20040501"), ("time", "2004-05-01T12:00:00"), ("words", "May")):
        add_xiph(copy("a.flac", f"dates/{name}.flac"), mutagen.flac.FLAC, {"DATE": [value]})
    add_xiph(copy("a.flac", "many.flac"), mutagen.flac.FLAC,
             {"GENRE": [f"Genre {i}" for i in range(2000)],
              "ARTIST": ["Twice", "Twice", " ", "Once"]})


def set_output_gain(path, gain):
    """Sets the gain of an Opus header in 1/256 dB, and the checksum of its page."""
    data = bytearray(path.read_bytes())
    head = data.index(b"OpusHead")
    data[head + 16:head + 18] = struct.pack("<h", gain)
    page_end = head + 19
    data[22:26] = bytes(4)
    crc = 0
    for byte in data[:page_end]:
        crc ^= byte << 24
        for _ in range(8):
            crc = (crc << 1 ^ (0x04C11DB7 if crc & 0x80000000 else 0)) & 0xFFFFFFFF
    data[22:26] = struct.pack("<I", crc)
    path.write_bytes(data)


# -- Photos ----------------------------------------------------------------------------------------

CAMERA = [
    "Exif.Image.Make Ascii Lumen ", "Exif.Image.Model Ascii L-1", "Exif.Image.Orientation Short 6",
    "Exif.Photo.ExposureTime Rational 1/125", "Exif.Photo.FNumber Rational 28/10",
    "Exif.Photo.ISOSpeedRatings Short 200",
    "Exif.Photo.DateTimeOriginal Ascii 2021:06:12 10:30:00",
    "Exif.Photo.OffsetTimeOriginal Ascii +02:00",
    "Xmp.dc.title lang=x-default Low tide",
]


def exiv2(path, fields):
    run("exiv2", *[word for field in fields for word in ("-M", "set " + field)], path)


def photo(name, fields):
    shutil.copy(work / ("p" + pathlib.Path(name).suffix), out / "photos" / name)
    exiv2(out / "photos" / name, fields)


def photos():
    (out / "photos").mkdir()
    for suffix in ("jpg", "png", "tiff", "webp", "gif", "bmp", "avif"):
        ffmpeg("-f", "lavfi", "-i", "testsrc=size=128x64:rate=1", "-frames:v", "1",
               work / f"p.{suffix}")
    for suffix in ("dng", "nef"):
        shutil.copy(work / "p.tiff", work / f"p.{suffix}")
    for suffix in ("jpg", "png", "tiff", "webp"):
        photo(f"full.{suffix}", CAMERA)
    photo("full.dng", [*CAMERA, "Exif.Image.DNGVersion Byte 1 4 0 0"])
    photo("full.nef", CAMERA)
    for suffix in ("gif", "bmp", "avif"):
        shutil.copy(work / f"p.{suffix}", out / "photos" / f"plain.{suffix}")
    run("heif-enc", "-q", "30", work / "p.jpg", "-o", out / "photos" / "plain.heic")
    make_heic(out / "photos" / "full.heic")
    make_raws()
    for orientation in range(1, 9):
        photo(f"orientation-{orientation}.jpg", [f"Exif.Image.Orientation Short {orientation}"])
    for name, value in (("fast", "1/4000"), ("third", "1/3"), ("half", "5/10"), ("long", "25/10"),
                        ("minute", "60/1"), ("raw", "10/1250"), ("none", "0/1")):
        photo(f"exposure-{name}.jpg", [f"Exif.Photo.ExposureTime Rational {value}"])
    photo("powers.jpg", ["Exif.Photo.ShutterSpeedValue SRational 7/1",
                         "Exif.Photo.ApertureValue Rational 3/1"])
    photo("unknown.jpg", ["Exif.Photo.ShutterSpeedValue SRational 0/0",
                          "Exif.Photo.ApertureValue Rational 0/0",
                          "Exif.Photo.FNumber Rational 0/0"])
    photo("whole-aperture.jpg", ["Exif.Photo.FNumber Rational 8/1"])
    photo("xmp.jpg", ["Xmp.exif.DateTimeOriginal 2020-02-29T23:59:58+09:00",
                      "Xmp.tiff.Make Lumen", "Xmp.exif.ExposureTime 1/60", "Xmp.exif.FNumber 4/1"])
    photo("digitized.jpg", ["Exif.Photo.DateTimeDigitized Ascii 2019:01:02 03:04:05"])
    photo("bad-time.jpg", ["Exif.Photo.DateTimeOriginal Ascii 2021:02:30 10:00:00"])
    photo("latin1.jpg", ["Exif.Image.Make Ascii Lumen"])
    path = out / "photos" / "latin1.jpg"
    path.write_bytes(path.read_bytes().replace(b"Lumen\0", b"Lum\xe9n\0"))


def directory(offset, entries, more=b""):
    """A directory of TIFF that stands at this offset: entries of tag, kind, count and bytes."""
    place = offset + 2 + 12 * len(entries) + 4
    head, values = struct.pack("<H", len(entries)), b""
    for tag, kind, count, data in sorted(entries):
        if len(data) > 4:
            head += struct.pack("<HHII", tag, kind, count, place + len(values))
            values += data + b"\0" * (len(data) % 2)
        else:
            head += struct.pack("<HHI", tag, kind, count) + data.ljust(4, b"\0")
    return head + bytes(4) + values + more


def raw_directories(offset):
    """The camera and its settings, and a picture of 128 by 64 of which nothing is there."""
    def short(value):
        return struct.pack("<H", value)

    def pair(first, second):
        return struct.pack("<II", first, second)

    settings = [(0x829A, 5, 1, pair(1, 125)), (0x829D, 5, 1, pair(28, 10)),
                (0x8827, 3, 1, short(200)), (0x9003, 2, 20, b"2021:06:12 10:30:00\0"),
                (0xA002, 3, 1, short(128)), (0xA003, 3, 1, short(64))]
    camera = [(0x0100, 3, 1, short(128)), (0x0101, 3, 1, short(64)), (0x010F, 2, 6, b"Lumen\0"),
              (0x0110, 2, 4, b"L-1\0"), (0x0112, 3, 1, short(6))]
    length = len(directory(offset, [*camera, (0x8769, 4, 1, bytes(4))]))
    place = struct.pack("<I", offset + length)
    return directory(offset, [*camera, (0x8769, 4, 1, place)],
                     directory(offset + length, settings))


def make_raws():
    photos_folder = out / "photos"
    cr2 = b"II*\0" + struct.pack("<I", 16) + b"CR\2\0" + bytes(4)
    (photos_folder / "full.cr2").write_bytes(cr2 + raw_directories(16))
    (photos_folder / "full.orf").write_bytes(b"IIRO" + struct.pack("<I", 8) + raw_directories(8))


def box(kind, *parts, version=None):
    body = b"".join(parts)
    if version is not None:
        body = struct.pack(">I", version << 24) + body
    return struct.pack(">I4s", 8 + len(body), kind) + body


def make_heic(path):
    """A HEIC of a picture's size and its camera settings; of the picture itself there is none."""
    jpeg = (out / "photos" / "full.jpg").read_bytes()
    begin = jpeg.index(b"Exif\0\0") + 6
    end = begin - 6 + struct.unpack(">H", jpeg[begin - 8:begin - 6])[0] - 2
    exif = struct.pack(">I", 0) + jpeg[begin:end]

    def meta(offset):
        items = box(b"iinf", struct.pack(">H", 2),
                    box(b"infe", struct.pack(">HH4s", 1, 0, b"hvc1"), b"\0", version=2),
                    box(b"infe", struct.pack(">HH4s", 2, 0, b"Exif"), b"\0", version=2), version=0)
        places = box(b"iloc", b"\x44\x00", struct.pack(">H", 1),
                     struct.pack(">HHHII", 2, 0, 1, offset, len(exif)), version=0)
        size = box(b"ispe", struct.pack(">II", 128, 64), version=0)
        properties = box(b"iprp", box(b"ipco", size),
                         box(b"ipma", struct.pack(">IHBB", 1, 1, 1, 1), version=0))
        return box(b"meta", box(b"hdlr", struct.pack(">I4s", 0, b"pict"), bytes(13), version=0),
                   box(b"pitm", struct.pack(">H", 1), version=0), items, places, properties,
                   version=0)

    kind = box(b"ftyp", b"heic", struct.pack(">I", 0), b"mif1heic")
    path.write_bytes(kind + meta(len(kind) + len(meta(0)) + 8) + box(b"mdat", exif))


# -- Videos ----------------------------------------------------------------------------------------


def film(name, *codecs):
    ffmpeg("-f", "lavfi", "-i", "testsrc=size=64x48:rate=25:duration=1",
           "-f", "lavfi", "-i", "sine=frequency=440:sample_rate=44100:duration=1",
           "-f", "lavfi", "-i", "sine=frequency=880:sample_rate=48000:duration=1",
           "-map", "0", "-metadata", "title=Cast Off", "-metadata", "album=Ferry Tales",
           "-pix_fmt", "yuv420p", *codecs, out / "videos" / name)


def videos():
    (out / "videos").mkdir()
    first = ["-map", "1", "-ac:a:0", "1", "-b:a:0", "64k"]
    h264 = ["-c:v", "libx264", "-preset", "veryfast", "-profile:v", "main", "-level:v", "3.1"]
    # The second sound is the one that players prefer, by its channels and its mark.
    film("two-sounds.mp4", *first, "-map", "2", *h264, "-c:a:0", "aac", "-c:a:1", "ac3",
         "-ac:a:1", "2", "-disposition:a:0", "0", "-disposition:a:1", "default")
    film("film.mov", *first, *h264, "-c:a", "aac")
    film("film.ts", *first, *h264, "-c:a", "mp2")
    film("film.flv", *first, *h264, "-c:a", "libmp3lame")
    film("film.mkv", *first, "-c:v", "libx265", "-x265-params", "log-level=none", "-preset",
         "ultrafast", "-r", "24000/1001", "-c:a", "ac3")
    film("film.webm", *first, "-c:v", "libvpx-vp9", "-cpu-used", "8", "-deadline", "realtime",
         "-c:a", "libopus")
    film("film.avi", *first, "-c:v", "mpeg4", "-c:a", "libmp3lame")
    film("film.wmv", *first, "-c:v", "wmv2", "-c:a", "wmav2")
    film("film.mpg", *first, "-c:v", "mpeg2video", "-c:a", "mp2")
    film("silent.mp4", *h264)
    avi = (out / "videos" / "film.avi").read_bytes()
    title = "Причалы".encode("cp1251") + b" "
    (out / "videos" / "cp1251.avi").write_bytes(avi.replace(b"Cast Off", title))


out = pathlib.Path(sys.argv[1])
shutil.rmtree(out, ignore_errors=True)
out.mkdir(parents=True)
os.environ["LC_ALL"] = "C.UTF-8"
try:
    make_sounds()
    tagged_in_full()
    old_encodings()
    album_artist_spellings()
    odd_ones()
    photos()
    videos()
    (out / ".made").touch()
finally:
    shutil.rmtree(work)
