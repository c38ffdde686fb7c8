// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/av_input.h"
#include "tags/readers.h"
#include "tags/tag_table.h"

namespace mediidx::tool {
namespace {

/// An opened file; without a picture or sound its stream is null.
struct Film {
  const AvInput& input;
  const std::string& path;
  AVStream* video;
  const AVStream* audio;
};

struct FilmColumn {
  ColumnText text;
  void (*store)(const Film& film, MediaFile& file);
};

void store_frame_rate(const Film& film, MediaFile& file) {
  if (!film.video) return;
  const auto rate = av_guess_frame_rate(film.input.context(), film.video, nullptr);
  if (rate.num <= 0 || rate.den <= 0) return;
  file.frame_rate_num = rate.num;
  file.frame_rate_den = rate.den;
}

/// What is not sound is picture, where the sound's share of the whole is known.
void store_video_rate(const Film& film, MediaFile& file) {
  if (!film.video) return;
  file.video_bitrate = bit_rate_of(film.video);
  const bool sound_known = !film.audio || file.bitrate > 0;
  if (sound_known && file.video_bitrate == 0 && file.frame_bitrate > file.bitrate) {
    file.video_bitrate = file.frame_bitrate - file.bitrate;
  }
}

/// A number of a stream's header; 0 without the stream.
template <auto kField>
int of(const AVStream* stream) {
  return stream ? to_int(stream->codecpar->*kField) : 0;
}

constexpr FilmColumn kFilmColumns[] = {
    {{"title", "title", "for want of it the file's name without its extension"},
     [](const Film& film, MediaFile& file) { file.title = film.input.tag("title"); }},
    {{"album", "album", "for want of it the folder's name"},
     [](const Film& film, MediaFile& file) { file.album = film.input.tag("album"); }},
    {{"duration", "the container", "seconds with a fraction; the row holds whole ones"},
     [](const Film& film, MediaFile& file) { file.duration = film.input.duration_s(); }},
    {{"container_type", "the container",
      "FFmpeg's name: \"matroska\", \"avi\"; of a family that shares one reader the file's "
      "extension: \"mp4\", \"mov\", \"3gp\""},
     [](const Film& film, MediaFile& file) {
       file.container_type = film.input.container(film.path);
     }},
    {{"frame_bitrate", "the container", "bits a second of all streams"},
     [](const Film& film, MediaFile& file) { file.frame_bitrate = film.input.bit_rate(); }},
    {{"audio_codec", "the first audio stream", "FFmpeg's name: \"aac\", \"ac3\", \"dts\""},
     [](const Film& film, MediaFile& file) { file.audio_codec = codec_of(film.audio); }},
    {{"audio_bitrate", "the first audio stream, or its Matroska tag BPS", "bits a second"},
     [](const Film& film, MediaFile& file) { file.bitrate = bit_rate_of(film.audio); }},
    {{"frequency", "the first audio stream", "samples a second"},
     [](const Film& film, MediaFile& file) {
       file.frequency = of<&AVCodecParameters::sample_rate>(film.audio);
     }},
    {{"channel", "the first audio stream", "count"},
     [](const Film& film, MediaFile& file) {
       if (film.audio) file.channel = to_int(film.audio->codecpar->ch_layout.nb_channels);
     }},
    {{"video_codec", "the video stream", "FFmpeg's name: \"h264\", \"hevc\", \"mpeg4\""},
     [](const Film& film, MediaFile& file) { file.video_codec = codec_of(film.video); }},
    {{"video_profile", "the video stream",
      "the codec's number: 77 is Main and 100 High of H.264, 1 Main of HEVC"},
     [](const Film& film, MediaFile& file) {
       file.video_profile = of<&AVCodecParameters::profile>(film.video);
     }},
    {{"video_level", "the video stream", "the codec's number: 41 is 4.1 of H.264, 123 of HEVC"},
     [](const Film& film, MediaFile& file) {
       file.video_level = of<&AVCodecParameters::level>(film.video);
     }},
    {{"resolutionx", "the video stream", "pixels as coded, whatever way it is to be turned"},
     [](const Film& film, MediaFile& file) {
       file.resolution_x = of<&AVCodecParameters::width>(film.video);
     }},
    {{"resolutiony", "the video stream", "likewise"},
     [](const Film& film, MediaFile& file) {
       file.resolution_y = of<&AVCodecParameters::height>(film.video);
     }},
    {{"video_bitrate", "the video stream, or its Matroska tag BPS",
      "bits a second; for want of it what the sound leaves of frame_bitrate"},
     store_video_rate},
    {{"frame_rate_num", "the video stream", "frames a second, numerator"}, store_frame_rate},
    {{"frame_rate_den", "the video stream", "frames a second, denominator"}, store_frame_rate},
};

}  // namespace

std::vector<ColumnText> video_columns() {
  std::vector<ColumnText> out;
  for (const auto& column : kFilmColumns) out.push_back(column.text);
  return out;
}

void read_video(MediaFile& file) {
  const AvInput input(file.path);
  const auto* video = input.best_stream(AVMEDIA_TYPE_VIDEO);
  const auto* audio = input.first_stream(AVMEDIA_TYPE_AUDIO);
  if (!video && !audio) throw ReadError("it has neither picture nor sound");
  const Film film{input, file.path, video ? input.context()->streams[video->index] : nullptr,
                  audio};
  for (const auto& column : kFilmColumns) column.store(film, file);
}

}  // namespace mediidx::tool
