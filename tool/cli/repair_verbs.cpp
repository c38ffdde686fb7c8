// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Finding and mending rows that were left half written.
#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "explain/half_written.h"
#include "explain/repair.h"
#include "mediidx/index_folder.h"
#include "store/data_folder.h"
#include "store/database.h"

namespace mediidx::tool {
namespace {

/// What a person looks for: the file, the cue sheet, or the number of a track that is gone.
std::string subject_of(const HalfWritten& half) {
  if (!half.path.empty()) return half.path;
  return half.cue_sheet.empty() ? "track " + std::to_string(half.id) : half.cue_sheet;
}

Json::Value to_json(const HalfWritten& half) {
  Json::Value out;
  out["fault"] = name_of(half.fault);
  out["id"] = half.id;
  out["path"] = half.path.empty() ? Json::Value() : json_text(half.path);
  out["cue_sheet"] = half.cue_sheet.empty() ? Json::Value() : json_text(half.cue_sheet);
  out["tables"] = json_text(half.detail);
  return out;
}

const char* text_of(Mending mending) {
  switch (mending) {
    case Mending::kSavedAgain:
      return "saved again";
    case Mending::kDeleted:
      return "rows deleted: the file is gone";
    case Mending::kSideRowsDeleted:
      return "side rows deleted";
  }
  return "";
}

void print_json(const RepairReport& report) {
  Json::Value out;
  auto& mended = out["mended"] = Json::Value(Json::arrayValue);
  for (const auto& done : report.mended) {
    Json::Value object;
    object["done"] = name_of(done.mending);
    object["path"] = done.path.empty() ? Json::Value() : json_text(done.path);
    if (done.mending == Mending::kSideRowsDeleted) object["id"] = done.id;
    mended.append(object);
  }
  auto& left = out["left"] = Json::Value(Json::arrayValue);
  for (const auto& one : report.left) {
    auto object = to_json(one.half);
    object["reason"] = json_text(one.reason);
    left.append(object);
  }
  put_json(out);
}

void print(const RepairReport& report) {
  std::vector<TableRow> lines;
  for (const auto& done : report.mended) {
    lines.push_back({"mended", text_of(done.mending),
                     done.path.empty() ? "track " + std::to_string(done.id) : done.path});
  }
  for (const auto& one : report.left) {
    lines.push_back(
        {"left", std::string(text_of(one.half.fault)) + ": " + one.reason, subject_of(one.half)});
  }
  // Nothing is cut: a reason has to be read to its end.
  put(format_lines(lines));
}

}  // namespace

int run_verify(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  const auto found = find_half_written(database);
  if (arguments.has("--json")) {
    JsonList list;
    for (const auto& half : found) list.add(to_json(half));
    list.finish();
  } else if (!found.empty()) {
    std::vector<TableRow> lines;
    for (const auto& half : found) {
      lines.push_back({text_of(half.fault), half.detail, subject_of(half)});
    }
    put_table({{"Half written"}, {"Tables"}, {"Path", false, true}}, lines);
  }
  return found.empty() ? kExitDone : kExitSomeFailed;
}

int run_repair(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  IndexFolderInit();
  Database database(folder);
  const auto report = repair(folder, database, [] { return noted_signal() != 0; });
  if (arguments.has("--json")) {
    print_json(report);
  } else {
    print(report);
  }
  if (noted_signal()) return kExitSignal + noted_signal();
  return report.left.empty() ? kExitDone : kExitSomeFailed;
}

}  // namespace mediidx::tool
