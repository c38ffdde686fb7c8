// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <string>

#include "index_folder_test.h"

namespace mediidx::test {
namespace {

class FindingAnIndexFolder : public IndexFolderTest {
 protected:
  FindingAnIndexFolder() {
    add_share("photo");
    root.make_folder("volume1/photo/2010/trip");
  }

  /// The path of the entry that was found; empty when `expected` was answered and none was.
  std::string find(const Json::Value& conf, const char* path, int expected) {
    const Json::Value* found = nullptr;
    EXPECT_EQ(FindIndexFolderByPath(conf, path, &found), expected);
    return found ? (*found)["path"].asString() : std::string();
  }
};

const Json::Value kShortFirst =
    list({entry("/photo", true, true, true), entry("/photo/2010", true, true, true)});
const Json::Value kLongFirst =
    list({entry("/photo/2010", true, true, true), entry("/photo", true, true, true)});

TEST_F(FindingAnIndexFolder, PicksTheDeepestWhateverTheOrder) {
  EXPECT_EQ(find(kShortFirst, "/photo/2010/trip", 1), "/photo/2010");
  EXPECT_EQ(find(kLongFirst, "/photo/2010/trip", 1), "/photo/2010");
}

TEST_F(FindingAnIndexFolder, PicksTheFolderItself) {
  EXPECT_EQ(find(kShortFirst, "/photo/2010", 1), "/photo/2010");
  EXPECT_EQ(find(kShortFirst, "/photo", 1), "/photo");
}

TEST_F(FindingAnIndexFolder, PicksTheFirstOfEqualLength) {
  const auto conf = list({entry("/photo", true, false, false), entry("/photo", false, true, true)});
  const Json::Value* found = nullptr;
  EXPECT_EQ(FindIndexFolderByPath(conf, "/photo/2010", &found), 1);
  EXPECT_EQ(found, &conf[0]);
}

TEST_F(FindingAnIndexFolder, FindsNoneOutsideOfEveryEntry) {
  const auto conf =
      list({entry("/photo/2010/trip", true, true, true), entry("/music", true, true, true)});
  EXPECT_EQ(find(conf, "/photo/2010", 0), "");
  EXPECT_EQ(find(Json::Value(Json::arrayValue), "/photo/2010", 0), "");
}

TEST_F(FindingAnIndexFolder, FailsForAnUnknownShare) {
  EXPECT_EQ(find(list({entry("/gone", true, true, true)}), "/gone", -1), "");
}

TEST_F(FindingAnIndexFolder, FailsForWhatIsNoFolder) {
  root.write("volume1/photo/file", "");
  EXPECT_EQ(find(kShortFirst, "/photo/file", -1), "");
  EXPECT_EQ(find(kShortFirst, "/photo/missing", -1), "");
}

TEST_F(FindingAnIndexFolder, FailsWithoutAPathOrAPlaceForTheAnswer) {
  EXPECT_EQ(find(kShortFirst, nullptr, -1), "");
  EXPECT_EQ(find(kShortFirst, "", -1), "");
  EXPECT_EQ(FindIndexFolderByPath(kShortFirst, "/photo", nullptr), -1);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(FindingAnIndexFolder, PassesOverWhatIsNoEntry) {
  auto conf = list({Json::Value(1), Json::Value(), entry("", true, true, true),
                    Json::Value(Json::arrayValue), Json::Value(Json::objectValue)});
  conf.append(entry("/photo", true, true, true));
  EXPECT_EQ(find(conf, "/photo/2010", 1), "/photo");
  EXPECT_EQ(find(Json::Value("text"), "/photo/2010", 0), "");
}

}  // namespace
}  // namespace mediidx::test
