// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// What a program that loads the library may rely on: it can be called from C, shares its globals,
// and everything that it asks of the platform can be stood before.
#include <gmock/gmock.h>
#include <tavocore.h>
#include <tavodb.h>
#include <tavosdk.h>

#include <cstdio>
#include <string>
#include <vector>

#include "database.h"
#include "mediidx/database.h"
#include "mediidx/index_folder.h"
#include "mediidx/request.h"

namespace {

using mediidx::test::clear_log;
using mediidx::test::logged;
using testing::ElementsAre;

/// The calls that reached this program instead of the platform, while it stands before it.
std::vector<std::string> g_calls;
bool g_stands_before = false;
TAVOSHARE g_share{"replaced", "/replaced", 0};

}  // namespace

extern "C" {

TAVOSDK_EXPORT int TAVOShareGet(const char* name, TAVOSHARE** share) {
  g_calls.push_back(std::string("TAVOShareGet ") + name);
  *share = &g_share;
  return 0;
}

TAVOSDK_EXPORT void TAVOShareFree(TAVOSHARE* share) {
  if (share) g_calls.push_back(std::string("TAVOShareFree ") + share->path);
}

TAVOSDK_EXPORT int IndexIsPathRemoteMount(const char* path) {
  if (g_stands_before) g_calls.push_back(std::string("IndexIsPathRemoteMount ") + path);
  return g_stands_before ? 1 : 0;
}

TAVOCORE_EXPORT int TLIBCProcSignalByPidFile(const char* file, int signal) {
  const std::string path = file;
  g_calls.push_back("TLIBCProcSignalByPidFile " + path.substr(path.rfind('/') + 1) + " " +
                    std::to_string(signal));
  return 0;
}

TAVODB_EXPORT tavodb_connection* TAVODBConnect(const char*, const char* user, const char*,
                                               const char* database) {
  g_calls.push_back(std::string("TAVODBConnect ") + user + " " + database);
  return nullptr;
}
}

namespace {

class Replacement : public testing::Test {
 protected:
  Replacement() {
    g_calls.clear();
    g_stands_before = true;
    clear_log();
  }
  ~Replacement() override { g_stands_before = false; }

  mediidx::test::ScratchRoot root;
};

TEST_F(Replacement, OfTheShareLookupIsCalled) {
  root.set_index_folders(R"([{"path": "/any/folder", "music": true}])");
  IndexFolderInit();
  EXPECT_THAT(g_calls, ElementsAre("TAVOShareGet any", "TAVOShareFree /replaced"));
  EXPECT_EQ(IndexFolderPositionGet("/replaced/folder"), 0);
}

TEST_F(Replacement, OfTheRemoteMountTestIsCalled) {
  EXPECT_EQ(TAVOMediaIndexIsIndexPath("/a.mp3", MEDIA_TABLE_MUSIC), 0);
  EXPECT_THAT(g_calls, ElementsAre("IndexIsPathRemoteMount /a.mp3"));
}

TEST_F(Replacement, OfTheSignalIsCalled) {
  IndexServiceReload();
  EXPECT_THAT(g_calls, ElementsAre("TLIBCProcSignalByPidFile tavoindexd.pid 1",
                                   "TLIBCProcSignalByPidFile tavomkthumbd.pid 1",
                                   "TLIBCProcSignalByPidFile tavomkflvd.pid 1",
                                   "TLIBCProcSignalByPidFile dms.pid 18"));
}

TEST_F(Replacement, OfTheConnectIsCalled) {
  EXPECT_EQ(MediaDBConnGet(), nullptr);
  EXPECT_THAT(g_calls, ElementsAre("TAVODBConnect postgres mediaserver"));
}

TEST_F(Replacement, OfTheSystemLogIsCalled) {
  EXPECT_EQ(TAVOMediaIndexAdd(nullptr, MEDIA_TABLE_MUSIC), -1);
  ASSERT_EQ(logged().size(), 1U);
  EXPECT_EQ(logged()[0].priority, 3);
}

class Globals : public Replacement {};

TEST_F(Globals, AreSharedWithTheProgram) {
  gIsBlockUpdate = 1;
  IndexFolderUpdate();
  EXPECT_EQ(gIsDirty, 1);
  IndexFolderConfUnLock();
  EXPECT_EQ(gIsBlockUpdate, 0);
  EXPECT_EQ(gIsDirty, 0);
  gIndexFolderConf.append(createRule("n", "/v", true, true, true, false));
  EXPECT_EQ(IndexFolderSizeGet(), 1);
}

using AClientInC = mediidx::test::DatabaseTest;

TEST_F(AClientInC, AddsCountsAndLists) {
  root.make_folder("tmp");
  root.index_everything("media", root.at("volume1/media"));
  const auto file = root.at("volume1/media/a.mp4");
  std::FILE* output = TLIBCPopen(MEDIIDX_C_CLIENT, "r", root.path().c_str(), file.c_str(), nullptr);
  ASSERT_NE(output, nullptr);
  std::string text;
  for (int c = std::fgetc(output); c != EOF; c = std::fgetc(output)) text += static_cast<char>(c);
  EXPECT_EQ(TLIBCPclose(output), 0);
  EXPECT_EQ(text, "folders 1\nadded 0\ncounted 1\n" + file + ": From C\n");
}

}  // namespace
