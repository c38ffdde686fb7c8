// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The absolute system paths that the library itself opens, all named here.
#ifndef MEDIIDX_SUPPORT_ROOT_H_
#define MEDIIDX_SUPPORT_ROOT_H_

#include <string>

namespace mediidx {

inline constexpr const char* kIndexFolderConfPath = "/usr/tavo/etc/index_folder.conf";
inline constexpr const char* kSettingsPath = "/etc/tavoinfo.conf";
inline constexpr const char* kTableMarkerPath = "/tmp/tavoindexdaapd_checkin";
inline constexpr const char* kPhotoLinkPath = "/var/services/photo";
inline constexpr const char* kMusicLinkPath = "/var/services/music";
inline constexpr const char* kVideoLinkPath = "/var/services/video";
inline constexpr const char* kIndexDaemonPidPath = "/var/run/tavoindexd.pid";
inline constexpr const char* kThumbnailDaemonPidPath = "/var/run/tavomkthumbd.pid";
inline constexpr const char* kVideoDaemonPidPath = "/var/run/tavomkflvd.pid";
inline constexpr const char* kMediaServerPidPath = "/var/run/dms.pid";
inline constexpr const char* kIndexerPath = "/usr/tavo/bin/tavoindex";
inline constexpr const char* kIndexManagerPath = "/usr/tavo/bin/tavoindex_mgr";
inline constexpr const char* kConverterPath = "/usr/bin/php";

/// The place of one of these paths on this machine: the path below the root that
/// TAVOMediaIndexRootSet was given, or itself.
std::string below_root(const char* path);

}  // namespace mediidx

#endif
