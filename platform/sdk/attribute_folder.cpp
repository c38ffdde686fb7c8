// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <border.h>
#include <tavosdk.h>
#include <utf8.h>

#include <string>
#include <string_view>

namespace platform = mediidx::platform;

namespace {

/// Empty when the path's last part is no name.
std::string attribute_folder(std::string_view path) {
  const auto slash = path.rfind('/');
  const auto start = slash == std::string_view::npos ? 0 : slash + 1;
  const auto name = path.substr(start);
  if (name.empty() || name == "." || name == "..") return {};
  return std::string(path.substr(0, start)).append("@eaDir/").append(name);
}

}  // namespace

extern "C" int TAVOEADirPath([[maybe_unused]] int flags, const char* path, char* buffer, int size) {
  if (!path || !buffer || size < 1) {
    return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "attribute_folder.cpp", 1);
  }
  return platform::no_throw(-1, "attribute_folder.cpp", 2, [&] {
    const auto folder = attribute_folder(path);
    const bool written =
        !folder.empty() && platform::copy_whole({buffer, static_cast<std::size_t>(size)}, folder);
    return written ? 0 : platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "attribute_folder.cpp", 3);
  });
}
