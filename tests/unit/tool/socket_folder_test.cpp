// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <cstdlib>

#include "postgres_server.h"
#include "store/private_server.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

const std::string kLongFolder = "/" + std::string(120, 'd');

TEST(TheSocket, StandsBesideTheClusterWhereItsAddressFits) {
  EXPECT_EQ(socket_folder_for("/data/postgres"), "/data/postgres/run");
}

TEST(TheSocket, StandsInAShortFolderOtherwise) {
  const auto folder = socket_folder_for(kLongFolder);
  EXPECT_LE(folder.native().size(), PostgresServer::longest_socket_folder());
  EXPECT_EQ(folder, socket_folder_for(kLongFolder));
  EXPECT_NE(folder, socket_folder_for(kLongFolder + "x"));
}

TEST(TheSocket, OfAFolderNamedTooLongIsRefused) {
  EXPECT_THROW(PostgresServer(fs::path(kLongFolder)), std::runtime_error);
}

}  // namespace
}  // namespace mediidx::tool
