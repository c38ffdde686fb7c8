// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// No fuzzer writes to the system log, by any of the names that a build reaches it by.
#include <cstdarg>

extern "C" {
__attribute__((visibility("default"))) void syslog(int, const char*, ...) {}
__attribute__((visibility("default"))) void __syslog_chk(int, int, const char*, ...) {}
__attribute__((visibility("default"))) void vsyslog(int, const char*, va_list) {}
__attribute__((visibility("default"))) void __vsyslog_chk(int, int, const char*, va_list) {}
}
