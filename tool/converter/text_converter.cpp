// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "converter/text_converter.h"

#include <strings.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <stdexcept>

namespace mediidx::tool {
namespace {

constexpr std::string_view kUtf8Mark = "\xEF\xBB\xBF";

bool is_utf8(const std::string& charset) {
  return strcasecmp(charset.c_str(), "UTF-8") == 0 || strcasecmp(charset.c_str(), "UTF8") == 0;
}

constexpr std::string_view kUcs2 = "UCS-2";
constexpr std::string_view kUtf16 = "UTF-16";

bool begins_with(const std::string& charset, std::string_view name) {
  return strncasecmp(charset.c_str(), name.data(), name.size()) == 0;
}

/// What is called UCS-2 is UTF-16 nowadays: iconv's UCS-2 stumbles over characters of two units.
std::string source_name(const std::string& charset) {
  if (!begins_with(charset, kUcs2)) return charset;
  return std::string(kUtf16) + charset.substr(kUcs2.size());
}

/// iconv knows characters beyond the last of Unicode, in UTF-8 of up to six bytes: each is
/// replaced.
std::string within_unicode(std::string text, const std::string& replacement) {
  const auto is_beyond = [&text](std::size_t at) {
    const auto byte = [&](std::size_t place) {
      return place < text.size() ? static_cast<unsigned char>(text[place]) : 0U;
    };
    return byte(at) > 0xF4U || (byte(at) == 0xF4U && byte(at + 1) > 0x8FU);
  };
  for (std::size_t at = 0; at < text.size(); ++at) {
    if (!is_beyond(at)) continue;
    const auto lead = static_cast<unsigned char>(text[at]);
    text.replace(at, lead < 0xF8U ? 4 : lead < 0xFCU ? 5 : 6, replacement);
  }
  return text;
}

}  // namespace

TextConverter::TextConverter(const std::string& from, const std::string& to)
    : descriptor_(iconv_open(to.c_str(), source_name(from).c_str())),
      unit_(begins_with(source_name(from), kUtf16) ? 2 : 1),
      replacement_(is_utf8(to) ? "\xEF\xBF\xBD" : "?"),
      to_utf8_(is_utf8(to)) {
  // iconv_open reports failure by this value, which is no pointer that could be compared to null.
  if (descriptor_ == reinterpret_cast<iconv_t>(-1)) {  // NOLINT(performance-no-int-to-ptr)
    throw std::invalid_argument("no conversion from " + from + " to " + to);
  }
}

TextConverter::~TextConverter() { iconv_close(descriptor_); }

std::string TextConverter::run(std::string_view text, bool is_last) {
  std::string input = rest_ + std::string(text);
  rest_.clear();
  std::string out;
  char* from = input.data();
  std::size_t left = input.size();
  std::array<char, 4096> buffer;
  // At the end the converter hands out a letter that it held back for an accent to follow.
  for (bool flushes = is_last; left > 0 || flushes;) {
    char* to = buffer.data();
    std::size_t room = buffer.size();
    if (left == 0) flushes = false;
    const auto converted = left > 0 ? iconv(descriptor_, &from, &left, &to, &room)
                                    : iconv(descriptor_, nullptr, nullptr, &to, &room);
    const int error = converted == static_cast<std::size_t>(-1) ? errno : 0;
    const std::string piece(buffer.data(), to);
    out += to_utf8_ ? within_unicode(piece, replacement_) : piece;
    if (error == EINVAL && !is_last) {
      rest_.assign(from, left);
      break;
    }
    if (error == EILSEQ || error == EINVAL) {
      out += replacement_;
      const auto skipped = std::min(unit_, left);
      from += skipped;
      left -= skipped;
    }
  }
  take_mark_off(out);
  return out;
}

void TextConverter::take_mark_off(std::string& out) {
  if (!at_beginning_ || out.empty()) return;
  at_beginning_ = false;
  if (to_utf8_ && out.starts_with(kUtf8Mark)) out.erase(0, kUtf8Mark.size());
}

std::string TextConverter::convert(std::string_view piece) { return run(piece, false); }

std::string TextConverter::finish() { return run({}, true); }

}  // namespace mediidx::tool
