// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The command line: verbs, their options and operands, and the help that tells of them.
#ifndef MEDIIDX_TOOL_CLI_ARGUMENTS_H_
#define MEDIIDX_TOOL_CLI_ARGUMENTS_H_

#include <cstddef>
#include <map>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <vector>

namespace mediidx::tool {

/// "--name", or "--name VALUE" where `value` names what is expected.
struct Option {
  const char* name;
  const char* value;
  const char* help;
};

struct Arguments;

/// What a command line can ask for. A name of two words ("db init") is two words of the command
/// line.
struct Verb {
  const char* name;
  const char* operands;  ///< As the help shows them.
  const char* help;
  std::size_t least_operands;
  std::size_t most_operands;
  std::span<const Option> options;
  std::span<const char* const> choices;  ///< What the first operand may be; empty: anything.
  int (*run)(const Arguments&);
  const char* statuses = nullptr;  ///< Exit statuses that mean something of their own here.
};

/// A command line, understood.
struct Arguments {
  const Verb* verb = nullptr;
  std::vector<std::string> operands;
  std::map<std::string, std::string> options;

  bool has(const std::string& option) const { return options.contains(option); }
  std::optional<std::string> value(const std::string& option) const;
};

/// A command line that asks for nothing known; what() says why.
struct UsageError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// Options of every verb.
std::span<const Option> common_options();

/// Understands the words behind the program's name. "--" ends the options. Throws UsageError.
Arguments parse_arguments(std::span<const Verb> verbs, std::span<const std::string> words);

/// The help of all verbs.
std::string general_help(std::span<const Verb> verbs);
/// The help of one.
std::string verb_help(const Verb& verb);

}  // namespace mediidx::tool

#endif
