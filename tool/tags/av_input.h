// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A media file opened with libavformat.
#ifndef MEDIIDX_TOOL_TAGS_AV_INPUT_H_
#define MEDIIDX_TOOL_TAGS_AV_INPUT_H_

extern "C" {
#include <libavformat/avformat.h>
}

#include <cstdint>
#include <string>

#include "tags/tag_table.h"

namespace mediidx::tool {

/// Opens plain container formats only: a file whose content is a list of addresses of others would
/// otherwise make the reader open those, over the network too.
class AvInput {
 public:
  /// Throws ReadError.
  explicit AvInput(const std::string& path);
  ~AvInput();
  AvInput(const AvInput&) = delete;
  AvInput& operator=(const AvInput&) = delete;

  /// The stream that a player would choose; null when there is none. Covers are no video.
  const AVStream* best_stream(AVMediaType type) const;
  /// The first one of this type; null when there is none.
  const AVStream* first_stream(AVMediaType type) const;
  /// A tag of the file, else of the audio stream (where Ogg has them), cleaned; empty when there is
  /// none. Names match without regard to case.
  std::string tag(const char* name) const;
  /// All tags of the file and of its first audio stream, and the number of covers.
  NamedTags tags() const;
  double duration_s() const;
  /// Bits a second of all streams; 0 when unknown.
  int bit_rate() const;
  /// "matroska", "avi", …; of the formats that share a reader the one that the extension names.
  std::string container(const std::string& path) const;
  AVFormatContext* context() const { return context_; }

 private:
  AVFormatContext* context_ = nullptr;
};

/// A number that fits the record; 0 for one that does not, and for what is unknown.
int to_int(std::int64_t value);
/// "h264", "aac"; empty without a stream.
std::string codec_of(const AVStream* stream);
/// The rate that the stream's header tells, or the one that Matroska's writers leave as a tag; 0
/// without a stream.
int bit_rate_of(const AVStream* stream);

}  // namespace mediidx::tool

#endif
