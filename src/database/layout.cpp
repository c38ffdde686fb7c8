// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Proof of the records' layout, which is part of the binary interface.
#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "mediidx/database.h"
#include "mediidx/record.h"

namespace {

struct WideMember {
  char before;
  std::int64_t value;
};

/// 8, but 4 where the C ABI aligns 64-bit members like words.
constexpr std::size_t kWideAlignment = offsetof(WideMember, value);
static_assert(kWideAlignment == 8 || kWideAlignment == 4);
/// What such an ABI leaves out before a record's 64-bit member.
constexpr std::size_t kSaved = 8 - kWideAlignment;
constexpr std::size_t kPointer = sizeof(void*);
static_assert(kPointer == 8 || kPointer == 4);

template <class Record>
constexpr bool is_plain_v =
    std::is_standard_layout_v<Record> && std::is_trivially_copyable_v<Record>;

// __tag_TAVO_MEDIA_INFO
using Info = __tag_TAVO_MEDIA_INFO;
static_assert(is_plain_v<Info>);
static_assert(offsetof(Info, id) == 0);
static_assert(offsetof(Info, path) == 4);
static_assert(offsetof(Info, track) == 8452);
static_assert(offsetof(Info, disc) == 8456);
static_assert(offsetof(Info, year) == 8460);
static_assert(offsetof(Info, title) == 8464);
static_assert(offsetof(Info, album) == 8719);
static_assert(offsetof(Info, artist) == 8974);
static_assert(offsetof(Info, album_artist) == 9229);
static_assert(offsetof(Info, genre) == 9484);
static_assert(offsetof(Info, composer) == 9739);
static_assert(offsetof(Info, comment) == 9994);
static_assert(offsetof(Info, camera_make) == 10249);
static_assert(offsetof(Info, camera_model) == 10349);
static_assert(offsetof(Info, exposure) == 10449);
static_assert(offsetof(Info, aperture) == 10469);
static_assert(offsetof(Info, timetaken) == 10489);
static_assert(offsetof(Info, date) == 10521);
static_assert(offsetof(Info, mdate) == 10553);
static_assert(offsetof(Info, duration) == 10588);
static_assert(offsetof(Info, bitrate) == 10592);
static_assert(offsetof(Info, frame_bitrate) == 10596);
static_assert(offsetof(Info, video_bitrate) == 10600);
static_assert(offsetof(Info, frame_rate_num) == 10604);
static_assert(offsetof(Info, frame_rate_den) == 10608);
static_assert(offsetof(Info, frequency) == 10612);
static_assert(offsetof(Info, channel) == 10616);
static_assert(offsetof(Info, resolutionX) == 10620);
static_assert(offsetof(Info, resolutionY) == 10624);
static_assert(offsetof(Info, filesize) == 10632 - kSaved);
static_assert(offsetof(Info, reserved) == 10640 - kSaved);
static_assert(offsetof(Info, covercount) == 10664 - kSaved);
static_assert(offsetof(Info, iso) == 10668 - kSaved);
static_assert(offsetof(Info, video_codec) == 10672 - kSaved);
static_assert(offsetof(Info, container_type) == 10927 - kSaved);
static_assert(offsetof(Info, video_profile) == 11184 - kSaved);
static_assert(offsetof(Info, video_level) == 11188 - kSaved);
static_assert(offsetof(Info, audio_codec) == 11192 - kSaved);
static_assert(offsetof(Info, fs_uuid) == 11447 - kSaved);
static_assert(sizeof(Info) == 11704 - kSaved);

// _PLAYLIST_REC
static_assert(is_plain_v<_PLAYLIST_REC>);
static_assert(offsetof(_PLAYLIST_REC, info) == 0);
static_assert(offsetof(_PLAYLIST_REC, next) == 11704 - kSaved);
static_assert(sizeof(_PLAYLIST_REC) == (kWideAlignment == 8 ? 11712 : 11704));

// DIR_INFO_REC
static_assert(is_plain_v<DIR_INFO_REC>);
static_assert(offsetof(DIR_INFO_REC, path) == 0);
static_assert(offsetof(DIR_INFO_REC, title) == 4096);
static_assert(offsetof(DIR_INFO_REC, date) == 8192);
static_assert(offsetof(DIR_INFO_REC, mdate) == 8224);
static_assert(offsetof(DIR_INFO_REC, fs_uuid) == 8256);
static_assert(sizeof(DIR_INFO_REC) == 8511);

// VIDEO_CONVERT_REC
static_assert(is_plain_v<VIDEO_CONVERT_REC>);
static_assert(offsetof(VIDEO_CONVERT_REC, video_path) == 0);
static_assert(offsetof(VIDEO_CONVERT_REC, convert_file_path) == 4096);
static_assert(offsetof(VIDEO_CONVERT_REC, resolutionx) == 8192);
static_assert(offsetof(VIDEO_CONVERT_REC, resolutiony) == 8196);
static_assert(offsetof(VIDEO_CONVERT_REC, video_bitrate) == 8200);
static_assert(offsetof(VIDEO_CONVERT_REC, vcodec) == 8204);
static_assert(offsetof(VIDEO_CONVERT_REC, video_profile) == 8460);
static_assert(offsetof(VIDEO_CONVERT_REC, video_level) == 8464);
static_assert(offsetof(VIDEO_CONVERT_REC, container_type) == 8468);
static_assert(offsetof(VIDEO_CONVERT_REC, acodec) == 8723);
static_assert(offsetof(VIDEO_CONVERT_REC, audio_bitrate) == 8980);
static_assert(offsetof(VIDEO_CONVERT_REC, audio_frequency) == 8984);
static_assert(offsetof(VIDEO_CONVERT_REC, audio_channel) == 8988);
static_assert(offsetof(VIDEO_CONVERT_REC, convert_type) == 8992);
static_assert(sizeof(VIDEO_CONVERT_REC) == 9248);

// MEDIA_DB_HANDLE: five words where pointers are words
static_assert(is_plain_v<MEDIA_DB_HANDLE>);
static_assert(offsetof(MEDIA_DB_HANDLE, conn) == 0);
static_assert(offsetof(MEDIA_DB_HANDLE, result) == kPointer);
static_assert(offsetof(MEDIA_DB_HANDLE, row) == 2 * kPointer);
static_assert(offsetof(MEDIA_DB_HANDLE, rowCount) == 2 * kPointer + 4);
static_assert(offsetof(MEDIA_DB_HANDLE, tableType) == 2 * kPointer + 8);
static_assert(sizeof(MEDIA_DB_HANDLE) == (kPointer == 8 ? 32 : 20));

}  // namespace
