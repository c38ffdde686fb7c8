// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <sys/stat.h>
#include <tavocore.h>

#include <optional>
#include <string>
#include <string_view>
#include <unordered_set>

#include "border.h"
#include "key_value.h"
#include "utf8.h"
#include "whole_file.h"

namespace mediidx::platform {

namespace {

std::optional<mode_t> mode_of(const char* path) {
  struct stat info{};
  if (!path || stat(path, &info) != 0) return std::nullopt;
  return info.st_mode;
}

std::optional<KeyValue> find_key(std::string_view text, std::string_view separator,
                                 std::string_view key) {
  KeyValueReader reader(text, separator);
  while (const auto entry = reader.next()) {
    if (entry->key == key) return entry;
  }
  return std::nullopt;
}

bool store(TLIBSZHASH* hash, const KeyValue& entry) {
  return TLIBCSzHashSetValue(hash, std::string(entry.key).c_str(),
                             std::string(entry.value).c_str()) == 0;
}

int store_all(TLIBSZHASH* hash, std::string_view text, std::string_view separator) {
  std::unordered_set<std::string_view> seen;
  KeyValueReader reader(text, separator);
  while (const auto entry = reader.next()) {
    // The first line of a key counts, as in the reading of a single key.
    if (seen.insert(entry->key).second && !store(hash, *entry)) return -1;
  }
  return static_cast<int>(seen.size());
}

int store_one(TLIBSZHASH* hash, std::string_view text, std::string_view separator,
              std::string_view key) {
  const auto entry = find_key(text, separator, key);
  if (!entry) return 0;
  return store(hash, *entry) ? 1 : -1;
}

}  // namespace

}  // namespace mediidx::platform

namespace platform = mediidx::platform;

extern "C" int IsFileExist(const char* path, [[maybe_unused]] int flags) {
  const auto mode = platform::mode_of(path);
  return mode && !S_ISDIR(*mode) ? 1 : 0;
}

extern "C" int IsDirExist(const char* path) {
  const auto mode = platform::mode_of(path);
  return mode && S_ISDIR(*mode) ? 1 : 0;
}

extern "C" int TLIBCFileExist(const char* path) { return platform::mode_of(path) ? 1 : 0; }

extern "C" int TLIBCFileGetKeyValue(const char* file, const char* key, char* buffer, int size,
                                    [[maybe_unused]] int flags) {
  if (!file || !key || !buffer || size < 1) {
    return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "files.cpp", 1);
  }
  return platform::no_throw(-1, "files.cpp", 2, [&] {
    const auto text = platform::read_whole_file(file);
    if (!text) return platform::failed(-1, TAVO_ERR_OPEN_FAILED, "files.cpp", 3);
    const auto entry = platform::find_key(*text, "=", key);
    if (!entry) return 0;
    platform::copy_cut({buffer, static_cast<std::size_t>(size)}, entry->value);
    return 1;
  });
}

extern "C" int TLIBCFileGetKeys(const char* file, const char* keys, TLIBSZHASH* hash,
                                const char* separator) {
  if (!file || !hash || !separator || !*separator) {
    return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "files.cpp", 4);
  }
  return platform::no_throw(-1, "files.cpp", 5, [&] {
    const auto text = platform::read_whole_file(file);
    if (!text) return platform::failed(-1, TAVO_ERR_OPEN_FAILED, "files.cpp", 6);
    return keys ? platform::store_one(hash, *text, separator, keys)
                : platform::store_all(hash, *text, separator);
  });
}
