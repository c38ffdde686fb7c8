// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include <algorithm>
#include <climits>
#include <deque>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>

#include "border.h"

namespace {

struct Entry {
  std::string key;
  std::string value;
};

}  // namespace

// Entries in the order of first insertion; the positions refer to the keys inside the entries,
// which a deque never moves.
struct tlib_szhash {
  std::deque<Entry> entries;
  std::unordered_map<std::string_view, std::size_t> positions;
};

using mediidx::platform::failed;
using mediidx::platform::no_throw;

namespace {

void set_value(tlib_szhash& hash, const char* key, const char* value) {
  const auto found = hash.positions.find(key);
  if (found != hash.positions.end()) {
    hash.entries[found->second].value = value;
    return;
  }
  hash.entries.push_back({key, value});
  try {
    hash.positions.emplace(hash.entries.back().key, hash.entries.size() - 1);
  } catch (...) {
    hash.entries.pop_back();
    throw;
  }
}

}  // namespace

extern "C" TLIBSZHASH* TLIBCSzHashAlloc(int size) {
  // A hint is believed up to what costs little.
  constexpr int kMostReserved = 1 << 16;
  return no_throw<TLIBSZHASH*>(nullptr, "hash.cpp", 1, [&] {
    auto hash = std::make_unique<tlib_szhash>();
    hash->positions.reserve(static_cast<std::size_t>(std::clamp(size, 0, kMostReserved)));
    return hash.release();
  });
}

extern "C" void TLIBCSzHashFree(TLIBSZHASH* hash) { delete hash; }

extern "C" int TLIBCSzHashSetValue(TLIBSZHASH* hash, const char* key, const char* value) {
  if (!hash || !key || !value || hash->entries.size() >= INT_MAX) {
    return failed(-1, TAVO_ERR_BAD_PARAMETERS, "hash.cpp", 2);
  }
  return no_throw(-1, "hash.cpp", 3, [&] {
    set_value(*hash, key, value);
    return 0;
  });
}

extern "C" const char* TLIBCSzHashGetValue(const TLIBSZHASH* hash, const char* key) {
  if (!hash || !key) return nullptr;
  const auto found = hash->positions.find(key);
  return found == hash->positions.end() ? nullptr : hash->entries[found->second].value.c_str();
}

extern "C" int TLIBCSzHashCount(const TLIBSZHASH* hash) {
  return hash ? static_cast<int>(hash->entries.size()) : 0;
}

extern "C" int TLIBCSzHashNext(const TLIBSZHASH* hash, int* cursor, const char** key,
                               const char** value) {
  if (!cursor || *cursor < 0 || *cursor >= TLIBCSzHashCount(hash)) return 0;
  const Entry& entry = hash->entries[static_cast<std::size_t>(*cursor)];
  ++*cursor;
  if (key) *key = entry.key.c_str();
  if (value) *value = entry.value.c_str();
  return 1;
}
