// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <sys/vfs.h>
#include <tavosdk.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <optional>
#include <sstream>
#include <string>
#include <vector>

#include "mount_table.h"
#include "unit/platform_core/temporary_folder.h"

namespace {

namespace platform = mediidx::platform;

constexpr std::string_view kMounts =
    "22 27 0:21 / /proc rw,relatime - proc proc rw\n"
    "27 1 254:0 / / rw,relatime - ext4 /dev/vda rw,discard\n"
    "30 27 0:30 / /volume1 rw shared:5 master:2 - btrfs /dev/mapper/v1 rw\n"
    "31 30 0:31 / /volume1/remote rw shared:6 - nfs4 server:/export rw\n"
    "33 27 0:33 / /mnt/with\\040blank rw - cifs //server/share rw\n"
    "36 35 0:36 / /stacked rw - fuse.sshfs user@host: rw";

struct ListedCase {
  const char* name;
  int id;
  const char* type;
};

class AMount : public testing::TestWithParam<ListedCase> {};

TEST_P(AMount, IsListedWithItsType) {
  EXPECT_EQ(platform::find_mount_type(kMounts, GetParam().id), GetParam().type);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, AMount,
    testing::Values(ListedCase{"First", 22, "proc"}, ListedCase{"WithoutOptions", 27, "ext4"},
                    ListedCase{"WithOptions", 30, "btrfs"}, ListedCase{"Remote", 31, "nfs4"},
                    ListedCase{"BlankInItsName", 33, "cifs"}, ListedCase{"Last", 36, "fuse.sshfs"},
                    ListedCase{"NotListed", 35, ""}, ListedCase{"ParentOnly", 1, ""},
                    ListedCase{"BeginsAlike", 3, ""}),
    [](const auto& test) { return test.param.name; });

struct TypeCase {
  const char* type;
  bool remote;
};

class AFileSystemType : public testing::TestWithParam<TypeCase> {};

TEST_P(AFileSystemType, ComesOverTheNetworkOrNot) {
  EXPECT_EQ(platform::is_remote_type(GetParam().type), GetParam().remote);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, AFileSystemType,
    testing::Values(TypeCase{"nfs", true}, TypeCase{"nfs4", true}, TypeCase{"cifs", true},
                    TypeCase{"smb3", true}, TypeCase{"smbfs", true}, TypeCase{"9p", true},
                    TypeCase{"fuse.sshfs", true}, TypeCase{"fuse.rclone", true},
                    TypeCase{"fuse.davfs", true}, TypeCase{"davfs", true}, TypeCase{"ceph", true},
                    TypeCase{"fuse.ceph", true}, TypeCase{"glusterfs", true},
                    TypeCase{"fuse.glusterfs", true}, TypeCase{"lustre", true},
                    TypeCase{"afs", true}, TypeCase{"ncpfs", true}, TypeCase{"beegfs", true},
                    TypeCase{"coda", true}, TypeCase{"fuse.curlftpfs", true},
                    TypeCase{"fuseblk", false}, TypeCase{"fuse.mergerfs", false},
                    TypeCase{"fuse.ntfs-3g", false}, TypeCase{"fuse.mhddfs", false},
                    TypeCase{"fuse.bindfs", false}, TypeCase{"fuse.exfat", false},
                    TypeCase{"fuse", false}, TypeCase{"ext4", false}, TypeCase{"btrfs", false},
                    TypeCase{"overlay", false}, TypeCase{"tmpfs", false}, TypeCase{"NFS", false},
                    TypeCase{"", false}));

struct LineCase {
  const char* name;
  const char* text;
  const char* type;
};

class AMountLine : public testing::TestWithParam<LineCase> {};

TEST_P(AMountLine, IsReadOrPassedOver) {
  EXPECT_EQ(platform::find_mount_type(GetParam().text, 1), GetParam().type);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, AMountLine,
    testing::Values(LineCase{"Whole", "1 0 0:1 / / rw - ext4 /dev/a rw", "ext4"},
                    LineCase{"NoSource", "1 0 0:1 / / rw - ext4", "ext4"},
                    LineCase{"Empty", "", ""},
                    LineCase{"EmptyLines", "\n\n1 0 0:1 / / rw - ext4 a\n", "ext4"},
                    LineCase{"NoType", "1 0 0:1 / / rw -", ""},
                    LineCase{"NoDash", "1 0 0:1 / / rw shared:1 ext4", ""},
                    LineCase{"NoDashButANextLine", "1 0\n2 0 0:1 / / rw - nfs4 a rw", ""},
                    LineCase{"IdOnly", "1", ""}, LineCase{"BadId", "1x 0 0:1 / / rw - ext4 a", ""},
                    LineCase{"HugeId", "4294967297 0 0:1 / / rw - ext4 /dev/a rw", ""}),
    [](const auto& test) { return test.param.name; });

TEST(MountsThatAreKnown, AreThoseLearnt) {
  platform::RemoteMounts mounts;
  EXPECT_EQ(mounts.find(7), std::nullopt);
  EXPECT_TRUE(mounts.learn(7, "nfs4"));
  EXPECT_FALSE(mounts.learn(8, "ext4"));
  EXPECT_EQ(mounts.find(7), true);
  EXPECT_EQ(mounts.find(8), false);
  EXPECT_EQ(mounts.find(9), std::nullopt);
}

TEST(MountsThatAreKnown, AreNotThoseThatMayBeAnotherTheNextTime) {
  platform::RemoteMounts mounts;
  EXPECT_TRUE(mounts.learn(std::nullopt, "nfs4"));
  EXPECT_EQ(mounts.find(std::nullopt), std::nullopt);
  EXPECT_FALSE(mounts.learn(7, ""));
  EXPECT_EQ(mounts.find(7), std::nullopt);
}

TEST(MountsThatAreKnown, DoNotGrowWithoutEnd) {
  platform::RemoteMounts mounts;
  for (std::uint64_t mount = 0; mount < 5000; ++mount) mounts.learn(mount, "nfs4");
  int known = 0;
  for (std::uint64_t mount = 0; mount < 5000; ++mount) known += mounts.find(mount) ? 1 : 0;
  EXPECT_GT(known, 0);
  EXPECT_LE(known, 1000);
  EXPECT_EQ(mounts.find(4999), true);
}

/// As the file system that a path is on names itself to statfs; nothing for FUSE, which may be
/// either.
std::optional<bool> comes_over_network(const std::string& path) {
  constexpr std::array<unsigned, 6> kNetwork{0x6969,     0xFF534D42, 0xFE534D42,
                                             0x01021997, 0x00C36400, 0x73757245};
  constexpr unsigned kFuse = 0x65735546;
  struct statfs status;
  if (statfs(path.c_str(), &status) != 0) return std::nullopt;
  const auto type = static_cast<unsigned>(status.f_type);
  if (type == kFuse) return std::nullopt;
  return std::ranges::find(kNetwork, type) != kNetwork.end();
}

std::vector<std::string> own_mount_points() {
  std::vector<std::string> points;
  std::ifstream list("/proc/self/mountinfo");
  for (std::string line; std::getline(list, line);) {
    std::istringstream words(line);
    std::string word;
    for (int i = 0; i < 5; ++i) words >> word;
    points.push_back(word);
  }
  return points;
}

TEST(APathOnThisMachine, IsAsItsFileSystemSays) {
  const mediidx::test::TemporaryFolder folder;
  auto paths = own_mount_points();
  paths.insert(paths.end(), {"/", "/proc/self/status", "/etc", folder.at("")});
  int answers = 0;
  for (const auto& path : paths) {
    const auto expected = comes_over_network(path);
    if (!expected) continue;
    ++answers;
    // Once looked up, once known.
    EXPECT_EQ(IndexIsPathRemoteMount(path.c_str()), *expected) << path;
    EXPECT_EQ(IndexIsPathRemoteMount((path + "/missing/x").c_str()), *expected) << path;
  }
  EXPECT_GE(answers, 2);
}

TEST(APathOnThisMachine, ThatDoesNotExistCountsByTheFolderAbove) {
  const mediidx::test::TemporaryFolder folder;
  const int expected = IndexIsPathRemoteMount(folder.at("").c_str());
  EXPECT_EQ(IndexIsPathRemoteMount(folder.at("missing/a/b").c_str()), expected);
  std::filesystem::create_symlink("/proc", folder.at("link"));
  EXPECT_EQ(IndexIsPathRemoteMount(folder.at("link/missing/x").c_str()), 0);
}

TEST(APathOnThisMachine, MayBeLongerThanTheSystemTakes) {
  EXPECT_EQ(IndexIsPathRemoteMount(("/proc/" + std::string(100000, 'x')).c_str()), 0);
  std::string deep = "/proc";
  for (int i = 0; i < 5000; ++i) deep += "/x";
  EXPECT_EQ(IndexIsPathRemoteMount(deep.c_str()), 0);
}

TEST(NoPath, IsNotRemote) {
  EXPECT_EQ(IndexIsPathRemoteMount(nullptr), 0);
  EXPECT_EQ(IndexIsPathRemoteMount(""), 0);
  EXPECT_EQ(IndexIsPathRemoteMount("relative"), 0);
}

}  // namespace
