// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/track_genre.h"

#include <tavocore.h>

#include <cerrno>
#include <cstring>

#include "database/catalogue_lines.h"
#include "support/log.h"
#include "support/sort_key.h"
#include "support/text.h"

namespace mediidx::catalogue {
namespace {

AggregatedGenre one_genre(const char* genre) {
  const NameKeys keys(genre);
  return {genre, keys.sort, keys.search};
}

void append(AggregatedGenre& all, const char* genre) {
  const NameKeys keys(genre);
  all.text.append("; ").append(genre);
  all.sort.append("; ").append(keys.sort);
  all.search.append("; ").append(keys.search);
}

void cut(std::string& text) { text.resize(cut_at_character(text, kAggregatedWidth).size()); }

}  // namespace

GenreTokens::GenreTokens(const char* genres) : copy_(strdup(genres)), start_(copy_.get()) {}

char* GenreTokens::next() {
  char* token = strtok_r(start_, ";", &rest_);
  start_ = nullptr;
  return token;
}

std::optional<AggregatedGenre> aggregate_genres(const char* genres) {
  GenreTokens tokens(genres);
  if (!tokens) {
    kDatabaseLog.colon(kTrackGenreCopyLine, "Failed to strdup. %s", std::strerror(errno));
    return std::nullopt;
  }
  const char* first = tokens.next();
  AggregatedGenre all = one_genre(first ? first : genres);
  // strtok_r that found nothing must not be asked again.
  while (first) {
    char* token = tokens.next();
    if (!token) break;
    append(all, StringTrim(token));
  }
  cut(all.text);
  cut(all.sort);
  cut(all.search);
  return all;
}

}  // namespace mediidx::catalogue
