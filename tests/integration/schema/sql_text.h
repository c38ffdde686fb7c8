// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// SQL texts taken apart: their statements, and what is left of one without its values. Reads what
/// the library writes: standard-conforming literals, no comments, no dollar quotes.
#ifndef MEDIIDX_TESTS_INTEGRATION_SCHEMA_SQL_TEXT_H_
#define MEDIIDX_TESTS_INTEGRATION_SCHEMA_SQL_TEXT_H_

#include <string>
#include <string_view>
#include <vector>

namespace mediidx::test {

/// The statements of a text, split at ";" outside of literals; blank ones are left out.
std::vector<std::string> split_statements(std::string_view text);

/// The statement with one blank between words and signs, each number as 0, each literal as '?' and
/// each list after IN as (...). The wildcards of a pattern stay: LIKE '%x/%' becomes LIKE '%x%';
/// the pattern '/%', which all paths match, stays as a whole.
std::string shape_of(std::string_view statement);

/// How far the values of a statement are from ordinary ones, 0 being ordinary: patterns with so
/// little text that they match much or so much that matching is work, long lists, empty texts.
std::size_t oddness(std::string_view statement);

}  // namespace mediidx::test

#endif
