// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <iconv.h>
#include <tavocore.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <string>
#include <string_view>

#include "border.h"
#include "utf8.h"

namespace {

struct CodePage {
  std::string_view code;
  const char* charset;
};

// Sorted by code.
constexpr std::array kCodePages{
    CodePage{"chs", "CP936"},  CodePage{"cht", "CP950"},  CodePage{"csy", "CP1250"},
    CodePage{"dan", "CP1252"}, CodePage{"enu", "CP1252"}, CodePage{"fre", "CP1252"},
    CodePage{"ger", "CP1252"}, CodePage{"hun", "CP1250"}, CodePage{"ita", "CP1252"},
    CodePage{"jpn", "CP932"},  CodePage{"krn", "CP949"},  CodePage{"nld", "CP1252"},
    CodePage{"nor", "CP1252"}, CodePage{"plk", "CP1250"}, CodePage{"ptb", "CP1252"},
    CodePage{"ptg", "CP1252"}, CodePage{"rus", "CP1251"}, CodePage{"spn", "CP1252"},
    CodePage{"sve", "CP1252"}, CodePage{"trk", "CP1254"}, CodePage{"utf8", "UTF-8"},
};
static_assert(std::ranges::is_sorted(kCodePages, {}, &CodePage::code));

const char* charset_of(const char* codepage) {
  const auto* row =
      std::ranges::lower_bound(kCodePages, std::string_view(codepage), {}, &CodePage::code);
  return row != kCodePages.end() && row->code == codepage ? row->charset : codepage;
}

class Converter {
 public:
  explicit Converter(const char* charset) : handle_(iconv_open("UTF-8", charset)) {}
  ~Converter() {
    if (is_open()) iconv_close(handle_);
  }
  Converter(const Converter&) = delete;
  Converter& operator=(const Converter&) = delete;

  bool is_open() const { return handle_ != kNone; }

  /// Converts all of `text` into `out` of `room` bytes; the bytes written, or -1.
  long convert(std::string_view text, char* out, std::size_t room) {
    char* in = const_cast<char*>(text.data());  // iconv reads it only
    std::size_t left = text.size();
    char* end = out;
    // What iconv could only approximate is not valid in the code page either.
    if (iconv(handle_, &in, &left, &end, &room) != 0 || left != 0) return -1;
    if (iconv(handle_, nullptr, nullptr, &end, &room) != 0) return -1;
    return end - out;
  }

 private:
  static inline const iconv_t kNone = reinterpret_cast<iconv_t>(-1);
  iconv_t handle_;
};

// An empty name would mean the process's locale, and "//" starts iconv's own flags.
bool is_charset_name(std::string_view name) {
  return !name.empty() && name.find("//") == std::string_view::npos;
}

}  // namespace

extern "C" int TLIBCUnicodeStrCPToUTF8(const char* codepage, const char* text, char* out,
                                       int size) {
  using mediidx::platform::failed;
  if (!codepage || !text || !out || size < 1 || !is_charset_name(codepage)) {
    return failed(-1, TAVO_ERR_BAD_PARAMETERS, "code_page.cpp", 1);
  }
  Converter converter(charset_of(codepage));
  if (!converter.is_open()) return failed(-1, TAVO_ERR_BAD_PARAMETERS, "code_page.cpp", 2);
  const long written = converter.convert(text, out, static_cast<std::size_t>(size) - 1);
  // iconv knows characters beyond the last of Unicode.
  if (written < 0 || !mediidx::platform::is_utf8({out, static_cast<std::size_t>(written)})) {
    *out = '\0';
    return failed(-1, TAVO_ERR_BAD_PARAMETERS, "code_page.cpp", 3);
  }
  out[written] = '\0';
  return static_cast<int>(written) + 1;
}
