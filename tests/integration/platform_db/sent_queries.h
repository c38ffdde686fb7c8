// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the database client hands to libpq: the program's PQexec stands before libpq's.
#ifndef MEDIIDX_TESTS_PLATFORM_DB_SENT_QUERIES_H_
#define MEDIIDX_TESTS_PLATFORM_DB_SENT_QUERIES_H_

#include <functional>
#include <string>
#include <vector>

namespace mediidx::test {

/// The texts sent since the object was made, session settings left out. `after` is called when one
/// was answered.
class SentQueries {
 public:
  using After = std::function<void(const std::string& sql)>;
  explicit SentQueries(After after = {});
  ~SentQueries();
  const std::vector<std::string>& texts() const { return texts_; }
  void note(const std::string& sql);

 private:
  After after_;
  std::vector<std::string> texts_;
};

}  // namespace mediidx::test

#endif
