// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain/index_answer.h"

#include <sys/stat.h>
#include <tavoindex.h>
#include <tavosdk.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <filesystem>

#include "indexfolder/entry.h"
#include "mediidx/index_folder.h"
#include "mediidx/request.h"
#include "scan/coverage.h"
#include "scan/file_walk.h"
#include "store/query.h"
#include "support/owned.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

std::string parent_of(const std::string& path) { return path.substr(0, path.rfind('/')); }

/// The position of the deepest entry that is the path or holds it; -1 when none does. An entry may
/// end with a slash, and then holds what is below it only.
int position_for(const std::string& path) {
  const int exact = IndexFolderPositionGet(path.c_str());
  if (exact >= 0) return exact;
  for (auto above = path; !above.empty();) {
    above = parent_of(above);
    for (const auto& folder : {above + "/", above}) {
      const int position = folder.empty() ? -1 : IndexFolderPositionGet(folder.c_str());
      if (position >= 0) return position;
    }
  }
  return -1;
}

std::optional<ChosenFolder> chosen_for(const std::string& path) {
  const int position = position_for(path);
  if (position < 0) return std::nullopt;
  const auto at = static_cast<unsigned>(position);
  std::array<char, MEDIIDX_PATH_SIZE> folder;
  IndexFolderPathAt(at, folder.data(), static_cast<int>(folder.size()));
  const auto& name = gIndexFolderConf[at]["name"];
  ChosenFolder out;
  out.folder = folder.data();
  while (out.folder.size() > 1 && out.folder.ends_with('/')) out.folder.pop_back();
  if (name.isString()) out.name = name.asString();
  out.music = IndexFolderIsIndexTypeAt(at, MEDIA_TABLE_MUSIC) == 1;
  out.photo = IndexFolderIsIndexTypeAt(at, MEDIA_TABLE_PHOTO) == 1;
  out.video = IndexFolderIsIndexTypeAt(at, MEDIA_TABLE_VIDEO) == 1;
  return out;
}

bool is_there(const std::string& folder) {
  std::error_code ignored;
  return fs::is_directory(folder, ignored);
}

OwnedHomeCheck home_of(const std::string& path) {
  OwnedHomeCheck home;
  TAVOServiceHomePathCheck(path.c_str(), 1, 1, out(home));
  return home;
}

/// The home as the library compares it, with a slash at its end.
std::string real_home(const TAVOHOMECHECK& home) {
  std::error_code error;
  const auto real = fs::canonical(home.home, error);
  return (error ? std::string(home.home) : real.string()) + "/";
}

/// The entry without a share whose folder this path may be in: shares lie anywhere, but a folder is
/// mostly called as its share is.
std::string lost_entry_for(const std::string& path) {
  for (const auto& entry : entries_without_share()) {
    if ((path + "/").find(entry + "/") != std::string::npos) return entry;
  }
  return {};
}

/// The first name below `base` that is passed over; empty when there is none.
std::string passed_over_name(const std::string& path, const std::string& base) {
  if (path.size() <= base.size() || !path.starts_with(base)) return {};
  for (const auto& part : fs::path(path.substr(base.size())).relative_path()) {
    if (is_passed_over(part.string())) return part.string();
  }
  return {};
}

/// Why the library said no.
void explain_no(IndexAnswer& out) {
  if (IndexIsPathRemoteMount(out.path.c_str()) > 0) {
    out.reason = Reason::kRemoteMount;
  } else if (out.chosen) {
    out.reason = Reason::kKindOff;
  } else if (const auto lost = lost_entry_for(out.path); !lost.empty()) {
    out.reason = Reason::kShareGone;
    out.subject = lost;
  } else {
    out.reason = IndexFolderSizeGet() == 0 ? Reason::kNoFolders : Reason::kOutside;
  }
}

/// Why the library said yes; what the scan walks from.
std::string explain_yes(IndexAnswer& out, const TAVOHOMECHECK* home) {
  const auto home_folder = home ? real_home(*home) : std::string();
  if (home && TAVOMediaIndexIsUnderPersonalLibPath(home_folder.c_str(), out.path.c_str()) == 1) {
    out.reason = Reason::kPersonalLibrary;
    return out.chosen ? out.chosen->folder : home_folder;
  }
  out.reason = Reason::kIndexFolder;
  return out.chosen ? out.chosen->folder : std::string();
}

/// What keeps a file that is there from being indexed.
void check_file(IndexAnswer& out, const struct stat& status) {
  if (!S_ISREG(status.st_mode)) {
    out.reason = Reason::kNoFile;
  } else if (status.st_size == 0) {
    out.reason = Reason::kEmptyFile;
  } else if (access(out.path.c_str(), R_OK) != 0) {
    out.reason = Reason::kUnreadable;
    out.subject = std::strerror(errno);
  }
}

