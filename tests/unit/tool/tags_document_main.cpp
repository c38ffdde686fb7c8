// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Prints docs/tags.md.
#include <cstdio>

#include "tags_document.h"

int main() {
  const auto text = mediidx::test::tags_document();
  return std::fwrite(text.data(), 1, text.size(), stdout) == text.size() ? 0 : 1;
}
