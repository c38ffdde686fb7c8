// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Coverage by many entries, which are indexed: the answers are those of a plain walk, whatever
// happens to the in-memory copy.
#include <gtest/gtest.h>

#include <optional>
#include <random>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "index_folder_test.h"

namespace mediidx::test {
namespace {

constexpr int kMusic = 0;
constexpr int kPhoto = 2;
constexpr int kDirectory = 4;
/// Answers that are exceptions.
constexpr int kOutOfRange = 1000;

// -- The plain walk ------------------------------------------------------------------------------

std::optional<std::string> path_of(const Json::Value& entry) {
  if (!entry.isObject()) return std::nullopt;
  const auto& path = entry["path"];
  if (path.isNull()) return "";
  return path.isString() ? std::optional(path.asString()) : std::nullopt;
}

bool begins_below(const std::string& path, const std::string& folder) {
  return path.starts_with(folder.ends_with('/') ? folder : folder + "/");
}

/// The first entry of the path, with `itself`, or above it. An empty path that is met throws.
const Json::Value* walk(const std::string& path, bool itself) {
  if (!gIndexFolderConf.isArray()) return nullptr;
  for (const auto& entry : gIndexFolderConf) {
    const auto folder = path_of(entry);
    if (!folder) continue;
    if (itself && *folder == path) return &entry;
    if (folder->size() >= path.size()) continue;
    if (folder->empty()) throw std::out_of_range("empty");
    if (begins_below(path, *folder)) return &entry;
  }
  return nullptr;
}

int walked_position(const std::string& path) {
  int position = 0;
  for (const auto& entry : gIndexFolderConf) {
    if (path_of(entry) == path) return position;
    ++position;
  }
  return -1;
}

/// A flag as it reads, where every value is true, false or a number.
int walked_flag(const std::string& path, int kind) {
  if (gIndexFolderConf.empty() || kind == kDirectory) return -1;
  const auto* entry = walk(path, true);
  if (!entry) return 0;
  const auto& flag = (*entry)[kind == kPhoto ? "photo" : "music"];
  return flag.asBool() ? 1 : 0;
}

template <class Ask>
int answer_of(Ask&& ask) {
  try {
    return ask();
  } catch (const std::out_of_range&) {
    return kOutOfRange;
  }
}

/// All answers about a path, by the library and by the walk.
std::vector<int> answers(const std::string& path) {
  const char* text = path.c_str();
  return {answer_of([&] { return IndexFolderIsPathIndexed(text, kPhoto); }),
          answer_of([&] { return IndexFolderIsPathIndexed(text, kMusic); }),
          answer_of([&] { return IndexFolderIsFolderIndexed(text); }),
          answer_of([&] { return IndexFolderIsFolderHasParent(text); }),
          answer_of([&] { return IndexFolderPositionGet(text); })};
}

std::vector<int> walked_answers(const std::string& path) {
  return {answer_of([&] { return walked_flag(path, kPhoto); }),
          answer_of([&] { return walked_flag(path, kMusic); }),
          answer_of([&] { return walk(path, true) ? 1 : -1; }),
          answer_of([&] { return walk(path, false) ? 1 : -1; }),
          answer_of([&] { return walked_position(path); })};
}

// -- Random copies and changes -------------------------------------------------------------------

class Dice {
 public:
  explicit Dice(unsigned seed) : numbers_(seed) {}
  unsigned below(unsigned end) { return static_cast<unsigned>(numbers_() % end); }
  bool once_in(unsigned times) { return below(times) == 0; }

  /// Few names, so that folders lie in each other and come twice.
  std::string path() {
    if (once_in(200)) return "";
    if (once_in(50)) return "/";
    std::string path = once_in(50) ? "relative" : "";
    for (auto depth = 1 + below(5); depth > 0; --depth) {
      path += '/';
      if (!once_in(60)) path += std::string(1 + below(2), static_cast<char>('a' + below(3)));
    }
    return once_in(15) ? path + '/' : path;
  }

