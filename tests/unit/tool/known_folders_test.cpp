// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/known_folders.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <tavosdk.h>

#include <cstring>

#include "scratch.h"

/// Stands before the platform's: every folder named "remote" is a network mount.
extern "C" int IndexIsPathRemoteMount(const char* path) {
  return std::strstr(path, "/remote") ? 1 : 0;
}

namespace mediidx::tool {
namespace {

TEST(AFolderToIndex, IsRealAndAbsolute) {
  const test::ScratchFolder scratch;
  scratch.make_folder("real");
  scratch.make_link("link", scratch.at("real"));
  EXPECT_EQ(real_folder(scratch.at("link/../link/")), scratch.at("real"));
}

/// The reason why a folder is refused; empty when it is not.
std::string refusal(const std::string& folder) {
  try {
    real_folder(folder);
  } catch (const std::runtime_error& error) {
    return error.what();
  }
  return {};
}

TEST(AFolderToIndex, OnANetworkMountIsRefused) {
  const test::ScratchFolder scratch;
  const auto folder = scratch.make_folder("remote/music");
  EXPECT_EQ(refusal(folder), folder + ": on a network mount, which is never indexed");
}

TEST(AFolderToIndex, WithANameThatIsNotUtf8IsRefused) {
  const test::ScratchFolder scratch;
  const auto folder = scratch.make_folder("caf\xE9");
  EXPECT_EQ(refusal(folder), scratch.at("caf\\xE9") + ": its name is not valid UTF-8");
}

TEST(AFolderToIndex, IsNotTheWholeSystem) {
  EXPECT_EQ(refusal("/"), "/: the whole system cannot be indexed");
  EXPECT_EQ(refusal("/usr/.."), "/: the whole system cannot be indexed");
}

}  // namespace
}  // namespace mediidx::tool
