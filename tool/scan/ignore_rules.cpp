// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/ignore_rules.h"

#include <re2/re2.h>

#include <algorithm>
#include <deque>
#include <optional>
#include <utility>

#include "scan/glob.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

/// The rules for one path; of more, the deepest are dropped. Each takes some kilobytes.
constexpr std::size_t kMostRules = 10'000;

struct Rule {
  Rule(const std::string& regex, const RE2::Options& options, bool back, bool folders)
      : pattern(regex, options), takes_back(back), folders_only(folders) {}

  RE2 pattern;
  bool takes_back;
  bool folders_only;
};

RE2::Options of_bytes() {
  RE2::Options options(RE2::Latin1);
  options.set_dot_nl(true);
  options.set_log_errors(false);
  return options;
}

std::string_view parent(std::string_view path) {
  const auto slash = path.rfind('/');
  return path.substr(0, slash == std::string_view::npos ? 0 : slash);
}

/// Without blanks at the end, unless a backslash keeps them.
std::string_view trim_end(std::string_view line) {
  std::size_t length = 0;
  for (std::size_t i = 0; i < line.size(); ++i) {
    if (line[i] == ' ') continue;
    if (line[i] == '\\') ++i;
    length = std::min(i + 1, line.size());
  }
  return line.substr(0, length);
}

void add_rule(std::deque<Rule>& rules, std::string_view line) {
  if (line.starts_with('#') || !is_utf8(line)) return;
  line = trim_end(line);
  const bool takes_back = line.starts_with('!');
  if (takes_back) line.remove_prefix(1);
  const bool folders_only = line.ends_with('/');
  if (folders_only) line.remove_suffix(1);
  const bool any_folder = line.find('/') == std::string_view::npos;
  if (line.starts_with('/')) line.remove_prefix(1);
  const auto regex = regex_of_glob(line);
  if (line.empty() || !regex) return;
  rules.emplace_back((any_folder ? "(?:.*/)?" : "") + *regex, of_bytes(), takes_back, folders_only);
  if (!rules.back().pattern.ok()) rules.pop_back();  // Too large.
}

}  // namespace

/// The rules of one file.
class IgnoreRules::Level {
 public:
  Level(std::string folder, std::string_view text, std::size_t most)
      : folder_(std::move(folder)), prefix_(folder_.empty() ? 0 : folder_.size() + 1) {
    while (!text.empty() && rules_.size() < most) {
      const auto end = std::min(text.find('\n'), text.size());
      auto line = text.substr(0, end);
      text.remove_prefix(std::min(end + 1, text.size()));
      if (line.ends_with('\r')) line.remove_suffix(1);
      add_rule(rules_, line.substr(0, line.find('\0')));
    }
  }

  const std::string& folder() const { return folder_; }
  std::size_t size() const { return rules_.size(); }
  bool is_above(std::string_view relative) const {
    return folder_.empty() || (relative.starts_with(folder_) && relative.size() > prefix_ &&
                               relative[folder_.size()] == '/');
  }
  /// What the last rule that matches says; empty when none does. The path lies below the folder.
  std::optional<bool> leaves_out(std::string_view relative, bool is_folder) const {
    const auto path = relative.substr(prefix_);
    const re2::StringPiece bytes(path.data(), path.size());
    for (auto rule = rules_.rbegin(); rule != rules_.rend(); ++rule) {
      if (rule->folders_only && !is_folder) continue;
      if (RE2::FullMatch(bytes, rule->pattern)) return !rule->takes_back;
    }
    return std::nullopt;
  }

 private:
  std::string folder_;
  std::size_t prefix_;
  std::deque<Rule> rules_;
};

IgnoreRules::IgnoreRules(std::string root) : root_(std::move(root)) {}
IgnoreRules::IgnoreRules(IgnoreRules&&) noexcept = default;
IgnoreRules& IgnoreRules::operator=(IgnoreRules&&) noexcept = default;
IgnoreRules::~IgnoreRules() = default;

std::string IgnoreRules::below_root(const std::string& path) const {
  return path.substr(std::min(root_.size() + (root_ == "/" ? 0 : 1), path.size()));
}

void IgnoreRules::add(const std::string& folder, std::string_view text) {
  constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
  if (text.size() > kIgnoreFileSize) {
    text = text.substr(0, kIgnoreFileSize);
    text = text.substr(0, text.rfind('\n') + 1);
  }
  if (text.starts_with(kByteOrderMark)) text.remove_prefix(kByteOrderMark.size());
  auto relative = below_root(folder);
  if (Level("", text, 1).size() == 0) return;
  texts_.insert_or_assign(std::move(relative), text);
  levels_.clear();
  last_folder_.clear();
  last_folder_left_out_ = false;
}

void IgnoreRules::use_levels_above(std::string_view relative) const {
  while (!levels_.empty() && !levels_.back()->is_above(relative)) levels_.pop_back();
  std::size_t left = kMostRules;
  for (const auto& level : levels_) left -= level->size();
  std::vector<std::string_view> missing;
  for (auto folder = parent(relative);; folder = parent(folder)) {
    if (!levels_.empty() && levels_.back()->folder() == folder) break;
    missing.push_back(folder);
    if (folder.empty()) break;
  }
  for (auto folder = missing.rbegin(); folder != missing.rend(); ++folder) {
    const auto text = texts_.find(*folder);
    if (text == texts_.end()) continue;
    levels_.push_back(std::make_unique<Level>(text->first, text->second, left));
    left -= levels_.back()->size();
  }
}

bool IgnoreRules::leaves_out(const std::string& relative, bool is_folder) const {
  use_levels_above(relative);
  for (auto level = levels_.rbegin(); level != levels_.rend(); ++level) {
    if (const auto answer = (*level)->leaves_out(relative, is_folder)) return *answer;
  }
  return false;
}

bool IgnoreRules::leaves_out_folder(const std::string& relative) const {
  if (relative.empty()) return false;
  if (relative != last_folder_) {
    last_folder_left_out_ =
        leaves_out_folder(std::string(parent(relative))) || leaves_out(relative, true);
    last_folder_ = relative;
  }
  return last_folder_left_out_;
}

bool IgnoreRules::ignores(const std::string& path, bool is_folder) const {
  if (is_empty()) return false;
  const auto relative = below_root(path);
  return leaves_out_folder(std::string(parent(relative))) || leaves_out(relative, is_folder);
}

}  // namespace mediidx::tool
