// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The text that creates the tables.
#ifndef MEDIIDX_TESTS_INTEGRATION_SCHEMA_SCHEMA_TEXT_H_
#define MEDIIDX_TESTS_INTEGRATION_SCHEMA_SCHEMA_TEXT_H_

#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>

namespace mediidx::test {

inline std::string schema_text() {
  std::ifstream in(MEDIIDX_SCHEMA);
  std::string text(std::istreambuf_iterator<char>(in), {});
  if (text.empty()) throw std::runtime_error("cannot read " MEDIIDX_SCHEMA);
  return text;
}

}  // namespace mediidx::test

#endif
