// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Shares: the named folders that index folders lie in.
#include <tavocore.h>

#include <stdexcept>

#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "folders/configured_folders.h"
#include "mediidx/index_folder.h"
#include "scan/known_folders.h"
#include "scan/share_file.h"
#include "store/settings_lock.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

/// As shares are looked up: without regard to case.
bool is_same_name(const std::string& first, const std::string& second) {
  return TLIBCUnicodeUTF8StrCaseCmp(first.c_str(), second.c_str()) == 0;
}

void check_name(const Shares& shares, const std::string& name) {
  if (name.empty() || name == "." || name == ".." || name.find('/') != name.npos ||
      !is_utf8(name) || name.size() >= sizeof(TAVOSHARE::name)) {
    throw UsageError("\"" + escape_for_display(name) + "\" is no name of a share");
  }
  for (const auto& [known, folder] : shares) {
    if (!is_same_name(known, name)) continue;
    throw std::runtime_error("there is a share " + escape_for_display(known) + " already, at " +
                             escape_for_display(folder));
  }
}

/// A share that index folders name cannot go: nobody would know any more where they lie.
void check_unused(const std::string& name) {
  for (const auto& configured : configured_folders()) {
    if (!is_same_name(getShareName(configured.entry["path"].asString()), name)) continue;
    throw std::runtime_error(configured.shown() + " lies in the share " + escape_for_display(name) +
                             " and is chosen for indexing: first mediidx folder remove");
  }
}

bool is_folder(const std::string& path) {
  std::error_code ignored;
  return std::filesystem::is_directory(path, ignored);
}

}  // namespace

int run_share_list(const Arguments& arguments) {
  const DataFolder data(arguments.value("--data-dir"));
  const ShareFile file(data.root());
  JsonList list;
  std::vector<TableRow> lines;
  for (const auto& [name, folder] : file.shares()) {
    const bool exists = is_folder(folder);
    const bool indexed = file.is_indexed(name);
    lines.push_back({name, folder, indexed ? "yes" : "no", exists ? "yes" : "away"});
    if (!arguments.has("--json")) continue;
    Json::Value object;
    object["name"] = name;
    object["path"] = json_text(folder);
    object["indexed"] = indexed;
    object["exists"] = exists;
    list.add(object);
  }
  if (arguments.has("--json")) {
    list.finish();
  } else {
    put_table({{"Share"}, {"Folder", false, true}, {"Indexed"}, {"There"}}, lines);
  }
  return kExitDone;
}

int run_share_add(const Arguments& arguments) {
  const auto folder = real_folder(arguments.operands[1]);
  const DataFolder data(arguments.value("--data-dir"));
  const SettingsLock lock(data);
  ShareFile file(data.root());
  check_name(file.shares(), arguments.operands[0]);
  IndexFolderUpdate();
  file.add(arguments.operands[0], folder, IndexFolderIsCoveredByShare(folder.c_str()) > 0);
  file.save();
  put("Added the share " + arguments.operands[0] + ": " + escape_for_display(folder) + "\n");
  return kExitDone;
}

int run_share_remove(const Arguments& arguments) {
  const auto& name = arguments.operands[0];
  const DataFolder data(arguments.value("--data-dir"));
  const SettingsLock lock(data);
  ShareFile file(data.root());
  if (!file.shares().contains(name)) {
    throw std::runtime_error("there is no share " + escape_for_display(name));
  }
  check_unused(name);
  file.remove(name);
  file.save();
  put("Removed the share " + escape_for_display(name) + "\n");
  return kExitDone;
}

}  // namespace mediidx::tool
