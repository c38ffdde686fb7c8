// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/arguments.h"

#include <gtest/gtest.h>

#include "cli/verbs.h"

namespace mediidx::tool {
namespace {

Arguments parse(const std::vector<std::string>& words) { return parse_arguments(verbs(), words); }

/// The reason why words are refused; empty when they are not.
std::string refusal(const std::vector<std::string>& words) {
  try {
    parse(words);
  } catch (const UsageError& error) {
    return error.what();
  }
  return {};
}

TEST(ACommandLine, HasAVerbAndItsOperands) {
  const auto arguments = parse({"index", "/a", "/b"});
  EXPECT_STREQ(arguments.verb->name, "index");
  EXPECT_EQ(arguments.operands, (std::vector<std::string>{"/a", "/b"}));
}

TEST(ACommandLine, MayHaveAVerbOfTwoWords) {
  EXPECT_STREQ(parse({"db", "init"}).verb->name, "db init");
}

TEST(ACommandLine, TakesOptionsAnywhere) {
  const auto before = parse({"--data-dir", "/d", "list", "--json", "music"});
  EXPECT_EQ(before.value("--data-dir"), "/d");
  EXPECT_TRUE(before.has("--json"));
  EXPECT_EQ(before.operands, std::vector<std::string>{"music"});
  EXPECT_EQ(parse({"list", "music", "--data-dir=/e"}).value("--data-dir"), "/e");
}

TEST(ACommandLine, TakesWhatFollowsTwoDashesAsItStands) {
  EXPECT_EQ(parse({"index", "--", "--data-dir"}).operands, std::vector<std::string>{"--data-dir"});
}

TEST(ACommandLine, MayAskForHelpWithoutOperands) {
  EXPECT_TRUE(parse({"index", "--help"}).has("--help"));
  EXPECT_TRUE(parse({"-h"}).has("--help"));
  EXPECT_EQ(parse({"--help"}).verb, nullptr);
}

struct RefusedCase {
  const char* name;
  std::vector<std::string> words;
  const char* reason;
};
class ARefusedCommandLine : public testing::TestWithParam<RefusedCase> {};
TEST_P(ARefusedCommandLine, SaysWhy) { EXPECT_EQ(refusal(GetParam().words), GetParam().reason); }
INSTANTIATE_TEST_SUITE_P(
    Cases, ARefusedCommandLine,
    testing::Values(
        RefusedCase{"UnknownVerb", {"frobnicate"}, "unknown verb \"frobnicate\""},
        RefusedCase{"HalfAVerb", {"db"}, "unknown verb \"db\""},
        RefusedCase{"UnknownOption", {"index", "--fast", "/a"}, "unknown option --fast"},
        RefusedCase{"OptionOfAnother", {"index", "--json", "/a"}, "index does not take --json"},
        RefusedCase{"NoFolder", {"index"}, "index needs FOLDER..."},
        RefusedCase{"NothingToList",
                    {"list"},
                    "list needs music|albums|artists|genres|photos|videos|playlists|folders"},
        RefusedCase{"UnknownList",
                    {"list", "songs"},
                    "list does not know \"songs\", only "
                    "music|albums|artists|genres|photos|videos|playlists|folders"},
        RefusedCase{"TooMuch", {"list", "music", "photos"}, "list does not take \"photos\""},
        RefusedCase{"NoValue", {"list", "music", "--data-dir"}, "--data-dir needs DIR"},
        RefusedCase{"EmptyValue", {"list", "music", "--data-dir="}, "--data-dir needs DIR"},
        RefusedCase{"NeedlessValue", {"list", "music", "--json=1"}, "--json takes no value"}),
    [](const auto& test) { return test.param.name; });

TEST(TheHelp, NamesEveryVerb) {
  const auto help = general_help(verbs());
  for (const auto& verb : verbs()) {
    EXPECT_NE(help.find(std::string("  mediidx ") + verb.name), std::string::npos) << verb.name;
  }
}

TEST(TheHelp, OfAVerbNamesItsOptions) {
  for (const auto& verb : verbs()) {
    const auto help = verb_help(verb);
    for (const auto& option : verb.options) EXPECT_NE(help.find(option.name), std::string::npos);
    EXPECT_NE(help.find("--data-dir DIR"), std::string::npos);
  }
}

TEST(TheHelp, FitsATerminal) {
  const auto help = general_help(verbs());
  for (std::size_t begin = 0; begin < help.size();) {
    const auto end = help.find('\n', begin);
    EXPECT_LE(end - begin, 100U) << help.substr(begin, end - begin);
    begin = end + 1;
  }
}

}  // namespace
}  // namespace mediidx::tool
