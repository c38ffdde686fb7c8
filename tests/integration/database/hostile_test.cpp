// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Names that mean something to SQL, to patterns, to formats or to templates, through every write.
#include <tavocore.h>

#include <ostream>

#include "media_test.h"
#include "support/owned.h"

namespace mediidx::test {
namespace {

struct Name {
  const char* kind;
  std::string text;
};

void PrintTo(const Name& name, std::ostream* out) { *out << name.kind; }

/// A name that makes a path of about 4,000 bytes, whatever folder it lies in.
std::string long_name() {
  std::string name;
  while (name.size() < 3800) name += std::string(199, 'n') + "/";
  return name + "end";
}

const Name kNames[] = {
    {"Quote", "it's"},
    {"DoubleQuote", "\"quoted\""},
    {"Injection", "x' OR '1'='1"},
    {"Statement", "x'); DROP TABLE music; --"},
    {"Percent", "100%"},
    {"Underscore", "a_b"},
    {"Backslash", "back\\slash\\"},
    {"BackslashQuote", "\\'"},
    {"Newline", "two\nlines"},
    {"Dollar", "$1 $$ $tag$"},
    {"Comment", "-- /* comment"},
    {"Format", "%s%n%d%999999d"},
    {"Placeholder", "@TAVO:VAR @TAVO:INT"},
    {"Chinese", "音乐 影片"},
    {"Emoji", "\xF0\x9F\x8E\xB5"},
    {"Long", long_name()},
};

std::string kind_of(const testing::TestParamInfo<Name>& test) { return test.param.kind; }

constexpr const char* kFileTables[] = {"music", "video", "photo", "playlist"};

class HostileName : public MediaTest, public testing::WithParamInterface<Name> {
 protected:
  HostileName() : path(shared(GetParam().text)), title(GetParam().text.substr(0, 250)) {}

  /// Rows of other files, which nothing here may change.
  void add_bystander(const std::string& table, const char* column = "path") {
    rows("INSERT INTO " + table + "(" + column + ") VALUES('/bystander')");
  }
  void expect_bystander(const std::string& table, const char* column = "path") {
    EXPECT_EQ(count(table, std::string(column) + " = '/bystander'"), 1) << table;
  }
  Info hostile_record() const {
    auto info = record(path);
    for (char* text : {info.title, info.album, info.artist, info.album_artist, info.genre,
                       info.composer, info.comment, info.fs_uuid}) {
      std::snprintf(text, MEDIIDX_TEXT_SIZE, "%s", title.c_str());
    }
    for (auto* text : {&info.camera_make, &info.camera_model}) set(*text, title.substr(0, 99));
    return info;
  }

