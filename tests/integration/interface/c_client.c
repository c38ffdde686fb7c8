/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/* A caller in C: c_client ROOT FILE adds a video to the index, counts and lists the videos, and
 * prints what it found. */
#include <mediidx/catalogue.h>
#include <mediidx/cue_sheet.h>
#include <mediidx/database.h>
#include <mediidx/index_folder.h>
#include <mediidx/index_folder_action.h>
#include <mediidx/playlist.h>
#include <mediidx/request.h>
#include <mediidx/root.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <tavocore.h>

static int list_videos(void) {
  struct __tag_TAVO_MEDIA_INFO* info = calloc(1, sizeof *info);
  MEDIA_DB_HANDLE* handle =
      MediaInfoDBOpenEx(MEDIA_TABLE_VIDEO, "path, title", NULL, NULL, "path", 0, 0, 0);
  if (!info || !handle) {
    free(info);
    MediaInfoDBClose(handle);
    return 1;
  }
  while (MediaInfoDBGet(handle, info) == 0) printf("%s: %s\n", info->path, info->title);
  MediaInfoDBClose(handle);
  free(info);
  return 0;
}

static int add_video(const char* path) {
  struct __tag_TAVO_MEDIA_INFO* info = calloc(1, sizeof *info);
  int result = -1;
  if (!info) return -1;
  if (strlen(path) < MEDIIDX_PATH_SIZE) {
    strcpy(info->path, path);
    strcpy(info->title, " From C ");
    result = TAVOMediaIndexAdd(info, MEDIA_TABLE_VIDEO);
  }
  free(info);
  return result;
}

int main(int argc, char** argv) {
  int failed;
  if (argc != 3) return 2;
  if (TAVOMediaIndexRootSet(argv[1]) != 0 || TAVOPlatformRootSet(argv[1]) != 0) return 2;
  IndexFolderInit();
  printf("folders %d\n", IndexFolderSizeGet());
  printf("added %d\n", add_video(argv[2]));
  printf("counted %d\n", MediaInfoDBGetCount(MEDIA_TABLE_VIDEO, NULL, NULL, NULL, 0));
  failed = list_videos();
  failed |= TAVOMediaIndexDBClose() != 0 || gpDBConnect != NULL;
  IndexFolderFree();
  return failed;
}
