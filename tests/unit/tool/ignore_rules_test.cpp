// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/ignore_rules.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "process.h"
#include "scratch.h"

namespace mediidx::tool {
namespace {

using testing::AnyOf;

struct IgnoreFile {
  std::string folder;  ///< Below the root, "" for the root itself.
  std::string text;
};
using IgnoreFiles = std::vector<IgnoreFile>;

IgnoreRules rules_of(const IgnoreFiles& files, const std::string& root = "/volume1/music") {
  IgnoreRules rules(root);
  for (const auto& [folder, text] : files) {
    rules.add(folder.empty() ? root : root + "/" + folder, text);
  }
  return rules;
}

bool ignores(const IgnoreRules& rules, const std::string& path, bool is_folder = false) {
  return rules.ignores("/volume1/music/" + path, is_folder);
}

/// Asks git about the same files, under its own name for them, in a tree of real ones.
class Git {
 public:
  explicit Git(const IgnoreFiles& files) {
    // Nothing of this user's or machine's settings, nor of a hook that this may run in.
    setenv("GIT_CONFIG_GLOBAL", "/dev/null", 1);
    setenv("GIT_CONFIG_NOSYSTEM", "1", 1);
    unsetenv("GIT_DIR");
    unsetenv("GIT_WORK_TREE");
    EXPECT_EQ(run({"init", "--quiet", "--template="}), 0);
    for (const auto& [folder, text] : files) {
      tree_.write("tree/" + (folder.empty() ? "" : folder + "/") + ".gitignore", text);
    }
  }

  /// Makes the file, or the folder where the path ends in a slash.
  void make(const std::string& path) const {
    if (path.ends_with('/')) {
      tree_.make_folder("tree/" + path);
    } else {
      tree_.write("tree/" + path, "x");
    }
  }
  bool ignores(const std::string& path) const {
    // With a slash at the end it would be another path to git.
    const int status = run({"check-ignore", "--quiet", "--no-index", "--",
                            path.substr(0, path.size() - (path.ends_with('/') ? 1 : 0))});
    EXPECT_THAT(status, AnyOf(0, 1)) << tree_.read("log");
    return status == 0;
  }
  /// Those of the paths, which have no odd characters, that git ignores, a line each.
  std::string ignored(std::vector<std::string> paths) const {
    std::vector<std::string> arguments = {"-c", "core.quotePath=off", "check-ignore", "--no-index",
                                          "--"};
    arguments.insert(arguments.end(), paths.begin(), paths.end());
    std::filesystem::remove(tree_.at("log"));
    EXPECT_THAT(run(std::move(arguments)), AnyOf(0, 1)) << tree_.read("log");
    return tree_.read("log");
  }

 private:
  int run(std::vector<std::string> arguments) const {
    std::vector<std::string> all = {MEDIIDX_GIT, "-C", tree_.make_folder("tree")};
    all.insert(all.end(), arguments.begin(), arguments.end());
    return run_program(all, tree_.at("log"), std::nullopt);
  }

