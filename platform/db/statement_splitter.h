// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Texts of several statements, taken apart where the server's own reader would end one.
#ifndef TAVODB_STATEMENT_SPLITTER_H_
#define TAVODB_STATEMENT_SPLITTER_H_

#include <optional>
#include <string_view>

namespace mediidx::platform {

/// Takes the next statement off the front of `text`: up to a ";" outside of literals, quoted names
/// and comments, without it and without blanks around. Pieces that hold nothing but blanks and
/// comments are passed over; nothing when none is left. What is opened and never closed reaches to
/// the end of the text, so that the server can complain of it.
std::optional<std::string_view> next_statement(std::string_view& text);

}  // namespace mediidx::platform

#endif
