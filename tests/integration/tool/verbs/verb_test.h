// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the tests of the command's verbs have in common.
#ifndef MEDIIDX_TESTS_TOOL_VERB_TEST_H_
#define MEDIIDX_TESTS_TOOL_VERB_TEST_H_

#include <gmock/gmock.h>
#include <json/value.h>

#include <string>
#include <vector>

#include "database.h"
#include "integration/tool/command.h"

namespace mediidx::test {

using testing::HasSubstr;
using testing::IsEmpty;
using Words = std::vector<std::string>;

/// A song to be saved; everything but the path may be empty.
struct Song {
  std::string path{};
  std::string title{};
  std::string artist{};
  std::string album{};
  std::string composer{};
  std::string genre{};
  float duration = 0;
  long filesize = 0;
};

/// A fresh database behind the built command. Rows are saved by the test itself.
class VerbTest : public DatabaseTest {
 protected:
  VerbTest();

  /// Runs the command on this test's data folder.
  Outcome run(Words words, Setting setting = {}) const;
  /// The output of a run that has to succeed, without complaints.
  std::string output(const Words& words) const;
  /// The same with --json, understood.
  Json::Value json(Words words) const;
  /// A path in the share that is indexed; its file is not made.
  std::string at(const std::string& name) const { return media.at(name); }
  /// Saves a song through the library; its id.
  unsigned save(const Song& song) const;
  /// Saves a row of every kind that has an online state.
  void insert(const std::string& path, bool online = true);

  OpenFolder media;
  OpenFolder data;
};

/// Members of the objects of an array.
std::vector<std::string> column(const Json::Value& array, const char* name);
/// The lines of a text.
std::vector<std::string> lines(const std::string& text);

}  // namespace mediidx::test

#endif
