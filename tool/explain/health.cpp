// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain/health.h"

#include <json/reader.h>
#include <tavocore.h>
#include <tavoindex.h>
#include <tavosdk.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <stdexcept>

#include "explain/index_answer.h"
#include "mediidx/index_folder.h"
#include "mediidx/record.h"
#include "postgres_server.h"
#include "store/schema_text.h"
#include "support/root.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

constexpr std::string_view kMakeTable = "CREATE TABLE IF NOT EXISTS ";
constexpr std::string_view kMakeIndex = "CREATE INDEX IF NOT EXISTS ";

constexpr const char* kSelectServer =
    "SELECT current_setting('server_version') AS version, "
    "current_setting('server_version_num') AS number";
constexpr const char* kSelectLocale =
    "SELECT pg_encoding_to_char(encoding) AS encoding, datcollate, datctype "
    "FROM pg_database WHERE datname = current_database()";
constexpr const char* kSelectCollation =
    "SELECT datcollversion AS recorded, pg_database_collation_actual_version(oid) AS actual "
    "FROM pg_database WHERE datname = current_database()";
constexpr const char* kSelectObjects =
    "SELECT CASE WHEN i.indexrelid IS NULL THEN n.nspname ELSE 'public' END || '.' || c.relname "
    "AS name, coalesce(i.indisvalid, true) AS valid "
    "FROM pg_class c JOIN pg_namespace n ON n.oid = c.relnamespace "
    "LEFT JOIN pg_index i ON i.indexrelid = c.oid "
    "WHERE n.nspname IN ('public', 'mediidx', 'scan')";
constexpr const char* kCountFolders =
    "SELECT (SELECT count(*) FROM directory) + (SELECT count(*) FROM personal_directory) AS folders";

constexpr int kOldestServer = 150000;

long number_in(const std::string& text) {
  long number = 0;
  std::from_chars(text.data(), text.data() + text.size(), number);
  return number;
}

bool is_program(const fs::path& path) { return access(path.c_str(), X_OK) == 0; }

bool is_on_path(const std::string& program) {
  const char* path = std::getenv("PATH");
  std::string_view rest = path ? path : "/usr/bin:/bin";
  while (!rest.empty()) {
    const auto folder = rest.substr(0, rest.find(':'));
    rest.remove_prefix(std::min(rest.size(), folder.size() + 1));
    if (!folder.empty() && is_program(fs::path(folder) / program)) return true;
  }
  return false;
}

Check check_server_programs() {
  if (has_configured_server()) {
    return {"server_programs", Health::kOk, "not needed: the environment names a server", ""};
  }
  try {
    return {"server_programs", Health::kOk, find_server_programs().string(), ""};
  } catch (const std::runtime_error& error) {
    return {"server_programs", Health::kProblem, error.what(), "install PostgreSQL's server"};
  }
}

Check check_own_program(const DataFolder& data, const char* name, const char* path,
                        const char* use) {
  const auto program = data.root() / path;
  if (is_program(program)) return {name, Health::kOk, program.string(), ""};
  return {name, Health::kProblem, program.string() + " cannot be run, which " + use,
          "install mediidx again: the program belongs beside the command"};
}

Check check_client() {
  if (is_on_path("psql")) return {"psql", Health::kOk, "psql is there", ""};
  return {"psql", Health::kWarning, "psql is missing, which mediidx db shell runs",
          "install PostgreSQL's client"};
}

bool is_list(const fs::path& file) {
  std::error_code ignored;
  if (!fs::exists(file, ignored) || fs::is_empty(file, ignored)) return true;
  std::ifstream in(file, std::ios::binary);
  Json::Value top;
  std::string errors;
  return Json::parseFromStream(Json::CharReaderBuilder(), in, &top, &errors) && top.isArray();
}

std::vector<std::string> chosen_folders() {
  std::vector<std::string> out;
  std::array<char, MEDIIDX_PATH_SIZE> path;
  for (int i = 0; i < IndexFolderSizeGet(); ++i) {
    const auto position = static_cast<unsigned>(i);
    if (IndexFolderPathAt(position, path.data(), static_cast<int>(path.size())) == 1) {
      out.emplace_back(path.data());
    }
  }
  return out;
}

