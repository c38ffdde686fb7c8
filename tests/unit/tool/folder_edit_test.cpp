// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "folders/folder_edit.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <tavocore.h>

#include <filesystem>
#include <stdexcept>

#include "mediidx/index_folder.h"
#include "scratch.h"

namespace mediidx::tool {
namespace {

/// The programs that were run, files below the root as the appliance names them.
std::vector<std::string> g_programs;

}  // namespace
}  // namespace mediidx::tool

/// Stands before the platform's.
extern "C" int TLIBCExec(const char* program, const char* arg1, const char* arg2, const char* arg3,
                         const char* arg4) {
  std::string line = program;
  line.erase(0, std::string(TAVOPlatformRootGet()).size());
  for (const char* argument : {arg1, arg2, arg3, arg4}) {
    if (argument) line += " " + std::string(argument);
  }
  mediidx::tool::g_programs.push_back(line);
  return 0;
}

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

const KindFlags kAllKinds{{"music", true}, {"photo", true}, {"video", true}};
constexpr const char* kCheck = "/usr/tavo/bin/tavoindex_mgr --check-indexbit";

class AFolderEdit : public testing::Test {
 protected:
  AFolderEdit() {
    apply([&](FolderEdit& edit) {
      for (const auto& folder : {m, n}) edit.add(folder, "a name", kAllKinds);
    });
    g_programs.clear();
  }

  template <class Change>
  void apply(Change&& change, bool drop_missing = false) const {
    FolderEdit edit(data, drop_missing);
    change(edit);
    edit.apply();
  }
  static std::string drop(const std::string& folder) {
    return "/usr/tavo/bin/tavoindex -D " + folder + " -P MediaIndex";
  }
  static std::string add(const std::string& folder) {
    return "/usr/tavo/bin/tavoindex -A " + folder + " -P MediaIndex";
  }

  test::ScratchRoot scratch;
  DataFolder data{scratch.at("d")};
  std::string m = scratch.make_folder("m");
  std::string n = scratch.make_folder("n");
};

TEST_F(AFolderEdit, ThatAddsHasTheSharesCheckedAndThatFolderIndexed) {
  const auto folder = scratch.make_folder("o");
  apply([&](FolderEdit& edit) { edit.add(folder, "o", kAllKinds); });
  EXPECT_THAT(g_programs, ElementsAre(kCheck, drop(folder), add(folder)));
}

TEST_F(AFolderEdit, ThatSetsKindsHasThatFolderIndexedAgain) {
  apply([&](FolderEdit& edit) { edit.set(m, {{"music", false}}); });
  EXPECT_THAT(g_programs, ElementsAre(drop(m), add(m)));
  const auto conf = IndexFolderConfOpen();
  ASSERT_EQ(conf.size(), 2U);
  EXPECT_EQ(conf[0], createRule("a name", "/m", true, false, true, false));
  EXPECT_EQ(conf[1], createRule("a name", "/n", true, true, true, false));
}

TEST_F(AFolderEdit, ThatRemovesHasThatFolderDroppedAndThenTheSharesChecked) {
  apply([&](FolderEdit& edit) { edit.remove(m); });
  EXPECT_THAT(g_programs, ElementsAre(drop(m), add(m), kCheck));
}

TEST_F(AFolderEdit, ThatGivesUpWhatIsAwayDropsItBeforeTheOthers) {
  fs::remove(n);
  apply([&](FolderEdit& edit) { edit.set(m, {{"music", false}}); }, /*drop_missing=*/true);
  EXPECT_THAT(g_programs, ElementsAre(drop(n), add(n), kCheck, drop(m), add(m)));
}

TEST_F(AFolderEdit, IsRefusedWhileAFolderIsAway) {
  fs::remove(n);
  try {
    const FolderEdit edit(data, /*drop_missing=*/false);
    FAIL() << "not refused";
  } catch (const std::runtime_error& error) {
    EXPECT_THAT(error.what(), HasSubstr(n + " is not there"));
  }
  EXPECT_THAT(g_programs, IsEmpty());
}

TEST_F(AFolderEdit, TellsWhatItWillDoInOrder) {
  fs::remove(n);
  const auto folder = scratch.make_folder("o");
  FolderEdit edit(data, /*drop_missing=*/true);
  edit.set(m, {{"video", false}});
  edit.add(folder, "o", kAllKinds);
  std::vector<std::string> folders;
  for (const auto& change : edit.changes()) folders.push_back(change.folder);
  EXPECT_THAT(folders, ElementsAre(n, folder, m));
}

}  // namespace
}  // namespace mediidx::tool
