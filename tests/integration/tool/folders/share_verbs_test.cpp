// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "folder_test.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

class ShareVerbs : public FolderTest {};

TEST_F(ShareVerbs, AddAndRemoveKeepTheShareFile) {
  output({"share", "add", "pictures", media.path()});
  auto shares = read_json(settings("share.conf"));
  EXPECT_EQ(shares["pictures"]["path"], media.path().string());
  EXPECT_EQ(shares["pictures"]["status"], 0);
  output({"share", "remove", "pictures"});
  shares = read_json(settings("share.conf"));
  EXPECT_TRUE(shares.empty());
  EXPECT_TRUE(fs::exists(media.path()));
}

TEST_F(ShareVerbs, ListsAsJsonAndAsLines) {
  fs::create_directory(media.at("m"));
  output({"share", "add", "pictures", media.at("m")});
  auto list = json({"share", "list"});
  ASSERT_EQ(list.size(), 1U);
  EXPECT_EQ(list[0]["name"], "pictures");
  EXPECT_EQ(list[0]["path"], media.at("m"));
  EXPECT_EQ(list[0]["indexed"], false);
  EXPECT_EQ(list[0]["exists"], true);
  EXPECT_EQ(output({"share", "list"}), "pictures\t" + media.at("m") + "\tno\tyes\n");
  output({"folder", "add", media.at("m")});
  EXPECT_EQ(json({"share", "list"})[0]["indexed"], true);
  fs::remove(media.at("m"));
  EXPECT_EQ(json({"share", "list"})[0]["exists"], false);
}

TEST_F(ShareVerbs, NoShareIsAnEmptyList) {
  EXPECT_EQ(output({"--json", "share", "list"}), "[]\n");
  EXPECT_EQ(output({"--json", "folder", "list"}), "[]\n");
}

TEST_F(ShareVerbs, ANameIsTakenOnceWithoutRegardToCase) {
  output({"share", "add", "Pictures", media.path()});
  const auto again = run({"share", "add", "pictures", media.path()});
  EXPECT_EQ(again.status, 1);
  EXPECT_THAT(again.err, HasSubstr("there is a share Pictures already"));
}

TEST_F(ShareVerbs, NamesThatAreNoPathPartAreRefused) {
  for (const char* name : {"", ".", "..", "a/b", "\xff"}) {
    EXPECT_EQ(run({"share", "add", name, media.path()}).status, 2) << name;
  }
  EXPECT_EQ(run({"share", "add", std::string(256, 'a'), media.path()}).status, 2);
}

TEST_F(ShareVerbs, AFolderOfTheShareKeepsItsName) {
  fs::create_directory(media.at("m"));
  output({"share", "add", "pictures", media.path()});
  output({"folder", "add", media.at("m")});
  EXPECT_EQ(json({"folder", "list"})[0]["share_path"], "/pictures/m");
}

TEST_F(ShareVerbs, AShareWithAnIndexFolderStays) {
  output({"share", "add", "pictures", media.path()});
  output({"folder", "add", media.path()});
  const auto refused = run({"share", "remove", "pictures"});
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.err, HasSubstr(media.path().string() + " lies in the share pictures"));
  output({"folder", "remove", media.path()});
  output({"share", "remove", "pictures"});
  EXPECT_EQ(json({"share", "list"}).size(), 0U);
}

TEST_F(ShareVerbs, OnlyAShareThatIsThereIsRemoved) {
  const auto refused = run({"share", "remove", "pictures"});
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.err, HasSubstr("there is no share pictures"));
}

}  // namespace
}  // namespace mediidx::test
