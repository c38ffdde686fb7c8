// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "folders/programs.h"

#include <array>
#include <filesystem>
#include <stdexcept>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/scan_run.h"
#include "cli/verbs.h"
#include "folders/configured_folders.h"
#include "mediidx/index_folder.h"
#include "mediidx/index_folder_action.h"
#include "mediidx/record.h"
#include "mediidx/request.h"
#include "scan/scan_state.h"
#include "scan/share_file.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "store/pid_file.h"
#include "store/query.h"
#include "store/settings_lock.h"
#include "support/share.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

/// <data folder>/root/usr/tavo/bin/<program>, without following the program's link.
DataFolder data_folder_of(const std::string& program) {
  const auto path = fs::absolute(program).lexically_normal();
  const auto root = path.parent_path().parent_path().parent_path().parent_path();
  const auto data = root.parent_path();
  if (program.find('/') == std::string::npos || root.filename() != "root" ||
      !fs::exists(data / ".mediidx")) {
    throw std::runtime_error(escape_for_display(program) +
                             " is not below the root of a data folder of mediidx");
  }
  return DataFolder(data.string());
}

bool is_folder(const std::string& path) {
  std::error_code ignored;
  return fs::is_directory(path, ignored);
}

/// Index folders that are this folder or lie below it.
std::vector<std::string> index_folders_below(const std::string& folder) {
  std::vector<std::string> out;
  std::array<char, MEDIIDX_PATH_SIZE> path;
  for (int i = 0; i < IndexFolderSizeGet(); ++i) {
    if (IndexFolderPathAt(static_cast<unsigned>(i), path.data(), static_cast<int>(path.size())) !=
        1) {
      continue;
    }
    if (IsEqualOrSubPath(path.data(), folder)) out.emplace_back(path.data());
  }
  return out;
}

/// The library asks for a folder of a disk that may be away: only what is there is scanned.
std::vector<std::string> folders_to_scan(const std::string& folder) {
  auto out = IndexFolderIsFolderIndexed(folder.c_str()) > 0 ? std::vector{folder}
                                                            : index_folders_below(folder);
  std::erase_if(out, [](const auto& path) { return !is_folder(path); });
  return out;
}

int add_folder(const DataFolder& data, const std::string& folder) {
  const auto folders = folders_to_scan(folder);
  if (folders.empty()) return kExitDone;
  Database database(data);
  ScanSetting setting;
  setting.options.wait = true;
  return exit_status(run_scanner(data, database, folders, setting));
}

int drop_folder(const DataFolder& data, const std::string& folder) {
  const bool exists = is_folder(folder);
  // What is still to be indexed is on a disk that will come back.
  const bool is_wanted =
      IndexFolderIsFolderIndexed(folder.c_str()) > 0 || !index_folders_below(folder).empty();
  if (!exists && is_wanted) return kExitDone;
  if (!exists && !is_configuration_whole(data.root())) {
    throw std::runtime_error(escape_for_display(folder) +
                             " is not there, and the index-folder configuration does not tell "
                             "whether it was given up: its index is kept");
  }
  Database database(data);
  ScanState(database).unsettle_below(folder);
  const int result =
      exists ? TAVOMediaIndexPreReindex(folder.c_str()) : TAVOMediaIndexDirDelete(folder.c_str());
  if (result >= 0) return kExitDone;
  throw std::runtime_error(escape_for_display(folder) +
                           " could not be taken out of the index: " + database.last_error());
}

int run_indexer(const std::string& program, const std::vector<std::string>& words) {
  if (words.size() != 4 || (words[0] != "-A" && words[0] != "-D") || words[2] != "-P" ||
      words[3] != "MediaIndex") {
    throw UsageError("tavoindex needs -A FOLDER -P MediaIndex or -D FOLDER -P MediaIndex");
  }
  const auto folder = stored_path(words[1]);
  if (folder.empty()) throw UsageError("/: the whole system is not indexed");
  const auto data = data_folder_of(program);
  reload_on_hangup();
  const ScanLock lock(data, ScanLock::IfTaken::kWait);
  const PidFile pid_file(data);
  IndexFolderUpdate();
  return words[0] == "-A" ? add_folder(data, folder) : drop_folder(data, folder);
}

bool holds_index_folder(const std::string& folder) {
  return IndexFolderIsCoveredByShare(folder.c_str()) > 0;
}

/// Marks the shares that should be marked, or takes the mark from the others.
void mark_shares(const fs::path& root, bool on) {
  const OwnedList names(TLIBCSzListAlloc(0));
  if (!names) throw std::bad_alloc();
  const ShareFile file(root);
  for (const auto& [name, folder] : file.shares()) {
    if (!find_share(name.c_str()) || holds_index_folder(folder) != on) continue;
    if (TLIBCSzListPush(names.get(), name.c_str()) < 0) throw std::bad_alloc();
  }
  SetShareIndexed(names.get(), on);
  const ShareFile now(root);
  for (int i = 0; i < TLIBCSzListCount(names.get()); ++i) {
    const std::string name = TLIBCSzListGet(names.get(), i);
    if (now.is_indexed(name) == on) continue;
    throw std::runtime_error("the share " + escape_for_display(name) + " could not be changed");
  }
}

int run_index_manager(const std::string& program, const std::vector<std::string>& words) {
  if (words != std::vector<std::string>{"--check-indexbit"}) {
    throw UsageError("tavoindex_mgr needs --check-indexbit");
  }
  const auto data = data_folder_of(program);
  const SettingsLock lock(data);
  IndexFolderUpdate();
  mark_shares(data.root(), false);
  mark_shares(data.root(), true);
  return kExitDone;
}

}  // namespace

Program program_named(const std::string& path) {
  const auto name = path.substr(path.rfind('/') + 1);
  if (name == "tavoindex") return run_indexer;
  if (name == "tavoindex_mgr") return run_index_manager;
  return nullptr;
}

}  // namespace mediidx::tool
