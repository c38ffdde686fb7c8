// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/named_tags.h"

#include <attachedpictureframe.h>
#include <commentsframe.h>
#include <id3v1genres.h>
#include <relativevolumeframe.h>
#include <textidentificationframe.h>

#include <algorithm>
#include <cmath>

#include "text/legacy_text.h"

namespace mediidx::tool {
namespace {

namespace ID3v2 = TagLib::ID3v2;

TagLib::String decode(const TagLib::ByteVector& bytes) {
  return {decode_legacy({bytes.data(), bytes.size()}), TagLib::String::UTF8};
}

struct Id3v2Decoder : ID3v2::Latin1StringHandler {
  TagLib::String parse(const TagLib::ByteVector& bytes) const override { return decode(bytes); }
};

struct Id3v1Decoder : TagLib::ID3v1::StringHandler {
  TagLib::String parse(const TagLib::ByteVector& bytes) const override {
    return decode(bytes).stripWhiteSpace();
  }
};

struct InfoDecoder : TagLib::RIFF::Info::StringHandler {
  TagLib::String parse(const TagLib::ByteVector& bytes) const override { return decode(bytes); }
};

std::string utf8(const TagLib::String& text) { return text.to8Bit(true); }
std::string plain(const TagLib::ByteVector& bytes) { return {bytes.data(), bytes.size()}; }

/// "17" as the genre of that number.
std::string genre_name(const std::string& text) {
  constexpr std::size_t kDigits = 3;
  const bool is_number = !text.empty() && text.size() <= kDigits &&
                         std::ranges::all_of(text, [](char c) { return c >= '0' && c <= '9'; });
  if (!is_number) return text;
  const auto name = utf8(TagLib::ID3v1::genre(std::stoi(text)));
  return name.empty() ? text : name;
}

void add_text(const ID3v2::TextIdentificationFrame& frame, NamedTags& out) {
  auto name = plain(frame.frameID());
  const bool is_genre = name == "TCON";
  auto fields = frame.fieldList();
  const auto* own = dynamic_cast<const ID3v2::UserTextIdentificationFrame*>(&frame);
  if (own) {
    name += ":" + utf8(own->description());
    if (!fields.isEmpty()) fields.erase(fields.begin());
  }
  for (const auto& field : fields) {
    out.add(name, is_genre ? genre_name(utf8(field)) : utf8(field));
  }
}

void add_comment(const ID3v2::CommentsFrame& frame, NamedTags& out) {
  const auto description = utf8(frame.description());
  out.add(description.empty() ? "COMM" : "COMM:" + description, utf8(frame.text()));
}

/// The peak stands as so many bits, of which the first counts whole full scales.
double peak_of(const ID3v2::RelativeVolumeFrame::PeakVolume& peak) {
  double value = 0;
  for (const unsigned char byte : peak.peakVolume) value = value * 256 + byte;
  return std::ldexp(value, 1 - static_cast<int>(peak.peakVolume.size() * 8));
}

void add_volume(const ID3v2::RelativeVolumeFrame& frame, NamedTags& out) {
  const auto name = "RVA2:" + utf8(frame.identification());
  if (!frame.channels().contains(ID3v2::RelativeVolumeFrame::MasterVolume)) return;
  out.add(name + " gain", std::to_string(frame.volumeAdjustment()));
  if (!frame.peakVolume().peakVolume.isEmpty()) {
    out.add(name + " peak", std::to_string(peak_of(frame.peakVolume())));
  }
}

std::string number_text(unsigned number) { return number == 0 ? "" : std::to_string(number); }

std::string text_of(const TagLib::ASF::Attribute& attribute) {
  switch (attribute.type()) {
    case TagLib::ASF::Attribute::UnicodeType:
      return utf8(attribute.toString());
    case TagLib::ASF::Attribute::WordType:
      return std::to_string(attribute.toUShort());
    case TagLib::ASF::Attribute::DWordType:
      return std::to_string(attribute.toUInt());
    case TagLib::ASF::Attribute::QWordType:
      return std::to_string(attribute.toULongLong());
    default:
      return {};
  }
}

}  // namespace

void prepare_taglib() {
  static const Id3v2Decoder id3v2;
  static const Id3v1Decoder id3v1;
  static const InfoDecoder info;
  ID3v2::Tag::setLatin1StringHandler(&id3v2);
  TagLib::ID3v1::Tag::setStringHandler(&id3v1);
  TagLib::RIFF::Info::Tag::setStringHandler(&info);
}

NamedTags named_tags(const ID3v2::Tag& tag) {
  NamedTags out{TagFamily::kId3v2, {}};
  for (const auto* frame : tag.frameList()) {
    if (const auto* text = dynamic_cast<const ID3v2::TextIdentificationFrame*>(frame)) {
      add_text(*text, out);
    } else if (const auto* comment = dynamic_cast<const ID3v2::CommentsFrame*>(frame)) {
      add_comment(*comment, out);
    } else if (const auto* volume = dynamic_cast<const ID3v2::RelativeVolumeFrame*>(frame)) {
      add_volume(*volume, out);
    } else if (dynamic_cast<const ID3v2::AttachedPictureFrame*>(frame)) {
      ++out.covers;
    }
  }
  return out;
}

NamedTags named_tags(const TagLib::ID3v1::Tag& tag) {
  NamedTags out{TagFamily::kId3v1, {}};
  out.add("title", utf8(tag.title()));
  out.add("artist", utf8(tag.artist()));
  out.add("album", utf8(tag.album()));
  out.add("comment", utf8(tag.comment()));
  out.add("genre", utf8(tag.genre()));
  out.add("year", number_text(tag.year()));
  out.add("track", number_text(tag.track()));
  return out;
}

NamedTags named_tags(TagLib::Ogg::XiphComment& tag) {
  NamedTags out{TagFamily::kVorbis, {}};
  for (const auto& [name, values] : tag.fieldListMap()) {
    for (const auto& value : values) out.add(utf8(name), utf8(value));
  }
  out.covers = static_cast<int>(tag.pictureList().size());
  return out;
}

NamedTags named_tags(const TagLib::MP4::Tag& tag) {
  NamedTags out{TagFamily::kMp4, {}};
  for (const auto& [key, item] : tag.itemMap()) {
    auto name = utf8(key);
    if (name == "trkn" || name == "disk") {
      out.add(name, std::to_string(item.toIntPair().first));
    } else if (name == "covr") {
      out.covers += static_cast<int>(item.toCoverArtList().size());
    } else {
      constexpr std::string_view kFreeform = "----:";
      if (name.starts_with(kFreeform)) {
        const auto end = name.find(':', kFreeform.size());
        if (end != std::string::npos) name.erase(kFreeform.size(), end + 1 - kFreeform.size());
      }
      for (const auto& value : item.toStringList()) out.add(name, utf8(value));
    }
  }
  return out;
}

NamedTags named_tags(const TagLib::APE::Tag& tag) {
  NamedTags out{TagFamily::kApe, {}};
  for (const auto& [key, item] : tag.itemListMap()) {
    if (item.type() == TagLib::APE::Item::Text) {
      for (const auto& value : item.values()) out.add(utf8(key), utf8(value));
    } else if (key.upper().startsWith("COVER ART")) {
      ++out.covers;
    }
  }
  return out;
}

NamedTags named_tags(const TagLib::ASF::Tag& tag) {
  NamedTags out{TagFamily::kAsf, {}};
  out.add("Title", utf8(tag.title()));
  out.add("Author", utf8(tag.artist()));
  out.add("Description", utf8(tag.comment()));
  for (const auto& [name, attributes] : tag.attributeListMap()) {
    if (name == "WM/Picture") out.covers += static_cast<int>(attributes.size());
    for (const auto& attribute : attributes) out.add(utf8(name), text_of(attribute));
  }
  return out;
}

NamedTags named_tags(const TagLib::RIFF::Info::Tag& tag) {
  NamedTags out{TagFamily::kRiffInfo, {}};
  for (const auto& [id, text] : tag.fieldListMap()) out.add(plain(id), utf8(text));
  return out;
}

}  // namespace mediidx::tool
