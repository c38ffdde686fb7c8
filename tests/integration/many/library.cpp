// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "library.h"

#include <cmath>

namespace mediidx::test {

RandomLibrary::RandomLibrary(const ScratchRoot& root, unsigned seed) : root_(root), random_(seed) {
  for (const char* name :
       {"volume1/media/a.flac", "volume1/media/it's %.mp3", "volume1/media/sub/b_.mp3",
        "volume1/media/sub/\\N \"{}\".ogg", "volume1/media/é\t.flac", "homes/ann/music/a.flac",
        "homes/ann/music/x/b.mp3", "volume1/other/outside.mp3", "volume1/media/folder.mp3",
        "volume1/media/remote.mp3"}) {
    songs_.push_back(root.at(name));
  }
  for (const char* name :
       {"volume1/media/a.cue", "volume1/media/sub/it's_%.CUE", "homes/ann/music/a.cue",
        "volume1/media/none.cue", "volume1/media/empty.cue", "volume1/media/text.cue"}) {
    sheets_.push_back(root.at(name));
  }
  for (const char* name : {"volume1/media/two.m3u", "volume1/media/missing.pls",
                           "homes/ann/music/own.m3u8", "volume1/media/no extension"}) {
    playlists_.push_back(root.at(name));
  }
  root.make_folder("volume1/media/folder.mp3");
}

std::string RandomLibrary::text() {
  static const std::vector<std::string> kTexts{
      "",          "\\N",   "it's",       "back\\slash\\", "a\tb\nc\rd",
      "{\"x\",y}", "NULL",  " blanks ",   "The Ünder",     "100%_",
      "epoch",     "$1",    "a day",      "\\.",           std::string(254, 'x'),
      "日本語",    "'; --", "An \"x\" \\"};
  return one_of(kTexts);
}

void RandomLibrary::fill(Info& info) {
  set(info.title, text());
  set(info.album, one_of({"Hits", "Hits", "hits", "", " Hits", "It's \\ {x}"}));
  set(info.artist, one_of({"The X", "a Y", "Z'\\", "", "The X "}));
  set(info.album_artist, one_in(4) ? one_of({"The X", "Band", " "}) : "");
  set(info.genre, one_of({"Rock;;Pop", "", ";;", " Rock ; Jazz ;", "A;An;The Blues"}));
  set(info.composer, text());
  set(info.comment, text());
  set(info.date, one_of({"", "2020-01-02 03:04:05", "infinity"}));
  set(info.mdate, one_of({"", "1999-12-31 23:59:59.5", "epoch"}));
  set(info.fs_uuid, text());
  set(info.container_type, one_of({"flac", "mp3", ""}));
  set(info.video_codec, one_of({"flac", "mp3", ""}));
  info.track = static_cast<int>(below(4));
  info.year = static_cast<int>(below(3)) - 1;
  info.channel = static_cast<int>(below(3));
  info.frequency = 44100;
  info.bitrate = static_cast<int>(below(1000));
  info.duration = one_in(10) ? (one_in(2) ? NAN : 1e30F) : static_cast<float>(below(9999)) / 10;
  info.filesize = 5'000'000'000LL - below(3);
}

Info RandomLibrary::song() {
  auto info = record(one_of(songs_));
  fill(info);
  info.disc = static_cast<int>(below(3));
  info.covercount = static_cast<int>(below(3));
  return info;
}

Json::Value RandomLibrary::json_song() {
  const auto info = song();
  Json::Value json(Json::objectValue);
  json["szPath"] = one_in(30) ? Json::Value(7) : Json::Value(info.path);
  json["title"] = info.title;
  json["album"] = info.album;
  json["artist"] = info.artist;
  json["album_artist"] = info.album_artist;
  json["genre"] = info.genre;
  json["duration"] = info.track;
  if (one_in(2)) json["rg_track_gain"] = one_in(2) ? Json::Value("-7.5") : Json::Value(1e300);
  if (one_in(2)) json["rg_album_peak"] = 0.5;
  return json;
}

Info RandomLibrary::video() {
  auto info = record(root_.at(one_of({"volume1/media/a.mp4", "volume1/media/b'%.mkv"})));
  fill(info);
  set(info.audio_codec, text());
  info.frame_bitrate = 1;
  info.video_bitrate = 2;
  info.frame_rate_num = 24000;
  info.frame_rate_den = 1001;
  info.resolutionX = 1920;
  info.resolutionY = 1080;
  info.video_profile = 3;
  info.video_level = 4;
  return info;
}

Info RandomLibrary::photo() {
  auto info = record(root_.at(one_of({"volume1/media/a.jpg", "volume1/media/\\b.png"})));
  fill(info);
  set(info.camera_make, "Cämera\t");
  set(info.camera_model, " X ");
  set(info.exposure, "1/60");
  set(info.aperture, "f/2.8");
  set(info.timetaken, one_of({"", "2001-02-03 04:05:06"}));
  info.resolutionX = 6000;
  info.resolutionY = 4000;
  info.iso = 200;
  return info;
}

Info RandomLibrary::playlist() {
  auto info = record(one_of(one_in(3) ? playlists_ : sheets_));
  fill(info);
  return info;
}

DIR_INFO_REC RandomLibrary::folder() {
  const auto path =
      one_of({"volume1/media/sub", "volume1/media", "volume1/media/it's", "volume1/other",
              "volume1/media/not there", "homes/ann/music", "homes/ann/music/x"});
  if (!path.ends_with("there")) root_.make_folder(path);
  auto folder = folder_record(root_.at(path));
  set(folder.title, text());
  set(folder.date, one_of({"", "2020-01-02 03:04:05"}));
  set(folder.mdate, one_of({"", "2021-01-02 03:04:05"}));
  set(folder.fs_uuid, text());
  return folder;
}

std::string RandomLibrary::any_path() { return one_of(one_in(2) ? songs_ : sheets_); }

std::string RandomLibrary::sheet(const std::vector<std::string>& files, int first_number) {
  std::string text = "PERFORMER \"" + one_of({"The X", "a Y", ""}) + "\"\n";
  if (one_in(3)) text.clear();  // no album artist
  // Known as UTF-8 by this; others start a converter, which takes its time to be missing.
  if (!one_in(100)) text += "REM COMMENT \"日本語 Ünder\"\n";
  text += "TITLE \"" + one_of({"Hits", "hits", "Sheet"}) + "\"\nREM GENRE \"Rock;Pop\"\n";
  int number = first_number;
  for (const auto& file : files) {
    text += "FILE \"" + file + "\" WAVE\n";
    for (unsigned i = below(3) + 1; i > 0; --i) {
      text += "TRACK " + std::to_string(number++) + " AUDIO\nTITLE \"" + one_of({"One", "Two"}) +
              "\"\nPERFORMER \"" + one_of({"The X", "a Y", "Z'\\"}) + "\"\n";
      if (one_in(5)) text += "PREGAP 00:02:00\n";
      text += "INDEX 01 0" + std::to_string(i) + ":00:00\n";
    }
  }
  return text;
}

void RandomLibrary::write_cue_sheets(bool clashing) {
  // The parser takes blanks in quoted names as it finds them.
  const int apart = clashing ? 0 : 20;
  root_.write("volume1/media/a.cue", sheet({"a.flac", "it's %.mp3", "remote.mp3"}, 1));
  root_.write("volume1/media/sub/it's_%.CUE", sheet({"b_.mp3", "../a.flac"}, 1 + apart));
  root_.write("homes/ann/music/a.cue", sheet({"a.flac", "x/b.mp3"}, 1));
  root_.write("volume1/media/empty.cue", "REM nothing\n");
  root_.write("volume1/media/text.cue", sheet({"a.txt"}, 1));
}

void RandomLibrary::write_files() {
  root_.write("volume1/media/two.m3u", "#EXTM3U\na.flac\nsub/b_.mp3\n");
  root_.write("homes/ann/music/own.m3u8", "a.flac\n");
  root_.write("volume1/media/@eaDir/a.flac/TAVOAUDIO_SONG_RATING", "1026=4\n4711=5\nx=y\n");
  root_.write("volume1/media/@eaDir/a.flac_2/TAVOAUDIO_SONG_RATING", "1026=3\n");
  root_.write("homes/ann/music/@eaDir/a.flac/TAVOAUDIO_SONG_RATING", "1026=1\n");
  root_.make_folder("volume1/media/sub/@eaDir/b_.mp3/TAVOAUDIO_SONG_RATING");
  root_.make_folder("volume1/media/@eaDir/it's %.mp3_3/TAVOAUDIO_SONG_RATING");
}

void RandomLibrary::spoil(Info& info) {
  if (one_in(2)) return set(info.date, "no date");
  set(info.title, "no UTF-8 \xff");
}

}  // namespace mediidx::test
