// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "report/page.h"

#include <sys/random.h>

#include <array>
#include <cstdio>
#include <cstdlib>
#include <stdexcept>

#include "report/page_parts.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

// The page of every version begins so.
constexpr std::string_view kBeginning =
    "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
    "<meta name=\"generator\" content=\"mediidx ";

/// Text between tags and in quoted attributes. What a screen could not show stands as an escape.
std::string html(std::string_view text) {
  std::string out;
  for (const char c : escape_for_display(text)) {
    switch (c) {
      case '&':
        out += "&amp;";
        break;
      case '<':
        out += "&lt;";
        break;
      case '>':
        out += "&gt;";
        break;
      case '"':
        out += "&quot;";
        break;
      case '\'':
        out += "&#39;";
        break;
      default:
        out += c;
    }
  }
  return out;
}

std::int64_t number_in(const std::string& text) { return std::strtoll(text.c_str(), nullptr, 10); }

const char* name_of(ReportChart chart) {
  switch (chart) {
    case ReportChart::kNone:
      break;
    case ReportChart::kRing:
      return "ring";
    case ReportChart::kBars:
      return "bars";
    case ReportChart::kColumns:
      return "columns";
    case ReportChart::kGrowth:
      return "growth";
  }
  return "";
}

bool is_number(ReportValue type) {
  return type == ReportValue::kNumber || type == ReportValue::kBytes;
}

std::string heading_cell(const ReportColumn& column) {
  std::string out = "<th scope=\"col\"";
  if (is_number(column.type)) out += " class=\"number\"";
  if (column.colour) out += std::string(" data-colour=\"") + column.colour + "\"";
  return out + ">" + html(column.title) + "</th>";
}

std::string number_cell(ReportValue type, std::int64_t number) {
  const auto shown = type == ReportValue::kBytes ? size_text(number) : grouped_text(number);
  return "<td class=\"number\" data-value=\"" + std::to_string(number) + "\">" +
         (number == 0 ? "" : shown) + "</td>";
}

/// The name that a row is about; what it sums up where it stands for many.
std::string label_cell(const ReportRow& row, ReportValue type) {
  if (row.rest > 0) {
    return "<th scope=\"row\" class=\"rest\">" + grouped_text(row.rest) + " more</th>";
  }
  const auto& name = row.cells[0];
  return std::string("<th scope=\"row\"") + (type == ReportValue::kPath ? " class=\"path\"" : "") +
         "><bdi>" + (name.empty() ? "—" : html(name)) + "</bdi></th>";
}

std::string table_row(const ReportRow& row, std::span<const ReportColumn> columns) {
  auto out = "<tr>" + label_cell(row, columns[0].type);
  for (std::size_t i = 1; i < columns.size(); ++i) {
    const auto& cell = row.cells[i];
    if (is_number(columns[i].type)) {
      out += number_cell(columns[i].type, number_in(cell));
    } else {
      out += std::string("<td") + (columns[i].type == ReportValue::kPath ? " class=\"path\"" : "") +
             "><bdi>" + html(cell) + "</bdi></td>";
    }
  }
  return out + "</tr>\n";
}

std::string table(const ReportTable& table) {
  const auto columns = table.section->columns;
  std::string out = "<div class=\"scroll\" tabindex=\"0\"><table>\n<thead><tr>";
  for (const auto& column : columns) out += heading_cell(column);
  out += "</tr></thead>\n<tbody>\n";
  for (const auto& row : table.rows) out += table_row(row, columns);
  return out + "</tbody>\n</table></div>\n";
}

/// The unit of what is drawn.
const char* unit_of(const ReportSection& section) {
  for (const auto& column : section.columns) {
    if (column.colour && column.type == ReportValue::kBytes) return "bytes";
  }
  return "files";
}

/// A place for the chart, and the table that it is drawn from: open, until it is.
std::string figure(const ReportTable& data) {
  const auto& section = *data.section;
  return std::string("<figure data-chart=\"") + name_of(section.chart) + "\" data-unit=\"" +
         unit_of(section) + "\">\n<div class=\"plot\" hidden><canvas role=\"img\" aria-label=\"" +
         html(section.title) + "\"></canvas></div>\n<details open><summary>As a table</summary>\n" +
         table(data) + "</details>\n</figure>\n";
}

std::string section_text(const ReportTable& data) {
  const auto& section = *data.section;
  const bool is_drawn = section.chart != ReportChart::kNone;
  auto out = std::string("<section id=\"") + section.id + "\"" +
             (is_drawn ? "" : " class=\"wide\"") + ">\n<h2>" + html(section.title) + "</h2>\n";
  if (data.rows.empty()) {
    return out + "<p class=\"nothing\">" + html(section.nothing) + "</p>\n</section>\n";
  }
  out += "<p class=\"note\">" + html(section.note);
  const auto shown = static_cast<std::int64_t>(data.rows.size());
  if (data.total > shown) {
    out += " The first " + grouped_text(shown) + " of " + grouped_text(data.total) + ".";
  }
  return out + "</p>\n" + (is_drawn ? figure(data) : table(data)) + "</section>\n";
}

std::string counted(std::int64_t number, const char* one, const char* many) {
  return grouped_text(number) + " " + (number == 1 ? one : many);
}

std::string tile(const char* name, const std::string& value, const std::string& more) {
  return std::string("<li><span class=\"name\">") + name + "</span><strong>" + value +
         "</strong><span class=\"more\">" + more + "</span></li>\n";
}

