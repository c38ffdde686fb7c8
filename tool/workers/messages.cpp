// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

#include "workers/messages.h"

#include <cmath>
#include <cstdint>
#include <cstring>
#include <type_traits>

#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr double kLargestGain = 1000;
constexpr int kLargestErrno = 4095;
constexpr int kNanoseconds = 1'000'000'000;

/// The one list of what an answer tells of a file. A field that is added to the record stops it
/// from compiling.
template <class File, class Visit>
void visit_fields(File& file, Visit visit) {
  auto& [path, kind, title, album, artist, album_artist, genre, composer, comment, camera_make,
         camera_model, exposure, aperture, timetaken, date, mdate, video_codec, container_type,
         audio_codec, fs_uuid, track, disc, year, duration, bitrate, frame_bitrate, video_bitrate,
         frame_rate_num, frame_rate_den, frequency, channel, resolution_x, resolution_y, covercount,
         iso, video_profile, video_level, filesize, gain] = file;
  auto& [track_gain, track_peak, album_gain, album_peak] = gain;
  // Path and kind are the order's.
  const auto visit_all = [&visit](auto&... fields) { (visit(fields), ...); };
  visit_all(title, album, artist, album_artist, genre, composer, comment, camera_make, camera_model,
            exposure, aperture, timetaken, date, mdate, video_codec, container_type, audio_codec,
            fs_uuid, track, disc, year, duration, bitrate, frame_bitrate, video_bitrate,
            frame_rate_num, frame_rate_den, frequency, channel, resolution_x, resolution_y,
            covercount, iso, video_profile, video_level, filesize, track_gain, track_peak,
            album_gain, album_peak);
}

bool is_sendable(const std::string& text) {
  return text.size() <= kLongestText && clean_text(text) == text;
}
bool is_sendable(int number) { return number >= 0; }
bool is_sendable(std::int64_t number) { return number >= 0; }
bool is_sendable(double number) { return std::isfinite(number) && number >= 0; }
bool is_sendable(const std::optional<double>& gain) {
  return !gain || std::abs(*gain) <= kLargestGain;  // Of NaN not.
}
bool is_sendable(const FileStamp& stamp) {
  return stamp.size >= 0 && stamp.nanoseconds >= 0 && stamp.nanoseconds < kNanoseconds;
}

/// Appends one message.
class MessageWriter {
 public:
  explicit MessageWriter(std::string& out) : out_(out), begin_(out.size()) {
    put(std::uint32_t{0});
  }
  ~MessageWriter() {
    const auto length = static_cast<std::uint32_t>(out_.size() - begin_ - sizeof(std::uint32_t));
    std::memcpy(out_.data() + begin_, &length, sizeof(length));
  }
  MessageWriter(const MessageWriter&) = delete;
  MessageWriter& operator=(const MessageWriter&) = delete;

  template <class Number>
    requires std::is_arithmetic_v<Number> || std::is_enum_v<Number>
  void put(Number number) {
    out_.append(reinterpret_cast<const char*>(&number), sizeof(number));
  }
  void put(std::string_view text) {
    put(static_cast<std::uint32_t>(text.size()));
    out_ += text;
  }
  void put(const std::optional<double>& gain) {
    put(gain.has_value());
    if (gain) put(*gain);
  }
  void put(const FileStamp& stamp) {
    put(stamp.size);
    put(stamp.seconds);
    put(stamp.nanoseconds);
  }

 private:
  std::string& out_;
  std::size_t begin_;
};

/// Reads what a MessageWriter wrote.
class MessageReader {
 public:
  explicit MessageReader(std::string_view message) : rest_(message) {}

  /// A number, or one byte of an enum or truth value, whose value the caller checks.
  template <class Number>
    requires std::is_arithmetic_v<Number>
  Number number() {
    Number out;
    std::memcpy(&out, take(sizeof(out)).data(), sizeof(out));
    return out;
  }
  std::string_view text() { return take(number<std::uint32_t>()); }

