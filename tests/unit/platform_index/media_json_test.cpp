// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <json/reader.h>
#include <mediidx/record.h>
#include <tavoindex.h>

#include <array>
#include <cmath>
#include <cstring>
#include <limits>
#include <memory>
#include <sstream>
#include <string>

namespace {

using Record = __tag_TAVO_MEDIA_INFO;
using namespace std::string_literals;

class ARecordFromJson : public testing::Test {
 protected:
  ARecordFromJson() { json_["szPath"] = "/v/a.mp3"; }

  const Record& read() {
    std::memset(record_.get(), 0x55, sizeof(Record));
    EXPECT_EQ(MediaInfoJson2Object(json_, record_.get()), 0);
    return *record_;
  }
  int result() { return MediaInfoJson2Object(json_, record_.get()); }

  Json::Value json_{Json::objectValue};
  std::unique_ptr<Record> record_ = std::make_unique<Record>();
};

TEST_F(ARecordFromJson, HasEveryText) {
  constexpr const char* kTexts[] = {
      "title",   "album",       "artist",   "album_artist", "genre",       "composer",
      "comment", "camera_make", "exposure", "camera_model", "aperture",    "timetaken",
      "date",    "mdate",       "fs_uuid",  "video_codec",  "audio_codec", "container_type"};
  for (const char* name : kTexts) json_[name] = "<"s + name + ">";
  const Record& record = read();
  EXPECT_STREQ(record.path, "/v/a.mp3");
  EXPECT_STREQ(record.title, "<title>");
  EXPECT_STREQ(record.album, "<album>");
  EXPECT_STREQ(record.artist, "<artist>");
  EXPECT_STREQ(record.album_artist, "<album_artist>");
  EXPECT_STREQ(record.genre, "<genre>");
  EXPECT_STREQ(record.composer, "<composer>");
  EXPECT_STREQ(record.comment, "<comment>");
  EXPECT_STREQ(record.camera_make, "<camera_make>");
  EXPECT_STREQ(record.camera_model, "<camera_model>");
  EXPECT_STREQ(record.exposure, "<exposure>");
  EXPECT_STREQ(record.aperture, "<aperture>");
  EXPECT_STREQ(record.timetaken, "<timetaken>");
  EXPECT_STREQ(record.date, "<date>");
  EXPECT_STREQ(record.mdate, "<mdate>");
  EXPECT_STREQ(record.video_codec, "<video_codec>");
  EXPECT_STREQ(record.container_type, "<container_type>");
  EXPECT_STREQ(record.audio_codec, "<audio_codec>");
  EXPECT_STREQ(record.fs_uuid, "<fs_uuid>");
}

TEST_F(ARecordFromJson, HasEveryNumber) {
  constexpr const char* kNumbers[] = {"id",
                                      "track",
                                      "disc",
                                      "year",
                                      "bitrate",
                                      "frame_bitrate",
                                      "video_bitrate",
                                      "frequency",
                                      "channel",
                                      "resolutionX",
                                      "frame_rate_num",
                                      "frame_rate_den",
                                      "covercount",
                                      "resolutionY",
                                      "iso",
                                      "video_profile",
                                      "video_level",
                                      "filesize",
                                      "duration"};
  int number = 1;
  for (const char* name : kNumbers) json_[name] = number++;
  const Record& record = read();
  EXPECT_EQ(record.id, 1U);
  EXPECT_EQ(record.track, 2);
  EXPECT_EQ(record.disc, 3);
  EXPECT_EQ(record.year, 4);
  EXPECT_EQ(record.bitrate, 5);
  EXPECT_EQ(record.frame_bitrate, 6);
  EXPECT_EQ(record.video_bitrate, 7);
  EXPECT_EQ(record.frequency, 8);
  EXPECT_EQ(record.channel, 9);
  EXPECT_EQ(record.resolutionX, 10);
  EXPECT_EQ(record.frame_rate_num, 11);
  EXPECT_EQ(record.frame_rate_den, 12);
  EXPECT_EQ(record.covercount, 13);
  EXPECT_EQ(record.resolutionY, 14);
  EXPECT_EQ(record.iso, 15);
  EXPECT_EQ(record.video_profile, 16);
  EXPECT_EQ(record.video_level, 17);
  EXPECT_EQ(record.filesize, 18);
  EXPECT_EQ(record.duration, 19.0F);
}

TEST_F(ARecordFromJson, IsZeroWhereNothingStands) {
  const auto empty = std::make_unique<Record>();
  std::strcpy(empty->path, "/v/a.mp3");
  json_["reserved"] = 5;
  json_["path"] = "/not/this";
  EXPECT_EQ(std::memcmp(&read(), empty.get(), sizeof(Record)), 0);
}

struct IntegerCase {
  const char* name;
  Json::Value given;
  std::int32_t year;
  std::uint32_t id;
  std::int64_t filesize;
};

class AnIntegerFromJson : public testing::TestWithParam<IntegerCase> {};

TEST_P(AnIntegerFromJson, IsHeldWithinItsField) {
  Json::Value json;
  json["szPath"] = "/a";
  for (const char* name : {"year", "id", "filesize"}) json[name] = GetParam().given;
  const auto record = std::make_unique<Record>();
  ASSERT_EQ(MediaInfoJson2Object(json, record.get()), 0);
  EXPECT_EQ(record->year, GetParam().year);
  EXPECT_EQ(record->id, GetParam().id);
  EXPECT_EQ(record->filesize, GetParam().filesize);
}

constexpr std::int32_t kLow = std::numeric_limits<std::int32_t>::min();
constexpr std::int32_t kHigh = std::numeric_limits<std::int32_t>::max();
constexpr std::uint32_t kUnsigned = std::numeric_limits<std::uint32_t>::max();
constexpr std::int64_t kLowest = std::numeric_limits<std::int64_t>::min();
constexpr std::int64_t kHighest = std::numeric_limits<std::int64_t>::max();
constexpr double kInfinity = std::numeric_limits<double>::infinity();

INSTANTIATE_TEST_SUITE_P(
    Cases, AnIntegerFromJson,
    testing::Values(
        IntegerCase{"Number", 7, 7, 7, 7}, IntegerCase{"Negative", -7, -7, 0, -7},
        IntegerCase{"Largest", Json::Int64{kHighest}, kHigh, kUnsigned, kHighest},
        IntegerCase{"Smallest", Json::Int64{kLowest}, kLow, 0, kLowest},
        IntegerCase{"Unsigned", Json::UInt64{~0ULL}, kHigh, kUnsigned, kHighest},
        IntegerCase{"BeyondDoubles", Json::Int64{9007199254740993}, kHigh, kUnsigned,
                    9007199254740993},
        IntegerCase{"Fraction", 7.9, 7, 7, 7}, IntegerCase{"NegativeFraction", -7.9, -7, 0, -7},
        IntegerCase{"HugeFraction", 1e300, kHigh, kUnsigned, kHighest},
        IntegerCase{"HugeNegative", -1e300, kLow, 0, kLowest},
        IntegerCase{"NotANumber", std::nan(""), 0, 0, 0},
        IntegerCase{"Infinite", kInfinity, 0, 0, 0}, IntegerCase{"True", true, 1, 1, 1},
        IntegerCase{"False", false, 0, 0, 0}, IntegerCase{"Text", "12", 12, 12, 12},
        IntegerCase{"TextWithBlanks", " 12\n", 12, 12, 12},
        IntegerCase{"TextWithPlus", "+12", 12, 12, 12},
        IntegerCase{"TextWithSigns", "+-12", 0, 0, 0},
        IntegerCase{"NegativeText", "-12", -12, 0, -12},
        IntegerCase{"FractionText", "12.9", 12, 12, 12},
        IntegerCase{"ExactText", "9007199254740993", kHigh, kUnsigned, 9007199254740993},
        IntegerCase{"HugeText", std::string(400, '9'), kHigh, kUnsigned, kHighest},
        IntegerCase{"HugeNegativeText", "-1e999", kLow, 0, kLowest},
        IntegerCase{"TinyText", "1e-999", 0, 0, 0}, IntegerCase{"EmptyText", "", 0, 0, 0},
        IntegerCase{"InfiniteText", "inf", 0, 0, 0}, IntegerCase{"NanText", "nan", 0, 0, 0},
        IntegerCase{"HexadecimalText", "0x10", 0, 0, 0},
        IntegerCase{"NumberAndMore", "12 apples", 0, 0, 0}, IntegerCase{"Word", "many", 0, 0, 0},
        IntegerCase{"Null", Json::Value(), 0, 0, 0},
        IntegerCase{"Array", Json::Value(Json::arrayValue), 0, 0, 0},
        IntegerCase{"Object", Json::Value(Json::objectValue), 0, 0, 0}),
    [](const auto& test) { return test.param.name; });

struct DurationCase {
  const char* name;
  Json::Value given;
  float duration;
};

class ADurationFromJson : public testing::TestWithParam<DurationCase> {};

TEST_P(ADurationFromJson, IsFinite) {
  Json::Value json;
  json["szPath"] = "/a";
  json["duration"] = GetParam().given;
  const auto record = std::make_unique<Record>();
  ASSERT_EQ(MediaInfoJson2Object(json, record.get()), 0);
  EXPECT_EQ(record->duration, GetParam().duration);
}

constexpr float kLargest = std::numeric_limits<float>::max();

INSTANTIATE_TEST_SUITE_P(
    Cases, ADurationFromJson,
    testing::Values(DurationCase{"Fraction", 3.5, 3.5F}, DurationCase{"Whole", 180, 180.0F},
                    DurationCase{"Text", "3.5", 3.5F}, DurationCase{"Comma", "3,5", 0.0F},
                    DurationCase{"TooLarge", 1e300, kLargest},
                    DurationCase{"TooSmall", -1e300, -kLargest},
                    DurationCase{"Infinite", kInfinity, 0.0F},
                    DurationCase{"NotANumber", std::nan(""), 0.0F},
                    DurationCase{"HugeText", "1e999", kLargest}, DurationCase{"True", true, 1.0F},
                    DurationCase{"Null", Json::Value(), 0.0F}),
    [](const auto& test) { return test.param.name; });

TEST_F(ARecordFromJson, HasItsTextsCutToTheirFields) {
  json_["title"] = std::string(1000, 't');
  json_["exposure"] = std::string(20, 'e');
  const Record& record = read();
  EXPECT_EQ(record.title, std::string(254, 't'));
  EXPECT_EQ(record.exposure, std::string(19, 'e'));
}

TEST_F(ARecordFromJson, CutsNoCharacterInTwo) {
  json_["title"] = std::string(252, 't') + "日本";
  json_["album"] = std::string(253, 'a') + "é";
  const Record& record = read();
  EXPECT_EQ(record.title, std::string(252, 't'));
  EXPECT_EQ(record.album, std::string(253, 'a'));
}

TEST_F(ARecordFromJson, HasItsTextsCutAtANullByte) {
  json_["title"] = "before\0after"s;
  EXPECT_STREQ(read().title, "before");
}

TEST_F(ARecordFromJson, HasNoTextWhereNoneStands) {
  json_["title"] = 5;
  json_["album"] = true;
  json_["artist"] = Json::Value(Json::arrayValue);
  json_["genre"]["title"] = "inner";
  const Record& record = read();
  EXPECT_STREQ(record.title, "");
  EXPECT_STREQ(record.album, "");
  EXPECT_STREQ(record.artist, "");
  EXPECT_STREQ(record.genre, "");
}

TEST_F(ARecordFromJson, KeepsBytesThatAreNoUtf8) {
  json_["title"] = "caf\xE9";
  EXPECT_STREQ(read().title, "caf\xE9");
}

TEST_F(ARecordFromJson, TakesTheLongestPath) {
  json_["szPath"] = "/" + std::string(4094, 'p');
  EXPECT_EQ(read().path, "/" + std::string(4094, 'p'));
  json_["szPath"] = "/" + std::string(4095, 'p');
  EXPECT_EQ(result(), -1);
}

TEST_F(ARecordFromJson, NeedsAPath) {
  json_.removeMember("szPath");
  EXPECT_EQ(result(), -1);
  for (const Json::Value& path : {Json::Value(), Json::Value(5), Json::Value(true), Json::Value(""),
                                  Json::Value("/v/a\0.mp3"s), Json::Value(Json::arrayValue)}) {
    json_["szPath"] = path;
    EXPECT_EQ(result(), -1) << path.toStyledString();
  }
}

TEST_F(ARecordFromJson, NeedsAnObjectAndARecord) {
  EXPECT_EQ(MediaInfoJson2Object(json_, nullptr), -1);
  for (const Json::Value& value :
       {Json::Value(), Json::Value("text"), Json::Value(1), Json::Value(Json::arrayValue)}) {
    EXPECT_EQ(MediaInfoJson2Object(value, record_.get()), -1);
  }
}

/// Sets every field to one of its extremes. A field that is added to the record stops it from
/// compiling.
class EveryField : public testing::TestWithParam<std::size_t> {
 protected:
  template <class Number>
  using Extremes = std::array<Number, 5>;

