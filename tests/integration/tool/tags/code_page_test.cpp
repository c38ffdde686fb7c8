// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "../command.h"
#include "database.h"
#include "tag_samples.h"
#include "text/legacy_text.h"
#include "workers/tag_workers.h"

namespace mediidx::test {
namespace {

/// Readers under a code page of their own.
class ACodePage : public testing::Test {
 protected:
  ~ACodePage() override { tool::set_code_page(""); }

  static std::string title(const std::string& page, const std::string& file) {
    tool::set_code_page(page);
    return read_sample("encodings/" + file).title;
  }
};

struct Encoding {
  const char* page;
  const char* charset;
  const char* text;
};
constexpr Encoding kEncodings[] = {
    {"rus", "cp1251", "Запруда"}, {"jpn", "cp932", "波止場"},     {"chs", "cp936", "灯塔"},
    {"plk", "cp1250", "Łódź"},    {"", "latin1", "Zoë Ångström"}, {"", "utf8", "夜の港"},
};

TEST_F(ACodePage, DecodesWhatClaimsToBeLatin1) {
  for (const auto& [page, charset, text] : kEncodings) {
    EXPECT_EQ(title(page, std::string("id3v2-") + charset + ".mp3"), text) << charset;
    EXPECT_EQ(title(page, std::string("id3v1-") + charset + ".mp3"), text) << charset;
    EXPECT_EQ(title(page, std::string("info-") + charset + ".wav"), text) << charset;
    EXPECT_EQ(title(page, std::string("dsf-") + charset + ".dsf"), text) << charset;
  }
}

TEST_F(ACodePage, DecodesEveryFieldAndValue) {
  tool::set_code_page("rus");
  const auto file = read_sample("encodings/id3v2-cp1251.mp3");
  EXPECT_EQ(file.artist, "Запруда; Запруда 2");
  EXPECT_EQ(file.album_artist, "Запруда");
  EXPECT_EQ(file.comment, "Запруда");
}

TEST_F(ACodePage, LeavesValidUtf8Alone) {
  for (const char* page : {"rus", "jpn", "chs", "plk", "enu", "none such"}) {
    EXPECT_EQ(title(page, "id3v2-utf8.mp3"), "夜の港") << page;
    EXPECT_EQ(title(page, "id3v1-utf8.mp3"), "夜の港") << page;
    EXPECT_EQ(title(page, "info-utf8.wav"), "夜の港") << page;
  }
}

TEST_F(ACodePage, LeavesTextAloneThatIsPlainlyLatin1) {
  // Not so under Polish: its letters stand where those of Latin-1 do.
  for (const char* page : {"rus", "jpn", "chs", "cht", "krn", "enu", "none such"}) {
    EXPECT_EQ(title(page, "id3v2-latin1.mp3"), "Zoë Ångström") << page;
    EXPECT_EQ(title(page, "id3v1-latin1.mp3"), "Zoë Ångström") << page;
  }
}

TEST_F(ACodePage, ThatIsNotSetLeavesLatin1) {
  EXPECT_EQ(title("", "id3v2-cp1251.mp3"), "Çàïðóäà");
  EXPECT_EQ(title("none such", "id3v1-cp1251.mp3"), "Çàïðóäà");
}

TEST_F(ACodePage, DecodesTheTitleOfAnAvi) {
  tool::set_code_page("rus");
  EXPECT_EQ(read_sample("videos/cp1251.avi").title, "Причалы");
}

TEST_F(ACodePage, LeavesFormatsAloneThatTellTheirs) {
  tool::set_code_page("rus");
  EXPECT_EQ(read_sample("full.flac").title, "Slack Water");
  EXPECT_EQ(read_sample("id3v2.3.mp3").title, "Slack Water");
}

class ACodePageOfTheSystem : public testing::Test {
 protected:
  ScratchRoot root;
};

TEST_F(ACodePageOfTheSystem, ReachesTheWorkers) {
  root.write("etc/tavoinfo.conf", "codepage=\"rus\"\n");
  tool::TagWorkers workers(1, {}, MEDIIDX_COMMAND);
  workers.submit({1, tag_sample("encodings/id3v2-cp1251.mp3"), tool::Kind::kMusic});
  const auto answer = workers.take(std::chrono::seconds(60));
  ASSERT_TRUE(answer);
  EXPECT_EQ(answer->file.title, "Запруда");
}

TEST(ACodePageInTheDataFolder, IsTheOneOfTheIndex) {
  TestServer::get().fresh_database();
  const OpenFolder folder;
  std::filesystem::create_directory(folder.at("m"));
  const auto first = run_mediidx({"index", "--data-dir", folder.at("d"), folder.at("m")});
  ASSERT_EQ(first.status, 0) << first.err;
  folder.write("d/root/etc/tavoinfo.conf", "codepage=\"jpn\"\n");
  std::filesystem::copy(tag_sample("encodings/id3v2-cp932.mp3"), folder.at("m/a.mp3"));
  const auto run = run_mediidx({"index", "--data-dir", folder.at("d"), folder.at("m")});
  ASSERT_EQ(run.status, 0) << run.err;
  EXPECT_EQ(TestServer::get().rows("SELECT title, artist FROM music"),
            (std::vector<Row>{{"波止場", "波止場; 波止場 2"}}));
}

/// Half a megabyte of text that is valid in no way.
TEST_F(ACodePage, StandsHugeAndBrokenTexts) {
  for (const char* page : {"", "rus", "jpn", "UTF-16", "UTF-7", "ISO-2022-JP"}) {
    tool::set_code_page(page);
    const auto text = tool::decode_legacy(std::string(1 << 19, '\xFF'));
    EXPECT_GT(text.size(), 0U) << page;
    EXPECT_LE(text.size(), 4U << 16U) << page;
    EXPECT_EQ(tool::decode_legacy(""), "");
    EXPECT_EQ(tool::decode_legacy(std::string_view("a\0b", 3)), "a");
  }
}

}  // namespace
}  // namespace mediidx::test
