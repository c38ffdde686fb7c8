// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "report/page.h"

namespace mediidx::tool {
namespace {

using testing::HasSubstr;
using testing::Not;

constexpr std::string_view kNonce = "0123456789abcdef";

const ReportSection& section(std::string_view id) {
  return *std::ranges::find_if(report_sections(), [id](const auto& one) { return one.id == id; });
}

/// A report with one section that has these rows.
Report report_with(std::string_view id, std::vector<ReportRow> rows) {
  const auto total = static_cast<std::int64_t>(rows.size());
  Report out;
  out.tables.push_back({&section(id), std::move(rows), total});
  return out;
}

std::string page_of(const Report& report) { return report_page(report, kNonce); }

/// How often a text stands in another.
int times(std::string_view text, std::string_view what) {
  int out = 0;
  for (auto at = text.find(what); at != text.npos; at = text.find(what, at + 1)) ++out;
  return out;
}

constexpr const char* kHostile = "</script><img src=http://x onerror='alert(1)'>&\"<!--";
constexpr const char* kHarmless =
    "&lt;/script&gt;&lt;img src=http://x onerror=&#39;alert(1)&#39;&gt;&amp;&quot;&lt;!--";

TEST(AReportPage, HoldsAHostileNameAsText) {
  const auto page = page_of(report_with("genres", {{{kHostile, "1"}}}));
  EXPECT_THAT(page, HasSubstr(std::string("<bdi>") + kHarmless + "</bdi>"));
  EXPECT_THAT(page, Not(HasSubstr("<img")));
  EXPECT_EQ(times(page, "<script"), 2);
  EXPECT_EQ(times(page, "</script>"), 2);
}

TEST(AReportPage, HoldsAHostileNumberAsANumber) {
  const auto page = page_of(report_with("genres", {{{"Folk", "\"><img src=x>"}}}));
  EXPECT_THAT(page, HasSubstr("data-value=\"0\""));
  EXPECT_THAT(page, Not(HasSubstr("<img")));
}

TEST(AReportPage, ShowsWhatIsNoTextAsEscapes) {
  const auto page = page_of(report_with("failures", {{{"/m/a\nb\x1B[31m\xFF.mp3", "no\x01good"}}}));
  EXPECT_THAT(page, HasSubstr("/m/a\\nb\\x1B[31m\\xFF.mp3"));
  EXPECT_THAT(page, Not(HasSubstr("\x01")));
}

TEST(AReportPage, ForbidsWhatIsNotItsOwn) {
  const auto page = page_of(report_with("genres", {}));
  EXPECT_THAT(page, HasSubstr("content=\"default-src 'none'; "
                              "script-src 'nonce-0123456789abcdef'; "
                              "style-src 'nonce-0123456789abcdef'; "
                              "img-src data:; base-uri 'none'; form-action 'none'\""));
  EXPECT_EQ(times(page, "<script nonce=\"0123456789abcdef\">"), 2);
  EXPECT_EQ(times(page, "<style nonce=\"0123456789abcdef\">"), 1);
  EXPECT_THAT(page, Not(HasSubstr(" src=\"")));
  EXPECT_THAT(page, Not(HasSubstr("href=\"http")));
}

TEST(AReportPage, NamesTheTermsOfItsChartLibrary) {
  EXPECT_THAT(page_of({}), HasSubstr("Chart.js Contributors"));
  EXPECT_THAT(page_of({}), HasSubstr("Permission is hereby granted, free of charge"));
}

TEST(AReportPage, SaysWhereThereIsNothing) {
  const auto page = page_of(report_with("failures", {}));
  EXPECT_THAT(page, HasSubstr("Every file that was found could be read."));
  EXPECT_THAT(page, Not(HasSubstr("<table>")));
}

TEST(AReportPage, DrawsNothingFromATableWithoutRows) {
  EXPECT_THAT(page_of(report_with("genres", {})), Not(HasSubstr("<figure")));
}

TEST(AReportPage, ShowsItsTablesWithoutAScript) {
  const auto page = page_of(report_with("genres", {{{"Folk", "1234"}}}));
  EXPECT_THAT(page, HasSubstr("<details open>"));
  EXPECT_THAT(page, HasSubstr("<td class=\"number\" data-value=\"1234\">1,234</td>"));
}

TEST(AReportPage, SaysHowManyARowSumsUp) {
  const auto page = page_of(report_with("genres", {{{"Folk", "5"}}, {{"Jazz", "9"}, 1200}}));
  EXPECT_THAT(page, HasSubstr(">1,200 more</th>"));
  EXPECT_THAT(page, Not(HasSubstr("Jazz")));
}

TEST(AReportPage, SaysWhatAListLeavesOut) {
  auto report = report_with("failures", {{{"/m/a.mp3", "damaged"}}});
  report.tables[0].total = 5000;
  EXPECT_THAT(page_of(report), HasSubstr("The first 1 of 5,000."));
}

TEST(AReportPage, PointsToWhatIsWrong) {
  auto report = report_with("albums", {{{"Hits", "2", "2", "/m/a.mp3"}}});
  report.totals.failures = 2;
  report.totals.offline = 1;
  const auto page = page_of(report);
  EXPECT_THAT(page, HasSubstr("<a href=\"#failures\">2 files could not be read</a>"));
  EXPECT_THAT(page, HasSubstr("<a href=\"#offline\">1 file is offline</a>"));
  EXPECT_THAT(page, HasSubstr("<a href=\"#albums\">1 album has no artist</a>"));
  EXPECT_THAT(page_of({}), Not(HasSubstr("<a ")));
}

TEST(AReportPage, IsKnownByItsBeginning) {
  const auto page = page_of({});
  EXPECT_TRUE(begins_report_page(std::string_view(page).substr(0, kPageBeginning)));
  EXPECT_FALSE(begins_report_page("<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n"));
  EXPECT_FALSE(begins_report_page(""));
}

TEST(ANonce, IsAnotherEveryTime) {
  const auto one = random_nonce();
  EXPECT_EQ(one.size(), 32U);
  EXPECT_EQ(one.find_first_not_of("0123456789abcdef"), std::string::npos);
  EXPECT_NE(one, random_nonce());
}

TEST(AReportsNumber, HasItsDigitsInGroups) {
  EXPECT_EQ(grouped_text(0), "0");
  EXPECT_EQ(grouped_text(999), "999");
  EXPECT_EQ(grouped_text(1000), "1,000");
  EXPECT_EQ(grouped_text(1234567), "1,234,567");
  EXPECT_EQ(grouped_text(-123), "-123");
  EXPECT_EQ(grouped_text(-1234), "-1,234");
}

TEST(AReportsSize, HasTwoDigitsOrThree) {
  EXPECT_EQ(size_text(0), "0 B");
  EXPECT_EQ(size_text(999), "999 B");
  EXPECT_EQ(size_text(1000), "1.0 kB");
  EXPECT_EQ(size_text(9949), "9.9 kB");
  EXPECT_EQ(size_text(9951), "10 kB");
  EXPECT_EQ(size_text(999499), "999 kB");
  EXPECT_EQ(size_text(999500), "1.0 MB");
  EXPECT_EQ(size_text(INT64_MAX), "9.2 EB");
  EXPECT_EQ(size_text(-5), "-5 B");
}

TEST(AReportsTime, HasTwoUnitsAtMost) {
  EXPECT_EQ(span_text(0), "0 s");
  EXPECT_EQ(span_text(59), "59 s");
  EXPECT_EQ(span_text(60), "1 min");
  EXPECT_EQ(span_text(3600), "1 h 0 min");
  EXPECT_EQ(span_text(86399), "23 h 59 min");
  EXPECT_EQ(span_text(90000), "1 d 1 h");
}

}  // namespace
}  // namespace mediidx::tool
