// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The configuration file, and the daemons that have to read it again.
#include <fcntl.h>
#include <json/reader.h>
#include <sys/stat.h>
#include <tavocore.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstring>
#include <fstream>
#include <string>

#include "mediidx/index_folder.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/root.h"

namespace mediidx {
namespace {

constexpr int kNotOpened = 101;
constexpr int kNotWritten = 102;

Json::Value empty_list() { return Json::Value(Json::arrayValue); }

Json::Value read_conf() {
  auto conf = empty_list();
  std::ifstream file(below_root(kIndexFolderConfPath));
  if (!file) return conf;
  // What stood before an error is used.
  try {
    Json::Reader().parse(file, conf);
  } catch (const Json::Exception&) {  // nested too deeply, an error like others
  }
  return conf.isArray() ? conf : empty_list();
}

class Descriptor {
 public:
  explicit Descriptor(int fd) : fd_(fd) {}
  ~Descriptor() {
    if (fd_ >= 0) close(fd_);
  }
  Descriptor(const Descriptor&) = delete;
  Descriptor& operator=(const Descriptor&) = delete;
  int get() const { return fd_; }

 private:
  int fd_;
};

int save_conf(const Json::Value& conf) {
  constexpr int kFlags = O_WRONLY | O_CREAT | O_TRUNC | O_SYNC;
  const auto text = conf.toStyledString();
  const Descriptor file(open(below_root(kIndexFolderConfPath).c_str(), kFlags, 0777));
  if (file.get() < 0) {
    kIndexFolderActionLog.colon(kNotOpened, "open(%s, %d) failed, reason=%s\n",
                                kIndexFolderConfPath, kFlags, std::strerror(errno));
    return -1;
  }
  if (write(file.get(), text.data(), text.size()) < 0) {
    kIndexFolderActionLog.colon(kNotWritten, "failed to write into %s, reason=%s",
                                kIndexFolderConfPath, std::strerror(errno));
    return -1;
  }
  IndexServiceReload();
  return 0;
}

void signal_daemon(const char* pid_file, int signal) {
  TLIBCProcSignalByPidFile(below_root(pid_file).c_str(), signal);
}

}  // namespace
}  // namespace mediidx

using mediidx::kIndexFolderActionLog;
using mediidx::no_throw;

Json::Value IndexFolderConfOpen() {
  return no_throw(kIndexFolderActionLog, Json::Value(Json::arrayValue), mediidx::read_conf);
}

int IndexFolderConfSave(const Json::Value& conf) {
  return no_throw(kIndexFolderActionLog, -1, [&] { return mediidx::save_conf(conf); });
}

bool IsIndexFolderConfExist() {
  return no_throw(kIndexFolderActionLog, false, [] {
    struct stat status;
    return stat(mediidx::below_root(mediidx::kIndexFolderConfPath).c_str(), &status) == 0;
  });
}

void IndexServiceReload() {
  no_throw(kIndexFolderActionLog, 0, [] {
    mediidx::signal_daemon(mediidx::kIndexDaemonPidPath, SIGHUP);
    mediidx::signal_daemon(mediidx::kThumbnailDaemonPidPath, SIGHUP);
    mediidx::signal_daemon(mediidx::kVideoDaemonPidPath, SIGHUP);
    mediidx::signal_daemon(mediidx::kMediaServerPidPath, SIGCONT);
    return 0;
  });
}
