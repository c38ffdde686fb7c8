// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The command's own statements.
#ifndef MEDIIDX_TOOL_STORE_QUERY_H_
#define MEDIIDX_TOOL_STORE_QUERY_H_

#include <stdexcept>
#include <string>
#include <string_view>
#include <type_traits>

#include "store/database.h"
#include "support/statement.h"

namespace mediidx::tool {

/// A filled statement. Throws std::runtime_error when it cannot be filled.
template <class... Values>
std::string filled(std::type_identity_t<Template<Values...>> statement, Values... values) {
  const auto sql = fill(TAVODB_TYPE_POSTGRESQL, statement, values...);
  if (!sql) throw std::runtime_error("a statement could not be made");
  return sql.get();
}

/// A text as it stands in a statement, quotes included.
std::string literal(std::string_view text);

/// Paths as the index stores them. Absolute, without "." and "..", without a slash at the end ("/"
/// is empty); the file system is not asked, for what a path names may be away. Throws
/// std::runtime_error for what is no path and what cannot be stored.
std::string stored_path(const std::string& named);

}  // namespace mediidx::tool

#endif
