// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// ID3v2 in files of formats that TagLib does not know: at their beginning, or where DSF says.
#ifndef MEDIIDX_TOOL_TAGS_ID3_FILE_H_
#define MEDIIDX_TOOL_TAGS_ID3_FILE_H_

#include <id3v2tag.h>
#include <tfile.h>

#include <memory>

namespace mediidx::tool {

class Id3File : public TagLib::File {
 public:
  /// The stream outlives the object.
  explicit Id3File(TagLib::IOStream* stream);
  /// Null when there is none.
  TagLib::ID3v2::Tag* ID3v2Tag() const { return tag_.get(); }

  TagLib::Tag* tag() const override { return tag_.get(); }
  TagLib::AudioProperties* audioProperties() const override { return nullptr; }
  bool save() override { return false; }

 private:
  std::unique_ptr<TagLib::ID3v2::Tag> tag_;
};

}  // namespace mediidx::tool

#endif
