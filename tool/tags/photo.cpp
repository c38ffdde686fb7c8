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
#include "tags/tag_table.h"
#include "text/legacy_text.h"
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

/// A datum of any kind that Exiv2 names; null when there is none.
const Exiv2::Metadatum* find(const Exiv2::Image& image, const std::string& key) {
  const auto find_in = [](const auto& data, const auto& name) -> const Exiv2::Metadatum* {
    const auto found = data.findKey(name);
    return found == data.end() || found->count() == 0 ? nullptr : &*found;
  };
  return key.starts_with("Xmp.") ? find_in(image.xmpData(), Exiv2::XmpKey(key))
                                 : find_in(image.exifData(), Exiv2::ExifKey(key));
}

std::string text_of(const Exiv2::Metadatum& datum) {
  const auto* titles = dynamic_cast<const Exiv2::LangAltValue*>(&datum.value());
  return clean_text(decode_legacy(titles ? titles->toString("x-default") : datum.toString()));
}

/// Not a number for what is divided by 0, as cameras write what they do not know.
double number_of(const Exiv2::Metadatum& datum) {
  const auto [numerator, denominator] = datum.toRational();
  return denominator == 0 ? std::nan("") : static_cast<double>(numerator) / denominator;
}

std::string time_of(const Exiv2::Metadatum& datum) { return camera_time(text_of(datum)); }

/// Apertures and shutter speeds are sometimes only given as powers of two.
bool is_power(const Exiv2::Metadatum& datum) { return datum.key().ends_with("Value"); }

std::string aperture_of(const Exiv2::Metadatum& datum) {
  const double number = number_of(datum);
  return aperture_text(is_power(datum) && number > 0 ? std::exp2(number / 2) : number);
}

std::string exposure_of(const Exiv2::Metadatum& datum) {
  const double number = number_of(datum);
  return exposure_text(is_power(datum) ? std::exp2(-number) : number);
}

void store_iso(const Exiv2::Image& image, MediaFile& file) {
  const auto& exif = image.exifData();
  const auto found = Exiv2::isoSpeed(exif);
  if (found != exif.end() && found->count() > 0) file.iso = to_int(found->toLong());
}

/// The size that the tags tell, where the image does not.
int size_of(const Exiv2::Image& image, int pixels, const char* key) {
  const auto* datum = pixels > 0 ? nullptr : find(image, key);
  return datum ? to_int(datum->toLong()) : pixels;
}

/// Turned as the picture is to be shown.
void store_size(const Exiv2::Image& image, MediaFile& file) {
  constexpr double kFirstTurned = 5;
  constexpr double kLastTurned = 8;
  file.resolution_x = size_of(image, to_int(image.pixelWidth()), "Exif.Photo.PixelXDimension");
  file.resolution_y = size_of(image, to_int(image.pixelHeight()), "Exif.Photo.PixelYDimension");
  for (const char* key : {"Exif.Image.Orientation", "Xmp.tiff.Orientation"}) {
    const auto* datum = find(image, key);
    if (!datum) continue;
    const double orientation = number_of(*datum);
    if (orientation >= kFirstTurned && orientation <= kLastTurned) {
      std::swap(file.resolution_x, file.resolution_y);
    }
    return;
  }
}

struct PhotoColumn {
  ColumnText text;  ///< The source is the keys in the order in which they are looked for.
  std::string MediaFile::* field;
  std::string (*read)(const Exiv2::Metadatum& datum);
  void (*store)(const Exiv2::Image& image, MediaFile& file);  ///< Of the others.
};

constexpr PhotoColumn kPhotoColumns[] = {
    {{"title", "Xmp.dc.title", "for want of it the file's name without its extension"},
     &MediaFile::title,
     text_of,
     nullptr},
    {{"camera_make", "Exif.Image.Make, Xmp.tiff.Make", "as it stands"},
     &MediaFile::camera_make,
     text_of,
     nullptr},
    {{"camera_model", "Exif.Image.Model, Exif.Image.UniqueCameraModel, Xmp.tiff.Model",
      "as it stands"},
     &MediaFile::camera_model,
     text_of,
     nullptr},
    {{"exposure",
      "Exif.Photo.ExposureTime, Exif.Image.ExposureTime, Exif.Photo.ShutterSpeedValue, "
      "Xmp.exif.ExposureTime",
      "seconds: \"1/125\", from 0.3 on \"0.5\", \"2.5\""},
     &MediaFile::exposure,
     exposure_of,
     nullptr},
    {{"aperture",
      "Exif.Photo.FNumber, Exif.Image.FNumber, Exif.Photo.ApertureValue, Xmp.exif.FNumber",
      "\"f/2.8\", \"f/8\""},
     &MediaFile::aperture,
     aperture_of,
     nullptr},
    {{"timetaken",
      "Exif.Photo.DateTimeOriginal, Exif.Image.DateTimeOriginal, Exif.Photo.DateTimeDigitized, "
      "Xmp.exif.DateTimeOriginal, Xmp.photoshop.DateCreated, Xmp.xmp.CreateDate",
      "the camera's own time: a zone is left out; impossible dates are none"},
     &MediaFile::timetaken,
     time_of,
     nullptr},
    {{"iso", "Exif.Photo.ISOSpeedRatings and what stands for it, makers' notes included",
      "a number"},
     nullptr,
     nullptr,
     store_iso},
    {{"resolutionx",
      "the image, Exif.Photo.PixelXDimension; Exif.Image.Orientation, Xmp.tiff.Orientation",
      "pixels as the picture is shown: turned by a quarter, width and height change places"},
     nullptr,
     nullptr,
     store_size},
    {{"resolutiony",
      "the image, Exif.Photo.PixelYDimension; Exif.Image.Orientation, Xmp.tiff.Orientation",
      "likewise"},
     nullptr,
     nullptr,
     nullptr},
};

/// The first of the keys that gives a text.
std::string first_text(const Exiv2::Image& image, const PhotoColumn& column) {
  std::string out;
  for_each_name(column.text.source, [&](std::string_view key) {
    const auto* datum = out.empty() ? find(image, std::string(key)) : nullptr;
    if (datum) out = column.read(*datum);
  });
  return out;
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

std::vector<ColumnText> photo_columns() {
  std::vector<ColumnText> out;
  for (const auto& column : kPhotoColumns) out.push_back(column.text);
  return out;
}

void read_photo(MediaFile& file) {
  prepare_once();
  const auto image = open_image(file.path);
  for (const auto& column : kPhotoColumns) {
    if (column.field) file.*column.field = first_text(*image, column);
    if (column.store) column.store(*image, file);
  }
}

}  // namespace mediidx::tool