/// The path without links; empty when it has none or cannot be resolved.
std::string other_name(const std::string& path) {
  std::error_code error;
  const auto real = fs::canonical(path, error).string();
  return error || real == path ? std::string() : real;
}

/// Indexed under its own name, when the walk meets it there.
bool is_found_elsewhere(const std::string& real, MEDIA_TABLE_TYPE type) {
  const auto chosen = chosen_for(real);
  return is_utf8(real) && chosen && passed_over_name(real, chosen->folder).empty() &&
         TAVOMediaIndexIsIndexPath(real.c_str(), type) > 0;
}

bool is_ignored_by_scan(const IndexAnswer& answer) {
  return std::ranges::any_of(outermost_index_folders(), [&answer](const auto& root) {
    return is_ignored(root, answer.path, answer.is_folder);
  });
}

/// What the scan knows beyond the library.
void check_scan(IndexAnswer& out, const DataFolder& data, const std::string& base,
                MEDIA_TABLE_TYPE type) {
  struct stat status{};
  if (IsEqualOrSubPath(out.path, data.path().string())) {
    out.reason = Reason::kOwnData;
  } else if (const auto name = passed_over_name(out.path, base); !name.empty()) {
    out.reason = Reason::kPassedOver;
    out.subject = name;
  } else if (is_ignored_by_scan(out)) {
    out.reason = Reason::kIgnored;
  } else if (stat(out.path.c_str(), &status) != 0) {
    if (errno == ENOENT || errno == ENOTDIR) return;
    out.reason = Reason::kUnreadable;
    out.subject = std::strerror(errno);
  } else if (const auto real = other_name(out.path);
             !real.empty() && is_found_elsewhere(real, type)) {
    out.reason = Reason::kOtherName;
    out.subject = real;
  } else if (!out.is_folder) {
    check_file(out, status);
  }
}

/// True when the path cannot be stored, whatever it is.
bool is_unstorable(IndexAnswer& out) {
  if (!is_utf8(out.path)) {
    out.reason = Reason::kNotUtf8;
  } else if (out.path.size() >= MEDIIDX_PATH_SIZE) {
    out.reason = Reason::kTooLong;
  } else {
    return false;
  }
  return true;
}

}  // namespace

const char* name_of(Reason reason) {
  static constexpr std::array kNames{
      "index_folder", "personal_library", "not_utf8",   "too_long",   "unknown_extension",
      "remote_mount", "kind_off",         "share_gone", "no_folders", "outside",
      "own_data",     "passed_over",      "ignored",    "unreadable", "no_file",
      "empty_file",   "other_name",
  };
  static_assert(kNames.size() == static_cast<std::size_t>(Reason::kOtherName) + 1);
  return kNames.at(static_cast<std::size_t>(reason));
}

std::vector<std::string> entries_without_share() {
  std::vector<std::string> out;
  for (const auto& entry : IndexFolderConfOpen()) {
    if (!is_usable_entry(entry)) continue;
    const auto path = entry["path"].asString();
    if (!absolute_folder(path)) out.push_back(path);
  }
  return out;
}

IndexAnswer answer_for(const DataFolder& data, const std::string& named) {
  if (named.empty()) throw std::runtime_error("an empty path names nothing");
  IndexAnswer out;
  std::error_code ignored;
  const bool names_folder = named.ends_with('/');
  out.path = fs::absolute(named).lexically_normal().string();
  while (out.path.size() > 1 && out.path.ends_with('/')) out.path.pop_back();
  out.exists = fs::exists(fs::symlink_status(out.path, ignored));
  out.is_folder = is_there(out.path) || (!out.exists && names_folder);
  if (!out.is_folder) out.kind = kind_of(out.path);
  if (is_unstorable(out)) return out;
  out.chosen = chosen_for(out.path);
  out.is_chosen_there = !out.chosen || is_there(out.chosen->folder);
  const auto home = home_of(out.path);
  if (home) out.user = home->user;
  if (!out.is_folder && !out.kind) {
    const char* extension = TAVOIndexExtGet(out.path.c_str());
    out.reason = Reason::kUnknownExtension;
    out.subject = extension ? extension : "";
    return out;
  }
  const auto type = out.is_folder ? MEDIA_TABLE_TYPE{MEDIA_TABLE_DIRECTORY} : table_of(*out.kind);
  out.library = TAVOMediaIndexIsIndexPath(out.path.c_str(), type);
  if (*out.library > 0) {
    const auto base = explain_yes(out, home.get());
    check_scan(out, data, base, type);
  } else {
    explain_no(out);
  }
  return out;
}

}  // namespace mediidx::tool
