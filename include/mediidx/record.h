/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// The records in which media files and folders travel through the library.
///
/// Records are owned by the caller and zero-filled before use; a record that carries only a path is
/// valid input to every write. Layout is part of the binary interface (natural C alignment).
#ifndef MEDIIDX_RECORD_H_
#define MEDIIDX_RECORD_H_

#include "mediidx/types.h"

/// Widths of the text fields, terminator included. Texts longer than a field are cut by whoever
/// fills the record, at the border of a UTF-8 character.
enum {
  MEDIIDX_PATH_SIZE = 4096,       ///< The part of `path` that is used.
  MEDIIDX_PATH_AREA_SIZE = 8448,  ///< What a record reserves for it.
  MEDIIDX_TEXT_SIZE = 255,
  MEDIIDX_DATE_SIZE = 32
};

/// Metadata of one media file. The same slot serves several media types where meanings coincide.
struct __tag_TAVO_MEDIA_INFO {
  uint32_t id;                        ///< Row id; set by a music save, read back by queries.
  char path[MEDIIDX_PATH_AREA_SIZE];  ///< Full path of the file; the key of every row.
  int32_t track;                      ///< Track number.
  int32_t disc;                       ///< Disc number.
  int32_t year;
  char title[MEDIIDX_TEXT_SIZE];
  char album[MEDIIDX_TEXT_SIZE];
  char artist[MEDIIDX_TEXT_SIZE];
  char album_artist[MEDIIDX_TEXT_SIZE];  ///< Empty when the file has no such tag.
  char genre[MEDIIDX_TEXT_SIZE];         ///< Several genres are separated by ";".
  char composer[MEDIIDX_TEXT_SIZE];
  char comment[MEDIIDX_TEXT_SIZE];         ///< Virtual tracks: start in the audio file, mm:ss:ff.
  char camera_make[100];                   ///< Photo.
  char camera_model[100];                  ///< Photo.
  char exposure[20];                       ///< Photo: exposure time.
  char aperture[20];                       ///< Photo: aperture.
  char timetaken[MEDIIDX_DATE_SIZE];       ///< Photo: SQL timestamp, or empty.
  char date[MEDIIDX_DATE_SIZE];            ///< Creation time: SQL timestamp, or empty.
  char mdate[MEDIIDX_DATE_SIZE];           ///< Modification time: SQL timestamp, or empty.
  float duration;                          ///< Seconds; stored truncated toward zero.
  int32_t bitrate;                         ///< Bits a second; for video that of its audio.
  int32_t frame_bitrate;                   ///< Video: bits a second of all streams.
  int32_t video_bitrate;                   ///< Video: bits a second of the picture.
  int32_t frame_rate_num;                  ///< Video: frames a second, numerator.
  int32_t frame_rate_den;                  ///< Video: frames a second, denominator.
  int32_t frequency;                       ///< Audio samples a second.
  int32_t channel;                         ///< Audio channels.
  int32_t resolutionX;                     ///< Photo and video: width in pixels.
  int32_t resolutionY;                     ///< Photo and video: height in pixels.
  int64_t filesize;                        ///< Bytes.
  uint32_t reserved[6];                    ///< Set to 0 by the row reader, never stored.
  int32_t covercount;                      ///< Music: number of embedded cover images.
  int32_t iso;                             ///< Photo: ISO speed.
  char video_codec[MEDIIDX_TEXT_SIZE];     ///< Video codec; for music the codec.
  char container_type[MEDIIDX_TEXT_SIZE];  ///< Video container; for music the container.
  int32_t video_profile;
  int32_t video_level;
  char audio_codec[MEDIIDX_TEXT_SIZE];  ///< Video: codec of its audio.
  char fs_uuid[MEDIIDX_TEXT_SIZE];      ///< Identifier of the file system that holds the file.
};

/// Metadata of one folder.
typedef struct DIR_INFO_REC {
  char path[MEDIIDX_PATH_SIZE];
  char title[MEDIIDX_PATH_SIZE];
  char date[MEDIIDX_DATE_SIZE];     ///< SQL timestamp.
  char mdate[MEDIIDX_DATE_SIZE];    ///< SQL timestamp.
  char fs_uuid[MEDIIDX_TEXT_SIZE];  ///< Identifier of the file system that holds the folder.
} DIR_INFO_REC;

/// One entry of a playlist, or one track of a cue sheet; freed with TAVOPlaylistRecFree.
struct _PLAYLIST_REC {
  struct __tag_TAVO_MEDIA_INFO info;
  struct _PLAYLIST_REC* next;  ///< Null at the end.
};

/// One transcoded copy of a video.
typedef struct VIDEO_CONVERT_REC {
  char video_path[MEDIIDX_PATH_SIZE];         ///< The video that was transcoded.
  char convert_file_path[MEDIIDX_PATH_SIZE];  ///< Its copy.
  int32_t resolutionx;                        ///< Pixels.
  int32_t resolutiony;                        ///< Pixels.
  int32_t video_bitrate;                      ///< Bits a second.
  char vcodec[MEDIIDX_TEXT_SIZE];
  int32_t video_profile;
  int32_t video_level;
  char container_type[MEDIIDX_TEXT_SIZE];
  char acodec[MEDIIDX_TEXT_SIZE];
  int32_t audio_bitrate;    ///< Bits a second.
  int32_t audio_frequency;  ///< Samples a second.
  int32_t audio_channel;
  char convert_type[MEDIIDX_TEXT_SIZE];
} VIDEO_CONVERT_REC;

#endif
