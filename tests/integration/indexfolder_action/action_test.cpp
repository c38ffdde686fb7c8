// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <dlfcn.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <json/reader.h>
#include <tavocore.h>
#include <tavosdk.h>

#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

#include "log_recorder.h"
#include "mediidx/index_folder.h"
#include "mediidx/index_folder_action.h"
#include "scratch.h"

namespace {

using mediidx::test::logged;
using mediidx::test::logged_messages;
using testing::ElementsAre;
using testing::IsEmpty;

/// What the library asked of the platform, in order.
std::vector<std::string> g_calls;
int g_program_status = 0;
int g_share_update_result = 0;
int g_status_clear_result = 0;

int g_shares_held = 0;

std::string shown(const char* text) { return text ? text : "null"; }

/// A file below the root, as the library names it on the appliance.
std::string without_root(const char* file) {
  const std::string path = file;
  const std::string root = TAVOPlatformRootGet();
  return path.starts_with(root) ? path.substr(root.size()) : path;
}

}  // namespace

// Stand before the platform's own.
extern "C" {

TAVOCORE_EXPORT int TLIBCExec(const char* program, const char* arg1, const char* arg2,
                              const char* arg3, const char* arg4) {
  g_calls.push_back(without_root(program) + " " + shown(arg1) + " " + shown(arg2) + " " +
                    shown(arg3) + " " + shown(arg4));
  return g_program_status;
}

TAVOCORE_EXPORT int TLIBCProcSignalByPidFile(const char* file, int signal) {
  g_calls.push_back("signal " + without_root(file) + " " + std::to_string(signal));
  return -1;
}

TAVOCORE_EXPORT int TLIBShareUpdate(const TAVOSHARE* share) {
  g_calls.push_back("share " + std::string(share->name) + " " + std::to_string(share->status));
  return g_share_update_result;
}

TAVOSDK_EXPORT int ShareIndexStatusClear(const char* name) {
  g_calls.push_back("clear " + std::string(name));
  return g_status_clear_result;
}

// These count, and hand on to the platform's own.
TAVOSDK_EXPORT int TAVOShareGet(const char* name, TAVOSHARE** share) {
  static const auto own =
      reinterpret_cast<decltype(&TAVOShareGet)>(dlsym(RTLD_NEXT, "TAVOShareGet"));
  const int result = own(name, share);
  if (result == 0) ++g_shares_held;
  return result;
}

TAVOSDK_EXPORT void TAVOShareFree(TAVOSHARE* share) {
  static const auto own =
      reinterpret_cast<decltype(&TAVOShareFree)>(dlsym(RTLD_NEXT, "TAVOShareFree"));
  if (share) --g_shares_held;
  own(share);
}
}

namespace {

Json::Value entry(const std::string& path, bool photo, bool music, bool video,
                  bool is_default = false) {
  return createRule("entry", path, photo, music, video, is_default);
}

Json::Value list(const std::vector<Json::Value>& entries) {
  Json::Value all(Json::arrayValue);
  for (const auto& one : entries) all.append(one);
  return all;
}

const std::vector<std::string> kReload{
    "signal /var/run/tavoindexd.pid 1", "signal /var/run/tavomkthumbd.pid 1",
    "signal /var/run/tavomkflvd.pid 1", "signal /var/run/dms.pid 18"};

std::vector<std::string> after_reload(const std::vector<std::string>& calls) {
  auto all = kReload;
  all.insert(all.end(), calls.begin(), calls.end());
  return all;
}

class FolderAction : public testing::Test {
 protected:
  FolderAction() {
    root.add_share("photo", photo);
    root.add_share("music", music);
    root.make_folder("volume1/photo/2010");
    mediidx::test::clear_log();
    g_calls.clear();
    g_program_status = g_share_update_result = g_status_clear_result = g_shares_held = 0;
  }
  ~FolderAction() override { EXPECT_EQ(g_shares_held, 0); }

