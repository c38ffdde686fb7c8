// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <algorithm>

#include "explain/raw_tags.h"
#include "tag_samples.h"

namespace mediidx::test {
namespace {

/// Turned by a quarter: the picture is 128 wide and 64 high as it is stored.
const Fields kFull{
    {"title", "Low tide"},    {"album", "photos"},
    {"camera_make", "Lumen"}, {"camera_model", "L-1"},
    {"exposure", "1/125"},    {"aperture", "f/2.8"},
    {"iso", "200"},           {"resolutionX", "64"},
    {"resolutionY", "128"},   {"timetaken", "2021-06-12 10:30:00"},
};

TEST(AllSettings, OfAJpegAreRead) { EXPECT_EQ(fields_of("photos/full.jpg"), kFull); }
TEST(AllSettings, OfAPngAreRead) { EXPECT_EQ(fields_of("photos/full.png"), kFull); }
TEST(AllSettings, OfATiffAreRead) { EXPECT_EQ(fields_of("photos/full.tiff"), kFull); }
TEST(AllSettings, OfAWebpAreRead) { EXPECT_EQ(fields_of("photos/full.webp"), kFull); }
TEST(AllSettings, OfADngAreRead) { EXPECT_EQ(fields_of("photos/full.dng"), kFull); }
TEST(AllSettings, OfANefAreRead) { EXPECT_EQ(fields_of("photos/full.nef"), kFull); }

/// These have no place for the title here.
TEST(AllSettings, OfAHeicAreRead) {
  EXPECT_EQ(fields_of("photos/full.heic"), with(kFull, {{"title", "full"}}));
}
TEST(AllSettings, OfACr2AreRead) {
  EXPECT_EQ(fields_of("photos/full.cr2"), with(kFull, {{"title", "full"}}));
}
TEST(AllSettings, OfAnOrfAreRead) {
  EXPECT_EQ(fields_of("photos/full.orf"), with(kFull, {{"title", "full"}}));
}

TEST(APictureWithoutSettings, HasItsSize) {
  for (const char* suffix : {"gif", "bmp", "avif", "heic"}) {
    EXPECT_EQ(fields_of(std::string("photos/plain.") + suffix), (Fields{{"title", "plain"},
                                                                        {"album", "photos"},
                                                                        {"resolutionX", "128"},
                                                                        {"resolutionY", "64"}}))
        << suffix;
  }
}

TEST(APhoto, IsAsWideAsItIsShown) {
  for (int orientation = 1; orientation <= 8; ++orientation) {
    const auto file = read_sample("photos/orientation-" + std::to_string(orientation) + ".jpg");
    const bool turned = orientation >= 5;
    EXPECT_EQ(file.resolution_x, turned ? 64 : 128) << orientation;
    EXPECT_EQ(file.resolution_y, turned ? 128 : 64) << orientation;
  }
}

TEST(AnExposure, IsWrittenAsPeopleWriteIt) {
  const auto exposure = [](const std::string& name) {
    return read_sample("photos/exposure-" + name + ".jpg").exposure;
  };
  EXPECT_EQ(exposure("fast"), "1/4000");
  EXPECT_EQ(exposure("raw"), "1/125");
  EXPECT_EQ(exposure("third"), "0.333");
  EXPECT_EQ(exposure("half"), "0.5");
  EXPECT_EQ(exposure("long"), "2.5");
  EXPECT_EQ(exposure("minute"), "60");
  EXPECT_EQ(exposure("none"), "");
}

TEST(AnAperture, HasNoNeedlessZeros) {
  EXPECT_EQ(read_sample("photos/whole-aperture.jpg").aperture, "f/8");
}

TEST(Settings, AreReadFromPowersOfTwo) {
  const auto file = read_sample("photos/powers.jpg");
  EXPECT_EQ(file.exposure, "1/128");
  EXPECT_EQ(file.aperture, "f/2.8");
}

TEST(Settings, DividedByZeroAreNone) {
  const auto file = read_sample("photos/unknown.jpg");
  EXPECT_EQ(file.exposure, "");
  EXPECT_EQ(file.aperture, "");
}

TEST(Settings, AreReadFromXmpToo) {
  const auto file = read_sample("photos/xmp.jpg");
  EXPECT_EQ(file.timetaken, "2020-02-29 23:59:58");
  EXPECT_EQ(file.camera_make, "Lumen");
  EXPECT_EQ(file.exposure, "1/60");
  EXPECT_EQ(file.aperture, "f/4");
}

/// full.jpg was taken two hours before UTC, xmp.jpg nine.
TEST(TheTimeTaken, IsTheCamerasOwnWhateverItsZone) {
  EXPECT_EQ(read_sample("photos/full.jpg").timetaken, "2021-06-12 10:30:00");
  EXPECT_EQ(read_sample("photos/xmp.jpg").timetaken, "2020-02-29 23:59:58");
}

TEST(TheZoneOfTheTimeTaken, StandsAmongTheTagsAsTheyAre) {
  const auto tags = tool::raw_tags(tag_sample("photos/full.jpg"), tool::Kind::kPhoto);
  const auto is_zone = [](const tool::RawTag& tag) {
    return tag.name == "Exif.Photo.OffsetTimeOriginal" && tag.value == "+02:00";
  };
  EXPECT_EQ(std::ranges::count_if(tags, is_zone), 1);
}

TEST(TheTimeTaken, MayBeThatOfTheScan) {
  EXPECT_EQ(read_sample("photos/digitized.jpg").timetaken, "2019-01-02 03:04:05");
}

TEST(TheTimeTaken, IsNoneWhenItCannotBe) {
  EXPECT_EQ(read_sample("photos/bad-time.jpg").timetaken, "");
}

TEST(ACamera, OfLatin1LettersIsReadAsUtf8) {
  EXPECT_EQ(read_sample("photos/latin1.jpg").camera_make, "Lumén");
}

}  // namespace
}  // namespace mediidx::test
