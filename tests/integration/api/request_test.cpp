// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "request_test.h"

#include <dlfcn.h>
#include <tavosdk.h>

#include <regex>

#include "mediidx/index_folder.h"

namespace mediidx::test {

PlatformAnswers& platform_answers() {
  static PlatformAnswers answers;
  return answers;
}

Info record(std::string_view path) {
  Info info{};
  info.path[path.copy(info.path, sizeof info.path - 1)] = '\0';
  return info;
}

DIR_INFO_REC folder_record(std::string_view path) {
  DIR_INFO_REC folder{};
  folder.path[path.copy(folder.path, sizeof folder.path - 1)] = '\0';
  return folder;
}

Json::Value json_record(const std::string& path) {
  Json::Value json(Json::objectValue);
  json["szPath"] = path;
  return json;
}

std::vector<std::string> log_lines() {
  static const std::regex number(R"(^(mediidx\w*(?::| ?\())\d+)");
  std::vector<std::string> lines;
  for (const auto& line : logged()) lines.push_back(std::regex_replace(line.text, number, "$1N"));
  return lines;
}

RequestTest::RequestTest() {
  platform_answers() = {};
  root.make_folder("tmp");
  root.make_folder("volume1/other");
  root.add_user("ann", 1026, root.at("homes/ann"));
  root.index_everything("media", root.at("volume1/media"));
  clear_log();
}

RequestTest::~RequestTest() { platform_answers() = {}; }

void RequestTest::take_away(const std::string& table) {
  rows("ALTER TABLE " + table + " RENAME TO " + table + "_away");
}

std::vector<std::string> RequestTest::paths(const std::string& table) {
  std::vector<std::string> all;
  for (const auto& row : rows("SELECT path FROM " + table + " ORDER BY path"))
    all.push_back(row[0]);
  return all;
}

HelperTest::HelperTest() {
  platform_answers() = {};
  root.add_user("ann", 1026, root.at("homes/ann"));
  clear_log();
}

HelperTest::~HelperTest() { platform_answers() = {}; }

}  // namespace mediidx::test

namespace {

TAVOHOMECHECK g_home;  // this program's own answer

template <class Call>
Call next_definition(const char* name) {
  return reinterpret_cast<Call>(dlsym(RTLD_NEXT, name));
}

}  // namespace

extern "C" {

TAVOSDK_EXPORT int IndexIsPathRemoteMount(const char* path) {
  static const auto call =
      next_definition<decltype(&IndexIsPathRemoteMount)>("IndexIsPathRemoteMount");
  const auto& mount = mediidx::test::platform_answers().remote_mount;
  if (!mount.empty()) return std::string_view(path).starts_with(mount) ? 1 : 0;
  return call(path);
}

TAVOSDK_EXPORT int TAVOServiceHomePathCheck(const char* path, int flag_a, int flag_b,
                                            TAVOHOMECHECK** result) {
  static const auto call =
      next_definition<decltype(&TAVOServiceHomePathCheck)>("TAVOServiceHomePathCheck");
  const auto& answers = mediidx::test::platform_answers();
  if (answers.home_check_fails) return -1;
  if (answers.home_user.empty()) return call(path, flag_a, flag_b, result);
  g_home = {};
  answers.home_user.copy(g_home.user, sizeof g_home.user - 1);
  *result = &g_home;
  return 1;
}

TAVOSDK_EXPORT void TAVOHomeCheckResultFree(TAVOHOMECHECK* result) {
  static const auto call =
      next_definition<decltype(&TAVOHomeCheckResultFree)>("TAVOHomeCheckResultFree");
  if (result != &g_home) call(result);
}
}
