// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/completion.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

#include "cli/verbs.h"
#include "process.h"
#include "scratch.h"

namespace mediidx::tool {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::IsSupersetOf;

using Words = std::vector<std::string>;

Words lines_of(const std::string& text) {
  Words out;
  std::istringstream in(text);
  for (std::string line; std::getline(in, line);) out.push_back(line);
  return out;
}

/// What bash offers for the last of these words, with the helpers of its own completions or
/// without.
Words offered(const Words& words, bool with_helpers = false) {
  const test::ScratchFolder folder;
  const auto script = folder.write("completion", bash_completion(verbs()));
  Words arguments{"/bin/bash",
                  "-c",
                  std::string(with_helpers ? "source " MEDIIDX_BASH_COMPLETION "; " : "") +
                      "source \"$1\"; shift; COMP_WORDS=(\"$@\"); COMP_CWORD=$(($# - 1)); "
                      "_mediidx; [ \"${#COMPREPLY[@]}\" -eq 0 ] || printf '%s\\n' "
                      "\"${COMPREPLY[@]}\"",
                  "bash",
                  script,
                  "mediidx"};
  arguments.insert(arguments.end(), words.begin(), words.end());
  EXPECT_EQ(run_program(arguments, folder.at("output"), std::nullopt), 0);
  return lines_of(folder.read("output"));
}

TEST(BashCompletion, OffersVerbs) {
  EXPECT_THAT(offered({"sc"}), ElementsAre("scan"));
  EXPECT_THAT(offered({""}), IsSupersetOf({"index", "scan", "db", "help"}));
  EXPECT_THAT(offered({"help", "sta"}), ElementsAre("status", "stats"));
}

TEST(BashCompletion, OffersTheSecondWordsOfVerbs) {
  EXPECT_THAT(offered({"db", ""}), ElementsAre("init", "vacuum", "reset", "shell"));
  EXPECT_THAT(offered({"--data-dir", "/d", "rating", "ex"}), ElementsAre("export"));
}

TEST(BashCompletion, OffersTheOptionsOfTheVerb) {
  EXPECT_THAT(offered({"scan", "--f"}), ElementsAre("--full", "--full-speed"));
  EXPECT_THAT(offered({"folder", "set", "/a", "--no-m"}), ElementsAre("--no-music"));
  EXPECT_THAT(offered({"--"}), ElementsAre("--data-dir", "--help"));
}

TEST(BashCompletion, OffersWhatAnOperandOrAValueCanBe) {
  EXPECT_THAT(offered({"list", "al"}), ElementsAre("albums"));
  EXPECT_THAT(offered({"scan", "--progress", ""}), ElementsAre("json"));
  EXPECT_THAT(offered({"completion", "z"}), ElementsAre("zsh"));
}

class FoldersForBash : public testing::TestWithParam<bool> {
 protected:
  Words offered(const Words& words) { return tool::offered(words, GetParam()); }

  test::ScratchFolder folder;
};
INSTANTIATE_TEST_SUITE_P(WithAndWithoutHelpers, FoldersForBash, testing::Bool());

TEST_P(FoldersForBash, AreOfferedWhereFoldersAreWanted) {
  const auto music = folder.make_folder("My Music");
  folder.write("My file", "");
  EXPECT_THAT(offered({"index", folder.at("My")}), ElementsAre(music));
  EXPECT_THAT(offered({"index", "/elsewhere", folder.at("My")}), ElementsAre(music));
  EXPECT_THAT(offered({"share", "add", "name", folder.at("My")}), ElementsAre(music));
  EXPECT_THAT(offered({"--data-dir", folder.at("My")}), ElementsAre(music));
  EXPECT_THAT(offered({"--data-dir", "=", folder.at("My")}), ElementsAre(music));
}

TEST_P(FoldersForBash, AreOfferedWithFilesWherePathsAreWanted) {
  const auto list = folder.write("list.m3u", "");
  EXPECT_THAT(offered({"playlist", "show", folder.at("li")}), ElementsAre(list));
  EXPECT_THAT(offered({"show", folder.at("li")}), ElementsAre(list));
}

TEST(BashCompletion, OffersNothingWhereNothingIsKnown) {
  EXPECT_THAT(offered({"search", ""}), IsEmpty());
  EXPECT_THAT(offered({"share", "add", ""}), IsEmpty());
  EXPECT_THAT(offered({"stats", ""}), IsEmpty());
  EXPECT_THAT(offered({"watch", "--interval", ""}), IsEmpty());
  EXPECT_THAT(offered({"no-such-verb", ""}), IsEmpty());
}

TEST(ZshCompletion, IsWithoutErrors) {
  const test::ScratchFolder folder;
  const auto script = folder.write("_mediidx", zsh_completion(verbs()));
  EXPECT_EQ(run_program({"/bin/zsh", "-n", script}, folder.at("output"), std::nullopt), 0);
  EXPECT_EQ(folder.read("output"), "");
}

TEST(ZshCompletion, HasEveryVerbWithItsOptions) {
  const auto script = zsh_completion(verbs());
  for (const auto& verb : verbs()) {
    const std::string name = verb.name;
    const auto begin = script.find("\n" + name.substr(name.find(' ') + 1) + ")\n");
    ASSERT_NE(begin, std::string::npos) << name;
    for (const auto& option : verb.options) {
      EXPECT_NE(script.find("'" + std::string(option.name), begin), std::string::npos)
          << name << " " << option.name;
    }
  }
}

}  // namespace
}  // namespace mediidx::tool