  test::ScratchFolder tree_;
};

struct IgnoreCase {
  const char* name;
  IgnoreFiles files;
  const char* path;  ///< Of a folder when it ends in a slash.
  bool ignored;
};

void PrintTo(const IgnoreCase& test, std::ostream* out) { *out << test.name; }
std::string name_of(const testing::TestParamInfo<IgnoreCase>& test) { return test.param.name; }

class APathUnderRules : public testing::TestWithParam<IgnoreCase> {};

TEST_P(APathUnderRules, IsLeftOutAsGitDoes) {
  const auto& [name, files, asked, ignored] = GetParam();
  std::string path = asked;
  const bool is_folder = path.ends_with('/');
  const Git git(files);
  git.make(path);
  EXPECT_EQ(git.ignores(path), ignored) << "git is of another opinion";
  if (is_folder) path.pop_back();
  EXPECT_EQ(ignores(rules_of(files), path, is_folder), ignored);
}

INSTANTIATE_TEST_SUITE_P(
    OfOneFile, APathUnderRules,
    testing::Values(
        IgnoreCase{"ANameAnywhere", {{"", "a.mp3\n"}}, "x/y/a.mp3", true},
        IgnoreCase{"ANameAtTheTop", {{"", "a.mp3\n"}}, "a.mp3", true},
        IgnoreCase{"AnotherName", {{"", "a.mp3\n"}}, "x/ba.mp3", false},
        IgnoreCase{"WithoutALineEnd", {{"", "a.mp3"}}, "a.mp3", true},
        IgnoreCase{"ANameOfAFolder", {{"", "a\n"}}, "x/a/", true},
        IgnoreCase{"WhatIsBelowAFolder", {{"", "a\n"}}, "x/a/b/c.mp3", true},
        IgnoreCase{"CaseCounts", {{"", "a.mp3\n"}}, "A.mp3", false},
        IgnoreCase{"AnAnchorAtTheTop", {{"", "/a.mp3\n"}}, "a.mp3", true},
        IgnoreCase{"AnAnchorFurtherDown", {{"", "/a.mp3\n"}}, "x/a.mp3", false},
        IgnoreCase{"ASlashInside", {{"", "x/a.mp3\n"}}, "x/a.mp3", true},
        IgnoreCase{"ASlashInsideAnchors", {{"", "x/a.mp3\n"}}, "y/x/a.mp3", false},
        IgnoreCase{"TwoSlashesInFront", {{"", "//a.mp3\n"}}, "a.mp3", false},
        IgnoreCase{"TwoSlashesBehind", {{"", "a//\n"}}, "a/", false},
        IgnoreCase{"ASlashAlone", {{"", "/\n"}}, "a/", false},
        IgnoreCase{"FoldersOnlyForAFolder", {{"", "a/\n"}}, "x/a/", true},
        IgnoreCase{"FoldersOnlyForAFile", {{"", "a/\n"}}, "x/a", false},
        IgnoreCase{"FoldersOnlyForAFileAtTheTop", {{"", "a/\n"}}, "a", false},
        IgnoreCase{"FoldersOnlyForWhatIsBelow", {{"", "a/\n"}}, "x/a/b", true},
        IgnoreCase{"AnAnchoredFolder", {{"", "/x/a/\n"}}, "x/a/", true},
        IgnoreCase{"AnAnchoredFolderIsNoFile", {{"", "/x/a/\n"}}, "x/a", false},
        IgnoreCase{"AStar", {{"", "*.tmp.mp3\n"}}, "x/1.tmp.mp3", true},
        IgnoreCase{"AStarAlone", {{"", "*\n"}}, "a", true},
        IgnoreCase{"AStarStopsAtASlash", {{"", "x/*.mp3\n"}}, "x/y/a.mp3", false},
        IgnoreCase{"AQuestionMark", {{"", "a?.mp3\n"}}, "a1.mp3", true},
        IgnoreCase{"AQuestionMarkIsOneCharacter", {{"", "a?\n"}}, "a", false},
        IgnoreCase{"AQuestionMarkIsNoTwo", {{"", "a?\n"}}, "abc", false},
        IgnoreCase{"AClass", {{"", "[a-c]1\n"}}, "b1", true},
        IgnoreCase{"OutsideAClass", {{"", "[a-c]1\n"}}, "d1", false},
        IgnoreCase{"ANegatedClass", {{"", "[!a]1\n"}}, "b1", true},
        IgnoreCase{"ANamedClass", {{"", "[[:digit:]].mp3\n"}}, "7.mp3", true},
        IgnoreCase{"AClassIsNoSlash", {{"", "x[/]a\n"}}, "x/a", false},
        IgnoreCase{"AnOpenClass", {{"", "a[b\n"}}, "ab", false},
        IgnoreCase{"AnOpenClassIsNoText", {{"", "a[b\n"}}, "a[b", false},
        IgnoreCase{"AnOpenClassForAFolder", {{"", "a[b/\n"}}, "ab/", false},
        IgnoreCase{"TwoStarsInFrontAtTheTop", {{"", "**/a\n"}}, "a", true},
        IgnoreCase{"TwoStarsInFrontFurtherDown", {{"", "**/a\n"}}, "x/y/a", true},
        IgnoreCase{"TwoStarsBehind", {{"", "x/**\n"}}, "x/a", true},
        IgnoreCase{"TwoStarsBehindFurtherDown", {{"", "x/**\n"}}, "x/y/z/a", true},
        IgnoreCase{"TwoStarsBehindNotTheFolder", {{"", "x/**\n"}}, "x/", false},
        IgnoreCase{"TwoStarsBehindWin", {{"", "x/**\n!x/y/\n"}}, "x/y/a", true},
        IgnoreCase{"TwoStarsBehindForFolders", {{"", "x/**/\n"}}, "x/y/", true},
        IgnoreCase{"TwoStarsBehindForNoFile", {{"", "x/**/\n"}}, "x/a", false},
        IgnoreCase{"TwoStarsBetweenNothing", {{"", "x/**/a\n"}}, "x/a", true},
        IgnoreCase{"TwoStarsBetweenFolders", {{"", "x/**/a\n"}}, "x/y/z/a", true},
        IgnoreCase{"TwoStarsInAName", {{"", "x/a**b\n"}}, "x/a/b", false},
        IgnoreCase{"TwoStarsBehindPlainText", {{"", "a**/b\n"}}, "ab", true},
        IgnoreCase{"TwoStarsBehindPlainTextAndFolders", {{"", "a**/b\n"}}, "a/x/b", true},
        IgnoreCase{"TwoStarsBehindAStar", {{"", "?a**/b\n"}}, "xa/y/b", false},
        IgnoreCase{"TwoStarsAlone", {{"", "**\n"}}, "x/a", true},
        IgnoreCase{"ThreeStarsBehind", {{"", "x/***\n"}}, "x/y/a", true},
        IgnoreCase{"TakenBack", {{"", "*.mp3\n!a.mp3\n"}}, "x/a.mp3", false},
        IgnoreCase{"TakenBackTooEarly", {{"", "!a.mp3\n*.mp3\n"}}, "x/a.mp3", true},
        IgnoreCase{"TakenBackByAnAnchor", {{"", "a\n!/x/a\n"}}, "x/a", false},
        IgnoreCase{"TakenBackElsewhere", {{"", "a\n!/x/a\n"}}, "y/a", true},
        IgnoreCase{"TakenBackAndNotAgain", {{"", "a\n!a\na\n"}}, "a", true},
        IgnoreCase{"NotTakenBackBelowAFolder", {{"", "x\n!x/a\n"}}, "x/a", true},
        IgnoreCase{"TakenBackInAListedFolder", {{"", "x/*\n!x/a\n"}}, "x/a", false},
        IgnoreCase{"TakenBackAsAFolder", {{"", "*\n!*/\n"}}, "x/", false},
        IgnoreCase{"TakenBackOnlyAsAFolder", {{"", "*\n!*/\n"}}, "x/a", true},
        IgnoreCase{"AllButOneKind", {{"", "*\n!*/\n!*.mp3\n"}}, "x/y/a.mp3", false},
        IgnoreCase{"AMarkOfExclamationKept", {{"", "\\!a\n"}}, "!a", true},
        IgnoreCase{"TwoMarksOfExclamation", {{"", "*\n!!a\n"}}, "!a", false},
        IgnoreCase{"AMarkAlone", {{"", "a\n!\n"}}, "a", true},
        IgnoreCase{"AComment", {{"", "#a\n"}}, "#a", false},
        IgnoreCase{"AHashKept", {{"", "\\#a\n"}}, "#a", true},
        IgnoreCase{"AHashInside", {{"", "a#b\n"}}, "a#b", true},
        IgnoreCase{"AHashBehindABlank", {{"", " #a\n"}}, " #a", true},
        IgnoreCase{"AnEmptyLine", {{"", "\n\n"}}, "a", false},
        IgnoreCase{"ABackslashForAStar", {{"", "\\*\n"}}, "a", false},
        IgnoreCase{"ABackslashForAStarItself", {{"", "\\*\n"}}, "*", true},
        IgnoreCase{"ABackslashForALetter", {{"", "\\a\n"}}, "a", true},
        IgnoreCase{"ABackslashItself", {{"", "a\\\\b\n"}}, "a\\b", true},
        IgnoreCase{"ABackslashAtTheEnd", {{"", "a\\\n"}}, "a", false},
        IgnoreCase{"ABackslashAtTheEndItself", {{"", "a\\\n"}}, "a\\", false},
        IgnoreCase{"TwoBackslashesAtTheEnd", {{"", "a\\\\\n"}}, "a\\", true},
        IgnoreCase{"ABackslashBeforeTheLastSlash", {{"", "a\\/\n"}}, "a/", false},
        IgnoreCase{"BlanksAtTheEnd", {{"", "a  \n"}}, "a", true},
        IgnoreCase{"BlanksAtTheEndKept", {{"", "a\\ \n"}}, "a ", true},
        IgnoreCase{"BlanksBehindAKeptOne", {{"", "a\\   \n"}}, "a ", true},
        IgnoreCase{"BlanksBehindABackslash", {{"", "a\\\\ \n"}}, "a\\", true},
        IgnoreCase{"BlanksInFront", {{"", "  a\n"}}, "a", false},
        IgnoreCase{"BlanksInFrontCount", {{"", "  a\n"}}, "  a", true},
        IgnoreCase{"BlanksInside", {{"", "a b\n"}}, "a b", true},
        IgnoreCase{"BlanksAlone", {{"", "   \n"}}, "   ", false},
        IgnoreCase{"ATabAtTheEnd", {{"", "a\t\n"}}, "a", false},
        IgnoreCase{"ATabAtTheEndCounts", {{"", "a\t\n"}}, "a\t", true},
        IgnoreCase{"BlanksBehindTheLastSlash", {{"", "a/ \n"}}, "a", false},
        IgnoreCase{"LinesOfOtherSystems", {{"", "a\r\nb/\r\n"}}, "x/a", true},
        IgnoreCase{"FoldersInLinesOfOtherSystems", {{"", "a\r\nb/\r\n"}}, "b/", true},
        IgnoreCase{"ACarriageReturnInside", {{"", "a\rb\n"}}, "a\rb", true},
        IgnoreCase{"AVerticalTab", {{"", "a\vb\n"}}, "a\vb", true},
        IgnoreCase{"AVerticalTabEndsNoLine", {{"", "a\vb\n"}}, "b", false},
        IgnoreCase{"AFormFeed", {{"", "a\f\n"}}, "a\f", true},
        IgnoreCase{"AByteOrderMark",
                   {{"",
                     "\xEF\xBB\xBF"
                     "a\n"}},
                   "a",
                   true},
        IgnoreCase{"ABackslashAndABlankInside", {{"", "a\\ b\n"}}, "a b", true},
        IgnoreCase{"LettersOfTwoBytes", {{"", "é*.mp3\n"}}, "x/tété.mp3", false},
        IgnoreCase{"LettersOfTwoBytesMatch", {{"", "é*.mp3\n"}}, "x/éa.mp3", true},
        IgnoreCase{"BytesOfAName", {{"", "??\n"}}, "é", true},
        IgnoreCase{"ALineEndInAName", {{"", "a?b\n"}}, "a\nb", true},
        IgnoreCase{"AClassWithABracket", {{"", "[]a]\n"}}, "]", true},
        IgnoreCase{"AClassOfARangeAcrossTheSlash", {{"", "x[+-9]a\n"}}, "x/a", false},
        IgnoreCase{"AClassOfARange", {{"", "x[+-9]a\n"}}, "x0a", true},
        IgnoreCase{"AClassOfARangeBackwards", {{"", "[9-0]\n"}}, "5", false},
        IgnoreCase{"AClassThatEndsInADash", {{"", "[a-]\n"}}, "-", true},
        IgnoreCase{"AClassWithABackslash", {{"", "[\\]]\n"}}, "]", true},
        IgnoreCase{"AClassWithACaret", {{"", "[^a]\n"}}, "b", true},
        IgnoreCase{"ANamedClassNegated", {{"", "[![:alpha:]_]\n"}}, "_", false},
        IgnoreCase{"ANamedClassBetweenOthers", {{"", "[a[:digit:]b]\n"}}, "b", true},
        IgnoreCase{"NoNamedClass", {{"", "[[:word:]]\n"}}, "w", false},
        IgnoreCase{"ANamedClassLeftOpen", {{"", "[[:digit]\n"}}, "t", true},
        IgnoreCase{"RegularExpressions", {{"", "a.(b|c)+{2}$\n"}}, "a.(b|c)+{2}$", true},
        IgnoreCase{"RegularExpressionsAreNone", {{"", "a.b\n"}}, "axb", false}),
    name_of);

INSTANTIATE_TEST_SUITE_P(
    OfNestedFiles, APathUnderRules,
    testing::Values(
        IgnoreCase{"TheDeeperOneIgnores", {{"x", "a\n"}}, "x/y/a", true},
        IgnoreCase{"TheDeeperOneIsNotForOthers", {{"x", "a\n"}}, "y/a", false},
        IgnoreCase{"NorForItsOwnFolder", {{"x", "x\n"}}, "x/", false},
        IgnoreCase{"ItsAnchorIsItsFolder", {{"x", "/a\n"}}, "x/a", true},
        IgnoreCase{"ItsAnchorIsNotTheTop", {{"x", "/a\n"}}, "x/x/a", false},
        IgnoreCase{"ItsSlashInside", {{"x", "y/a\n"}}, "x/y/a", true},
        IgnoreCase{"TheDeeperOneTakesBack", {{"", "*.mp3\n"}, {"x", "!a.mp3\n"}}, "x/a.mp3", false},
        IgnoreCase{"AndNotForOthers", {{"", "*.mp3\n"}, {"x", "!a.mp3\n"}}, "a.mp3", true},
        IgnoreCase{"TheDeeperOneWins", {{"", "!a\n"}, {"x", "a\n"}}, "x/a", true},
        IgnoreCase{
            "TheDeepestOfThree", {{"", "a\n"}, {"x", "!a\n"}, {"x/y", "a\n"}}, "x/y/a", true},
        IgnoreCase{
            "TheMiddleOfThree", {{"", "a\n"}, {"x", "!a\n"}, {"x/y", "b\n"}}, "x/y/a", false},
        IgnoreCase{
            "BelowAnIgnoredFolderNothingIsTakenBack", {{"", "x/\n"}, {"x", "!a\n"}}, "x/a", true},
        IgnoreCase{"NorByAnythingFurtherDown", {{"", "x/\n"}, {"x/y", "!*\n"}}, "x/y/a", true},
        IgnoreCase{"AFolderTakenBack", {{"", "y\n"}, {"x", "!y/\n"}}, "x/y/a", false},
        IgnoreCase{"AFolderOfWildcards", {{"[a]*?", "b\n"}}, "[a]*?/b", true},
        IgnoreCase{"AFolderLikeWildcards", {{"[a]*?", "b\n"}}, "aaa/b", false},
        IgnoreCase{"AFolderWithABackslash", {{"a\\*", "/b\n"}}, "a\\*/b", true},
        IgnoreCase{"AFolderWithABlank", {{"a ", "b\n"}}, "a /b", true},
        IgnoreCase{"AFolderWithAHash", {{"#a", "b\n"}}, "#a/b", true},
        IgnoreCase{"AFolderWithAMark", {{"!a", "b\n"}}, "!a/b", true},
        IgnoreCase{"AFolderWithALineEnd", {{"a\nb", "c\n"}}, "a\nb/c", true},
        IgnoreCase{"HalfAFolderWithALineEnd", {{"a\nb", "c\n"}}, "b/c", false},
        IgnoreCase{"AFolderThatBeginsAlike", {{"x", "a\n"}}, "xy/a", false}),
    name_of);

TEST(IgnoreRulesTest, AskNothingWithoutARule) {
  IgnoreRules rules("/volume1/music");
  EXPECT_TRUE(rules.is_empty());
  rules.add("/volume1/music", "# nothing\n\n");
  EXPECT_TRUE(rules.is_empty());
  EXPECT_FALSE(ignores(rules, "a.mp3"));
  rules.add("/volume1/music/x", "a.mp3\n");
  EXPECT_FALSE(rules.is_empty());
}

TEST(IgnoreRulesTest, HoldForTheRootOfTheFileSystem) {
  const auto rules = [] {
    IgnoreRules made("/");
    made.add("/", "/music/a.mp3\n");
    made.add("/video", "*.mkv\n");
    return made;
  }();
  EXPECT_TRUE(rules.ignores("/music/a.mp3", false));
  EXPECT_TRUE(rules.ignores("/video/x/a.mkv", false));
  EXPECT_FALSE(rules.ignores("/music/a.mkv", false));
}

TEST(IgnoreRulesTest, TakeFilesThatAreMetAfterAnAnswer) {
  auto rules = rules_of({{"", "*.mp3\n"}});
  EXPECT_TRUE(ignores(rules, "x/a.mp3"));
  EXPECT_FALSE(ignores(rules, "x", true));
  rules.add("/volume1/music/x", "!a.mp3\ny\n");
  EXPECT_FALSE(ignores(rules, "x/a.mp3"));
  EXPECT_TRUE(ignores(rules, "x/y/b.ogg"));
  EXPECT_TRUE(ignores(rules, "z/a.mp3"));
}

TEST(IgnoreRulesTest, PassOverLinesThatAreNotUtf8) {
  const auto rules = rules_of({{"", "caf\xE9*\n*\xFF\na\n"}});
  EXPECT_TRUE(ignores(rules, "a"));
  EXPECT_FALSE(ignores(rules, "b"));
}

TEST(IgnoreRulesTest, EndALineAtANullByte) {
  const auto rules = rules_of({{"", std::string("a\0b\nc\n", 6)}});
  EXPECT_TRUE(ignores(rules, "a"));
  EXPECT_FALSE(ignores(rules, "b"));
  EXPECT_TRUE(ignores(rules, "c"));
}

TEST(IgnoreRulesTest, EndWithTheLastWholeLineOfAHugeFile) {
  std::string text = "first\n";
  text.resize(kIgnoreFileSize - 5, '#');
  const auto rules = rules_of({{"", text + "\na*b*c*last\nbeyond\n"}});
  EXPECT_TRUE(ignores(rules, "first"));
  EXPECT_FALSE(ignores(rules, "a"));
  EXPECT_FALSE(ignores(rules, "beyond"));
}

TEST(IgnoreRulesTest, BearALineAsLongAsTheFile) {
  const auto rules = rules_of({{"", std::string(kIgnoreFileSize - 3, 'a') + "\nb"}});
  EXPECT_TRUE(ignores(rules, "b"));
  EXPECT_FALSE(ignores(rules, "a"));
}

TEST(IgnoreRulesTest, TakeNoLongerForManyStars) {
  std::string many;
  for (int i = 0; i < 40; ++i) many += "*a";
  std::string deep;
  for (int i = 0; i < 20; ++i) deep += "**/*a*a/";
  const auto rules = rules_of({{"", many + "*b\n" + deep + "b\n"}});
  std::string path;
  for (int i = 0; i < 15; ++i) path += std::string(250, 'a') + "/";
  EXPECT_FALSE(ignores(rules, path + "a"));
  EXPECT_TRUE(ignores(rules, path + std::string(50, 'a') + "b"));
}

TEST(IgnoreRulesTest, BearMoreRulesThanCount) {
  std::string many;
  for (int i = 0; i < 6'000; ++i) many += "a" + std::to_string(i) + "\n";
  const auto rules = rules_of({{"", many}, {"x", many}, {"x/y", "b\n"}});
  EXPECT_TRUE(ignores(rules, "x/y/a5999"));
  EXPECT_FALSE(ignores(rules, "x/y/b"));
}

TEST(IgnoreRulesTest, BearAnyBytes) {
  std::mt19937 random(7);
  std::uniform_int_distribution<int> byte(0, 255);
  for (int round = 0; round < 50; ++round) {
    std::string text(2000, ' ');
    for (auto& c : text) c = static_cast<char>(byte(random));
    const auto rules = rules_of({{"", text + "\n/end\n"}});
    EXPECT_TRUE(ignores(rules, "end"));
  }
}

/// A text of pieces that mean something in a pattern.
std::string random_patterns(std::mt19937& random) {
  constexpr const char* kPieces[] = {"a",  "b",  "a",    "b",   "*", "**", "/",   "/",
                                     "\n", "\n", "\n!",  "?",   "!", " ",  "\\",  "\r\n",
                                     "#",  "[",  "[ab]", "[!a", "]", "/*", "**/", "/**"};
  std::uniform_int_distribution<std::size_t> piece(0, std::size(kPieces) - 1);
  std::string text;
  for (int i = 0; i < 12; ++i) text += kPieces[piece(random)];
  return text + "\n";
}

TEST(IgnoreRulesTest, AgreeWithGitOnRandomPatterns) {
  const std::vector<std::string> folders = {"x", "x/y", "aa", "*"};
  const std::vector<std::string> files = {"a",     "b",     "ab",   "[",     "x a",   "x/a", "x/b",
                                          "x/y/a", "x/y/b", "aa/a", "aa/bb", "a b/a", "*/b"};
  std::mt19937 random(20);
  for (int round = 0; round < 40; ++round) {
    const IgnoreFiles texts = {{"", random_patterns(random)},
                               {"x", random_patterns(random)},
                               {"x/y", random_patterns(random)}};
    const Git git(texts);
    const auto rules = rules_of(texts);
    std::string ours;
    std::vector<std::string> asked;
    for (const auto& folder : folders) {
      git.make(folder + "/");
      asked.push_back(folder);
      if (ignores(rules, folder, true)) ours += folder + "\n";
    }
    for (const auto& file : files) {
      git.make(file);
      asked.push_back(file);
      if (ignores(rules, file)) ours += file + "\n";
    }
    ASSERT_EQ(ours, git.ignored(asked)) << texts[0].text << "---\n"
                                        << texts[1].text << "---\n"
                                        << texts[2].text;
  }
}

}  // namespace
}  // namespace mediidx::tool
