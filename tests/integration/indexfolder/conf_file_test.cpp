// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <csignal>
#include <filesystem>
#include <string>

#include "index_folder_test.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

class ConfFile : public IndexFolderTest {};

const Json::Value kEmptyList(Json::arrayValue);

TEST_F(ConfFile, IsEmptyWhenAbsent) {
  EXPECT_FALSE(IsIndexFolderConfExist());
  EXPECT_EQ(IndexFolderConfOpen(), kEmptyList);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(ConfFile, ExistsWhateverItsType) {
  root.make_folder(kConf);
  EXPECT_TRUE(IsIndexFolderConfExist());
  EXPECT_EQ(IndexFolderConfOpen(), kEmptyList);
}

TEST_F(ConfFile, IsReadAsItStands) {
  root.set_index_folders(R"([{"path": "/photo", "photo": true, "extra": [1]}, 7])");
  const auto conf = IndexFolderConfOpen();
  ASSERT_EQ(conf.size(), 2U);
  EXPECT_EQ(conf[0]["extra"][0], 1);
  EXPECT_EQ(conf[1], 7);
}

struct BrokenCase {
  const char* name;
  std::string text;
};

class BrokenConfFile : public IndexFolderTest, public testing::WithParamInterface<BrokenCase> {};

TEST_P(BrokenConfFile, IsEmpty) {
  root.set_index_folders(GetParam().text);
  EXPECT_EQ(IndexFolderConfOpen(), kEmptyList);
  EXPECT_THAT(logged(), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(
    Cases, BrokenConfFile,
    testing::Values(BrokenCase{"EmptyFile", ""}, BrokenCase{"NoJson", "photo = yes"},
                    BrokenCase{"ObjectOnTop", R"({"path": "/photo"})"},
                    BrokenCase{"TextOnTop", R"("/photo")"}, BrokenCase{"NullOnTop", "null"},
                    BrokenCase{"NumberOnTop", "1"}, BrokenCase{"ZeroBytes", std::string(100, '\0')},
                    BrokenCase{"BadEncoding", "\xFF\xFE[\x80"}),
    [](const auto& test) { return test.param.name; });

TEST_F(ConfFile, KeepsWhatStoodBeforeAnError) {
  root.set_index_folders(R"([{"path": "/photo", "photo": true}, {"path": )");
  const auto conf = IndexFolderConfOpen();
  ASSERT_GE(conf.size(), 1U);
  EXPECT_EQ(conf[0]["path"], "/photo");
}

std::string repeated(const std::string& text, int times) {
  std::string all;
  for (int i = 0; i < times; ++i) all += text;
  return all;
}

TEST_F(ConfFile, NestedTooDeeplyKeepsWhatStoodBefore) {
  for (const auto& deep : {std::string(100000, '['), repeated(R"({"a":)", 100000),
                           repeated("[", 100000) + repeated("]", 100000)}) {
    root.set_index_folders(R"([{"path": "/photo", "photo": true}, )" + deep);
    const auto conf = IndexFolderConfOpen();
    ASSERT_GE(conf.size(), 1U);
    EXPECT_EQ(conf[0]["path"], "/photo");
  }
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(ConfFile, NestedWithinMeasureIsReadWhole) {
  root.set_index_folders(R"([{"path": "/photo", "extra": )" + repeated("[", 500) +
                         repeated("]", 500) + "}, {\"path\": \"/music\"}]");
  EXPECT_THAT(paths_of(IndexFolderConfOpen()), ElementsAre("/photo", "/music"));
}

/// Gives up the superuser's rights, which no mode keeps out.
class AsNobody {
 public:
  AsNobody() : own_(geteuid()) { EXPECT_EQ(seteuid(own_ == 0 ? 65534 : own_), 0); }
  ~AsNobody() { EXPECT_EQ(seteuid(own_), 0); }
  AsNobody(const AsNobody&) = delete;
  AsNobody& operator=(const AsNobody&) = delete;

 private:
  uid_t own_;
};

TEST_F(ConfFile, IsEmptyWhenUnreadable) {
  root.set_index_folders(R"([{"path": "/photo"}])");
  fs::permissions(root.at(kConf), fs::perms::none);
  const AsNobody rights;
  EXPECT_EQ(IndexFolderConfOpen(), kEmptyList);
  EXPECT_EQ(IndexFolderInit(), 0);
  EXPECT_EQ(IndexFolderSizeGet(), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(ConfFile, ThatIsALoopOfLinksIsAbsent) {
  root.make_link(kConf, root.at(kConf));
  EXPECT_FALSE(IsIndexFolderConfExist());
  EXPECT_EQ(IndexFolderConfOpen(), kEmptyList);
}

class HugeConfFile : public IndexFolderTest {};

TEST_F(HugeConfFile, OfAHundredThousandEntriesIsReadWhole) {
  constexpr int kEntries = 100'000;
  const auto text = text_of_folders(kEntries);
  EXPECT_GT(text.size(), 8'000'000U);
  root.set_index_folders(text);
  const auto conf = IndexFolderConfOpen();
  ASSERT_EQ(conf.size(), static_cast<unsigned>(kEntries));
  EXPECT_EQ(conf[kEntries - 1]["path"], "/p/" + std::to_string(kEntries - 1));
}

TEST_F(HugeConfFile, WithATextOfManyMegabytesIsReadWhole) {
  const std::string name(8'000'000, 'x');
  root.set_index_folders(R"([{"path": "/photo", "name": ")" + name + "\"}]");
  EXPECT_EQ(IndexFolderConfOpen()[0]["name"], name);
}

class Saving : public IndexFolderTest {
 protected:
  Saving() { root.make_folder("usr/tavo/etc"); }
};

TEST_F(Saving, WritesStyledTextAndTellsTheDaemons) {
  const auto conf = list({entry("/photo", true, false, false)});
  EXPECT_EQ(IndexFolderConfSave(conf), 0);
  EXPECT_EQ(root.read(kConf),
            "[\n\t{\n\t\t\"default\" : false,\n\t\t\"music\" : false,\n\t\t\"name\" : \"entry\",\n"
            "\t\t\"path\" : \"/photo\",\n\t\t\"photo\" : true,\n\t\t\"video\" : false\n\t}\n]\n");
  EXPECT_THAT(asked_signals(),
              ElementsAre("/var/run/tavoindexd.pid 1", "/var/run/tavomkthumbd.pid 1",
                          "/var/run/tavomkflvd.pid 1", "/var/run/dms.pid 18"));
}

TEST_F(Saving, CreatesTheFileForEveryone) {
  const auto mask = umask(0);
  EXPECT_EQ(IndexFolderConfSave(kEmptyList), 0);
  umask(mask);
  EXPECT_EQ(fs::status(root.at(kConf)).permissions(), fs::perms::all);
}

TEST_F(Saving, ReplacesALongerFileInPlace) {
  root.write(kConf, std::string(10000, 'x'));
  root.make_link("usr/tavo/etc/other", root.at(kConf));
  EXPECT_EQ(IndexFolderConfSave(kEmptyList), 0);
  EXPECT_EQ(root.read("usr/tavo/etc/other"), "[]\n");
}

TEST_F(Saving, IsReadBackUnchanged) {
  const auto conf = list({entry("/photo/o'brien \"%s\"\n\\", true, false, true),
                          entry("/\xE5\x86\x99\xE7\x9C\x9F", false, true, false)});
  EXPECT_EQ(IndexFolderConfSave(conf), 0);
  EXPECT_EQ(IndexFolderConfOpen(), conf);
}

TEST_F(Saving, FailsWhereTheFileCannotBeOpened) {
  fs::remove(root.at("usr/tavo/etc"));
  EXPECT_EQ(IndexFolderConfSave(kEmptyList), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_indexfolder_action:N open("
                                       "/usr/tavo/etc/index_folder.conf, " +
                                       std::to_string(O_WRONLY | O_CREAT | O_TRUNC | O_SYNC) +
                                       ") failed, reason=No such file or directory\n"));
  EXPECT_EQ(logged()[0].priority, 3);
  EXPECT_THAT(asked_signals(), IsEmpty());
}

#if defined(__x86_64__)
TEST_F(Saving, LogsTheFlagsAsADecimalNumber) {
  fs::remove(root.at("usr/tavo/etc"));
  EXPECT_EQ(IndexFolderConfSave(kEmptyList), -1);
  EXPECT_TRUE(was_logged("index_folder.conf, 1053249) failed"));
}
#endif

TEST_F(Saving, FailsWhereTheTextCannotBeWritten) {
  root.make_link(kConf, "/dev/full");
  EXPECT_EQ(IndexFolderConfSave(kEmptyList), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre("mediidx_indexfolder_action:N failed to write into "
                          "/usr/tavo/etc/index_folder.conf, reason=No space left on device"));
  EXPECT_THAT(asked_signals(), IsEmpty());
}

/// No file grows beyond so many bytes while the object lives: an error, no signal.
class FileSizeLimit {
 public:
  explicit FileSizeLimit(rlim_t bytes) {
    std::signal(SIGXFSZ, SIG_IGN);
    getrlimit(RLIMIT_FSIZE, &before_);
    const rlimit limit{bytes, before_.rlim_max};
    EXPECT_EQ(setrlimit(RLIMIT_FSIZE, &limit), 0);
  }
  ~FileSizeLimit() {
    setrlimit(RLIMIT_FSIZE, &before_);
    std::signal(SIGXFSZ, SIG_DFL);
  }
  FileSizeLimit(const FileSizeLimit&) = delete;
  FileSizeLimit& operator=(const FileSizeLimit&) = delete;

 private:
  rlimit before_{};
};

TEST_F(Saving, ThatCannotOpenTheFileLeavesItAsItWas) {
  root.write(kConf, "old");
  fs::permissions(root.at(kConf), fs::perms::owner_read);
  {
    const AsNobody rights;
    EXPECT_EQ(IndexFolderConfSave(kEmptyList), -1);
  }
  EXPECT_EQ(root.read(kConf), "old");
  EXPECT_TRUE(was_logged("failed, reason=Permission denied"));
  EXPECT_THAT(asked_signals(), IsEmpty());
}

TEST_F(Saving, ThatCannotWriteLeavesTheFileEmpty) {
  root.write(kConf, "old");
  {
    const FileSizeLimit no_content(0);
    EXPECT_EQ(IndexFolderConfSave(kEmptyList), -1);
  }
  EXPECT_TRUE(root.exists(kConf));
  EXPECT_EQ(root.read(kConf), "");
  EXPECT_TRUE(was_logged("failed to write into"));
  EXPECT_THAT(asked_signals(), IsEmpty());
}

TEST_F(Saving, DoesNotSeeThatOnlyAPartWasWritten) {
  {
    const FileSizeLimit two_bytes(2);
    EXPECT_EQ(IndexFolderConfSave(kEmptyList), 0);
  }
  EXPECT_EQ(root.read(kConf), "[]");
  EXPECT_EQ(asked_signals().size(), 4U);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(ConfFile, ReloadSignalsEveryDaemonInOrder) {
  IndexServiceReload();
  EXPECT_THAT(asked_signals(),
              ElementsAre("/var/run/tavoindexd.pid 1", "/var/run/tavomkthumbd.pid 1",
                          "/var/run/tavomkflvd.pid 1", "/var/run/dms.pid 18"));
  EXPECT_THAT(logged(), IsEmpty());
}

}  // namespace
}  // namespace mediidx::test
