// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What is asked of a worker that reads tags, and what comes back.
#ifndef MEDIIDX_TOOL_WORKERS_TAG_ANSWER_H_
#define MEDIIDX_TOOL_WORKERS_TAG_ANSWER_H_

#include <cstdint>
#include <string>

#include "tags/media_file.h"

namespace mediidx::tool {

/// One file to read. The ticket is the caller's own.
struct TagOrder {
  std::uint64_t ticket = 0;
  std::string path;
  Kind kind = Kind::kMusic;
};

/// By this a file is known to be as it was.
struct FileStamp {
  std::int64_t size = 0;
  std::int64_t seconds = 0;  ///< Of the modification time, since 1970.
  std::int32_t nanoseconds = 0;

  bool operator==(const FileStamp&) const = default;
};

struct TagAnswer {
  enum class Outcome : std::uint8_t {
    kRead,
    kUnreadable,  ///< The file system refused to tell or to give its content.
    kDamaged,     ///< It cannot be understood.
    kLost,        ///< Its reader died of it, or took too long.
  };

  std::uint64_t ticket = 0;
  Outcome outcome = Outcome::kLost;
  int error = 0;       ///< kUnreadable: an errno.
  std::string reason;  ///< In words, for people; of kRead empty.
  MediaFile file;      ///< Of kRead.
  /// Around the reading: they differ when the file was changed meanwhile. Empty as far as they
  /// could not be told, and of kLost.
  FileStamp before;
  FileStamp after;
};

}  // namespace mediidx::tool

#endif
