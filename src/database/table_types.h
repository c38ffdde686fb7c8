// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The per-type tables, by table type.
#ifndef MEDIIDX_DATABASE_TABLE_TYPES_H_
#define MEDIIDX_DATABASE_TABLE_TYPES_H_

#include <array>
#include <cstddef>

#include "mediidx/types.h"

namespace mediidx {

struct TableType {
  MEDIA_TABLE_TYPE type;
  const char* name;
  bool has_online_state;  ///< Rows are marked offline while their volume is away.
};

/// Every type that has a table; a type is the position of its table.
inline constexpr std::array kTableTypes{
    TableType{MEDIA_TABLE_MUSIC, "music", true},
    TableType{MEDIA_TABLE_VIDEO, "video", true},
    TableType{MEDIA_TABLE_PHOTO, "photo", true},
    TableType{MEDIA_TABLE_PLAYLIST, "playlist", true},
    TableType{MEDIA_TABLE_DIRECTORY, "directory", true},
    TableType{MEDIA_TABLE_VIDEO_CONVERT, "video_convert", false},
};

consteval bool table_types_stand_at_their_position() {
  for (std::size_t i = 0; i < kTableTypes.size(); ++i) {
    if (kTableTypes[i].type != i) return false;
  }
  return kTableTypes.size() == MEDIA_TABLE_FOLDER;
}
static_assert(table_types_stand_at_their_position());

/// Transcoded copies have a table, but are never selected through a handle.
constexpr bool is_selectable(MEDIA_TABLE_TYPE type) { return type <= MEDIA_TABLE_DIRECTORY; }

constexpr const char* table_name(MEDIA_TABLE_TYPE type) { return kTableTypes[type].name; }

}  // namespace mediidx

#endif
