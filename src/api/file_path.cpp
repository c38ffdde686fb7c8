// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "api/file_path.h"

#include <tavocore.h>

#include "support/log.h"

namespace mediidx {

bool is_no_folder(const char* path) {
  constexpr int kFolder = 101;
  if (!IsDirExist(path)) return true;
  kRequestLog.colon(kFolder, "Path should be a file, not a directory: %s", path);
  return false;
}

const char* find_path(const Json::Value& json) {
  if (!json.isObject()) return nullptr;
  const auto& path = json["szPath"];
  return path.isString() ? path.asCString() : nullptr;
}

}  // namespace mediidx
