// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Ratings out of tags, and into them.
#include <algorithm>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/progress.h"
#include "cli/rating_words.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "mediidx/index_folder.h"
#include "ratings/transfer.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

/// A song that could not be dealt with.
struct Failure {
  Song song;
  std::string reason;
};

void complain_of(const Failure& failure) {
  complain(escape_for_display(failure.song.path) + ": " + escape_for_display(failure.reason));
}

Json::Value to_json(const Failure& failure) {
  auto out = song_json(failure.song);
  out["reason"] = json_text(failure.reason);
  return out;
}

class Import {
 public:
  Import(Database& database, const RatingUser& user, bool replace)
      : database_(database), user_(user), replace_(replace) {}

  /// Tags are of files; a track that a cue sheet cuts out has none.
  void take(const Song& song) {
    if (song.track) return;
    const auto [result, stars] = import_rating(database_, song, user_, replace_);
    if (result == ImportResult::kKept) ++kept_;
    if (result == ImportResult::kUnrated) ++unrated_;
    if (result == ImportResult::kImported) imported_.push_back({song, stars});
  }

  void print_json(const std::vector<Failure>& failures) const {
    Json::Value out;
    auto& imported = out["imported"] = Json::Value(Json::arrayValue);
    for (const auto& [song, stars] : imported_) {
      auto object = song_json(song);
      object["stars"] = stars;
      imported.append(object);
    }
    out["kept"] = Json::UInt64{kept_};
    out["unrated"] = Json::UInt64{unrated_};
    auto& failed = out["failed"] = Json::Value(Json::arrayValue);
    for (const auto& failure : failures) failed.append(to_json(failure));
    put_json(out);
  }

  void print() const {
    std::vector<TableRow> lines;
    for (const auto& [song, stars] : imported_) {
      lines.push_back({std::to_string(stars), song.path});
    }
    if (!lines.empty()) put_table({{"Stars", true}, {"Path", false, true}}, lines);
    complain(std::to_string(imported_.size()) + " imported, " + std::to_string(kept_) +
             " kept as they were, " + std::to_string(unrated_) + " without a rating");
  }

 private:
  struct Taken {
    Song song;
    int stars;
  };

  Database& database_;
  const RatingUser& user_;
  bool replace_;
  std::vector<Taken> imported_;
  std::size_t kept_ = 0;
  std::size_t unrated_ = 0;
};

class Export {
 public:
  Export(Database& database, const RatingUser& user, bool write_tags)
      : database_(database), user_(user), write_tags_(write_tags) {}

  void take(const Song& song) {
    const auto stars = stars_of(song, user_);
    if (!stars) return;
    auto& given = given_.emplace_back(Given{song, *stars, false});
    if (!write_tags_ || song.track) return;
    given.is_written = export_rating(database_, song, user_, *stars);
  }

  void print_json(const std::vector<Failure>& failures) const {
    Json::Value out;
    auto& ratings = out["ratings"] = Json::Value(Json::arrayValue);
    for (const auto& given : given_) {
      auto object = song_json(given.song);
      object["stars"] = given.stars;
      if (write_tags_) object["written"] = given.is_written;
      ratings.append(object);
    }
    auto& failed = out["failed"] = Json::Value(Json::arrayValue);
    for (const auto& failure : failures) failed.append(to_json(failure));
    put_json(out);
  }

  void print() const {
    std::vector<Column> columns{{"Stars", true}, {"Track", true}, {"Path", false, true}};
    if (write_tags_) columns.push_back({"Tag"});
    std::vector<TableRow> lines;
    for (const auto& given : given_) {
      lines.push_back({std::to_string(given.stars),
                       given.song.track ? std::to_string(*given.song.track) : "", given.song.path});
      if (write_tags_) lines.back().push_back(given.is_written ? "written" : "");
    }
    put_table(columns, lines);
  }

 private:
  struct Given {
    Song song;
    int stars;
    bool is_written;
  };

  Database& database_;
  const RatingUser& user_;
  bool write_tags_;
  std::vector<Given> given_;
};

/// Takes every song that is meant; those that cannot be dealt with.
template <class Transfer>
std::vector<Failure> take_all(Transfer& transfer, Database& database,
                              const std::vector<Song>& songs) {
  std::vector<Failure> failures;
  Progress progress(songs.size());
  for (const auto& song : songs) {
    if (noted_signal()) break;
    progress.step(song.path);
    try {
      transfer.take(song);
    } catch (const std::runtime_error& error) {
      failures.push_back({song, error.what()});
      if (!database.answers()) throw;
    }
  }
  return failures;
}

/// Runs a transfer over the songs of the path that is named, or all.
template <class Transfer>
int run_transfer(const Arguments& arguments, const char* switched_by) {
  const DataFolder data(arguments.value("--data-dir"));
  const auto user = asked_user(arguments);
  const auto path = arguments.operands.empty() ? "" : stored_path(arguments.operands[0]);
  IndexFolderInit();
  Database database(data);
  Transfer transfer(database, user, arguments.has(switched_by));
  const auto failures = take_all(transfer, database, find_songs(database, path));
  if (arguments.has("--json")) {
    transfer.print_json(failures);
  } else {
    transfer.print();
    std::ranges::for_each(failures, complain_of);
  }
  if (noted_signal()) return kExitSignal + noted_signal();
  return failures.empty() ? kExitDone : kExitSomeFailed;
}

}  // namespace

int run_rating_import(const Arguments& arguments) {
  return run_transfer<Import>(arguments, "--replace");
}

int run_rating_export(const Arguments& arguments) {
  return run_transfer<Export>(arguments, "--write-tags");
}

}  // namespace mediidx::tool
