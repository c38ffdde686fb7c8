// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <stdexcept>
#include <string>

#include "index_folder_test.h"

namespace mediidx::test {
namespace {

enum Kind { kMusic, kVideo, kPhoto, kPlaylist, kDirectory, kConvert };

/// Sets the in-memory copy itself, in the order given.
class Coverage : public IndexFolderTest {
 protected:
  void hold(const std::vector<Json::Value>& entries) { gIndexFolderConf = list(entries); }
  void hold_folders(const std::vector<std::string>& folders) {
    for (const auto& folder : folders) gIndexFolderConf.append(entry(folder, true, true, true));
  }
};

class PathIsIndexed : public Coverage {};

TEST_F(PathIsIndexed, ByTheFlagOfItsKind) {
  hold({entry("/v/photo", true, false, false), entry("/v/sound", false, true, false),
        entry("/v/film", false, false, true)});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.jpg", kPhoto), 1);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.mp3", kMusic), 0);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.mp4", kVideo), 0);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/sound/a.mp3", kMusic), 1);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/film/a.mp4", kVideo), 1);
}

TEST_F(PathIsIndexed, AsAPlaylistWhereMusicIs) {
  hold({entry("/v/sound", false, true, false), entry("/v/photo", true, false, true)});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/sound/a.m3u", kPlaylist), 1);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.m3u", kPlaylist), 0);
}

TEST_F(PathIsIndexed, ByTheDeepestEntryThatHoldsIt) {
  hold({entry("/v/photo/private", false, false, false), entry("/v/photo", true, false, false)});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/private/a.jpg", kPhoto), 0);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.jpg", kPhoto), 1);
}

TEST_F(PathIsIndexed, OnlyToTheBoundaryOfAName) {
  hold({entry("/v/photo/2010", false, true, false), entry("/v/photo", true, false, false)});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/2010x/a.jpg", kPhoto), 1);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/2010/a.jpg", kPhoto), 0);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/2010/a.mp3", kMusic), 1);
}

TEST_F(PathIsIndexed, WhenItIsTheEntryItself) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo", kPhoto), 1);
}

TEST_F(PathIsIndexed, BelowAnEntryThatEndsWithASlash) {
  hold_folders({"/v/photo/"});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.jpg", kPhoto), 1);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo", kPhoto), 0);
}

TEST_F(PathIsIndexed, WithRegardToCase) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/Photo/a.jpg", kPhoto), 0);
}

TEST_F(PathIsIndexed, NotWhenNoEntryHoldsIt) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderIsPathIndexed("/w/a.jpg", kPhoto), 0);
  EXPECT_EQ(IndexFolderIsPathIndexed("", kPhoto), 0);
}

TEST_F(PathIsIndexed, NotForAnUnknownKind) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a", -1), 0);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a", 6), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(PathIsIndexed, IsAnErrorForANullPath) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderIsPathIndexed(nullptr, kPhoto), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder:N szPath is null!"));
  EXPECT_EQ(logged()[0].priority, 3);
}

TEST_F(PathIsIndexed, IsAnErrorOfAnEmptyConfiguration) {
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.jpg", kPhoto), -1);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.jpg", kDirectory), -1);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(PathIsIndexed, IsAnErrorForFoldersAndConversions) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a%s", kDirectory), -1);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/b", kConvert), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder:N Wrong media table type: /v/photo/a%s",
                                       "mediidx_indexfolder:N Wrong media table type: /v/photo/b"));
}

TEST_F(PathIsIndexed, ReloadsWhatWaitsEvenOnAnError) {
  add_share("photo");
  root.set_index_folders(list({entry("/photo", true, true, true)}).toStyledString());
  IndexFolderConfLock();
  IndexFolderUpdate();
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/a.jpg", kPhoto), -1);
  EXPECT_EQ(gIsBlockUpdate, 0);
  EXPECT_EQ(gIsDirty, 0);
  EXPECT_EQ(IndexFolderSizeGet(), 1);
}

TEST_F(PathIsIndexed, AndUnlocksWhenItAnswers) {
  hold_folders({"/v/photo"});
  IndexFolderConfLock();
  IndexFolderIsPathIndexed("/v/photo/a.jpg", kPhoto);
  EXPECT_EQ(gIsBlockUpdate, 0);
}

class FolderIsIndexed : public Coverage {};

TEST_F(FolderIsIndexed, WhateverTheFlagsOfItsEntry) {
  hold({entry("/v/photo", false, false, false)});
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/photo"), 1);
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/photo/a/b"), 1);
}

TEST_F(FolderIsIndexed, NotOutsideOfEveryEntry) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v"), -1);
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/photos"), -1);
  EXPECT_EQ(IndexFolderIsFolderIndexed(""), -1);
  EXPECT_EQ(IndexFolderIsFolderIndexed(nullptr), -1);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(FolderIsIndexed, NotInAnEmptyConfiguration) {
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/photo"), -1);
}

class FolderHasParent : public Coverage {};

TEST_F(FolderHasParent, WhenAnEntryLiesStrictlyAbove) {
  hold_folders({"/v/photo/2010", "/v/photo"});
  EXPECT_EQ(IndexFolderIsFolderHasParent("/v/photo/2010"), 1);
  EXPECT_EQ(IndexFolderIsFolderHasParent("/v/photo/2011/a"), 1);
}

TEST_F(FolderHasParent, NotByItself) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderIsFolderHasParent("/v/photo"), -1);
}

TEST_F(FolderHasParent, OnlyToTheBoundaryOfAName) {
  hold_folders({"/v/photo", "/w/"});
  EXPECT_EQ(IndexFolderIsFolderHasParent("/v/photos"), -1);
  EXPECT_EQ(IndexFolderIsFolderHasParent("/w/a"), 1);
  EXPECT_EQ(IndexFolderIsFolderHasParent("/w/"), -1);
}

