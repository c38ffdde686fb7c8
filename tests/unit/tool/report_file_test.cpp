// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "report/report_file.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <fstream>
#include <sstream>

#include "report/page.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;
using testing::AllOf;
using testing::HasSubstr;

class AReportFile : public testing::Test {
 protected:
  AReportFile() {
    std::string name = "/tmp/mediidx-report-XXXXXX";
    if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
    folder_ = name;
  }
  ~AReportFile() override { fs::remove_all(folder_); }

  std::string at(const std::string& name) const { return (folder_ / name).string(); }
  std::string put(const std::string& name, const std::string& text) const {
    std::ofstream(at(name)) << text;
    return at(name);
  }
  std::string text_of(const std::string& name) const {
    std::ostringstream out;
    out << std::ifstream(at(name)).rdbuf();
    return out.str();
  }
  /// Why a file is refused; empty when it is not.
  static std::string refusal(const std::string& path) {
    try {
      const ReportFile file(path);
    } catch (const std::runtime_error& error) {
      return error.what();
    }
    return "";
  }
  long files() const {
    return std::distance(fs::directory_iterator(folder_), fs::directory_iterator());
  }

 private:
  fs::path folder_;
};

std::string page() { return report_page({}, "00"); }

TEST_F(AReportFile, IsNewOrAnEarlierReport) {
  ReportFile(at("r.html")).write(page());
  EXPECT_EQ(text_of("r.html"), page());
  ReportFile(at("r.html")).write("the next");
  EXPECT_EQ(text_of("r.html"), "the next");
  EXPECT_EQ(files(), 1);
}

TEST_F(AReportFile, ThatIsNoReportIsNeverReplaced) {
  EXPECT_THAT(refusal(put("song.mp3", "ID3")),
              AllOf(HasSubstr("song.mp3"), HasSubstr("no report")));
  EXPECT_THAT(refusal(put("empty", "")), HasSubstr("no report"));
  EXPECT_EQ(text_of("song.mp3"), "ID3");
}

TEST_F(AReportFile, IsNoFolderAndNoDevice) {
  EXPECT_THAT(refusal(at("")), HasSubstr("is a folder"));
  EXPECT_THAT(refusal("/dev/null"), HasSubstr("no report"));
}

TEST_F(AReportFile, NamesItselfWhereItCannotBeWritten) {
  const auto write = [this] { ReportFile(at("no/such/r.html")).write(page()); };
  EXPECT_THAT(write, testing::ThrowsMessage<std::runtime_error>(
                         AllOf(HasSubstr("no/such/r.html"), HasSubstr("No such file"))));
}

TEST_F(AReportFile, ThatDoesNotFitLeavesTheEarlierOne) {
  const ReportFile file(put("r.html", page()));
  rlimit before{};
  getrlimit(RLIMIT_FSIZE, &before);
  const rlimit small{100, before.rlim_max};
  const auto handler = signal(SIGXFSZ, SIG_IGN);
  setrlimit(RLIMIT_FSIZE, &small);
  std::string error;
  try {
    file.write(std::string(1000, 'x'));
  } catch (const std::runtime_error& failure) {
    error = failure.what();
  }
  setrlimit(RLIMIT_FSIZE, &before);
  signal(SIGXFSZ, handler);
  EXPECT_THAT(error, AllOf(HasSubstr("r.html"), HasSubstr("too large")));
  EXPECT_EQ(text_of("r.html"), page());
  EXPECT_EQ(files(), 1);
}

TEST_F(AReportFile, BehindALinkIsWrittenWhereTheLinkLeads) {
  put("real.html", page());
  fs::create_symlink("real.html", at("link.html"));
  ReportFile(at("link.html")).write("the next");
  EXPECT_TRUE(fs::is_symlink(at("link.html")));
  EXPECT_EQ(text_of("real.html"), "the next");
}

TEST_F(AReportFile, KeepsItsMode) {
  const ReportFile file(put("r.html", page()));
  fs::permissions(at("r.html"), fs::perms(0640));
  file.write(page());
  EXPECT_EQ(fs::status(at("r.html")).permissions(), fs::perms(0640));
}

TEST_F(AReportFile, ThatIsNewHasTheUsersMode) {
  const auto before = umask(027);
  ReportFile(at("r.html")).write(page());
  umask(before);
  EXPECT_EQ(fs::status(at("r.html")).permissions(), fs::perms(0640));
}

}  // namespace
}  // namespace mediidx::tool
