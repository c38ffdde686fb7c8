// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "index_folder_test.h"

#include <dlfcn.h>
#include <tavocore.h>
#include <tavosdk.h>

#include <regex>

namespace mediidx::test {
namespace {

std::vector<std::string>& signals() {
  static std::vector<std::string> asked;
  return asked;
}

int g_lookups = 0;
int g_held = 0;

}  // namespace

int share_lookups() { return g_lookups; }

std::vector<std::string> log_lines() {
  static const std::regex number(R"(^(mediidx\w*:)\d+)");
  std::vector<std::string> lines;
  for (const auto& line : logged()) lines.push_back(std::regex_replace(line.text, number, "$1N"));
  return lines;
}

const std::vector<std::string>& asked_signals() { return signals(); }

Json::Value entry(const std::string& path, bool photo, bool music, bool video) {
  return createRule("entry", path, photo, music, video, false);
}

Json::Value list(const std::vector<Json::Value>& entries) {
  Json::Value all(Json::arrayValue);
  for (const auto& one : entries) all.append(one);
  return all;
}

std::string text_of_folders(int count) {
  std::string text = "[";
  for (int i = 0; i < count; ++i) {
    text += (i == 0 ? "" : ",\n") + (R"({"name": "one folder among many others", "path": "/p/)" +
                                     std::to_string(i) + R"(", "photo": true, "music": false})");
  }
  return text + "]\n";
}

std::vector<std::string> paths_of(const Json::Value& conf) {
  std::vector<std::string> paths;
  for (const auto& one : conf) paths.push_back(one["path"].asString());
  return paths;
}

IndexFolderTest::IndexFolderTest() {
  gIndexFolderConf = Json::Value(Json::arrayValue);
  gIsBlockUpdate = gIsDirty = 0;
  clear_log();
  signals().clear();
  g_lookups = g_held = 0;
}

IndexFolderTest::~IndexFolderTest() {
  EXPECT_EQ(g_held, 0) << "shares that are not freed";
  gIndexFolderConf = Json::Value(Json::arrayValue);
  gIsBlockUpdate = gIsDirty = 0;
}

std::string IndexFolderTest::add_share(const std::string& name) {
  auto folder = root.at("volume1/" + name);
  root.add_share(name, folder);
  return folder;
}

void IndexFolderTest::load(const std::string& text) {
  root.set_index_folders(text);
  IndexFolderInit();
}

void IndexFolderTest::load(const std::vector<Json::Value>& entries) {
  load(list(entries).toStyledString());
}

}  // namespace mediidx::test

// Stands before the platform's own: nothing that runs on this machine is signalled.
extern "C" TAVOCORE_EXPORT int TLIBCProcSignalByPidFile(const char* file, int signal) {
  std::string path = file;
  const std::string root = TAVOPlatformRootGet();
  if (path.starts_with(root)) path.erase(0, root.size());
  mediidx::test::signals().push_back(path + " " + std::to_string(signal));
  return -1;
}

// These count, and hand on to the platform's own.
extern "C" TAVOSDK_EXPORT int TAVOShareGet(const char* name, TAVOSHARE** share) {
  static const auto own =
      reinterpret_cast<decltype(&TAVOShareGet)>(dlsym(RTLD_NEXT, "TAVOShareGet"));
  ++mediidx::test::g_lookups;
  const int result = own(name, share);
  if (result == 0) ++mediidx::test::g_held;
  return result;
}

extern "C" TAVOSDK_EXPORT void TAVOShareFree(TAVOSHARE* share) {
  static const auto own =
      reinterpret_cast<decltype(&TAVOShareFree)>(dlsym(RTLD_NEXT, "TAVOShareFree"));
  if (share) --mediidx::test::g_held;
  own(share);
}
