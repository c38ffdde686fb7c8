// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavodb.h>
#include <tavoindex.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdlib>
#include <limits>
#include <optional>
#include <string_view>

#include "mediidx/cue_sheet.h"
#include "mediidx/playlist.h"
#include "mediidx/request.h"
#include "playlist/cue_durations.h"
#include "playlist/cue_position.h"
#include "support/log.h"
#include "support/owned.h"
#include "support/statement.h"
#include "support/text.h"

namespace mediidx {
namespace {

constexpr Template<const char*> kSelectMusic{"SELECT * FROM music WHERE path = '@TAVO:VAR'"};

/// One comparison for what most characters are.
constexpr bool is_white_space(char c) {
  return static_cast<unsigned char>(c) <= ' ' && (c == ' ' || (c >= '\t' && c <= '\r'));
}

std::string_view without_leading_space(std::string_view text) {
  const auto* begin = std::ranges::find_if_not(text, is_white_space);
  return {begin, text.end()};
}

std::string_view trimmed(std::string_view text) {
  while (!text.empty() && is_white_space(text.back())) text.remove_suffix(1);
  return without_leading_space(text);
}

/// Takes the first word, and the white space behind it, off a trimmed text.
std::string_view take_word(std::string_view& text) {
  const auto* end = std::ranges::find_if(text, is_white_space);
  const std::string_view word(text.begin(), end);
  text = without_leading_space({end, text.end()});
  return word;
}

/// A trimmed text of one word stays as it is.
std::string_view without_last_word(std::string_view text) {
  auto length = text.size();
  while (length > 0 && !is_white_space(text[length - 1])) --length;
  return length == 0 ? text : trimmed(text.substr(0, length));
}

/// A trimmed text with every run of white space as one blank; kept in `room` where that changes it.
std::string_view with_single_blanks(std::string_view text, std::string& room) {
  const auto is_run = [](char a, char b) {
    return is_white_space(a) && (a != ' ' || is_white_space(b));
  };
  if (std::ranges::adjacent_find(text, is_run) == text.end()) return text;
  while (!text.empty()) {
    if (!room.empty()) room += ' ';
    room += take_word(text);
  }
  return room;
}

/// The value that a trimmed text gives: its first word or, where that has a quote, all of it
/// without its first and last character. What is not a part of the text is kept in `room`, which is
/// empty.
std::string_view value_of(std::string_view text, std::string& room) {
  auto rest = text;
  const auto word = take_word(rest);
  if (word.find('"') == word.npos) return word;
  auto value = with_single_blanks(text, room).substr(1);
  if (!value.empty()) value.remove_suffix(1);
  return value;
}

float seconds(std::int32_t frames) {
  return static_cast<float>(frames / static_cast<double>(kFramesPerSecond));
}

/// Truncates toward zero; what no frame count can hold becomes the nearest that can.
std::int32_t frames_from_seconds(double duration_s) {
  using Range = std::numeric_limits<std::int32_t>;
  const double frames = duration_s * kFramesPerSecond;
  if (std::isnan(frames)) return 0;
  if (frames >= Range::max()) return Range::max();
  if (frames <= Range::min()) return Range::min();
  return static_cast<std::int32_t>(frames);
}

/// From a track's start to where it ends, less its postgap.
float duration_until(std::int32_t end, const std::string& postgap, const char* start) {
  const auto gap = postgap.empty() ? 0 : frames_from_position(postgap);
  return seconds(subtract_frames(subtract_frames(end, gap), frames_from_position(start)));
}

/// Zeroed memory is given what a track of a sheet says; all else stays zero.
void fill_record(__tag_TAVO_MEDIA_INFO& record, const __tag_TAVO_MEDIA_INFO& track,
                 const __tag_TAVO_MEDIA_INFO& album) {
  copy_text(record.path, track.path);
  copy_text(record.title, track.title);
  copy_text(record.artist, track.artist);
  copy_text(record.composer, track.composer[0] ? track.composer : album.composer);
  copy_text(record.comment, track.comment);
  copy_text(record.album, album.title);
  copy_text(record.album_artist, album.artist);
  copy_text(record.genre, album.genre);
  record.track = track.track;
  record.year = album.year;
  record.duration = track.duration;
}

/// What the index knows of an audio file's length.
struct FileEnd {
  bool failed = false;
  std::optional<std::int32_t> frames;  ///< Empty when the index does not know the file.
};

bool is_indexed(const std::string& audio_path) {
  return TAVOMediaIndexIsIndexPath(audio_path.c_str(), MEDIA_TABLE_MUSIC) > 0;
}

FileEnd known_file_end(CueDurations& durations, const std::string& audio_path) {
  if (!is_indexed(audio_path)) return {};
  const auto duration = durations.find(audio_path);
  if (!duration) return {};
  return {false, frames_from_seconds(std::strtod(duration->c_str(), nullptr))};
}

FileEnd find_file_end(tavodb_connection* conn, const std::string& audio_path) {
  constexpr FileEnd kFailed{true, std::nullopt};
  if (!is_indexed(audio_path)) return {};
  const auto sql = fill(TAVODBDatabaseTypeGet(conn), kSelectMusic, audio_path.c_str());
  if (!sql) return kFailed;
  OwnedResult result;
  if (TAVODBExecute(conn, sql.get(), out(result)) == -1) {
    kCueLog.colon(255, "Failed to exec [%s] (%s)", sql.get(), TAVODBErrorGet(conn));
    return kFailed;
  }
  if (TAVODBNumRows(result.get()) == 0) return {};
  std::uint32_t row = 0;
  if (TAVODBFetchRow(result.get(), &row) == -1) {
    kCueLog.colon(266, "Failed to fetch row");
    return kFailed;
  }
  const char* duration = TAVODBFetchField(result.get(), row, "duration");
  return {false, frames_from_seconds(duration ? std::strtod(duration, nullptr) : 0)};
}

}  // namespace
}  // namespace mediidx

