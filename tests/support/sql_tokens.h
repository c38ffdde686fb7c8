// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What PostgreSQL reads in a text of statements, found without it and without the library.
#ifndef MEDIIDX_TESTS_SUPPORT_SQL_TOKENS_H_
#define MEDIIDX_TESTS_SUPPORT_SQL_TOKENS_H_

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace mediidx::test {

struct SqlToken {
  enum class Kind {
    kWord,     ///< Keywords and names.
    kName,     ///< A name in double quotes, which are left out.
    kLiteral,  ///< The value of a literal, whichever way it is quoted.
    kNumber,
    kSign,    ///< An operator, or a single sign.
    kBroken,  ///< A quoted text or comment that is never closed, as it stands.
  };
  Kind kind;
  std::string text;

  bool operator==(const SqlToken&) const = default;
};

/// The tokens of a text, as the server's lexer cuts it with standard-conforming strings; comments
/// and blanks are left out. Numeric escapes of E'' literals, and those of U&'', stay as they stand.
std::vector<SqlToken> sql_tokens(std::string_view sql);

/// The only text that a LIKE pattern matches; empty when it may match others.
std::optional<std::string> sole_match(std::string_view pattern);

}  // namespace mediidx::test

#endif
