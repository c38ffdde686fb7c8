// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/photo.h"

#include <array>
#include <cmath>
#include <cstdio>
#include <exiv2/exiv2.hpp>
#include <string_view>

#include "tags/av_input.h"
#include "tags/file_times.h"
#include "tags/readers.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

/// Exiv2's one-time setting up: no messages on standard error, HEIC where it is built in.
void prepare_once() {
  static const bool done = [] {
    Exiv2::LogMsg::setLevel(Exiv2::LogMsg::mute);
    Exiv2::XmpParser::initialize();
    Exiv2::enableBMFF(true);
    return true;
  }();
  static_cast<void>(done);
}

const Exiv2::Exifdatum* find(const Exiv2::ExifData& data, const char* key) {
  const auto found = data.findKey(Exiv2::ExifKey(key));
  return found == data.end() || found->count() == 0 ? nullptr : &*found;
}

std::string text_of(const Exiv2::ExifData& data, const char* key) {
  const auto* datum = find(data, key);
  return datum ? clean_text(datum->toString()) : std::string();
}

double number_of(const Exiv2::ExifData& data, const char* key) {
  const auto* datum = find(data, key);
  if (!datum) return 0;
  const auto [numerator, denominator] = datum->toRational();
  return denominator == 0 ? 0 : static_cast<double>(numerator) / denominator;
}

/// Apertures and shutter speeds that are only given as powers of two.
double f_number(const Exiv2::ExifData& data) {
  const double plain = number_of(data, "Exif.Photo.FNumber");
  const double apex = plain > 0 ? 0 : number_of(data, "Exif.Photo.ApertureValue");
  return apex > 0 ? std::exp2(apex / 2) : plain;
}

double exposure_s(const Exiv2::ExifData& data) {
  const double plain = number_of(data, "Exif.Photo.ExposureTime");
  if (plain > 0 || !find(data, "Exif.Photo.ShutterSpeedValue")) return plain;
  return std::exp2(-number_of(data, "Exif.Photo.ShutterSpeedValue"));
}

int iso_of(const Exiv2::ExifData& data) {
  const auto found = Exiv2::isoSpeed(data);
  return found == data.end() || found->count() == 0 ? 0 : to_int(found->toLong());
}

std::string time_taken(const Exiv2::ExifData& data) {
  for (const char* key : {"Exif.Photo.DateTimeOriginal", "Exif.Photo.DateTimeDigitized"}) {
    const auto time = camera_time(text_of(data, key));
    if (!time.empty()) return time;
  }
  return {};
}

std::string title_of(const Exiv2::XmpData& data) {
  const auto found = data.findKey(Exiv2::XmpKey("Xmp.dc.title"));
  if (found == data.end()) return {};
  const auto* titles = dynamic_cast<const Exiv2::LangAltValue*>(&found->value());
  return titles ? clean_text(titles->toString("x-default")) : std::string();
}

void read_size(const Exiv2::Image& image, MediaFile& out) {
  out.resolution_x = to_int(image.pixelWidth());
  out.resolution_y = to_int(image.pixelHeight());
  if (out.resolution_x > 0 && out.resolution_y > 0) return;
  out.resolution_x = to_int(std::lround(number_of(image.exifData(), "Exif.Photo.PixelXDimension")));
  out.resolution_y = to_int(std::lround(number_of(image.exifData(), "Exif.Photo.PixelYDimension")));
}

Exiv2::Image::AutoPtr open_image(const std::string& path) {
  try {
    auto image = Exiv2::ImageFactory::open(path);
    image->readMetadata();
    return image;
  } catch (const Exiv2::AnyError& error) {
    const std::string_view message = error.what();
    const auto prefix = path + ": ";
    throw ReadError(
        clean_text(message.starts_with(prefix) ? message.substr(prefix.size()) : message));
  }
}

/// Three digits at most, no needless zeros.
std::string decimal(double value) {
  std::array<char, 32> text;
  std::snprintf(text.data(), text.size(), "%.3g", value);
  return text.data();
}

}  // namespace

std::string exposure_text(double seconds) {
  constexpr double kLongest = 1e6;
  constexpr double kShortest = 1e-6;
  if (!(seconds >= kShortest && seconds <= kLongest)) return {};
  // Above a quarter of a second fractions are no longer written as 1/n.
  if (seconds > 0.26) return decimal(seconds);
  return "1/" + std::to_string(std::lround(1 / seconds));
}

std::string aperture_text(double f_number) {
  constexpr double kLargest = 1000;
  if (!(f_number > 0 && f_number < kLargest)) return {};
  return "f/" + decimal(std::round(f_number * 10) / 10);
}

void read_photo(MediaFile& file) {
  prepare_once();
  const auto image = open_image(file.path);
  const auto& exif = image->exifData();
  file.title = title_of(image->xmpData());
  file.camera_make = text_of(exif, "Exif.Image.Make");
  file.camera_model = text_of(exif, "Exif.Image.Model");
  file.exposure = exposure_text(exposure_s(exif));
  file.aperture = aperture_text(f_number(exif));
  file.iso = iso_of(exif);
  file.timetaken = time_taken(exif);
  read_size(*image, file);
}

}  // namespace mediidx::tool
