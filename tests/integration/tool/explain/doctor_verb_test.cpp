// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <filesystem>

#include "explain/health.h"
#include "explain_test.h"

namespace mediidx::test {
namespace {

using testing::Contains;
using testing::Each;
using tool::Health;

class Doctor : public ExplainTest {
 protected:
  /// The one check of this name.
  static Json::Value check(const Json::Value& checks, const std::string& name) {
    Json::Value found;
    for (const auto& one : checks) {
      if (one["check"] != name) continue;
      EXPECT_TRUE(found.isNull()) << name << " twice";
      found = one;
    }
    EXPECT_FALSE(found.isNull()) << name;
    return found;
  }
};

TEST_F(Doctor, FindsNothingWrongWithWhatIsWell) {
  const auto checks = json({"doctor"});
  EXPECT_THAT(column(checks, "status"), Each("ok"));
  EXPECT_THAT(column(checks, "advice"), Each(""));
  for (const char* name : {"server_programs", "converter", "indexer", "psql", "code_page",
                           "folders", "database", "server_version", "locale", "collation_version",
                           "schema_version", "tables", "indexes", "inotify"}) {
    check(checks, name);
  }
  EXPECT_EQ(check(checks, "folders")["found"], "1 chosen for indexing");
  EXPECT_EQ(check(checks, "indexes")["found"], "all 33 indexes are there");
}

TEST_F(Doctor, MissesAnIndexAndSaysHowItIsMade) {
  rows("DROP INDEX track_path");
  const auto found = check(json_with(1, {"doctor"}), "indexes");
  EXPECT_EQ(found["status"], "problem");
  EXPECT_EQ(found["found"], "track_path is missing");
  EXPECT_EQ(found["advice"],
            "mediidx db shell, then: CREATE INDEX IF NOT EXISTS track_path ON public.track USING "
            "spgist (path);");
  rows("CREATE INDEX IF NOT EXISTS track_path ON public.track USING spgist (path);");
  EXPECT_EQ(run({"doctor"}).status, 0);
}

TEST_F(Doctor, FindsAnIndexThatIsBroken) {
  rows("UPDATE pg_index SET indisvalid = false WHERE indexrelid = 'public.music_path'::regclass");
  const auto found = check(json_with(1, {"doctor"}), "indexes");
  EXPECT_EQ(found["found"], "music_path is broken: its making was interrupted");
  EXPECT_EQ(found["advice"], "mediidx db shell, then: REINDEX INDEX public.music_path;");
  rows("REINDEX INDEX public.music_path");
  EXPECT_EQ(run({"doctor"}).status, 0);
}

TEST_F(Doctor, MissesATable) {
  rows("DROP TABLE video_convert");
  const auto checks = json_with(1, {"doctor"});
  EXPECT_EQ(check(checks, "tables")["found"], "public.video_convert is missing");
}

TEST_F(Doctor, GoesOnWithoutADatabase) {
  Setting setting;
  setting.environment["PGHOST"] = data.at("nowhere");
  const auto done = run({"doctor"}, setting);
  EXPECT_EQ(done.status, 1);
  EXPECT_THAT(done.out, HasSubstr("problem\tdatabase\t"));
  EXPECT_THAT(done.out, HasSubstr("ok\tcode_page\t"));
}

TEST_F(Doctor, RefusesACodePageThatNobodyKnows) {
  data.write("d/root/etc/tavoinfo.conf", "codepage=\"rus\"\n");
  EXPECT_EQ(check(json({"doctor"}), "code_page")["found"], "rus");
  data.write("d/root/etc/tavoinfo.conf", "codepage=\"klingon\"\n");
  const auto found = check(json_with(1, {"doctor"}), "code_page");
  EXPECT_EQ(found["found"], "klingon is not known");
  EXPECT_THAT(found["advice"].asString(), HasSubstr("etc/tavoinfo.conf"));
}

TEST_F(Doctor, MissesTheConverter) {
  data.write("bin/none", "");
  std::filesystem::copy_file(MEDIIDX_COMMAND, data.at("bin/mediidx"));
  Setting setting;
  setting.program = data.at("bin/mediidx");
  setting.environment["LD_LIBRARY_PATH"] = MEDIIDX_LIBRARIES;
  const auto done = run({"doctor"}, setting);
  EXPECT_EQ(done.status, 1);
  EXPECT_THAT(done.out, HasSubstr("problem\tconverter\t"));
  EXPECT_THAT(done.out, HasSubstr("ok\tindexer\t"));
}

TEST_F(Doctor, WarnsOfFoldersThatAreAway) {
  choose(R"({"path": "/media/away", "music": true}, {"path": "/gone", "music": true})");
  const auto done = run({"doctor"});
  EXPECT_EQ(done.status, 0);
  EXPECT_THAT(lines(done.out), Contains("warning\tfolders\t" + at("away") +
                                        " is not there\tmount its disk, or mediidx folder remove"));
  EXPECT_THAT(done.out, HasSubstr("the entry /gone names a share that is not known"));
  choose("");
  EXPECT_EQ(check(json({"doctor"}), "folders")["status"], "warning");
  data.write("d/root/usr/tavo/etc/index_folder.conf", "{}");
  EXPECT_EQ(check(json_with(1, {"doctor"}), "folders")["status"], "problem");
}

TEST_F(Doctor, ShowsEveryAdviceOnATerminal) {
  rows("DROP INDEX track_path");
  Setting setting;
  setting.on_terminal = true;
  const auto done = run({"doctor"}, setting);
  EXPECT_EQ(done.status, 1);
  EXPECT_THAT(done.out, HasSubstr("problem  indexes: track_path is missing\r\n"));
  EXPECT_THAT(done.out, HasSubstr("USING spgist (path);\r\n"));
}

TEST(TheDoctor, WarnsWhenFoldersOutnumberWatches) {
  EXPECT_EQ(tool::check_inotify({100, 1, 1}, 100).health, Health::kOk);
  const auto few = tool::check_inotify({100, 128, 16384}, 101);
  EXPECT_EQ(few.health, Health::kWarning);
  EXPECT_EQ(few.found, "100 watches for 101 folders, 128 instances, 16384 queued events");
  EXPECT_THAT(few.advice, HasSubstr("fs.inotify.max_user_watches=202"));
  EXPECT_EQ(tool::check_inotify({100, 0, 1}, 1).health, Health::kWarning);
  EXPECT_EQ(tool::check_inotify({100, 1, 0}, 1).health, Health::kWarning);
  EXPECT_EQ(tool::check_inotify({std::nullopt, 1, 1}, 1).health, Health::kWarning);
}

TEST(TheDoctor, ReadsTheKernelsLimits) {
  const OpenFolder folder;
  folder.write("max_user_watches", "8192\n");
  folder.write("max_user_instances", "many\n");
  const auto limits = tool::read_inotify_limits(folder.path());
  EXPECT_EQ(limits.watches, 8192);
  EXPECT_EQ(limits.instances, std::nullopt);
  EXPECT_EQ(limits.queued_events, std::nullopt);
}

TEST(TheDoctor, ComparesTheVersionsOfTheCollation) {
  EXPECT_EQ(tool::check_collation_version("", "").health, Health::kOk);
  EXPECT_EQ(tool::check_collation_version("2.36", "2.36").health, Health::kOk);
  const auto changed = tool::check_collation_version("2.36", "2.41");
  EXPECT_EQ(changed.health, Health::kProblem);
  EXPECT_THAT(changed.found, HasSubstr("2.36"));
  EXPECT_THAT(changed.advice, HasSubstr("REFRESH COLLATION VERSION"));
  EXPECT_EQ(tool::check_collation_version("2.36", "").health, Health::kProblem);
}

TEST(TheDoctor, JudgesServerAndLocale) {
  EXPECT_EQ(tool::check_server_version(150000, "15.0").health, Health::kOk);
  EXPECT_EQ(tool::check_server_version(140012, "14.12").health, Health::kProblem);
  EXPECT_EQ(tool::check_locale("UTF8", "C", "C.UTF-8").health, Health::kOk);
  EXPECT_EQ(tool::check_locale("SQL_ASCII", "C", "C").health, Health::kProblem);
  EXPECT_EQ(tool::check_locale("UTF8", "C", "C").health, Health::kWarning);
  EXPECT_EQ(tool::check_locale("UTF8", "de_DE.UTF-8", "de_DE.UTF-8").health, Health::kWarning);
}

TEST(TheDoctor, FindsObjectsInASchema) {
  const auto found = tool::schema_objects(
      "-- CREATE INDEX IF NOT EXISTS comment ON a (b);\n"
      "CREATE INDEX IF NOT EXISTS a_b ON a\n  USING gin (b);\nCREATE TABLE c (d integer);\n"
      "CREATE INDEX IF NOT EXISTS a_c ON a (c);\n",
      "CREATE INDEX IF NOT EXISTS ");
  ASSERT_EQ(found.size(), 2U);
  EXPECT_EQ(found[0].name, "a_b");
  EXPECT_EQ(found[0].statement, "CREATE INDEX IF NOT EXISTS a_b ON a   USING gin (b);");
  EXPECT_EQ(found[1].name, "a_c");
}

}  // namespace
}  // namespace mediidx::test