  Json::Value folder() {
    if (once_in(100)) return Json::Value(7);
    if (once_in(200)) return Json::Value(Json::objectValue);
    auto made = entry(path(), once_in(2), once_in(2), once_in(2));
    if (once_in(200)) made["path"] = 3;
    return made;
  }

  Json::Value folders(unsigned count) {
    Json::Value made(Json::arrayValue);
    for (unsigned i = 0; i < count; ++i) made.append(folder());
    return made;
  }

 private:
  std::mt19937 numbers_;
};

/// What a caller may do at any time.
void change_openly(Dice& dice) {
  const auto size = gIndexFolderConf.size();
  const auto any = dice.below(size + 1);
  switch (dice.below(8)) {
    case 0:
      gIndexFolderConf = dice.folders(dice.below(80));
      break;
    case 1:
      gIndexFolderConf.append(dice.folder());
      break;
    case 2: {
      auto copy = gIndexFolderConf;
      if (any < size) copy[any] = dice.folder();
      gIndexFolderConf = copy;
      break;
    }
    case 3: {
      // Other entries of the same number, perhaps where the old ones were.
      gIndexFolderConf.clear();
      for (unsigned i = 0; i < size; ++i) gIndexFolderConf.append(dice.folder());
      break;
    }
    case 4: {
      Json::Value removed;
      if (size > 0) gIndexFolderConf.removeIndex(any % size, &removed);
      gIndexFolderConf.append(dice.folder());
      break;
    }
    case 5:
      if (any < size && gIndexFolderConf[any].isObject()) gIndexFolderConf[any]["photo"] = 1;
      break;
    case 6: {
      auto other = dice.folders(size);
      gIndexFolderConf.swap(other);
      break;
    }
    default:
      gIndexFolderConf.resize(size / 2 + dice.below(40));
  }
}

/// What he may do between lock and unlock.
void change_in_place(Dice& dice) {
  const auto size = gIndexFolderConf.size();
  for (int i = 0; i < 3 && size > 0; ++i) {
    auto& changed = gIndexFolderConf[dice.below(size)];
    if (changed.isObject()) changed["path"] = dice.path();
    if (dice.once_in(2)) gIndexFolderConf[dice.below(size)] = dice.folder();
  }
}

class ManyFolders : public IndexFolderTest {
 protected:
  static void expect_answers_of_a_walk(Dice& dice, int count) {
    for (int i = 0; i < count; ++i) {
      const auto path = dice.path() + (dice.once_in(2) ? "/file" : "");
      ASSERT_EQ(answers(path), walked_answers(path)) << path << '\n'
                                                     << gIndexFolderConf.toStyledString();
    }
  }

