// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/file_times.h"

#include <gtest/gtest.h>

#include <cmath>

#include "tags/photo.h"

namespace mediidx::tool {
namespace {

TEST(Timestamp, IsUtc) {
  EXPECT_EQ(to_timestamp(0), "1970-01-01 00:00:00");
  EXPECT_EQ(to_timestamp(1083412800), "2004-05-01 12:00:00");
  EXPECT_EQ(to_timestamp(-1), "1969-12-31 23:59:59");
}

TEST(Timestamp, OutsideTheDatabasesYearsIsEmpty) {
  EXPECT_EQ(to_timestamp(253402300799), "9999-12-31 23:59:59");
  EXPECT_EQ(to_timestamp(253402300800), "");
  EXPECT_EQ(to_timestamp(-62135596800), "0001-01-01 00:00:00");
  EXPECT_EQ(to_timestamp(-62135596801), "");
  EXPECT_EQ(to_timestamp(INT64_MAX), "");
}

TEST(FileTimes, FallBackOnTheModificationTime) {
  struct statx status{};
  status.stx_mtime.tv_sec = 1083412800;
  EXPECT_EQ(file_times(status).created, "2004-05-01 12:00:00");
  status.stx_mask = STATX_BTIME;
  status.stx_btime.tv_sec = 86400;
  EXPECT_EQ(file_times(status).created, "1970-01-02 00:00:00");
  EXPECT_EQ(file_times(status).modified, "2004-05-01 12:00:00");
}

struct DateCase {
  const char* name;
  std::string_view text;
  std::string_view expected;
};
class CameraTime : public testing::TestWithParam<DateCase> {};
TEST_P(CameraTime, IsATimestampOrEmpty) {
  EXPECT_EQ(camera_time(GetParam().text), GetParam().expected);
}
INSTANTIATE_TEST_SUITE_P(
    Cases, CameraTime,
    testing::Values(DateCase{"AsCamerasWriteIt", "2021:06:12 10:30:00", "2021-06-12 10:30:00"},
                    DateCase{"WithDashes", "2021-06-12T10:30:00+02:00", "2021-06-12 10:30:00"},
                    DateCase{"LeapDay", "2020:02:29 00:00:00", "2020-02-29 00:00:00"},
                    DateCase{"NoLeapDay", "2021:02:29 00:00:00", ""},
                    DateCase{"Zeros", "0000:00:00 00:00:00", ""},
                    DateCase{"Blanks", "    :  :     :  :  ", ""},
                    DateCase{"Hour24", "2021:06:12 24:00:00", ""},
                    DateCase{"Minute60", "2021:06:12 10:60:00", ""},
                    DateCase{"Second60", "2021:06:12 10:30:60", ""},
                    DateCase{"Negative", "2021:-6:12 10:30:00", ""},
                    DateCase{"DateAlone", "2021:06:12", ""}, DateCase{"Empty", "", ""}),
    [](const auto& test) { return test.param.name; });

TEST(Year, BeginsADate) {
  EXPECT_EQ(year_of("2004-05-01"), 2004);
  EXPECT_EQ(year_of("2004"), 2004);
  EXPECT_EQ(year_of("2004-05"), 2004);
  EXPECT_EQ(year_of("20040501"), 2004);
  EXPECT_EQ(year_of("200405"), 0);
  EXPECT_EQ(year_of("May 2004"), 0);
  EXPECT_EQ(year_of("0000"), 0);
  EXPECT_EQ(year_of("99"), 0);
}

TEST(TrackNumber, StandsBeforeTheTotal) {
  EXPECT_EQ(leading_number("3/12"), 3);
  EXPECT_EQ(leading_number("03"), 3);
  EXPECT_EQ(leading_number(" 7"), 7);
  EXPECT_EQ(leading_number("A3"), 0);
  EXPECT_EQ(leading_number("-3"), 0);
  EXPECT_EQ(leading_number("99999999999"), 0);
  EXPECT_EQ(leading_number(""), 0);
}

TEST(Exposure, IsWrittenAsOnCameras) {
  EXPECT_EQ(exposure_text(1.0 / 125), "1/125");
  EXPECT_EQ(exposure_text(0.25), "1/4");
  EXPECT_EQ(exposure_text(0.5), "0.5");
  EXPECT_EQ(exposure_text(2.5), "2.5");
  EXPECT_EQ(exposure_text(30), "30");
  EXPECT_EQ(exposure_text(0), "");
  EXPECT_EQ(exposure_text(-1), "");
  EXPECT_EQ(exposure_text(NAN), "");
}

TEST(Aperture, IsWrittenAsOnCameras) {
  EXPECT_EQ(aperture_text(2.8), "f/2.8");
  EXPECT_EQ(aperture_text(8), "f/8");
  EXPECT_EQ(aperture_text(0), "");
  EXPECT_EQ(aperture_text(INFINITY), "");
}

}  // namespace
}  // namespace mediidx::tool
