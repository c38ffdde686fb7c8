/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/* index_file FILE TITLE ARTIST: puts a song into the index, and shows what the index holds then. */
#include <mediidx/database.h>
#include <mediidx/index_folder.h>
#include <mediidx/request.h>
#include <stdio.h>
#include <stdlib.h>

#include "root.h"

static int index_file(struct __tag_TAVO_MEDIA_INFO* info) {
  const char* path = info->path;
  if (TAVOMediaIndexIsIndexPath(path, MEDIA_TABLE_MUSIC) != 1) {
    fprintf(stderr, "%s is not chosen for indexing\n", path);
    return 1;
  }
  if (TAVOMediaIndexAdd(info, MEDIA_TABLE_MUSIC) != 0) return 1;
  printf("row %u\n", info->id);
  /* The record is ours, and is filled again from the row. */
  if (MediaInfoDBGetOne(MEDIA_TABLE_MUSIC, path, info, 0) != 0) return 1;
  printf("%s by %s\n", info->title, info->artist);
  return 0;
}

int main(int argc, char** argv) {
  struct __tag_TAVO_MEDIA_INFO* info;
  int failed;
  if (argc != 4 || use_root() != 0) return 2;
  info = calloc(1, sizeof(*info));
  if (!info) return 1;
  snprintf(info->path, MEDIIDX_PATH_SIZE, "%s", argv[1]);
  snprintf(info->title, sizeof(info->title), "%s", argv[2]);
  snprintf(info->artist, sizeof(info->artist), "%s", argv[3]);

  IndexFolderInit();
  failed = index_file(info);
  TAVOMediaIndexDBClose();
  IndexFolderFree();
  free(info);
  return failed;
}