using mediidx::copy_text;
using mediidx::kCueLog;

MediaInfoCueParser::MediaInfoCueParser() : dbConn(nullptr), isCueSheet(false), albumInfo() {}

MediaInfoCueParser::~MediaInfoCueParser() = default;

tavodb_connection* MediaInfoCueParser::PersonalLibraryDBConnect() {
  if (!dbConn) dbConn = TAVODBConnect(nullptr, "postgres", nullptr, "mediaserver");
  return dbConn;
}

void MediaInfoCueParser::PersonalLibraryDBClose() {
  if (!dbConn) return;
  TAVODBClose(dbConn);
  dbConn = nullptr;
}

bool MediaInfoCueParser::GetIsCueSheet() { return isCueSheet; }

int MediaInfoCueParser::GetFramesFromPos(std::string pos) {
  return mediidx::frames_from_position(pos);
}

std::string MediaInfoCueParser::GetPosFromFrames(int frames) {
  return mediidx::position_from_frames(frames);
}

void MediaInfoCueParser::GetString(std::string& out, std::vector<std::string> tokens, int index,
                                   int count) {
  if (index < 0 || static_cast<std::size_t>(index) >= tokens.size()) return;
  const auto first = static_cast<std::size_t>(index);
  out = tokens[first];
  if (out.find('"') == out.npos) return;
  for (std::size_t k = 1; static_cast<int>(k) < count && first + k < tokens.size(); ++k) {
    out += ' ' + tokens[first + k];
  }
  out.erase(0, 1);
  if (!out.empty()) out.pop_back();
}

void MediaInfoCueParser::CalPosition(std::string& pos, std::string offset, std::string op) {
  auto frames = mediidx::frames_from_position(pos);
  const auto difference = mediidx::frames_from_position(offset);
  if (op == "+") frames = mediidx::add_frames(frames, difference);
  if (op == "-") frames = mediidx::subtract_frames(frames, difference);
  pos = mediidx::position_from_frames(frames);
}

int MediaInfoCueParser::CalDuration(std::string endPos, int trackIndex) {
  if (trackIndex < 0 || static_cast<std::size_t>(trackIndex) >= tracks.size()) return 0;
  if (endPos.empty()) return CalDurationOfLast(trackIndex);
  auto& track = tracks[static_cast<std::size_t>(trackIndex)];
  track.duration =
      mediidx::duration_until(mediidx::frames_from_position(endPos), postgap, track.comment);
  return 1;
}

int MediaInfoCueParser::CalDurationOfLast(int trackIndex) {
  mediidx::FileEnd end;
  if (auto* durations = mediidx::CueDurations::current()) {
    end = mediidx::known_file_end(*durations, currentFile);
  } else {
    tavodb_connection* conn = PersonalLibraryDBConnect();
    if (!conn) {
      kCueLog.colon(239, "Failed to connect to database.");
      return 1;  // the track keeps the duration that it has
    }
    end = mediidx::find_file_end(conn, currentFile);
    PersonalLibraryDBClose();
  }
  if (end.failed) return 0;
  // Callers know a file that is not indexed by a duration of minus the track's start.
  auto& track = tracks[static_cast<std::size_t>(trackIndex)];
  track.duration = mediidx::duration_until(end.frames.value_or(0), postgap, track.comment);
  return 1;
}

