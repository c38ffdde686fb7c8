// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/query.h"

#include <filesystem>

#include "text/utf8.h"

namespace mediidx::tool {

std::string literal(std::string_view text) {
  const std::string source(text);
  std::string out(2 * source.size() + 1, '\0');
  TAVODBEscapeString(out.data(), source.c_str(), source.size());
  return "'" + std::string(out.c_str()) + "'";
}

std::string stored_path(const std::string& named) {
  if (named.empty()) throw std::runtime_error("an empty path names nothing");
  if (!is_utf8(named)) {
    throw std::runtime_error(escape_for_display(named) +
                             " is no UTF-8: the index cannot hold such a path");
  }
  auto path = std::filesystem::absolute(named).lexically_normal().string();
  while (path.ends_with('/')) path.pop_back();
  return path;
}

}  // namespace mediidx::tool