  static void set(std::int32_t& field) {
    field = Extremes<std::int32_t>{kLow, kHigh, -1, 1, 0}[GetParam()];
  }
  static void set(std::uint32_t& field) {
    field = Extremes<std::uint32_t>{kUnsigned, 1U << 31U, 1, 2, 0}[GetParam()];
  }
  static void set(std::int64_t& field) {
    field = Extremes<std::int64_t>{kLowest, kHighest, -1, (1LL << 53) + 1, 0}[GetParam()];
  }
  static void set(float& field) {
    using Limits = std::numeric_limits<float>;
    field =
        Extremes<float>{Limits::max(), Limits::lowest(), Limits::denorm_min(), 0.1F, 0}[GetParam()];
  }
  template <std::size_t kSize>
  static void set(char (&field)[kSize]) {
    constexpr bool kIsPath = kSize == MEDIIDX_PATH_AREA_SIZE;
    constexpr std::size_t kLongest = (kIsPath ? std::size_t{MEDIIDX_PATH_SIZE} : kSize) - 1;
    std::string characters;
    for (std::size_t i = 0; i < kLongest / 2; ++i) characters += "\u00E9";
    const auto text =
        Extremes<std::string>{std::string(kLongest, 'x'), characters, " \n\t\"\\/\x01\x7F ",
                              "\xFF\xC3", kIsPath ? "/" : ""}[GetParam()];
    std::memcpy(field, text.c_str(), text.size() + 1);
  }

