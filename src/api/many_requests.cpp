// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Adding many files or folders at once.
#include <tavoindex.h>

#include <algorithm>
#include <memory>
#include <set>
#include <span>
#include <string>
#include <vector>

#include "api/add_file.h"
#include "api/add_folder.h"
#include "api/file_path.h"
#include "api/replay_gain.h"
#include "api/virtual_tracks.h"
#include "database/many.h"
#include "mediidx/request.h"
#include "playlist/cue_durations.h"
#include "support/log.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

using Record = __tag_TAVO_MEDIA_INFO;

constexpr int kManyBadParameter = 150;

/// One result a record, -1 until it is set, for a caller who may not want them.
class Results {
 public:
  Results(int* results, unsigned count) : results_(results) {
    if (results_) std::fill_n(results_, count, -1);
  }
  void set(unsigned index, int result) {
    if (results_) results_[index] = result;
    if (result != 0) any_failed_ = true;
  }
  int all() const { return any_failed_ ? -1 : 0; }

 private:
  int* results_;
  bool any_failed_ = false;
};

int bad_parameter() {
  kRequestLog.colon(kManyBadParameter, "Bad parameter");
  return -1;
}

/// A file that is to be saved.
struct Pending {
  unsigned index;  ///< Of its record and result.
  Record* info;
  std::optional<std::array<float, 4>> gains;
};

/// What was read of a file's cue sheet.
struct Sheet {
  OwnedTracks tracks;
  bool is_read = false;
  bool failed = false;
  std::vector<std::string> lines;
  std::set<std::string> asked;  ///< Audio files whose lengths its tracks depend on.
};

void read_sheet(const char* path, Sheet& sheet) {
  static const KnownDurations kNone;
  CueDurations durations(kNone);
  auto tracks = parse_virtual_tracks(path);
  sheet.is_read = tracks.has_value();
  sheet.failed = !sheet.is_read;
  if (tracks) sheet.tracks = *std::move(tracks);
  sheet.lines = durations.take_lines();
  sheet.asked = durations.asked();
}

/// Reads every cue sheet, and parses those whose audio files the index knows once more, with their
/// lengths. False when these cannot be had.
bool read_sheets(std::span<const Pending> pending, std::vector<Sheet>& sheets) {
  std::set<std::string> asked;
  for (std::size_t i = 0; i < pending.size(); ++i) {
    if (!is_cue_sheet(pending[i].info->path)) continue;
    read_sheet(pending[i].info->path, sheets[i]);
    asked.insert(sheets[i].asked.begin(), sheets[i].asked.end());
  }
  const auto known = many::find_durations(asked);
  if (!known) return false;
  for (std::size_t i = 0; i < pending.size(); ++i) {
    auto& sheet = sheets[i];
    const bool depends = std::ranges::any_of(
        sheet.asked, [&](const std::string& path) { return known->contains(path); });
    if (!sheet.is_read || !depends) continue;
    OwnedTracks tracks;
    const bool parsed = parse_again(sheet.lines, pending[i].info->path, *known, out(tracks));
    if (!parsed) return false;
    sheet.tracks = std::move(tracks);
  }
  return true;
}

/// The result of a file that was saved with others.
int result_of(const many::File& file, const Sheet& sheet) {
  if (sheet.failed) return -1;
  if (file.outcome == many::Outcome::kWhole) return 0;
  return sheet.is_read ? virtual_tracks_not_saved() : file_not_saved();
}

bool save_together(MEDIA_TABLE_TYPE type, std::span<const Pending> pending, Results& results) {
  std::vector<Sheet> sheets(pending.size());
  if (type == MEDIA_TABLE_PLAYLIST && !read_sheets(pending, sheets)) return false;
  std::vector<many::File> files;
  files.reserve(pending.size());
  for (std::size_t i = 0; i < pending.size(); ++i) {
    files.push_back({pending[i].info, pending[i].gains, sheets[i].is_read, sheets[i].tracks.get()});
  }
  if (!many::save_files(type, files)) return false;
  for (std::size_t i = 0; i < pending.size(); ++i) {
    results.set(pending[i].index, result_of(files[i], sheets[i]));
  }
  return true;
}

