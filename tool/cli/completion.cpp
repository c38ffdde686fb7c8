// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/completion.h"

#include <algorithm>
#include <string_view>
#include <vector>

namespace mediidx::tool {
namespace {

enum class Kind { kAnything, kFolder, kPath, kVerb, kWords };

/// What an operand or the value of an option can be.
struct Value {
  Kind kind = Kind::kAnything;
  std::string name;                ///< As the help calls it.
  std::vector<std::string> words;  ///< All that it can be, when it is one of some words.
  bool is_repeated = false;
};

std::vector<std::string> split(std::string_view text, char separator) {
  std::vector<std::string> out;
  while (!text.empty()) {
    const auto end = std::min(text.find(separator), text.size());
    out.emplace_back(text.substr(0, end));
    text.remove_prefix(std::min(end + 1, text.size()));
  }
  return out;
}

std::string joined(const std::vector<std::string>& words, std::string_view separator) {
  std::string out;
  for (const auto& word : words) {
    if (!out.empty()) out += separator;
    out += word;
  }
  return out;
}

/// Values are named in capitals; anything else is what is to be typed.
bool is_literal(std::string_view name) {
  return name.find_first_of("abcdefghijklmnopqrstuvwxyz") == 0;
}

Value value_named(std::string name) {
  Value value;
  if (name.starts_with('[')) name = name.substr(1, name.size() - 2);
  if (name.ends_with("...")) {
    name.resize(name.size() - 3);
    value.is_repeated = true;
  }
  value.name = name;
  if (name == "FOLDER" || name == "DIR") value.kind = Kind::kFolder;
  if (name == "PATH" || name == "FILE") value.kind = Kind::kPath;
  if (name == "VERB") value.kind = Kind::kVerb;
  if (is_literal(name)) {
    value.kind = Kind::kWords;
    value.words = split(name, '|');
  }
  return value;
}

std::vector<Value> operands_of(const Verb& verb) {
  std::vector<Value> out;
  for (const auto& name : split(verb.operands, ' ')) out.push_back(value_named(name));
  return out;
}

/// The first words of verbs, or the second ones of those that begin with `first`; each once.
std::vector<std::string> words_of(std::span<const Verb> verbs, std::string_view first = {}) {
  std::vector<std::string> out;
  for (const auto& verb : verbs) {
    const auto words = split(verb.name, ' ');
    if (!first.empty() && (words.size() < 2 || words[0] != first)) continue;
    const auto& word = words[first.empty() ? 0 : 1];
    if (std::ranges::find(out, word) == out.end()) out.push_back(word);
  }
  return out;
}

/// The options of all verbs, each once.
std::vector<Option> all_options(std::span<const Verb> verbs) {
  std::vector<Option> out(common_options().begin(), common_options().end());
  for (const auto& verb : verbs) {
    for (const auto& option : verb.options) {
      if (std::ranges::find(out, std::string_view(option.name), &Option::name) == out.end()) {
        out.push_back(option);
      }
    }
  }
  return out;
}

std::string option_names(std::span<const Option> options) {
  std::string out;
  for (const auto& option : options) out += (out.empty() ? "" : " ") + std::string(option.name);
  return out;
}

std::string single_quoted(std::string_view text) {
  std::string out = "'";
  for (const char c : text) out += c == '\'' ? std::string("'\\''") : std::string(1, c);
  return out + "'";
}

// -- bash -----------------------------------------------------------------------------------------

constexpr std::string_view kBashBegin = R"sh(# Made by "mediidx completion bash".

_mediidx_words() {
  mapfile -t COMPREPLY < <(compgen -W "$1" -- "$cur")
}

_mediidx_paths() {
  if declare -F _filedir >/dev/null; then
    if [ "$1" = directory ]; then _filedir -d; else _filedir; fi
  else
    compopt -o filenames 2>/dev/null
    mapfile -t COMPREPLY < <(compgen -A "$1" -- "$cur")
  fi
}

_mediidx() {
  local cur=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD - 1]}
  local verb taken options i kind
  local -a words=() kinds=()
  COMPREPLY=()
  # "--name=value" comes as three words.
  if [ "$cur" = = ]; then
    cur=
  elif [ "$previous" = = ] && [ "$COMP_CWORD" -gt 1 ]; then
    previous=${COMP_WORDS[COMP_CWORD - 2]}
  fi
)sh";

