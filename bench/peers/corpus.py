# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
"""The files that are indexed. The same size gives the same files, which are made once."""

import os
import shutil
import subprocess

# What this file and media_corpus.cpp make; another number makes every corpus anew.
VERSION = "1"


def ffmpeg(*words):
    exact = ["-flags", "+bitexact", "-fflags", "+bitexact", "-map_metadata", "-1"]
    subprocess.run(["ffmpeg", "-nostdin", "-v", "error", "-y", *words[:-1], *exact, words[-1]],
                   check=True)


def make_bases(folder):
    """One file of each format, a second long."""
    sound = ["-f", "lavfi", "-i", "sine=frequency=440:sample_rate=44100:duration=1"]
    film = ["-f", "lavfi", "-i", "testsrc=size=64x64:rate=10:duration=1"]
    ffmpeg(*sound, "-c:a", "libmp3lame", "-b:a", "64k", folder / "base.mp3")
    ffmpeg(*sound, "-c:a", "flac", folder / "base.flac")
    ffmpeg(*sound, "-c:a", "aac", "-b:a", "48k", folder / "base.m4a")
    ffmpeg(*sound, "-c:a", "libvorbis", "-q:a", "1", folder / "base.ogg")
    ffmpeg(*film, "-frames:v", "1", folder / "base.jpg")
    ffmpeg(*film, *sound, "-c:v", "libx264", "-preset", "ultrafast", "-pix_fmt", "yuv420p",
           "-c:a", "aac", folder / "base.mp4")
    subprocess.run(["exiv2", "-M", "set Exif.Photo.DateTimeOriginal 2020:01:01 12:00:00",
                    folder / "base.jpg"], check=True)


class Corpus:
    """`audio_files` songs with their playlists and cue sheets in `music`; `photos` and `videos`."""

    def __init__(self, program, cache, audio_files):
        self.program = program
        self.audio_files = audio_files
        self.folder = cache / f"corpus-{audio_files}"
        self.music = self.folder / "music"
        self.photos = self.folder / "photos"
        self.videos = self.folder / "videos"
        self.changes = 0
        made = self.folder / "made"
        if not made.exists() or made.read_text() != VERSION:
            shutil.rmtree(self.folder, ignore_errors=True)
            bases = self.folder / "bases"
            bases.mkdir(parents=True)
            make_bases(bases)
            subprocess.run([program, "make", bases, self.folder, str(audio_files)], check=True)
            made.write_text(VERSION)
        self.songs = sorted(path for path in self.music.rglob("*")
                            if path.suffix in (".mp3", ".flac", ".m4a", ".ogg"))
        if len(self.songs) != audio_files:
            raise RuntimeError(f"{self.folder} is not whole; remove it")
        # The one that is changed for a while.
        self.song = next(path for path in self.songs[audio_files // 2:] if path.suffix == ".mp3")
        self.original = self.song.read_bytes()
        self.dated = self.song.stat().st_mtime

    def bytes(self):
        return sum(song.stat().st_size for song in self.songs)

    def warm(self):
        """From here on the files come from memory."""
        for folder in (self.music, self.photos, self.videos):
            for path in folder.rglob("*"):
                if path.is_file():
                    path.read_bytes()

    def change_one(self):
        """One tagged song gets a title that no other has, which is returned."""
        self.changes += 1
        title = f"Changed {self.changes}"
        before = self.song.stat().st_mtime
        subprocess.run([self.program, "retitle", self.song, title], check=True)
        # Some keep whole seconds.
        os.utime(self.song, (before + 60, before + 60))
        return title

    def restore(self):
        self.song.write_bytes(self.original)
        os.utime(self.song, (self.dated, self.dated))
