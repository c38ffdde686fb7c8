// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/cue_charset.h"

#include <enca.h>
#include <strings.h>
#include <tavocore.h>

#include <array>

#include "support/root.h"

namespace mediidx {
namespace {

struct CodepageCharset {
  std::string_view code;
  const char* charset;
  const char* language;  ///< Enca's name; null for none in particular.
};

constexpr std::array gCodepageCharsetTable{
    CodepageCharset{"utf8", "UTF-8", nullptr}, CodepageCharset{"enu", "CP1252", nullptr},
    CodepageCharset{"fre", "CP1252", nullptr}, CodepageCharset{"ger", "CP1252", nullptr},
    CodepageCharset{"ita", "CP1252", nullptr}, CodepageCharset{"spn", "CP1252", nullptr},
    CodepageCharset{"cht", "CP950", "zh"},     CodepageCharset{"chs", "CP936", "zh"},
    CodepageCharset{"jpn", "CP932", nullptr},  CodepageCharset{"krn", "CP949", nullptr},
    CodepageCharset{"ptb", "CP1252", nullptr}, CodepageCharset{"rus", "CP1251", "ru"},
    CodepageCharset{"dan", "CP1252", nullptr}, CodepageCharset{"nor", "CP1252", nullptr},
    CodepageCharset{"sve", "CP1252", nullptr}, CodepageCharset{"nld", "CP1252", nullptr},
    CodepageCharset{"plk", "CP1250", "pl"},    CodepageCharset{"ptg", "CP1252", nullptr},
    CodepageCharset{"hun", "CP1250", "hu"},    CodepageCharset{"trk", "CP1254", nullptr},
    CodepageCharset{"csy", "CP1250", "cs"},
};

/// Any language: Enca then tells multi-byte character sets only.
constexpr const char* kNoLanguage = "__";

const CodepageCharset* find_code_page(std::string_view code) {
  for (const auto& row : gCodepageCharsetTable) {
    if (row.code == code) return &row;
  }
  return nullptr;
}

const char* analyse(std::string_view sample, const char* language) {
  using Analyser = Owned<std::remove_pointer_t<EncaAnalyser>, enca_analyser_free>;
  const Analyser analyser(enca_analyser_alloc(language));
  if (!analyser) return nullptr;
  enca_set_interpreted_surfaces(analyser.get(), 0);
  const auto encoding = enca_analyse_const(
      analyser.get(), reinterpret_cast<const unsigned char*>(sample.data()), sample.size());
  if (encoding.charset == ENCA_CS_UNKNOWN) return nullptr;
  return enca_charset_name(encoding.charset, ENCA_NAME_STYLE_ICONV);
}

}  // namespace

std::optional<std::string> detect_charset(std::string_view sample, std::string_view code_page) {
  if (sample.empty()) return std::nullopt;
  const auto* row = find_code_page(code_page);
  const char* name = analyse(sample, row && row->language ? row->language : kNoLanguage);
  if (!name && row) name = row->charset;
  if (!name) return std::nullopt;
  if (strcasecmp(name, "UCS-2") == 0) {
    const auto first = static_cast<unsigned char>(sample[0]);
    return first == 0xFE || first == 0x00 ? "UCS-2BE" : "UCS-2LE";
  }
  return name;
}

std::optional<std::string> detect_cue_charset(const char* cue_path) {
  std::array<char, 8> code_page{};
  TLIBCFileGetKeyValue(below_root(kSettingsPath).c_str(), "codepage", code_page.data(),
                       static_cast<int>(code_page.size()), 0);
  const OwnedFile file(std::fopen(cue_path, "re"));
  if (!file) return std::nullopt;
  std::array<char, 4096> sample;
  const auto length = std::fread(sample.data(), 1, sample.size(), file.get());
  return detect_charset({sample.data(), length}, code_page.data());
}

OwnedPipe open_cue_converter(const char* cue_path, const std::string& charset) {
  // The script's place is fixed by the package that ships it.
  constexpr const char* kScript = "/var/packages/Cantivo/target/scripts/phpiconv";
  return OwnedPipe(TLIBCPopen(below_root(kConverterPath).c_str(), "r", "-n", "-d",
                              "extension_dir=/lib/php/modules", "-d", "extension=iconv.so", kScript,
                              "--from", charset.c_str(), "--to", "UTF-8", cue_path, nullptr));
}

}  // namespace mediidx
