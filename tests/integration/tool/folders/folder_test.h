// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the tests of the folders chosen for indexing have in common.
#ifndef MEDIIDX_TESTS_INTEGRATION_TOOL_FOLDERS_FOLDER_TEST_H_
#define MEDIIDX_TESTS_INTEGRATION_TOOL_FOLDERS_FOLDER_TEST_H_

#include <gmock/gmock.h>
#include <json/value.h>

#include <string>
#include <vector>

#include "database.h"
#include "integration/tool/command.h"

namespace mediidx::test {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using Words = std::vector<std::string>;

/// A data folder and media on the test's server.
class FolderTest : public DatabaseTest {
 protected:
  /// Runs the command on this test's data folder.
  Outcome run(Words words) const;
  /// The output of a run that has to succeed.
  std::string output(const Words& words) const;
  /// The same with --json, understood.
  Json::Value json(Words words) const;
  /// Runs one of the programs that the library starts, from below the root.
  Outcome run_program(const std::string& name, const Words& words) const;
  /// A settings file below the root.
  std::string settings(const std::string& name) const {
    return data.at("d/root/usr/tavo/etc/" + name);
  }
  /// One song, photo and video in a folder below the media.
  void fill(const std::string& folder) const;
  /// The stored paths of a table, those below the media folder without it.
  std::vector<std::string> stored(const std::string& table);

  OpenFolder data;
  OpenFolder media;
};

Json::Value read_json(const std::string& file);

}  // namespace mediidx::test

#endif
