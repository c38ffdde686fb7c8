// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <unistd.h>

#include "verb_test.h"

namespace mediidx::test {
namespace {

/// While it lives, a file with this text is the standard input, which the command inherits.
class Input {
 public:
  explicit Input(const std::string& file) : saved_(dup(STDIN_FILENO)) {
    const int opened = open(file.c_str(), O_RDONLY);
    dup2(opened, STDIN_FILENO);
    close(opened);
  }
  ~Input() {
    dup2(saved_, STDIN_FILENO);
    close(saved_);
  }
  Input(const Input&) = delete;
  Input& operator=(const Input&) = delete;

 private:
  int saved_;
};

class CareOfTheDatabase : public VerbTest {
 protected:
  Outcome answer(const std::string& text, const Words& words) {
    const Input input(media.write("input", text));
    return run(words);
  }
};

TEST_F(CareOfTheDatabase, VacuumsAndRefreshesStatistics) {
  insert("/a");
  EXPECT_EQ(output({"db", "vacuum"}), "");
  EXPECT_EQ(value("SELECT reltuples FROM pg_class WHERE relname = 'music'"), "1");
}

TEST_F(CareOfTheDatabase, EmptiesTheIndexWithoutPersonalLibraries) {
  save({.path = at("a.mp3")});
  insert("/a");
  rows("INSERT INTO personal_playlist(userid, path) VALUES (1026, '/home/x/p')");
  rows("INSERT INTO track(userid, path) VALUES (1026, '/home/x/a')");
  EXPECT_EQ(output({"db", "reset", "--yes"}), "");
  for (const char* table : {"music", "video", "photo", "playlist", "directory"}) {
    EXPECT_EQ(count(table), 0) << table;
  }
  EXPECT_EQ(count("track"), 1);
  EXPECT_EQ(count("personal_playlist"), 1);
}

TEST_F(CareOfTheDatabase, AsksBeforeItEmptiesTheIndex) {
  insert("/a");
  for (const char* text : {"", "no\n", "y", "yes please\n"}) {
    const auto done = answer(text, {"db", "reset"});
    EXPECT_EQ(done.status, 1) << text;
    EXPECT_EQ(done.out, "");
    EXPECT_THAT(done.err, HasSubstr("Type yes to go on: mediidx: nothing was changed\n"));
    EXPECT_EQ(count("music"), 1);
  }
  EXPECT_EQ(answer("yes\n", {"db", "reset"}).status, 0);
  EXPECT_EQ(count("music"), 0);
}

TEST_F(CareOfTheDatabase, SaysWhyItCouldNotEmptyTheIndex) {
  rows(
      "CREATE FUNCTION refuse() RETURNS trigger LANGUAGE plpgsql AS "
      "'BEGIN RAISE EXCEPTION ''photos stay''; END'");
  rows("CREATE TRIGGER refuse BEFORE DELETE ON photo EXECUTE FUNCTION refuse()");
  const auto done = run({"db", "reset", "--yes"});
  EXPECT_EQ(done.status, 1);
  EXPECT_THAT(done.err, HasSubstr("the database could not be emptied: "));
  EXPECT_THAT(done.err, HasSubstr("photos stay"));
}

TEST_F(CareOfTheDatabase, OpensPsqlOnItsOwnDatabase) {
  insert("/it's here");
  const auto done = answer("\\pset tuples_only on\nSELECT current_database() || path FROM music;\n",
                           {"db", "shell"});
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_THAT(done.out, HasSubstr("mediaserver/it's here"));
}

TEST_F(CareOfTheDatabase, EndsAsPsqlEnded) {
  EXPECT_EQ(answer("\\set ON_ERROR_STOP on\nSELECT nonsense;\n", {"db", "shell"}).status, 3);
}

TEST_F(CareOfTheDatabase, SaysThatPsqlIsMissing) {
  Setting setting;
  setting.environment["PATH"] = "/nonexistent";
  const auto done = run({"db", "shell"}, setting);
  EXPECT_EQ(done.status, 1);
  EXPECT_EQ(done.err, "mediidx: psql: No such file or directory\n");
}

}  // namespace
}  // namespace mediidx::test
