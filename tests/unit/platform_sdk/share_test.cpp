// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavosdk.h>

#include <array>
#include <memory>
#include <string>

#include "unit/platform_core/temporary_folder.h"

namespace {

using mediidx::test::TemporaryRoot;
using Share = std::unique_ptr<TAVOSHARE, decltype(&TAVOShareFree)>;

constexpr const char* kFile = "usr/tavo/etc/share.conf";

Share get(const char* name) {
  TAVOSHARE* share = nullptr;
  const int result = TAVOShareGet(name, &share);
  EXPECT_EQ(result < 0, share == nullptr);
  return {share, TAVOShareFree};
}

class AShare : public testing::Test {
 protected:
  void given(std::string_view text) { root_.write(kFile, text); }
  TemporaryRoot root_;
};

TEST_F(AShare, IsFoundByName) {
  given(R"({"music": {"path": "/volume1/music", "status": 33}, "photo": {"path": "/v/photo"}})");
  const auto music = get("music");
  ASSERT_NE(music, nullptr);
  EXPECT_STREQ(music->name, "music");
  EXPECT_STREQ(music->path, "/volume1/music");
  EXPECT_EQ(music->status, 33U);
}

TEST_F(AShare, HasNoFlagsWhenNoneStandThere) {
  given(R"({"photo": {"path": "/v/photo"}})");
  const auto photo = get("photo");
  ASSERT_NE(photo, nullptr);
  EXPECT_EQ(photo->status, 0U);
}

TEST_F(AShare, IsFoundWithoutRegardToCaseWhenNoNameIsExact) {
  given(R"({"Été": {"path": "/v/a"}, "music": {"path": "/v/b"}, "MUSIC": {"path": "/v/c"}})");
  const auto exact = get("music");
  const auto folded = get("ÉTÉ");
  ASSERT_NE(exact, nullptr);
  ASSERT_NE(folded, nullptr);
  EXPECT_STREQ(exact->path, "/v/b");
  EXPECT_STREQ(folded->name, "Été");
}

TEST_F(AShare, LosesTheSlashesBehindItsFolder) {
  given(R"({"music": {"path": "/volume1/music//"}})");
  ASSERT_NE(get("music"), nullptr);
  EXPECT_STREQ(get("music")->path, "/volume1/music");
}

TEST_F(AShare, MayHaveTheLongestNameAndFolder) {
  const std::string name(255, 'n');
  const std::string path = "/" + std::string(4094, 'p');
  given("{\"" + name + "\": {\"path\": \"" + path + "\"}}");
  const auto share = get(name.c_str());
  ASSERT_NE(share, nullptr);
  EXPECT_EQ(share->name, name);
  EXPECT_EQ(share->path, path);
}

TEST_F(AShare, ThatIsUnknownIsAFailure) {
  given(R"({"music": {"path": "/v/music"}})");
  TAVOSHARE* share = nullptr;
  EXPECT_LT(TAVOShareGet("video", &share), 0);
  EXPECT_EQ(TLIBCErrGet(), TAVO_ERR_SHARE_NOT_FOUND);
  EXPECT_EQ(share, nullptr);
}

TEST_F(AShare, NeedsANameAndAPlaceForTheRecord) {
  TAVOSHARE* share = nullptr;
  EXPECT_LT(TAVOShareGet(nullptr, &share), 0);
  EXPECT_LT(TAVOShareGet("music", nullptr), 0);
  TAVOShareFree(nullptr);
}

struct BadFileCase {
  const char* name;
  std::string text;
};

class ABadShareFile : public testing::TestWithParam<BadFileCase> {};

TEST_P(ABadShareFile, HoldsNoSuchShare) {
  const TemporaryRoot root;
  root.write(kFile, GetParam().text);
  EXPECT_EQ(get("music"), nullptr);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, ABadShareFile,
    testing::Values(BadFileCase{"Empty", ""}, BadFileCase{"CutShort", R"({"music": {"path": "/v)"},
                    BadFileCase{"AnArray", R"([{"path": "/v"}])"},
                    BadFileCase{"AText", R"("music")"},
                    BadFileCase{"DeepArrays", std::string(200000, '[')},
                    BadFileCase{"DeepObjects",
                                [] {
                                  std::string text;
                                  for (int i = 0; i < 50000; ++i) text += "{\"music\":";
                                  return text;
                                }()},
                    BadFileCase{"NoText", std::string("\0\xFF\xFE{", 4)},
                    BadFileCase{"EntryIsAText", R"({"music": "/v"})"},
                    BadFileCase{"EntryIsNull", R"({"music": null})"},
                    BadFileCase{"NoPath", R"({"music": {"status": 1}})"},
                    BadFileCase{"PathIsANumber", R"({"music": {"path": 1}})"},
                    BadFileCase{"PathIsAnObject", R"({"music": {"path": {}}})"},
                    BadFileCase{"PathIsEmpty", R"({"music": {"path": ""}})"},
                    BadFileCase{"PathIsRelative", R"({"music": {"path": "v/music"}})"},
                    BadFileCase{"PathHoldsNull", R"({"music": {"path": "/v\u0000/x"}})"},
                    BadFileCase{"PathIsTooLong",
                                "{\"music\": {\"path\": \"/" + std::string(4095, 'p') + "\"}}"},
                    BadFileCase{"StatusIsNegative", R"({"music": {"path": "/v", "status": -1}})"},
                    BadFileCase{"StatusIsTooLarge",
                                R"({"music": {"path": "/v", "status": 4294967296}})"},
                    BadFileCase{"StatusIsAText", R"({"music": {"path": "/v", "status": "1"}})"}),
    [](const auto& test) { return test.param.name; });

TEST(AMissingShareFile, HoldsNoShare) {
  const TemporaryRoot root;
  EXPECT_EQ(get("music"), nullptr);
}

TEST_F(AShare, StandsBesideBadEntries) {
  given(R"({"a": 1, "music": {"path": "/v/music"}, "z": {"path": []}})");
  EXPECT_NE(get("music"), nullptr);
}

TEST_F(AShare, HasItsIndexedBitCleared) {
  given(R"({"music": {"path": "/v/music", "status": 255}, "photo": {"path": "/v/p"}})");
  EXPECT_EQ(ShareIndexStatusClear("music"), 0);
  ASSERT_NE(get("music"), nullptr);
  EXPECT_EQ(get("music")->status, 255U - 0x20U);
}

TEST_F(AShare, HasNoBitToClearWhenItIsUnknown) {
  given(R"({"music": {"path": "/v/music"}})");
  EXPECT_LT(ShareIndexStatusClear("photo"), 0);
  EXPECT_LT(ShareIndexStatusClear(nullptr), 0);
}

struct VolumeCase {
  const char* name;
  const char* path;
  const char* root;  ///< Null for a failure.
};

class TheVolumeRoot : public testing::TestWithParam<VolumeCase> {};

TEST_P(TheVolumeRoot, StandsAboveTheShare) {
  const TemporaryRoot root;
  root.write(kFile, R"({"photo": {"path": "/srv/disk/photo"}, "deep": {"path": "/srv/disk/photo/d"},
                        "top": {"path": "/top"}})");
  std::array<char, 4096> buffer{"untouched"};
  const int result = TAVOShareBinPathGet(GetParam().path, buffer.data(), 4096);
  EXPECT_EQ(result == 0, GetParam().root != nullptr);
  EXPECT_STREQ(buffer.data(), GetParam().root ? GetParam().root : "untouched");
}

INSTANTIATE_TEST_SUITE_P(
    Cases, TheVolumeRoot,
    testing::Values(VolumeCase{"TheShareItself", "/srv/disk/photo", "/srv/disk"},
                    VolumeCase{"BelowTheShare", "/srv/disk/photo/2010/x", "/srv/disk"},
                    VolumeCase{"DeepestShare", "/srv/disk/photo/d/x", "/srv/disk/photo"},
                    VolumeCase{"NameOnlyBeginsAlike", "/srv/disk/photos", "/srv"},
                    VolumeCase{"NoShare", "/volume1/photo", "/volume1"},
                    VolumeCase{"VolumeAlone", "/volume1", "/volume1"},
                    VolumeCase{"ShareInTheRoot", "/top/a", nullptr},
                    VolumeCase{"Root", "/", nullptr}, VolumeCase{"TwoSlashes", "//a", nullptr},
                    VolumeCase{"Relative", "volume1/photo", nullptr},
                    VolumeCase{"Empty", "", nullptr}, VolumeCase{"None", nullptr, nullptr}),
    [](const auto& test) { return test.param.name; });

TEST(TheVolumeRootsBuffer, HasToBeLargeEnough) {
  const TemporaryRoot root;
  std::array<char, 9> buffer{};
  EXPECT_EQ(TAVOShareBinPathGet("/volume1/a", buffer.data(), 9), 0);
  EXPECT_LT(TAVOShareBinPathGet("/volume1/a", buffer.data(), 8), 0);
  EXPECT_LT(TAVOShareBinPathGet("/volume1/a", buffer.data(), 0), 0);
  EXPECT_LT(TAVOShareBinPathGet("/volume1/a", nullptr, 9), 0);
}

}  // namespace
