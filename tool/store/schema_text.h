// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The schema that the command carries, made from schema/mediaserver.sql when it is built.
#ifndef MEDIIDX_TOOL_STORE_SCHEMA_TEXT_H_
#define MEDIIDX_TOOL_STORE_SCHEMA_TEXT_H_

namespace mediidx::tool {

/// The version of the schema that this program works with.
inline constexpr int kSchemaVersion = 3;

extern const char* const kSchemaText;

}  // namespace mediidx::tool

#endif
