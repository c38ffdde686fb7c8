// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/dsf_file.h"

namespace mediidx::tool {

DsfFile::DsfFile(TagLib::IOStream* stream) : TagLib::File(stream) {
  constexpr unsigned kHeader = 28;
  constexpr unsigned kTagPlace = 20;
  seek(0);
  const auto header = readBlock(kHeader);
  if (header.size() != kHeader || !header.startsWith("DSD ")) return;
  const auto place = header.toLongLong(kTagPlace, /*mostSignificantByteFirst=*/false);
  if (place >= kHeader && place < length()) {
    tag_ = std::make_unique<TagLib::ID3v2::Tag>(this, static_cast<long>(place));
  }
}

}  // namespace mediidx::tool
