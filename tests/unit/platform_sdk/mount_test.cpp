// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavosdk.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

#include "mount_table.h"
#include "unit/platform_core/temporary_folder.h"

namespace {

namespace platform = mediidx::platform;

// /proc stands before the root, as it does where the root was moved over it.
constexpr std::string_view kMounts =
    "22 27 0:21 / /proc rw,relatime - proc proc rw\n"
    "27 1 254:0 / / rw,relatime - ext4 /dev/vda rw,discard\n"
    "30 27 0:30 / /volume1 rw shared:5 master:2 - btrfs /dev/mapper/v1 rw\n"
    "31 30 0:31 / /volume1/remote rw shared:6 - nfs4 server:/export rw\n"
    "32 31 0:32 / /volume1/remote/local rw - fuse.mergerfs disks rw\n"
    "33 27 0:33 / /mnt/with\\040blank\\134and\\011tab rw - cifs //server/share rw\n"
    "34 27 0:34 / /volume10 rw - fuseblk /dev/sdb1 rw\n"
    "35 27 0:35 / /stacked rw - ext4 /dev/sdc1 rw\n"
    "36 35 0:36 / /stacked rw - fuse.sshfs user@host: rw\n"
    "37 27 0:37 / /hidden/deep rw - nfs server:/deep rw\n"
    "38 27 0:38 / /hidden rw - tmpfs tmpfs rw\n"
    "39 27 0:39 / /over/deep rw - ext4 /dev/sdd1 rw\n"
    "40 27 0:40 / /over rw - 9p tag rw\n";

struct RemoteCase {
  const char* name;
  const char* path;
  bool remote;
};

class AMount : public testing::TestWithParam<RemoteCase> {};

TEST_P(AMount, MakesAPathRemoteOrNot) {
  EXPECT_EQ(platform::is_remote(kMounts, GetParam().path), GetParam().remote);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, AMount,
    testing::Values(RemoteCase{"Root", "/", false},
                    RemoteCase{"LocalDisk", "/volume1/music", false},
                    RemoteCase{"TheMountItself", "/volume1/remote", true},
                    RemoteCase{"BelowTheMount", "/volume1/remote/a/b", true},
                    RemoteCase{"NameOnlyBeginsAlike", "/volume1/remote2", false},
                    RemoteCase{"LocalOnRemote", "/volume1/remote/local/x", false},
                    RemoteCase{"EscapedName", "/mnt/with blank\\and\ttab/x", true},
                    RemoteCase{"OtherName", "/mnt/with", false},
                    RemoteCase{"LocalFuse", "/volume10/x", false},
                    RemoteCase{"LaterOverEarlier", "/stacked/x", true},
                    RemoteCase{"HiddenByALaterMount", "/hidden/deep/x", false},
                    RemoteCase{"HidingALocalMount", "/over/deep/x", true},
                    RemoteCase{"NoPath", "", false}, RemoteCase{"Relative", "volume1", false}),
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
  std::size_t mounts;
};

class AMountLine : public testing::TestWithParam<LineCase> {};

TEST_P(AMountLine, IsReadOrPassedOver) {
  EXPECT_EQ(platform::parse_mounts(GetParam().text).size(), GetParam().mounts);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, AMountLine,
    testing::Values(LineCase{"Whole", "1 0 0:1 / / rw - ext4 /dev/a rw", 1},
                    LineCase{"NoSource", "1 0 0:1 / / rw - ext4", 1}, LineCase{"Empty", "", 0},
                    LineCase{"EmptyLines", "\n\n", 0}, LineCase{"NoType", "1 0 0:1 / / rw -", 0},
                    LineCase{"NoDash", "1 0 0:1 / / rw shared:1 ext4", 0},
                    LineCase{"NoPoint", "1 0 0:1 /", 0},
                    LineCase{"RelativePoint", "1 0 0:1 / net:[1] rw - nsfs nsfs rw", 0},
                    LineCase{"BadId", "x 0 0:1 / / rw - ext4 /dev/a rw", 0},
                    LineCase{"HugeId", "99999999999 0 0:1 / / rw - ext4 /dev/a rw", 0}),
    [](const auto& test) { return test.param.name; });

TEST(AMountLine, KeepsEscapesThatAreNone) {
  const auto mounts = platform::parse_mounts("1 0 0:1 / /a\\04\\9\\ rw - ext4 x rw\n");
  ASSERT_EQ(mounts.size(), 1U);
  EXPECT_EQ(mounts[0].point, "/a\\04\\9\\");
}

TEST(AMountList, ThatRunsInCirclesHasAnEnd) {
  EXPECT_TRUE(platform::is_remote("1 1 0:1 / / rw - nfs a rw\n", "/x"));
  EXPECT_FALSE(platform::is_remote("1 2 0:1 / / rw - nfs a rw\n2 1 0:2 / / rw - nfs b rw\n", "/x"));
  EXPECT_TRUE(platform::is_remote(
      "3 9 0:3 / / rw - nfs a rw\n1 3 0:1 / / rw - nfs a rw\n3 1 0:2 / / rw - nfs b rw\n", "/x"));
}

TEST(AMountList, WithoutARootIsReadFromWhatHangsBelowNothing) {
  EXPECT_TRUE(platform::is_remote("5 1 0:1 / /data rw - nfs a rw\n", "/data/x"));
  EXPECT_FALSE(platform::is_remote("5 1 0:1 / /data rw - nfs a rw\n", "/other"));
}

std::string own_mounts() {
  std::ifstream in("/proc/self/mountinfo");
  return {std::istreambuf_iterator<char>(in), {}};
}

TEST(APathOnThisMachine, IsAsItsMountSays) {
  const mediidx::test::TemporaryFolder folder;
  const int expected = platform::is_remote(own_mounts(), folder.at("")) ? 1 : 0;
  EXPECT_EQ(IndexIsPathRemoteMount(folder.at("").c_str()), expected);
  EXPECT_EQ(IndexIsPathRemoteMount("/proc/self/status"), 0);
  EXPECT_EQ(IndexIsPathRemoteMount("/"), platform::is_remote(own_mounts(), "/") ? 1 : 0);
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
