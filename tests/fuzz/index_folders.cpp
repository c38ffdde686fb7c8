// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// A path, and the configuration as a file. The answers about the path have to be those that a plain
// look at the entries of the in-memory copy gives.
#include <strings.h>
#include <tavocore.h>
#include <tavosdk.h>

#include <array>
#include <memory>
#include <vector>

#include "fuzz.h"
#include "mediidx/index_folder.h"
#include "mediidx/index_folder_action.h"
#include "mediidx/root.h"
#include "scratch.h"
#include "utf8.h"

// The share "s", whose folder exists, others whose names begin so, and nothing that could be
// started or signalled.
extern "C" {
TAVOSDK_EXPORT int TAVOShareGet(const char* name, TAVOSHARE** share) {
  if (*name != 's') return -1;
  auto found = std::make_unique<TAVOSHARE>();
  std::snprintf(found->name, sizeof found->name, "%s", name);
  if (name[1]) {
    std::snprintf(found->path, sizeof found->path, "/volume1/%.100s", name);
  } else {
    std::strcpy(found->path, "/usr");
  }
  *share = found.release();
  return 0;
}
TAVOSDK_EXPORT void TAVOShareFree(TAVOSHARE* share) { delete share; }
TAVOSDK_EXPORT int ShareIndexStatusClear(const char*) { return -1; }
TAVOCORE_EXPORT int TLIBCExec(const char*, const char*, const char*, const char*, const char*) {
  return 0;
}
TAVOCORE_EXPORT int TLIBCProcSignalByPidFile(const char*, int) { return -1; }
}

namespace {

using namespace mediidx;

constexpr const char* kFile = "usr/tavo/etc/index_folder.conf";

struct Entry {
  std::string path;
  std::array<bool, 3> flags;  ///< By media kind.
};

std::vector<Entry> entries() {
  std::vector<Entry> found;
  for (unsigned i = 0; i < static_cast<unsigned>(IndexFolderSizeGet()); ++i) {
    std::vector<char> path(std::size_t{1} << 16, 'x');
    fuzz::check(IndexFolderPathAt(i, path.data(), static_cast<int>(path.size())) == 1);
    Entry entry{path.data(), {}};
    for (int kind = 0; kind < 3; ++kind) {
      const int flag = IndexFolderIsIndexTypeAt(i, kind);
      fuzz::check(flag == 0 || flag == 1);
      entry.flags[static_cast<std::size_t>(kind)] = flag == 1;
    }
    found.push_back(entry);
  }
  fuzz::check(IndexFolderPathAt(static_cast<unsigned>(found.size()), nullptr, 0) == -1);
  return found;
}

std::string with_slash(std::string path) { return path.ends_with('/') ? path : path + "/"; }

void check_answers(const std::vector<Entry>& all, const std::string& path) {
  const Entry* deepest = nullptr;
  int position = -1;
  bool has_parent = false;
  bool is_covered = false;
  for (const auto& entry : all) {
    const auto folder = with_slash(entry.path);
    const bool holds = path.starts_with(folder);
    if (!deepest && (entry.path == path || holds)) deepest = &entry;
    if (position < 0 && entry.path == path) position = static_cast<int>(&entry - all.data());
    has_parent |= holds && entry.path.size() < path.size();
    is_covered |=
        strcasecmp(entry.path.c_str(), path.c_str()) == 0 ||
        strncasecmp(entry.path.c_str(), with_slash(path).c_str(), with_slash(path).size()) == 0;
  }
  const auto flag = [&](std::size_t kind) { return deepest && deepest->flags[kind] ? 1 : 0; };
  for (const auto& [kind, expected] :
       {std::array{0, flag(0)}, std::array{1, flag(1)}, std::array{2, flag(2)},
        std::array{3, flag(0)}, std::array{4, -1}, std::array{5, -1}, std::array{-1, 0},
        std::array{6, 0}}) {
    fuzz::check(IndexFolderIsPathIndexed(path.c_str(), kind) == (all.empty() ? -1 : expected));
  }
  fuzz::check(IndexFolderIsFolderIndexed(path.c_str()) == (deepest ? 1 : -1));
  fuzz::check(IndexFolderIsFolderHasParent(path.c_str()) == (has_parent ? 1 : -1));
  fuzz::check(IndexFolderPositionGet(path.c_str()) == position);
  if (path.empty()) return;
  fuzz::check(IndexFolderIsCoveredByShare(path.c_str()) == (is_covered ? 1 : -1));
}

std::vector<std::string> paths(const std::vector<Entry>& all) {
  std::vector<std::string> found;
  for (const auto& entry : all) found.push_back(entry.path);
  return found;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static test::ScratchRoot root;
  fuzz::Input input(data, size);
  const auto path = input.text();
  root.write(kFile, input.rest());
  fuzz::check(IndexFolderInit() == 0);
  const auto all = entries();
  fuzz::check(std::ranges::is_sorted(all, std::greater(),
                                     [](const Entry& entry) { return entry.path.size(); }));
  check_answers(all, path);
  for (std::size_t i = 0; i < all.size() && i < 3; ++i) {
    check_answers(all, all[i].path);
    check_answers(all, all[i].path + "/" + path);
  }

  const auto conf = IndexFolderConfOpen();
  fuzz::check(conf.isArray());
  const Json::Value* found = nullptr;
  const int result = FindIndexFolderByPath(conf, path.c_str(), &found);
  fuzz::check((result == 1) == (found != nullptr));
  printIndexFolderConf();
  fuzz::check(IndexFolderConfLoad().isArray());
  std::array<char, 16> share;
  fuzz::check(IndexFolderShareNameGet(path.c_str(), share.data(), share.size()) ==
              (path.empty() ? -1 : 1));

  // What is written reads as what it was, but for texts that JSON does not have.
  const bool is_text = platform::is_utf8(input.rest());
  fuzz::check(IndexFolderConfSave(conf) == 0);
  IndexFolderConfLock();
  IndexFolderUpdate();
  IndexFolderConfUnLock();
  fuzz::check(!is_text || paths(entries()) == paths(all));
  if (is_text && !all.empty() &&
      !all[0].path.starts_with("/usr")) {  // A folder that is there stays.
    fuzz::check(IndexFolderConfDelFolder(all[0].path.c_str()) == 0);
    IndexFolderUpdate();
    fuzz::check(entries().size() < all.size());
  }
  IndexFolderAction().onApply(conf, IndexFolderConfOpen());
  IndexFolderFree();
  fuzz::check(IndexFolderSizeGet() == 0);
  return 0;
}
