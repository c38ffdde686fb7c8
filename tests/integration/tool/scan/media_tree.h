// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A small library of real media that users change at random.
#ifndef MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_MEDIA_TREE_H_
#define MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_MEDIA_TREE_H_

#include <filesystem>
#include <set>
#include <string>
#include <vector>

#include "dice.h"

namespace mediidx::test {

/// Folders with files under few names, so that names, albums and artists meet again and again. Each
/// change says what it did; the text is empty when there was nothing to do it to. What lies below a
/// folder that is closed, or in a root that is away, is not changed.
class MediaTree {
 public:
  /// `base`: an empty folder. The first root may be moved away, the second is a mount point where
  /// this process may mount, the third is the music folder of the user whose home is "homes/ann".
  MediaTree(std::filesystem::path base, Dice& dice);
  ~MediaTree();
  MediaTree(const MediaTree&) = delete;
  MediaTree& operator=(const MediaTree&) = delete;

  const std::vector<std::string>& roots() const { return roots_; }
  bool is_away(const std::string& root) const { return away_.contains(root); }
  /// Any folder that is there, a root or one below.
  std::string any_folder();
  /// A folder that can be looked at: not one below a folder that is closed.
  bool is_there(const std::string& folder) const {
    std::error_code ignored;
    return std::filesystem::is_directory(folder, ignored);
  }
  std::string any_file();
  /// True when a folder above the path, or it, is closed.
  bool is_closed(const std::string& path) const;
  const std::set<std::string>& closed() const { return closed_; }
  /// True when a folder above the path says what is to be left out.
  bool may_be_ignored(const std::string& path) const;

  std::string add_audio();
  std::string add_picture_or_film();
  std::string add_playlist();
  std::string add_cue_sheet();
  std::string add_folder();
  std::string add_damaged();
  std::string retag();
  std::string replace();
  std::string touch();
  std::string empty_out();
  std::string move_file();
  std::string move_folder();
  std::string swap_files();
  std::string swap_folders();
  std::string remove_file();
  std::string remove_folder();
  std::string ignore_something();
  std::string close_something();
  std::string open_all();
  std::string take_root_away();
  std::string bring_root_back();
  /// Opens and brings back all that is closed and away.
  void restore();
  /// Gives each file and folder a modification time of its own. Of two that changed in one tick of
  /// the clock of files nobody can tell which is which once they have changed names.
  void tell_apart();

 private:
  struct Listing {
    std::vector<std::string> folders;
    std::vector<std::string> files;
  };
  void mount_second_root();
  Listing list() const;
  std::string any_folder_below_roots();
  std::string new_file(const std::vector<std::string>& extensions);
  void set_random_tags(const std::string& file);
  void put_sample(const std::string& sample, const std::string& file);
  std::string disk_of(const std::string& root) const;
  bool holds_closed(const std::string& folder) const;
  bool rename(const std::string& from, const std::string& to);

  std::filesystem::path base_;
  Dice& dice_;
  std::vector<std::string> roots_;
  std::string mount_;  ///< The root that is a mount point; empty where this process may not mount.
  std::set<std::string> away_;
  std::set<std::string> closed_;
};

}  // namespace mediidx::test

#endif
