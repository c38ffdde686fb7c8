// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A server that behaves as no real one can be made to at will: it speaks just enough of the
/// protocol to greet, answer, say farewell or vanish at a given statement.
#ifndef MEDIIDX_TESTS_PLATFORM_DB_WIRE_SERVER_H_
#define MEDIIDX_TESTS_PLATFORM_DB_WIRE_SERVER_H_

#include <atomic>
#include <functional>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace mediidx::test {

class WireServer {
 public:
  struct Answer {
    std::string bytes;
    bool hangs_up = false;
  };
  using Answers = std::function<Answer(const std::string& sql)>;

  /// `greeting` goes out once a client is let in; nobody is let in without one.
  WireServer(std::string greeting, Answers answers);
  ~WireServer();
  WireServer(const WireServer&) = delete;
  WireServer& operator=(const WireServer&) = delete;

  const std::string& host() const { return folder_; }
  int sessions() const { return sessions_; }
  /// What was received, session settings left out.
  std::vector<std::string> received() const;

  /// Messages of the server; `remarks` go out before it is ready.
  static std::string let_in(const std::string& remarks = "");
  static std::string done();
  static std::string notice(const std::string& text);
  static std::string farewell();

 private:
  void serve();
  void serve_session(int client);
  bool read_exactly(int client, std::string& bytes) const;

  std::string folder_;
  std::string greeting_;
  Answers answers_;
  int listener_ = -1;
  int stop_[2] = {-1, -1};
  std::atomic<int> sessions_ = 0;
  mutable std::mutex mutex_;
  std::vector<std::string> received_;
  std::thread thread_;
};

}  // namespace mediidx::test

#endif
