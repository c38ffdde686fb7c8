// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/share_names.h"

#include <tavocore.h>

#include <algorithm>

#include "mediidx/index_folder.h"
#include "support/text.h"

namespace mediidx::tool {
namespace {

constexpr std::size_t kLongestName = sizeof(TAVOSHARE::name) - 1;

bool is_taken(const Shares& shares, const std::string& name) {
  return std::ranges::any_of(shares, [&](const auto& share) {
    return TLIBCUnicodeUTF8StrCaseCmp(share.first.c_str(), name.c_str()) == 0;
  });
}

}  // namespace

std::optional<std::string> path_in_share(const Shares& shares, const std::string& folder) {
  const std::pair<const std::string, std::string>* deepest = nullptr;
  for (const auto& share : shares) {
    if (!IsEqualOrSubPath(folder, share.second)) continue;
    if (!deepest || share.second.size() > deepest->second.size()) deepest = &share;
  }
  if (!deepest) return std::nullopt;
  return "/" + deepest->first + folder.substr(deepest->second.size());
}

std::string name_for_share(const Shares& shares, const std::string& folder) {
  const auto base = folder.substr(folder.rfind('/') + 1);
  std::string name(cut_at_character(base, kLongestName));
  for (int number = 2; is_taken(shares, name); ++number) {
    std::string suffix = "-";
    suffix += std::to_string(number);
    name = cut_at_character(base, kLongestName - suffix.size());
    name += suffix;
  }
  return name;
}

}  // namespace mediidx::tool
