// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A report as one page of HTML that needs nothing else.
#ifndef MEDIIDX_TOOL_REPORT_PAGE_H_
#define MEDIIDX_TOOL_REPORT_PAGE_H_

#include <cstdint>
#include <string>
#include <string_view>

#include "report/report.h"

namespace mediidx::tool {

/// The whole page. All that it tells stands in its tables, as text; its script draws the charts
/// from them. `nonce` is a text that nobody can guess: the page forbids every script and style
/// without it, and everything from elsewhere.
std::string report_page(const Report& report, std::string_view nonce);

/// Thirty-two random hexadecimal digits.
std::string random_nonce();

/// True for the beginning of such a page, of any version.
bool begins_report_page(std::string_view text);
/// So much of a file tells that.
inline constexpr std::size_t kPageBeginning = 256;

/// "1,234,567"
std::string grouped_text(std::int64_t number);
/// "1.2 GB", decimal units.
std::string size_text(std::int64_t bytes);
/// "45 s", "12 min", "3 h 20 min", "4 d 2 h"
std::string span_text(std::int64_t seconds);

}  // namespace mediidx::tool

#endif
