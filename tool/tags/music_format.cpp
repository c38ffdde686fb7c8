// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/music_format.h"

#include <aifffile.h>
#include <apefile.h>
#include <asffile.h>
#include <flacfile.h>
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

#include <cmath>
#include <string_view>

#include "tags/id3_file.h"
#include "tags/musepack_gain.h"
#include "tags/named_tags.h"

namespace mediidx::tool {
namespace {

namespace Ogg = TagLib::Ogg;
namespace RIFF = TagLib::RIFF;

template <class Tag>
void append(Tag* tag, MusicFormat& out) {
  if (!tag) return;
  out.tags.push_back(named_tags(*tag));
  out.covers += out.tags.back().covers;
}

/// The file's tag of one family. Files with one tag only have it under the plain name.
template <class File>
void append(TagFamily family, File& file, MusicFormat& out) {
  if constexpr (!requires { file.ID3v2Tag(); } && requires { named_tags(*file.tag()); }) {
    append(file.tag(), out);
  }
  if constexpr (requires { file.ID3v2Tag(); }) {
    if (family == TagFamily::kId3v2) append(file.ID3v2Tag(), out);
  }
  if constexpr (requires { file.ID3v1Tag(); }) {
    if (family == TagFamily::kId3v1) append(file.ID3v1Tag(), out);
  }
  if constexpr (requires { file.APETag(); }) {
    if (family == TagFamily::kApe) append(file.APETag(), out);
  }
  if constexpr (requires { file.xiphComment(); }) {
    if (family == TagFamily::kVorbis) append(file.xiphComment(), out);
  }
  if constexpr (requires { file.InfoTag(); }) {
    if (family == TagFamily::kRiffInfo) append(file.InfoTag(), out);
  }
}

/// The codec where the file itself does not have to be asked.
template <class File>
std::string codec_of(const File& /*file*/, std::string_view usual) {
  return std::string(usual);
}

std::string codec_of(const TagLib::MPEG::File& file, std::string_view usual) {
  static constexpr const char* kLayers[] = {"", "mp1", "mp2", "mp3"};
  const auto* properties = file.audioProperties();
  const int layer = properties ? properties->layer() : 0;
  return layer >= 1 && layer <= 3 ? kLayers[layer] : std::string(usual);
}

std::string codec_of(const TagLib::MP4::File& file, std::string_view usual) {
  const auto* properties = file.audioProperties();
  if (!properties) return std::string(usual);
  switch (properties->codec()) {
    case TagLib::MP4::Properties::ALAC:
      return "alac";
    case TagLib::MP4::Properties::Unknown:
      return {};
    default:
      return std::string(usual);
  }
}

std::string codec_of(const TagLib::ASF::File& file, std::string_view usual) {
  const auto* properties = file.audioProperties();
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
      return std::string(usual);
  }
}

/// The format tag of a RIFF file: 1 and 3 are plain samples; 0xFFFE names them further on.
std::string codec_of(const RIFF::WAV::File& file, std::string_view usual) {
  constexpr int kSamples = 1;
  constexpr int kFloatSamples = 3;
  const auto* properties = file.audioProperties();
  const int format = properties ? properties->format() : 0;
  return format == kSamples || format == kFloatSamples ? std::string(usual) : "";
}

template <class File>
void add_own(File& /*file*/, MusicFormat& /*out*/) {}

void add_own(TagLib::MPEG::File& /*file*/, MusicFormat& out) { out.container = out.codec; }

/// Pictures stand beside the comments here.
void add_own(TagLib::FLAC::File& file, MusicFormat& out) {
  out.covers += static_cast<int>(file.pictureList().size());
}

MusepackGain musepack_gain(TagLib::MPC::File& file) {
  constexpr unsigned kBeginning = 4096;
  file.seek(0);
  const auto bytes = file.readBlock(kBeginning);
  if (const auto gain = parse_musepack_gain({bytes.data(), bytes.size()})) return *gain;
  const auto* older = file.audioProperties();
  if (!older) return {};
  return {older->trackGain(), older->trackPeak(), older->albumGain(), older->albumPeak()};
}

/// The gains of the stream's header.
void add_own(TagLib::MPC::File& file, MusicFormat& out) {
  NamedTags header{TagFamily::kApe, {}};
  const auto add_gain = [&header](const char* name, int gain) {
    constexpr double kReference = 64.82;
    if (gain != 0) header.add(name, std::to_string(kReference - gain / 256.0));
  };
  const auto add_peak = [&header](const char* name, int peak) {
    constexpr double kFullScale = 32768;
    if (peak != 0) header.add(name, std::to_string(std::pow(10, peak / 256.0 / 20) / kFullScale));
  };
  const auto gain = musepack_gain(file);
  add_gain("(Musepack header) track gain", gain.track_gain);
  add_peak("(Musepack header) track peak", gain.track_peak);
  add_gain("(Musepack header) album gain", gain.album_gain);
  add_peak("(Musepack header) album peak", gain.album_peak);
  out.tags.push_back(std::move(header));
}

struct Names {
  const char* codec;
  const char* container;
};

/// Describes the file and returns true when it is of this class.
template <class File>
bool describe(TagLib::File* any, MusicFormatId id, Names names, MusicFormat& out) {
  auto* file = dynamic_cast<File*>(any);
  if (!file) return false;
  out.codec = codec_of(*file, names.codec);
  out.container = names.container;
  for (const auto family : music_formats()[static_cast<std::size_t>(id)].families) {
    append(family, *file, out);
  }
  add_own(*file, out);
  return true;
}

}  // namespace

bool is_matroska(TagLib::IOStream& stream) {
  const TagLib::ByteVector mark("\x1A\x45\xDF\xA3", 4);
  stream.seek(0);
  const bool found = stream.readBlock(mark.size()) == mark;
  stream.seek(0);
  return found;
}

MusicFormat music_format(TagLib::File* file) {
  using enum MusicFormatId;
  MusicFormat out;
  static_cast<void>(describe<TagLib::MPEG::File>(file, kMpeg, {"mp3", "mp3"}, out) ||
                    describe<TagLib::FLAC::File>(file, kFlac, {"flac", "flac"}, out) ||
                    describe<TagLib::MP4::File>(file, kMp4, {"aac", "mp4"}, out) ||
                    describe<TagLib::ASF::File>(file, kAsf, {"", "asf"}, out) ||
                    describe<RIFF::WAV::File>(file, kWav, {"pcm", "wav"}, out) ||
                    describe<RIFF::AIFF::File>(file, kAiff, {"pcm", "aiff"}, out) ||
                    describe<Ogg::Vorbis::File>(file, kVorbis, {"vorbis", "ogg"}, out) ||
                    describe<Ogg::Opus::File>(file, kOpus, {"opus", "ogg"}, out) ||
                    describe<Ogg::FLAC::File>(file, kOggFlac, {"flac", "ogg"}, out) ||
                    describe<Ogg::Speex::File>(file, kSpeex, {"speex", "ogg"}, out) ||
                    describe<TagLib::APE::File>(file, kMonkey, {"ape", "ape"}, out) ||
                    describe<TagLib::WavPack::File>(file, kWavPack, {"wavpack", "wv"}, out) ||
                    describe<TagLib::MPC::File>(file, kMusepack, {"musepack", "mpc"}, out) ||
                    describe<TagLib::TrueAudio::File>(file, kTrueAudio, {"tta", "tta"}, out) ||
                    describe<Id3File>(file, kOtherId3, {"", ""}, out));
  return out;
}

}  // namespace mediidx::tool
