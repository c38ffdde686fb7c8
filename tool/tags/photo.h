// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Camera settings as people write them.
#ifndef MEDIIDX_TOOL_TAGS_PHOTO_H_
#define MEDIIDX_TOOL_TAGS_PHOTO_H_

#include <string>

namespace mediidx::tool {

/// 1/125 s as "1/125", 2.5 s as "2.5"; empty for what is no time.
std::string exposure_text(double seconds);
/// 2.8 as "f/2.8", 8 as "f/8"; empty for what is no aperture.
std::string aperture_text(double f_number);

}  // namespace mediidx::tool

#endif