void check_folders(std::vector<Check>& out) {
  const auto file = below_root(kIndexFolderConfPath);
  if (!is_list(file)) {
    out.push_back({"folders", Health::kProblem, file + " is not a list: nothing is indexed",
                   "repair or remove it"});
    return;
  }
  for (const auto& entry : entries_without_share()) {
    out.push_back({"folders", Health::kWarning,
                   "the entry " + entry + " names a share that is not known",
                   "mediidx share add, or remove the entry"});
  }
  for (const auto& folder : chosen_folders()) {
    std::error_code ignored;
    if (IndexIsPathRemoteMount(folder.c_str()) > 0) {
      out.push_back({"folders", Health::kWarning,
                     folder + " lies on a network mount, which is never indexed",
                     "mediidx folder remove"});
    } else if (!fs::is_directory(folder, ignored)) {
      out.push_back({"folders", Health::kWarning, folder + " is not there",
                     "mount its disk, or mediidx folder remove"});
    }
  }
  const bool is_well =
      std::ranges::none_of(out, [](const Check& check) { return check.name == "folders"; });
  if (!is_well) return;
  const int count = IndexFolderSizeGet();
  out.push_back({"folders", count > 0 ? Health::kOk : Health::kWarning,
                 count > 0 ? std::to_string(count) + " chosen for indexing" : "none is chosen",
                 count > 0 ? "" : "mediidx index FOLDER"});
}

/// Tables and indexes by name, and whether they can be used.
using Objects = std::map<std::string, bool>;

Objects objects_of(Database& database) {
  Objects out;
  for (auto rows = database.query(kSelectObjects); rows.next();) {
    out[rows.text("name")] = rows.text("valid") == "t";
  }
  return out;
}

std::string qualified(const std::string& name) {
  return name.find('.') == std::string::npos ? "public." + name : name;
}

void check_objects(const Objects& objects, const char* name, const char* what,
                   std::string_view beginning, std::vector<Check>& out) {
  const std::string in_shell = "mediidx db shell, then: ";
  const auto wanted = schema_objects(kSchemaText, beginning);
  bool is_well = true;
  for (const auto& object : wanted) {
    const auto found = objects.find(qualified(object.name));
    if (found != objects.end() && found->second) continue;
    is_well = false;
    if (found == objects.end()) {
      out.push_back(
          {name, Health::kProblem, object.name + " is missing", in_shell + object.statement});
    } else {
      out.push_back({name, Health::kProblem, object.name + " is broken: its making was interrupted",
                     in_shell + "REINDEX INDEX " + found->first + ";"});
    }
  }
  if (!is_well) return;
  out.push_back({name, Health::kOk, "all " + std::to_string(wanted.size()) + " " + what, ""});
}

Check check_schema_version(Database& database) {
  return {"schema_version", Health::kOk,
          std::to_string(database.version()) +
              (database.was_changed() ? ", made or brought up to date just now" : ""),
          ""};
}

}  // namespace

const char* name_of(Health health) {
  static constexpr std::array kNames{"ok", "warning", "problem"};
  return kNames.at(static_cast<std::size_t>(health));
}

Check check_server_version(int number, const std::string& text) {
  if (number >= kOldestServer) return {"server_version", Health::kOk, "PostgreSQL " + text, ""};
  return {"server_version", Health::kProblem, "PostgreSQL " + text, "use PostgreSQL 15 or later"};
}

Check check_collation_version(const std::string& recorded, const std::string& actual) {
  constexpr const char* kName = "collation_version";
  if (recorded == actual) {
    return {kName, Health::kOk, actual.empty() ? "none: the order never changes" : actual, ""};
  }
  return {kName, Health::kProblem,
          "the database was made with " + (recorded.empty() ? "none" : recorded) +
              ", the system has " + (actual.empty() ? "none" : actual),
          "mediidx db shell, then: REINDEX DATABASE mediaserver; "
          "ALTER DATABASE mediaserver REFRESH COLLATION VERSION;"};
}

Check check_locale(const std::string& encoding, const std::string& order, const std::string& type) {
  Check out{"locale", Health::kOk, encoding + ", order " + order + ", character types " + type, ""};
  if (encoding != "UTF8") {
    out.health = Health::kProblem;
    out.advice = "make the database anew with ENCODING 'UTF8'";
  } else if (type == "C" || type == "POSIX") {
    out.health = Health::kWarning;
    out.advice =
        "make the database anew with LC_CTYPE 'C.UTF-8': searches by part of a name do "
        "not use the index beyond ASCII";
  } else if (order != "C" && order != "POSIX") {
    out.health = Health::kWarning;
    out.advice = "make the database anew with LC_COLLATE 'C': its order changes with the system";
  }
  return out;
}

