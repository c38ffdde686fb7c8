// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The corpus of the benchmark: one encoded file of each format, copied and tagged. The same words
// make the same files.
#include <fileref.h>
#include <tpropertymap.h>

#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace {

namespace fs = std::filesystem;

constexpr std::uint32_t kSeed = 20240229;
constexpr const char* kWords[] = {
    "amber",   "anchor", "Ångström", "autumn", "bell",  "birch",  "blue",   "bridge",  "candle",
    "cedar",   "cloud",  "coast",    "cœur",   "crow",  "dawn",   "delta",  "dune",    "echo",
    "ember",   "fern",   "field",    "flood",  "fox",   "glass",  "gravel", "grün",    "harbour",
    "heron",   "ice",    "iron",     "ivy",    "jetty", "kite",   "lake",   "lantern", "León",
    "linen",   "marsh",  "meadow",   "mill",   "moon",  "moss",   "night",  "north",   "oak",
    "orchard", "owl",    "paper",    "quarry", "quay",  "rain",   "river",  "rope",    "salt",
    "slate",   "snow",   "stone",    "tide",   "tin",   "valley", "wall",   "willow",  "Запруда",
};
constexpr const char* kGenres[] = {"Folk", "Jazz", "Rock", "Ambient", "Classical", "Electronic"};
// Of ten albums.
constexpr const char* kFormats[] = {"mp3",  "mp3",  "mp3", "mp3", "flac",
                                    "flac", "flac", "m4a", "m4a", "ogg"};
constexpr std::size_t kAlbumsAnArtist = 5;
constexpr std::size_t kAlbumsAPlaylist = 4;
constexpr std::size_t kAlbumsACueSheet = 25;
constexpr std::size_t kAudioAPhoto = 20;
constexpr std::size_t kAudioAVideo = 100;

/// Distributions of the standard library differ between its makers; this does not.
class Random {
 public:
  std::size_t below(std::size_t limit) { return engine_() % limit; }
  template <class T, std::size_t N>
  T one_of(const T (&values)[N]) {
    return values[below(N)];
  }
  std::string name(std::size_t words) {
    std::string out;
    for (std::size_t i = 0; i < words; ++i) {
      if (i > 0) out += ' ';
      out += one_of(kWords);
    }
    return out;
  }

 private:
  std::mt19937 engine_{kSeed};
};

struct Album {
  std::string title;
  std::string artist;
  std::string genre;
  std::string year;
  std::string format;
  bool is_tagged;
  std::size_t tracks;
};

std::string two_digits(std::size_t number) {
  auto text = std::to_string(number);
  if (number < 10) text.insert(text.begin(), '0');
  return text;
}

void write_text(const fs::path& path, const std::string& text) {
  std::ofstream file(path, std::ios::binary);
  file << text;
  if (!file.flush()) throw std::runtime_error("cannot write " + path.string());
}

void set_tags(const fs::path& path, const TagLib::PropertyMap& tags) {
  TagLib::FileRef file(path.c_str(), /*readAudioProperties=*/false);
  if (file.isNull()) throw std::runtime_error("no media file: " + path.string());
  file.file()->setProperties(tags);
  if (!file.save()) throw std::runtime_error("cannot tag " + path.string());
}

TagLib::StringList value(const std::string& text) {
  return {TagLib::String(text, TagLib::String::UTF8)};
}

class Corpus {
 public:
  Corpus(fs::path bases, fs::path folder) : bases_(std::move(bases)), folder_(std::move(folder)) {}

  void make(std::size_t audio_files) {
    while (audio_ < audio_files) add_album(audio_files - audio_);
    for (std::size_t i = 0; i < audio_files / kAudioAPhoto; ++i) add_copy("photos", "jpg", i);
    for (std::size_t i = 0; i < audio_files / kAudioAVideo; ++i) add_copy("videos", "mp4", i);
  }

 private:
  void add_album(std::size_t most_tracks) {
    const auto number = albums_++;
    if (number % kAlbumsAnArtist == 0) artist_ = random_.name(2) + " " + std::to_string(number);
    const Album album{random_.name(3),
                      artist_,
                      random_.one_of(kGenres),
                      std::to_string(1960 + random_.below(60)),
                      random_.one_of(kFormats),
                      /*is_tagged=*/number % 10 != 9,
                      std::min(10 + random_.below(3), most_tracks)};
    const auto place = folder_ / "music" / artist_ / (std::to_string(number) + " " + album.title);
    fs::create_directories(place);
    std::string first;
    for (std::size_t track = 1; track <= album.tracks; ++track) {
      const auto title = random_.name(2 + random_.below(3));
      const auto path = place / (two_digits(track) + " - " + title + "." + album.format);
      add_track(path, album, title, track);
      if (track == 1) first = path.filename();
      if (random_.below(3) == 0) playlist_ += "../" + relative_to_music(path) + "\n";
    }
    if (number % kAlbumsACueSheet == 0) add_cue_sheet(place, album, first);
    if (number % kAlbumsAPlaylist == kAlbumsAPlaylist - 1) add_playlist();
  }

