// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// A user, stars, and the file of ratings beside a song: what the library reads of it, and what the
// command makes of it.
#include "ratings/rating_file.h"

#include <tavocore.h>
#include <tavosdk.h>

#include <map>
#include <optional>

#include "database/side_rating.h"
#include "fuzz.h"
#include "scratch.h"

// Every user exists.
extern "C" {
TAVOSDK_EXPORT int TAVOUserGetByUID(std::uint32_t uid, TAVOUSER** user) {
  *user = new TAVOUSER{"user", uid, 0, "/"};
  return 0;
}
TAVOSDK_EXPORT void TAVOUserFree(TAVOUSER* user) { delete user; }
}

namespace {

using namespace mediidx;

class Song {
 public:
  Song() {
    folder_.write("a.mp3", "");
    std::snprintf(info_.path, sizeof info_.path, "%s", path().c_str());
  }
  std::string path() const { return folder_.at("a.mp3"); }
  void rate(std::string_view text) const {
    folder_.write("@eaDir/a.mp3/TAVOAUDIO_SONG_RATING", text);
  }
  /// As the index stores them.
  std::multimap<std::uint32_t, int> stored() const {
    const auto read = catalogue::read_ratings(info_, false);
    fuzz::check(read.has_value());
    std::multimap<std::uint32_t, int> found;
    for (const auto& rating : *read) found.emplace(rating.userid, rating.star);
    return found;
  }

 private:
  test::ScratchFolder folder_;
  __tag_TAVO_MEDIA_INFO info_{};
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const Song song;
  fuzz::Input input(data, size);
  const auto user = static_cast<std::uint32_t>(std::strtoul(input.text().c_str(), nullptr, 10));
  const int stars = static_cast<int>(input.byte() % (tool::kMostStars + 1));
  const std::string text(input.rest());
  song.rate(text);
  auto expected = song.stored();
  tool::read_ratings(song.path());

  // Only the user's ratings change.
  song.rate(tool::with_rating(text, user, stars));
  expected.erase(user);
  if (stars > 0) expected.emplace(user, stars);
  fuzz::check(song.stored() == expected);
  const auto shown = tool::read_ratings(song.path());
  fuzz::check(shown.contains(user) == (stars > 0));
  if (stars > 0) fuzz::check(shown.at(user) == stars);

  // By way of the file it is the same.
  song.rate(text);
  tool::write_rating(song.path(), user, stars);
  fuzz::check(song.stored() == expected);
  return 0;
}
