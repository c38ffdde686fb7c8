// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The tags that TagLib reads, under the names that their formats give them.
#ifndef MEDIIDX_TOOL_TAGS_NAMED_TAGS_H_
#define MEDIIDX_TOOL_TAGS_NAMED_TAGS_H_

#include <apetag.h>
#include <asftag.h>
#include <id3v1tag.h>
#include <id3v2tag.h>
#include <infotag.h>
#include <mp4tag.h>
#include <xiphcomment.h>

#include "tags/tag_table.h"

namespace mediidx::tool {

/// From now on TagLib decodes texts that claim to be Latin-1, or claim nothing, by decode_legacy.
void prepare_taglib();

/// Text frames by their id, "TXXX:" and "COMM:" with their description behind; "RVA2:track gain".
NamedTags named_tags(const TagLib::ID3v2::Tag& tag);
/// By the names of the fields: "title", "artist", ….
NamedTags named_tags(const TagLib::ID3v1::Tag& tag);
NamedTags named_tags(TagLib::Ogg::XiphComment& tag);
/// Freeform atoms as "----:NAME", whatever program they name.
NamedTags named_tags(const TagLib::MP4::Tag& tag);
NamedTags named_tags(const TagLib::APE::Tag& tag);
NamedTags named_tags(const TagLib::ASF::Tag& tag);
NamedTags named_tags(const TagLib::RIFF::Info::Tag& tag);

}  // namespace mediidx::tool

#endif
