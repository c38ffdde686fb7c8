// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <tavocore.h>

#include <cerrno>
#include <csignal>
#include <cstdarg>
#include <cstdio>
#include <memory>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "border.h"
#include "child.h"
#include "descriptor.h"

namespace mediidx::platform {

namespace {

constexpr pid_t kNotStarted = -1;

/// Children by the stream that leads to them. Never destroyed: streams may be closed at exit.
std::unordered_map<std::FILE*, pid_t>& children() {
  static auto& table = *new std::unordered_map<std::FILE*, pid_t>;
  return table;
}

/// Holds SIGCHLD back, so that a handler of the caller's does not take a child's status away.
class ChildSignalHeld {
 public:
  ChildSignalHeld() {
    sigset_t held;
    sigemptyset(&held);
    sigaddset(&held, SIGCHLD);
    pthread_sigmask(SIG_BLOCK, &held, &before_);
  }
  ~ChildSignalHeld() { pthread_sigmask(SIG_SETMASK, &before_, nullptr); }
  ChildSignalHeld(const ChildSignalHeld&) = delete;
  ChildSignalHeld& operator=(const ChildSignalHeld&) = delete;

 private:
  sigset_t before_;
};

int execute(const std::vector<const char*>& arguments) {
  const ChildSignalHeld held;
  const StartedChild child = start_child(arguments, {.input_from_nowhere = true});
  if (child.error != 0) return failed(-1, TAVO_ERR_OPEN_FAILED, "program.cpp", 1);
  return wait_for_child(child.pid);
}

struct Pipe {
  Descriptor read_end;
  Descriptor write_end;
};

bool open_pipe(Pipe& pipe) {
  int ends[2];
  if (pipe2(ends, O_CLOEXEC) != 0) return false;
  pipe.read_end = Descriptor(ends[0]);
  pipe.write_end = Descriptor(ends[1]);
  return true;
}

using Stream = std::unique_ptr<std::FILE, decltype(&std::fclose)>;

/// A stream and the entry that will lead to its child: made before the child is, because from then
/// on nothing may fail any more.
class NewStream {
 public:
  explicit NewStream(std::FILE* stream) : stream_(stream, std::fclose) {
    entry_.emplace(stream, kNotStarted);
    children().reserve(children().size() + 1);
  }

  explicit operator bool() const { return static_cast<bool>(stream_); }
  std::FILE* remember(pid_t pid) {
    entry_.begin()->second = pid;
    children().insert(entry_.extract(entry_.begin()));
    return stream_.release();
  }

 private:
  Stream stream_;
  std::unordered_map<std::FILE*, pid_t> entry_;
};

/// A stream for a program that cannot be started: empty, or swallowing what is written.
std::FILE* open_nowhere(bool reading) {
  NewStream nowhere(std::fopen("/dev/null", reading ? "re" : "we"));
  return nowhere ? nowhere.remember(kNotStarted) : nullptr;
}

std::FILE* open_program(const std::vector<const char*>& arguments, bool reading) {
  Pipe pipe;
  if (!open_pipe(pipe)) return nullptr;
  Descriptor& ours = reading ? pipe.read_end : pipe.write_end;
  const int theirs = (reading ? pipe.write_end : pipe.read_end).get();
  NewStream stream(fdopen(ours.get(), reading ? "r" : "w"));
  if (!stream) return nullptr;
  ours.release();
  const StartedChild child =
      start_child(arguments, reading ? ChildStreams{.output = theirs, .input_from_nowhere = true}
                                     : ChildStreams{.input = theirs});
  if (child.error == 0) return stream.remember(child.pid);
  const bool no_process = child.error == EAGAIN || child.error == ENOMEM;
  return no_process ? nullptr : open_nowhere(reading);
}

}  // namespace

}  // namespace mediidx::platform

namespace platform = mediidx::platform;

extern "C" int TLIBCExec(const char* program, const char* arg1, const char* arg2, const char* arg3,
                         const char* arg4) {
  if (!program) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "program.cpp", 2);
  return platform::no_throw(-1, "program.cpp", 3, [&] {
    std::vector<const char*> arguments{program};
    for (const char* argument : {arg1, arg2, arg3, arg4}) {
      if (argument) arguments.push_back(argument);
    }
    return platform::execute(arguments);
  });
}

extern "C" FILE* TLIBCPopen(const char* program, const char* mode, const char* arg1, ...) {
  const std::string_view direction = mode ? mode : "";
  if (!program || (direction != "r" && direction != "w")) {
    return platform::failed<FILE*>(nullptr, TAVO_ERR_BAD_PARAMETERS, "program.cpp", 4);
  }
  va_list values;
  va_start(values, arg1);
  FILE* stream = platform::no_throw<FILE*>(nullptr, "program.cpp", 5, [&] {
    std::vector<const char*> arguments{program};
    for (const char* argument = arg1; argument; argument = va_arg(values, const char*)) {
      arguments.push_back(argument);
    }
    return platform::open_program(arguments, direction == "r");
  });
  va_end(values);
  return stream;
}

extern "C" int TLIBCPclose(FILE* stream) {
  const auto child = platform::children().extract(stream);
  // A stream that was not opened here is somebody else's to close.
  if (child.empty()) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "program.cpp", 6);
  std::fclose(stream);
  const pid_t pid = child.mapped();
  return pid == platform::kNotStarted ? -1 : platform::wait_for_child(pid);
}
