// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/id3_file.h"

namespace mediidx::tool {
namespace {

/// Where a tag may stand in a file that begins so; -1 for nowhere.
long long tag_place(const TagLib::ByteVector& header) {
  constexpr unsigned kPlaceOfDsf = 20;
  if (header.startsWith("ID3")) return 0;
  if (!header.startsWith("DSD ")) return -1;
  const auto place = header.toLongLong(kPlaceOfDsf, /*mostSignificantByteFirst=*/false);
  return place > 0 ? place : -1;
}

}  // namespace

Id3File::Id3File(TagLib::IOStream* stream) : TagLib::File(stream) {
  constexpr unsigned kHeader = 28;
  seek(0);
  const auto header = readBlock(kHeader);
  const auto place = header.size() == kHeader ? tag_place(header) : -1;
  if (place >= 0 && place < length()) {
    tag_ = std::make_unique<TagLib::ID3v2::Tag>(this, static_cast<long>(place));
  }
}

}  // namespace mediidx::tool