  void get(std::string& out) { out = text(); }
  template <class Number>
    requires std::is_arithmetic_v<Number>
  void get(Number& out) {
    out = number<Number>();
  }
  void get(std::optional<double>& out) {
    if (byte(1) == 1) out = number<double>();
  }
  void get(FileStamp& out) {
    get(out.size);
    get(out.seconds);
    get(out.nanoseconds);
  }
  std::uint8_t byte(int most) {
    const auto out = number<std::uint8_t>();
    if (out > most) throw MessageError("a choice that there is not");
    return out;
  }
  /// Reads what must be as a worker may send it.
  template <class Value>
  void get_checked(Value& out) {
    get(out);
    if (!is_sendable(out)) throw MessageError("a value that no file has");
  }
  void finish() const {
    if (!rest_.empty()) throw MessageError("bytes behind the end");
  }

 private:
  std::string_view take(std::size_t length) {
    if (length > rest_.size()) throw MessageError("it ends too early");
    const auto out = rest_.substr(0, length);
    rest_.remove_prefix(length);
    return out;
  }

  std::string_view rest_;
};

}  // namespace

std::optional<std::string_view> take_message(std::string_view& bytes) {
  std::uint32_t length = 0;
  if (bytes.size() < sizeof(length)) return std::nullopt;
  std::memcpy(&length, bytes.data(), sizeof(length));
  if (length > kLongestMessage) throw MessageError("a message that is too long");
  if (bytes.size() - sizeof(length) < length) return std::nullopt;
  const auto message = bytes.substr(sizeof(length), length);
  bytes.remove_prefix(sizeof(length) + length);
  return message;
}

void put_text(std::string& out, std::string_view text) {
  const auto length = static_cast<std::uint32_t>(text.size());
  out.append(reinterpret_cast<const char*>(&length), sizeof(length));
  out += text;
}

void put_order(std::string& out, const TagOrder& order) {
  MessageWriter writer(out);
  writer.put(order.ticket);
  writer.put(static_cast<std::uint8_t>(order.kind));
  writer.put(order.path);
}

TagOrder read_order(std::string_view message) {
  MessageReader reader(message);
  TagOrder order;
  reader.get(order.ticket);
  order.kind = static_cast<Kind>(reader.byte(kKinds - 1));
  reader.get(order.path);
  reader.finish();
  return order;
}

void put_answer(std::string& out, const TagAnswer& answer) {
  MessageWriter writer(out);
  writer.put(answer.ticket);
  writer.put(answer.outcome);
  writer.put(answer.before);
  writer.put(answer.after);
  if (answer.outcome == TagAnswer::Outcome::kRead) {
    visit_fields(answer.file, [&writer](const auto& field) { writer.put(field); });
  } else {
    writer.put(answer.error);
    writer.put(answer.reason);
  }
}

TagAnswer read_answer(std::string_view message, const TagOrder& order) {
  using Outcome = TagAnswer::Outcome;
  MessageReader reader(message);
  TagAnswer answer;
  reader.get(answer.ticket);
  if (answer.ticket != order.ticket) throw MessageError("an answer to another order");
  // That a file is lost is not for a worker to say.
  answer.outcome = static_cast<Outcome>(reader.byte(static_cast<int>(Outcome::kDamaged)));
  reader.get_checked(answer.before);
  reader.get_checked(answer.after);
  if (answer.outcome == Outcome::kRead) {
    answer.file.path = order.path;
    answer.file.kind = order.kind;
    visit_fields(answer.file, [&reader](auto& field) { reader.get_checked(field); });
  } else {
    reader.get_checked(answer.error);
    const bool refused = answer.outcome == Outcome::kUnreadable;
    if (answer.error > kLargestErrno || (answer.error > 0) != refused) {
      throw MessageError("an error that there is not");
    }
    reader.get_checked(answer.reason);
    if (answer.reason.empty()) throw MessageError("a failure without a reason");
  }
  reader.finish();
  return answer;
}

std::string sendable(std::string_view text) {
  auto out = clean_text(text);
  if (out.size() <= kLongestText) return out;
  auto end = kLongestText;
  while (end > 0 && (static_cast<unsigned char>(out[end]) & 0xC0U) == 0x80U) --end;
  return clean_text(std::string_view(out).substr(0, end));
}

void make_sendable(MediaFile& file) {
  visit_fields(file, []<class Field>(Field& field) {
    if (is_sendable(field)) return;
    if constexpr (std::is_same_v<Field, std::string>) {
      field = sendable(field);
    } else {
      field = {};
    }
  });
}

}  // namespace mediidx::tool
