// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Rewriting the row of a file. The statements are printf formats for values that are escaped
// already.
#include <array>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "database/escape.h"
#include "database/playlist_count.h"
#include "database/record.h"
#include "database/session.h"
#include "mediidx/catalogue.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;

constexpr char kUpdateMusic[] =
    "UPDATE music "
    "set filesize = %lld, title = '%s', album = '%s', artist = '%s', album_artist = '%s', "
    "composer = '%s', comment = '%s', year = %d, genre = '%s', channel = %d, frequency = %d, "
    "bitrate = %d, duration = %d, track = %d, disc = %d, covercount = %d, date = '%s', "
    "mdate = '%s' "
    "where path = '%s'";
constexpr char kUpdateVideo[] =
    "UPDATE video "
    "set path = '%s', filesize = %lld, title = '%s', album = '%s', frame_bitrate = %d, "
    "duration = %d, resolutionX = %d, resolutionY = %d, audio_bitrate = %d, frequency = %d, "
    "channel = %d, date = '%s', mdate = '%s' "
    "where id = %lu";
constexpr char kUpdatePhoto[] =
    "UPDATE photo "
    "set path = '%s', filesize = %lld, title = '%s', album = '%s', date = '%s', "
    "mdate = '%s', timetaken = '%s' "
    "where id = %lu";
constexpr char kUpdatePlaylist[] =
    "UPDATE playlist "
    "set path = '%s', filesize = %lld, title = '%s', album = '%s', song_count = %d, "
    "date = '%s', mdate = '%s' "
    "where id = %lu";

constexpr int kBadParameter = 420;
constexpr int kNoMemory = 421;
constexpr int kNoConnection = 422;
constexpr int kBadTableType = 423;
constexpr int kNotExecuted = 424;

/// The texts that the statements may hold, escaped.
class Texts {
 public:
  enum Name {
    kPath,
    kTitle,
    kAlbum,
    kArtist,
    kAlbumArtist,
    kComposer,
    kComment,
    kGenre,
    kDate,
    kMdate,
    kTimetaken,
    kCount
  };

  /// False, and logged, when one cannot be escaped.
  bool escape(const Info& info) {
    const std::array<const char*, kCount> sources{
        info.path,
        info.title,
        info.album,
        info.artist,
        info.album_artist,
        info.composer,
        info.comment,
        info.genre,
        date_or_epoch(info.date),
        date_or_epoch(info.mdate),
        date_or_epoch(info.timetaken),
    };
    for (std::size_t i = 0; i < kCount; ++i) {
      texts_[i] = escape_literal(sources[i]);
      if (!texts_[i]) return false;
      length_ += std::strlen(texts_[i].get());
    }
    return true;
  }

  const char* operator[](Name name) const { return texts_[name].get(); }
  std::size_t length() const { return length_; }

 private:
  std::array<OwnedText, kCount> texts_;
  std::size_t length_ = 0;
};

/// Where a statement is written: room for all texts and for the statement around them.
struct Buffer {
  OwnedText text;
  std::size_t size;

  explicit Buffer(const Texts& texts) : size(texts.length() + 512) {
    text.reset(static_cast<char*>(std::malloc(size)));
    if (!text) kDatabaseLog.parens(kNoMemory, "Failed to malloc(%d)", static_cast<int>(size));
  }
};

void format_music(const Buffer& out, const Info& info, const Texts& texts) {
  std::snprintf(out.text.get(), out.size, kUpdateMusic, static_cast<long long>(info.filesize),
                texts[Texts::kTitle], texts[Texts::kAlbum], texts[Texts::kArtist],
                texts[Texts::kAlbumArtist], texts[Texts::kComposer], texts[Texts::kComment],
                info.year, texts[Texts::kGenre], info.channel, info.frequency, info.bitrate,
                whole_seconds(info.duration), info.track, info.disc, info.covercount,
                texts[Texts::kDate], texts[Texts::kMdate], texts[Texts::kPath]);
}

void format_video(const Buffer& out, const Info& info, const Texts& texts) {
  std::snprintf(out.text.get(), out.size, kUpdateVideo, texts[Texts::kPath],
                static_cast<long long>(info.filesize), texts[Texts::kTitle], texts[Texts::kAlbum],
                info.frame_bitrate, whole_seconds(info.duration), info.resolutionX,
                info.resolutionY, info.bitrate, info.frequency, info.channel, texts[Texts::kDate],
                texts[Texts::kMdate], static_cast<unsigned long>(info.id));
}

void format_photo(const Buffer& out, const Info& info, const Texts& texts) {
  std::snprintf(out.text.get(), out.size, kUpdatePhoto, texts[Texts::kPath],
                static_cast<long long>(info.filesize), texts[Texts::kTitle], texts[Texts::kAlbum],
                texts[Texts::kDate], texts[Texts::kMdate], texts[Texts::kTimetaken],
                static_cast<unsigned long>(info.id));
}

void format_playlist(const Buffer& out, const Info& info, const Texts& texts) {
  std::snprintf(out.text.get(), out.size, kUpdatePlaylist, texts[Texts::kPath],
                static_cast<long long>(info.filesize), texts[Texts::kTitle], texts[Texts::kAlbum],
                playlist_song_count(info.path), texts[Texts::kDate], texts[Texts::kMdate],
                static_cast<unsigned long>(info.id));
}

/// False for a type that is not updated.
bool format_statement(MEDIA_TABLE_TYPE type, const Buffer& out, const Info& info,
                      const Texts& texts) {
  switch (type) {
    case MEDIA_TABLE_MUSIC:
      format_music(out, info, texts);
      return true;
    case MEDIA_TABLE_VIDEO:
      format_video(out, info, texts);
      return true;
    case MEDIA_TABLE_PHOTO:
      format_photo(out, info, texts);
      return true;
    case MEDIA_TABLE_PLAYLIST:
      format_playlist(out, info, texts);
      return true;
    default:
      kDatabaseLog.parens(kBadTableType, "Bad table type.");
      return false;
  }
}

int update(MEDIA_TABLE_TYPE type, Info& info) {
  trim_texts(info);
  Texts texts;
  if (!texts.escape(info)) return -1;
  const Buffer sql(texts);
  if (!sql.text) return -1;
  auto* conn = connect({LogShape::kParens, kNoConnection});
  if (!conn || !format_statement(type, sql, info, texts)) return -1;
  if (type == MEDIA_TABLE_MUSIC && MediaDBUpdateTrackRelatedTables(conn, &info) < 0) return -1;
  return execute(conn, sql.text.get(), {LogShape::kParens, kNotExecuted}) ? 0 : -1;
}

}  // namespace
}  // namespace mediidx

extern "C" int MediaInfoDBUpdate(MEDIA_TABLE_TYPE type, __tag_TAVO_MEDIA_INFO* info) {
  using mediidx::kDatabaseLog;
  return mediidx::no_throw(kDatabaseLog, -1, [&] {
    if (!info) {
      kDatabaseLog.parens(mediidx::kBadParameter, "Bad parameter");
      return -1;
    }
    return mediidx::update(type, *info);
  });
}
