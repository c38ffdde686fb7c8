// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Values as they stand in statements. Strings are standard-conforming in every session, so that a
/// backslash within a quoted literal is a character like any other.
#ifndef TAVODB_ESCAPE_H_
#define TAVODB_ESCAPE_H_

#include <optional>
#include <string>
#include <string_view>

namespace mediidx::platform {

/// Appends a value for a quoted literal.
void append_literal(std::string& out, std::string_view value);
/// Appends a value that matches itself in a LIKE pattern within a quoted literal.
void append_pattern(std::string& out, std::string_view value);
/// A condition of the form " column='value' ", whose value stands between the first quote and the
/// last; without quotes it stays as it is. Nothing for a condition with a single quote: it has no
/// end of a value, and whatever is made of it might let the rest of the value be read as SQL.
std::optional<std::string> escape_condition(std::string_view condition);

}  // namespace mediidx::platform

#endif