  static std::unique_ptr<Record> record() {
    auto out = std::make_unique<Record>();
    auto& [id, path, track, disc, year, title, album, artist, album_artist, genre, composer,
           comment, camera_make, camera_model, exposure, aperture, timetaken, date, mdate, duration,
           bitrate, frame_bitrate, video_bitrate, frame_rate_num, frame_rate_den, frequency,
           channel, resolution_x, resolution_y, filesize, reserved, covercount, iso, video_codec,
           container_type, video_profile, video_level, audio_codec, fs_uuid] = *out;
    const auto set_all = [](auto&... fields) { (set(fields), ...); };
    set_all(id, path, track, disc, year, title, album, artist, album_artist, genre, composer,
            comment, camera_make, camera_model, exposure, aperture, timetaken, date, mdate,
            duration, bitrate, frame_bitrate, video_bitrate, frame_rate_num, frame_rate_den,
            frequency, channel, resolution_x, resolution_y, filesize, covercount, iso, video_codec,
            container_type, video_profile, video_level, audio_codec, fs_uuid);
    return out;
  }
};

TEST_P(EveryField, ComesBackFromJson) {
  const auto before = record();
  Json::Value json;
  ASSERT_EQ(MediaInfoObject2Json(before.get(), &json), 0);
  EXPECT_EQ(json.size(), 38U);
  const auto after = std::make_unique<Record>();
  ASSERT_EQ(MediaInfoJson2Object(json, after.get()), 0);
  EXPECT_EQ(std::memcmp(before.get(), after.get(), sizeof(Record)), 0);
}

INSTANTIATE_TEST_SUITE_P(Extremes, EveryField, testing::Values(0, 1, 2, 3, 4));

/// But for texts that are no UTF-8, which JSON cannot be written with.
class EveryWrittenField : public EveryField {};

TEST_P(EveryWrittenField, ComesBackFromTheTextOfItsJson) {
  const auto before = record();
  Json::Value json;
  ASSERT_EQ(MediaInfoObject2Json(before.get(), &json), 0);
  std::istringstream text(json.toStyledString());
  Json::Value read;
  text >> read;
  const auto after = std::make_unique<Record>();
  ASSERT_EQ(MediaInfoJson2Object(read, after.get()), 0);
  EXPECT_EQ(std::memcmp(before.get(), after.get(), sizeof(Record)), 0);
}

INSTANTIATE_TEST_SUITE_P(Extremes, EveryWrittenField, testing::Values(0, 1, 2, 4));

TEST(JsonFromARecord, HasTextsThatFillTheirFieldsWithoutAnEnd) {
  const auto record = std::make_unique<Record>();
  std::memset(record->aperture, 'a', sizeof(record->aperture));
  std::memset(record->path, 'p', sizeof(record->path));
  Json::Value json;
  ASSERT_EQ(MediaInfoObject2Json(record.get(), &json), 0);
  EXPECT_EQ(json["aperture"], std::string(sizeof(record->aperture), 'a'));
  EXPECT_EQ(json["szPath"], std::string(MEDIIDX_PATH_SIZE, 'p'));
}

TEST(JsonFromARecord, ReplacesWhatWasThere) {
  const auto record = std::make_unique<Record>();
  Json::Value json;
  json["other"] = 1;
  ASSERT_EQ(MediaInfoObject2Json(record.get(), &json), 0);
  EXPECT_FALSE(json.isMember("other"));
  EXPECT_EQ(MediaInfoObject2Json(nullptr, &json), -1);
  EXPECT_EQ(MediaInfoObject2Json(record.get(), nullptr), -1);
}

}  // namespace
