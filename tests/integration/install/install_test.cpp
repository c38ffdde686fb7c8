// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// What is installed serves programs of other projects: the examples are built with it, and run.
#include <gtest/gtest.h>
#include <stdlib.h>
#include <tavocore.h>

#include <cstdio>
#include <string>
#include <vector>

#include "database.h"
#include "mediidx/database.h"
#include "mediidx/index_folder.h"
#include "process.h"

namespace mediidx::test {
namespace {

/// The build installed into a folder of its own, once for all tests.
class AnInstalledTree : public DatabaseTest {
 protected:
  static void SetUpTestSuite() {
    tree_ = new ScratchFolder;
    run({MEDIIDX_CMAKE, "--install", MEDIIDX_BUILD, "--prefix", tree_->path()});
    const auto libraries = tree_->at(MEDIIDX_LIBDIR);
    setenv("LD_LIBRARY_PATH", libraries.c_str(), 1);
    setenv("PKG_CONFIG_PATH", (libraries + "/pkgconfig").c_str(), 1);
    setenv("CFLAGS", MEDIIDX_SANITIZE_FLAG, 1);
    setenv("CXXFLAGS", MEDIIDX_SANITIZE_FLAG, 1);
  }
  static void TearDownTestSuite() {
    for (const auto* name : {"LD_LIBRARY_PATH", "PKG_CONFIG_PATH", "CFLAGS", "CXXFLAGS"}) {
      unsetenv(name);
    }
    delete tree_;
    tree_ = nullptr;
  }

  static void run(const std::vector<std::string>& arguments) {
    const auto log = tree_->at("log");
    EXPECT_EQ(tool::run_program(arguments, log, std::nullopt), 0) << tree_->read("log");
  }

  /// What a program prints; it has to succeed.
  static std::string output_of(const std::string& program, const std::string& first = {},
                               const char* second = nullptr, const char* third = nullptr) {
    std::FILE* output = TLIBCPopen(program.c_str(), "r", first.c_str(), second, third, nullptr);
    if (!output) return "not started: " + program;
    std::string text;
    for (int c = std::fgetc(output); c != EOF; c = std::fgetc(output)) text += static_cast<char>(c);
    EXPECT_EQ(TLIBCPclose(output), 0) << program;
    return text;
  }

  /// The examples, built into `programs`, on a share that is chosen for indexing.
  void expect_working_examples(const std::string& programs) {
    setenv("MEDIIDX_ROOT", root.path().c_str(), 1);
    const auto folder = root.make_folder("/volume1/music");
    root.index_everything("music", folder);
    const auto song = root.write("/volume1/music/song.mp3", "");
    const auto other = root.write("/volume1/music/other.mp3", "");
    const auto list = root.write("/volume1/music/list.m3u", "song.mp3\nother.mp3\n");

    EXPECT_EQ(output_of(programs + "/coverage", song.c_str(), "/elsewhere"),
              "1 folders\n" + song + ": music video photo\n/elsewhere:\n");
    const auto indexed = output_of(programs + "/index_file", song, "A Title", "An Artist");
    EXPECT_EQ(indexed, "row " + value("SELECT id FROM track") + "\nA Title by An Artist\n");
    EXPECT_EQ(output_of(programs + "/read_playlist", list),
              "2 entries\n" + song + " A Title\n" + other + " (not in the index)\n");
    unsetenv("MEDIIDX_ROOT");
  }

  static ScratchFolder* tree_;
};
ScratchFolder* AnInstalledTree::tree_ = nullptr;

TEST_F(AnInstalledTree, ServesProgramsThatFindItByPkgConfig) {
  const ScratchFolder programs;
  // Make takes no blank in a path, which the source tree may have.
  std::filesystem::copy(MEDIIDX_EXAMPLES, programs.path());
  run({MEDIIDX_MAKE, "-C", programs.path(), "CC=" MEDIIDX_CC, "CXX=" MEDIIDX_CXX,
       "PKG_CONFIG=" MEDIIDX_PKG_CONFIG});
  expect_working_examples(programs.path());
}

TEST_F(AnInstalledTree, ServesProgramsThatFindItByCMake) {
  const ScratchFolder programs;
  run({MEDIIDX_CMAKE, "-S", MEDIIDX_EXAMPLES, "-B", programs.path(), "-G", "Ninja",
       "-DCMAKE_PREFIX_PATH=" + tree_->path().string(), "-DCMAKE_C_COMPILER=" MEDIIDX_CC,
       "-DCMAKE_CXX_COMPILER=" MEDIIDX_CXX});
  run({MEDIIDX_CMAKE, "--build", programs.path()});
  expect_working_examples(programs.path());
}

TEST_F(AnInstalledTree, HasACommandThatFindsItsLibrariesAndItsConverter) {
  unsetenv("LD_LIBRARY_PATH");
  EXPECT_EQ(output_of(tree_->at("bin/mediidx"), "version").substr(0, 8), "mediidx ");
  const ScratchFolder data;
  output_of(tree_->at("bin/mediidx"), "share", "list", ("--data-dir=" + data.at("data")).c_str());
  EXPECT_EQ(std::filesystem::read_symlink(data.at("data/root/usr/bin/php")),
            tree_->at("libexec/mediidx/mediidx-iconv"));
  setenv("LD_LIBRARY_PATH", tree_->at(MEDIIDX_LIBDIR).c_str(), 1);
}

}  // namespace
}  // namespace mediidx::test
