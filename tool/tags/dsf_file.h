// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// DSF, of which TagLib reads the tag but does not know where it stands.
#ifndef MEDIIDX_TOOL_TAGS_DSF_FILE_H_
#define MEDIIDX_TOOL_TAGS_DSF_FILE_H_

#include <id3v2tag.h>
#include <tfile.h>

#include <memory>

namespace mediidx::tool {

class DsfFile : public TagLib::File {
 public:
  /// The stream outlives the object.
  explicit DsfFile(TagLib::IOStream* stream);
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
