// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Whether a path would be indexed, and why or why not.
#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "explain/index_answer.h"
#include "mediidx/index_folder.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

const char* kind_word(const IndexAnswer& answer) {
  if (answer.is_folder) return "folder";
  if (!answer.kind) return "";
  switch (*answer.kind) {
    case Kind::kMusic:
      return "music";
    case Kind::kPhoto:
      return "photo";
    case Kind::kVideo:
      return "video";
    case Kind::kPlaylist:
      return "playlist";
    case Kind::kCueSheet:
      return "cue sheet";
  }
  return "";
}

/// "/volume1/music (music, photos)"
std::string chosen_text(const ChosenFolder& chosen) {
  std::string kinds;
  const auto add = [&kinds](bool on, const char* kind) {
    if (on) kinds += (kinds.empty() ? "" : ", ") + std::string(kind);
  };
  add(chosen.music, "music");
  add(chosen.photo, "photos");
  add(chosen.video, "videos");
  return escape_for_display(chosen.folder) + " (" + (kinds.empty() ? "no kind" : kinds) + ")";
}

std::string reason_text(const IndexAnswer& answer) {
  const auto subject = escape_for_display(answer.subject);
  const auto chosen = answer.chosen ? chosen_text(*answer.chosen) : std::string();
  switch (answer.reason) {
    case Reason::kIndexFolder:
      return "it lies in the folder chosen for indexing " + chosen;
    case Reason::kPersonalLibrary:
      return "it lies in the personal music library of " + escape_for_display(answer.user) +
             ", whatever folders are chosen";
    case Reason::kNotUtf8:
      return "its name is not valid UTF-8";
    case Reason::kTooLong:
      return "its path is too long";
    case Reason::kUnknownExtension:
      return subject.empty() ? "its name has no extension that tells what it is"
                             : "no kind of media has the extension " + subject;
    case Reason::kRemoteMount:
      return "it lies on a network mount, which is never indexed";
    case Reason::kKindOff:
      return "the deepest folder chosen for indexing that holds it leaves this kind out: " + chosen;
    case Reason::kShareGone:
      return "the configuration's entry " + subject + " names a share that is not known";
    case Reason::kNoFolders:
      return "no folder is chosen for indexing";
    case Reason::kOutside:
      return "no folder chosen for indexing holds it";
    case Reason::kOwnData:
      return "it belongs to mediidx's own data";
    case Reason::kPassedOver:
      return "the name " + subject + " is passed over";
    case Reason::kIgnored:
      return "a .mediidxignore file leaves it out";
    case Reason::kUnreadable:
      return "it cannot be read: " + subject;
    case Reason::kNoFile:
      return "it is neither a file nor a folder";
    case Reason::kEmptyFile:
      return "the file is empty";
    case Reason::kOtherName:
      return "it is indexed under the name that it has without links: " + subject;
  }
  return "";
}

/// What else there is to know, a sentence each.
std::vector<std::string> notes_of(const IndexAnswer& answer) {
  std::vector<std::string> notes;
  if (!answer.exists) notes.emplace_back("it does not exist now");
  if (!answer.is_chosen_there) {
    notes.push_back("the chosen folder is not there now: " +
                    escape_for_display(answer.chosen->folder));
  }
  if (answer.reason == Reason::kPersonalLibrary && !answer.chosen) {
    notes.emplace_back("no chosen folder holds it, so it is only found once its folder is indexed");
  }
  return notes;
}

Json::Value chosen_json(const ChosenFolder& chosen) {
  Json::Value out;
  out["folder"] = json_text(chosen.folder);
  out["name"] = json_text(chosen.name);
  out["music"] = chosen.music;
  out["photo"] = chosen.photo;
  out["video"] = chosen.video;
  return out;
}

Json::Value to_json(const IndexAnswer& answer) {
  Json::Value out;
  out["path"] = json_text(answer.path);
  out["exists"] = answer.exists;
  const std::string kind = kind_word(answer);
  out["kind"] = kind.empty() ? Json::Value() : Json::Value(kind);
  out["indexed"] = answer.indexed();
  out["library"] = answer.library ? Json::Value(*answer.library) : Json::Value();
  out["reason"] = name_of(answer.reason);
  out["text"] = json_text(reason_text(answer));
  out["folder"] = answer.chosen ? chosen_json(*answer.chosen) : Json::Value();
  out["user"] = answer.user.empty() ? Json::Value() : json_text(answer.user);
  auto& notes = out["notes"] = Json::Value(Json::arrayValue);
  for (const auto& note : notes_of(answer)) notes.append(json_text(note));
  return out;
}

void print(const IndexAnswer& answer) {
  const std::string kind = kind_word(answer);
  const auto as = kind.empty() ? std::string() : " as " + kind;
  put(escape_for_display(answer.path) +
      (answer.indexed() ? " would be indexed" : " would not be indexed") + as + ": " +
      reason_text(answer) + "\n");
  for (const auto& note : notes_of(answer)) put("Note: " + note + "\n");
}

}  // namespace

int run_why(const Arguments& arguments) {
  const DataFolder data(arguments.value("--data-dir"));
  IndexFolderInit();
  const auto answer = answer_for(data, arguments.operands[0]);
  if (arguments.has("--json")) {
    put_json(to_json(answer));
  } else {
    print(answer);
  }
  return answer.indexed() ? kExitDone : kExitSomeFailed;
}

}  // namespace mediidx::tool
