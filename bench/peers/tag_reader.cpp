// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// tag_reader FOLDER: TagLib reads the tags and the audio properties of every file that it knows, on
// one core, and nothing is done with them. Prints how many files there were.
#include <fileref.h>
#include <tpropertymap.h>

#include <cstdio>
#include <filesystem>
#include <set>
#include <string>

int main(int count, char** words) {
  if (count != 2) return 2;
  const std::set<std::string> audio{".flac", ".m4a", ".mp3", ".ogg"};
  std::size_t files = 0;
  std::size_t tags = 0;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(words[1])) {
    if (!audio.contains(entry.path().extension())) continue;
    const TagLib::FileRef file(entry.path().c_str());
    if (file.isNull() || !file.audioProperties()) continue;
    ++files;
    tags += file.file()->properties().size();
  }
  std::printf("%zu files, %zu tags\n", files, tags);
  return 0;
}