constexpr std::string_view kBashEnd = R"sh(  if [[ $cur == -* ]]; then
    _mediidx_words "$options"
    return
  fi
  i=$((${#words[@]} - taken))
  if [ "$i" -ge "${#kinds[@]}" ] && [[ ${kinds[*]: -1} == *... ]]; then i=$((${#kinds[@]} - 1)); fi
  kind=${kinds[i]-}
  case ${kind%...} in
    '') ;;
    directory | file) _mediidx_paths "${kind%...}" ;;
    *) _mediidx_words "$kind" ;;
  esac
}

complete -F _mediidx mediidx
)sh";

std::string bash_kind(const Value& value, std::span<const Verb> verbs) {
  const std::string repeated = value.is_repeated ? "..." : "";
  switch (value.kind) {
    case Kind::kAnything:
      return "''";
    case Kind::kFolder:
      return "directory" + repeated;
    case Kind::kPath:
      return "file" + repeated;
    case Kind::kVerb:
      return single_quoted(joined(words_of(verbs), " "));
    case Kind::kWords:
      return single_quoted(joined(value.words, " "));
  }
  return {};
}

/// A line for each option's value.
std::string bash_values(std::span<const Option> options) {
  std::string out = "  case $previous in\n";
  std::string others;
  for (const auto& option : options) {
    if (!option.value) continue;
    const auto value = value_named(option.value);
    const std::string line = "    " + std::string(option.name) + ") ";
    if (value.kind == Kind::kFolder || value.kind == Kind::kPath) {
      const auto* kind = value.kind == Kind::kFolder ? "directory" : "file";
      out += line + "_mediidx_paths " + kind + "; return ;;\n";
    } else if (value.kind == Kind::kWords) {
      out += line + "_mediidx_words " + single_quoted(joined(value.words, " ")) + "; return ;;\n";
    } else {
      others += (others.empty() ? "" : " | ") + std::string(option.name);
    }
  }
  if (!others.empty()) out += "    " + others + ") return ;;\n";
  return out + "  esac\n";
}

/// The words that are no options and no values of options.
std::string bash_operands(std::span<const Option> options) {
  std::string with_value;
  for (const auto& option : options) {
    if (option.value) with_value += (with_value.empty() ? "" : " | ") + std::string(option.name);
  }
  return "  for ((i = 1; i < COMP_CWORD; ++i)); do\n"
         "    case ${COMP_WORDS[i]} in\n"
         "      " +
         with_value +
         ")\n"
         "        if [ \"${COMP_WORDS[i + 1]-}\" = = ]; then ((i += 2)); else ((++i)); fi\n"
         "        ;;\n"
         "      -*) ;;\n"
         "      *) words+=(\"${COMP_WORDS[i]}\") ;;\n"
         "    esac\n"
         "  done\n";
}

// -- zsh ------------------------------------------------------------------------------------------

/// As a text within an argument of _arguments.
std::string zsh_text(std::string_view text) {
  std::string out;
  for (const char c : text) {
    if (c == '[' || c == ']' || c == ':' || c == '\\') out += '\\';
    out += c;
  }
  return out;
}

std::string zsh_action(const Value& value, std::span<const Verb> verbs) {
  switch (value.kind) {
    case Kind::kAnything:
      return " ";
    case Kind::kFolder:
      return "_directories";
    case Kind::kPath:
      return "_files";
    case Kind::kVerb:
      return "(" + joined(words_of(verbs), " ") + ")";
    case Kind::kWords:
      return "(" + joined(value.words, " ") + ")";
  }
  return {};
}

std::string zsh_option(const Option& option) {
  const auto help = "[" + zsh_text(option.help) + "]";
  if (!option.value) return single_quoted(option.name + help);
  const auto value = value_named(option.value);
  return single_quoted(option.name + ("=" + help) + ":" + zsh_text(value.name) + ":" +
                       zsh_action(value, {}));
}

std::string zsh_arguments(const Verb& verb, std::span<const Verb> verbs) {
  std::string out = "_arguments -S $common";
  for (const auto& option : verb.options) out += " \\\n  " + zsh_option(option);
  int position = 0;
  for (const auto& operand : operands_of(verb)) {
    const auto place = operand.is_repeated ? "*" : std::to_string(++position);
    const auto name = operand.kind == Kind::kWords ? "what" : zsh_text(operand.name);
    out += " \\\n  " + single_quoted(place + ":" + name + ":" + zsh_action(operand, verbs));
  }
  return out + "\n";
}

/// What the word at hand chooses among: verbs with their help, or the first words of some.
std::string zsh_choice(std::span<const Verb> verbs, std::string_view first = {}) {
  std::string out = "choices=(\n";
  for (const auto& word : words_of(verbs, first)) {
    const auto name = first.empty() ? word : std::string(first) + " " + word;
    const auto found = std::ranges::find(verbs, std::string_view(name), &Verb::name);
    const auto help = found == verbs.end() ? joined(words_of(verbs, word), ", ") : found->help;
    out += "  " + single_quoted(word + ":" + help) + "\n";
  }
  return out + ")\n_describe -t commands verb choices\n";
}

}  // namespace

