// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The converter of cue sheets as a program of its own.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "command.h"

namespace mediidx::test {
namespace {

using testing::HasSubstr;

class Converter : public testing::Test {
 protected:
  static Outcome run(const std::vector<std::string>& arguments, Setting setting = {}) {
    setting.program = MEDIIDX_CONVERTER;
    return run_mediidx(arguments, setting);
  }
  OpenFolder folder;
};

TEST_F(Converter, TakesTheInterpretersWholeCommandLine) {
  const auto file = folder.write("--from it's.cue", "TITLE \"\x96\xE9\x82\xCC\x8D\x60\"\r\n");
  const auto done = run({"-n", "-d", "extension_dir=/lib/php/modules", "-d", "extension=iconv.so",
                         "/var/packages/Cantivo/target/scripts/phpiconv", "--from", "CP932", "--to",
                         "UTF-8", file});
  EXPECT_EQ(done.out, "TITLE \"夜の港\"\r\n");
  EXPECT_EQ(done.err, "");
  EXPECT_EQ(done.status, 0);
}

TEST_F(Converter, ConvertsAFileOfManyBuffers) {
  std::string latin;
  std::string utf8;
  for (int i = 0; i < 70'000; ++i) {
    latin += "a\xE9";
    utf8 += "aé";
  }
  const auto file = folder.write("a.cue", latin);
  EXPECT_EQ(run({"script", "--from", "CP1252", "--to", "UTF-8", file}).out, utf8);
}

TEST_F(Converter, GivesNothingForAnEmptyFile) {
  const auto done =
      run({"script", "--from", "UCS-2LE", "--to", "UTF-8", folder.write("a.cue", "")});
  EXPECT_EQ(done.out, "");
  EXPECT_EQ(done.status, 0);
}

TEST_F(Converter, GivesNothingOfAnUnknownCharacterSet) {
  const auto file = folder.write("a.cue", "TITLE x\n");
  const auto done = run({"script", "--from", "NO-SUCH-SET", "--to", "UTF-8", file});
  EXPECT_EQ(done.out, "");
  EXPECT_EQ(done.err, file + ": no conversion from NO-SUCH-SET to UTF-8\n");
  EXPECT_EQ(done.status, 1);
}

TEST_F(Converter, FailsForAFileThatIsNotThere) {
  const auto done = run({"script", "--from", "CP932", "--to", "UTF-8", folder.at("none.cue")});
  EXPECT_EQ(done.out, "");
  EXPECT_THAT(done.err, HasSubstr("none.cue: No such file or directory"));
  EXPECT_EQ(done.status, 1);
}

TEST_F(Converter, FailsWhenNobodyReadsIt) {
  const auto file = folder.write("a.cue", std::string(1'000'000, 'x'));
  Setting nobody;
  nobody.reader_gone = true;
  EXPECT_NE(run({"script", "--from", "ASCII", "--to", "UTF-8", file}, nobody).status, 0);
}

TEST_F(Converter, SaysHowItIsUsed) {
  for (const auto& arguments : std::vector<std::vector<std::string>>{
           {}, {"script"}, {"script", "--from", "CP932"}, {"script", "--to", "UTF-8", "a.cue"}}) {
    const auto done = run(arguments);
    EXPECT_EQ(done.status, 2);
    EXPECT_EQ(done.out, "");
    EXPECT_THAT(done.err, HasSubstr("usage: "));
  }
}

}  // namespace
}  // namespace mediidx::test
