// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "media_test.h"

#include <cstdlib>
#include <regex>

namespace mediidx::test {

namespace fs = std::filesystem;

Info record(std::string_view path) {
  Info info{};
  set(info.path, path);
  return info;
}

DIR_INFO_REC folder(std::string_view path) {
  DIR_INFO_REC dir{};
  set(dir.path, path);
  return dir;
}

std::vector<std::string> log_lines() {
  static const std::regex number(R"(^(mediidx\w*(?::| ?\())\d+)");
  std::vector<std::string> lines;
  for (const auto& line : logged()) lines.push_back(std::regex_replace(line.text, number, "$1N"));
  return lines;
}

std::string last_log_line() {
  const auto lines = log_lines();
  return lines.empty() ? "" : lines.back();
}

std::string last_statement() {
  const auto& statements = sent_statements();
  return statements.empty() ? "" : statements.back();
}

std::string parens(const std::string& message) { return "mediidx_database (N) " + message; }
std::string colon(const std::string& message) { return "mediidx_database:N " + message; }

std::string failed_statement(const std::string& sql) {
  return parens("Failed to exec [" + sql + "] (" + TAVODBErrorGet(gpDBConnect) + ")");
}

MediaTest::MediaTest() { root.make_folder("tmp"); }

void MediaTest::take_away(const std::string& table) {
  rows("ALTER TABLE " + table + " RENAME TO " + table + "_away");
}

void MediaTest::unmark() const { fs::remove(root.at("tmp/tavoindexdaapd_checkin")); }

std::string MediaTest::shared(const std::string& name) {
  if (!has_share_) root.index_everything("media", root.at("volume1/media"));
  has_share_ = true;
  return root.at("volume1/media/" + name);
}

std::string MediaTest::personal(const std::string& name) {
  if (!has_user_) root.add_user("ann", 1026, root.at("homes/ann"));
  has_user_ = true;
  return root.at("homes/ann/music/" + name);
}

NoServer::NoServer() : host_(std::getenv("PGHOST")) {
  MediaDBConnClose();
  setenv("PGHOST", empty_.path().c_str(), 1);
}

NoServer::~NoServer() { setenv("PGHOST", host_.c_str(), 1); }

Handle open(MEDIA_TABLE_TYPE type, const char* columns, const char* where, const char* group_by,
            const char* order_by, uint32_t range_a, uint32_t range_b, int escape_where) {
  return {
      MediaInfoDBOpenEx(type, columns, where, group_by, order_by, range_a, range_b, escape_where),
      MediaInfoDBClose};
}

std::vector<std::string> paths(MEDIA_DB_HANDLE* handle) {
  std::vector<std::string> all;
  while (const char* path = PlaylistDBGet(handle)) all.emplace_back(path);
  return all;
}

}  // namespace mediidx::test
