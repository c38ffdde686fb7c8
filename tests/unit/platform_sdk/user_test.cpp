// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <pwd.h>
#include <tavosdk.h>
#include <unistd.h>

#include <filesystem>
#include <memory>
#include <string>

#include "unit/platform_core/temporary_folder.h"

namespace {

using mediidx::test::TemporaryRoot;
using User = std::unique_ptr<TAVOUSER, decltype(&TAVOUserFree)>;

User get(uint32_t uid) {
  TAVOUSER* user = nullptr;
  const int result = TAVOUserGetByUID(uid, &user);
  EXPECT_EQ(result < 0, user == nullptr);
  return {user, TAVOUserFree};
}

class AUser : public testing::Test {
 protected:
  void given(std::string_view passwd) { root_.write("etc/passwd", passwd); }
  TemporaryRoot root_;
};

TEST_F(AUser, IsFoundByNameAndById) {
  given("root:x:0:0::/root:/bin/sh\nanna:x:1000:1001:Anna,,,:/home/anna:/bin/sh\n");
  uint32_t uid = 0;
  uint32_t gid = 0;
  EXPECT_EQ(TAVOUserGetUGID("anna", &uid, &gid), 0);
  EXPECT_EQ(uid, 1000U);
  EXPECT_EQ(gid, 1001U);
  const auto user = get(1000);
  ASSERT_NE(user, nullptr);
  EXPECT_STREQ(user->name, "anna");
  EXPECT_STREQ(user->home, "/home/anna");
  EXPECT_EQ(user->uid, 1000U);
  EXPECT_EQ(user->gid, 1001U);
  EXPECT_NE(get(0), nullptr);
}

TEST_F(AUser, CanBeAskedForOneIdOrNone) {
  given("anna:x:1000:1001::/home/anna:/bin/sh\n");
  uint32_t id = 0;
  EXPECT_EQ(TAVOUserGetUGID("anna", &id, nullptr), 0);
  EXPECT_EQ(id, 1000U);
  EXPECT_EQ(TAVOUserGetUGID("anna", nullptr, &id), 0);
  EXPECT_EQ(id, 1001U);
  EXPECT_EQ(TAVOUserGetUGID("anna", nullptr, nullptr), 0);
}

TEST_F(AUser, ThatIsUnknownIsAFailure) {
  given("anna:x:1000:1001::/home/anna:/bin/sh\n");
  uint32_t uid = 77;
  EXPECT_LT(TAVOUserGetUGID("root", &uid, nullptr), 0);
  EXPECT_EQ(TLIBCErrGet(), TAVO_ERR_USER_NOT_FOUND);
  EXPECT_EQ(uid, 77U);
  EXPECT_EQ(get(0), nullptr);
}

TEST_F(AUser, IsSeenAsSoonAsTheFileChanges) {
  given("anna:x:1000:1000::/home/anna:/bin/sh\n");
  EXPECT_NE(get(1000), nullptr);
  given("ben:x:1001:1001::/home/ben:/bin/sh\n");
  EXPECT_EQ(get(1000), nullptr);
  EXPECT_NE(get(1001), nullptr);
}

TEST_F(AUser, MayHaveALineOfAnyLength) {
  given("long:x:1000:1000:" + std::string(1000000, 'g') +
        ":/home/long:/bin/sh\nanna:x:1001:1001::/home/anna:/bin/sh\n");
  EXPECT_NE(get(1000), nullptr);
  EXPECT_NE(get(1001), nullptr);
}

TEST_F(AUser, StandsBetweenBadLines) {
  given(
      "\n# comment\nbad\nbad:x\nbad:x:notanumber:1:::\n:x:1::::\nanna:x:1000:1000::/home/anna:\n"
      "cut:x:1001:1001::/home/cut");
  EXPECT_EQ(TAVOUserGetUGID("anna", nullptr, nullptr), 0);
  EXPECT_EQ(TAVOUserGetUGID("bad", nullptr, nullptr), -1);
  EXPECT_NE(get(1001), nullptr);
}

TEST_F(AUser, WithANameThatDoesNotFitHasNoRecord) {
  given(std::string(256, 'n') + ":x:1000:1000::/home/n:/bin/sh\n");
  EXPECT_EQ(get(1000), nullptr);
}

TEST_F(AUser, WithAHomeThatDoesNotFitHasNone) {
  given("anna:x:1000:1000::/" + std::string(4095, 'h') + ":/bin/sh\n");
  const auto user = get(1000);
  ASSERT_NE(user, nullptr);
  EXPECT_STREQ(user->home, "");
}

TEST_F(AUser, NeedsANameOrAPlaceForTheRecord) {
  EXPECT_LT(TAVOUserGetUGID(nullptr, nullptr, nullptr), 0);
  EXPECT_LT(TAVOUserGetByUID(0, nullptr), 0);
  TAVOUserFree(nullptr);
}

TEST_F(AUser, IsTheSystemsWhenTheRootHasNone) {
  const passwd* system = getpwuid(geteuid());
  ASSERT_NE(system, nullptr);
  uint32_t uid = 77;
  EXPECT_EQ(TAVOUserGetUGID(system->pw_name, &uid, nullptr), 0);
  EXPECT_EQ(uid, geteuid());
  const auto user = get(geteuid());
  ASSERT_NE(user, nullptr);
  EXPECT_STREQ(user->name, system->pw_name);
  EXPECT_LT(TAVOUserGetUGID("no such user", nullptr, nullptr), 0);
}

}  // namespace
