// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/known_folders.h"

#include <json/reader.h>
#include <json/value.h>
#include <json/writer.h>
#include <tavosdk.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <memory>
#include <stdexcept>

#include "mediidx/index_folder.h"
#include "mediidx/record.h"
#include "scan/share_names.h"
#include "text/utf8.h"

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

/// Replaces the file as a whole.
void write_share_file(const fs::path& file, const Json::Value& top) {
  Json::StreamWriterBuilder builder;
  builder["indentation"] = "  ";
  builder["emitUTF8"] = true;
  const fs::path fresh = file.string() + "." + std::to_string(getpid());
  std::ofstream out(fresh, std::ios::binary | std::ios::trunc);
  out << Json::writeString(builder, top) << "\n";
  out.close();
  if (!out) throw std::runtime_error("the share file cannot be written: " + file.string());
  fs::rename(fresh, file);
}

/// The settings of one command: read, changed, and written where they changed.
class Settings {
 public:
  explicit Settings(const fs::path& root)
      : share_file_(root / kShareFile),
        top_(read_share_file(share_file_)),
        shares_(shares_of(top_)),
        entries_(IndexFolderConfOpen()) {
    if (!entries_.isArray()) {
      throw std::runtime_error("the index-folder configuration below " + root.string() +
                               " is not a list");
    }
  }

  void add(const std::string& folder) { add_entry(folder, share_path(folder)); }

  void save() const {
    if (shares_changed_) write_share_file(share_file_, top_);
    if (entries_changed_ && IndexFolderConfSave(entries_) != 0) {
      throw std::runtime_error("the index-folder configuration cannot be written");
    }
  }

 private:
  std::string share_path(const std::string& folder) {
    if (const auto known = path_in_share(shares_, folder)) return *known;
    const auto name = name_for_share(shares_, folder);
    shares_[name] = folder;
    top_[name]["path"] = folder;
    top_[name]["status"] = static_cast<unsigned>(TAVOSHARE_STATUS_INDEXED);
    shares_changed_ = true;
    return "/" + name;
  }

  void add_entry(const std::string& folder, const std::string& path) {
    for (auto& entry : entries_) {
      if (!entry.isObject() || entry["path"] != path) continue;
      for (const char* kind : {"photo", "music", "video"}) {
        if (entry[kind] == true) continue;
        entry[kind] = true;
        entries_changed_ = true;
      }
      return;
    }
    entries_.append(createRule(fs::path(folder).filename(), path, true, true, true, false));
    entries_changed_ = true;
  }

  fs::path share_file_;
  Json::Value top_;
  Shares shares_;
  Json::Value entries_;
  bool shares_changed_ = false;
  bool entries_changed_ = false;
};

}  // namespace

std::string real_folder(const std::string& named) {
  const auto shown = escape_for_display(named);
  const std::unique_ptr<char, decltype(&std::free)> real(realpath(named.c_str(), nullptr),
                                                         std::free);
  if (!real) throw std::runtime_error(shown + ": " + std::strerror(errno));
  const std::string folder = real.get();
  if (!fs::is_directory(folder)) throw std::runtime_error(shown + ": not a folder");
  if (folder == "/") throw std::runtime_error("/: the whole system cannot be indexed");
  if (!is_utf8(folder)) throw std::runtime_error(shown + ": its name is not valid UTF-8");
  if (folder.size() >= MEDIIDX_PATH_SIZE) {
    throw std::runtime_error(shown + ": its name is too long");
  }
  if (IndexIsPathRemoteMount(folder.c_str()) > 0) {
    throw std::runtime_error(shown + ": on a network mount, which is never indexed");
  }
  return folder;
}

void make_known(const DataFolder& data, const std::vector<std::string>& folders) {
  FileLock lock(data.path() / "lock");
  lock.own();
  Settings settings(data.root());
  for (const auto& folder : folders) settings.add(folder);
  settings.save();
  IndexFolderUpdate();
}

}  // namespace mediidx::tool
