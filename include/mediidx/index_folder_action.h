/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// What happens when the folders chosen for indexing change.
#ifndef MEDIIDX_INDEX_FOLDER_ACTION_H_
#define MEDIIDX_INDEX_FOLDER_ACTION_H_

#include "mediidx/types.h"

#ifdef __cplusplus
#include <json/value.h>

extern "C" {
#endif

/// Takes a folder that was deleted, given by its absolute path, and all below it out of the
/// configuration. Nothing happens while the folder exists. 0, or -1 when the file cannot be saved.
MEDIIDX_EXPORT int IndexFolderConfDelFolder(const char* path);

#ifdef __cplusplus
}  // extern "C"

/// Applies a new configuration: saves it and has the indexer drop and add the folders concerned,
/// waiting for its programs. Entries are those of the file, with share-relative paths; entries that
/// are not usable, and those whose folder does not exist, are left out.
class MEDIIDX_EXPORT IndexFolderAction {
 public:
  IndexFolderAction();
  ~IndexFolderAction();

  /// Applies `newConf`; folders of `comparison` are looked for among the present ones to find what
  /// was added and what changed. An empty `newConf` deletes the file. 0, or 1 when it cannot be
  /// saved.
  int onApply(const Json::Value& newConf, const Json::Value& comparison);
  /// Applies `newConf`, compared with the present file. 1, or 0 when it cannot be saved: the
  /// opposite of the other form.
  int onApply(const Json::Value& newConf);

  /// True when path and flags are equal.
  bool compareFolder(const Json::Value& first, const Json::Value& second);
  /// Fills the lists of added and changed folders.
  void setUpdatedIndexFolders();
  /// Fills the list of deleted folders.
  void setDeletedIndexFolders();
  /// Keeps the entries whose folder exists.
  void checkFoldersExist(Json::Value& conf);
  /// Has the indexer drop and add the folder of each entry.
  void ReindexFolders(const Json::Value& list);
  /// Has the index manager bring the shares' indexed bits up to date.
  void ModifyShareStatus();

 private:
  void Prepare(const Json::Value& newConf, const Json::Value& comparison);
  bool Save();
  void Reindex();

  Json::Value newConf_;
  Json::Value comparison_;
  Json::Value currentConf_;
  Json::Value added_;
  Json::Value deleted_;
  Json::Value changed_;
};

/// Sets or clears the indexed bit of each named share; stops at the first that fails.
MEDIIDX_EXPORT void SetShareIndexed(struct tlib_szlist* shares, bool on);
#endif

#endif
