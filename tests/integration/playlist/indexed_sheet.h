// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Cue sheets and audio files in an indexed folder, brought in through the requests.
#ifndef MEDIIDX_TESTS_PLAYLIST_INDEXED_SHEET_H_
#define MEDIIDX_TESTS_PLAYLIST_INDEXED_SHEET_H_

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <vector>

#include "database.h"
#include "mediidx/types.h"

namespace mediidx::test {

class IndexedSheetTest : public DatabaseTest {
 protected:
  IndexedSheetTest();

  std::string at(const std::string& name) const { return folder + "/" + name; }
  void set_code_page(const std::string& code) const;

  static int add(const std::string& path, MEDIA_TABLE_TYPE type, int duration_s = 600);
  int add_audio(const std::string& name = "a.flac", int duration_s = 600);
  int add_sheet(const std::string& name, const std::string& content);
  /// Removes a file, then its rows.
  int remove(const std::string& name);

  enum class LastDurations { kKept, kLeftOut };
  /// Every column but the ids of every row, in an order of its own; the durations of each file's
  /// last track may be left out.
  std::vector<Row> catalogue(LastDurations last = LastDurations::kKept);
  long rows_left() { return static_cast<long>(catalogue().size()); }
  /// An empty database again, in the same root.
  static void start_anew();

  std::string folder = root.make_folder("volume1/music");
};

/// The bytes of a text, given in UTF-8, in a character set that iconv knows.
std::string in_charset(const std::string& text, const char* charset);

}  // namespace mediidx::test

#endif
