// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include <climits>
#include <deque>
#include <string>

#include "border.h"

// A deque: texts that were handed out stay where they are when the list grows.
struct tlib_szlist {
  std::deque<std::string> texts;
};

using mediidx::platform::failed;
using mediidx::platform::no_throw;

extern "C" TLIBSZLIST* TLIBCSzListAlloc([[maybe_unused]] int size) {
  return no_throw<TLIBSZLIST*>(nullptr, "list.cpp", 1, [] { return new tlib_szlist; });
}

extern "C" void TLIBCSzListFree(TLIBSZLIST* list) { delete list; }

extern "C" int TLIBCSzListPush(TLIBSZLIST* list, const char* text) {
  if (!list || !text || list->texts.size() >= INT_MAX) {
    return failed(-1, TAVO_ERR_BAD_PARAMETERS, "list.cpp", 2);
  }
  return no_throw(-1, "list.cpp", 3, [&] {
    list->texts.emplace_back(text);
    return 0;
  });
}

extern "C" int TLIBCSzListCount(const TLIBSZLIST* list) {
  return list ? static_cast<int>(list->texts.size()) : 0;
}

extern "C" const char* TLIBCSzListGet(const TLIBSZLIST* list, int index) {
  if (index < 0 || index >= TLIBCSzListCount(list)) return nullptr;
  return list->texts[static_cast<std::size_t>(index)].c_str();
}
