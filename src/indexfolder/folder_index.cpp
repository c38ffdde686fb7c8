// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "indexfolder/folder_index.h"

#include <algorithm>
#include <functional>
#include <limits>
#include <new>
#include <stdexcept>
#include <string>
#include <unordered_map>

#include "indexfolder/entry.h"
#include "mediidx/index_folder.h"

namespace mediidx {
namespace {

/// Up to here a walk takes no longer than the index.
constexpr Json::ArrayIndex kFew = 16;
constexpr auto kNone = std::numeric_limits<Json::ArrayIndex>::max();

/// True when `path` lies below `folder`, which may end with a slash.
bool lies_below(std::string_view path, std::string_view folder) {
  if (folder.empty()) throw std::out_of_range("index folder without a path");
  if (!path.starts_with(folder)) return false;
  return folder.back() == '/' || path.substr(folder.size()).starts_with('/');
}

bool holds(std::string_view folder, std::string_view path, Reach reach) {
  if (folder == path) return reach == Reach::kItselfOrAbove;
  return folder.size() < path.size() && lies_below(path, folder);
}

struct Found {
  const Json::Value* entry = nullptr;
  int position = -1;
};

template <class Predicate>
Found walk_to(Predicate&& is_right) {
  int position = 0;
  for (const auto& entry : gIndexFolderConf) {
    const auto path = find_entry_path(entry);
    if (path && is_right(*path)) return {&entry, position};
    ++position;
  }
  return {};
}

struct TextHash : std::hash<std::string_view> {
  using is_transparent = void;
};

/// From the shortest to the longest: most beginnings of a path need no look-up.
struct Lengths {
  std::size_t shortest = std::string::npos;
  std::size_t longest = 0;

  void take_in(std::size_t length) {
    shortest = std::min(shortest, length);
    longest = std::max(longest, length);
  }
  bool hold(std::size_t length) const { return length >= shortest && length <= longest; }
};

class FolderIndex {
 public:
  /// Whether the copy is the one that the index was built from, as far as can be told at once.
  bool is_current() const {
    return mark_ != 0 && gIndexFolderConf.size() == size_ && &last_entry() == last_entry_ &&
           last_entry().getOffsetLimit() == mark_;
  }

  /// False when the copy has gaps, so that entries cannot be told by their position.
  bool build() {
    forget();
    first_of_path_.clear();
    lengths_ = {};
    Json::ArrayIndex position = 0;
    for (const auto& entry : gIndexFolderConf) {
      if (const auto path = find_entry_path(entry)) {
        first_of_path_.emplace(*path, position);
        lengths_.take_in(path->size());
      }
      ++position;
    }
    size_ = gIndexFolderConf.size();
    if (position != size_) return false;
    mark_ = --last_mark_;
    last_entry_ = &last_entry();
    gIndexFolderConf[size_ - 1].setOffsetLimit(mark_);
    return true;
  }
  void forget() { mark_ = 0; }

  Json::ArrayIndex position_of(std::string_view path) const {
    if (!lengths_.hold(path.size())) return kNone;
    const auto found = first_of_path_.find(path);
    return found == first_of_path_.end() ? kNone : found->second;
  }

  /// The first of all texts that the path of an entry above would have. An empty one comes before
  /// what follows it, for nothing can be told of what lies below it.
  Json::ArrayIndex holder_of(std::string_view path, Reach reach) const {
    auto first = reach == Reach::kItselfOrAbove ? position_of(path) : kNone;
    for (auto slash = path.find('/'); slash != path.npos; slash = path.find('/', slash + 1)) {
      first = std::min(first, position_of(path.substr(0, slash)));
      if (slash + 1 < path.size()) first = std::min(first, position_of(path.substr(0, slash + 1)));
    }
    return path.empty() ? first : std::min(first, position_of(""));
  }

 private:
  static const Json::Value& last_entry() {
    const auto& conf = gIndexFolderConf;
    return *--conf.end();
  }

  std::unordered_map<std::string, Json::ArrayIndex, TextHash, std::equal_to<>> first_of_path_;
  Lengths lengths_;
  Json::ArrayIndex size_ = 0;
  /// Stands where the last entry keeps the end of its text in the file, which nobody asks for: an
  /// entry that takes its place has none, or, from a file, one above zero. Entries that a caller
  /// copied have the mark, but another place. 0 while there is no index.
  std::ptrdiff_t mark_ = 0;
  std::ptrdiff_t last_mark_ = 0;
  const Json::Value* last_entry_ = nullptr;
};

/// Never destroyed: exit handlers of the program may still ask.
FolderIndex& folder_index() {
  static auto& index = *new FolderIndex;
  return index;
}

/// Null where a walk has to do.
const FolderIndex* current_index() {
  if (!gIndexFolderConf.isArray() || gIndexFolderConf.size() <= kFew) return nullptr;
  auto& index = folder_index();
  if (index.is_current()) return &index;
  try {
    return index.build() ? &index : nullptr;
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}

/// The entry at the position that `ask` has of the index, if its path still is right; else what a
/// walk finds.
template <class Ask, class Predicate>
Found find_by_index(Ask&& ask, Predicate&& is_right) {
  const auto* index = current_index();
  if (!index) return walk_to(is_right);
  const Json::ArrayIndex position = ask(*index);
  if (position == kNone) return {};
  const auto& conf = gIndexFolderConf;
  const auto& entry = conf[position];
  const auto path = find_entry_path(entry);
  if (path && is_right(*path)) return {&entry, static_cast<int>(position)};
  forget_folder_index();
  return walk_to(is_right);
}

}  // namespace

const Json::Value* find_holder(std::string_view path, Reach reach) {
  if (!gIndexFolderConf.isArray()) return nullptr;
  return find_by_index([&](const FolderIndex& index) { return index.holder_of(path, reach); },
                       [&](std::string_view folder) { return holds(folder, path, reach); })
      .entry;
}

int find_position(std::string_view path) {
  return find_by_index([&](const FolderIndex& index) { return index.position_of(path); },
                       [&](std::string_view folder) { return folder == path; })
      .position;
}

void forget_folder_index() { folder_index().forget(); }

}  // namespace mediidx
