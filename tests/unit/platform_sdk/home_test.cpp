// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavosdk.h>

#include <filesystem>
#include <memory>
#include <string>

#include "homes.h"
#include "unit/platform_core/temporary_folder.h"

namespace {

using mediidx::platform::Home;
using mediidx::platform::is_real_user;
using mediidx::platform::User;
using mediidx::test::TemporaryRoot;
using Record = std::unique_ptr<TAVOHOMECHECK, decltype(&TAVOHomeCheckResultFree)>;

struct RealCase {
  const char* name;
  User user;
  bool real;
};

class ARealUser : public testing::TestWithParam<RealCase> {};

TEST_P(ARealUser, IsAPersonWithAHome) { EXPECT_EQ(is_real_user(GetParam().user), GetParam().real); }

INSTANTIATE_TEST_SUITE_P(Cases, ARealUser,
                         testing::Values(RealCase{"First", {"u", 1000, 1, "/home/u"}, true},
                                         RealCase{"System", {"u", 999, 1, "/home/u"}, false},
                                         RealCase{"Root", {"root", 0, 0, "/root"}, false},
                                         RealCase{"Nobody", {"nobody", 65534, 1, "/home/n"}, false},
                                         RealCase{"BeyondNobody", {"u", 65535, 1, "/home/u"}, true},
                                         RealCase{"Last", {"u", 4294967295U, 1, "/home/u"}, true},
                                         RealCase{"NoHome", {"u", 1000, 1, ""}, false},
                                         RealCase{"RelativeHome", {"u", 1000, 1, "home/u"}, false},
                                         RealCase{"RootAsHome", {"u", 1000, 1, "/"}, false},
                                         RealCase{"SlashesAsHome", {"u", 1000, 1, "///"}, false}),
                         [](const auto& test) { return test.param.name; });

struct HomeCase {
  const char* name;
  const char* path;
  const char* user;  ///< Empty when the path is in no home.
};

class AHome : public testing::TestWithParam<HomeCase> {};

TEST_P(AHome, HoldsItselfAndWhatLiesBelow) {
  const std::vector<Home> homes{{"anna", "/home/anna", "/volume1/homes/anna"},
                                {"ben", "/home/anna/ben", ""},
                                {"second", "/home/anna", "/volume1/homes/anna"},
                                {"rooted", "/home/rooted", "/"}};
  const Home* found = mediidx::platform::find_home(homes, GetParam().path);
  EXPECT_EQ(found ? found->user : "", GetParam().user);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, AHome,
    testing::Values(HomeCase{"Itself", "/home/anna", "anna"},
                    HomeCase{"WithASlash", "/home/anna/", "anna"},
                    HomeCase{"Below", "/home/anna/music/a.mp3", "anna"},
                    HomeCase{"AsItResolves", "/volume1/homes/anna/music", "anna"},
                    HomeCase{"DeepestCounts", "/home/anna/ben/x", "ben"},
                    HomeCase{"NameOnlyBeginsAlike", "/home/annabel/x", ""},
                    HomeCase{"OtherCase", "/home/Anna/x", ""}, HomeCase{"Above", "/home", ""},
                    HomeCase{"LinkedToRootHoldsNothing", "/etc/passwd", ""},
                    HomeCase{"LinkedToRootStillHoldsItsName", "/home/rooted/x", "rooted"},
                    HomeCase{"Empty", "", ""}, HomeCase{"Relative", "home/anna", ""},
                    HomeCase{"DoubleSlash", "//home/anna", ""},
                    HomeCase{"DoubleSlashBelow", "/home/anna//x", "anna"}),
    [](const auto& test) { return test.param.name; });

class TheHomeCheck : public testing::Test {
 protected:
  int check(const std::string& path) {
    TAVOHOMECHECK* result = nullptr;
    const int answer = TAVOServiceHomePathCheck(path.c_str(), 1, 1, &result);
    EXPECT_EQ(answer == 1, result != nullptr);
    record_.reset(result);
    return answer;
  }
  void add_user(const std::string& name, int uid, const std::string& home) {
    const auto id = std::to_string(uid);
    users_ += name + ":x:" + id + ":" + id + "::" + home + ":/bin/sh\n";
    root_.write("etc/passwd", users_);
  }
  TemporaryRoot root_;
  std::string users_;
  Record record_{nullptr, TAVOHomeCheckResultFree};
};

TEST_F(TheHomeCheck, NamesTheUserAndTheHome) {
  add_user("anna", 1000, "/nowhere/anna/");
  EXPECT_EQ(check("/nowhere/anna/music/a.mp3"), 1);
  EXPECT_STREQ(record_->user, "anna");
  EXPECT_STREQ(record_->home, "/nowhere/anna");
}

TEST_F(TheHomeCheck, FindsNoHomeElsewhere) {
  add_user("anna", 1000, "/nowhere/anna");
  add_user("daemon", 2, "/nowhere/daemon");
  EXPECT_EQ(check("/nowhere/daemon/x"), 0);
  EXPECT_EQ(check("/nowhere/anna2"), 0);
  EXPECT_EQ(check(""), 0);
}

TEST_F(TheHomeCheck, FollowsALinkedHome) {
  const auto real = root_.make_folder("volume1/homes/anna");
  std::filesystem::create_symlink(root_.at("volume1/homes"), root_.at("links"));
  add_user("anna", 1000, root_.at("links/anna"));
  EXPECT_EQ(check(real + "/music"), 1);
  EXPECT_EQ(record_->home, root_.at("links/anna"));
  EXPECT_EQ(check(root_.at("links/anna/music")), 1);
}

TEST_F(TheHomeCheck, SeesNewUsersAndDeletedOnes) {
  add_user("anna", 1000, "/nowhere/anna");
  EXPECT_EQ(check("/nowhere/ben/x"), 0);
  add_user("ben", 1001, "/nowhere/ben");
  EXPECT_EQ(check("/nowhere/ben/x"), 1);
  root_.write("etc/passwd", "ben:x:1001:1001::/nowhere/ben:\n");
  EXPECT_EQ(check("/nowhere/anna/x"), 0);
}

TEST_F(TheHomeCheck, SeesEachOfManyChangesThatLeaveSizeAndNameOfTheFile) {
  const std::filesystem::path file = root_.at("etc/passwd");
  add_user("anna", 1000, "/nowhere/anna");
  const auto written = std::filesystem::last_write_time(file);
  for (int i = 0; i < 100; ++i) {
    const auto id = std::to_string(1000 + i);
    root_.write("etc/passwd", "u" + id + ":x:" + id + ":1000::/nowhere/" + id + ":/bin/sh\n");
    std::filesystem::last_write_time(file, written);
    EXPECT_EQ(check("/nowhere/" + id + "/x"), 1);
    EXPECT_EQ(check("/nowhere/" + std::to_string(999 + i) + "/x"), 0);
  }
}

TEST_F(TheHomeCheck, SeesAFileOfTheRootThatComesAndGoes) {
  add_user("anna", 1000, "/nowhere/anna");
  EXPECT_EQ(check("/nowhere/anna/x"), 1);
  std::filesystem::remove(root_.at("etc/passwd"));
  EXPECT_EQ(check("/nowhere/anna/x"), 0);
  add_user("ben", 1001, "/nowhere/ben");
  EXPECT_EQ(check("/nowhere/anna/x"), 1);
  EXPECT_EQ(check("/nowhere/ben/x"), 1);
}

TEST_F(TheHomeCheck, HasNoHomeWithoutUsers) {
  root_.write("etc/passwd", "");
  EXPECT_EQ(check("/home/anna"), 0);
}

TEST_F(TheHomeCheck, SurvivesOddPaths) {
  add_user("anna", 1000, "/nowhere/anna");
  EXPECT_EQ(check("/nowhere/anna/../../etc"), 1);  // compared as text
  EXPECT_EQ(check("/nowhere/anna/" + std::string(100000, 'x')), 1);
  EXPECT_EQ(check("/nowhere/anna\xFF"), 0);
}

TEST_F(TheHomeCheck, FailsWhenTheRecordCannotHoldTheHome) {
  const auto home = "/" + std::string(4095, 'h');
  add_user("anna", 1000, home);
  EXPECT_EQ(check(home + "/x"), -1);
}

TEST_F(TheHomeCheck, AsksTheSystemWhenTheRootHasNoUsers) {
  EXPECT_EQ(check("/no home is here"), 0);
}

TEST_F(TheHomeCheck, NeedsAPathAndAPlaceForTheRecord) {
  TAVOHOMECHECK* result = nullptr;
  EXPECT_EQ(TAVOServiceHomePathCheck(nullptr, 1, 1, &result), -1);
  EXPECT_EQ(TAVOServiceHomePathCheck("/home", 1, 1, nullptr), -1);
  TAVOHomeCheckResultFree(nullptr);
}

}  // namespace
