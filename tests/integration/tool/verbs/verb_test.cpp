// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "verb_test.h"

#include <json/reader.h>

#include <memory>
#include <sstream>
#include <stdexcept>

#include "mediidx/database.h"

namespace mediidx::test {
namespace {

template <std::size_t Size>
void set(char (&field)[Size], const std::string& text) {
  field[text.copy(field, Size - 1)] = '\0';
}

}  // namespace

VerbTest::VerbTest() { root.index_everything("media", media.path()); }

Outcome VerbTest::run(Words words, Setting setting) const {
  words.insert(words.begin(), {"--data-dir", data.at("d")});
  return run_mediidx(words, setting);
}

std::string VerbTest::output(const Words& words) const {
  const auto done = run(words);
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.err, "");
  return done.out;
}

Json::Value VerbTest::json(Words words) const {
  words.insert(words.begin(), "--json");
  std::istringstream in(output(words));
  Json::Value value;
  std::string errors;
  if (!Json::parseFromStream(Json::CharReaderBuilder(), in, &value, &errors)) {
    throw std::runtime_error(errors);
  }
  return value;
}

unsigned VerbTest::save(const Song& song) const {
  const auto info = std::make_unique<__tag_TAVO_MEDIA_INFO>();
  set(info->path, song.path);
  set(info->title, song.title);
  set(info->artist, song.artist);
  set(info->album, song.album);
  set(info->composer, song.composer);
  set(info->genre, song.genre);
  info->duration = song.duration;
  info->filesize = song.filesize;
  if (MediaInfoDBSave(MEDIA_TABLE_MUSIC, info.get()) != 0) {
    throw std::runtime_error("not saved: " + song.path);
  }
  return info->id;
}

void VerbTest::insert(const std::string& path, bool online) {
  for (const char* table : {"music", "video", "photo", "playlist", "directory"}) {
    rows(std::string("INSERT INTO ") + table + "(path, fs_online) VALUES(" + quoted(path) +
         (online ? ", 't')" : ", 'f')"));
  }
}

std::vector<std::string> column(const Json::Value& array, const char* name) {
  std::vector<std::string> out;
  for (const auto& object : array) out.push_back(object[name].asString());
  return out;
}

std::vector<std::string> lines(const std::string& text) {
  std::vector<std::string> out;
  std::istringstream in(text);
  for (std::string line; std::getline(in, line);) out.push_back(line);
  return out;
}

}  // namespace mediidx::test
