// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/known_folders.h"

#include <json/reader.h>
#include <json/value.h>
#include <tavosdk.h>

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <memory>
#include <stdexcept>

#include "mediidx/index_folder.h"
#include "mediidx/record.h"
#include "scan/share_file.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

/// The settings of one command: read, changed, and written where they changed.
class Settings {
 public:
  explicit Settings(const fs::path& root) : share_file_(root), entries_(IndexFolderConfOpen()) {}

  void add(const std::string& folder) { add_entry(folder, share_file_.path_of(folder)); }

  void save() {
    share_file_.save();
    if (entries_changed_ && IndexFolderConfSave(entries_) != 0) {
      throw std::runtime_error("the index-folder configuration cannot be written");
    }
  }

 private:
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

  ShareFile share_file_;
  Json::Value entries_;
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

void check_configuration(const fs::path& root) {
  const auto file = root / "usr/tavo/etc/index_folder.conf";
  std::error_code ignored;
  if (!fs::exists(file, ignored) || fs::is_empty(file, ignored)) return;
  std::ifstream in(file, std::ios::binary);
  Json::Value top;
  std::string errors;
  if (Json::parseFromStream(Json::CharReaderBuilder(), in, &top, &errors) && top.isArray()) return;
  throw std::runtime_error("the index-folder configuration is not a list: repair or remove " +
                           escape_for_display(file.string()));
}

void make_known(const DataFolder& data, const std::vector<std::string>& folders) {
  FileLock lock(data.path() / "lock");
  lock.own();
  check_configuration(data.root());
  Settings settings(data.root());
  for (const auto& folder : folders) settings.add(folder);
  settings.save();
  IndexFolderUpdate();
}

}  // namespace mediidx::tool
