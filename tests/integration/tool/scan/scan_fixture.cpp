// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan_fixture.h"

#include <fileref.h>
#include <tag.h>
#include <tpropertymap.h>

#include <algorithm>
#include <sstream>
#include <stdexcept>

namespace mediidx::test {

std::ostream& operator<<(std::ostream& out, const Counts& counts) {
  return out << "added " << counts.added << ", changed " << counts.changed << ", moved "
             << counts.moved << ", removed " << counts.removed << ", offline " << counts.offline
             << ", skipped " << counts.skipped << ", failed " << counts.failed;
}

ScanTest::ScanTest() { fs::create_directory(media.at("m")); }

Outcome ScanTest::run(Words words, const Setting& setting) const {
  words.insert(words.begin(), {"--data-dir", data.at("d")});
  return run_mediidx(words, setting);
}

void ScanTest::index() {
  const auto done = run({"index", "--full-speed", media.at("m")});
  ASSERT_EQ(done.status, 0) << done.err;
}

ScanOutcome ScanTest::scan(Words words, const Setting& setting) const {
  words.insert(words.begin(), {"scan", "--full-speed"});
  ScanOutcome out;
  static_cast<Outcome&>(out) = run(words, setting);
  auto line = out.out.substr(0, out.out.empty() ? 0 : out.out.size() - 1);
  line = line.substr(line.rfind('\n') + 1);
  std::ranges::replace(line, ',', ' ');
  std::istringstream in(line);
  std::string name;
  const std::pair<const char*, int Counts::*> kFields[] = {
      {"added", &Counts::added},     {"changed", &Counts::changed}, {"moved", &Counts::moved},
      {"removed", &Counts::removed}, {"offline", &Counts::offline}, {"skipped", &Counts::skipped},
      {"failed", &Counts::failed},
  };
  for (const auto& [field, value] : kFields) {
    if (!(in >> name >> out.counts.*value) || name != field) out.counts = {-1};
  }
  return out;
}

void ScanTest::expect_scan(int status, const Counts& counts, const Words& words) const {
  const auto done = scan(words);
  EXPECT_EQ(done.status, status) << done.err;
  EXPECT_EQ(done.counts, counts) << done.out << done.err;
}

std::string ScanTest::song(const std::string& name, const SongTags& tags) const {
  const auto path = media.take_sample(kSong, "m/" + name);
  TagLib::FileRef file(path.c_str(), false);
  TagLib::PropertyMap map;
  const auto set = [&map](const char* key, const std::string& text) {
    if (!text.empty()) map.replace(key, TagLib::String(text, TagLib::String::UTF8));
  };
  set("TITLE", tags.title);
  set("ALBUM", tags.album);
  set("ARTIST", tags.artist);
  set("ALBUMARTIST", tags.album_artist);
  file.file()->setProperties(map);
  if (!file.save()) throw std::runtime_error("no tags can be written to " + path);
  return path;
}

void ScanTest::move(const std::string& from, const std::string& to) const {
  fs::create_directories(fs::path(at(to)).parent_path());
  fs::rename(at(from), at(to));
}

std::vector<std::string> ScanTest::stored(const std::string& table) {
  std::vector<std::string> out;
  const auto above = media.at("m/");
  for (const auto& row : rows("SELECT path FROM " + table + " ORDER BY path")) {
    out.push_back(row[0].starts_with(above) ? row[0].substr(above.size()) : row[0]);
  }
  return out;
}

std::vector<std::string> ScanTest::everything() {
  std::vector<std::string> out;
  const auto add = [&](const std::string& name, const std::string& sql) {
    for (const auto& row : rows(sql)) out.push_back(name + " " + row[0]);
  };
  for (const std::string table : {"music", "video", "photo", "playlist", "directory",
                                  "virtual_music", "personal_playlist", "personal_directory"}) {
    add(table, "SELECT (to_jsonb(t) - 'id')::text FROM " + table + " t");
  }
  add("track", "SELECT (to_jsonb(t) - 'id')::text FROM track t");
  for (const std::string side : {"genre_track", "composer_track", "artist_track", "album_track",
                                 "virtual_info_track", "rating_track", "replaygain_track"}) {
    add(side,
        "SELECT concat(t.path, ' ', t.is_virtual, ' ', t.track, ' ', (to_jsonb(s) - 'track')::text)"
        " FROM " +
            side + " s JOIN track t ON t.id = s.track");
  }
  std::ranges::sort(out);
  return out;
}

void ScanTest::expect_as_fresh() {
  const auto incremental = everything();
  rows(
      "DELETE FROM track; DELETE FROM music; DELETE FROM video; DELETE FROM photo; "
      "DELETE FROM playlist; DELETE FROM directory; DELETE FROM virtual_music; "
      "DELETE FROM personal_playlist; DELETE FROM personal_directory; DELETE FROM scan.folder; "
      "DELETE FROM scan.root; DELETE FROM scan.unsettled");
  const auto done = scan();
  EXPECT_TRUE(done.status == 0 || done.status == 3) << done.err;
  EXPECT_EQ(incremental, everything());
}

}  // namespace mediidx::test
