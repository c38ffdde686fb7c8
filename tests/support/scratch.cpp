// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scratch.h"

#include <json/writer.h>
#include <tavocore.h>

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <stdexcept>

#include "mediidx/index_folder.h"
#include "mediidx/root.h"

namespace mediidx::test {

namespace fs = std::filesystem;

ScratchFolder::ScratchFolder() {
  std::string name = fs::temp_directory_path() / "mediidx-XXXXXX";
  if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
  path_ = fs::canonical(name);
}

ScratchFolder::~ScratchFolder() {
  std::error_code ignored;
  fs::remove_all(path_, ignored);
}

std::string ScratchFolder::at(std::string_view relative) const {
  while (relative.starts_with('/')) relative.remove_prefix(1);
  return path_.native() + "/" + std::string(relative);
}

std::string ScratchFolder::write(std::string_view relative, std::string_view content) const {
  const auto file = at(relative);
  fs::create_directories(fs::path(file).parent_path());
  std::ofstream out(file, std::ios::binary | std::ios::trunc);
  out << content;
  out.close();
  if (!out) throw std::runtime_error("cannot write " + file);
  return file;
}

std::string ScratchFolder::make_folder(std::string_view relative) const {
  const auto folder = at(relative);
  fs::create_directories(folder);
  return folder;
}

std::string ScratchFolder::make_link(std::string_view relative, const std::string& target) const {
  const auto link = at(relative);
  fs::create_directories(fs::path(link).parent_path());
  fs::create_symlink(target, link);
  return link;
}

std::string ScratchFolder::read(std::string_view relative) const {
  std::ifstream in(at(relative), std::ios::binary);
  return {std::istreambuf_iterator<char>(in), {}};
}

bool ScratchFolder::exists(std::string_view relative) const { return fs::exists(at(relative)); }

ScratchRoot::ScratchRoot() {
  TAVOMediaIndexRootSet(path().c_str());
  TAVOPlatformRootSet(path().c_str());
}

ScratchRoot::~ScratchRoot() {
  IndexFolderFree();
  TAVOMediaIndexRootSet("");
  TAVOPlatformRootSet("");
}

void ScratchRoot::add_share(const std::string& name, const std::string& folder,
                            std::uint32_t status) {
  fs::create_directories(folder);
  Json::Value share;
  share["path"] = folder;
  share["status"] = status;
  if (!shares_.empty()) shares_ += ",\n";
  shares_ += Json::valueToQuotedString(name.c_str()) + ": " + share.toStyledString();
  write("usr/tavo/etc/share.conf", "{" + shares_ + "}\n");
}

void ScratchRoot::add_user(const std::string& name, std::uint32_t uid, const std::string& home) {
  fs::create_directories(home);
  const auto id = std::to_string(uid);
  users_ += name + ":x:" + id + ":" + id + "::" + home + ":/bin/sh\n";
  write("etc/passwd", users_);
}

void ScratchRoot::set_index_folders(std::string_view json) const {
  write("usr/tavo/etc/index_folder.conf", json);
}

void ScratchRoot::index_everything(const std::string& share, const std::string& folder) {
  add_share(share, folder);
  set_index_folders(R"([{"name": "all", "path": "/)" + share +
                    R"(", "photo": true, "music": true, "video": true, "default": false}])");
  IndexFolderUpdate();
}

}  // namespace mediidx::test