int MediaInfoCueParser::OutputResultLists(_PLAYLIST_REC** out) {
  if (CalDuration("", static_cast<int>(tracks.size()) - 1) == 0) return 0;
  _PLAYLIST_REC** end = out;
  for (const auto& track : tracks) {
    if (!BlTAVOIndexIsMusicFile(track.path)) continue;
    auto* node = static_cast<_PLAYLIST_REC*>(std::calloc(1, sizeof(_PLAYLIST_REC)));
    if (!node) {
      kCueLog.colon(452, "Failed to calloc.");
      return 0;
    }
    mediidx::fill_record(node->info, track, albumInfo);
    *end = node;
    end = &node->next;
  }
  return 1;
}

int MediaInfoCueParser::ParseFile(std::string_view text, const char* cuePath) {
  const auto count = static_cast<int>(tracks.size());
  if (count > 0 && tracks.back().comment[0] && CalDuration("", count - 1) == 0) return 0;
  const std::string_view sheet(cuePath);
  std::string room;
  currentFile = sheet.substr(0, sheet.rfind('/') + 1);
  // The last word is the file's type.
  currentFile += mediidx::value_of(mediidx::without_last_word(text), room);
  return 1;
}

void MediaInfoCueParser::ParseTrack(std::string_view number) {
  // Records are large to move, and what is not used of their memory is never touched.
  constexpr std::size_t kTracksOfADisc = 99;
  if (tracks.empty()) tracks.reserve(kTracksOfADisc);
  tracks.emplace_back();
  tracks.back().track = static_cast<int>(mediidx::leading_number(number));
  isCueSheet = true;
  pregap.clear();
}

void MediaInfoCueParser::ParseIndex(std::string_view number, std::string_view position) {
  if (tracks.empty()) return;
  if (tracks.size() > 1) {
    // A predecessor in another file ends with that file, not here.
    auto& previous = tracks[tracks.size() - 2];
    if (!previous.path[0] || previous.path == currentFile) {
      previous.duration = mediidx::duration_until(mediidx::frames_from_position(position), postgap,
                                                  previous.comment);
    }
  }
  if (mediidx::leading_number(number) != 1) return;
  std::string start(position);
  auto& track = tracks.back();
  copy_text(std::span(track.path).first<MEDIIDX_PATH_SIZE>(), currentFile);
  if (!pregap.empty()) CalPosition(start, pregap, "+");
  copy_text(track.comment, start);
  postgap.clear();
}

void MediaInfoCueParser::ParseRemark(std::string_view key, std::string_view text) {
  std::string room;
  const auto value = mediidx::value_of(text, room);
  if (key == "GENRE") copy_text(albumInfo.genre, value);
  if (key == "DATE") albumInfo.year = static_cast<int>(mediidx::leading_number(value));
}

char (&MediaInfoCueParser::TextField(
    char (__tag_TAVO_MEDIA_INFO::*field)[MEDIIDX_TEXT_SIZE]))[MEDIIDX_TEXT_SIZE] {
  auto& record = tracks.empty() ? albumInfo : tracks.back();
  return record.*field;
}

int MediaInfoCueParser::ParseCommand(std::string line, const char* cuePath) {
  return ParseLine(line, cuePath);
}

int mediidx::parse_cue_line(MediaInfoCueParser& parser, std::string_view line,
                            const char* cue_path) {
  return parser.ParseLine(line, cue_path);
}

int MediaInfoCueParser::ParseLine(std::string_view line, const char* cuePath) {
  auto text = mediidx::trimmed(line);
  const auto command = mediidx::take_word(text);
  if (text.empty()) return 1;  // no command does anything without a value
  if (command == "FILE") return ParseFile(text, cuePath);
  if (command == "TRACK") {
    ParseTrack(mediidx::take_word(text));
  } else if (command == "INDEX") {
    const auto number = mediidx::take_word(text);
    if (!text.empty()) ParseIndex(number, mediidx::take_word(text));
  } else if (command == "PREGAP") {
    pregap = mediidx::take_word(text);
  } else if (command == "POSTGAP") {
    postgap = mediidx::take_word(text);
  } else if (command == "REM") {
    const auto key = mediidx::take_word(text);
    if (!text.empty()) ParseRemark(key, text);
  } else {
    struct TextCommand {
      std::string_view name;
      char (__tag_TAVO_MEDIA_INFO::*field)[MEDIIDX_TEXT_SIZE];
    };
    static constexpr std::array kTextCommands{
        TextCommand{"TITLE", &__tag_TAVO_MEDIA_INFO::title},
        TextCommand{"PERFORMER", &__tag_TAVO_MEDIA_INFO::artist},
        TextCommand{"SONGWRITER", &__tag_TAVO_MEDIA_INFO::composer},
    };
    for (const auto& known : kTextCommands) {
      if (known.name != command) continue;
      std::string room;
      copy_text(TextField(known.field), mediidx::value_of(text, room));
    }
  }
  return 1;
}
