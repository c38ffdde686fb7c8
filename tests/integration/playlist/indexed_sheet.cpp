// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "indexed_sheet.h"

#include <iconv.h>

#include <filesystem>
#include <memory>
#include <string_view>

#include "mediidx/request.h"

namespace mediidx::test {
namespace {

/// The rows of a table, without their ids and the column `last`, each after the table's name.
std::string plain_query(const std::string& table, const std::string& last) {
  return "SELECT '" + table + "', (to_jsonb(t) - 'id' - " + last + ")::text FROM " + table +
         " t ORDER BY 2";
}

/// The rows of a side table, each after its track's own key.
std::string side_query(const std::string& table) {
  return "SELECT '" + table +
         "', t.path, t.is_virtual, t.track, (to_jsonb(s) - 'track')::text "
         "FROM " +
         table + " s JOIN track t ON t.id = s.track ORDER BY 2, 3, 4, 5";
}

template <std::size_t kSize>
void set(char (&field)[kSize], std::string_view text) {
  field[text.copy(field, kSize - 1)] = '\0';
}

}  // namespace

IndexedSheetTest::IndexedSheetTest() {
  root.index_everything("music", folder);
  root.make_link("usr/bin/php", MEDIIDX_CONVERTER);
  clear_log();
}

void IndexedSheetTest::set_code_page(const std::string& code) const {
  root.write("etc/tavoinfo.conf", code.empty() ? "" : "codepage=\"" + code + "\"\n");
}

int IndexedSheetTest::add(const std::string& path, MEDIA_TABLE_TYPE type, int duration_s) {
  const auto info = std::make_unique<__tag_TAVO_MEDIA_INFO>();
  set(info->path, path);
  if (type == MEDIA_TABLE_MUSIC) {
    set(info->title, "File");
    set(info->album, "Album");
    set(info->artist, "Band");
    set(info->video_codec, "flac");
    set(info->container_type, "flac");
    info->duration = static_cast<float>(duration_s);
    info->channel = 2;
    info->frequency = 44100;
    info->bitrate = 900000;
  }
  set(info->date, "2020-01-02 03:04:05");
  return TAVOMediaIndexAdd(info.get(), type);
}

int IndexedSheetTest::add_audio(const std::string& name, int duration_s) {
  return add(root.write("volume1/music/" + name, "x"), MEDIA_TABLE_MUSIC, duration_s);
}

int IndexedSheetTest::add_sheet(const std::string& name, const std::string& content) {
  return add(root.write("volume1/music/" + name, content), MEDIA_TABLE_PLAYLIST);
}

int IndexedSheetTest::remove(const std::string& name) {
  std::filesystem::remove(at(name));
  return TAVOMediaIndexDelete(at(name).c_str());
}

std::vector<Row> IndexedSheetTest::catalogue(LastDurations last) {
  const auto duration_of_last = [&](const std::string& is_virtual) -> std::string {
    if (last == LastDurations::kKept) return "''";
    return "CASE WHEN " + is_virtual +
           " AND t.track = max(t.track) OVER (PARTITION BY t.path) THEN 'duration' ELSE '' END";
  };
  std::vector<std::string> queries{plain_query("music", "''"), plain_query("playlist", "''"),
                                   plain_query("personal_playlist", "''"),
                                   plain_query("virtual_music", duration_of_last("true")),
                                   plain_query("track", duration_of_last("t.is_virtual = 'TRUE'"))};
  for (const char* table : {"genre_track", "composer_track", "artist_track", "album_track",
                            "virtual_info_track", "rating_track", "replaygain_track"}) {
    queries.push_back(side_query(table));
  }
  std::vector<Row> all;
  for (const auto& query : queries) {
    for (auto& row : rows(query)) all.push_back(std::move(row));
  }
  return all;
}

void IndexedSheetTest::start_anew() {
  TestServer::get().fresh_database();
  TAVOMediaIndexDBClose();
}

std::string in_charset(const std::string& text, const char* charset) {
  iconv_t descriptor = iconv_open(charset, "UTF-8");
  std::string in = text;
  std::string out(text.size() * 4 + 16, '\0');
  char* from = in.data();
  char* into = out.data();
  std::size_t left = in.size();
  std::size_t room = out.size();
  if (iconv(descriptor, &from, &left, &into, &room) == static_cast<std::size_t>(-1)) {
    ADD_FAILURE() << "no " << charset << " for " << text;
  }
  iconv_close(descriptor);
  out.resize(out.size() - room);
  return out;
}

}  // namespace mediidx::test
