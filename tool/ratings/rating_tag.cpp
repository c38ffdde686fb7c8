// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "ratings/rating_tag.h"

#include <aifffile.h>
#include <apefile.h>
#include <asffile.h>
#include <fileref.h>
#include <id3v2header.h>
#include <id3v2tag.h>
#include <mp4file.h>
#include <mpcfile.h>
#include <mpegfile.h>
#include <popularimeterframe.h>
#include <tfilestream.h>
#include <tpropertymap.h>
#include <trueaudiofile.h>
#include <wavfile.h>
#include <wavpackfile.h>
#include <xiphcomment.h>

#include <array>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <stdexcept>

#include "ratings/rating_file.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace ID3v2 = TagLib::ID3v2;

constexpr const char* kFmps = "FMPS_RATING";
constexpr const char* kFmpsOfMp4 = "----:com.apple.iTunes:FMPS_Rating";
constexpr const char* kFmpsOfAsf = "FMPS/Rating";

/// The ID3 tag of formats that rate by POPM; null for others. `create` makes one.
ID3v2::Tag* id3_tag(TagLib::File& file, bool create) {
  if (auto* mpeg = dynamic_cast<TagLib::MPEG::File*>(&file)) return mpeg->ID3v2Tag(create);
  if (auto* tta = dynamic_cast<TagLib::TrueAudio::File*>(&file)) return tta->ID3v2Tag(create);
  if (auto* aiff = dynamic_cast<TagLib::RIFF::AIFF::File*>(&file)) return aiff->tag();
  if (auto* wav = dynamic_cast<TagLib::RIFF::WAV::File*>(&file)) return wav->ID3v2Tag();
  return nullptr;
}

std::optional<int> read_popm(const ID3v2::Tag& tag, const std::string& user) {
  std::optional<int> first;
  for (const auto* frame : tag.frameList("POPM")) {
    const auto* popm = dynamic_cast<const ID3v2::PopularimeterFrame*>(frame);
    const auto stars = popm ? stars_of_popm(popm->rating()) : std::nullopt;
    if (!stars) continue;
    if (popm->email().to8Bit(true) == user) return stars;
    if (!first) first = stars;
  }
  return first;
}

void write_popm(ID3v2::Tag& tag, const std::string& user, int stars) {
  for (auto* frame : tag.frameList("POPM")) {
    auto* popm = dynamic_cast<ID3v2::PopularimeterFrame*>(frame);
    if (!popm || popm->email().to8Bit(true) != user) continue;
    popm->setRating(popm_of_stars(stars));
    return;
  }
  // The tag owns its frames.
  auto* popm = new ID3v2::PopularimeterFrame;  // NOLINT(cppcoreguidelines-owning-memory)
  popm->setEmail({user, TagLib::String::UTF8});
  popm->setRating(popm_of_stars(stars));
  tag.addFrame(popm);
}

std::string first_text(const TagLib::StringList& texts) {
  return texts.isEmpty() ? std::string() : texts.front().to8Bit(true);
}

std::string read_fmps(TagLib::File& file) {
  if (auto* mp4 = dynamic_cast<TagLib::MP4::File*>(&file)) {
    return mp4->tag() ? first_text(mp4->tag()->item(kFmpsOfMp4).toStringList()) : "";
  }
  if (auto* asf = dynamic_cast<TagLib::ASF::File*>(&file)) {
    const auto values =
        asf->tag() ? asf->tag()->attribute(kFmpsOfAsf) : TagLib::ASF::AttributeList();
    return values.isEmpty() ? "" : values.front().toString().to8Bit(true);
  }
  return first_text(file.properties()[kFmps]);
}

/// False for a file that holds no tags by name.
bool set_fmps(TagLib::File& file, int stars) {
  const TagLib::String text = fmps_of_stars(stars);
  if (auto* mp4 = dynamic_cast<TagLib::MP4::File*>(&file)) {
    if (!mp4->tag()) return false;
    mp4->tag()->setItem(kFmpsOfMp4, TagLib::StringList(text));
    return true;
  }
  if (auto* asf = dynamic_cast<TagLib::ASF::File*>(&file)) {
    if (!asf->tag()) return false;
    asf->tag()->setAttribute(kFmpsOfAsf, {TagLib::ASF::Attribute(text)});
    return true;
  }
  auto tags = file.properties();
  tags.replace(kFmps, TagLib::StringList(text));
  const auto refused = file.setProperties(tags);
  return !refused.contains(kFmps);
}

/// As the file has it, so that a player of old tags still reads them.
ID3v2::Version version_of(const ID3v2::Tag& tag) {
  const auto* header = tag.header();
  return header && header->majorVersion() == 3 ? ID3v2::v3 : ID3v2::v4;
}

bool save(TagLib::File& file) {
  auto* mpeg = dynamic_cast<TagLib::MPEG::File*>(&file);
  if (!mpeg) return file.save();
  return mpeg->save(TagLib::MPEG::File::ID3v2, TagLib::File::StripNone,
                    version_of(*mpeg->ID3v2Tag(true)), TagLib::File::DoNotDuplicate);
}

}  // namespace

std::optional<int> stars_of_popm(int rating) {
  constexpr std::array kLeast{1, 32, 96, 160, 224};
  std::optional<int> stars;
  for (std::size_t i = 0; i < kLeast.size(); ++i) {
    if (rating >= kLeast[i]) stars = static_cast<int>(i) + 1;
  }
  return stars;
}

int popm_of_stars(int stars) {
  constexpr std::array kRatings{0, 1, 64, 128, 196, 255};
  return kRatings.at(static_cast<std::size_t>(stars));
}

std::optional<int> stars_of_fmps(std::string_view rating) {
  double value = 0;
  const char* end = rating.data() + rating.size();
  const auto read = std::from_chars(rating.data(), end, value);
  if (read.ec != std::errc() || read.ptr != end || !(value >= 0 && value <= 1)) return std::nullopt;
  const int stars = static_cast<int>(std::lround(value * kMostStars));
  return stars > 0 ? std::optional(stars) : std::nullopt;
}

std::string fmps_of_stars(int stars) {
  std::array<char, 16> text;
  std::snprintf(text.data(), text.size(), "%.1f", static_cast<double>(stars) / kMostStars);
  return text.data();
}

std::optional<int> read_rating_tag(const std::string& path, const std::string& user) {
  TagLib::FileStream stream(path.c_str(), /*openReadOnly=*/true);
  if (!stream.isOpen()) throw std::runtime_error("it cannot be opened");
  const TagLib::FileRef opened(&stream, /*readAudioProperties=*/false);
  if (opened.isNull()) return std::nullopt;
  if (const auto* tag = id3_tag(*opened.file(), false)) {
    if (const auto stars = read_popm(*tag, user)) return stars;
  }
  return stars_of_fmps(clean_text(read_fmps(*opened.file())));
}

bool write_rating_tag(const std::string& path, const std::string& user, int stars) {
  TagLib::FileStream stream(path.c_str());
  if (!stream.isOpen() || stream.readOnly()) throw std::runtime_error("it cannot be written");
  const TagLib::FileRef opened(&stream, /*readAudioProperties=*/false);
  if (opened.isNull()) return false;
  auto& file = *opened.file();
  if (auto* tag = id3_tag(file, true)) {
    write_popm(*tag, user, stars);
  } else if (!set_fmps(file, stars)) {
    return false;
  }
  if (!save(file)) throw std::runtime_error("its tags cannot be written");
  return true;
}

}  // namespace mediidx::tool
