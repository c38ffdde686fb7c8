// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>

#include "scratch.h"
#include "tag_samples.h"
#include "text/utf8.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

std::string content_of(const fs::path& path) {
  std::ifstream file(path, std::ios::binary);
  std::ostringstream out;
  out << file.rdbuf();
  return out.str();
}

/// One sample of each format and each odd one, read after something was done to its bytes.
class ABrokenFile : public testing::Test {
 protected:
  /// Reads every sample as `damage` leaves it; the number of those that could be read.
  template <class Damage>
  int read_all(Damage damage) {
    int read = 0;
    for (const auto& entry : fs::recursive_directory_iterator(tag_sample(""))) {
      const auto kind = tool::kind_of(entry.path());
      if (!kind || !entry.is_regular_file()) continue;
      auto bytes = content_of(entry.path());
      damage(bytes);
      const auto path = folder.write("a" + entry.path().extension().string(), bytes);
      SCOPED_TRACE(entry.path().string());
      read += is_read(path, *kind) ? 1 : 0;
    }
    return read;
  }

  /// What is read is clean; what is not has a reason.
  static bool is_read(const std::string& path, tool::Kind kind) {
    try {
      const auto json = to_json(tool::read_media_file(path, kind));
      for (const auto& name : json.getMemberNames()) {
        const auto& value = json[name];
        if (value.isString()) {
          EXPECT_EQ(tool::clean_text(value.asString()), value.asString()) << name;
          EXPECT_LE(value.asString().size(), 1U << 20U) << name;
        } else if (!name.starts_with("rg_")) {
          EXPECT_GE(value.asDouble(), 0) << name;
        }
      }
      return true;
    } catch (const tool::ReadError& error) {
      EXPECT_STRNE(error.what(), "");
      return false;
    }
  }

  ScratchFolder folder;
};

TEST_F(ABrokenFile, CutShortIsReadAsFarAsItGoesOrRefused) {
  for (const std::size_t part : {2, 8, 50}) {
    EXPECT_GT(read_all([part](std::string& bytes) { bytes.resize(bytes.size() / part); }), 0);
  }
}

TEST_F(ABrokenFile, WithBytesChangedIsReadOrRefused) {
  std::mt19937 random(20210612);
  const auto change = [&random](std::string& bytes) {
    // Most near the beginning, where headers and tags stand.
    const auto near = std::min<std::size_t>(bytes.size(), 4096);
    for (int i = 0; i < 40; ++i) bytes[random() % near] = static_cast<char>(random());
    for (int i = 0; i < 20; ++i) bytes[random() % bytes.size()] = static_cast<char>(random());
  };
  EXPECT_GT(read_all(change), 0);
}

/// Sizes in headers that claim more than there is.
TEST_F(ABrokenFile, WithHugeSizesIsReadOrRefused) {
  std::mt19937 random(1);
  const auto change = [&random](std::string& bytes) {
    const auto near = std::min<std::size_t>(bytes.size(), 2048);
    for (int i = 0; i < 6; ++i) {
      const auto place = random() % (near - 4);
      for (std::size_t k = 0; k < 4; ++k) bytes[place + k] = '\xFF';
    }
  };
  EXPECT_GT(read_all(change), 0);
}

}  // namespace
}  // namespace mediidx::test
