// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mediidx/playlist.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <optional>
#include <string>

#include "mediidx/database.h"
#include "playlist/entry_path.h"
#include "playlist/extended_tags.h"
#include "playlist/playlist_records.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/text.h"

namespace mediidx {
namespace {

using OwnedHandle = Owned<MEDIA_DB_HANDLE, MediaInfoDBClose>;

bool is_decimal(std::string_view text) {
  return !text.empty() && std::ranges::all_of(text, [](char c) { return c >= '0' && c <= '9'; });
}

/// The path of the playlist row of this id.
std::optional<std::string> find_playlist_path(std::string_view id) {
  OwnedHandle handle;
  if (is_decimal(id)) {
    const auto condition = "id=" + std::string(id);
    handle.reset(MediaInfoDBOpen(MEDIA_TABLE_PLAYLIST, "path", condition.c_str(), "", "", 0, 0, 1));
  }
  if (!handle) {
    kPlaylistLog.parens(101, "Failed to query database.");
    return std::nullopt;
  }
  const char* path = PlaylistDBGet(handle.get());
  if (!path) {
    kPlaylistLog.parens(102, "Failed to get playlist path.");
    return std::nullopt;
  }
  return path;
}

_PLAYLIST_REC* hand_out(PlaylistRecords records, int* count) {
  if (count) *count = records.kept;
  return records.head.release();
}

int read_tag_line(const char* line, __tag_TAVO_MEDIA_INFO& info) {
  ExtendedTags tags;
  tags.duration_s = info.duration;
  tags.year = info.year;
  tags.disc = info.disc;
  tags.track = info.track;
  tags.title = info.title;
  tags.artist = info.artist;
  tags.album = info.album;
  tags.genre = info.genre;
  const bool is_tag = tags.read_line(line);
  if (is_tag) tags.fill(info);
  return is_tag ? 1 : 0;
}

int resolve_simply(const char* playlist_path, char* entry, char* out) {
  std::replace(entry, entry + std::strlen(entry), '\\', '/');
  const auto music_link = read_music_link();
  if (!music_link) kPlaylistLog.parens(103, "Failed to get real path.");
  const bool as_it_is = !music_link || std::string_view(entry).starts_with(*music_link);
  const auto path = as_it_is ? std::string(entry) : join_entry(entry, playlist_path);
  const bool fits = path.size() < MEDIIDX_PATH_SIZE;
  copy_text(std::span(out, MEDIIDX_PATH_SIZE), fits ? path : std::string());
  return music_link && fits ? 0 : 1;
}

}  // namespace
}  // namespace mediidx

using mediidx::kPlaylistLog;
using mediidx::no_throw;

extern "C" {

_PLAYLIST_REC* ParsePlayList(const char* playlistId, int* count, int offset, int limit) {
  return ParsePlayListByField(playlistId, count, offset, limit, "id, path", MEDIIDX_KEEP_KNOWN);
}

_PLAYLIST_REC* ParsePlayListByField(const char* playlistId, int* count, int offset, int limit,
                                    const char* fields, int flags) {
  if (count) *count = 0;
  return no_throw(kPlaylistLog, static_cast<_PLAYLIST_REC*>(nullptr), [&]() -> _PLAYLIST_REC* {
    const auto path = mediidx::find_playlist_path(playlistId ? playlistId : "");
    if (!path) return nullptr;
    return mediidx::hand_out(mediidx::read_playlist_records(*path, {offset, limit, fields, flags}),
                             count);
  });
}

_PLAYLIST_REC* ParsePlayListByFieldGivenPath(const char* playlistPath, int* count, int offset,
                                             int limit, const char* fields, int flags) {
  if (count) *count = 0;
  if (!playlistPath) return nullptr;
  return no_throw(kPlaylistLog, static_cast<_PLAYLIST_REC*>(nullptr), [&] {
    return mediidx::hand_out(
        mediidx::read_playlist_records(playlistPath, {offset, limit, fields, flags}), count);
  });
}

int ABSPlayListPath(const char* playlistPath, char* entry, char* out) {
  if (!playlistPath || !entry || !out) return 1;
  return no_throw(kPlaylistLog, 1,
                  [&] { return mediidx::resolve_simply(playlistPath, entry, out); });
}

int GetExtInfoM3U(const char* line, __tag_TAVO_MEDIA_INFO* info) {
  if (!line || !info) {
    kPlaylistLog.colon(104, "Bad parameters.");
    return 1;
  }
  return no_throw(kPlaylistLog, 1, [&] { return mediidx::read_tag_line(line, *info); });
}

void TAVOPlaylistRecFree(_PLAYLIST_REC* list) {
  while (list) {
    _PLAYLIST_REC* next = list->next;
    std::free(list);
    list = next;
  }
}
}
