// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Statement templates whose placeholders and values are matched by the compiler.
#ifndef MEDIIDX_SUPPORT_STATEMENT_H_
#define MEDIIDX_SUPPORT_STATEMENT_H_

#include <tavodb.h>

#include <array>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <type_traits>

#include "support/owned.h"

namespace mediidx {

/// What a placeholder takes.
enum class BindKind { kText, kInt, kLongInt };

template <class Value>
consteval BindKind bind_kind() {
  if constexpr (std::same_as<Value, const char*>) {
    return BindKind::kText;
  } else if constexpr (std::same_as<Value, int>) {
    return BindKind::kInt;
  } else {
    static_assert(std::same_as<Value, std::int64_t>,
                  "statement values are const char*, int or std::int64_t");
    return BindKind::kLongInt;
  }
}

/// True when the placeholders of `sql` take values of exactly these kinds, in this order.
constexpr bool placeholders_match(std::string_view sql, std::span<const BindKind> kinds) {
  constexpr std::string_view kMark = "@TAVO:";
  struct Placeholder {
    std::string_view name;
    BindKind kind;
  };
  constexpr std::array kPlaceholders{
      Placeholder{"VAR", BindKind::kText},      Placeholder{"LVAR", BindKind::kText},
      Placeholder{"NEVAR", BindKind::kText},    Placeholder{"INT", BindKind::kInt},
      Placeholder{"LLINT", BindKind::kLongInt},
  };
  std::size_t used = 0;
  for (auto at = sql.find(kMark); at != sql.npos; at = sql.find(kMark, at)) {
    at += kMark.size();
    auto end = at;
    while (end < sql.size() && sql[end] >= 'A' && sql[end] <= 'Z') ++end;
    const auto name = sql.substr(at, end - at);
    const Placeholder* found = nullptr;
    for (const auto& placeholder : kPlaceholders) {
      if (placeholder.name == name) found = &placeholder;
    }
    if (!found || used == kinds.size() || kinds[used] != found->kind) return false;
    ++used;
  }
  return used == kinds.size();
}

/// A template for values of these types: `Template<const char*, int>` takes a text, then a number.
template <class... Values>
class Template {
 public:
  consteval Template(const char* sql)
      : sql_(sql) {  // NOLINT(google-explicit-constructor): a literal
    constexpr std::array<BindKind, sizeof...(Values)> kinds{bind_kind<Values>()...};
    if (!placeholders_match(sql, kinds)) throw "placeholders and values differ";
  }
  const char* sql() const { return sql_; }

 private:
  const char* sql_;
};

/// Fills a template for a database type; null when the platform cannot.
template <class... Values>
OwnedText fill(int database_type, std::type_identity_t<Template<Values...>> statement,
               Values... values) {
  const auto argument = [](auto value) {
    if constexpr (std::same_as<decltype(value), std::int64_t>) {
      return static_cast<long long>(value);
    } else {
      return value;
    }
  };
  return OwnedText(TAVODBEscapeStringEX3(database_type, statement.sql(), argument(values)...));
}

}  // namespace mediidx

#endif
