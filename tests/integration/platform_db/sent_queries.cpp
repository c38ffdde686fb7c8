// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "sent_queries.h"

#include <dlfcn.h>
#include <libpq-fe.h>

namespace mediidx::test {
namespace {

SentQueries* watching = nullptr;

}  // namespace

SentQueries::SentQueries(After after) : after_(std::move(after)) { watching = this; }
SentQueries::~SentQueries() { watching = nullptr; }

void SentQueries::note(const std::string& sql) {
  if (sql.starts_with("SET client_encoding")) return;
  texts_.push_back(sql);
  if (after_) after_(sql);
}

}  // namespace mediidx::test

extern "C" __attribute__((visibility("default"))) PGresult* PQexec(PGconn* conn, const char* sql) {
  static const auto next = reinterpret_cast<decltype(&PQexec)>(dlsym(RTLD_NEXT, "PQexec"));
  PGresult* result = next(conn, sql);
  if (mediidx::test::watching) mediidx::test::watching->note(sql);
  return result;
}
