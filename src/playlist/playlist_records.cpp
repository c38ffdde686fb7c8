// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/playlist_records.h"

#include <cstring>
#include <vector>

#include "mediidx/database.h"
#include "playlist/entry_path.h"
#include "playlist/playlist_file.h"
#include "support/log.h"
#include "support/text.h"

namespace mediidx {
namespace {

constexpr int kListHint = 0x14000;
constexpr int kHashHint = 8192;

constexpr int kEveryEntry = MEDIIDX_KEEP_KNOWN | MEDIIDX_KEEP_UNKNOWN | MEDIIDX_KEEP_STREAMS;

using OwnedBatch = Owned<MEDIA_DB_HANDLE, MediaInfoDBBatchClose>;

/// Tags of the entry at a position of the path list.
struct PositionedTags {
  int position;
  ExtendedTags tags;
};

struct Entries {
  OwnedList paths;
  std::vector<PositionedTags> extra;  ///< By rising position.
};

/// Fails (false) when the file cannot be read whole or a path cannot be listed.
bool read_entries(const std::string& playlist_path, PlaylistFormat format, Entries& entries) {
  bool listed = true;
  const bool read =
      read_playlist(playlist_path, format, [&](const std::string& path, ExtendedTags tags) {
        if (!listed) return;
        listed = MediaInfoDBBatchPara(entries.paths.get(), path.c_str()) >= 0;
        if (listed && !tags.title.empty()) {
          entries.extra.push_back({TLIBCSzListCount(entries.paths.get()) - 1, std::move(tags)});
        }
      });
  return read && listed;
}

/// Appends records at the end of a list.
class RecordList {
 public:
  void append(const __tag_TAVO_MEDIA_INFO& info) {
    auto* record = static_cast<_PLAYLIST_REC*>(std::calloc(1, sizeof(_PLAYLIST_REC)));
    if (!record) throw std::bad_alloc();
    record->info = info;
    if (last_) {
      last_->next = record;
    } else {
      head_.reset(record);
    }
    last_ = record;
    ++size_;
  }
  int size() const { return size_; }
  OwnedRecords release() { return std::move(head_); }

 private:
  OwnedRecords head_;
  _PLAYLIST_REC* last_ = nullptr;
  int size_ = 0;
};

/// The record of an entry that the index does not know: the playlist's own words, or its file name.
void describe(const char* path, const ExtendedTags* tags, __tag_TAVO_MEDIA_INFO& info) {
  std::memset(&info, 0, sizeof(info));
  const std::string_view whole(path);
  if (tags) {
    tags->fill(info);
  } else {
    copy_text(info.title, whole.substr(whole.rfind('/') + 1));
  }
  copy_text(std::span(info.path).first<MEDIIDX_PATH_SIZE>(), whole);
}

/// Walks entries beside the tags chain, which is only ever moved forward.
class Describer {
 public:
  explicit Describer(const std::vector<PositionedTags>& extra) : extra_(extra) {}

  void operator()(int position, const char* path, __tag_TAVO_MEDIA_INFO& info) {
    while (next_ < extra_.size() && extra_[next_].position < position) ++next_;
    const bool has_tags = next_ < extra_.size() && extra_[next_].position == position;
    describe(path, has_tags ? &extra_[next_].tags : nullptr, info);
  }

 private:
  const std::vector<PositionedTags>& extra_;
  std::size_t next_ = 0;
};

PlaylistRecords look_up(const Entries& entries, const PlaylistPage& page) {
  const OwnedBatch batch(MediaInfoDBBatchOpen(MEDIA_TABLE_MUSIC, page.fields, "path",
                                              entries.paths.get(), "", "", 0, 0));
  if (!batch) return {};
  const OwnedHash hash(TLIBCSzHashAlloc(kHashHint));
  if (!hash) return kPlaylistLog.tight(301, "Failed to TLIBCSzHashAlloc"), PlaylistRecords();
  if (MediaInfoDBGenHash(batch.get(), "path", hash.get()) < 0) {
    return kPlaylistLog.tight(302, "Failed to MediaInfoDBGenHash"), PlaylistRecords();
  }
  RecordList records;
  int kept = 0;
  Describer describe_entry(entries.extra);
  const auto info = std::make_unique<__tag_TAVO_MEDIA_INFO>();
  const int count = TLIBCSzListCount(entries.paths.get());
  for (int position = 0; position < count; ++position) {
    const char* path = TLIBCSzListGet(entries.paths.get(), position);
    const bool known = MediaInfoDBHashFind(batch.get(), "path", path, info.get(), hash.get()) == 0;
    const int kind = known                    ? MEDIIDX_KEEP_KNOWN
                     : begins_with_http(path) ? MEDIIDX_KEEP_STREAMS
                                              : MEDIIDX_KEEP_UNKNOWN;
    if (!(page.flags & kind)) continue;
    const bool on_page = kept >= page.offset && (page.limit == 0 || records.size() < page.limit);
    ++kept;
    if (!on_page) continue;
    if (!known) describe_entry(position, path, *info);
    records.append(*info);
  }
  return {records.release(), kept};
}

}  // namespace

PlaylistRecords read_playlist_records(const std::string& playlist_path, const PlaylistPage& page) {
  if (playlist_path.find('.') == playlist_path.npos) {
    kPlaylistLog.parens(303, "Not a valid playlist.");
    return {};
  }
  const auto format = playlist_format(playlist_path);
  if (!format) return {};
  // Every entry is kept and none handed out: there is nothing to look up.
  if (page.limit < 0 && (page.flags & kEveryEntry) == kEveryEntry) {
    return {nullptr, count_playlist_entries(playlist_path, *format)};
  }
  Entries entries;
  entries.paths.reset(TLIBCSzListAlloc(kListHint));
  if (!entries.paths) {
    kPlaylistLog.parens(304, "Failed to TLIBCSzListAlloc.");
    return {};
  }
  if (!read_entries(playlist_path, *format, entries)) return {};
  if (TLIBCSzListCount(entries.paths.get()) == 0) return {};
  return look_up(entries, page);
}

}  // namespace mediidx