  void store(const std::vector<Json::Value>& entries) {
    root.set_index_folders(list(entries).toStyledString());
  }
  static std::vector<std::string> paths(const Json::Value& conf) {
    std::vector<std::string> all;
    for (const auto& one : conf) all.push_back(one["path"].asString());
    return all;
  }
  static std::string drop(const std::string& folder) {
    return "/usr/tavo/bin/tavoindex -D " + folder + " -P MediaIndex";
  }
  static std::string add(const std::string& folder) {
    return "/usr/tavo/bin/tavoindex -A " + folder + " -P MediaIndex";
  }

  mediidx::test::ScratchRoot root;
  std::string photo = root.at("volume1/photo");
  std::string music = root.at("volume1/music");
  IndexFolderAction action;
  static constexpr const char* kCheck =
      "/usr/tavo/bin/tavoindex_mgr --check-indexbit null null null";
};

TEST_F(FolderAction, ThatAddsAFolderChecksTheSharesAndThenIndexesIt) {
  EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)})), 1);
  EXPECT_EQ(g_calls, after_reload({kCheck, drop(music), add(music)}));
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music"));
}

TEST_F(FolderAction, ThatChangesOnlyFlagsRunsNoProgram) {
  store({entry("/music", false, true, false)});
  EXPECT_EQ(action.onApply(list({entry("/music", true, true, false)})), 1);
  EXPECT_EQ(g_calls, kReload);
  EXPECT_TRUE(IndexFolderConfOpen()[0]["photo"].asBool());
}

TEST_F(FolderAction, ThatChangesFlagsBesideAnAddedFolderIndexesBoth) {
  store({entry("/music", false, true, false)});
  EXPECT_EQ(action.onApply(
                list({entry("/music", true, true, false), entry("/photo", true, false, false)})),
            1);
  EXPECT_EQ(g_calls, after_reload({kCheck, drop(photo), add(photo), drop(music), add(music)}));
}

TEST_F(FolderAction, ThatDeletesAFolderIndexesItBeforeTheCheck) {
  store({entry("/music", false, true, false), entry("/photo", true, false, false)});
  EXPECT_EQ(action.onApply(list({entry("/photo", true, false, false)})), 1);
  EXPECT_EQ(g_calls, after_reload({drop(music), add(music), kCheck}));
}

TEST_F(FolderAction, DropsDeletedFoldersChecksTheSharesThenAddsAndThenIndexesChangedOnes) {
  const auto a = root.make_folder("volume1/music/a");
  const auto b = root.make_folder("volume1/music/b");
  store({entry("/music", false, true, false), entry("/music/a", false, true, false),
         entry("/photo", true, false, false), entry("/music/b", false, true, false)});
  const auto conf =
      list({entry("/music/b", true, true, false), entry("/photo/2010", true, false, false),
            entry("/photo", true, true, false)});
  const auto expected =
      after_reload({drop(music), add(music), drop(a), add(a), kCheck, drop(photo + "/2010"),
                    add(photo + "/2010"), drop(b), add(b), drop(photo), add(photo)});
  EXPECT_EQ(action.onApply(conf, conf), 0);
  EXPECT_EQ(g_calls, expected);
  EXPECT_EQ(IndexFolderConfOpen(), conf);
}

TEST_F(FolderAction, GoesOnWhenTheIndexerFails) {
  g_program_status = -1;
  store({entry("/photo", true, false, false)});
  EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)})), 1);
  EXPECT_EQ(g_calls, after_reload({drop(photo), add(photo), kCheck, drop(music), add(music)}));
  EXPECT_THAT(logged_messages(), ElementsAre("ModifyShareStatus failed"));
}

TEST_F(FolderAction, MayBeUsedAgain) {
  EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)})), 1);
  g_calls.clear();
  EXPECT_EQ(action.onApply(list({entry("/photo", true, false, false)})), 1);
  EXPECT_EQ(g_calls, after_reload({drop(music), add(music), kCheck, drop(photo), add(photo)}));
}

TEST_F(FolderAction, WithNothingChangedSavesAndRunsNoProgram) {
  store({entry("/music", false, true, false)});
  EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)})), 1);
  EXPECT_EQ(g_calls, kReload);
  EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)}),
                           list({entry("/music", false, true, false)})),
            0);
}