/// Calls `save` for everything together, and `save_one` for each record where that fails.
template <class Items, class Save, class SaveOne>
void save_or_one_by_one(const Items& items, Save save, SaveOne save_one) {
  if (items.empty()) return;
  if (many::is_available() && no_throw(kRequestLog, false, save)) return;
  for (const auto& item : items) save_one(item);
}

void save(MEDIA_TABLE_TYPE type, const std::vector<Pending>& pending, Results& results) {
  save_or_one_by_one(
      pending, [&] { return save_together(type, pending, results); },
      [&](const Pending& file) {
        results.set(file.index, no_throw(kRequestLog, -1,
                                         [&] { return save_file(*file.info, type, file.gains); }));
      });
}

int add_many(Record* records, unsigned count, MEDIA_TABLE_TYPE type, Results results) {
  if (count == 0) return 0;
  if (!records) return bad_parameter();
  std::vector<Pending> pending;
  for (unsigned i = 0; i < count; ++i) {
    if (const auto result = result_without_save(records[i].path, type)) {
      results.set(i, *result);
    } else {
      pending.push_back({i, &records[i], {}});
    }
  }
  save(type, pending, results);
  return results.all();
}

int add_many(const Json::Value& array, MEDIA_TABLE_TYPE type, Results results) {
  if (!array.isArray()) return bad_parameter();
  std::vector<std::unique_ptr<Record>> records;
  std::vector<Pending> pending;
  for (unsigned i = 0; i < array.size(); ++i) {
    const auto& json = array[i];
    const char* path = find_path(json);
    const auto result = path ? result_without_save(path, type) : add_bad_parameter();
    if (result) {
      results.set(i, *result);
      continue;
    }
    records.push_back(std::make_unique<Record>());
    if (MediaInfoJson2Object(json, records.back().get()) != 0) {
      results.set(i, file_not_saved());
      continue;
    }
    pending.push_back({i, records.back().get(), find_replay_gain(json)});
  }
  save(type, pending, results);
  return results.all();
}

struct PendingFolder {
  unsigned index;
  const DIR_INFO_REC* folder;
};

int add_many(const DIR_INFO_REC* records, unsigned count, Results results) {
  if (count == 0) return 0;
  if (!records) return bad_parameter();
  std::vector<PendingFolder> pending;
  std::vector<const DIR_INFO_REC*> folders;
  for (unsigned i = 0; i < count; ++i) {
    if (const auto result = result_without_save(records[i])) {
      results.set(i, *result);
      continue;
    }
    pending.push_back({i, &records[i]});
    folders.push_back(&records[i]);
  }
  const auto save_together = [&] {
    if (!many::save_folders(folders)) return false;
    for (const auto& folder : pending) results.set(folder.index, 0);
    return true;
  };
  save_or_one_by_one(pending, save_together, [&](const PendingFolder& folder) {
    results.set(folder.index, save_folder(*folder.folder));
  });
  return results.all();
}

template <class... Arguments>
int add_many_or_fail(int* results, unsigned count, Arguments&&... arguments) {
  return no_throw(kRequestLog, -1, [&] {
    return add_many(std::forward<Arguments>(arguments)..., Results(results, count));
  });
}

}  // namespace
}  // namespace mediidx

using mediidx::add_many_or_fail;

extern "C" {

int TAVOMediaIndexAddMany(__tag_TAVO_MEDIA_INFO* records, unsigned count, MEDIA_TABLE_TYPE type,
                          int* results) {
  return add_many_or_fail(results, count, records, count, type);
}

int TAVOMediaIndexAddMany_Json(const Json::Value& array, MEDIA_TABLE_TYPE type, int* results) {
  const unsigned count = array.isArray() ? array.size() : 0;
  return add_many_or_fail(results, count, array, type);
}

int TAVOMediaIndexDirAddMany(const DIR_INFO_REC* records, unsigned count, int* results) {
  return add_many_or_fail(results, count, records, count);
}
}
