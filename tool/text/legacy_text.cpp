// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "text/legacy_text.h"

#include <tavocore.h>
#include <tavoindex.h>

#include <algorithm>
#include <optional>

#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr std::size_t kLongest = 64UL * 1024;

std::optional<std::string>& own_code_page() {
  static std::optional<std::string> value;
  return value;
}

std::optional<std::string> from_code_page(const std::string& page, const std::string& text) {
  constexpr std::size_t kLongestCharacter = 4;
  std::string out(text.size() * kLongestCharacter + 1, '\0');
  const int written =
      TLIBCUnicodeStrCPToUTF8(page.c_str(), text.c_str(), out.data(), static_cast<int>(out.size()));
  if (written < 1) return std::nullopt;
  out.resize(static_cast<std::size_t>(written) - 1);
  return out;
}

std::string from_latin1(std::string_view text) {
  std::string out;
  for (const unsigned char byte : text) {
    if (byte < 0x80) {
      out += static_cast<char>(byte);
    } else {
      out += static_cast<char>(0xC0U | (byte >> 6U));
      out += static_cast<char>(0x80U | (byte & 0x3FU));
    }
  }
  return out;
}

/// Where é stands in Latin-1, the Latin code pages have it too.
bool is_latin(const std::string& page) { return from_code_page(page, "\xE9") == "\xC3\xA9"; }

bool is_ascii_letter(unsigned char byte) {
  return (byte >= 'A' && byte <= 'Z') || (byte >= 'a' && byte <= 'z');
}

/// Whether a text is plainly Latin-1: of its bytes beyond ASCII all are letters there, at least one
/// word has them among ASCII letters, and no word of more than one letter is made of them alone.
bool is_plainly_latin1(std::string_view text) {
  bool found = false;
  std::size_t ascii = 0;
  std::size_t accented = 0;
  for (std::size_t i = 0; i <= text.size(); ++i) {
    const unsigned char byte = i < text.size() ? static_cast<unsigned char>(text[i]) : ' ';
    if (byte >= 0x80) {
      constexpr unsigned char kTimes = 0xD7;
      constexpr unsigned char kDivide = 0xF7;
      if (byte < 0xC0 || byte == kTimes || byte == kDivide) return false;
      ++accented;
    } else if (is_ascii_letter(byte)) {
      ++ascii;
    } else {
      if (accented > 1 && ascii == 0) return false;
      found = found || (accented > 0 && ascii > 0);
      ascii = accented = 0;
    }
  }
  return found;
}

}  // namespace

void set_code_page(std::string code_page) { own_code_page() = std::move(code_page); }

const std::string& code_page() {
  auto& page = own_code_page();
  if (!page) page = TAVOIndexCodePageGet();
  return *page;
}

std::string decode_legacy(std::string_view bytes) {
  const std::string text(bytes.substr(0, std::min(bytes.find('\0'), kLongest)));
  if (is_utf8(text)) return text;
  const auto& page = code_page();
  const bool is_latin1 = page.empty() || (is_plainly_latin1(text) && !is_latin(page));
  const auto decoded = is_latin1 ? std::nullopt : from_code_page(page, text);
  return decoded ? *decoded : from_latin1(text);
}

}  // namespace mediidx::tool