std::string tiles(const ReportTotals& totals) {
  return "<ul class=\"tiles\">\n" +
         tile("Songs", grouped_text(totals.songs), span_text(totals.seconds_of_music)) +
         tile("Albums", grouped_text(totals.albums),
              counted(totals.artists, "artist", "artists") + ", " +
                  counted(totals.genres, "genre", "genres")) +
         tile("Videos", grouped_text(totals.videos), span_text(totals.seconds_of_video)) +
         tile("Photos", grouped_text(totals.photos), "") +
         tile("Playlists", grouped_text(totals.playlists), "cue sheets included") +
         tile("Size", size_text(totals.bytes), counted(totals.files, "file", "files")) + "</ul>\n";
}

std::int64_t rows_in(const Report& report, std::string_view section) {
  for (const auto& table : report.tables) {
    if (table.section->id == section) return table.total;
  }
  return 0;
}

/// What somebody may want to look at, with the way to it.
std::string alerts(const Report& report) {
  struct Alert {
    const char* section;
    std::int64_t number;
    const char* one;
    const char* many;
  };
  const Alert all[] = {
      {"failures", report.totals.failures, "file could not be read", "files could not be read"},
      {"offline", report.totals.offline, "file is offline", "files are offline"},
      {"albums", rows_in(report, "albums"), "album has no artist", "albums have no artist"},
  };
  std::string out;
  for (const auto& alert : all) {
    if (alert.number == 0) continue;
    out += std::string("<li><a href=\"#") + alert.section + "\">" +
           counted(alert.number, alert.one, alert.many) + "</a></li>\n";
  }
  return out.empty() ? "" : "<ul class=\"alerts\">\n" + out + "</ul>\n";
}

std::string head(std::string_view nonce) {
  const std::string allowed = "'nonce-" + std::string(nonce) + "'";
  return std::string(kBeginning) +
         MEDIIDX_VERSION
         "\">\n"
         "<meta http-equiv=\"Content-Security-Policy\" content=\"default-src 'none'; "
         "script-src " +
         allowed + "; style-src " + allowed +
         "; img-src data:; base-uri 'none'; form-action 'none'\">\n"
         "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n"
         "<meta name=\"color-scheme\" content=\"light dark\">\n"
         "<link rel=\"icon\" href=\"data:,\">\n"
         "<title>Media library</title>\n"
         "<style nonce=\"" +
         std::string(nonce) + "\">\n" + kPageStyle + "</style>\n</head>\n";
}

std::string script(std::string_view nonce, std::string_view text) {
  return "<script nonce=\"" + std::string(nonce) + "\">\n" + std::string(text) + "</script>\n";
}

}  // namespace

std::string report_page(const Report& report, std::string_view nonce) {
  auto out = head(nonce) + "<body>\n<header>\n<h1>Media library</h1>\n<p>" +
             html(report.totals.written) + " UTC, mediidx " MEDIIDX_VERSION "</p>\n</header>\n" +
             "<main>\n" + tiles(report.totals) + alerts(report) + "<div class=\"cards\">\n";
  for (const auto& table : report.tables) out += section_text(table);
  return out + "</div>\n</main>\n<!--\n" + kChartLicence + "-->\n" + script(nonce, kChartLibrary) +
         script(nonce, kPageScript) + "</body>\n</html>\n";
}

std::string random_nonce() {
  std::array<unsigned char, 16> bytes;
  if (getrandom(bytes.data(), bytes.size(), 0) != static_cast<ssize_t>(bytes.size())) {
    throw std::runtime_error("the system gives no random numbers");
  }
  std::string out;
  for (const unsigned char byte : bytes) {
    out += "0123456789abcdef"[byte >> 4];
    out += "0123456789abcdef"[byte & 15];
  }
  return out;
}

bool begins_report_page(std::string_view text) { return text.starts_with(kBeginning); }

std::string grouped_text(std::int64_t number) {
  const auto digits = std::to_string(number);
  std::string out;
  for (std::size_t i = 0; i < digits.size(); ++i) {
    const bool begins_group = i > 0 && digits[i - 1] != '-' && (digits.size() - i) % 3 == 0;
    if (begins_group) out += ',';
    out += digits[i];
  }
  return out;
}

std::string size_text(std::int64_t bytes) {
  constexpr std::array kUnits{"kB", "MB", "GB", "TB", "PB", "EB"};
  if (bytes < 1000) return std::to_string(bytes) + " B";
  auto value = static_cast<double>(bytes) / 1000;
  std::size_t unit = 0;
  // What would be rounded to a thousand is one of the next unit.
  while (value >= 999.5 && unit + 1 < kUnits.size()) {
    value /= 1000;
    ++unit;
  }
  std::array<char, 48> text;
  std::snprintf(text.data(), text.size(), "%.*f %s", value < 9.95 ? 1 : 0, value, kUnits[unit]);
  return text.data();
}

std::string span_text(std::int64_t seconds) {
  constexpr std::int64_t kMinute = 60;
  constexpr std::int64_t kHour = 60 * kMinute;
  constexpr std::int64_t kDay = 24 * kHour;
  const auto text = [](std::int64_t number, const char* unit) {
    return grouped_text(number) + " " + unit;
  };
  if (seconds < kMinute) return text(seconds, "s");
  if (seconds < kHour) return text(seconds / kMinute, "min");
  if (seconds < kDay) {
    return text(seconds / kHour, "h") + " " + text(seconds % kHour / kMinute, "min");
  }
  return text(seconds / kDay, "d") + " " + text(seconds % kDay / kHour, "h");
}

}  // namespace mediidx::tool
