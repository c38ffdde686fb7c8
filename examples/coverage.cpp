// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// coverage PATH…: for which kinds of media a path is chosen for indexing. No database is needed.
#include <mediidx/index_folder.h>

#include <iostream>

#include "root.h"

int main(int argc, char** argv) {
  if (use_root() != 0) return 2;
  IndexFolderInit();
  std::cout << gIndexFolderConf.size() << " folders\n";
  for (int i = 1; i < argc; ++i) {
    std::cout << argv[i] << ":";
    for (const auto& [kind, name] :
         {std::pair{MEDIA_TABLE_MUSIC, "music"}, std::pair{MEDIA_TABLE_VIDEO, "video"},
          std::pair{MEDIA_TABLE_PHOTO, "photo"}}) {
      if (IndexFolderIsPathIndexed(argv[i], kind) == 1) std::cout << " " << name;
    }
    std::cout << "\n";
  }
  IndexFolderFree();
}
