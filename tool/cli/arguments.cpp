// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/arguments.h"

#include <algorithm>
#include <limits>
#include <string_view>

namespace mediidx::tool {
namespace {

constexpr Option kCommonOptions[] = {
    {"--data-dir", "DIR", "keep index, settings and database server in DIR"},
    {"--help", nullptr, "show this help"},
};

std::size_t words_in(std::string_view name) {
  return 1 + static_cast<std::size_t>(std::ranges::count(name, ' '));
}

/// The verb whose name begins the words, the longest first.
const Verb* find_verb(std::span<const Verb> verbs, const std::vector<std::string>& words) {
  const Verb* found = nullptr;
  for (const auto& verb : verbs) {
    const auto count = words_in(verb.name);
    if (count > words.size() || (found && count <= words_in(found->name))) continue;
    std::string name = words[0];
    for (std::size_t i = 1; i < count; ++i) name += " " + words[i];
    if (name == verb.name) found = &verb;
  }
  return found;
}

const Option* find_option(std::span<const Option> options, std::string_view name) {
  const auto found = std::ranges::find(options, name, &Option::name);
  return found == options.end() ? nullptr : &*found;
}

/// Every option of every verb: whether one takes a value is known before the verb is.
const Option* find_any_option(std::span<const Verb> verbs, std::string_view name) {
  if (const auto* option = find_option(kCommonOptions, name)) return option;
  for (const auto& verb : verbs) {
    if (const auto* option = find_option(verb.options, name)) return option;
  }
  return nullptr;
}

void check_operands(const Arguments& arguments) {
  const auto& verb = *arguments.verb;
  const auto count = arguments.operands.size();
  if (count < verb.least_operands) {
    throw UsageError(std::string(verb.name) + " needs " + verb.operands);
  }
  if (count > verb.most_operands) {
    throw UsageError(std::string(verb.name) + " does not take \"" +
                     arguments.operands[verb.most_operands] + "\"");
  }
  if (verb.choices.empty() || count == 0) return;
  if (std::ranges::find(verb.choices, std::string_view(arguments.operands[0])) ==
      verb.choices.end()) {
    throw UsageError(std::string(verb.name) + " does not know \"" + arguments.operands[0] +
                     "\", only " + verb.operands);
  }
}

std::string option_lines(std::span<const Option> options) {
  std::string out;
  for (const auto& option : options) {
    std::string name = option.name;
    if (option.value) name += std::string(" ") + option.value;
    name.resize(std::max<std::size_t>(name.size() + 2, 18), ' ');
    out += "  " + name + option.help + "\n";
  }
  return out;
}

std::string usage_of(const Verb& verb) {
  std::string out = std::string("mediidx ") + verb.name;
  if (*verb.operands) out += std::string(" ") + verb.operands;
  return out;
}

}  // namespace

std::optional<std::string> Arguments::value(const std::string& option) const {
  const auto found = options.find(option);
  return found == options.end() ? std::nullopt : std::optional(found->second);
}

std::span<const Option> common_options() { return kCommonOptions; }

Arguments parse_arguments(std::span<const Verb> verbs, std::span<const std::string> words) {
  Arguments out;
  bool options_end = false;
  for (std::size_t i = 0; i < words.size(); ++i) {
    const auto& word = words[i];
    if (options_end || !word.starts_with("-") || word == "-") {
      out.operands.push_back(word);
      continue;
    }
    if (word == "--") {
      options_end = true;
      continue;
    }
    const auto equals = word.find('=');
    const auto name = word == "-h" ? "--help" : word.substr(0, equals);
    const auto* option = find_any_option(verbs, name);
    if (!option) throw UsageError("unknown option " + name);
    std::string value;
    if (equals != std::string::npos) {
      if (!option->value) throw UsageError(name + " takes no value");
      value = word.substr(equals + 1);
    } else if (option->value) {
      if (++i == words.size()) throw UsageError(name + " needs " + option->value);
      value = words[i];
    }
    if (option->value && value.empty()) throw UsageError(name + " needs " + option->value);
    out.options[name] = value;
  }
  if (out.operands.empty()) return out;
  out.verb = find_verb(verbs, out.operands);
  if (!out.verb) throw UsageError("unknown verb \"" + out.operands[0] + "\"");
  out.operands.erase(out.operands.begin(),
                     out.operands.begin() + static_cast<std::ptrdiff_t>(words_in(out.verb->name)));
  for (const auto& [name, value] : out.options) {
    if (!find_option(kCommonOptions, name) && !find_option(out.verb->options, name)) {
      throw UsageError(std::string(out.verb->name) + " does not take " + name);
    }
  }
  if (!out.has("--help")) check_operands(out);
  return out;
}

std::string general_help(std::span<const Verb> verbs) {
  std::string out = "mediidx keeps an index of music, videos, photos and playlists.\n\n";
  std::size_t width = 0;
  for (const auto& verb : verbs) width = std::max(width, usage_of(verb).size());
  // Long operands stand on a line of their own instead of pushing every help aside.
  width = std::min<std::size_t>(width, 28);
  for (const auto& verb : verbs) {
    auto usage = usage_of(verb);
    if (usage.size() > width) {
      usage += "\n  " + std::string(width, ' ');
    } else {
      usage.resize(width, ' ');
    }
    out += "  " + usage + "  " + verb.help + "\n";
  }
  return out + "\nOptions of every verb:\n" + option_lines(kCommonOptions) +
         "\nA server named by PGHOST, PGHOSTADDR, PGPORT, PGSERVICE or PGDATABASE is used when one\n"
         "of them is set; otherwise mediidx runs a database server of its own.\n"
         "Exit status: 0 done, 1 failed, 2 wrong usage, 3 done except for some files.\n";
}

std::string verb_help(const Verb& verb) {
  auto out = "Usage: " + usage_of(verb) + "\n\n" + verb.help + "\n\nOptions:\n" +
             option_lines(verb.options) + option_lines(kCommonOptions);
  if (verb.statuses) out += std::string("\nExit status: ") + verb.statuses + ".\n";
  return out;
}

}  // namespace mediidx::tool
