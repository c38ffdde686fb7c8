// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "connection.h"

#include <poll.h>

#include <algorithm>
#include <charconv>
#include <chrono>
#include <limits>
#include <new>
#include <optional>
#include <stdexcept>
#include <string_view>

#include "border.h"

namespace mediidx::platform {
namespace {

using Clock = std::chrono::steady_clock;

/// By statement, since the environment may ask for others and poolers refuse start-up options.
constexpr const char* kSettings =
    "SET client_encoding TO 'UTF8'; "
    "SET datestyle TO 'ISO, MDY'; "
    "SET timezone TO 'UTC'; "
    "SET standard_conforming_strings TO on";

struct FreeOptions {
  void operator()(PQconninfoOption* options) const noexcept { PQconninfoFree(options); }
};

/// When connecting is to be given up, if "connect_timeout" says so.
std::optional<Clock::time_point> connect_limit(PGconn* conn) {
  const std::unique_ptr<PQconninfoOption, FreeOptions> options(PQconninfo(conn));
  for (auto* option = options.get(); option && option->keyword; ++option) {
    if (std::string_view(option->keyword) != "connect_timeout" || !option->val) continue;
    const std::string_view value(option->val);
    int seconds = 0;
    std::from_chars(value.data(), value.data() + value.size(), seconds);
    if (seconds <= 0) return std::nullopt;
    return Clock::now() + std::chrono::seconds(std::max(seconds, 2));  // 2 is libpq's least
  }
  return std::nullopt;
}

int remaining_ms(std::optional<Clock::time_point> limit) {
  if (!limit) return -1;
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(*limit - Clock::now()).count();
  return static_cast<int>(std::clamp<decltype(left)>(left, 0, std::numeric_limits<int>::max()));
}

/// Carries a started connection through; false when the time is up. Whether it came about is for
/// PQstatus to say.
bool complete(PGconn* conn) {
  const auto limit = connect_limit(conn);
  for (auto wanted = PGRES_POLLING_WRITING;
       wanted == PGRES_POLLING_READING || wanted == PGRES_POLLING_WRITING;
       wanted = PQconnectPoll(conn)) {
    pollfd socket{PQsocket(conn),
                  static_cast<short>(wanted == PGRES_POLLING_READING ? POLLIN : POLLOUT), 0};
    if (poll(&socket, 1, remaining_ms(limit)) == 0) return false;
  }
  return true;
}

int touched_rows(PGresult* rows) {
  const std::string_view count(PQcmdTuples(rows));
  if (count.empty()) return PQntuples(rows);
  int number = std::numeric_limits<int>::max();  // kept when there are more
  std::from_chars(count.data(), count.data() + count.size(), number);
  return number;
}

}  // namespace

Connection::Connection(const char* host, const char* user, const char* password,
                       const char* database) {
  const char* names[] = {"host", "user", "password", "dbname", nullptr};
  const char* values[] = {host, user, password, database, nullptr};
  // Started and carried through here: what the server says while PQconnectdb connects would be
  // printed before a receiver can be set.
  conn_.reset(PQconnectStartParams(names, values, 0));
  if (!conn_) throw std::bad_alloc();
  PQsetNoticeReceiver(conn_.get(), receive_notice, this);
  if (PQstatus(conn_.get()) != CONNECTION_BAD && !complete(conn_.get())) {
    throw std::runtime_error("timeout expired");
  }
  if (PQstatus(conn_.get()) != CONNECTION_OK) {
    set_error(PQerrorMessage(conn_.get()));
    throw std::runtime_error(error_);
  }
  if (!settle()) throw std::runtime_error(error_);
}

void Connection::receive_notice(void* connection, const PGresult* notice) {
  const char* severity = PQresultErrorField(notice, PG_DIAG_SEVERITY_NONLOCALIZED);
  // An error between two statements is the server's farewell; the end of the stream comes later.
  if (severity &&
      (std::string_view(severity) == "FATAL" || std::string_view(severity) == "PANIC")) {
    static_cast<Connection*>(connection)->was_dismissed_ = true;
  }
}

void Connection::set_error(std::string_view message) {
  while (message.ends_with('\n')) message.remove_suffix(1);
  error_ = message;
}

bool Connection::settle() {
  const OwnedRows done(PQexec(conn_.get(), kSettings));
  if (PQresultStatus(done.get()) == PGRES_COMMAND_OK) return true;
  set_error(PQerrorMessage(conn_.get()));
  return false;
}

bool Connection::is_alive() {
  pollfd socket{PQsocket(conn_.get()), POLLIN, 0};
  // The status changes only when the end of the stream is read, which may stand behind messages.
  while (PQstatus(conn_.get()) == CONNECTION_OK) {
    PQisBusy(conn_.get());  // takes the messages that are here: a farewell may be among them
    if (was_dismissed_ || poll(&socket, 1, 0) <= 0) break;
    if (!PQconsumeInput(conn_.get())) return false;
  }
  return PQstatus(conn_.get()) == CONNECTION_OK && !was_dismissed_;
}

bool Connection::make_alive() {
  if (is_alive()) return true;
  if (in_transaction_) {
    in_transaction_ = false;
    set_error("the connection was lost within a transaction");
    return false;
  }
  PQreset(conn_.get());
  was_dismissed_ = false;
  if (PQstatus(conn_.get()) == CONNECTION_OK) return settle();
  set_error(PQerrorMessage(conn_.get()));
  return false;
}

OwnedRows Connection::run(const std::string& statement) {
  affected_rows_ = -1;
  if (!make_alive()) return nullptr;
  return take(PQexec(conn_.get(), statement.c_str()));
}

OwnedRows Connection::run(const std::string& statement, std::span<const char* const> values) {
  affected_rows_ = -1;
  if (!make_alive()) return nullptr;
  constexpr int kAsText = 0;
  return take(PQexecParams(conn_.get(), statement.c_str(), static_cast<int>(values.size()), nullptr,
                           values.data(), nullptr, nullptr, kAsText));
}

/// What became of a statement.
OwnedRows Connection::take(PGresult* answer) {
  OwnedRows rows(answer);
  const auto transaction = PQtransactionStatus(conn_.get());
  in_transaction_ = transaction == PQTRANS_INTRANS || transaction == PQTRANS_INERROR;
  switch (PQresultStatus(rows.get())) {
    case PGRES_TUPLES_OK:
    case PGRES_COMMAND_OK:
    case PGRES_EMPTY_QUERY:
      affected_rows_ = touched_rows(rows.get());
      return rows;
    case PGRES_COPY_IN:
    case PGRES_COPY_OUT:
      OwnedRows(PQexec(conn_.get(), ""));  // leaves the copying that began
      set_error("COPY from or to the client is not supported");
      return nullptr;
    default:
      set_error(PQerrorMessage(conn_.get()));
      return nullptr;
  }
}

bool Connection::copy(const std::string& statement, std::string_view rows) {
  affected_rows_ = -1;
  if (!make_alive()) return false;
  OwnedRows begun(PQexec(conn_.get(), statement.c_str()));
  if (PQresultStatus(begun.get()) != PGRES_COPY_IN) {
    if (take(begun.release())) set_error("not a COPY from the client");
    affected_rows_ = -1;
    return false;
  }
  constexpr std::size_t kMost = 1 << 20;
  bool sent = true;
  for (; sent && !rows.empty(); rows.remove_prefix(std::min(rows.size(), kMost))) {
    const auto piece = rows.substr(0, kMost);
    sent = PQputCopyData(conn_.get(), piece.data(), static_cast<int>(piece.size())) == 1;
  }
  sent = sent && PQputCopyEnd(conn_.get(), nullptr) == 1;
  if (!sent) {
    set_error(PQerrorMessage(conn_.get()));
    const OwnedRows left(PQexec(conn_.get(), ""));  // leaves the copying
    return false;
  }
  OwnedRows copied(PQgetResult(conn_.get()));
  while (OwnedRows(PQgetResult(conn_.get()))) {
  }
  return take(copied.release()) != nullptr;
}

namespace {

/// Why the thread's last TAVODBConnect failed.
std::string& connect_error() {
  static thread_local std::string message;
  return message;
}

tavodb_connection* connect(const char* host, const char* user, const char* password,
                           const char* database) {
  try {
    connect_error().clear();
    return new tavodb_connection(host, user, password, database);
  } catch (const std::exception& error) {
    connect_error() = error.what();
    return nullptr;
  }
}

}  // namespace
}  // namespace mediidx::platform

using namespace mediidx::platform;

extern "C" tavodb_connection* TAVODBConnect(const char* host, const char* user,
                                            const char* password, const char* database) {
  return no_throw<tavodb_connection*>(nullptr,
                                      [&] { return connect(host, user, password, database); });
}

extern "C" void TAVODBClose(tavodb_connection* conn) { delete conn; }

extern "C" const char* TAVODBErrorGet(tavodb_connection* conn) {
  return conn ? conn->error().c_str() : connect_error().c_str();
}

extern "C" int TAVODBDatabaseTypeGet(tavodb_connection* conn) {
  return conn ? TAVODB_TYPE_POSTGRESQL : -1;
}
