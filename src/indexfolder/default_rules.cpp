// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The default entries: the shares photo, music and video.
#include <strings.h>
#include <sys/stat.h>
#include <tavosdk.h>
#include <unistd.h>

#include <array>
#include <string>

#include "indexfolder/entry.h"
#include "mediidx/index_folder.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/root.h"
#include "support/share.h"

namespace mediidx {
namespace {

constexpr int kNoVolumeRoot = 201;

struct DefaultShare {
  const char* kind;  ///< Also the share's usual name.
  const char* link;  ///< The service link that leads to it.
};

constexpr std::array kDefaultShares{
    DefaultShare{"photo", kPhotoLinkPath},
    DefaultShare{"music", kMusicLinkPath},
    DefaultShare{"video", kVideoLinkPath},
};

/// Null for another kind. Kinds are compared without regard to case.
const DefaultShare* find_default_share(const char* kind) {
  for (const auto& share : kDefaultShares) {
    if (kind && strcasecmp(kind, share.kind) == 0) return &share;
  }
  return nullptr;
}

/// The entry of one kind's default folder. Default entries do not say that they are.
Json::Value kind_rule(const std::string& kind, const std::string& path) {
  return createRule(kind, path, kind == "photo", kind == "music", kind == "video", false);
}

std::string default_share_path(const char* kind) {
  const auto* share = find_default_share(kind);
  if (!share) return {};
  std::array<char, 4096> target{};
  if (readlink(below_root(share->link).c_str(), target.data(), target.size() - 1) < 0) return {};
  std::array<char, 4096> root{};
  if (TAVOShareBinPathGet(target.data(), root.data(), static_cast<int>(root.size())) < 0) {
    kIndexFolderActionLog.colon(kNoVolumeRoot, "Fail to get share bin path from [%s]",
                                target.data());
    return {};
  }
  const std::string path = target.data();
  const auto behind_root = path.find('/', std::string(root.data()).size());
  return behind_root == std::string::npos ? std::string() : path.substr(behind_root);
}

Json::Value default_share_rule(const char* kind, bool use_fallback) {
  const auto* share = find_default_share(kind);
  if (!share) return {};
  auto path = default_share_path(kind);
  if (path.empty() && !use_fallback) return {};
  if (path.empty()) path = std::string("/") + kind;
  return kind_rule(share->kind, path);
}

int write_default_conf() {
  Json::Value conf(Json::arrayValue);
  // Path and type stay from one share to the next: a share that is missing is judged by what was
  // found before it.
  std::string folder;
  struct stat status{};
  for (const auto& [kind, link] : kDefaultShares) {
    const auto share = find_share(kind);
    if (share) folder = appendPath(share->path, kind);
    struct stat found;
    const bool exists = stat(folder.c_str(), &found) == 0;
    if (exists) status = found;
    if (!exists && S_ISDIR(status.st_mode)) continue;
    conf.append(kind_rule(kind, std::string("/") + kind));
  }
  return IndexFolderConfSave(conf);
}

/// Gives the flags of a stored default entry to the default entries of the same folder.
void apply_to_defaults(Json::Value& shown, const Json::Value& stored) {
  for (auto& entry : shown) {
    if (!entry_flag(entry, "default") || entry["path"] != stored["path"]) continue;
    for (const char* flag : {"photo", "music", "video"}) entry[flag] = stored[flag];
  }
}

Json::Value load_for_editor() {
  Json::Value shown(Json::arrayValue);
  for (const auto& share : kDefaultShares) {
    auto rule = createDefaultShareRule(share.kind, 0);
    if (rule.isMember("path")) shown.append(std::move(rule));
  }
  for (const auto& stored : IndexFolderConfOpen()) {
    if (!is_usable_entry(stored)) continue;
    if (entry_flag(stored, "default")) {
      apply_to_defaults(shown, stored);
    } else {
      shown.append(stored);
    }
  }
  return shown;
}

}  // namespace
}  // namespace mediidx

using mediidx::kIndexFolderActionLog;
using mediidx::no_throw;

Json::Value createRule(std::string name, std::string path, bool photo, bool music, bool video,
                       bool isDefault) {
  Json::Value rule(Json::objectValue);
  rule["name"] = name;
  rule["path"] = path;
  rule["photo"] = photo;
  rule["music"] = music;
  rule["video"] = video;
  rule["default"] = isDefault;
  return rule;
}

std::string getDefaultSharePath(const char* kind) {
  return no_throw(kIndexFolderActionLog, std::string(),
                  [&] { return mediidx::default_share_path(kind); });
}

Json::Value createDefaultShareRule(const char* kind, int useFallback) {
  return no_throw(kIndexFolderActionLog, Json::Value(),
                  [&] { return mediidx::default_share_rule(kind, useFallback != 0); });
}

int WriteDefaultConf() { return no_throw(kIndexFolderActionLog, -1, mediidx::write_default_conf); }

Json::Value IndexFolderConfLoad() {
  return no_throw(kIndexFolderActionLog, Json::Value(Json::arrayValue), mediidx::load_for_editor);
}
