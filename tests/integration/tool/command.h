// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The built command as a process of its own.
#ifndef MEDIIDX_TESTS_INTEGRATION_TOOL_COMMAND_H_
#define MEDIIDX_TESTS_INTEGRATION_TOOL_COMMAND_H_

#include <sys/types.h>

#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace mediidx::test {

/// What a run of the command left.
struct Outcome {
  int status;  ///< Exit status; 128 + signal.
  std::string out;
  std::string err;
};

/// How it is run.
struct Setting {
  std::map<std::string, std::string> environment;  ///< Over what the test has.
  bool without_server = false;                     ///< None of the variables that name a server.
  std::optional<uid_t> user;                       ///< Outcome as this user, by root only.
  bool on_terminal = false;                        ///< Both outputs go to one terminal, into `out`.
  bool reader_gone = false;                        ///< Nobody reads standard output.
  std::string program;                             ///< Another copy of the command.
  /// Called with the process id while it runs.
  std::function<void(pid_t)> meanwhile;
};

/// Runs the command with these arguments, without a shell.
Outcome run_mediidx(const std::vector<std::string>& arguments, const Setting& setting = {});

/// A folder with a short name that every user may enter, gone with the object.
class OpenFolder {
 public:
  OpenFolder();
  ~OpenFolder();
  OpenFolder(const OpenFolder&) = delete;
  OpenFolder& operator=(const OpenFolder&) = delete;
  std::string at(const std::string& relative) const { return (path_ / relative).string(); }
  const std::filesystem::path& path() const { return path_; }
  /// Copies a file or folder of the sample library; "" all of it. What is in a user's home, as the
  /// library itself may be, belongs to that user.
  std::string take_sample(const std::string& sample, const std::string& relative) const;
  std::string write(const std::string& relative, const std::string& content) const;

 private:
  std::filesystem::path path_;
};

/// A copy of the command where every user may run it: the build tree may stand where only root may
/// go. Permissions do not bind root, so root has it run as another user; others run it as it is.
class OpenCommand {
 public:
  /// `user`: whom root has it run as.
  explicit OpenCommand(const std::string& user);
  /// Runs it so.
  const Setting& setting() const { return setting_; }
  /// Hands over what a test made, with all that is in it.
  void give(const std::filesystem::path& tree) const;

 private:
  void give_one(const std::filesystem::path& path) const;

  OpenFolder copy_;
  Setting setting_;
  gid_t group_ = 0;
};

/// Processes whose command line has this word as one of its arguments; of parent and child the
/// parent.
std::vector<pid_t> processes_with(const std::string& argument);

}  // namespace mediidx::test

#endif
