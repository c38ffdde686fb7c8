// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Whether a path is covered, among 1, 100 and 10,000 folders: the question to the folders alone,
// and the whole question that each file is asked, with its mount and the homes of the users.
#include <benchmark/benchmark.h>
#include <tavosdk.h>

#include <stdexcept>
#include <string>

#include "mediidx/index_folder.h"
#include "mediidx/request.h"
#include "scratch.h"

namespace {

using mediidx::test::ScratchRoot;

/// A machine with a few users, and so many folders that are indexed.
class Folders {
 public:
  explicit Folders(long count) {
    for (int i = 0; i < 5; ++i) {
      const auto name = "user" + std::to_string(i);
      root_.add_user(name, 1000U + static_cast<unsigned>(i), root_.at("homes/" + name));
    }
    gIndexFolderConf = Json::Value(Json::arrayValue);
    for (long i = 0; i < count; ++i) {
      gIndexFolderConf.append(createRule("", folder(i), true, true, true, false));
    }
    covered_ =
        root_.write("volume1/music/folder" + std::to_string(count / 2) + "/album/song.mp3", "");
    outside_ = root_.write("volume1/other/folder/album/song.mp3", "");
  }
  ~Folders() { gIndexFolderConf = Json::Value(Json::arrayValue); }

  const char* covered() const { return covered_.c_str(); }
  const char* outside() const { return outside_.c_str(); }

 private:
  std::string folder(long number) const {
    return root_.at("volume1/music/folder" + std::to_string(number));
  }

  ScratchRoot root_;
  std::string covered_;
  std::string outside_;
};

void ask(benchmark::State& state, int expected, int (*question)(const Folders&)) {
  const Folders folders(state.range(0));
  for (auto _ : state) {
    if (question(folders) != expected) throw std::runtime_error("wrong answer");
  }
}

void BM_FoldersCover(benchmark::State& state) {
  ask(state, 1, [](const Folders& folders) {
    return IndexFolderIsPathIndexed(folders.covered(), MEDIA_TABLE_MUSIC);
  });
}
void BM_FoldersDoNotCover(benchmark::State& state) {
  ask(state, 0, [](const Folders& folders) {
    return IndexFolderIsPathIndexed(folders.outside(), MEDIA_TABLE_MUSIC);
  });
}
void BM_PathBelongs(benchmark::State& state) {
  ask(state, 1, [](const Folders& folders) {
    return TAVOMediaIndexIsIndexPath(folders.covered(), MEDIA_TABLE_MUSIC);
  });
}
void BM_PathDoesNotBelong(benchmark::State& state) {
  ask(state, 0, [](const Folders& folders) {
    return TAVOMediaIndexIsIndexPath(folders.outside(), MEDIA_TABLE_MUSIC);
  });
}

// What the whole question asks of the platform.
void BM_MountOfAPath(benchmark::State& state) {
  ask(state, 0, [](const Folders& folders) { return IndexIsPathRemoteMount(folders.covered()); });
}
void BM_HomeOfAPath(benchmark::State& state) {
  ask(state, 0, [](const Folders& folders) {
    TAVOHOMECHECK* home = nullptr;
    return TAVOServiceHomePathCheck(folders.covered(), 1, 1, &home);
  });
}

BENCHMARK(BM_FoldersCover)->Arg(1)->Arg(100)->Arg(10000);
BENCHMARK(BM_FoldersDoNotCover)->Arg(1)->Arg(100)->Arg(10000);
BENCHMARK(BM_PathBelongs)->Arg(1)->Arg(100)->Arg(10000);
BENCHMARK(BM_PathDoesNotBelong)->Arg(1)->Arg(100)->Arg(10000);
BENCHMARK(BM_MountOfAPath)->Arg(1);
BENCHMARK(BM_HomeOfAPath)->Arg(1);

}  // namespace

BENCHMARK_MAIN();
