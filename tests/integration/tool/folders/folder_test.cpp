// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "folder_test.h"

#include <json/reader.h>

#include <fstream>
#include <sstream>
#include <stdexcept>

namespace mediidx::test {
namespace {

Json::Value parse(std::istream& in) {
  Json::Value value;
  std::string errors;
  if (!Json::parseFromStream(Json::CharReaderBuilder(), in, &value, &errors)) {
    throw std::runtime_error(errors);
  }
  return value;
}

}  // namespace

Outcome FolderTest::run(Words words) const {
  words.insert(words.begin(), {"--data-dir", data.at("d")});
  return run_mediidx(words);
}

std::string FolderTest::output(const Words& words) const {
  const auto done = run(words);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_EQ(done.err, "");
  return done.out;
}

Json::Value FolderTest::json(Words words) const {
  words.insert(words.begin(), "--json");
  std::istringstream in(output(words));
  return parse(in);
}

Outcome FolderTest::run_program(const std::string& name, const Words& words) const {
  Setting setting;
  setting.program = data.at("d/root/usr/tavo/bin/" + name);
  return run_mediidx(words, setting);
}

void FolderTest::fill(const std::string& folder) const {
  const auto begin = folder.empty() ? "" : folder + "/";
  media.take_sample("music/Untagged/tape side A.mp3", begin + "a.mp3");
  media.take_sample("photos/2021 Harbour/IMG_0001.jpg", begin + "b.jpg");
  media.take_sample("videos/harbour.mp4", begin + "c.mp4");
}

std::vector<std::string> FolderTest::stored(const std::string& table) {
  std::vector<std::string> out;
  const auto above = media.path().string() + "/";
  for (const auto& row : rows("SELECT path FROM " + table + " ORDER BY path")) {
    const auto& path = row[0];
    out.push_back(path.starts_with(above) ? path.substr(above.size()) : path);
  }
  return out;
}

Json::Value read_json(const std::string& file) {
  std::ifstream in(file);
  return parse(in);
}

}  // namespace mediidx::test
