// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The system log, in the message shapes that the library's readers know.
#ifndef MEDIIDX_SUPPORT_LOG_H_
#define MEDIIDX_SUPPORT_LOG_H_

#include <cstdarg>

namespace mediidx {

/// How a message begins.
enum class LogShape {
  kColon,   ///< "module:line message"
  kParens,  ///< "module (line) message"
  kTight,   ///< "module(line)message"
};

/// One module's access to the system log. A message's line is a constant of its own, unique within
/// the module, so that a log line names the one call that wrote it whatever happens to the source.
class Log {
 public:
  constexpr explicit Log(const char* module) : module_(module) {}

  [[gnu::format(printf, 3, 4)]] void colon(int line, const char* format, ...) const noexcept;
  [[gnu::format(printf, 3, 4)]] void parens(int line, const char* format, ...) const noexcept;
  [[gnu::format(printf, 3, 4)]] void tight(int line, const char* format, ...) const noexcept;
  /// "module:line message" as an informational note, not an error.
  [[gnu::format(printf, 3, 4)]] void note(int line, const char* format, ...) const noexcept;
  [[gnu::format(printf, 4, 5)]] void error(LogShape shape, int line, const char* format,
                                           ...) const noexcept;

 private:
  [[gnu::format(printf, 5, 0)]] void write(int priority, LogShape shape, int line,
                                           const char* format, va_list arguments) const noexcept;

  const char* module_;
};

inline constexpr Log kDatabaseLog{"mediidx_database"};
inline constexpr Log kPlaylistLog{"mediidx_playlist_parse"};
inline constexpr Log kCueLog{"mediidx_playlist_cue_parse"};
inline constexpr Log kIndexFolderLog{"mediidx_indexfolder"};
inline constexpr Log kIndexFolderActionLog{"mediidx_indexfolder_action"};
inline constexpr Log kRequestLog{"mediidx"};

}  // namespace mediidx

#endif
