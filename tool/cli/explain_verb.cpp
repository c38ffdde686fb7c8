// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The tracks of an album, and why its album artist is what it is.
#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "explain/album_account.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

Json::Value to_json(const AlbumTrack& track) {
  Json::Value out;
  out["path"] = json_text(track.path);
  out["title"] = json_text(track.title);
  out["artist"] = json_text(track.artist);
  out["album_artist"] = json_text(track.album_artist);
  out["tagged"] = track.is_tagged;
  out["source"] = name_of(track.source);
  out["disc"] = track.disc;
  out["track"] = track.track;
  out["userid"] = Json::Int64{track.userid};
  out["cue_sheet"] = track.cue_sheet.empty() ? Json::Value() : json_text(track.cue_sheet);
  return out;
}

Json::Value to_json(const AlbumAccount& account) {
  Json::Value out;
  out["album"] = json_text(account.album);
  auto& sentences = out["why"] = Json::Value(Json::arrayValue);
  for (const auto& sentence : account.sentences()) sentences.append(json_text(sentence));
  auto& tracks = out["tracks"] = Json::Value(Json::arrayValue);
  for (const auto& track : account.tracks) tracks.append(to_json(track));
  return out;
}

const char* source_text(const AlbumTrack& track) {
  switch (track.source) {
    case ArtistSource::kTag:
      return "its tag";
    case ArtistSource::kArtist:
      return "its artist";
    case ArtistSource::kSeveral:
      return "several artists";
    case ArtistSource::kLastLeft:
      return "the last artist left";
    case ArtistSource::kUnknown:
      break;
  }
  return "unknown";
}

void print(const AlbumAccount& account) {
  if (is_on_terminal()) put("Album: " + escape_for_display(account.album) + "\n");
  for (const auto& sentence : account.sentences()) put(escape_for_display(sentence) + "\n");
  std::vector<TableRow> lines;
  for (const auto& track : account.tracks) {
    lines.push_back({track.track > 0 ? std::to_string(track.track) : "", track.title, track.artist,
                     track.album_artist, source_text(track), track.path});
  }
  put_table(
      {{"No.", true}, {"Title"}, {"Artist"}, {"Album artist"}, {"From"}, {"Path", false, true}},
      lines);
}

}  // namespace

int run_explain(const Arguments& arguments) {
  const auto& name = arguments.operands[0];
  if (!is_utf8(name)) throw UsageError("explain needs a name in UTF-8");
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  const auto albums = find_albums(database, name);
  if (albums.empty()) {
    throw std::runtime_error("the index holds no album " + escape_for_display(name));
  }
  if (arguments.has("--json")) {
    JsonList list;
    for (const auto& album : albums) list.add(to_json(album));
    list.finish();
  } else {
    for (const auto& album : albums) print(album);
  }
  return kExitDone;
}

}  // namespace mediidx::tool
