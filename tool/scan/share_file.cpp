// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/share_file.h"

#include <json/reader.h>
#include <json/writer.h>
#include <tavosdk.h>
#include <unistd.h>

#include <fstream>
#include <stdexcept>

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

constexpr const char* kShareFile = "usr/tavo/etc/share.conf";

/// The share file's object; an empty one when there is no file.
Json::Value read_share_file(const fs::path& file) {
  if (!fs::exists(file)) return {Json::objectValue};
  std::ifstream in(file, std::ios::binary);
  Json::Value top;
  std::string errors;
  if (!Json::parseFromStream(Json::CharReaderBuilder(), in, &top, &errors) || !top.isObject()) {
    throw std::runtime_error("the share file cannot be understood: " + file.string());
  }
  return top;
}

Shares shares_of(const Json::Value& top) {
  Shares shares;
  for (const auto& name : top.getMemberNames()) {
    const auto& share = top[name];
    if (!share.isObject() || !share["path"].isString()) continue;
    auto folder = share["path"].asString();
    while (folder.size() > 1 && folder.ends_with('/')) folder.pop_back();
    shares[name] = folder;
  }
  return shares;
}

}  // namespace

ShareFile::ShareFile(const fs::path& root)
    : file_(root / kShareFile), top_(read_share_file(file_)), shares_(shares_of(top_)) {}

bool ShareFile::is_indexed(const std::string& name) const {
  if (!shares_.contains(name)) return false;
  const auto& status = top_[name]["status"];
  return status.isUInt() && (status.asUInt() & TAVOSHARE_STATUS_INDEXED) != 0;
}

void ShareFile::add(const std::string& name, const std::string& folder, bool indexed) {
  shares_[name] = folder;
  top_[name]["path"] = folder;
  top_[name]["status"] = indexed ? static_cast<unsigned>(TAVOSHARE_STATUS_INDEXED) : 0U;
  is_changed_ = true;
}

void ShareFile::remove(const std::string& name) {
  shares_.erase(name);
  top_.removeMember(name);
  is_changed_ = true;
}

std::string ShareFile::path_of(const std::string& folder) {
  if (const auto known = path_in_share(shares_, folder)) return *known;
  const auto name = name_for_share(shares_, folder);
  add(name, folder, true);
  return "/" + name;
}

void ShareFile::save() {
  if (!is_changed_) return;
  Json::StreamWriterBuilder builder;
  builder["indentation"] = "  ";
  builder["emitUTF8"] = true;
  const fs::path fresh = file_.string() + "." + std::to_string(getpid());
  std::ofstream out(fresh, std::ios::binary | std::ios::trunc);
  out << Json::writeString(builder, top_) << "\n";
  out.close();
  if (!out) throw std::runtime_error("the share file cannot be written: " + file_.string());
  fs::rename(fresh, file_);
  is_changed_ = false;
}

}  // namespace mediidx::tool
