// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Texts escaped for statements that are put together by format. Failures are logged and give null.
#ifndef MEDIIDX_DATABASE_ESCAPE_H_
#define MEDIIDX_DATABASE_ESCAPE_H_

#include "support/owned.h"

namespace mediidx {

/// For a quoted literal.
OwnedText escape_literal(const char* text);
/// For a LIKE pattern within a quoted literal, where it matches itself.
OwnedText escape_pattern(const char* text);
/// The same, by the rules of a database type.
OwnedText escape_pattern(int database_type, const char* text);

}  // namespace mediidx

#endif
