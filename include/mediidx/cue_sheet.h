/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// Cue sheets: the tracks that they cut out of audio files.
#ifndef MEDIIDX_CUE_SHEET_H_
#define MEDIIDX_CUE_SHEET_H_

#include "mediidx/record.h"

#ifdef __cplusplus
#include <string>
#include <string_view>
#include <vector>

extern "C" {
#endif

/// Reads a cue sheet, in whatever character set, into one record per track whose audio file is a
/// music file: path of the audio file, track number, start (mm:ss:ff) as comment, duration in
/// seconds and texts. `*out` is left alone when there is no such track; it is freed with
/// TAVOPlaylistRecFree, also after a failure. 0, or -1.
MEDIIDX_EXPORT int TAVOParseCueByPath(struct _PLAYLIST_REC** out, const char* cuePath);

#ifdef __cplusplus
}  // extern "C"

class MediaInfoCueParser;
namespace mediidx {
int parse_cue_line(MediaInfoCueParser& parser, std::string_view line, const char* cue_path);
}

/// Turns the lines of one cue sheet, in UTF-8, into records. Positions are texts of minutes,
/// seconds and frames (mm:ss:ff) at 75 frames a second. Lines that say too little are ignored.
class MEDIIDX_EXPORT MediaInfoCueParser {
 public:
  MediaInfoCueParser();
  ~MediaInfoCueParser();

  /// The parser's own database connection, opened when there is none; null on failure.
  struct tavodb_connection* PersonalLibraryDBConnect();
  void PersonalLibraryDBClose();
  /// True once a TRACK was read.
  bool GetIsCueSheet();
  int GetFramesFromPos(std::string pos);
  std::string GetPosFromFrames(int frames);
  /// Rebuilds the value that begins at `tokens[index]` and, when quoted, takes up `count` tokens.
  void GetString(std::string& out, std::vector<std::string> tokens, int index, int count);
  /// Adds ("+") or subtracts ("-") a position in place.
  void CalPosition(std::string& pos, std::string offset, std::string op);
  /// Sets a track's duration from its end in its audio file, or, with an empty end, from the file's
  /// duration in the index (minus the track's start when the index does not know it). 0 on failure.
  int CalDuration(std::string endPos, int trackIndex);
  /// Completes the tracks and hands them out as a list; 1, or 0 on failure.
  int OutputResultLists(struct _PLAYLIST_REC** out);
  /// Reads one line of the sheet at `cuePath`; 1, or 0 on failure.
  int ParseCommand(std::string line, const char* cuePath);

 private:
  friend int mediidx::parse_cue_line(MediaInfoCueParser& parser, std::string_view line,
                                     const char* cue_path);
  int ParseLine(std::string_view line, const char* cuePath);
  int ParseFile(std::string_view text, const char* cuePath);
  void ParseTrack(std::string_view number);
  void ParseIndex(std::string_view number, std::string_view position);
  void ParseRemark(std::string_view key, std::string_view text);
  /// The field of the current track, or of the sheet before the first one.
  char (&TextField(char (__tag_TAVO_MEDIA_INFO::*field)[MEDIIDX_TEXT_SIZE]))[MEDIIDX_TEXT_SIZE];
  int CalDurationOfLast(int trackIndex);

  struct tavodb_connection* dbConn;
  bool isCueSheet;
  struct __tag_TAVO_MEDIA_INFO albumInfo;
  std::vector<struct __tag_TAVO_MEDIA_INFO> tracks;
  std::string currentFile;
  std::string pregap;
  std::string postgap;
};
#endif

#endif
