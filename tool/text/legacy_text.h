// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Texts of formats that do not say in which character set they are, or say so wrongly.
#ifndef MEDIIDX_TOOL_TEXT_LEGACY_TEXT_H_
#define MEDIIDX_TOOL_TEXT_LEGACY_TEXT_H_

#include <string>
#include <string_view>

namespace mediidx::tool {

/// The code page of such texts: "rus", "jpn" and the like, or a name that iconv knows; empty for
/// none. Until it is set, it is the one that the system's settings name when it is first asked for.
void set_code_page(std::string code_page);
const std::string& code_page();

/// The bytes as UTF-8: as they are where they are valid UTF-8; else from the code page, where there
/// is one in which they are valid; else from Latin-1. Under a code page of another script than
/// Latin, words that mix ASCII and accented letters are Latin-1. Up to the first NUL, and of very
/// long texts the beginning.
std::string decode_legacy(std::string_view bytes);

}  // namespace mediidx::tool

#endif
