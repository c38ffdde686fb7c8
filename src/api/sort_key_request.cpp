// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mediidx/request.h"
#include "support/sort_key.h"

extern "C" char* TAVOMediaIndexGetSortAndSearchProperty(const char* name, char* search,
                                                        int searchLength, char* sort,
                                                        int sortLength) {
  return mediidx::make_sort_and_search_keys(name, search, searchLength, sort, sortLength);
}
