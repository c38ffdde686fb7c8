// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The figures of a report on the index: totals, and a table for each of its sections.
#ifndef MEDIIDX_TOOL_REPORT_REPORT_H_
#define MEDIIDX_TOOL_REPORT_REPORT_H_

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "store/database.h"

namespace mediidx::tool {

enum class ReportValue { kText, kPath, kNumber, kBytes };

/// A column of a section's query, its title in the report, and the colour in which its numbers are
/// drawn; null: they are not.
struct ReportColumn {
  const char* name;
  const char* title;
  ReportValue type;
  const char* colour = nullptr;
};

/// How the numbers of a table are drawn.
enum class ReportChart {
  kNone,
  kRing,     ///< The shares of a whole.
  kBars,     ///< Named things, a bar each.
  kColumns,  ///< Years or days, in order.
  kGrowth,   ///< The same, summed up from the first one on.
};

/// What a report tells of one matter. The query may read from "media", every file of the index; its
/// first column is what a row is about. Its number "rest", where there is one, says how many things
/// a last row sums up; its number "total" how many rows there would be without a limit.
struct ReportSection {
  const char* id;
  const char* title;
  const char* note;     ///< What the numbers are.
  const char* nothing;  ///< Stands in place of a table without rows.
  ReportChart chart;
  std::span<const ReportColumn> columns;
  const char* query;
};

std::span<const ReportSection> report_sections();

struct ReportRow {
  std::vector<std::string> cells;  ///< As the database gives them.
  std::int64_t rest = 0;
};

struct ReportTable {
  const ReportSection* section = nullptr;
  std::vector<ReportRow> rows;
  std::int64_t total = 0;  ///< Rows without a limit.
};

struct ReportTotals {
  std::string written;  ///< "2024-05-01 12:30", UTC.
  std::int64_t files = 0;
  std::int64_t songs = 0;
  std::int64_t videos = 0;
  std::int64_t photos = 0;
  std::int64_t playlists = 0;
  std::int64_t albums = 0;
  std::int64_t artists = 0;
  std::int64_t genres = 0;
  std::int64_t bytes = 0;
  std::int64_t seconds_of_music = 0;
  std::int64_t seconds_of_video = 0;
  std::int64_t offline = 0;
  std::int64_t failures = 0;
};

struct Report {
  ReportTotals totals;
  std::vector<ReportTable> tables;
};

/// Counts everything as it is at one moment, whatever a scan does meanwhile. What it holds does not
/// grow with the index.
Report read_report(Database& database);

}  // namespace mediidx::tool

#endif