  static void hold_folders(int count) {
    gIndexFolderConf = Json::Value(Json::arrayValue);
    for (int i = 0; i < count; ++i) {
      gIndexFolderConf.append(entry("/v/folder" + std::to_string(i), true, true, true));
    }
  }
};

TEST_F(ManyFolders, AnswerAsAWalkDoes) {
  for (unsigned seed = 0; seed < 1000; ++seed) {
    Dice dice(seed);
    gIndexFolderConf = dice.folders(dice.below(120));
    expect_answers_of_a_walk(dice, 20);
    if (HasFatalFailure()) return;
  }
}

TEST_F(ManyFolders, AnswerAsAWalkDoesAfterEachChange) {
  for (unsigned seed = 0; seed < 100; ++seed) {
    Dice dice(seed);
    gIndexFolderConf = dice.folders(20 + dice.below(60));
    for (int change = 0; change < 50; ++change) {
      if (dice.once_in(3)) {
        IndexFolderConfLock();
        change_in_place(dice);
        // A question ends the lock; what is changed behind it is known by the unlock.
        if (dice.once_in(2)) expect_answers_of_a_walk(dice, 2);
        change_in_place(dice);
        IndexFolderConfUnLock();
      } else {
        change_openly(dice);
      }
      expect_answers_of_a_walk(dice, 5);
      if (HasFatalFailure()) return;
    }
  }
}

TEST_F(ManyFolders, AreTenThousandAtMost) {
  hold_folders(10000);
  for (const int i : {0, 1, 4999, 9999}) {
    const auto folder = "/v/folder" + std::to_string(i);
    EXPECT_EQ(IndexFolderIsPathIndexed((folder + "/a/b.jpg").c_str(), kPhoto), 1);
    EXPECT_EQ(IndexFolderPositionGet(folder.c_str()), i);
    EXPECT_EQ(IndexFolderIsFolderHasParent(folder.c_str()), -1);
  }
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/folder10000/b.jpg", kPhoto), 0);
}

TEST_F(ManyFolders, AreReadForTheirFlagsEachTime) {
  hold_folders(100);
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/folder50/a.jpg", kPhoto), 1);
  gIndexFolderConf[50]["photo"] = false;
  EXPECT_EQ(IndexFolderIsPathIndexed("/v/folder50/a.jpg", kPhoto), 0);
}

TEST_F(ManyFolders, DoNotCountWhereTheyWere) {
  hold_folders(100);
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/folder50/a"), 1);
  gIndexFolderConf[50]["path"] = "/w";
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/folder50/a"), -1);
  EXPECT_EQ(IndexFolderIsFolderIndexed("/w/a"), 1);
}

TEST_F(ManyFolders, MayGiveTheirPlaceInMemoryToOthers) {
  hold_folders(100);
  Json::Value removed;
  for (int i = 0; i < 20; ++i) {
    const auto folder = "/w/" + std::to_string(i);
    auto other = entry(folder, true, true, true);
    EXPECT_EQ(IndexFolderIsFolderIndexed((folder + "/a").c_str()), -1);
    gIndexFolderConf.removeIndex(99, &removed);
    gIndexFolderConf.append(std::move(other));
    EXPECT_EQ(IndexFolderIsFolderIndexed((folder + "/a").c_str()), 1);
  }
}

TEST_F(ManyFolders, AreLoadedAnew) {
  const auto photo = add_share("p");
  load(text_of_folders(100));
  EXPECT_EQ(IndexFolderIsFolderIndexed((photo + "/99").c_str()), 1);
  root.set_index_folders(text_of_folders(99));
  EXPECT_EQ(IndexFolderIsFolderIndexed((photo + "/99").c_str()), 1);
  IndexFolderUpdate();
  EXPECT_EQ(IndexFolderIsFolderIndexed((photo + "/99").c_str()), -1);
  EXPECT_EQ(IndexFolderIsFolderIndexed((photo + "/98").c_str()), 1);
  IndexFolderFree();
  EXPECT_EQ(IndexFolderIsFolderIndexed((photo + "/98").c_str()), -1);
}

TEST_F(ManyFolders, FollowTheirShare) {
  add_share("p");
  load(text_of_folders(100));
  const auto elsewhere = root.at("elsewhere");
  root.add_share("p", elsewhere);
  IndexFolderUpdate();
  EXPECT_EQ(IndexFolderIsFolderIndexed((elsewhere + "/99/a").c_str()), 1);
  EXPECT_EQ(IndexFolderIsFolderIndexed(root.at("volume1/p/99/a").c_str()), -1);
}

TEST_F(ManyFolders, MayHaveGapsBetweenThem) {
  gIndexFolderConf[500] = entry("/v/last", true, true, true);
  hold_folders(30);
  gIndexFolderConf[100] = entry("/v/hundred", true, true, true);
  EXPECT_EQ(IndexFolderIsFolderIndexed("/v/hundred/a"), 1);
  EXPECT_EQ(IndexFolderPositionGet("/v/hundred"), walked_position("/v/hundred"));
}

}  // namespace
}  // namespace mediidx::test
