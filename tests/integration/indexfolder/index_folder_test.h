// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the tests of the index folders have in common.
#ifndef MEDIIDX_TESTS_INDEXFOLDER_INDEX_FOLDER_TEST_H_
#define MEDIIDX_TESTS_INDEXFOLDER_INDEX_FOLDER_TEST_H_

#include <gmock/gmock.h>
#include <json/value.h>

#include <string>
#include <vector>

#include "log_recorder.h"
#include "mediidx/index_folder.h"
#include "scratch.h"

namespace mediidx::test {

using testing::ElementsAre;
using testing::IsEmpty;

/// Logged lines with the number that a message carries as "N": "mediidx_indexfolder:N …".
std::vector<std::string> log_lines();

/// "pid file signal" of every signal asked for, files below the root.
const std::vector<std::string>& asked_signals();

/// How many shares were asked for; a fixture sees those found freed.
int share_lookups();

/// An entry of a configuration.
Json::Value entry(const std::string& path, bool photo, bool music, bool video);
Json::Value list(const std::vector<Json::Value>& entries);
/// The text of a configuration of so many folders: "/p/0", "/p/1", …
std::string text_of_folders(int count);
std::vector<std::string> paths_of(const Json::Value& conf);

class IndexFolderTest : public testing::Test {
 protected:
  IndexFolderTest();
  ~IndexFolderTest() override;

  /// Adds a share below the root's volume; returns its absolute folder.
  std::string add_share(const std::string& name);
  /// Writes the configuration and loads it.
  void load(const std::string& text);
  void load(const std::vector<Json::Value>& entries);
  std::vector<std::string> loaded_paths() const { return paths_of(gIndexFolderConf); }

  ScratchRoot root;
};

inline constexpr const char* kConf = "usr/tavo/etc/index_folder.conf";

}  // namespace mediidx::test

#endif
