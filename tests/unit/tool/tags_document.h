// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// docs/tags.md, from the tables by which the command reads tags.
#ifndef MEDIIDX_TESTS_UNIT_TOOL_TAGS_DOCUMENT_H_
#define MEDIIDX_TESTS_UNIT_TOOL_TAGS_DOCUMENT_H_

#include <span>
#include <string>
#include <string_view>

namespace mediidx::test {

/// A format and what its samples were made with.
struct SampledFormat {
  std::string_view name;
  std::string_view samples;
  bool is_foreign;  ///< Written by no program of the format, or never tried.
};
/// In the order of tool::music_formats, then those that only libavformat reads.
std::span<const SampledFormat> sampled_music();

std::string tags_document();

}  // namespace mediidx::test

#endif
