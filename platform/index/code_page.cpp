// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <below_root.h>
#include <border.h>
#include <tavoindex.h>

#include <array>

namespace {

// Room for every name that iconv knows, not only for the three-letter codes.
std::array<char, 64> code_page{};

}  // namespace

extern "C" const char* TAVOIndexCodePageGet(void) {
  namespace platform = mediidx::platform;
  code_page[0] = '\0';
  return platform::no_throw<const char*>("", "code_page.cpp", 101, [] {
    TLIBCFileGetKeyValue(platform::below_root("/etc/tavoinfo.conf").c_str(), "codepage",
                         code_page.data(), static_cast<int>(code_page.size()), 0);
    return code_page.data();
  });
}
