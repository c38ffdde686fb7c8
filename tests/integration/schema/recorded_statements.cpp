// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "recorded_statements.h"

#include <filesystem>
#include <fstream>
#include <sstream>
#include <tuple>

#include "sql_text.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

using Shapes = std::map<std::string, std::string>;

bool is_more_ordinary(const std::string& one, const std::string& other) {
  return std::tuple(oddness(one), one.size(), one) <
         std::tuple(oddness(other), other.size(), other);
}

/// Adds the statements of one program's file: texts that each end with a NUL byte.
void read(const fs::path& file, Shapes& shapes) {
  std::ifstream in(file, std::ios::binary);
  for (std::string text; std::getline(in, text, '\0');) {
    for (auto& statement : split_statements(text)) {
      auto& kept = shapes[shape_of(statement)];
      if (kept.empty() || is_more_ordinary(statement, kept)) kept = std::move(statement);
    }
  }
}

/// A file is named for its program. Only programs of this build count: what one that is gone left
/// behind says nothing.
Shapes read_journal() {
  const fs::path folder = MEDIIDX_JOURNAL_FOLDER;
  Shapes shapes;
  std::istringstream programs(MEDIIDX_RECORDED_PROGRAMS);
  for (std::string program; std::getline(programs, program, ',');) {
    read(folder / (program + ".statements"), shapes);
  }
  return shapes;
}

}  // namespace

const Shapes& recorded_statements() {
  static const Shapes shapes = read_journal();
  return shapes;
}

}  // namespace mediidx::test