  void add_track(const fs::path& path, const Album& album, const std::string& title,
                 std::size_t track) {
    fs::copy_file(bases_ / ("base." + album.format), path);
    if (album.is_tagged) {
      TagLib::PropertyMap tags;
      tags["TITLE"] = value(title);
      tags["ALBUM"] = value(album.title);
      tags["ARTIST"] = value(album.artist);
      if (album.year.back() % 2 == 0) tags["ALBUMARTIST"] = value(album.artist);
      if (album.genre == "Classical") tags["COMPOSER"] = value(random_.name(2));
      tags["GENRE"] = value(album.genre);
      tags["DATE"] = value(album.year);
      tags["TRACKNUMBER"] = value(std::to_string(track) + "/" + std::to_string(album.tracks));
      tags["DISCNUMBER"] = value("1");
      set_tags(path, tags);
    }
    date(path);
    ++audio_;
  }

  void add_cue_sheet(const fs::path& place, const Album& album, const std::string& audio) {
    std::string text = "PERFORMER \"" + album.artist + "\"\nTITLE \"" + album.title +
                       "\"\nFILE \"" + audio + "\" WAVE\n";
    for (std::size_t track = 1; track <= 3; ++track) {
      text += "  TRACK " + two_digits(track) + " AUDIO\n    TITLE \"" + random_.name(2) +
              "\"\n    INDEX 01 00:00:" + two_digits(20 * (track - 1)) + "\n";
    }
    write_text(place / "sheet.cue", text);
    date(place / "sheet.cue");
  }

  void add_playlist() {
    const auto place = folder_ / "music" / "playlists";
    fs::create_directories(place);
    const auto path = place / (std::to_string(albums_) + " " + random_.name(2) + ".m3u8");
    write_text(path, "#EXTM3U\n" + playlist_);
    date(path);
    playlist_.clear();
  }

  /// A photo or film with a day of its own where the base has one.
  void add_copy(const std::string& kind, const std::string& extension, std::size_t number) {
    const auto place = folder_ / kind / std::to_string(number / 100);
    fs::create_directories(place);
    const auto path = place / (two_digits(number % 100) + " " + random_.name(2) + "." + extension);
    std::ifstream base(bases_ / ("base." + extension), std::ios::binary);
    std::string bytes{std::istreambuf_iterator(base), {}};
    constexpr std::string_view kDay = "2020:01:01";
    if (const auto at = bytes.find(kDay); at != std::string::npos) {
      bytes.replace(at, kDay.size(), "2020:01:" + two_digits(1 + random_.below(28)));
    }
    write_text(path, bytes);
    date(path);
  }

  /// A minute between one file and the next, so that no file looks new.
  void date(const fs::path& path) {
    using namespace std::chrono;
    const sys_seconds first = sys_days(2021y / 6 / 12);
    fs::last_write_time(path, file_clock::from_sys(first + minutes(files_++)));
  }

  std::string relative_to_music(const fs::path& path) const {
    return path.lexically_relative(folder_ / "music");
  }

  fs::path bases_;
  fs::path folder_;
  Random random_;
  std::string artist_;
  std::string playlist_;
  std::size_t albums_ = 0;
  std::size_t audio_ = 0;
  int files_ = 0;
};

void retitle(const fs::path& path, const std::string& title) {
  auto tags = TagLib::FileRef(path.c_str(), false).file()->properties();
  tags["TITLE"] = value(title);
  set_tags(path, tags);
}

}  // namespace

int main(int count, char** words) {
  const std::vector<std::string> arguments(words + 1, words + count);
  try {
    if (arguments.size() == 4 && arguments[0] == "make") {
      Corpus(arguments[1], arguments[2]).make(std::stoul(arguments[3]));
      return EXIT_SUCCESS;
    }
    if (arguments.size() == 3 && arguments[0] == "retitle") {
      retitle(arguments[1], arguments[2]);
      return EXIT_SUCCESS;
    }
    std::fputs("usage: media_corpus make BASES FOLDER COUNT | retitle FILE TITLE\n", stderr);
    return 2;
  } catch (const std::exception& error) {
    std::fprintf(stderr, "media_corpus: %s\n", error.what());
    return EXIT_FAILURE;
  }
}