Check check_code_page(const std::string& code_page) {
  constexpr const char* kName = "code_page";
  if (code_page.empty()) {
    return {kName, Health::kOk, "none: texts of old encodings are guessed without it", ""};
  }
  std::array<char, 8> converted;
  if (TLIBCUnicodeStrCPToUTF8(code_page.c_str(), "a", converted.data(),
                              static_cast<int>(converted.size())) > 0) {
    return {kName, Health::kOk, code_page, ""};
  }
  return {kName, Health::kProblem, code_page + " is not known",
          "set codepage in " + below_root(kSettingsPath) +
              " to enu, jpn, rus or another, or to a "
              "name that iconv knows"};
}

InotifyLimits read_inotify_limits(const std::string& folder) {
  const auto read = [&folder](const char* name) {
    std::ifstream in(fs::path(folder) / name);
    long number = 0;
    return in >> number ? std::optional(number) : std::nullopt;
  };
  return {read("max_user_watches"), read("max_user_instances"), read("max_queued_events")};
}

Check check_inotify(const InotifyLimits& limits, long folders) {
  constexpr const char* kName = "inotify";
  if (!limits.watches || !limits.instances || !limits.queued_events) {
    return {kName, Health::kWarning, "the kernel's limits cannot be read",
            "folders may have to be scanned at intervals instead of being watched"};
  }
  Check out{kName, Health::kOk,
            std::to_string(*limits.watches) + " watches for " + std::to_string(folders) +
                " folders, " + std::to_string(*limits.instances) + " instances, " +
                std::to_string(*limits.queued_events) + " queued events",
            ""};
  if (folders > *limits.watches) {
    out.health = Health::kWarning;
    out.advice = "sysctl fs.inotify.max_user_watches=" + std::to_string(folders * 2) +
                 ", or folders are scanned at intervals instead of being watched";
  } else if (*limits.instances < 1 || *limits.queued_events < 1) {
    out.health = Health::kWarning;
    out.advice =
        "raise fs.inotify.max_user_instances and fs.inotify.max_queued_events: nothing "
        "can be watched";
  }
  return out;
}

std::vector<SchemaObject> schema_objects(std::string_view schema, std::string_view beginning) {
  std::vector<SchemaObject> out;
  const auto statements = schema_statements(schema);
  for (auto at = statements.find(beginning); at != std::string::npos;
       at = statements.find(beginning, at + 1)) {
    const auto name_at = at + beginning.size();
    auto statement = statements.substr(at, statements.find(';', at) + 1 - at);
    std::ranges::replace(statement, '\n', ' ');
    const auto end = statements.find_first_of(" (\n;", name_at);
    out.push_back({statements.substr(name_at, end - name_at), std::move(statement)});
  }
  return out;
}

std::vector<Check> check_system(const DataFolder& data) {
  std::vector<Check> out{
      check_server_programs(),
      check_own_program(data, "converter", "usr/bin/php", "converts cue sheets of old encodings"),
      check_own_program(data, "indexer", "usr/tavo/bin/tavoindex",
                        "indexes folders when the configuration changes"),
      check_own_program(data, "index_manager", "usr/tavo/bin/tavoindex_mgr",
                        "marks shares when the configuration changes"),
      check_client(),
      check_code_page(TAVOIndexCodePageGet()),
  };
  check_folders(out);
  return out;
}

void check_database(Database& database, std::vector<Check>& out) {
  auto server = database.query(kSelectServer);
  server.next();
  const int number = static_cast<int>(number_in(server.text("number")));
  out.push_back({"database", Health::kOk, database.where(), ""});
  out.push_back(check_server_version(number, server.text("version")));
  auto locale = database.query(kSelectLocale);
  locale.next();
  out.push_back(
      check_locale(locale.text("encoding"), locale.text("datcollate"), locale.text("datctype")));
  if (number >= kOldestServer) {
    auto collation = database.query(kSelectCollation);
    collation.next();
    out.push_back(check_collation_version(collation.text("recorded"), collation.text("actual")));
  }
  out.push_back(check_schema_version(database));
  const auto objects = objects_of(database);
  check_objects(objects, "tables", "tables are there", kMakeTable, out);
  check_objects(objects, "indexes", "indexes are there", kMakeIndex, out);
  auto folders = database.query(kCountFolders);
  folders.next();
  out.push_back(check_inotify(read_inotify_limits(), number_in(folders.text("folders"))));
}

}  // namespace mediidx::tool
