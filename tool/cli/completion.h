// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What shells need to complete a command line, made from the verbs as they are.
#ifndef MEDIIDX_TOOL_CLI_COMPLETION_H_
#define MEDIIDX_TOOL_CLI_COMPLETION_H_

#include <span>
#include <string>

#include "cli/arguments.h"

namespace mediidx::tool {

/// A script for bash to source.
std::string bash_completion(std::span<const Verb> verbs);
/// A file for one of the folders of zsh's `fpath`.
std::string zsh_completion(std::span<const Verb> verbs);

}  // namespace mediidx::tool

#endif
