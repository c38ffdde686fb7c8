// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <filesystem>

#include "explain/raw_tags.h"
#include "tag_samples.h"

namespace mediidx::test {
namespace {

/// What every format can hold, and how make_tag_samples.py fills it.
const Fields kFull{
    {"title", "Slack Water"},
    {"album", "Low Tide"},
    {"artist", "Ada Brandt; Bo Lindqvist"},
    {"album_artist", "The Ferrymen"},
    {"genre", "Folk;Sea Songs"},
    {"composer", "Mina Okafor; Jo Reed"},
    {"comment", "recorded at the quay"},
    {"year", "2004"},
    {"track", "3"},
    {"disc", "2"},
    {"covercount", "2"},
    {"rg_track_gain", "-3.5"},
    {"rg_track_peak", "0.912"},
    {"rg_album_gain", "-2.25"},
    {"rg_album_peak", "0.95"},
    {"duration", "1"},
    {"bitrate", "some"},
    {"frequency", "44100"},
    {"channel", "2"},
};

const Fields kOneOfEach{
    {"artist", "Ada Brandt"}, {"genre", "Folk"}, {"composer", "Mina Okafor"}, {"covercount", "1"}};

Fields full(const std::string& codec, const std::string& container, const Fields& others = {}) {
  return with(with(kFull, {{"video_codec", codec}, {"container_type", container}}), others);
}

TEST(AllTags, OfAnMp3AreRead) { EXPECT_EQ(fields_of("full.mp3"), full("mp3", "mp3")); }
TEST(AllTags, OfAnMp2AreRead) { EXPECT_EQ(fields_of("full.mp2"), full("mp2", "mp2")); }
TEST(AllTags, OfAnAacAreRead) { EXPECT_EQ(fields_of("full.aac"), full("aac", "aac")); }
TEST(AllTags, OfAFlacAreRead) { EXPECT_EQ(fields_of("full.flac"), full("flac", "flac")); }
TEST(AllTags, OfAnOggVorbisAreRead) { EXPECT_EQ(fields_of("full.ogg"), full("vorbis", "ogg")); }
TEST(AllTags, OfAnOggFlacAreRead) { EXPECT_EQ(fields_of("full.oga"), full("flac", "ogg")); }
TEST(AllTags, OfAnM4aWithAacAreRead) { EXPECT_EQ(fields_of("full.m4a"), full("aac", "mp4")); }
TEST(AllTags, OfAnM4aWithAlacAreRead) { EXPECT_EQ(fields_of("alac.m4a"), full("alac", "mp4")); }
TEST(AllTags, OfAWavAreRead) { EXPECT_EQ(fields_of("full.wav"), full("pcm", "wav")); }
TEST(AllTags, OfAnAiffAreRead) { EXPECT_EQ(fields_of("full.aiff"), full("pcm", "aiff")); }
TEST(AllTags, OfAMonkeysAudioAreRead) { EXPECT_EQ(fields_of("full.ape"), full("ape", "ape")); }
TEST(AllTags, OfATrueAudioAreRead) { EXPECT_EQ(fields_of("full.tta"), full("tta", "tta")); }

/// Its writer puts the first of several values behind the others.
TEST(AllTags, OfAWmaAreRead) {
  EXPECT_EQ(
      fields_of("full.wma"),
      full("wmav2", "asf", {{"genre", "Sea Songs;Folk"}, {"composer", "Jo Reed; Mina Okafor"}}));
}

TEST(AllTags, OfASpeexAreRead) {
  EXPECT_EQ(fields_of("full.spx"),
            full("speex", "ogg", {{"frequency", "16000"}, {"channel", "1"}}));
}

/// The format's own gains: -1280 and -640 of 1/256 dB, 5 dB added. It knows no peaks.
TEST(AllTags, OfAnOpusAreReadWithItsOwnGains) {
  EXPECT_EQ(fields_of("full.opus"), full("opus", "ogg",
                                         {{"frequency", "48000"},
                                          {"rg_track_gain", ""},  // 0 dB
                                          {"rg_track_peak", ""},
                                          {"rg_album_gain", "2.5"},
                                          {"rg_album_peak", ""}}));
  EXPECT_EQ(read_sample("full.opus").gain.track_gain, 0);
  EXPECT_EQ(read_sample("full.opus").gain.track_peak, std::nullopt);
}

TEST(AllTags, OfAWavPackAreRead) {
  EXPECT_EQ(fields_of("full.wv"), full("wavpack", "wv", kOneOfEach));
}

TEST(AllTags, OfADsfAreRead) {
  EXPECT_EQ(fields_of("full.dsf"), full("dsd_lsbf_planar", "dsf", {{"frequency", "352800"}}));
}

TEST(AllTags, OfAMatroskaAudioFileAreRead) {
  EXPECT_EQ(fields_of("full.mka"), full("flac", "matroska", kOneOfEach));
}

/// Of the stream's header, where the format's own program puts them. The tone is an eighth of full
/// scale, 3 dB less on each of its two channels.
TEST(AllTags, OfAMusepackAreReadWithItsOwnGains) {
  auto fields = fields_of("full.mpc");
  for (const char* gain : {"rg_track_gain", "rg_track_peak", "rg_album_gain", "rg_album_peak"}) {
    fields.erase(gain);
  }
  EXPECT_EQ(fields, full("musepack", "mpc",
                         {{"rg_track_gain", ""},
                          {"rg_track_peak", ""},
                          {"rg_album_gain", ""},
                          {"rg_album_peak", ""}}));
  const auto gain = read_sample("full.mpc").gain;
  EXPECT_NEAR(gain.track_peak.value_or(0), 0.0884, 0.001);
  EXPECT_NEAR(gain.album_peak.value_or(0), 0.0884, 0.001);
  EXPECT_NEAR(gain.track_gain.value_or(99), 6.26, 0.1);
  EXPECT_NEAR(gain.album_gain.value_or(99), 6.26, 0.1);
}

/// UTF-16 text, the year in a field of its own, and a number for the genre.
TEST(AllTags, OfAnOlderId3v2AreRead) {
  EXPECT_EQ(fields_of("id3v2.3.mp3"), full("mp3", "mp3", {{"genre", "Rock"}}));
}

TEST(AGapInTheFirstTag, IsFilledFromTheNext) {
  const auto file = read_sample("id3v2-and-id3v1.mp3");
  EXPECT_EQ(file.title, "From ID3v2");
  EXPECT_EQ(file.artist, "Old Artist");
  EXPECT_EQ(file.album, "Album");
  EXPECT_EQ(file.genre, "Rock");
  EXPECT_EQ(file.comment, "a comment");
  EXPECT_EQ(file.year, 2004);
  EXPECT_EQ(file.track, 7);
}

TEST(ReplayGainOfAnMp3, MayStandInApe) {
  const auto file = read_sample("id3v1-and-ape.mp3");
  EXPECT_EQ(file.title, "From ID3v1");
  EXPECT_EQ(file.gain.track_gain, -6.01);
  EXPECT_EQ(file.gain.track_peak, 0.5);
}

TEST(RiffInfo, IsReadWhereAWavHasNoId3) {
  EXPECT_EQ(fields_of("info.wav"), (Fields{{"title", "Slack Water"},
                                           {"album", "Low Tide"},
                                           {"artist", "Ada Brandt"},
                                           {"genre", "Folk"},
                                           {"comment", "at the quay"},
                                           {"composer", "Jo Reed"},
                                           {"year", "2004"},
                                           {"track", "3"},
                                           {"duration", "1"},
                                           {"bitrate", "some"},
                                           {"frequency", "44100"},
                                           {"channel", "2"},
                                           {"video_codec", "pcm"},
                                           {"container_type", "wav"}}));
  const auto other = read_sample("info-of-ffmpeg.wav");
  EXPECT_EQ(other.title, "Slack Water");
  EXPECT_EQ(other.track, 3);
  EXPECT_EQ(other.year, 2004);
}

TEST(ADsf, WithoutATagIsNamedAfterItsFile) {
  EXPECT_EQ(fields_of("untagged.dsf"), (Fields{{"title", "untagged"},
                                               {"duration", "1"},
                                               {"bitrate", "some"},
                                               {"frequency", "352800"},
                                               {"channel", "2"},
                                               {"video_codec", "dsd_lsbf_planar"},
                                               {"container_type", "dsf"}}));
}

TEST(AFormatWithoutTags, IsNamedAfterItsFile) {
  for (const std::string name : {"ac3", "dts"}) {
    EXPECT_EQ(fields_of("untagged." + name), (Fields{{"title", "untagged"},
                                                     {"duration", "1"},
                                                     {"bitrate", "some"},
                                                     {"frequency", "44100"},
                                                     {"channel", "2"},
                                                     {"video_codec", name},
                                                     {"container_type", name}}));
  }
}

TEST(AFormatWithFewTags, HasThoseRead) {
  const Fields names{{"title", "Slack Water"}, {"artist", "Ada Brandt"}, {"bitrate", "some"}};
  EXPECT_EQ(fields_of("some.au"), with(names, {{"album", "Low Tide"},
                                               {"duration", "1"},
                                               {"frequency", "44100"},
                                               {"channel", "2"},
                                               {"video_codec", "pcm_s16be"},
                                               {"container_type", "au"}}));
  EXPECT_EQ(fields_of("some.ra"), with(names, {{"frequency", "8000"},
                                               {"channel", "1"},
                                               {"video_codec", "ra_144"},
                                               {"container_type", "rm"}}));
}

TEST(ReplayGainOfId3, StandsInAVolumeFrameToo) {
  const auto gain = read_sample("rva2.mp3").gain;
  EXPECT_EQ(gain.track_gain, -4.5);
  EXPECT_EQ(gain.track_peak, 0.5);
  EXPECT_EQ(gain.album_gain, -3.25);
  EXPECT_EQ(gain.album_peak, 0.75);
}

/// Players apply it whatever they do with the gains, which count from there.
TEST(TheOutputGainOfAnOpus, ChangesNoReplayGain) {
  const auto gain = read_sample("output-gain.opus").gain;
  EXPECT_EQ(gain.track_gain, 0);
  EXPECT_EQ(gain.album_gain, 2.5);
  EXPECT_EQ(fields_of("output-gain.opus"),
            with(fields_of("full.opus"), {{"title", "Slack Water"}}));
}

TEST(AnAlbumArtist, IsReadInEverySpelling) {
  int files = 0;
  for (const auto& entry : std::filesystem::directory_iterator(tag_sample("spellings"))) {
    const auto name = entry.path().filename().string();
    auto written = entry.path().stem().string();
    if (written == "WM-AlbumArtist") written = "WM/AlbumArtist";
    EXPECT_EQ(read_sample("spellings/" + name).album_artist, written) << name;
    ++files;
  }
  EXPECT_EQ(files, 21);
}

TEST(ADate, MayBePartial) {
  for (const char* name : {"day", "month", "year", "compact", "time"}) {
    EXPECT_EQ(read_sample(std::string("dates/") + name + ".flac").year, 2004) << name;
  }
  EXPECT_EQ(read_sample("dates/words.flac").year, 0);
}

TEST(ManyValues, AreJoinedOnceEachAndNotWithoutEnd) {
  const auto file = read_sample("many.flac");
  EXPECT_EQ(file.artist, "Twice; Once");
  EXPECT_TRUE(file.genre.starts_with("Genre 0;Genre 1;Genre 2;"));
  EXPECT_LT(file.genre.size(), 5000U);
}

/// Also where TagLib alone would see another format, or none.
TEST(TheTagsAsTheyAre, AreThoseOfTheFormat) {
  const auto value = [](const std::string& file, const std::string& name) {
    for (const auto& tag : tool::raw_tags(tag_sample(file), tool::Kind::kMusic)) {
      if (tag.name == name) return tag.value;
    }
    return std::string("none");
  };
  EXPECT_EQ(value("full.mka", "ALBUM"), "Low Tide");
  EXPECT_EQ(value("full.dsf", "album"), "Low Tide");
  EXPECT_EQ(value("full.wv", "TRACKNUMBER"), "3/12");
}

}  // namespace
}  // namespace mediidx::test
