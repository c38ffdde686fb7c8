// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the tests of the verbs that explain, mend and rate have in common.
#ifndef MEDIIDX_TESTS_TOOL_EXPLAIN_TEST_H_
#define MEDIIDX_TESTS_TOOL_EXPLAIN_TEST_H_

#include <string>

#include "integration/tool/verbs/verb_test.h"

namespace mediidx::test {

/// The command and the library of the test see the same settings, those of the command's data
/// folder: the share "media" is the test's media folder, indexed for every kind. The user "ada" has
/// the id 1026 and the home "ada" beside the media.
class ExplainTest : public VerbTest {
 protected:
  ExplainTest();

  /// Replaces the folders chosen for indexing: the array's objects.
  void choose(const std::string& entries) const;
  /// Replaces the shares: the object's members.
  void set_shares(const std::string& members) const;
  /// A run whose exit status is this one; its output, understood.
  Json::Value json_with(int status, Words words) const;
  /// Copies a file of the sample library into the media.
  std::string sample(const std::string& sample, const std::string& name) const {
    return media.take_sample(sample, name);
  }
  /// Indexes the media; every file has to go in.
  void index() const;
  /// A file in the home of the user "ada".
  std::string at_home(const std::string& name) const { return home.at("ada/" + name); }

  OpenFolder home;

 private:
  void load() const;
};

}  // namespace mediidx::test

#endif
