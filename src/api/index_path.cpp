// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Whether a path, or a share, belongs in the index.
#include <tavosdk.h>

#include "api/personal_library.h"
#include "mediidx/index_folder.h"
#include "mediidx/request.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/owned.h"
#include "support/share.h"

namespace mediidx {
namespace {

constexpr int kNoPath = 301;
constexpr int kHomeNotChecked = 302;
constexpr int kNoShare = 303;

/// Why the folders cannot be asked does not matter here: what is not known to be indexed is not.
int is_in_index_folder(const char* path, MEDIA_TABLE_TYPE type) {
  return no_throw(kRequestLog, 0, [&] {
    const int answer = type == MEDIA_TABLE_DIRECTORY
                           ? IndexFolderIsFolderIndexed(path)
                           : IndexFolderIsPathIndexed(path, static_cast<int>(type));
    return answer > 0 ? 1 : 0;
  });
}

int is_index_path(const char* path, MEDIA_TABLE_TYPE type) {
  if (!path || !*path) {
    kRequestLog.colon(kNoPath, "TAVOMediaIndexIsIndexPath: Bad parameter: path");
    return -1;
  }
  if (IndexIsPathRemoteMount(path)) return 0;
  OwnedHomeCheck home;
  const int answer = TAVOServiceHomePathCheck(path, 1, 1, out(home));
  if (answer == -1) {
    kRequestLog.colon(kHomeNotChecked, "TAVOServiceHomePathCheck(%s) fail", path);
    return -1;
  }
  if (answer > 0 && home && is_in_personal_library(home->home, path)) return 1;
  return is_in_index_folder(path, type);
}

/// A share by its folder, or by its name, which never begins with a slash.
int is_share_indexed(const char* share) {
  if (*share == '/') return IndexFolderIsCoveredByShare(share) > 0 ? 1 : 0;
  const auto found = find_share(share);
  if (!found || !*found->path) return 0;
  return IndexFolderIsCoveredByShare(found->path) > 0 ? 1 : 0;
}

}  // namespace
}  // namespace mediidx

using mediidx::kRequestLog;
using mediidx::no_throw;

extern "C" int TAVOMediaIndexIsIndexPath(const char* path, MEDIA_TABLE_TYPE type) {
  return no_throw(kRequestLog, -1, [&] { return mediidx::is_index_path(path, type); });
}

extern "C" int TAVOMediaintIndexIsShareIndexed(const char* share) {
  return no_throw(kRequestLog, 0, [&] {
    if (share && *share) return mediidx::is_share_indexed(share);
    kRequestLog.colon(mediidx::kNoShare, "Bad parameter: szShare");
    return -1;
  });
}
