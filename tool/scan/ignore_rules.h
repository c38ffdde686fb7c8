// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What users keep out of the index themselves.
#ifndef MEDIIDX_TOOL_SCAN_IGNORE_RULES_H_
#define MEDIIDX_TOOL_SCAN_IGNORE_RULES_H_

#include <cstddef>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace mediidx::tool {

/// The file that says so, for its folder and all below.
inline constexpr const char* kIgnoreFile = ".mediidxignore";
/// The part of it that counts, in bytes; a line that this cuts does not.
inline constexpr std::size_t kIgnoreFileSize = std::size_t{64} * 1024;

/// What the `.mediidxignore` files of one tree leave out, read as git reads `.gitignore`: a deeper
/// file wins over a higher one and "!" takes back, but nothing takes back what is below a folder
/// that is left out. Lines that are not UTF-8 are passed over. What a question costs grows with the
/// rules and the length of the path, whatever the patterns are.
class IgnoreRules {
 public:
  /// `root`: an absolute folder.
  explicit IgnoreRules(std::string root);
  IgnoreRules(IgnoreRules&&) noexcept;
  IgnoreRules& operator=(IgnoreRules&&) noexcept;
  ~IgnoreRules();

  /// Takes the text of folder/.mediidxignore; `folder` is the root or lies below it, and is met
  /// before what it holds.
  void add(const std::string& folder, std::string_view text);
  /// True when there is no rule: then nothing is left out.
  bool is_empty() const { return texts_.empty(); }
  /// True when the path, below the root, or a folder above it is left out. Cheapest in the order
  /// of a walk: the answer for its folder and the rules for that are kept until the next call.
  bool ignores(const std::string& path, bool is_folder) const;

 private:
  class Level;

  std::string below_root(const std::string& path) const;
  bool leaves_out(const std::string& relative, bool is_folder) const;
  bool leaves_out_folder(const std::string& relative) const;
  void use_levels_above(std::string_view relative) const;

  std::string root_;
  /// By folder below the root, "" for the root itself.
  std::map<std::string, std::string, std::less<>> texts_;
  /// Those of the folders above the last path that was asked about, from the root down.
  mutable std::vector<std::unique_ptr<Level>> levels_;
  mutable std::string last_folder_;  ///< The last folder asked about, and the answer.
  mutable bool last_folder_left_out_ = false;
};

}  // namespace mediidx::tool

#endif
