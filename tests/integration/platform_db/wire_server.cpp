// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "wire_server.h"

#include <arpa/inet.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <stdexcept>

namespace mediidx::test {
namespace {

std::string number(std::uint32_t value) {
  const auto wire = htonl(value);
  return {reinterpret_cast<const char*>(&wire), sizeof(wire)};
}

std::uint32_t number_in(const std::string& bytes) {
  std::uint32_t wire = 0;
  std::memcpy(&wire, bytes.data(), sizeof(wire));
  return ntohl(wire);
}

std::string message(char type, const std::string& body) {
  return type + number(static_cast<std::uint32_t>(body.size() + 4)) + body;
}

std::string field(char code, const std::string& text) { return code + text + '\0'; }

std::string report(char type, const std::string& severity, const std::string& text) {
  return message(type, field('S', severity) + field('V', severity) + field('C', "57P01") +
                           field('M', text) + '\0');
}

const std::string kReady = message('Z', "I");

}  // namespace

std::string WireServer::let_in(const std::string& remarks) {
  return message('R', number(0)) + remarks + kReady;
}
std::string WireServer::done() { return message('C', field('S', "ET")) + kReady; }
std::string WireServer::notice(const std::string& text) { return report('N', "WARNING", text); }
std::string WireServer::farewell() { return report('E', "FATAL", "goodbye"); }

WireServer::WireServer(std::string greeting, Answers answers)
    : folder_("/tmp/mediidx-wire-XXXXXX"),
      greeting_(std::move(greeting)),
      answers_(std::move(answers)) {
  if (!mkdtemp(folder_.data()) || pipe(stop_) != 0) throw std::runtime_error("no wire server");
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  (folder_ + "/.s.PGSQL.5432").copy(address.sun_path, sizeof(address.sun_path) - 1);
  listener_ = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
  if (bind(listener_, reinterpret_cast<sockaddr*>(&address), sizeof(address)) != 0 ||
      listen(listener_, 8) != 0) {
    throw std::runtime_error("no wire server");
  }
  thread_ = std::thread([this] { serve(); });
}

WireServer::~WireServer() {
  close(stop_[1]);  // wakes every thread
  thread_.join();
  close(stop_[0]);
  close(listener_);
  std::error_code ignored;
  std::filesystem::remove_all(folder_, ignored);
}

std::vector<std::string> WireServer::received() const {
  const std::lock_guard lock(mutex_);
  return received_;
}

void WireServer::serve() {
  std::vector<std::thread> sessions;
  for (;;) {
    pollfd waiting[] = {{listener_, POLLIN, 0}, {stop_[0], POLLIN, 0}};
    poll(waiting, 2, -1);
    if (waiting[1].revents) break;
    const int client = accept4(listener_, nullptr, nullptr, SOCK_CLOEXEC);
    ++sessions_;
    sessions.emplace_back([this, client] {
      serve_session(client);
      close(client);
    });
  }
  for (auto& session : sessions) session.join();
}

/// False when the client is gone or the server stops.
bool WireServer::read_exactly(int client, std::string& bytes) const {
  for (std::size_t have = 0; have < bytes.size();) {
    pollfd waiting[] = {{client, POLLIN, 0}, {stop_[0], POLLIN, 0}};
    poll(waiting, 2, -1);
    if (waiting[1].revents) return false;
    const auto count = read(client, bytes.data() + have, bytes.size() - have);
    if (count <= 0) return false;
    have += static_cast<std::size_t>(count);
  }
  return true;
}

void WireServer::serve_session(int client) {
  const auto say = [client](const std::string& bytes) {
    return send(client, bytes.data(), bytes.size(), MSG_NOSIGNAL) >= 0;
  };
  std::string length(4, '\0');
  if (!read_exactly(client, length)) return;
  std::string startup(number_in(length) - 4, '\0');
  if (!read_exactly(client, startup) || !say(greeting_)) return;
  std::string head(5, '\0');
  while (read_exactly(client, head)) {
    std::string body(number_in(head.substr(1)) - 4, '\0');
    if (!read_exactly(client, body) || head[0] != 'Q') return;
    const std::string sql(body.c_str());
    Answer answer{done()};
    if (!sql.starts_with("SET client_encoding")) {
      {
        const std::lock_guard lock(mutex_);
        received_.push_back(sql);
      }
      answer = answers_(sql);
    }
    if (!say(answer.bytes) || answer.hangs_up) return;
  }
}

}  // namespace mediidx::test
