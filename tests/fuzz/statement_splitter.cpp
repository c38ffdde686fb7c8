// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "statement_splitter.h"

#include <vector>

#include "fuzz.h"
#include "sql_tokens.h"

namespace {

using Tokens = std::vector<mediidx::test::SqlToken>;

/// Blanks at the end of a statement go, those of a text that is never closed among them.
Tokens tokens(std::string_view sql) {
  auto found = mediidx::test::sql_tokens(sql);
  if (!found.empty() && found.back().kind == mediidx::test::SqlToken::Kind::kBroken) {
    auto& text = found.back().text;
    text.resize(text.find_last_not_of(" \t\n\r\f") + 1);
  }
  return found;
}

std::vector<Tokens> at_semicolons(const Tokens& tokens) {
  const mediidx::test::SqlToken semicolon{mediidx::test::SqlToken::Kind::kSign, ";"};
  std::vector<Tokens> statements(1);
  for (const auto& token : tokens) {
    if (token == semicolon) {
      statements.emplace_back();
    } else {
      statements.back().push_back(token);
    }
  }
  std::erase_if(statements, [](const Tokens& statement) { return statement.empty(); });
  return statements;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  const auto sql = fuzz::Input(data, size).text();  // No statement holds a NUL.
  std::vector<Tokens> statements;
  auto rest = std::string_view(sql);
  while (const auto statement = platform::next_statement(rest)) {
    statements.push_back(tokens(*statement));
  }
  fuzz::check(statements == at_semicolons(tokens(sql)));
  return 0;
}