TEST_F(FolderAction, OfAnEmptyConfigurationDeletesTheFileAndIndexesEveryFolderOfIt) {
  store({entry("/music", false, true, false), entry("/photo/2010", true, false, false)});
  EXPECT_EQ(action.onApply(Json::Value(Json::arrayValue), Json::Value(Json::arrayValue)), 0);
  EXPECT_FALSE(IsIndexFolderConfExist());
  EXPECT_THAT(g_calls, ElementsAre(drop(music), add(music), drop(photo + "/2010"),
                                   add(photo + "/2010"), kCheck));
}

TEST_F(FolderAction, OfAnEmptyConfigurationWithoutAFileDoesNothing) {
  EXPECT_EQ(action.onApply(Json::Value(Json::arrayValue), Json::Value(Json::arrayValue)), 0);
  EXPECT_THAT(g_calls, IsEmpty());
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(FolderAction, OfFoldersThatAreAllAwayDeletesTheFile) {
  store({entry("/music", false, true, false)});
  std::filesystem::remove(music);
  const auto conf = list({entry("/music", false, true, false)});
  EXPECT_EQ(action.onApply(conf, conf), 0);
  EXPECT_FALSE(IsIndexFolderConfExist());
  EXPECT_THAT(g_calls, ElementsAre(drop(music), add(music), kCheck));
}

TEST_F(FolderAction, OfAnEmptyConfigurationInOneArgumentSavesAnEmptyFile) {
  store({entry("/music", false, true, false)});
  EXPECT_EQ(action.onApply(Json::Value(Json::arrayValue)), 1);
  EXPECT_TRUE(IsIndexFolderConfExist());
  EXPECT_EQ(IndexFolderConfOpen(), Json::Value(Json::arrayValue));
}

TEST_F(FolderAction, FindsAddedFoldersInTheComparisonListOnly) {
  EXPECT_EQ(action.onApply(
                list({entry("/music", false, true, false), entry("/photo", true, false, false)}),
                list({entry("/photo", true, false, false)})),
            0);
  EXPECT_EQ(g_calls, after_reload({kCheck, drop(photo), add(photo)}));
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music", "/photo"));
}

TEST_F(FolderAction, AddsNoFolderOfTheComparisonListThatIsAway) {
  const auto conf = list({entry("/music", false, true, false)});
  EXPECT_EQ(action.onApply(conf, list({entry("/photo/away", true, false, false)})), 0);
  EXPECT_EQ(g_calls, kReload);
}

TEST_F(FolderAction, ComparesWithTheFirstOfSeveralEntriesOfAFolder) {
  store({entry("/music", false, true, false), entry("/music", true, true, true)});
  EXPECT_EQ(action.onApply(
                list({entry("/music", false, true, false), entry("/photo", true, false, false)})),
            1);
  EXPECT_EQ(g_calls, after_reload({kCheck, drop(photo), add(photo)}));
}

TEST_F(FolderAction, LeavesANameAloneThatDiffersInCase) {
  store({entry("/Music", false, true, false)});
  EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)})), 1);
  EXPECT_EQ(g_calls, after_reload({drop(music), add(music), kCheck, drop(music), add(music)}));
}

struct HugeFolderAction : FolderAction {};

TEST_F(HugeFolderAction, GivesUpThirtyThousandFoldersThatAreAwayAndKeepsTheOneThatIsThere) {
  constexpr int kFolders = 30'000;
  std::vector<Json::Value> many{entry("/music", false, true, false)};
  for (int i = 0; i < kFolders; ++i) {
    many.push_back(entry("/music/" + std::to_string(i), false, true, false));
  }
  store(many);
  EXPECT_EQ(action.onApply(list(many)), 1);
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music"));
  EXPECT_EQ(g_calls.size(), kReload.size() + 2 * kFolders + 1);
  EXPECT_EQ(g_calls.back(), kCheck);
}

