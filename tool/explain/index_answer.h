// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Whether a path would be indexed, and why or why not.
#ifndef MEDIIDX_TOOL_EXPLAIN_INDEX_ANSWER_H_
#define MEDIIDX_TOOL_EXPLAIN_INDEX_ANSWER_H_

#include <optional>
#include <string>
#include <vector>

#include "store/data_folder.h"
#include "tags/media_file.h"

namespace mediidx::tool {

/// What decides. The first two speak for the path, the others against it.
enum class Reason {
  kIndexFolder,       ///< A folder chosen for indexing holds it.
  kPersonalLibrary,   ///< A user's music folder holds it.
  kNotUtf8,           ///< The index cannot hold such a name.
  kTooLong,           ///< Nor one of this length.
  kUnknownExtension,  ///< It is no medium, by its name.
  kRemoteMount,       ///< It lies on a network mount.
  kKindOff,           ///< The deepest folder chosen for indexing leaves this kind out.
  kShareGone,         ///< The entry that seems to be meant names a share that is not known.
  kNoFolders,         ///< No folder is chosen for indexing.
  kOutside,           ///< None of the folders chosen for indexing holds it.
  kOwnData,           ///< It is a part of mediidx's own data.
  kPassedOver,        ///< A name on the way is one that the scan passes over.
  kIgnored,           ///< A ".mediidxignore" file leaves it out.
  kUnreadable,        ///< It cannot be looked at or read.
  kNoFile,            ///< It is a socket, a device or the like.
  kEmptyFile,         ///< It has no content.
  kOtherName,         ///< It is indexed under the name that it has without links.
};
/// The reason for programs: "index_folder", "kind_off", …
const char* name_of(Reason reason);

/// A folder chosen for indexing.
struct ChosenFolder {
  std::string folder;
  std::string name;
  bool music = false;  ///< Playlists too.
  bool photo = false;
  bool video = false;
};

struct IndexAnswer {
  std::string path;
  bool exists = false;
  bool is_folder = false;
  std::optional<Kind> kind;  ///< Of a file.
  Reason reason = Reason::kOutside;
  /// What the reason is about: the extension, the name that is passed over, the share, the other
  /// name, the cause.
  std::string subject;
  std::optional<int> library;          ///< What the library answered, when it was asked.
  std::optional<ChosenFolder> chosen;  ///< The deepest one that holds the path.
  std::string user;                    ///< Whose home folder holds the path.
  bool is_chosen_there = true;         ///< False when the chosen folder is away.

  bool indexed() const { return reason <= Reason::kPersonalLibrary; }
};

/// Answers for a path that may exist or not; one with a slash at its end is a folder. The
/// configuration has to be loaded. Throws std::runtime_error for an empty path.
IndexAnswer answer_for(const DataFolder& data, const std::string& named);

/// Entries of the configuration whose share is not known, as the file holds them ("/share/folder").
std::vector<std::string> entries_without_share();

}  // namespace mediidx::tool

#endif
