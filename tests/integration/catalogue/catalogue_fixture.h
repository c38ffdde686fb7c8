// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the catalogue's tests share: an open connection, records, and how failures are told.
#ifndef MEDIIDX_TESTS_CATALOGUE_CATALOGUE_FIXTURE_H_
#define MEDIIDX_TESTS_CATALOGUE_CATALOGUE_FIXTURE_H_

#include <string>
#include <string_view>
#include <vector>

#include "database.h"
#include "mediidx/catalogue.h"
#include "platform_fakes.h"

namespace mediidx::test {

using Record = __tag_TAVO_MEDIA_INFO;

/// A zero-filled record with a path and, where given, the texts that the catalogue turns on.
Record record(std::string_view path, std::string_view artist = "", std::string_view album = "",
              std::string_view album_artist = "");
/// The same of a virtual track with its number, starting at "00:00:00".
Record virtual_record(std::string_view path, int track, std::string_view artist = "",
                      std::string_view album = "", std::string_view album_artist = "");
/// Copies a text into a field of a record, cut to it.
template <std::size_t Size>
void set(char (&field)[Size], std::string_view text) {
  text.copy(field, Size - 1);
  field[std::min(text.size(), Size - 1)] = '\0';
}

class CatalogueTest : public DatabaseTest {
 protected:
  CatalogueTest();
  ~CatalogueTest() override;

  /// Inserts a whole track; its id.
  int insert(Record info);
  int insert(Record info, const Record& cue_sheet);
  /// The column of the only row.
  std::string only(const std::string& column, const std::string& table);
  /// "album artist/flag" of the rows of an album, in order of their tracks.
  std::vector<std::string> album_artists(const std::string& album);
  /// Expects one failed statement (the last that was sent) in the log, then these messages.
  void expect_failed_statement(const std::vector<std::string>& messages = {});
  /// Expects these messages, in the shape "mediidx_database:line message", and no other.
  void expect_messages(const std::vector<std::string>& messages, std::size_t first = 0);

  tavodb_connection* conn;
};

}  // namespace mediidx::test

#endif
