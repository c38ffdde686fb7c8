// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "support/log.h"

#include <syslog.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>

namespace mediidx {

void Log::write(int priority, LogShape shape, int line, const char* format,
                va_list arguments) const noexcept {
  const int error = errno;  // for "%m", and for the caller
  char* message = nullptr;
  if (vasprintf(&message, format, arguments) < 0) message = nullptr;
  // Without memory the bare format still says what happened.
  const char* text = message ? message : format;
  switch (shape) {
    case LogShape::kColon:
      syslog(priority, "%s:%d %s", module_, line, text);
      break;
    case LogShape::kParens:
      syslog(priority, "%s (%d) %s", module_, line, text);
      break;
    case LogShape::kTight:
      syslog(priority, "%s(%d)%s", module_, line, text);
      break;
  }
  std::free(message);
  errno = error;
}

void Log::colon(int line, const char* format, ...) const noexcept {
  va_list arguments;
  va_start(arguments, format);
  write(LOG_ERR, LogShape::kColon, line, format, arguments);
  va_end(arguments);
}

void Log::parens(int line, const char* format, ...) const noexcept {
  va_list arguments;
  va_start(arguments, format);
  write(LOG_ERR, LogShape::kParens, line, format, arguments);
  va_end(arguments);
}

void Log::tight(int line, const char* format, ...) const noexcept {
  va_list arguments;
  va_start(arguments, format);
  write(LOG_ERR, LogShape::kTight, line, format, arguments);
  va_end(arguments);
}

void Log::note(int line, const char* format, ...) const noexcept {
  va_list arguments;
  va_start(arguments, format);
  write(LOG_INFO, LogShape::kColon, line, format, arguments);
  va_end(arguments);
}

void Log::error(LogShape shape, int line, const char* format, ...) const noexcept {
  va_list arguments;
  va_start(arguments, format);
  write(LOG_ERR, shape, line, format, arguments);
  va_end(arguments);
}

}  // namespace mediidx
