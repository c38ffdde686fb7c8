// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The character set of a cue sheet, and its conversion to UTF-8 by the external converter.
#ifndef MEDIIDX_PLAYLIST_CUE_CHARSET_H_
#define MEDIIDX_PLAYLIST_CUE_CHARSET_H_

#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "support/owned.h"

namespace mediidx {

/// The iconv name of the character set of a file that begins with `sample`, guided by the
/// configured code page ("enu", "rus", …); empty when it cannot be told, and for an empty sample.
std::optional<std::string> detect_charset(std::string_view sample, std::string_view code_page);

/// The same for the file at a path under the system's code page; empty when it cannot be read.
std::optional<std::string> detect_cue_charset(const char* cue_path);

/// Starts the converter from `charset` to UTF-8; its output, or null.
OwnedPipe open_cue_converter(const char* cue_path, const std::string& charset);

}  // namespace mediidx

#endif
