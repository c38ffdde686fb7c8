// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/ignore_rules.h"

#include <re2/re2.h>

#include "fuzz.h"
#include "scan/glob.h"

namespace {

using namespace mediidx;

/// The text as a pattern that matches itself.
std::string plain(std::string_view text) {
  std::string glob;
  for (const char c : text) {
    if (std::string_view("\\*?[").find(c) != std::string_view::npos) glob += '\\';
    glob += c;
  }
  return glob;
}

RE2::Options of_bytes() {
  RE2::Options options(RE2::Latin1);
  options.set_dot_nl(true);
  options.set_log_errors(false);
  return options;
}

void check_glob(const std::string& glob, const std::string& text) {
  static const auto options = of_bytes();
  const re2::StringPiece bytes(text.data(), text.size());
  if (const auto regex = tool::regex_of_glob(glob)) {
    const RE2 pattern(*regex, options);
    fuzz::check(pattern.ok() || pattern.error_code() == RE2::ErrorPatternTooLarge);
    // No pattern without "**" matches across the border of a folder that it does not name.
    const auto slashes = [](const std::string& in) { return std::ranges::count(in, '/'); };
    if (glob.find("**") == glob.npos && pattern.ok() && RE2::FullMatch(bytes, pattern)) {
      fuzz::check(slashes(text) <= slashes(glob));
    }
  }
  const auto itself = tool::regex_of_glob(plain(text));
  fuzz::check(itself.has_value());
  fuzz::check(RE2::FullMatch(bytes, RE2(*itself, options)));
}

/// The text as a path that a walk meets: without empty names.
std::string below_root(std::string_view text) {
  std::string path = "/root";
  while (!text.empty()) {
    const auto name = text.substr(0, text.find('/'));
    if (!name.empty()) path.append("/").append(name);
    text.remove_prefix(std::min(name.size() + 1, text.size()));
  }
  return path;
}

}  // namespace

/// A path, a folder above it, and the texts of the root's file and of that folder's.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  constexpr std::size_t kLongestPath = 256;
  fuzz::Input input(data, size);
  const auto path = below_root(input.text(kLongestPath));
  if (path == "/root") return 0;
  const auto depth = input.byte();
  const auto own = input.text();
  const auto deeper = input.text();
  auto folder = path;
  for (unsigned i = 0; i < depth && folder.find('/', 6) != folder.npos; ++i) {
    folder.resize(folder.rfind('/'));
  }
  check_glob(own.substr(0, own.find('\n')), path.substr(6));

  tool::IgnoreRules rules("/root");
  rules.add("/root", own);
  if (folder != path) rules.add(folder, deeper);
  const bool as_file = rules.ignores(path, false);
  const bool as_folder = rules.ignores(path, true);
  if (rules.is_empty()) fuzz::check(!as_file && !as_folder);
  // Nothing takes back what is below a folder that is left out.
  if (as_folder) fuzz::check(rules.ignores(path + "/below", false));
  // An answer does not hang on what was asked before.
  tool::IgnoreRules fresh("/root");
  fresh.add("/root", own);
  if (folder != path) fresh.add(folder, deeper);
  fuzz::check(fresh.ignores(path, true) == as_folder);
  return 0;
}
