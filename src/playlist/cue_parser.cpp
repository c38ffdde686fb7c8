// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavodb.h>
#include <tavoindex.h>

#include <array>
#include <cmath>
#include <cstdlib>
#include <cstring>
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

std::vector<std::string> split_at_white_space(std::string_view line) {
  constexpr std::string_view kWhiteSpace = " \t\n\v\f\r";
  std::vector<std::string> tokens;
  for (auto begin = line.find_first_not_of(kWhiteSpace); begin != line.npos;) {
    const auto end = line.find_first_of(kWhiteSpace, begin);
    tokens.emplace_back(line.substr(begin, end - begin));
    begin = line.find_first_not_of(kWhiteSpace, end);
  }
  return tokens;
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
  if (!postgap.empty()) CalPosition(endPos, postgap, "-");
  track.duration = mediidx::seconds(mediidx::subtract_frames(
      mediidx::frames_from_position(endPos), mediidx::frames_from_position(track.comment)));
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
  if (end.frames) return CalDuration(mediidx::position_from_frames(*end.frames), trackIndex);
  // Callers know a file that is not indexed by a duration of minus the track's start.
  auto& track = tracks[static_cast<std::size_t>(trackIndex)];
  const auto start = mediidx::frames_from_position(track.comment);
  const auto gap = mediidx::frames_from_position(postgap);
  track.duration =
      mediidx::seconds(mediidx::subtract_frames(mediidx::subtract_frames(0, start), gap));
  return 1;
}

int MediaInfoCueParser::OutputResultLists(_PLAYLIST_REC** out) {
  if (CalDuration("", static_cast<int>(tracks.size()) - 1) == 0) return 0;
  _PLAYLIST_REC** end = out;
  for (auto& track : tracks) {
    if (!BlTAVOIndexIsMusicFile(track.path)) continue;
    std::memcpy(track.album, albumInfo.title, sizeof(track.album));
    std::memcpy(track.album_artist, albumInfo.artist, sizeof(track.album_artist));
    if (!track.composer[0]) std::memcpy(track.composer, albumInfo.composer, sizeof(track.composer));
    std::memcpy(track.genre, albumInfo.genre, sizeof(track.genre));
    track.year = albumInfo.year;
    auto* node = static_cast<_PLAYLIST_REC*>(std::calloc(1, sizeof(_PLAYLIST_REC)));
    if (!node) {
      kCueLog.colon(452, "Failed to calloc.");
      return 0;
    }
    node->info = track;
    *end = node;
    end = &node->next;
  }
  return 1;
}

int MediaInfoCueParser::ParseFile(const Tokens& tokens, const char* cuePath) {
  const auto count = static_cast<int>(tracks.size());
  if (count > 0 && tracks.back().comment[0] && CalDuration("", count - 1) == 0) return 0;
  GetString(currentFile, tokens, 1, static_cast<int>(tokens.size()) - 2);
  const std::string_view sheet(cuePath);
  currentFile.insert(0, sheet.substr(0, sheet.rfind('/') + 1));
  return 1;
}

void MediaInfoCueParser::ParseTrack(const Tokens& tokens) {
  tracks.emplace_back();
  tracks.back().track = static_cast<int>(std::strtol(tokens[1].c_str(), nullptr, 10));
  isCueSheet = true;
  pregap.clear();
}

int MediaInfoCueParser::ParseIndex(const Tokens& tokens) {
  if (tracks.empty()) return 1;
  if (tracks.size() > 1) {
    // A predecessor in another file ends with that file, not here.
    const auto previous = tracks.size() - 2;
    const std::string_view path = tracks[previous].path;
    if ((path.empty() || path == currentFile) &&
        CalDuration(tokens[2], static_cast<int>(previous)) == 0) {
      return 0;
    }
  }
  if (std::strtol(tokens[1].c_str(), nullptr, 10) != 1) return 1;
  auto position = tokens[2];
  auto& track = tracks.back();
  copy_text(std::span(track.path).first<MEDIIDX_PATH_SIZE>(), currentFile);
  if (!pregap.empty()) CalPosition(position, pregap, "+");
  copy_text(track.comment, position);
  postgap.clear();
  return 1;
}

void MediaInfoCueParser::ParseRemark(const Tokens& tokens) {
  std::string value;
  GetString(value, tokens, 2, static_cast<int>(tokens.size()) - 2);
  if (tokens[1] == "GENRE") copy_text(albumInfo.genre, value);
  if (tokens[1] == "DATE") {
    albumInfo.year = static_cast<int>(std::strtol(value.c_str(), nullptr, 10));
  }
}

char (&MediaInfoCueParser::TextField(
    char (__tag_TAVO_MEDIA_INFO::*field)[MEDIIDX_TEXT_SIZE]))[MEDIIDX_TEXT_SIZE] {
  auto& record = tracks.empty() ? albumInfo : tracks.back();
  return record.*field;
}

int MediaInfoCueParser::ParseCommand(std::string line, const char* cuePath) {
  const auto tokens = mediidx::split_at_white_space(line);
  const auto count = tokens.size();
  if (count < 2) return 1;  // no command does anything without a value
  const auto& command = tokens[0];
  if (command == "FILE") return ParseFile(tokens, cuePath);
  if (command == "TRACK") {
    ParseTrack(tokens);
  } else if (command == "INDEX") {
    if (count > 2) return ParseIndex(tokens);
  } else if (command == "PREGAP") {
    pregap = tokens[1];
  } else if (command == "POSTGAP") {
    postgap = tokens[1];
  } else if (command == "REM") {
    if (count > 2) ParseRemark(tokens);
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
    for (const auto& text : kTextCommands) {
      if (text.name != command) continue;
      std::string value;
      GetString(value, tokens, 1, static_cast<int>(count) - 1);
      copy_text(TextField(text.field), value);
    }
  }
  return 1;
}
