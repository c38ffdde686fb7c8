// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "share_file.h"

#include <json/reader.h>
#include <json/writer.h>

#include <cstring>
#include <memory>
#include <optional>
#include <sstream>
#include <string>

#include "below_root.h"
#include "border.h"
#include "replace_file.h"
#include "utf8.h"
#include "whole_file.h"

namespace mediidx::platform {

namespace {

constexpr std::string_view kShareFile = "/usr/tavo/etc/share.conf";

std::optional<Json::Value> parse_object(const std::string& text) {
  const std::unique_ptr<Json::CharReader> reader(Json::CharReaderBuilder().newCharReader());
  Json::Value top;
  try {
    if (!reader->parse(text.data(), text.data() + text.size(), &top, nullptr)) return std::nullopt;
  } catch (const Json::Exception&) {  // nested too deeply
    return std::nullopt;
  }
  if (!top.isObject()) return std::nullopt;
  return top;
}

std::optional<Json::Value> read_top() {
  const auto text = read_whole_file(below_root(kShareFile).c_str());
  return text ? parse_object(*text) : std::nullopt;
}

bool has_null(std::string_view text) { return text.find('\0') != std::string_view::npos; }

std::string_view without_trailing_slashes(std::string_view path) {
  while (path.size() > 1 && path.ends_with('/')) path.remove_suffix(1);
  return path;
}

std::optional<TAVOSHARE> to_share(const std::string& name, const Json::Value& entry) {
  if (name.empty() || has_null(name) || !entry.isObject()) return std::nullopt;
  const Json::Value& folder = entry["path"];
  const Json::Value& status = entry["status"];
  if (!folder.isString() || !(status.isUInt() || status.isNull())) return std::nullopt;
  const std::string path = folder.asString();
  if (!path.starts_with('/') || has_null(path)) return std::nullopt;
  TAVOSHARE share{};
  share.status = status.isNull() ? 0 : status.asUInt();
  const bool fits =
      copy_whole(share.name, name) && copy_whole(share.path, without_trailing_slashes(path));
  return fits ? std::optional(share) : std::nullopt;
}

std::string to_text(const Json::Value& top) {
  Json::StreamWriterBuilder builder;
  builder["indentation"] = "  ";
  builder["emitUTF8"] = true;
  return Json::writeString(builder, top) + "\n";
}

bool is_terminated(std::string_view field) { return has_null(field); }

bool is_complete(const TAVOSHARE& share) {
  return is_terminated({share.name, sizeof share.name}) && share.name[0] != '\0' &&
         is_terminated({share.path, sizeof share.path}) && share.path[0] == '/';
}

}  // namespace

std::vector<TAVOSHARE> read_shares() {
  std::vector<TAVOSHARE> shares;
  const auto top = read_top();
  if (!top) return shares;
  for (const auto& name : top->getMemberNames()) {
    if (const auto share = to_share(name, (*top)[name])) shares.push_back(*share);
  }
  return shares;
}

bool write_share(const TAVOSHARE& share) {
  if (!is_complete(share)) return failed(false, TAVO_ERR_BAD_PARAMETERS, "share_file.cpp", 1);
  auto top = read_top();
  // A file that cannot be understood is left alone.
  if (!top) return failed(false, TAVO_ERR_OPEN_FAILED, "share_file.cpp", 2);
  if (!top->isMember(share.name) || !(*top)[share.name].isObject()) {
    return failed(false, TAVO_ERR_SHARE_NOT_FOUND, "share_file.cpp", 3);
  }
  Json::Value& entry = (*top)[share.name];
  entry["path"] = share.path;
  entry["status"] = share.status;
  if (!replace_file(below_root(kShareFile), to_text(*top))) {
    return failed(false, TAVO_ERR_OPEN_FAILED, "share_file.cpp", 4);
  }
  return true;
}

}  // namespace mediidx::platform