TEST_F(FolderAction, OverAMalformedFileTakesWhatStoodBeforeTheError) {
  for (const auto& rest : {std::string(R"({"path": )"), std::string(100'000, '[')}) {
    root.set_index_folders(R"([{"path": "/photo", "photo": true}, )" + rest);
    g_calls.clear();
    EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)})), 1);
    EXPECT_EQ(g_calls, after_reload({drop(photo), add(photo), kCheck, drop(music), add(music)}));
    EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music"));
  }
}

struct OddFile {
  const char* name;
  std::string text;
};

class FolderActionOverAnOddFile : public FolderAction,
                                  public testing::WithParamInterface<OddFile> {};

TEST_P(FolderActionOverAnOddFile, FindsEveryFolderAdded) {
  root.set_index_folders(GetParam().text);
  EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)})), 1);
  EXPECT_EQ(g_calls, after_reload({kCheck, drop(music), add(music)}));
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music"));
}

INSTANTIATE_TEST_SUITE_P(Cases, FolderActionOverAnOddFile,
                         testing::Values(OddFile{"Empty", ""}, OddFile{"NoJson", "photo = yes"},
                                         OddFile{"ObjectOnTop", R"({"a": {"path": "/photo"}})"},
                                         OddFile{"NullOnTop", "null"},
                                         OddFile{"DeeplyNested", std::string(100'000, '[')},
                                         OddFile{"Zeros", std::string(1000, '\0')}),
                         [](const auto& test) { return test.param.name; });

TEST_F(FolderAction, OfWhatIsNoListIsThatOfAnEmptyOne) {
  for (const auto& odd : {Json::Value(), Json::Value(5), Json::Value("text")}) {
    store({entry("/music", false, true, false)});
    g_calls.clear();
    EXPECT_EQ(action.onApply(odd, odd), 0);
    EXPECT_THAT(g_calls, ElementsAre(drop(music), add(music), kCheck));
    EXPECT_FALSE(IsIndexFolderConfExist());
  }
}

TEST_F(FolderAction, ThatCannotSaveFailsInBothFormsAndIndexesNothing) {
  root.make_folder("usr/tavo/etc/index_folder.conf");
  const auto conf = list({entry("/music", false, true, false)});
  EXPECT_EQ(action.onApply(conf, conf), 1);
  EXPECT_EQ(action.onApply(conf), 0);
  EXPECT_THAT(g_calls, IsEmpty());
  EXPECT_EQ(logged_messages().back(), "IndexFolderActionConfSave failed.");
  EXPECT_THAT(logged().back().text, testing::StartsWith("mediidx_indexfolder_action:"));
}

TEST_F(FolderAction, LogsWhenTheCheckOfTheSharesFails) {
  g_program_status = 1;
  EXPECT_EQ(action.onApply(list({entry("/music", false, true, false)})), 1);
  EXPECT_THAT(logged_messages(), ElementsAre("ModifyShareStatus failed"));
}

TEST_F(FolderAction, KeepsOnlyFoldersThatExist) {
  auto conf = list({entry("/music", false, true, false), entry("/music/none", false, true, false),
                    entry("/photo/2010", true, false, false)});
  root.write("volume1/photo/file", "x");
  conf.append(entry("/photo/file", true, false, false));
  action.checkFoldersExist(conf);
  EXPECT_THAT(paths(conf), ElementsAre("/music", "/photo/2010"));
}

TEST_F(FolderAction, JudgesAnEntryOfAnUnknownShareByTheOneBefore) {
  auto conf = list({entry("/unknown", false, true, false), entry("/music", false, true, false),
                    entry("/unknown", false, true, false)});
  action.checkFoldersExist(conf);
  EXPECT_THAT(paths(conf), ElementsAre("/music", "/unknown"));
}

TEST_F(FolderAction, SkipsAnUnknownShareWhenIndexing) {
  action.ReindexFolders(
      list({entry("/unknown", false, true, false), entry("/photo/2010", true, false, false)}));
  EXPECT_THAT(g_calls, ElementsAre(drop(photo + "/2010"), add(photo + "/2010")));
}

TEST_F(FolderAction, SkipsEntriesThatAreNotUsable) {
  Json::Value odd = list({Json::Value("text"), Json::Value(Json::objectValue), Json::Value(5),
                          entry("", true, true, true), entry("/music", false, true, false)});
  odd[1]["path"] = 7;
  Json::Value bad_flag = entry("/photo", true, true, true);
  bad_flag["music"] = Json::Value(Json::arrayValue);
  bad_flag["music"].append(1);
  odd.append(bad_flag);
  root.set_index_folders(odd.toStyledString());
  EXPECT_EQ(action.onApply(odd), 1);
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music"));
}

TEST_F(FolderAction, ComparesPathAndFlagsOnly) {
  auto other = entry("/music", false, true, false, true);
  other["name"] = "another";
  EXPECT_TRUE(action.compareFolder(entry("/music", false, true, false), other));
  EXPECT_FALSE(action.compareFolder(entry("/music", true, true, false), other));
  EXPECT_FALSE(action.compareFolder(entry("/music", false, false, false), other));
  EXPECT_FALSE(action.compareFolder(entry("/music", false, true, true), other));
  EXPECT_FALSE(action.compareFolder(entry("/Music", false, true, false), other));
}

TEST_F(FolderAction, ComparesWhatIsNoEntryAsOneWithoutMembers) {
  EXPECT_TRUE(action.compareFolder(Json::Value(5), Json::Value("text")));
  EXPECT_TRUE(action.compareFolder(Json::Value(), Json::Value(Json::objectValue)));
  EXPECT_FALSE(action.compareFolder(Json::Value(Json::arrayValue), entry("/a", true, true, true)));
}

TEST_F(FolderAction, ReindexesAndChecksNothingOfWhatIsNoList) {
  Json::Value odd = entry("/music", false, true, false);
  action.ReindexFolders(odd);
  action.checkFoldersExist(odd);
  EXPECT_EQ(odd, Json::Value(Json::arrayValue));
  EXPECT_THAT(g_calls, IsEmpty());
}

struct Shares : FolderAction {
  using OwnedList = std::unique_ptr<TLIBSZLIST, decltype(&TLIBCSzListFree)>;
  OwnedList names{TLIBCSzListAlloc(0), TLIBCSzListFree};
};

TEST_F(Shares, AreMarkedAsIndexedInOrder) {
  root.add_share("other", root.at("volume1/other"), 0x41);
  for (const char* name : {"other", "music"}) TLIBCSzListPush(names.get(), name);
  SetShareIndexed(names.get(), true);
  EXPECT_THAT(g_calls, ElementsAre("share other 97", "share music 32"));
}

TEST_F(Shares, AreMarkedAsNotIndexed) {
  root.add_share("other", root.at("volume1/other"), 0x61);
  TLIBCSzListPush(names.get(), "other");
  SetShareIndexed(names.get(), false);
  EXPECT_THAT(g_calls, ElementsAre("share other 65"));
}

TEST_F(Shares, StopAtTheFirstThatIsUnknown) {
  for (const char* name : {"unknown", "music"}) TLIBCSzListPush(names.get(), name);
  SetShareIndexed(names.get(), true);
  EXPECT_THAT(g_calls, IsEmpty());
  EXPECT_THAT(logged_messages(), ElementsAre("TAVOShareGet failed [1400]"));
}

TEST_F(Shares, StopAtTheFirstThatCannotBeWritten) {
  g_share_update_result = -1;
  TLIBCErrSetEx(0x0900, "test", 1);
  for (const char* name : {"photo", "music"}) TLIBCSzListPush(names.get(), name);
  SetShareIndexed(names.get(), true);
  EXPECT_THAT(g_calls, ElementsAre("share photo 32"));
  EXPECT_THAT(logged_messages(), ElementsAre("TLIBShareUpdate failed [900]"));
}

TEST_F(Shares, OfNoListAreLeftAlone) {
  SetShareIndexed(nullptr, true);
  EXPECT_THAT(g_calls, IsEmpty());
}

/// A configuration in file and memory, from which folders vanish.
struct VanishedFolder : FolderAction {
  void load(const std::vector<Json::Value>& entries) {
    store(entries);
    IndexFolderUpdate();
  }
  int vanish(const std::string& folder) {
    std::filesystem::remove_all(folder);
    return IndexFolderConfDelFolder(folder.c_str());
  }
};

TEST_F(VanishedFolder, LeavesTheConfigurationWithAllBelowIt) {
  load({entry("/photo/2010", true, false, false), entry("/photo/2010/trip", true, false, false),
        entry("/photo/2010x", true, false, false), entry("/music", false, true, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_THAT(paths(IndexFolderConfOpen()),
              testing::UnorderedElementsAre("/photo/2010x", "/music"));
  EXPECT_EQ(g_calls, kReload);
}

TEST_F(VanishedFolder, ThatStillExistsChangesNothing) {
  load({entry("/photo/2010", true, false, false)});
  EXPECT_EQ(IndexFolderConfDelFolder((photo + "/2010").c_str()), 0);
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/photo/2010"));
  EXPECT_THAT(g_calls, IsEmpty());
}

TEST_F(VanishedFolder, ThatIsNotConfiguredWritesNothing) {
  load({entry("/photo/2010", true, false, false)});
  EXPECT_EQ(IndexFolderConfDelFolder((photo + "/none").c_str()), 0);
  EXPECT_THAT(g_calls, IsEmpty());
}

TEST_F(VanishedFolder, ClearsTheShareThatHasNoEntryLeft) {
  load({entry("/photo/2010", true, false, false), entry("/music", false, true, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_EQ(g_calls, after_reload({"clear photo"}));
}

TEST_F(VanishedFolder, LogsAShareThatCannotBeCleared) {
  g_status_clear_result = -1;
  load({entry("/photo/2010", true, false, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_THAT(logged_messages(), ElementsAre("ShareIndexStatusClear failed: photo"));
}

TEST_F(VanishedFolder, CarriesDefaultEntriesOver) {
  load({entry("/photo/2010", true, false, false), entry("/music", false, true, false, true)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  const auto left = IndexFolderConfOpen();
  ASSERT_EQ(left.size(), 1U);
  EXPECT_TRUE(left[0]["default"].asBool());
}

TEST_F(VanishedFolder, WhoseConfigurationCannotBeSavedFails) {
  load({entry("/photo/2010", true, false, false)});
  std::filesystem::remove(root.at("usr/tavo/etc/index_folder.conf"));
  root.make_folder("usr/tavo/etc/index_folder.conf");
  EXPECT_EQ(vanish(photo + "/2010"), -1);
  EXPECT_EQ(logged_messages().back(), "IndexFolderConfSave failed.");
  EXPECT_EQ(gIsBlockUpdate, 0);
}

TEST_F(VanishedFolder, MayEndWithASlash) {
  load({entry("/photo/2010", true, false, false), entry("/music", false, true, false)});
  std::filesystem::remove_all(photo + "/2010");
  EXPECT_EQ(IndexFolderConfDelFolder((photo + "/2010/").c_str()), 0);
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music"));
}

TEST_F(VanishedFolder, WithoutANameIsRefused) {
  load({entry("/music", false, true, false)});
  EXPECT_EQ(IndexFolderConfDelFolder(nullptr), -1);
  EXPECT_EQ(IndexFolderConfDelFolder(""), -1);
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music"));
}

TEST_F(VanishedFolder, LetsAReloadThatWasAskedForHappen) {
  load({entry("/photo/2010", true, false, false), entry("/music", false, true, false)});
  std::filesystem::remove_all(photo + "/2010");
  IndexFolderConfLock();
  IndexFolderUpdate();
  EXPECT_EQ(gIsDirty, 1);
  EXPECT_EQ(IndexFolderConfDelFolder((photo + "/2010").c_str()), 0);
  EXPECT_EQ(gIsDirty, 0);
  EXPECT_EQ(IndexFolderSizeGet(), 1);
}

TEST_F(VanishedFolder, StaysInMemoryUntilAReload) {
  load({entry("/photo/2010", true, false, false), entry("/music", false, true, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_EQ(IndexFolderSizeGet(), 2);
  EXPECT_EQ(gIsBlockUpdate, 0);
  IndexFolderUpdate();
  EXPECT_EQ(IndexFolderSizeGet(), 1);
}

TEST_F(VanishedFolder, ThatWasTheLastLeavesAnEmptyListInTheFile) {
  load({entry("/photo/2010", true, false, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_TRUE(IsIndexFolderConfExist());
  EXPECT_EQ(IndexFolderConfOpen(), Json::Value(Json::arrayValue));
}

TEST_F(VanishedFolder, LeavesTheOthersLongestFirst) {
  load({entry("/music", false, true, false), entry("/photo/2010", true, false, false),
        entry("/photo", true, false, false), entry("/music/long/way", false, true, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music/long/way", "/music", "/photo"));
}

TEST_F(VanishedFolder, MayBeTheShareItself) {
  load({entry("/photo", true, false, false), entry("/photo/2010", true, false, false),
        entry("/music", false, true, false)});
  EXPECT_EQ(vanish(photo), 0);
  EXPECT_EQ(g_calls, after_reload({"clear photo"}));
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/music"));
}

TEST_F(VanishedFolder, AboveEveryShareClearsNone) {
  load({entry("/photo", true, false, false), entry("/music", false, true, false)});
  EXPECT_EQ(vanish(root.at("volume1")), 0);
  EXPECT_EQ(g_calls, kReload);
  EXPECT_EQ(IndexFolderConfOpen(), Json::Value(Json::arrayValue));
}

TEST_F(VanishedFolder, LiesInTheDeepestShareThatHoldsIt) {
  root.add_share("inner", photo + "/inner");
  load({entry("/inner/a", true, false, false), entry("/photo/b", true, false, false)});
  EXPECT_EQ(vanish(photo + "/inner/a"), 0);
  EXPECT_EQ(g_calls, after_reload({"clear inner"}));
}

TEST_F(VanishedFolder, LeavesAShareIndexedThatAnotherEntryNamesInOtherCase) {
  load({entry("/Photo/2010", true, false, false), entry("/photo/a", true, false, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_EQ(g_calls, kReload);
  EXPECT_THAT(paths(IndexFolderConfOpen()), ElementsAre("/photo/a"));
}

TEST_F(VanishedFolder, BesideANameThatItBeginsLeavesThatAlone) {
  load({entry("/photo/2010x", true, false, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_THAT(g_calls, IsEmpty());
}

TEST_F(VanishedFolder, ThatIsAFileNowStillExists) {
  load({entry("/photo/2010", true, false, false)});
  std::filesystem::remove_all(photo + "/2010");
  root.write("volume1/photo/2010", "a file");
  EXPECT_EQ(IndexFolderConfDelFolder((photo + "/2010").c_str()), 0);
  EXPECT_THAT(g_calls, IsEmpty());
}

TEST_F(VanishedFolder, KeepsEntriesOfOneFolderOnceEach) {
  load({entry("/photo/2010", true, false, false), entry("/music", false, true, false),
        entry("/music", true, true, false)});
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_EQ(IndexFolderConfOpen(),
            list({entry("/music", false, true, false), entry("/music", true, true, false)}));
}

struct HugeVanishedFolder : VanishedFolder {};

TEST_F(HugeVanishedFolder, AmongTwentyThousandIsTakenOutAlone) {
  constexpr unsigned kFolders = 20'000;
  std::vector<Json::Value> many{entry("/photo/2010", true, false, false)};
  for (unsigned i = 0; i < kFolders; ++i) {
    many.push_back(entry("/music/" + std::to_string(i), false, true, false));
  }
  load(many);
  EXPECT_EQ(vanish(photo + "/2010"), 0);
  EXPECT_EQ(IndexFolderConfOpen().size(), kFolders);
}

}  // namespace
