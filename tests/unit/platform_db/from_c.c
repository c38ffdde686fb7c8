/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/* The header and its one variadic call, from C. */
#include <tavodb.h>

char* fill_from_c(const char* text, int number, long long wide);

char* fill_from_c(const char* text, int number, long long wide) {
  return TAVODBEscapeStringEX3(TAVODB_TYPE_POSTGRESQL, "'@TAVO:VAR', @TAVO:INT, @TAVO:LLINT", text,
                               number, wide);
}
