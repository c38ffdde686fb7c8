// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The stars that users give to songs.
#include <tavoindex.h>

#include <charconv>

#include "cli/file_operand.h"
#include "cli/output.h"
#include "cli/rating_words.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "mediidx/index_folder.h"
#include "ratings/rated_songs.h"
#include "ratings/rating_file.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

int number_word(const std::string& word, const char* what, int least, int most) {
  int number = -1;
  const auto read = std::from_chars(word.data(), word.data() + word.size(), number);
  if (read.ec != std::errc() || read.ptr != word.data() + word.size() || number < least ||
      number > most) {
    throw UsageError("\"" + escape_for_display(word) + "\" is no " + what);
  }
  return number;
}

std::optional<int> asked_track(const Arguments& arguments) {
  const auto word = arguments.value("--track");
  constexpr int kMostTracks = 99;  // of a cue sheet
  if (!word) return std::nullopt;
  return number_word(*word, "number of a track", 1, kMostTracks);
}

void check_song(const std::string& path) {
  if (BlTAVOIndexIsMusicFile(path.c_str()) != 1) throw no_such_kind(path, "song");
}

void check_known(Database& database, const Song& song) {
  if (!song.track || is_indexed(database, song)) return;
  throw std::runtime_error("the index knows no track " + std::to_string(*song.track) + " of " +
                           escape_for_display(song.path));
}

}  // namespace

int run_rating_set(const Arguments& arguments) {
  const int stars = number_word(arguments.operands[1], "number of stars, 0 to 5", 0, kMostStars);
  const Song song{stored_path(readable_file(arguments.operands[0])), asked_track(arguments)};
  check_song(song.path);
  const DataFolder data(arguments.value("--data-dir"));
  const auto user = asked_user(arguments);
  IndexFolderInit();
  Database database(data);
  check_known(database, song);
  write_rating(song.key(), user.id, stars);
  const bool is_known = update_index(database, song);
  if (!is_known) complain(escape_for_display(song.path) + " is not in the index");
  if (!arguments.has("--json")) return kExitDone;
  auto object = song_json(song);
  object["userid"] = user.id;
  object["user"] = json_text(user.name);
  object["stars"] = stars;
  object["indexed"] = is_known;
  put_json(object);
  return kExitDone;
}

int run_rating_show(const Arguments& arguments) {
  const Song song{stored_path(arguments.operands[0]), asked_track(arguments)};
  check_song(song.path);
  const DataFolder data(arguments.value("--data-dir"));
  auto ratings = read_ratings(song.key());
  if (arguments.has("--user")) {
    const auto user = asked_user(arguments);
    std::erase_if(ratings, [&user](const auto& rating) { return rating.first != user.id; });
  }
  if (arguments.has("--json")) {
    JsonList list;
    for (const auto& [id, stars] : ratings) {
      Json::Value object;
      object["userid"] = id;
      object["user"] = json_text(name_of_user(id));
      object["stars"] = stars;
      list.add(object);
    }
    list.finish();
    return kExitDone;
  }
  std::vector<TableRow> lines;
  for (const auto& [id, stars] : ratings) {
    lines.push_back({std::to_string(stars), name_of_user(id), std::to_string(id)});
  }
  put_table({{"Stars", true}, {"User"}, {"Id", true}}, lines);
  return kExitDone;
}

}  // namespace mediidx::tool
