// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include "mediidx/index_folder.h"
#include "request_test.h"

namespace mediidx::test {
namespace {

class IndexPath : public HelperTest {
 protected:
  IndexPath() {
    root.add_share("photo", root.at("volume1/photo"));
    root.set_index_folders(R"([{"path": "/photo", "photo": true}])");
    IndexFolderInit();
  }

  int ask(const std::string& path, MEDIA_TABLE_TYPE type) {
    return TAVOMediaIndexIsIndexPath(root.at(path).c_str(), type);
  }
};

TEST_F(IndexPath, BelongsByTheFlagsOfItsFolder) {
  EXPECT_EQ(ask("volume1/photo/a.jpg", MEDIA_TABLE_PHOTO), 1);
  EXPECT_EQ(ask("volume1/photo/a.mp3", MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(ask("volume1/photo/a.m3u", MEDIA_TABLE_PLAYLIST), 0);
  EXPECT_EQ(ask("volume1/a.jpg", MEDIA_TABLE_PHOTO), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(IndexPath, OfAFolderBelongsWhateverTheFlags) {
  EXPECT_EQ(ask("volume1/photo/2010", MEDIA_TABLE_DIRECTORY), 1);
  EXPECT_EQ(ask("volume1/photo", MEDIA_TABLE_DIRECTORY), 1);
  EXPECT_EQ(ask("volume1", MEDIA_TABLE_DIRECTORY), 0);
}

TEST_F(IndexPath, OfAConversionNeverBelongs) {
  EXPECT_EQ(ask("volume1/photo/a.mp4", MEDIA_TABLE_VIDEO_CONVERT), 0);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder:N Wrong media table type: " +
                                       root.at("volume1/photo/a.mp4")));
}

TEST_F(IndexPath, NeedsAPath) {
  EXPECT_EQ(TAVOMediaIndexIsIndexPath(nullptr, MEDIA_TABLE_PHOTO), -1);
  EXPECT_EQ(TAVOMediaIndexIsIndexPath("", MEDIA_TABLE_PHOTO), -1);
  EXPECT_EQ(log_lines(), std::vector<std::string>(
                             2, "mediidx:N TAVOMediaIndexIsIndexPath: Bad parameter: path"));
  EXPECT_EQ(logged()[0].priority, 3);
}

TEST_F(IndexPath, OnARemoteMountNeverBelongs) {
  platform_answers().remote_mount = root.path();
  EXPECT_EQ(ask("volume1/photo/a.jpg", MEDIA_TABLE_PHOTO), 0);
  EXPECT_EQ(ask("homes/ann/music/a.mp3", MEDIA_TABLE_MUSIC), 0);
}

TEST_F(IndexPath, IsAnErrorWhenHomesCannotBeChecked) {
  platform_answers().home_check_fails = true;
  EXPECT_EQ(TAVOMediaIndexIsIndexPath("/a%s.jpg", MEDIA_TABLE_PHOTO), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N TAVOServiceHomePathCheck(/a%s.jpg) fail"));
}

TEST_F(IndexPath, InAPersonalLibraryAlwaysBelongs) {
  EXPECT_EQ(ask("homes/ann/music/a.jpg", MEDIA_TABLE_PHOTO), 1);
  EXPECT_EQ(ask("homes/ann/MUSIC", MEDIA_TABLE_DIRECTORY), 1);
  EXPECT_EQ(ask("homes/ann/musical/a.mp3", MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(ask("homes/ann/a.mp3", MEDIA_TABLE_MUSIC), 0);
}

TEST_F(IndexPath, InAHomeMayBelongByItsFolder) {
  root.add_share("homes", root.at("homes"));
  root.set_index_folders(R"([{"path": "/homes/ann/pictures", "photo": true}])");
  IndexFolderUpdate();
  EXPECT_EQ(ask("homes/ann/pictures/a.jpg", MEDIA_TABLE_PHOTO), 1);
  EXPECT_EQ(ask("homes/ann/other/a.jpg", MEDIA_TABLE_PHOTO), 0);
}

TEST_F(IndexPath, InAPersonalLibraryIsThatOfTheResolvedHome) {
  root.make_link("homes/bob", root.make_folder("volume2/bob"));
  root.add_user("bob", 1027, root.at("homes/bob"));
  EXPECT_EQ(ask("volume2/bob/music/a.mp3", MEDIA_TABLE_MUSIC), 1);
  EXPECT_EQ(ask("homes/bob/music/a.mp3", MEDIA_TABLE_MUSIC), 0);
}

TEST_F(IndexPath, InAPersonalLibraryBelongsWithoutTheHomeFolder) {
  std::filesystem::remove(root.at("homes/ann"));
  EXPECT_EQ(ask("homes/ann/music/a.mp3", MEDIA_TABLE_MUSIC), 1);
}

TEST_F(IndexPath, DoesNotBelongWhereTheFoldersCannotBeAsked) {
  gIndexFolderConf.append(createRule("", "", true, true, true, false));
  EXPECT_EQ(ask("volume1/a.jpg", MEDIA_TABLE_PHOTO), 0);
  EXPECT_EQ(ask("volume1", MEDIA_TABLE_DIRECTORY), 0);
  EXPECT_EQ(logged().size(), 2U);
}

class SharesIndexed : public IndexPath {};

TEST_F(SharesIndexed, AreKnownByName) {
  root.add_share("music", root.at("volume1/music"));
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed("photo"), 1);
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed("music"), 0);
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed("unknown"), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(SharesIndexed, AreKnownByFolder) {
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed(root.at("volume1/photo").c_str()), 1);
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed(root.at("volume1/PHOTO").c_str()), 1);
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed(root.at("volume1/other").c_str()), 0);
}

TEST_F(SharesIndexed, NeedAName) {
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed(nullptr), -1);
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed(""), -1);
  EXPECT_EQ(log_lines(), std::vector<std::string>(2, "mediidx:N Bad parameter: szShare"));
}

TEST_F(SharesIndexed, AreNoneInAnEmptyConfiguration) {
  IndexFolderFree();
  EXPECT_EQ(TAVOMediaintIndexIsShareIndexed("photo"), 0);
}

}  // namespace
}  // namespace mediidx::test
