// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/musepack_gain.h"

#include <cstddef>
#include <cstdint>

namespace mediidx::tool {
namespace {

/// A packet: two letters, its whole size in seven bits a byte, and its content.
struct Packet {
  std::string_view key;
  std::string_view content;
};

/// Takes a packet off the text; empty when it is none or its end is missing.
std::optional<Packet> take_packet(std::string_view& text) {
  constexpr std::size_t kKey = 2;
  constexpr std::size_t kLongestSize = 9;
  std::uint64_t size = 0;
  for (std::size_t i = kKey; i < text.size() && i < kKey + kLongestSize; ++i) {
    const auto byte = static_cast<unsigned char>(text[i]);
    size = size << 7U | (byte & 0x7FU);
    if (byte >= 0x80) continue;
    const std::size_t head = i + 1;
    if (size < head || size > text.size()) return std::nullopt;
    const Packet out{text.substr(0, kKey), text.substr(head, size - head)};
    text.remove_prefix(size);
    return out;
  }
  return std::nullopt;
}

int unsigned_at(std::string_view content, std::size_t place) {
  return static_cast<unsigned char>(content[place]) << 8U |
         static_cast<unsigned char>(content[place + 1]);
}

int signed_at(std::string_view content, std::size_t place) {
  return static_cast<std::int16_t>(unsigned_at(content, place));
}

}  // namespace

std::optional<MusepackGain> parse_musepack_gain(std::string_view beginning) {
  constexpr std::string_view kMark = "MPCK";
  constexpr std::size_t kLength = 9;
  if (!beginning.starts_with(kMark)) return std::nullopt;
  beginning.remove_prefix(kMark.size());
  while (const auto packet = take_packet(beginning)) {
    const auto& content = packet->content;
    if (packet->key != "RG" || content.size() < kLength || content[0] != 1) continue;
    return MusepackGain{signed_at(content, 1), unsigned_at(content, 3), signed_at(content, 5),
                        unsigned_at(content, 7)};
  }
  return std::nullopt;
}

}  // namespace mediidx::tool