TEST_F(FolderHasParent, NotInAnEmptyConfigurationOrForNull) {
  EXPECT_EQ(IndexFolderIsFolderHasParent("/v/photo"), -1);
  EXPECT_EQ(IndexFolderIsFolderHasParent(nullptr), -1);
}

class CoveredByShare : public Coverage {};

TEST_F(CoveredByShare, WithoutRegardToCase) {
  hold_folders({"/v/photo/2010"});
  EXPECT_EQ(IndexFolderIsCoveredByShare("/V/Photo"), 1);
  EXPECT_EQ(IndexFolderIsCoveredByShare("/v/photo/"), 1);
}

TEST_F(CoveredByShare, ByTheShareItself) {
  hold_folders({"/v/PHOTO"});
  EXPECT_EQ(IndexFolderIsCoveredByShare("/v/photo"), 1);
}

TEST_F(CoveredByShare, NotByFoldersBesideOrAbove) {
  hold_folders({"/v/photos", "/v", "/v/photo-old/a"});
  EXPECT_EQ(IndexFolderIsCoveredByShare("/v/photo"), -1);
}

TEST_F(CoveredByShare, NotInAnEmptyConfigurationOrForNull) {
  EXPECT_EQ(IndexFolderIsCoveredByShare("/v/photo"), -1);
  EXPECT_EQ(IndexFolderIsCoveredByShare(nullptr), -1);
}

TEST_F(CoveredByShare, IsOutOfRangeForAnEmptyShare) {
  EXPECT_THROW(IndexFolderIsCoveredByShare(""), std::out_of_range);
  EXPECT_EQ(gIsBlockUpdate, 0);
}

class FolderPosition : public Coverage {};

TEST_F(FolderPosition, IsThatOfTheFirstEntryOfExactlyThisFolder) {
  hold_folders({"/v/photo/2010", "/v/photo", "/v/photo"});
  EXPECT_EQ(IndexFolderPositionGet("/v/photo"), 1);
  EXPECT_EQ(IndexFolderPositionGet("/v/photo/2010"), 0);
}

TEST_F(FolderPosition, IsNoneForOtherFolders) {
  hold_folders({"/v/photo"});
  EXPECT_EQ(IndexFolderPositionGet("/v/Photo"), -1);
  EXPECT_EQ(IndexFolderPositionGet("/v/photo/"), -1);
  EXPECT_EQ(IndexFolderPositionGet("/v/photo/a"), -1);
  EXPECT_EQ(IndexFolderPositionGet(nullptr), -1);
}

TEST_F(FolderPosition, IsNoneInAnEmptyConfiguration) {
  EXPECT_EQ(IndexFolderPositionGet("/v/photo"), -1);
}

class EntryWithoutAPath : public Coverage {
 protected:
  /// Runs a query under a pending reload; true when it threw, having unlocked and so reloaded.
  template <class Query>
  bool throws_unlocked(Query&& query) {
    hold_folders({""});
    gIsDirty = 1;
    bool thrown = false;
    try {
      query();
    } catch (const std::out_of_range&) {
      thrown = true;
    }
    return thrown && gIsBlockUpdate == 0 && gIsDirty == 0 && IndexFolderSizeGet() == 0;
  }
};

TEST_F(EntryWithoutAPath, IsOutOfRangeWhereASlashIsAdded) {
  EXPECT_TRUE(throws_unlocked([] { IndexFolderIsPathIndexed("/v/a.jpg", kPhoto); }));
  EXPECT_TRUE(throws_unlocked([] { IndexFolderIsFolderIndexed("/v"); }));
  EXPECT_TRUE(throws_unlocked([] { IndexFolderIsFolderHasParent("/v"); }));
}

TEST_F(EntryWithoutAPath, IsPassedOverByTheOtherQueries) {
  hold_folders({"", "/v/photo"});
  EXPECT_EQ(IndexFolderIsCoveredByShare("/v/photo"), 1);
  EXPECT_EQ(IndexFolderPositionGet("/v/photo"), 1);
}

TEST_F(EntryWithoutAPath, IsOutOfRangeWhenTheMemberIsMissing) {
  gIndexFolderConf.append(Json::Value(Json::objectValue));
  EXPECT_THROW(IndexFolderIsFolderIndexed("/v"), std::out_of_range);
  EXPECT_EQ(gIsBlockUpdate, 0);
}

TEST_F(Coverage, PassesOverWhatIsNoEntry) {
  gIndexFolderConf.append(7);
  gIndexFolderConf.append(Json::Value());
  Json::Value odd(Json::objectValue);
  odd["path"] = 3;
  gIndexFolderConf.append(odd);
  hold_folders({"/v/photo"});
  gIndexFolderConf[3]["photo"] = "yes";
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.jpg", kPhoto), 0);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.mp3", kMusic), 1);
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/photo"), 1);
  EXPECT_EQ(IndexFolderIsFolderHasParent("/v/photo/a"), 1);
  EXPECT_EQ(IndexFolderIsCoveredByShare("/v/photo"), 1);
  EXPECT_EQ(IndexFolderPositionGet("/v/photo"), 3);
}

TEST_F(Coverage, OfACopyThatIsNoArrayIsNone) {
  gIndexFolderConf = entry("/v/photo", true, true, true);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/photo/a.jpg", kPhoto), 0);
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/photo"), -1);
  EXPECT_EQ(IndexFolderPositionGet("/v/photo"), -1);
}

}  // namespace
}  // namespace mediidx::test
