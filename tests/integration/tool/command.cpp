// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "command.h"

#include <fcntl.h>
#include <poll.h>
#include <pty.h>
#include <pwd.h>
#include <signal.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <charconv>
#include <cstdlib>
#include <fstream>
#include <stdexcept>
#include <thread>
#include <utility>

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

constexpr const char* kServerVariables[] = {"PGHOST", "PGHOSTADDR", "PGPORT", "PGSERVICE",
                                            "PGDATABASE"};

struct Pipe {
  Pipe() {
    if (pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
  }
  int ends[2];
};

/// Reads until nobody writes any more. A terminal ends with an error.
std::string read_all(int descriptor) {
  std::string out;
  char buffer[4096];
  for (ssize_t length; (length = read(descriptor, buffer, sizeof(buffer))) > 0;) {
    out.append(buffer, static_cast<std::size_t>(length));
  }
  close(descriptor);
  return out;
}

[[noreturn]] void become_command(const std::vector<std::string>& arguments,
                                 const Setting& setting) {
  for (const char* name : kServerVariables) {
    if (setting.without_server) unsetenv(name);
  }
  for (const auto& [name, value] : setting.environment) setenv(name.c_str(), value.c_str(), 1);
  if (setting.user && (setgid(*setting.user) != 0 || setuid(*setting.user) != 0)) {
    _exit(126);
  }
  const auto program = setting.program.empty() ? std::string(MEDIIDX_COMMAND) : setting.program;
  std::vector<char*> words{const_cast<char*>(program.c_str())};
  for (const auto& argument : arguments) words.push_back(const_cast<char*>(argument.c_str()));
  words.push_back(nullptr);
  if (chdir("/") == 0) execv(words[0], words.data());
  _exit(127);
}

int exit_status(pid_t child) {
  int status = 0;
  waitpid(child, &status, 0);
  return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

Outcome run_on_terminal(const std::vector<std::string>& arguments, const Setting& setting) {
  winsize size{24, 80, 0, 0};
  int terminal = -1;
  const pid_t child = forkpty(&terminal, nullptr, nullptr, &size);
  if (child < 0) throw std::runtime_error("no terminal");
  if (child == 0) become_command(arguments, setting);
  auto out = read_all(terminal);
  return {exit_status(child), std::move(out), {}};
}

}  // namespace

Outcome run_mediidx(const std::vector<std::string>& arguments, const Setting& setting) {
  if (setting.on_terminal) return run_on_terminal(arguments, setting);
  Pipe out;
  Pipe err;
  if (setting.reader_gone) close(std::exchange(out.ends[0], -1));
  const pid_t child = fork();
  if (child < 0) throw std::runtime_error("no process");
  if (child == 0) {
    dup2(out.ends[1], STDOUT_FILENO);
    dup2(err.ends[1], STDERR_FILENO);
    become_command(arguments, setting);
  }
  close(out.ends[1]);
  close(err.ends[1]);
  Outcome run;
  std::jthread errors([&] { run.err = read_all(err.ends[0]); });
  try {
    if (setting.meanwhile) setting.meanwhile(child);
  } catch (...) {
    // Nobody reads the command's output any more: it must not wait for that.
    kill(child, SIGKILL);
    exit_status(child);
    close(out.ends[0]);
    throw;
  }
  run.out = read_all(out.ends[0]);
  errors.join();
  run.status = exit_status(child);
  return run;
}

OpenFolder::OpenFolder() {
  std::string name = "/tmp/mediidx-XXXXXX";
  if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
  path_ = name;
  chmod(path_.c_str(), 0755);
}

OpenFolder::~OpenFolder() {
  std::error_code ignored;
  fs::remove_all(path_, ignored);
}

std::string OpenFolder::take_sample(const std::string& sample, const std::string& relative) const {
  const fs::path file = at(relative);
  fs::create_directories(file.parent_path());
  fs::copy(fs::path(MEDIIDX_SAMPLE_LIBRARY) / sample, file, fs::copy_options::recursive);
  return file;
}

std::string OpenFolder::write(const std::string& relative, const std::string& content) const {
  const fs::path file = at(relative);
  fs::create_directories(file.parent_path());
  std::ofstream out(file, std::ios::binary);
  out << content;
  out.close();
  if (!out) throw std::runtime_error("cannot write " + file.string());
  return file;
}

OpenCommand::OpenCommand(const std::string& user) {
  if (geteuid() != 0) return;
  const auto programs = fs::path(MEDIIDX_COMMAND).parent_path();
  constexpr auto kAsTheyAre = fs::copy_options::recursive | fs::copy_options::copy_symlinks;
  fs::copy(programs, copy_.at("bin"), kAsTheyAre);
  fs::copy(MEDIIDX_LIBRARIES, copy_.at("lib"), kAsTheyAre);
  const passwd* account = getpwnam(user.c_str());
  if (!account) throw std::runtime_error("no user " + user);
  setting_.program = copy_.at("bin") / fs::path(MEDIIDX_COMMAND).filename();
  setting_.user = account->pw_uid;
  group_ = account->pw_gid;
}

void OpenCommand::give(const fs::path& tree) const {
  if (!setting_.user) return;
  give_one(tree);
  for (const auto& entry : fs::recursive_directory_iterator(tree)) give_one(entry.path());
}

void OpenCommand::give_one(const fs::path& path) const {
  if (lchown(path.c_str(), *setting_.user, group_) != 0) {
    throw std::runtime_error("cannot hand over " + path.string());
  }
}

namespace {

pid_t parent_of(pid_t pid) {
  std::ifstream in("/proc/" + std::to_string(pid) + "/status");
  for (std::string line; std::getline(in, line);) {
    if (line.starts_with("PPid:")) return std::stoi(line.substr(5));
  }
  return 0;
}

}  // namespace

std::vector<pid_t> processes_with(const std::string& argument) {
  std::vector<pid_t> found;
  for (const auto& entry : fs::directory_iterator("/proc")) {
    const auto name = entry.path().filename().string();
    pid_t pid = 0;
    std::from_chars(name.data(), name.data() + name.size(), pid);
    if (pid <= 0) continue;
    // Not by a stream buffer: it throws when the process ends between opening and reading.
    const int file = open((entry.path() / "cmdline").c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0) continue;
    const auto words = read_all(file);
    const auto wanted = '\0' + argument + '\0';
    if (words.find(wanted) != std::string::npos) found.push_back(pid);
  }
  // A child that was forked just now still shows its parent's words.
  const auto all = found;
  std::erase_if(found, [&all](pid_t pid) { return std::ranges::count(all, parent_of(pid)) > 0; });
  return found;
}

}  // namespace mediidx::test
