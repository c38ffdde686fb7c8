// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/music_format.h"

#include <aifffile.h>
#include <apefile.h>
#include <apetag.h>
#include <asffile.h>
#include <flacfile.h>
#include <id3v2tag.h>
#include <mp4file.h>
#include <mpcfile.h>
#include <mpegfile.h>
#include <oggflacfile.h>
#include <opusfile.h>
#include <speexfile.h>
#include <trueaudiofile.h>
#include <vorbisfile.h>
#include <wavfile.h>
#include <wavpackfile.h>

namespace mediidx::tool {
namespace {

std::string upper_text(const TagLib::String& text) { return text.upper().to8Bit(true); }

int count_covers(const TagLib::ID3v2::Tag* tag) {
  return tag ? static_cast<int>(tag->frameList("APIC").size()) : 0;
}

int count_covers(const TagLib::APE::Tag* tag) {
  int covers = 0;
  if (!tag) return covers;
  for (const auto& item : tag->itemListMap()) {
    covers += upper_text(item.first).starts_with("COVER ART") ? 1 : 0;
  }
  return covers;
}

int count_covers(TagLib::Ogg::XiphComment* tag) {
  return tag ? static_cast<int>(tag->pictureList().size()) : 0;
}

MusicFormat describe(TagLib::MPEG::File& file) {
  static constexpr const char* kLayers[] = {"", "mp1", "mp2", "mp3"};
  const auto* properties = file.audioProperties();
  const int layer = properties ? properties->layer() : 0;
  const char* codec = layer >= 1 && layer <= 3 ? kLayers[layer] : "mp3";
  return {codec, codec, count_covers(file.ID3v2Tag()) + count_covers(file.APETag()), {}};
}

MusicFormat describe(TagLib::FLAC::File& file) {
  return {"flac", "flac", static_cast<int>(file.pictureList().size()), {}};
}

MusicFormat describe(TagLib::MP4::File& file) {
  MusicFormat out{"aac", "mp4", 0, {}};
  const auto* properties = file.audioProperties();
  if (properties && properties->codec() == TagLib::MP4::Properties::ALAC) out.codec = "alac";
  if (properties && properties->codec() == TagLib::MP4::Properties::Unknown) out.codec.clear();
  const std::string own_name = "----:COM.APPLE.ITUNES:";
  for (const auto& item : file.tag()->itemMap()) {
    const auto name = upper_text(item.first);
    if (name == "COVR") out.covers = static_cast<int>(item.second.toCoverArtList().size());
    const auto texts = item.second.toStringList();
    if (name.starts_with(own_name) && !texts.isEmpty()) {
      out.extra_tags[name.substr(own_name.size())] = texts.front().to8Bit(true);
    }
  }
  return out;
}

std::string asf_codec(const TagLib::ASF::Properties* properties) {
  switch (properties ? properties->codec() : TagLib::ASF::Properties::Unknown) {
    case TagLib::ASF::Properties::WMA1:
      return "wmav1";
    case TagLib::ASF::Properties::WMA2:
      return "wmav2";
    case TagLib::ASF::Properties::WMA9Pro:
      return "wmapro";
    case TagLib::ASF::Properties::WMA9Lossless:
      return "wmalossless";
    default:
      return {};
  }
}

MusicFormat describe(TagLib::ASF::File& file) {
  MusicFormat out{asf_codec(file.audioProperties()), "asf", 0, {}};
  for (const auto& item : file.tag()->attributeListMap()) {
    const auto name = upper_text(item.first);
    if (name == "WM/PICTURE") out.covers = static_cast<int>(item.second.size());
    if (!item.second.isEmpty()) {
      out.extra_tags[name] = item.second.front().toString().to8Bit(true);
    }
  }
  return out;
}

/// The format tag of a RIFF file: 1 and 3 are plain samples; 0xFFFE names them further on.
MusicFormat describe(TagLib::RIFF::WAV::File& file) {
  constexpr int kSamples = 1;
  constexpr int kFloatSamples = 3;
  const auto* properties = file.audioProperties();
  const int format = properties ? properties->format() : 0;
  const bool is_pcm = format == kSamples || format == kFloatSamples;
  return {is_pcm ? "pcm" : "", "wav", count_covers(file.ID3v2Tag()), {}};
}

MusicFormat describe(TagLib::RIFF::AIFF::File& file) {
  return {"pcm", "aiff", count_covers(file.tag()), {}};
}

}  // namespace

MusicFormat music_format(TagLib::File* file) {
  namespace Ogg = TagLib::Ogg;
  if (auto* mpeg = dynamic_cast<TagLib::MPEG::File*>(file)) return describe(*mpeg);
  if (auto* flac = dynamic_cast<TagLib::FLAC::File*>(file)) return describe(*flac);
  if (auto* mp4 = dynamic_cast<TagLib::MP4::File*>(file)) return describe(*mp4);
  if (auto* asf = dynamic_cast<TagLib::ASF::File*>(file)) return describe(*asf);
  if (auto* wav = dynamic_cast<TagLib::RIFF::WAV::File*>(file)) return describe(*wav);
  if (auto* aiff = dynamic_cast<TagLib::RIFF::AIFF::File*>(file)) return describe(*aiff);
  if (auto* vorbis = dynamic_cast<Ogg::Vorbis::File*>(file)) {
    return {"vorbis", "ogg", count_covers(vorbis->tag()), {}};
  }
  if (auto* opus = dynamic_cast<Ogg::Opus::File*>(file)) {
    return {"opus", "ogg", count_covers(opus->tag()), {}};
  }
  if (auto* flac = dynamic_cast<Ogg::FLAC::File*>(file)) {
    return {"flac", "ogg", count_covers(flac->tag()), {}};
  }
  if (auto* speex = dynamic_cast<Ogg::Speex::File*>(file)) {
    return {"speex", "ogg", count_covers(speex->tag()), {}};
  }
  if (auto* ape = dynamic_cast<TagLib::APE::File*>(file)) {
    return {"ape", "ape", count_covers(ape->APETag()), {}};
  }
  if (auto* wavpack = dynamic_cast<TagLib::WavPack::File*>(file)) {
    return {"wavpack", "wv", count_covers(wavpack->APETag()), {}};
  }
  if (auto* musepack = dynamic_cast<TagLib::MPC::File*>(file)) {
    return {"musepack", "mpc", count_covers(musepack->APETag()), {}};
  }
  if (auto* tta = dynamic_cast<TagLib::TrueAudio::File*>(file)) {
    return {"tta", "tta", count_covers(tta->ID3v2Tag()), {}};
  }
  return {};
}

}  // namespace mediidx::tool
