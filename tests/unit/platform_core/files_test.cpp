// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <tavocore.h>

#include <array>
#include <filesystem>
#include <map>
#include <memory>
#include <string>

#include "temporary_folder.h"

namespace {

using mediidx::test::TemporaryFolder;

class AnExistingPath : public testing::Test {
 protected:
  void expect(const std::string& path, int file, int folder, int any) {
    EXPECT_EQ(IsFileExist(path.c_str(), 0), file) << path;
    EXPECT_EQ(IsDirExist(path.c_str()), folder) << path;
    EXPECT_EQ(TLIBCFileExist(path.c_str()), any) << path;
  }
  TemporaryFolder folder_;
};

TEST_F(AnExistingPath, IsAFileOrAFolder) {
  expect(folder_.write("file", ""), 1, 0, 1);
  expect(folder_.make_folder("folder"), 0, 1, 1);
  expect(folder_.at("missing"), 0, 0, 0);
  expect(folder_.at("file/below"), 0, 0, 0);
  expect("/dev/null", 1, 0, 1);
  expect("", 0, 0, 0);
}

TEST_F(AnExistingPath, IsWhatALinkLeadsTo) {
  std::filesystem::create_symlink(folder_.make_folder("folder"), folder_.at("to_folder"));
  std::filesystem::create_symlink(folder_.at("missing"), folder_.at("to_nothing"));
  expect(folder_.at("to_folder"), 0, 1, 1);
  expect(folder_.at("to_nothing"), 0, 0, 0);
}

TEST_F(AnExistingPath, IsNeverNull) {
  EXPECT_EQ(IsFileExist(nullptr, 0), 0);
  EXPECT_EQ(IsDirExist(nullptr), 0);
  EXPECT_EQ(TLIBCFileExist(nullptr), 0);
}

struct KeyCase {
  const char* name;
  std::string text;
  const char* value;  ///< Null when the key "codepage" is not found.
};

class ASetting : public testing::TestWithParam<KeyCase> {
 protected:
  TemporaryFolder folder_;
};

TEST_P(ASetting, IsReadFromItsLine) {
  const auto& given = GetParam();
  const auto file = folder_.write("conf", given.text);
  std::array<char, 64> buffer{"untouched"};
  const int result = TLIBCFileGetKeyValue(file.c_str(), "codepage", buffer.data(), 64, 0);
  EXPECT_EQ(result, given.value ? 1 : 0);
  EXPECT_STREQ(buffer.data(), given.value ? given.value : "untouched");
}

INSTANTIATE_TEST_SUITE_P(
    Cases, ASetting,
    testing::Values(KeyCase{"Plain", "codepage=enu\n", "enu"},
                    KeyCase{"LastLineWithoutEnd", "a=b\ncodepage=enu", "enu"},
                    KeyCase{"CarriageReturns", "a=b\r\ncodepage=enu\r\n", "enu"},
                    KeyCase{"Quoted", "codepage=\"enu\"\n", "enu"},
                    KeyCase{"QuotedBlanksStay", "codepage = \" a b \" \n", " a b "},
                    KeyCase{"LoneQuoteStays", "codepage=\"\n", "\""},
                    KeyCase{"OpenQuoteStays", "codepage=\"enu\n", "\"enu"},
                    KeyCase{"WhiteSpaceAround", " \t codepage \t = \t enu \t \n", "enu"},
                    KeyCase{"EmptyValue", "codepage=\n", ""},
                    KeyCase{"EmptyQuotes", "codepage=\"\"\n", ""},
                    KeyCase{"FirstMatchWins", "codepage=enu\ncodepage=rus\n", "enu"},
                    KeyCase{"ValueHoldsSeparator", "codepage=a=b\n", "a=b"},
                    KeyCase{"ByteOrderMark",
                            "\xEF\xBB\xBF"
                            "codepage=enu\n",
                            "enu"},
                    KeyCase{"LongLineBefore", std::string(1000000, 'x') + "\ncodepage=enu\n",
                            "enu"},
                    KeyCase{"NullEndsTheValue", std::string("codepage=en\0u\n", 14), "en"},
                    KeyCase{"Comment", "#codepage=enu\n", nullptr},
                    KeyCase{"IndentedComment", "  # codepage=enu\n", nullptr},
                    KeyCase{"NoSeparator", "codepage enu\n", nullptr},
                    KeyCase{"LongerKey", "codepages=enu\nxcodepage=enu\n", nullptr},
                    KeyCase{"OtherCase", "CODEPAGE=enu\n", nullptr},
                    KeyCase{"NullInTheKey", std::string("codepage\0=enu\n", 14), nullptr},
                    KeyCase{"Empty", "", nullptr}, KeyCase{"OnlySeparators", "=\n==\n\n", nullptr}),
    [](const auto& test) { return test.param.name; });

class SettingsFile : public testing::Test {
 protected:
  int read(const std::string& file, int size) {
    return TLIBCFileGetKeyValue(file.c_str(), "k", buffer_.data(), size, 0);
  }
  TemporaryFolder folder_;
  std::array<char, 8> buffer_{};
};

TEST_F(SettingsFile, GivesValuesCutToTheBuffer) {
  const auto file = folder_.write("conf", "k=abcdefghij\n");
  EXPECT_EQ(read(file, 8), 1);
  EXPECT_STREQ(buffer_.data(), "abcdefg");
  EXPECT_EQ(read(file, 1), 1);
  EXPECT_STREQ(buffer_.data(), "");
}

TEST_F(SettingsFile, CutsNoCharacterInTwo) {
  EXPECT_EQ(read(folder_.write("conf", "k=abcdeé…\n"), 8), 1);
  EXPECT_STREQ(buffer_.data(), "abcdeé");
  EXPECT_EQ(read(folder_.at("conf"), 7), 1);
  EXPECT_STREQ(buffer_.data(), "abcde");
}

TEST_F(SettingsFile, FailsWhenItCannotBeRead) {
  const auto fifo = folder_.at("fifo");
  ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
  EXPECT_EQ(read(folder_.at("missing"), 8), -1);
  EXPECT_EQ(read(folder_.make_folder("folder"), 8), -1);
  EXPECT_EQ(read(fifo, 8), -1);
  EXPECT_EQ(read("/dev/zero", 8), -1);
}

TEST_F(SettingsFile, FailsWhenItIsBeyondAllMeasure) {
  const auto file = folder_.write("conf", "k=v\n");
  std::filesystem::resize_file(file, std::uintmax_t{1} << 32);
  EXPECT_EQ(read(file, 8), -1);
}

TEST_F(SettingsFile, RefusesBadParameters) {
  const auto file = folder_.write("conf", "k=v\n");
  EXPECT_EQ(TLIBCFileGetKeyValue(nullptr, "k", buffer_.data(), 8, 0), -1);
  EXPECT_EQ(TLIBCFileGetKeyValue(file.c_str(), nullptr, buffer_.data(), 8, 0), -1);
  EXPECT_EQ(TLIBCFileGetKeyValue(file.c_str(), "k", nullptr, 8, 0), -1);
  EXPECT_EQ(read(file, 0), -1);
}

class AllSettings : public testing::Test {
 protected:
  std::map<std::string, std::string> found() {
    std::map<std::string, std::string> entries;
    int cursor = 0;
    const char* key = nullptr;
    const char* value = nullptr;
    while (TLIBCSzHashNext(hash_.get(), &cursor, &key, &value) == 1) entries[key] = value;
    return entries;
  }
  using Entries = std::map<std::string, std::string>;
  TemporaryFolder folder_;
  std::unique_ptr<TLIBSZHASH, decltype(&TLIBCSzHashFree)> hash_{TLIBCSzHashAlloc(0),
                                                                TLIBCSzHashFree};
};

TEST_F(AllSettings, GoIntoTheHash) {
  const auto file = folder_.write("ratings", "# stars\n1000=5\r\n1001 = \"3\"\nbad\n1000=1\n");
  EXPECT_EQ(TLIBCFileGetKeys(file.c_str(), nullptr, hash_.get(), "="), 2);
  EXPECT_EQ(found(), (Entries{{"1000", "5"}, {"1001", "3"}}));
}

TEST_F(AllSettings, CanBeOneSettingOnly) {
  const auto file = folder_.write("conf", "a=1\nb=2\n");
  EXPECT_EQ(TLIBCFileGetKeys(file.c_str(), "b", hash_.get(), "="), 1);
  EXPECT_EQ(TLIBCFileGetKeys(file.c_str(), "c", hash_.get(), "="), 0);
  EXPECT_EQ(found(), (Entries{{"b", "2"}}));
}

TEST_F(AllSettings, StandOnEitherSideOfTheSeparator) {
  const auto file = folder_.write("conf", "a = 1 => x\n=>y\n");
  EXPECT_EQ(TLIBCFileGetKeys(file.c_str(), nullptr, hash_.get(), "=>"), 1);
  EXPECT_EQ(found(), (Entries{{"a = 1", "x"}}));
}

TEST_F(AllSettings, ReplaceWhatTheHashHeld) {
  TLIBCSzHashSetValue(hash_.get(), "a", "old");
  EXPECT_EQ(TLIBCFileGetKeys(folder_.write("conf", "a=new").c_str(), nullptr, hash_.get(), "="), 1);
  EXPECT_EQ(found(), (Entries{{"a", "new"}}));
}

TEST_F(AllSettings, AreNoneInAnEmptyFile) {
  EXPECT_EQ(TLIBCFileGetKeys(folder_.write("conf", "").c_str(), nullptr, hash_.get(), "="), 0);
}

TEST_F(AllSettings, FailWithoutFileHashOrSeparator) {
  const auto file = folder_.write("conf", "a=1\n");
  EXPECT_EQ(TLIBCFileGetKeys(folder_.at("missing").c_str(), nullptr, hash_.get(), "="), -1);
  EXPECT_EQ(TLIBCFileGetKeys(nullptr, nullptr, hash_.get(), "="), -1);
  EXPECT_EQ(TLIBCFileGetKeys(file.c_str(), nullptr, nullptr, "="), -1);
  EXPECT_EQ(TLIBCFileGetKeys(file.c_str(), nullptr, hash_.get(), nullptr), -1);
  EXPECT_EQ(TLIBCFileGetKeys(file.c_str(), nullptr, hash_.get(), ""), -1);
}

}  // namespace
