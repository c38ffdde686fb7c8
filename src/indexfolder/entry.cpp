// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "indexfolder/entry.h"

#include <array>

#include "mediidx/index_folder.h"
#include "support/share.h"

namespace mediidx {
namespace {

constexpr std::array<std::string_view, 4> kFlags{"photo", "music", "video", "default"};

/// Null when the entry is no object, or has no such member.
const Json::Value* find_member(const Json::Value& entry, std::string_view member) {
  if (!entry.isObject()) return nullptr;
  return entry.find(member.data(), member.data() + member.size());
}

/// What Json::Value::asBool takes without throwing.
bool reads_as_flag(const Json::Value& value) {
  return value.isNull() || value.isBool() || value.isNumeric();
}

}  // namespace

bool is_usable_entry(const Json::Value& entry) {
  const auto path = find_entry_path(entry);
  if (!path || path->empty() || path->find('\0') != path->npos) return false;
  for (const auto flag : kFlags) {
    const auto* value = find_member(entry, flag);
    if (value && !reads_as_flag(*value)) return false;
  }
  return true;
}

std::optional<std::string_view> find_entry_path(const Json::Value& entry) {
  if (!entry.isObject()) return std::nullopt;
  const auto* path = find_member(entry, "path");
  if (!path || path->isNull()) return "";
  const char* begin = nullptr;
  const char* end = nullptr;
  if (!path->isString() || !path->getString(&begin, &end)) return std::nullopt;
  return std::string_view(begin, static_cast<std::size_t>(end - begin));
}

bool entry_flag(const Json::Value& entry, std::string_view member) {
  const auto* value = find_member(entry, member);
  return value && reads_as_flag(*value) && value->asBool();
}

std::string_view flag_of_kind(int kind) {
  switch (kind) {
    case MEDIA_TABLE_MUSIC:
      return "music";
    case MEDIA_TABLE_VIDEO:
      return "video";
    case MEDIA_TABLE_PHOTO:
      return "photo";
    default:
      return "";
  }
}

std::optional<std::string> absolute_folder(const std::string& path) {
  const auto share = find_share(getShareName(path).c_str());
  if (!share) return std::nullopt;
  return appendPath(share->path, getFolderPath(path));
}

}  // namespace mediidx
