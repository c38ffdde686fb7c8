// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include "index_folder_test.h"

namespace mediidx::test {
namespace {

class DefaultRules : public IndexFolderTest {
 protected:
  DefaultRules() { root.make_folder("usr/tavo/etc"); }

  /// The link of a service, to a share of this name below the root's volume.
  void link_service(const std::string& kind, const std::string& share) {
    root.make_link("var/services/" + kind, add_share(share));
  }
};

TEST_F(DefaultRules, AreMadeWithEveryMember) {
  const auto rule = createRule("n", "/p", true, false, true, true);
  EXPECT_EQ(rule.getMemberNames(),
            (std::vector<std::string>{"default", "music", "name", "path", "photo", "video"}));
  EXPECT_EQ(rule["name"], "n");
  EXPECT_EQ(rule["path"], "/p");
  EXPECT_EQ(rule["photo"], true);
  EXPECT_EQ(rule["music"], false);
  EXPECT_EQ(rule["video"], true);
  EXPECT_EQ(rule["default"], true);
}

TEST_F(DefaultRules, FindTheShareBehindTheServiceLink) {
  link_service("photo", "pictures");
  EXPECT_EQ(getDefaultSharePath("photo"), "/pictures");
  EXPECT_EQ(getDefaultSharePath("PHOTO"), "/pictures");
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(DefaultRules, FindAFolderInAShare) {
  add_share("media");
  root.make_link("var/services/music", root.at("volume1/media/sounds"));
  EXPECT_EQ(getDefaultSharePath("music"), "/media/sounds");
}

TEST_F(DefaultRules, HaveNoPathWithoutALink) {
  EXPECT_EQ(getDefaultSharePath("video"), "");
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(DefaultRules, HaveNoPathForAnotherKind) {
  link_service("photo", "photo");
  EXPECT_EQ(getDefaultSharePath("photos"), "");
  EXPECT_EQ(getDefaultSharePath(""), "");
  EXPECT_EQ(getDefaultSharePath(nullptr), "");
}

TEST_F(DefaultRules, HaveNoPathWhereTheVolumeIsUnknown) {
  root.make_link("var/services/photo", "relative/photo");
  EXPECT_EQ(getDefaultSharePath("photo"), "");
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder_action:N Fail to get share bin path "
                                       "from [relative/photo]"));
}

TEST_F(DefaultRules, HaveNoPathWhereNothingFollowsTheVolume) {
  root.make_link("var/services/photo", "/volume1");
  EXPECT_EQ(getDefaultSharePath("photo"), "");
}

struct KindCase {
  const char* kind;
  const char* name;
  bool photo;
  bool music;
  bool video;
};

class DefaultRuleOfKind : public IndexFolderTest, public testing::WithParamInterface<KindCase> {};

TEST_P(DefaultRuleOfKind, FallsBackToTheKindAsGiven) {
  const auto& expected = GetParam();
  EXPECT_EQ(createDefaultShareRule(expected.kind, 1),
            createRule(expected.name, std::string("/") + expected.kind, expected.photo,
                       expected.music, expected.video, false));
}

INSTANTIATE_TEST_SUITE_P(Cases, DefaultRuleOfKind,
                         testing::Values(KindCase{"photo", "photo", true, false, false},
                                         KindCase{"Photo", "photo", true, false, false},
                                         KindCase{"music", "music", false, true, false},
                                         KindCase{"MUSIC", "music", false, true, false},
                                         KindCase{"video", "video", false, false, true}),
                         [](const auto& test) { return test.param.kind; });

TEST_F(DefaultRules, AreNullWithoutAShareAndFallback) {
  EXPECT_TRUE(createDefaultShareRule("photo", 0).isNull());
}

TEST_F(DefaultRules, AreNullForAnotherKind) {
  EXPECT_TRUE(createDefaultShareRule("documents", 1).isNull());
  EXPECT_TRUE(createDefaultShareRule(nullptr, 1).isNull());
}

TEST_F(DefaultRules, PreferTheShareToTheFallback) {
  link_service("music", "sounds");
  EXPECT_EQ(createDefaultShareRule("music", 1),
            createRule("music", "/sounds", false, true, false, false));
}

class DefaultConf : public DefaultRules {
 protected:
  /// Makes the folder of the share's own name within it.
  void make_inner_folder(const std::string& share) {
    root.make_folder("volume1/" + share + "/" + share);
  }
  std::vector<std::string> written() { return paths_of(IndexFolderConfOpen()); }
};

TEST_F(DefaultConf, HoldsTheThreeShares) {
  for (const char* share : {"photo", "music", "video"}) {
    add_share(share);
    make_inner_folder(share);
  }
  EXPECT_EQ(WriteDefaultConf(), 0);
  EXPECT_EQ(IndexFolderConfOpen(),
            list({createRule("photo", "/photo", true, false, false, false),
                  createRule("music", "/music", false, true, false, false),
                  createRule("video", "/video", false, false, true, false)}));
  EXPECT_EQ(asked_signals().size(), 4U);
}

TEST_F(DefaultConf, HoldsSharesThatDoNotExist) {
  EXPECT_EQ(WriteDefaultConf(), 0);
  EXPECT_THAT(written(), ElementsAre("/photo", "/music", "/video"));
}

TEST_F(DefaultConf, LeavesOutAMissingFolderBehindOneThatIsThere) {
  for (const char* share : {"photo", "music", "video"}) add_share(share);
  make_inner_folder("photo");
  EXPECT_EQ(WriteDefaultConf(), 0);
  EXPECT_THAT(written(), ElementsAre("/photo"));
}

TEST_F(DefaultConf, KeepsAMissingFolderBehindAFile) {
  for (const char* share : {"photo", "music", "video"}) add_share(share);
  root.write("volume1/photo/photo", "a file");
  EXPECT_EQ(WriteDefaultConf(), 0);
  EXPECT_THAT(written(), ElementsAre("/photo", "/music", "/video"));
}

TEST_F(DefaultConf, JudgesAMissingShareByTheFolderBeforeIt) {
  add_share("photo");
  make_inner_folder("photo");
  EXPECT_EQ(WriteDefaultConf(), 0);
  EXPECT_THAT(written(), ElementsAre("/photo", "/music", "/video"));
}

TEST_F(DefaultConf, ReportsAFailedSave) {
  std::filesystem::remove(root.at("usr/tavo/etc"));
  EXPECT_EQ(WriteDefaultConf(), -1);
  EXPECT_TRUE(was_logged("open(/usr/tavo/etc/index_folder.conf, "));
}

class EditorList : public DefaultRules {};

TEST_F(EditorList, BeginsWithTheDefaultShares) {
  link_service("video", "video");
  link_service("photo", "pictures");
  root.set_index_folders(list({entry("/photo/2010", true, false, false)}).toStyledString());
  EXPECT_EQ(IndexFolderConfLoad(),
            list({createRule("photo", "/pictures", true, false, false, false),
                  createRule("video", "/video", false, false, true, false),
                  entry("/photo/2010", true, false, false)}));
}

TEST_F(EditorList, OfAnAbsentFileHoldsTheDefaultSharesAlone) {
  link_service("music", "music");
  EXPECT_THAT(paths_of(IndexFolderConfLoad()), ElementsAre("/music"));
}

TEST_F(EditorList, DropsStoredDefaultEntries) {
  link_service("photo", "photo");
  root.set_index_folders(
      list({createRule("photo", "/photo", false, true, true, true)}).toStyledString());
  EXPECT_EQ(IndexFolderConfLoad(),
            list({createRule("photo", "/photo", true, false, false, false)}));
}

TEST_F(EditorList, KeepsStoredEntriesInTheirOrder) {
  root.set_index_folders(R"([{"path": "/b"}, {"path": "/a/long"}, {"path": "/b"}])");
  EXPECT_THAT(paths_of(IndexFolderConfLoad()), ElementsAre("/b", "/a/long", "/b"));
}

TEST_F(EditorList, PassesOverEntriesThatAreNotUsable) {
  root.set_index_folders(
      R"([1, null, [], "x", {"photo": true}, {"path": ""}, {"path": 7}, {"path": ["/a"]},
          {"path": "/a", "default": "yes"}, {"path": "/a", "photo": {}}, {"path": "/good"}])");
  EXPECT_THAT(paths_of(IndexFolderConfLoad()), ElementsAre("/good"));
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(EditorList, WritesNothing) {
  IndexFolderConfLoad();
  EXPECT_FALSE(IsIndexFolderConfExist());
}

}  // namespace
}  // namespace mediidx::test
