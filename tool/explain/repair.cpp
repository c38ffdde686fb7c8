// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain/repair.h"

#include <array>
#include <filesystem>
#include <map>
#include <memory>
#include <set>
#include <stdexcept>

#include "explain/index_answer.h"
#include "explain/save_again.h"
#include "mediidx/catalogue.h"
#include "mediidx/database.h"
#include "mediidx/request.h"
#include "store/query.h"
#include "support/text.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;
using Text = const char*;

constexpr Template<Text, Text> kSelectOffline{
    "SELECT 1 AS found FROM music WHERE path = '@TAVO:VAR' AND NOT fs_online "
    "UNION ALL SELECT 1 FROM playlist WHERE path = '@TAVO:VAR' AND NOT fs_online"};

/// Thrown for one file: the reason why it stays as it is.
struct CannotMend : std::runtime_error {
  using std::runtime_error::runtime_error;
};

bool concerns_sheet(const HalfWritten& half) {
  switch (half.fault) {
    case Fault::kTrackWithoutSideRows:
      return half.is_virtual;
    case Fault::kVirtualTrackWithoutOrigin:
    case Fault::kVirtualTrackWithoutSheet:
    case Fault::kVirtualTrackWithoutMusicRow:
    case Fault::kVirtualMusicRowWithoutTrack:
      return true;
    default:
      return false;
  }
}

/// The file whose saving mends it; empty when that is not known.
const std::string& source_of(const HalfWritten& half) {
  return concerns_sheet(half) ? half.cue_sheet : half.path;
}

class Repair {
 public:
  Repair(const DataFolder& data, Database& database, const std::function<bool()>& stop)
      : data_(data), database_(database), stop_(stop) {}

  RepairReport run() {
    std::set<std::string> files;
    std::set<std::string> sheets;
    for (const auto& half : find_half_written(database_)) {
      if (half.fault == Fault::kSideRowWithoutTrack) {
        delete_side_rows(half.id);
      } else if (!source_of(half).empty()) {
        if (half.fault == Fault::kVirtualTrackWithoutOrigin) add_origin(half);
        (concerns_sheet(half) ? sheets : files).insert(source_of(half));
      }
    }
    for (const auto& path : files) mend(path, Kind::kMusic);
    for (const auto& path : sheets) mend(path, Kind::kCueSheet);
    take_left();
    return std::move(report_);
  }

 private:
  /// Album artists, which others share, are recovered by the same request.
  void delete_side_rows(unsigned id) {
    const auto record = std::make_unique<__tag_TAVO_MEDIA_INFO>();
    record->id = id;
    if (MediaDBDeleteRecordsInRelatedTables(MediaDBConnGet(), record.get()) == 0) {
      report_.mended.push_back({Mending::kSideRowsDeleted, "", id});
    }
  }

  /// Only tracks that know their cue sheet go with it, or are replaced with it.
  void add_origin(const HalfWritten& half) {
    const auto track = std::make_unique<__tag_TAVO_MEDIA_INFO>();
    const auto sheet = std::make_unique<__tag_TAVO_MEDIA_INFO>();
    copy_text(track->comment, half.start);
    copy_text(sheet->path, half.cue_sheet);
    MediaDBInsertIntoVirtualInfoTrackTable(MediaDBConnGet(), track.get(), sheet.get(),
                                           static_cast<int>(half.id));
  }

  void mend(const std::string& path, Kind kind) {
    if (stop_()) {
      reasons_[path] = "stopped before it";
      return;
    }
    try {
      report_.mended.push_back({mend_file(path, kind), path});
    } catch (const std::runtime_error& error) {
      reasons_[path] = error.what();
      if (!database_.answers()) throw;
    }
  }

  Mending mend_file(const std::string& path, Kind kind) {
    if (kind_of(path) != kind) throw CannotMend("its name tells another kind of file");
    const auto answer = answer_for(data_, path);
    if (!answer.exists) {
      check_gone(answer);
      if (TAVOMediaIndexDelete(path.c_str()) == 0) return Mending::kDeleted;
      throw CannotMend("its rows could not be deleted: " + database_.last_error());
    }
    if (answer.library.value_or(0) <= 0) {
      throw CannotMend("it is there, but not chosen for indexing");
    }
    save_again(database_, path, kind);
    return Mending::kSavedAgain;
  }

  /// A disk that is not mounted leaves an empty folder, or none.
  void check_gone(const IndexAnswer& answer) {
    std::error_code error;
    const bool has_chosen = answer.chosen.has_value();
    if (answer.reason == Reason::kShareGone || answer.reason == Reason::kUnreadable ||
        !answer.is_chosen_there || (has_chosen && fs::is_empty(answer.chosen->folder, error)) ||
        is_offline(answer.path)) {
      throw CannotMend("the disk that holds it seems to be away");
    }
  }

  bool is_offline(const std::string& path) {
    return database_.query(filled(kSelectOffline, path.c_str(), path.c_str())).next();
  }

  void take_left() {
    for (const auto& half : find_half_written(database_)) {
      const auto found = reasons_.find(source_of(half));
      std::string reason = "no request of the library mends it";
      if (found != reasons_.end()) {
        reason = found->second;
      } else if (concerns_sheet(half) && half.cue_sheet.empty()) {
        reason = "its cue sheet is not known";
      }
      report_.left.push_back({half, reason});
    }
  }

  const DataFolder& data_;
  Database& database_;
  const std::function<bool()>& stop_;
  std::map<std::string, std::string> reasons_;
  RepairReport report_;
};

}  // namespace

const char* name_of(Mending mending) {
  static constexpr std::array kNames{"saved_again", "deleted", "side_rows_deleted"};
  static_assert(kNames.size() == static_cast<std::size_t>(Mending::kSideRowsDeleted) + 1);
  return kNames.at(static_cast<std::size_t>(mending));
}

RepairReport repair(const DataFolder& data, Database& database, const std::function<bool()>& stop) {
  return Repair(data, database, stop).run();
}

}  // namespace mediidx::tool
