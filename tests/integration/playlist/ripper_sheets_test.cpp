// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Cue sheets as common rippers, burners and players write them, made by us in their style: read,
// and brought into the index.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cctype>
#include <cmath>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

#include "indexed_sheet.h"
#include "mediidx/cue_sheet.h"
#include "mediidx/playlist.h"
#include "mediidx/request.h"

namespace mediidx::test {
namespace {

constexpr int kFramesPerSecond = 75;

struct Cut {
  int number;
  std::string title;
  std::string artist;
  std::string composer;
  std::string start;
  int frames;        ///< Its length; 75 a second.
  std::string file;  ///< Beside the sheet.
  bool operator==(const Cut&) const = default;
};

std::ostream& operator<<(std::ostream& out, const Cut& cut) {
  return out << cut.number << " \"" << cut.title << "\" by \"" << cut.artist << "\" (\""
             << cut.composer << "\") " << cut.start << " + " << cut.frames << " in " << cut.file;
}

/// What a sheet gives to all of its tracks.
struct Disc {
  std::string album;
  std::string album_artist;
  std::string genre;
  int year;
  bool operator==(const Disc&) const = default;
};

std::ostream& operator<<(std::ostream& out, const Disc& disc) {
  return out << disc.album << " by " << disc.album_artist << ", " << disc.genre << ", "
             << disc.year;
}

struct SheetCase {
  const char* file;
  std::vector<std::string> code_pages;  ///< Under each of which it reads the same; "" for none.
  std::vector<std::pair<std::string, int>> audio;  ///< Files and their seconds.
  Disc disc;
  std::vector<Cut> cuts;
  friend void PrintTo(const SheetCase& test, std::ostream* out) { *out << test.file; }
};

std::string fixture(const std::string& name) {
  std::ifstream in(std::filesystem::path(MEDIIDX_FIXTURES) / "cue" / name, std::ios::binary);
  EXPECT_TRUE(in) << name;
  return {std::istreambuf_iterator<char>(in), {}};
}

class RipperSheet : public IndexedSheetTest, public testing::WithParamInterface<SheetCase> {
 protected:
  std::string name() const { return GetParam().file; }
  void add_all_audio() {
    for (const auto& [file, seconds] : GetParam().audio) EXPECT_EQ(add_audio(file, seconds), 0);
  }
  int add_sheet() { return IndexedSheetTest::add_sheet(name(), fixture(name())); }

  void expect_read() {
    _PLAYLIST_REC* list = nullptr;
    EXPECT_EQ(TAVOParseCueByPath(&list, at(name()).c_str()), 0);
    const std::unique_ptr<_PLAYLIST_REC, void (*)(_PLAYLIST_REC*)> owner(list, TAVOPlaylistRecFree);
    std::vector<Cut> cuts;
    for (const auto* node = list; node; node = node->next) {
      const auto& info = node->info;
      EXPECT_EQ((Disc{info.album, info.album_artist, info.genre, info.year}), GetParam().disc);
      const float frames = info.duration * static_cast<float>(kFramesPerSecond);
      const std::string path = info.path;
      cuts.push_back({info.track, info.title, info.artist, info.composer, info.comment,
                      static_cast<int>(std::lround(frames)),
                      path.starts_with(folder + "/") ? path.substr(folder.size() + 1) : path});
    }
    EXPECT_EQ(cuts, GetParam().cuts);
  }

