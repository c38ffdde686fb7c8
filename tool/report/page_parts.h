// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The fixed parts of a report's page, taken into the command when it is built.
#ifndef MEDIIDX_TOOL_REPORT_PAGE_PARTS_H_
#define MEDIIDX_TOOL_REPORT_PAGE_PARTS_H_

namespace mediidx::tool {

extern const char* const kPageStyle;     ///< page/report.css
extern const char* const kPageScript;    ///< page/report.js
extern const char* const kChartLibrary;  ///< Chart.js, as the system has it.
extern const char* const kChartLicence;  ///< page/chart_licence.txt

}  // namespace mediidx::tool

#endif