  const std::string path;
  const std::string title;
};

TEST_P(HostileName, IsSavedFoundUpdatedAndDeletedInEveryFileTable) {
  for (MEDIA_TABLE_TYPE type = MEDIA_TABLE_MUSIC; type <= MEDIA_TABLE_PLAYLIST; ++type) {
    SCOPED_TRACE(kFileTables[type]);
    add_bystander(kFileTables[type]);
    auto info = hostile_record();
    ASSERT_EQ(MediaInfoDBSave(type, &info), 0);
    ASSERT_EQ(MediaInfoDBSave(type, &info), 0);
    EXPECT_EQ(count(kFileTables[type]), 2);
    Info found;
    ASSERT_EQ(MediaInfoDBGetOne(type, path.c_str(), &found, 0), 0);
    EXPECT_EQ(found.path, path);
    EXPECT_EQ(found.title, title);
    ASSERT_EQ(MediaInfoDBGetOneByField(type, path.c_str(), "id, album", &found), 0);
    EXPECT_EQ(found.album, title);
    if (type != MEDIA_TABLE_MUSIC) info.id = found.id;
    set(info.album, "updated " + title.substr(0, 200));
    ASSERT_EQ(MediaInfoDBUpdate(type, &info), 0);
    EXPECT_EQ(count(kFileTables[type], "album = " + quoted(info.album)), 1);
    ASSERT_EQ(MediaInfoDBDelete(type, path.c_str()), 0);
    EXPECT_EQ(count(kFileTables[type]), 1);
    expect_bystander(kFileTables[type]);
  }
  EXPECT_EQ(count("track"), 0);
  EXPECT_FALSE(was_logged("mediidx_database"));
}

TEST_P(HostileName, IsSavedTwiceAndDeletedAsAFolder) {
  add_bystander("directory");
  auto dir = folder(path);
  set(dir.title, title);
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_EQ(count("directory", "path = " + quoted(path) + " AND title = " + quoted(title)), 1);
  ASSERT_EQ(MediaInfoDBDelete(MEDIA_TABLE_FOLDER, path.c_str()), 0);
  EXPECT_EQ(count("directory"), 1);
  expect_bystander("directory");
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_P(HostileName, IsSavedTwiceAsAPersonalFolder) {
  add_bystander("personal_directory");
  const auto dir = folder(personal(GetParam().text));
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_EQ(count("personal_directory", "path = " + quoted(dir.path)), 1);
  EXPECT_EQ(count("personal_directory"), 2);
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_P(HostileName, IsSavedAndDeletedAsACueSheetOfVirtualTracks) {
  add_bystander("virtual_music", "comment");
  auto cue = record(path.size() < 200 ? path : shared("disc.cue"));
  _PLAYLIST_REC track{hostile_record(), nullptr};
  set(track.info.comment, "00:00:00");
  ASSERT_EQ(MediaInfoVirtualDBSave(&track, &cue), 0);
  EXPECT_EQ(count("virtual_music", "title = " + quoted(title)), 1);
  EXPECT_EQ(count("virtual_info_track", "cue_sheet_path = " + quoted(cue.path)), 1);
  ASSERT_EQ(MediaInfoVirtualDBDelete(cue.path), 0);
  EXPECT_EQ(count("virtual_music"), 1);
  EXPECT_EQ(count("track"), 0);
  expect_bystander("virtual_music", "comment");
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_P(HostileName, IsSavedAndDeletedAsATranscodedCopy) {
  add_bystander("video_convert", "video_path");
  VIDEO_CONVERT_REC copy{};
  set(copy.video_path, path);
  set(copy.convert_file_path, path);
  set(copy.vcodec, title);
  ASSERT_EQ(MediaInfoVideoConvertDBSave(&copy), 0);
  EXPECT_EQ(count("video_convert",
                  "convert_file_path = " + quoted(path) + " AND vcodec = " + quoted(title)),
            1);
  ASSERT_EQ(MediaInfoDBDelete(MEDIA_TABLE_VIDEO_CONVERT, path.c_str()), 0);
  EXPECT_EQ(count("video_convert"), 1);
  expect_bystander("video_convert", "video_path");
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_P(HostileName, GoesOfflineAndIsPurged) {
  add_bystander("photo");
  const auto stored = "/volume1/" + GetParam().text + "/x.jpg";
  auto info = record(stored);
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_PHOTO, &info), 0);
  MediaInfoDBSetOnline(("/volume1/" + GetParam().text).c_str(), 1, 0);
  EXPECT_EQ(count("photo", "fs_online = false"), 1);
  MediaInfoDBUUIDDropOffline(GetParam().text.c_str());
  EXPECT_EQ(count("photo"), 1);
  expect_bystander("photo");
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_P(HostileName, IsFoundInABatch) {
  add_bystander("photo");
  auto info = record(path);
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_PHOTO, &info), 0);
  const OwnedList candidates(TLIBCSzListAlloc(512));
  MediaInfoDBBatchPara(candidates.get(), path.c_str());
  const Handle handle(MediaInfoDBBatchOpen(MEDIA_TABLE_PHOTO, "path", "path", candidates.get(),
                                           nullptr, nullptr, 0, 0),
                      MediaInfoDBBatchClose);
  EXPECT_THAT(paths(handle.get()), ElementsAre(path));
}

INSTANTIATE_TEST_SUITE_P(Names, HostileName, testing::ValuesIn(kNames), kind_of);

/// Texts that are no UTF-8: the server refuses them, and nothing else is lost.
class BrokenName : public MediaTest {
 protected:
  BrokenName() : path(shared("broken\xFF\xC3 name")) {}
  void expect_refusal(int result) {
    EXPECT_EQ(result, -1);
    EXPECT_TRUE(was_logged("invalid byte sequence for encoding \"UTF8\""));
    clear_log();
  }
  const std::string path;
};

TEST_F(BrokenName, IsRefusedByTheSavesAndDeletesOfEveryFileTable) {
  for (MEDIA_TABLE_TYPE type = MEDIA_TABLE_MUSIC; type <= MEDIA_TABLE_PLAYLIST; ++type) {
    SCOPED_TRACE(kFileTables[type]);
    auto good = record(shared("good"));
    ASSERT_EQ(MediaInfoDBSave(type, &good), 0);
    auto broken = record(path);
    expect_refusal(MediaInfoDBSave(type, &broken));
    expect_refusal(MediaInfoDBUpdate(type, &broken));
    expect_refusal(MediaInfoDBDelete(type, path.c_str()));
    ASSERT_EQ(MediaInfoDBSave(type, &good), 0);
    EXPECT_EQ(count(kFileTables[type]), 1);
  }
}

TEST_F(BrokenName, IsRefusedAsATitleWithoutHarmToOtherFiles) {
  for (MEDIA_TABLE_TYPE type = MEDIA_TABLE_MUSIC; type <= MEDIA_TABLE_PLAYLIST; ++type) {
    SCOPED_TRACE(kFileTables[type]);
    auto good = record(shared("good"));
    ASSERT_EQ(MediaInfoDBSave(type, &good), 0);
    auto broken = record(shared("bad"));
    set(broken.title, "\xFF");
    expect_refusal(MediaInfoDBSave(type, &broken));
    EXPECT_EQ(value(std::string("SELECT path FROM ") + kFileTables[type]), shared("good"));
  }
}

TEST_F(BrokenName, IsRefusedAsAFolder) {
  const auto good = folder(shared("good"));
  ASSERT_EQ(DirInfoDBSave(&good), 0);
  const auto broken = folder(path);
  expect_refusal(DirInfoDBSave(&broken));
  expect_refusal(MediaInfoDBDelete(MEDIA_TABLE_DIRECTORY, path.c_str()));
  expect_refusal(MediaInfoDBDelete(MEDIA_TABLE_FOLDER, path.c_str()));
  EXPECT_EQ(count("directory"), 1);
}

TEST_F(BrokenName, IsRefusedAsATranscodedCopy) {
  VIDEO_CONVERT_REC copy{};
  set(copy.video_path, path);
  expect_refusal(MediaInfoVideoConvertDBSave(&copy));
  EXPECT_EQ(count("video_convert"), 0);
}

TEST_F(BrokenName, IsRefusedAsAVirtualTrack) {
  auto cue = record(shared("disc.cue"));
  _PLAYLIST_REC broken{record(path), nullptr};
  _PLAYLIST_REC good{record(shared("m.flac")), &broken};
  expect_refusal(MediaInfoVirtualDBSave(&good, &cue));
  EXPECT_EQ(value("SELECT path FROM virtual_music"), shared("m.flac"));
  expect_refusal(MediaInfoVirtualDBDelete(path.c_str()));
}

TEST_F(BrokenName, IsRefusedByQueries) {
  Info info;
  expect_refusal(MediaInfoDBGetOne(MEDIA_TABLE_PHOTO, path.c_str(), &info, 0));
  expect_refusal(
      MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", ("path = '" + path + "'").c_str(), "", 1));
}

TEST_F(BrokenName, ChangesNoOnlineState) {
  auto good = record(shared("good"));
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_PHOTO, &good), 0);
  MediaInfoDBSetOnline(path.c_str(), 1, 0);
  EXPECT_TRUE(was_logged("invalid byte sequence for encoding \"UTF8\""));
  EXPECT_EQ(count("photo", "fs_online"), 1);
}

}  // namespace
}  // namespace mediidx::test
