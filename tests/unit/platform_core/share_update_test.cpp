// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <json/reader.h>
#include <sys/stat.h>
#include <tavocore.h>

#include <cstdio>
#include <filesystem>
#include <sstream>
#include <string>

#include "temporary_folder.h"

namespace {

using mediidx::test::TemporaryRoot;

constexpr const char* kFile = "usr/tavo/etc/share.conf";

TAVOSHARE make_share(const char* name, const char* path, uint32_t status) {
  TAVOSHARE share{};
  std::snprintf(share.name, sizeof share.name, "%s", name);
  std::snprintf(share.path, sizeof share.path, "%s", path);
  share.status = status;
  return share;
}

class UpdatingAShare : public testing::Test {
 protected:
  void given(std::string_view text) { root_.write(kFile, text); }
  int update(const char* name, const char* path, uint32_t status) {
    const auto share = make_share(name, path, status);
    return TLIBShareUpdate(&share);
  }
  Json::Value content() {
    Json::Value top;
    std::istringstream(root_.read(kFile)) >> top;
    return top;
  }
  TemporaryRoot root_;
};

TEST_F(UpdatingAShare, WritesItsFolderAndFlags) {
  given(R"({"music": {"path": "/volume1/music", "status": 1}})");
  EXPECT_EQ(update("music", "/volume2/music", 0xFFFFFFFF), 0);
  EXPECT_EQ(content()["music"]["path"], "/volume2/music");
  EXPECT_EQ(content()["music"]["status"].asUInt(), 0xFFFFFFFFU);
}

TEST_F(UpdatingAShare, KeepsEverythingElse) {
  given(R"({"music": {"path": "/v/music", "status": 1, "comment": "été", "n": [1, {"a": null}]},
            "photo": {"path": 5}, "version": 3.5})");
  auto expected = content();
  expected["music"]["status"] = 33;
  EXPECT_EQ(update("music", "/v/music", 33), 0);
  EXPECT_EQ(content(), expected);
}

TEST_F(UpdatingAShare, KeepsTheFilesModeAndLeavesNoOtherFile) {
  given(R"({"music": {"path": "/v/music", "status": 1}})");
  ASSERT_EQ(chmod(root_.at(kFile).c_str(), 0640), 0);
  EXPECT_EQ(update("music", "/v/music", 2), 0);
  struct stat info{};
  ASSERT_EQ(stat(root_.at(kFile).c_str(), &info), 0);
  EXPECT_EQ(info.st_mode & 07777, 0640U);
  const std::filesystem::directory_iterator files(root_.at("usr/tavo/etc"));
  EXPECT_EQ(std::distance(begin(files), end(files)), 1);
}

TEST_F(UpdatingAShare, WritesWhereALinkLeads) {
  root_.write("real.conf", R"({"music": {"path": "/v/music", "status": 1}})");
  root_.make_folder("usr/tavo/etc");
  std::filesystem::create_symlink(root_.at("real.conf"), root_.at(kFile));
  EXPECT_EQ(update("music", "/v/music", 2), 0);
  EXPECT_TRUE(std::filesystem::is_symlink(root_.at(kFile)));
  EXPECT_EQ(content()["music"]["status"].asUInt(), 2U);
}

TEST_F(UpdatingAShare, ThatTheFileDoesNotHoldFails) {
  given(R"({"music": {"path": "/v/music"}, "odd": 5})");
  const auto before = root_.read(kFile);
  EXPECT_EQ(update("photo", "/v/photo", 0), -1);
  EXPECT_EQ(TLIBCErrGet(), TAVO_ERR_SHARE_NOT_FOUND);
  EXPECT_EQ(update("odd", "/v/odd", 0), -1);
  EXPECT_EQ(root_.read(kFile), before);
}

TEST_F(UpdatingAShare, LeavesAFileAloneThatItDoesNotUnderstand) {
  for (const std::string& text : {std::string("{\"music\": {\"path\""), std::string("[]"),
                                  std::string(), std::string(100000, '[')}) {
    given(text);
    EXPECT_EQ(update("music", "/v/music", 0), -1);
    EXPECT_EQ(root_.read(kFile), text);
  }
}

TEST_F(UpdatingAShare, FailsWithoutAFile) {
  EXPECT_EQ(update("music", "/v/music", 0), -1);
  EXPECT_FALSE(std::filesystem::exists(root_.at(kFile)));
}

TEST_F(UpdatingAShare, RefusesRecordsThatAreNone) {
  given(R"({"music": {"path": "/v/music"}, "": {"path": "/v"}})");
  EXPECT_EQ(TLIBShareUpdate(nullptr), -1);
  EXPECT_EQ(update("", "/v", 0), -1);
  EXPECT_EQ(update("music", "v/music", 0), -1);
  EXPECT_EQ(update("music", "", 0), -1);
  auto endless = make_share("music", "/v/music", 0);
  std::fill(std::begin(endless.path), std::end(endless.path), 'x');
  endless.path[0] = '/';
  EXPECT_EQ(TLIBShareUpdate(&endless), -1);
}

}  // namespace