std::string bash_completion(std::span<const Verb> verbs) {
  const auto options = all_options(verbs);
  std::string pairs;
  for (const auto& verb : verbs) {
    if (std::string_view(verb.name).find(' ') == std::string_view::npos) continue;
    pairs += (pairs.empty() ? "" : " | ") + single_quoted(verb.name);
  }
  std::string out(kBashBegin);
  out += bash_values(options) + bash_operands(options);
  out +=
      "  verb=${words[0]-} taken=1\n"
      "  case \"$verb ${words[1]-}\" in\n"
      "    " +
      pairs +
      ") verb+=\" ${words[1]}\" taken=2 ;;\n"
      "  esac\n";
  const auto common = option_names(common_options());
  out += "  options='" + common + "'\n  case $verb in\n";
  out += "    '') taken=0 kinds=(" + single_quoted(joined(words_of(verbs), " ")) + ") ;;\n";
  std::string_view last;
  for (const auto& verb : verbs) {
    const std::string_view name = verb.name;
    const auto first = name.substr(0, name.find(' '));
    if (first != name && first != last) {
      out += "    " + std::string(first) + ") kinds=(" +
             single_quoted(joined(words_of(verbs, first), " ")) + ") ;;\n";
    }
    last = first;
    out += "    " + single_quoted(name) + ")";
    if (!verb.options.empty()) out += " options+=' " + option_names(verb.options) + "'";
    std::string kinds;
    for (const auto& operand : operands_of(verb)) {
      kinds += (kinds.empty() ? "" : " ") + bash_kind(operand, verbs);
    }
    out += " kinds=(" + kinds + ") ;;\n";
  }
  out += "    *) return ;;\n  esac\n";
  return out + std::string(kBashEnd);
}

std::string zsh_completion(std::span<const Verb> verbs) {
  std::string out =
      "#compdef mediidx\n# Made by \"mediidx completion zsh\".\n\n"
      "local curcontext=$curcontext state\n"
      "local -a choices common line\n"
      "typeset -A opt_args\n"
      "common=(";
  for (const auto& option : common_options()) out += "\n  " + zsh_option(option);
  out +=
      "\n)\n"
      "_arguments -C -S $common '1: :->verb' '*:: :->rest' && return\n"
      "if [[ $state == verb ]]; then\n" +
      zsh_choice(verbs) + "return\nfi\ncase $words[1] in\n";
  for (const auto& first : words_of(verbs)) {
    const auto seconds = words_of(verbs, first);
    out += first + ")\n";
    if (!seconds.empty()) {
      out +=
          "_arguments -C -S $common '1: :->verb' '*:: :->rest' && return\n"
          "if [[ $state == verb ]]; then\n" +
          zsh_choice(verbs, first) + "return\nfi\ncase $words[1] in\n";
    }
    for (const auto& verb : verbs) {
      const std::string_view name = verb.name;
      if (name.substr(0, name.find(' ')) != first) continue;
      if (!seconds.empty()) out += std::string(name.substr(first.size() + 1)) + ")\n";
      out += zsh_arguments(verb, verbs);
      if (!seconds.empty()) out += ";;\n";
    }
    if (!seconds.empty()) out += "esac\n";
    out += ";;\n";
  }
  return out + "esac\n";
}

}  // namespace mediidx::tool
