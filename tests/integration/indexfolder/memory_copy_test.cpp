// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <array>
#include <climits>
#include <cstring>
#include <string>

#include "index_folder_test.h"

namespace mediidx::test {
namespace {

class MemoryCopy : public IndexFolderTest {
 protected:
  std::string path_at(unsigned index) {
    std::array<char, 4096> buffer{};
    EXPECT_EQ(IndexFolderPathAt(index, buffer.data(), static_cast<int>(buffer.size())), 1);
    return buffer.data();
  }
};

/// As the library was loaded, before any test.
const bool g_started_empty = gIndexFolderConf == Json::Value(Json::arrayValue) &&
                             gIsBlockUpdate == 0 && gIsDirty == 0 && IndexFolderSizeGet() == 0;

TEST_F(MemoryCopy, StartsAsAnEmptyArrayWithoutALock) { EXPECT_TRUE(g_started_empty); }

TEST_F(MemoryCopy, ReadsAMissingFlagAsOff) {
  add_share("photo");
  load(R"([{"path": "/photo"}])");
  ASSERT_EQ(IndexFolderSizeGet(), 1);
  for (const int kind : {0, 1, 2}) EXPECT_EQ(IndexFolderIsIndexTypeAt(0, kind), 0) << kind;
}

TEST_F(MemoryCopy, IsEmptyWithoutAFile) {
  EXPECT_EQ(IndexFolderInit(), 0);
  EXPECT_EQ(IndexFolderSizeGet(), 0);
  EXPECT_TRUE(gIndexFolderConf.isArray());
}

TEST_F(MemoryCopy, HoldsAbsoluteFoldersLongestFirst) {
  const auto photo = add_share("photo");
  load({entry("/photo", true, false, false), entry("/photo/2010/trip", false, true, false)});
  EXPECT_EQ(IndexFolderSizeGet(), 2);
  EXPECT_EQ(path_at(0), photo + "/2010/trip");
  EXPECT_EQ(path_at(1), photo);
}

TEST_F(MemoryCopy, SortsByLengthWhateverTheOrderOfTheFile) {
  const auto share = add_share("s");
  load({entry("/s/bb", true, true, true), entry("/s", true, true, true),
        entry("/s/a/c/d", true, true, true), entry("/s/a/c", true, true, true)});
  EXPECT_THAT(loaded_paths(), ElementsAre(share + "/a/c/d", share + "/a/c", share + "/bb", share));
}

TEST_F(MemoryCopy, DropsEntriesOfUnknownShares) {
  const auto photo = add_share("photo");
  load({entry("/gone/2010", true, true, true), entry("/photo", true, true, true)});
  EXPECT_THAT(loaded_paths(), ElementsAre(photo));
  EXPECT_EQ(IndexFolderConfOpen().size(), 2U);
}

TEST_F(MemoryCopy, HoldsEveryEntryOnceForEachOfItsFolder) {
  const auto photo = add_share("photo");
  load({entry("/photo", true, false, false), entry("/photo", false, true, false),
        entry("/photo/a", false, false, true)});
  EXPECT_THAT(loaded_paths(), ElementsAre(photo + "/a", photo, photo, photo, photo));
  EXPECT_EQ(gIndexFolderConf[1], entry(photo, true, false, false));
  EXPECT_EQ(gIndexFolderConf[2], entry(photo, false, true, false));
  EXPECT_EQ(gIndexFolderConf[3], entry(photo, true, false, false));
  EXPECT_EQ(gIndexFolderConf[4], entry(photo, false, true, false));
}

TEST_F(MemoryCopy, KeepsTheOtherMembersOfAnEntry) {
  const auto photo = add_share("photo");
  load(R"([{"path": "/photo/a", "photo": true, "name": "mine", "default": true, "more": 1}])");
  ASSERT_EQ(gIndexFolderConf.size(), 1U);
  EXPECT_EQ(gIndexFolderConf[0]["name"], "mine");
  EXPECT_EQ(gIndexFolderConf[0]["default"], true);
  EXPECT_EQ(gIndexFolderConf[0]["more"], 1);
  EXPECT_FALSE(gIndexFolderConf[0].isMember("music"));
}

TEST_F(MemoryCopy, PassesOverEntriesThatAreNotUsable) {
  const auto photo = add_share("photo");
  load(R"([1, "/photo", null, [], {}, {"photo": true}, {"path": ""}, {"path": null}, {"path": 1},
           {"path": {}}, {"path": "/photo/a", "music": "on"}, {"path": "/photo/b", "video": []},
           {"path": "/photo\u0000"}, {"path": "/photo/d\u0000", "photo": true},
           {"path": "/photo/c", "photo": 1, "music": 0.5, "video": null}])");
  EXPECT_THAT(loaded_paths(), ElementsAre(photo + "/c"));
  EXPECT_EQ(IndexFolderIsIndexTypeAt(0, 2), 1);
  EXPECT_EQ(IndexFolderIsIndexTypeAt(0, 0), 1);
  EXPECT_EQ(IndexFolderIsIndexTypeAt(0, 1), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

struct BrokenFile {
  const char* name;
  std::string text;
};

class MemoryCopyOfABrokenFile : public IndexFolderTest,
                                public testing::WithParamInterface<BrokenFile> {};

TEST_P(MemoryCopyOfABrokenFile, IsEmpty) {
  add_share("photo");
  load({entry("/photo", true, true, true)});
  ASSERT_EQ(IndexFolderSizeGet(), 1);
  load(GetParam().text);
  EXPECT_EQ(IndexFolderSizeGet(), 0);
  EXPECT_TRUE(gIndexFolderConf.isArray());
  EXPECT_THAT(logged(), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(Cases, MemoryCopyOfABrokenFile,
                         testing::Values(BrokenFile{"EmptyFile", ""},
                                         BrokenFile{"NoJson", "\xFF\xFE[photo"},
                                         BrokenFile{"ObjectOnTop", R"({"a": {"path": "/photo"}})"},
                                         BrokenFile{"DeeplyNested", std::string(100000, '[')}),
                         [](const auto& test) { return test.param.name; });

TEST_F(MemoryCopy, OfAMalformedFileHoldsWhatStoodBeforeTheError) {
  const auto photo = add_share("photo");
  load(R"([{"path": "/photo", "photo": true}, {"path": "/photo/x)");
  EXPECT_THAT(loaded_paths(), ElementsAre(photo));
}

TEST_F(MemoryCopy, KeepsWhatStoodBeforeJsonNestedTooDeeply) {
  const auto photo = add_share("photo");
  load(R"([{"path": "/photo", "photo": true}, )" + std::string(100000, '['));
  EXPECT_THAT(loaded_paths(), ElementsAre(photo));
  EXPECT_THAT(logged(), IsEmpty());
}

class HugeMemoryCopy : public MemoryCopy {};

TEST_F(HugeMemoryCopy, HoldsAHundredThousandFolders) {
  constexpr int kFolders = 100'000;
  const auto share = add_share("p");
  load(text_of_folders(kFolders));
  EXPECT_EQ(IndexFolderSizeGet(), kFolders);
  EXPECT_EQ(path_at(0).size(), share.size() + 6);
  EXPECT_EQ(path_at(kFolders - 1).size(), share.size() + 2);
}

TEST_F(HugeMemoryCopy, HoldsAFolderNamedFiveHundredTimesForEachOfThem) {
  add_share("p");
  load(std::vector(500, entry("/p", true, false, false)));
  EXPECT_EQ(IndexFolderSizeGet(), 500 * 500);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(HugeMemoryCopy, HoldsAFolderNamedBeyondMeasureOnceForEachEntry) {
  constexpr int kEntries = 20'000;
  const auto share = add_share("p");
  std::vector<Json::Value> many(kEntries, entry("/p", true, false, false));
  many.push_back(entry("/p/a", false, true, false));
  load(many);
  EXPECT_EQ(IndexFolderSizeGet(), kEntries + 1);
  EXPECT_EQ(path_at(0), share + "/a");
  EXPECT_EQ(path_at(kEntries), share);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder:N Too many entries of one folder: each "
                                       "is held once"));
}

TEST_F(MemoryCopy, DoesNotFollowTheFileByItself) {
  add_share("photo");
  load({entry("/photo", true, true, true)});
  root.set_index_folders("[]");
  EXPECT_EQ(IndexFolderSizeGet(), 1);
  IndexFolderUpdate();
  EXPECT_EQ(IndexFolderSizeGet(), 0);
}

TEST_F(MemoryCopy, IsLoadedByAllThreeNames) {
  add_share("photo");
  root.set_index_folders(list({entry("/photo", true, true, true)}).toStyledString());
  EXPECT_EQ(loadConf(), 0);
  EXPECT_EQ(IndexFolderSizeGet(), 1);
  IndexFolderFree();
  EXPECT_EQ(IndexFolderInit(), 0);
  EXPECT_EQ(IndexFolderSizeGet(), 1);
  IndexFolderFree();
  IndexFolderUpdate();
  EXPECT_EQ(IndexFolderSizeGet(), 1);
}

TEST_F(MemoryCopy, IsAnEmptyArrayAgainOnceFreed) {
  add_share("photo");
  load({entry("/photo", true, true, true)});
  IndexFolderFree();
  EXPECT_EQ(gIndexFolderConf, Json::Value(Json::arrayValue));
}

TEST_F(MemoryCopy, HasSizeZeroWhileNull) {
  gIndexFolderConf = Json::Value();
  EXPECT_EQ(IndexFolderSizeGet(), 0);
  IndexFolderFree();
  EXPECT_TRUE(gIndexFolderConf.isNull());
}

TEST_F(MemoryCopy, WaitsForTheUnlockToReload) {
  add_share("photo");
  root.set_index_folders(list({entry("/photo", true, true, true)}).toStyledString());
  IndexFolderConfLock();
  EXPECT_EQ(gIsBlockUpdate, 1);
  IndexFolderUpdate();
  EXPECT_EQ(gIsDirty, 1);
  EXPECT_EQ(IndexFolderSizeGet(), 0);
  IndexFolderConfUnLock();
  EXPECT_EQ(gIsDirty, 0);
  EXPECT_EQ(gIsBlockUpdate, 0);
  EXPECT_EQ(IndexFolderSizeGet(), 1);
}

TEST_F(MemoryCopy, IsReloadedOnceHoweverOftenItWasAskedFor) {
  add_share("photo");
  root.set_index_folders(list({entry("/photo", true, true, true)}).toStyledString());
  IndexFolderConfLock();
  IndexFolderUpdate();
  IndexFolderUpdate();
  const auto before = share_lookups();
  IndexFolderConfUnLock();
  EXPECT_EQ(share_lookups(), before + 1);
  IndexFolderConfUnLock();
  EXPECT_EQ(share_lookups(), before + 1);
}

TEST_F(MemoryCopy, IsNotReloadedByAnUnlockThatNobodyAskedFor) {
  add_share("photo");
  root.set_index_folders(list({entry("/photo", true, true, true)}).toStyledString());
  IndexFolderConfLock();
  IndexFolderConfUnLock();
  EXPECT_EQ(IndexFolderSizeGet(), 0);
}

TEST_F(MemoryCopy, IsUnlockedOnceForTwoLocks) {
  IndexFolderConfLock();
  IndexFolderConfLock();
  IndexFolderConfUnLock();
  EXPECT_EQ(gIsBlockUpdate, 0);
}

TEST_F(MemoryCopy, KnowsNoPathAtItsSize) {
  add_share("photo");
  load({entry("/photo", true, true, true)});
  std::array<char, 16> buffer{"untouched"};
  EXPECT_EQ(IndexFolderPathAt(1, buffer.data(), 16), -1);
  EXPECT_STREQ(buffer.data(), "untouched");
  EXPECT_THAT(log_lines(),
              ElementsAre("mediidx_indexfolder:N Bad parameter: index 1 out of range"));
  EXPECT_EQ(logged()[0].priority, 3);
}

TEST_F(MemoryCopy, NeedsABufferForAPath) {
  add_share("photo");
  load({entry("/photo", true, true, true)});
  EXPECT_EQ(IndexFolderPathAt(0, nullptr, 16), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder:N Bad parameter: szPath"));
}

TEST_F(MemoryCopy, WritesNoMoreOfAPathThanFits) {
  gIndexFolderConf.append(entry("/volume1/photo", true, true, true));
  std::array<char, 16> buffer{"###############"};
  EXPECT_EQ(IndexFolderPathAt(0, buffer.data(), 8), 1);
  EXPECT_STREQ(buffer.data(), "/volume");
  EXPECT_EQ(buffer[8], '#');
  EXPECT_EQ(IndexFolderPathAt(0, buffer.data(), 0), 1);
  EXPECT_EQ(IndexFolderPathAt(0, buffer.data(), INT_MIN), -1);
  EXPECT_STREQ(buffer.data(), "/volume");
}

TEST_F(MemoryCopy, CutsAPathAtACharacter) {
  gIndexFolderConf.append(entry("/\xE5\x86\x99", true, true, true));
  std::array<char, 4> buffer{};
  EXPECT_EQ(IndexFolderPathAt(0, buffer.data(), 4), 1);
  EXPECT_STREQ(buffer.data(), "/");
}

TEST_F(MemoryCopy, KnowsTheKindsOfAnEntry) {
  gIndexFolderConf.append(entry("/a", true, false, false));
  gIndexFolderConf.append(entry("/b", false, true, true));
  const auto kinds = [](unsigned index) {
    return std::vector<int>{IndexFolderIsIndexTypeAt(index, 0), IndexFolderIsIndexTypeAt(index, 1),
                            IndexFolderIsIndexTypeAt(index, 2)};
  };
  EXPECT_THAT(kinds(0), ElementsAre(0, 0, 1));
  EXPECT_THAT(kinds(1), ElementsAre(1, 1, 0));
}

TEST_F(MemoryCopy, HasNoFlagForOtherKinds) {
  gIndexFolderConf.append(entry("/a", true, true, true));
  for (const int kind : {-1, 3, 4, 5, 6}) EXPECT_EQ(IndexFolderIsIndexTypeAt(0, kind), 0) << kind;
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(MemoryCopy, KnowsNoKindAtItsSize) {
  EXPECT_EQ(IndexFolderIsIndexTypeAt(0, 0), 0);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder:N Bad parameter: index of out range"));
}

TEST_F(MemoryCopy, IsPrintedEntryByEntry) {
  gIndexFolderConf.append(entry("/a/%s", true, false, true));
  gIndexFolderConf.append(entry("/b", false, true, false));
  printIndexFolderConf();
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder:N path: /a/%s",
                                       "mediidx_indexfolder:N index:    1     0     1",
                                       "mediidx_indexfolder:N path: /b",
                                       "mediidx_indexfolder:N index:    0     1     0"));
  for (const auto& line : logged()) EXPECT_EQ(line.priority, 3);
}

class ShareNameOfAPath : public IndexFolderTest {
 protected:
  std::array<char, 16> buffer{"untouched"};
};

TEST_F(ShareNameOfAPath, IsWrittenIntoTheBuffer) {
  EXPECT_EQ(IndexFolderShareNameGet("/photo/a", buffer.data(), 16), 1);
  EXPECT_STREQ(buffer.data(), "photo");
}

TEST_F(ShareNameOfAPath, IsCutToTheBuffer) {
  EXPECT_EQ(IndexFolderShareNameGet("/photo/a", buffer.data(), 3), 1);
  EXPECT_STREQ(buffer.data(), "ph");
}

TEST_F(ShareNameOfAPath, NeedsAPathAndABuffer) {
  EXPECT_EQ(IndexFolderShareNameGet(nullptr, buffer.data(), 16), -1);
  EXPECT_EQ(IndexFolderShareNameGet("", buffer.data(), 16), -1);
  EXPECT_EQ(IndexFolderShareNameGet("/photo", nullptr, 16), -1);
  EXPECT_STREQ(buffer.data(), "untouched");
  EXPECT_THAT(logged(), IsEmpty());
}

}  // namespace
}  // namespace mediidx::test