  /// The rows of its tracks in the table of virtual tracks.
  std::vector<Row> expected_rows() {
    const auto& disc = GetParam().disc;
    std::vector<Row> expected;
    for (const auto& cut : GetParam().cuts) {
      expected.push_back({at(cut.file), cut.title, disc.album, cut.artist, disc.album_artist,
                          cut.composer, std::to_string(disc.year), disc.genre,
                          cut.start + at(name()), std::to_string(cut.frames / kFramesPerSecond),
                          std::to_string(cut.number)});
    }
    return expected;
  }
  std::vector<Row> virtual_rows() {
    return rows(
        "SELECT path, title, album, artist, album_artist, composer, year, genre, comment, "
        "duration, track FROM virtual_music ORDER BY id");
  }
};

TEST_P(RipperSheet, GivesItsTracks) {
  add_all_audio();
  root.write("volume1/music/" + name(), fixture(name()));
  for (const auto& code : GetParam().code_pages) {
    SCOPED_TRACE("code page \"" + code + "\"");
    set_code_page(code);
    expect_read();
  }
}

TEST_P(RipperSheet, ComesToTheSameRowsBeforeAndAfterItsAudio) {
  set_code_page(GetParam().code_pages[0]);
  add_all_audio();
  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(virtual_rows(), expected_rows());
  EXPECT_EQ(count("playlist"), 1);
  EXPECT_EQ(count("virtual_info_track", "cue_sheet_path = " + quoted(at(name()))),
            static_cast<long>(GetParam().cuts.size()));
  const auto audio_first = catalogue();
  const auto audio_first_but_last = catalogue(LastDurations::kLeftOut);
  start_anew();

  EXPECT_EQ(add_sheet(), 0);
  add_all_audio();
  EXPECT_EQ(catalogue(LastDurations::kLeftOut), audio_first_but_last);
  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(catalogue(), audio_first);
}

TEST_P(RipperSheet, LeavesNoRowWhenItIsDeleted) {
  set_code_page(GetParam().code_pages[0]);
  add_all_audio();
  const auto alone = rows_left();
  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(remove(name()), 0);
  EXPECT_EQ(rows_left(), alone);

  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(TAVOMediaIndexDirDelete(folder.c_str()), 0);
  EXPECT_EQ(rows_left(), 0);
}

// Lengths are counted in frames: a minute has 4500.
INSTANTIATE_TEST_SUITE_P(
    Programs, RipperSheet,
    testing::Values(
        // One image: each track ends where the next one's music begins.
        SheetCase{"eac_image_cp1252.cue",
                  {"enu", "fre", "ger"},
                  {{"Zoé & The Quay - Low Tide.wav", 600}},
                  {"Low Tide / Marée Basse", "Zoé & The Quay", "Indie Folk", 2003},
                  {{1, "L'Été", "Zoé & The Quay", "", "00:00:32", 14560 - 32,
                    "Zoé & The Quay - Low Tide.wav"},
                   {2, "Slack Water", "Zoé & The Quay", "", "03:14:10", 33787 - 14560,
                    "Zoé & The Quay - Low Tide.wav"},
                   {3, "Where We Stood (Live)", "Zoé & The Quay", "", "07:30:37", 45000 - 33787,
                    "Zoé & The Quay - Low Tide.wav"}}},
        // Each pregap stands at the end of the file before: there the track before ends.
        SheetCase{
            "eac_gaps_appended.cue",
            {"", "enu", "jpn", "rus", "cht"},
            {{"01 - Departure.wav", 240}, {"02 - Open Sea.wav", 200}, {"03 - Lights.wav", 180}},
            {"Night Ferry", "Harbour Five", "Folk", 1998},
            {{1, "Departure", "Harbour Five", "", "00:00:00", 17900, "01 - Departure.wav"},
             {2, "Open Sea", "Harbour Five", "", "00:00:00", 14775, "02 - Open Sea.wav"},
             {3, "Lights", "Harbour Five", "", "00:00:00", 13500, "03 - Lights.wav"}}},
        // Each pregap stands at the beginning of its own track's file.
        SheetCase{"eac_gaps_prepended.cue",
                  {"", "enu"},
                  {{"01.flac", 240}, {"02.flac", 200}, {"03.flac", 180}},
                  {"Night Ferry", "Harbour Five", "Folk", 1998},
                  {{1, "Departure", "Harbour Five", "", "00:00:00", 18000, "01.flac"},
                   {2, "Open Sea", "Harbour Five", "", "00:01:37", 15000 - 112, "02.flac"},
                   {3, "Lights", "Harbour Five", "", "00:02:00", 13500 - 150, "03.flac"}}},
        SheetCase{
            "eac_cp1251.cue",
            {"rus"},
            {{"Паром - Ночной паром.ape", 500}},
            {"Ночной паром", "Группа Паром", "Фолк", 2005},
            {{1, "Песня о том, как мы пошли домой", "Группа Паром", "", "00:00:00", 18915,
              "Паром - Ночной паром.ape"},
             {2, "Берег", "Анна", "", "04:12:15", 37500 - 18915, "Паром - Ночной паром.ape"}}},
        // Two characters whose second byte is a backslash.
        SheetCase{
            "eac_cp932.cue",
            {"jpn"},
            {{"夜の港.tta", 400}},
            {"夜の港", "港の楽団", "J-Pop", 2001},
            {{1, "ソラの表示", "港の楽団", "", "00:00:00", 22725, "夜の港.tta"},
             {2, "日本語の歌 その二", "港の楽団", "", "05:03:00", 30000 - 22725, "夜の港.tta"}}},
        SheetCase{"xld.cue",
                  {"", "enu", "jpn", "utf8"},
                  {{"夜の楽団 - 潮の表.flac", 600}},
                  {"潮の表 (Tide Tables)", "夜の楽団", "Electronic", 2011},
                  {{1, "満潮", "夜の楽団", "", "00:00:00", 29325, "夜の楽団 - 潮の表.flac"},
                   {2, "干潮", "夜の楽団 feat. Zoë", "", "06:31:00", 45000 - 29325,
                    "夜の楽団 - 潮の表.flac"}}},
        SheetCase{"dbpoweramp.cue",
                  {"", "enu", "ger"},
                  {{"01 Prélude.m4a", 61}, {"02 Étude.m4a", 150}},
                  {"Quay Sessions, Disc 2", "Quartet Ø", "Chamber Music", 2016},
                  {{1, "Prélude", "Quartet Ø", "M. Brandt", "00:00:00", 4575, "01 Prélude.m4a"},
                   {2, "Étude", "Quartet Ø", "I. Okafor", "00:00:00", 11250, "02 Étude.m4a"}}},
        // An image of more than 100 minutes.
        SheetCase{"foobar2000.cue",
                  {"", "plk", "enu"},
                  {{"Ćma - Światła.ogg", 6300}},
                  {"Światła", "Ćma", "Rock/Pop", 1987},
                  {{1, "Jeden ''raz''", "Ćma", "", "00:00:00", 324378, "Ćma - Światła.ogg"},
                   {2, "Dwa", "Ćma; Żuk", "", "72:05:03", 454500 - 324378, "Ćma - Światła.ogg"},
                   {3, "Trzy", "Ćma", "", "101:00:00", 472500 - 454500, "Ćma - Światła.ogg"}}},
        // Music before the first track; an INDEX 02, which moves the end of the track before.
        SheetCase{"cueripper_hidden_track.cue",
                  {"", "enu"},
                  {{"Mina Okafor - Undertow.flac", 700}},
                  {"Undertow", "Mina Okafor", "Alternative", 1995},
                  {{1, "First Wave", "Mina Okafor", "", "04:10:05", 45000 - 18755,
                    "Mina Okafor - Undertow.flac"},
                   {2, "Second Wave", "Mina Okafor", "", "08:20:74", 52500 - 37574,
                    "Mina Okafor - Undertow.flac"}}},
        SheetCase{"hidden_track_zero.cue",
                  {"", "enu"},
                  {{"Undertow.wv", 300}},
                  {"Undertow", "Mina Okafor", "", 0},
                  {{0, "Before the First", "Nobody", "", "00:00:00", 18755, "Undertow.wv"},
                   {1, "First Wave", "Mina Okafor", "", "04:10:05", 22500 - 18755, "Undertow.wv"}}},
        // The data track is left out; a pregap delays a start, a postgap brings an end forward.
        SheetCase{"cdrwin_mixed_mode.cue",
                  {"", "enu"},
                  {{"TRACK02.WAV", 300}},
                  {"Sea Game", "The Developers", "", 0},
                  {{2, "Level One", "", "", "00:02:00", 11250 - 150, "TRACK02.WAV"},
                   {3, "Level Two", "", "", "02:30:00", 18000 - 75 - 11250, "TRACK02.WAV"},
                   {4, "Credits", "", "", "04:00:00", 22500 - 30 - 18000, "TRACK02.WAV"}}},
        SheetCase{"nero_data_disc.cue", {"", "enu"}, {}, {}, {}},
        SheetCase{"notepad_utf16.cue",
                  {"", "enu", "rus"},
                  {{"Ø.mp3", 180}},
                  {"Tide 🌊 Tables", "Мельница и Ø", "", 0},
                  {{1, "🌊 One", "Мельница", "", "00:00:00", 9000, "Ø.mp3"},
                   {2, "After 🌊", "Ø", "", "02:00:00", 13500 - 9000, "Ø.mp3"}}},
        // Odd white space, cases and quotes: only what stands in capitals counts, a value without a
        // quote in its first word is that word, and a quoted one loses one character at either end.
        SheetCase{"written_by_hand.cue",
                  {"", "enu"},
                  {{"It's the Tide.mp3", 200}, {"shanty.ogg", 61}},
                  {"The \"\"Big\"\" Tide", "Ada", "Sea Shanty", 1971},
                  {{1, "The \"Big\" One", "", "", "0:0:0", 6750, "It's the Tide.mp3"},
                   {2, "Say", "Ada Finch", "", "1:30:00", 9380 - 6750, "It's the Tide.mp3"},
                   {3, "\"tra\"", "", "", "02:05", 15000 - 9380, "It's the Tide.mp3"},
                   {4, "", "", "", "00:00:00", 4575, "shanty.ogg"}}}),
    [](const auto& test) {
      std::string name = test.param.file;
      for (char& c : name) {
        if (!std::isalnum(static_cast<unsigned char>(c))) c = '_';
      }
      return name;
    });

class LegacySheet : public IndexedSheetTest, public testing::WithParamInterface<const char*> {};

TEST_P(LegacySheet, KeepsItsRowAloneWithoutACodePage) {
  for (const char* code : {"", "nosuch"}) {
    set_code_page(code);
    EXPECT_EQ(add_sheet(GetParam(), fixture(GetParam())), -1);
    EXPECT_EQ(count("playlist", "path = " + quoted(at(GetParam()))), 1);
    EXPECT_EQ(count("virtual_music"), 0);
    EXPECT_EQ(count("track"), 0);
  }
}

INSTANTIATE_TEST_SUITE_P(Programs, LegacySheet,
                         testing::Values("eac_image_cp1252.cue", "eac_cp1251.cue",
                                         "eac_cp932.cue"));

}  // namespace
}  // namespace mediidx::test
