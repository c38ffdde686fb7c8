// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Texts that hold several genres.
#ifndef MEDIIDX_DATABASE_TRACK_GENRE_H_
#define MEDIIDX_DATABASE_TRACK_GENRE_H_

#include <cstddef>
#include <optional>
#include <string>

#include "support/owned.h"

namespace mediidx::catalogue {

/// Cuts a text at ";"; runs of ";" count as one, so no token is empty. Tokens come as they stand,
/// blanks included.
class GenreTokens {
 public:
  explicit GenreTokens(const char* genres);

  /// False when there was no memory for a copy of the text.
  explicit operator bool() const { return copy_ != nullptr; }
  /// The next token, for the caller to change in place; null at the end.
  char* next();

 private:
  OwnedText copy_;
  char* start_;
  char* rest_ = nullptr;
};

/// The most bytes that an aggregated text keeps.
inline constexpr std::size_t kAggregatedWidth = 255;

/// All genres of a track in one text, joined by "; ", and the joined keys.
struct AggregatedGenre {
  std::string text;
  std::string sort;
  std::string search;
};

/// The first genre keeps its blanks, the others are trimmed. A text that names no genre stays as it
/// is. Empty, and logged, when memory runs out.
std::optional<AggregatedGenre> aggregate_genres(const char* genres);

}  // namespace mediidx::catalogue

#endif
