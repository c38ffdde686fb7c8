# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT

# The music catalogue's part of this folder.
target_sources(mediidx_objects PRIVATE
  album_artist.cpp
  album_artist_recovery.cpp
  catalogue.cpp
  catalogue_connection.cpp
  catalogue_exports.cpp
  side_rating.cpp
  side_rows.cpp
  track_genre.cpp
  track_row.cpp)
