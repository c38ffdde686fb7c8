/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/* read_playlist FILE: shows the entries of an M3U, PLS or WPL playlist, those in the index with
 * their titles from there. */
#include <mediidx/database.h>
#include <mediidx/playlist.h>
#include <stdio.h>

#include "root.h"

int main(int argc, char** argv) {
  const int all = MEDIIDX_KEEP_KNOWN | MEDIIDX_KEEP_UNKNOWN | MEDIIDX_KEEP_STREAMS;
  int count = 0;
  struct _PLAYLIST_REC* list;
  const struct _PLAYLIST_REC* entry;
  if (argc != 2 || use_root() != 0) return 2;
  list = ParsePlayListByFieldGivenPath(argv[1], &count, 0, 0, "id, path, title", all);
  printf("%d entries\n", count);
  for (entry = list; entry; entry = entry->next) {
    printf("%s %s\n", entry->info.path, entry->info.id ? entry->info.title : "(not in the index)");
  }
  TAVOPlaylistRecFree(list);
  MediaDBConnClose();
  return 0;
}
